#include "host/convert/FileLedger.h"

#include "host/convert/Amounts.h"
#include "host/convert/Room.h"
#include "text/Path.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <fmt/format.h>

namespace movieconv {
namespace {

constexpr double kLengthTolerance = 0.1; // seconds: a picture or a codec's frame, at any usual rate

Category CategoryOf(int error) {
    switch (error) {
    case kWriterErrorArgument:
    case kWriterErrorFormat:
    case kWriterErrorCodec:
        return Category::kRequest;
    case kWriterErrorNoSpace:
        return Category::kNoSpace;
    case kWriterErrorInternal:
        return Category::kInternal;
    default:
        return Category::kOutput;
    }
}

Reason ReasonOf(int error) {
    return error == kWriterErrorCodec || error == kWriterErrorFormat ? Reason::kCodec : Reason::kOther;
}

/// What went wrong, where, and what remains.
std::string TextOf(const WriterStatus& failure) {
    std::string text =
        fmt::format("cannot write \"{}\": {}", failure.szPath,
                    failure.szWhat[0] != '\0' ? failure.szWhat : "the media writer gave no reason");
    if (text.back() == '.') // the writer's sentence goes on below
        text.pop_back();
    if (failure.nSystemError != 0 &&
        std::strstr(failure.szWhat, std::strerror(failure.nSystemError)) == nullptr)
        text += fmt::format(" ({})", std::strerror(failure.nSystemError));
    if (failure.nError == kWriterErrorNoSpace) {
        const int64_t free = FreeBytes(text::FolderOf(failure.szPath));
        text += fmt::format("; {} were written, {} are free: make room or choose another disk",
                            FormatBytes(failure.llBytesWritten), FormatBytes(free > 0 ? free : 0));
    }
    if (failure.szTemporaryPath[0] != '\0')
        text += fmt::format("; what was written so far is in \"{}\"", failure.szTemporaryPath);
    return text;
}

/// Compares a complete file with what was sent into it. Empty when everything is there.
std::string MissingFrom(const WriterStatus& file) {
    const auto compare = [&](const char* what, double written, double received, double frame) {
        if (std::abs(written - received) <= std::max(kLengthTolerance, frame))
            return std::string();
        return fmt::format("\"{}\" holds {:.3f} s of {}, but {:.3f} s were sent into it", file.szPath,
                           written, what, received);
    };
    const std::string pictures =
        compare("pictures", file.dVideoWritten, file.dVideoReceived,
                file.dVideoWritten / static_cast<double>(std::max<int64_t>(1, file.llPicturesWritten)));
    return pictures.empty() ? compare("sound", file.dAudioWritten, file.dAudioReceived, 0.0) : pictures;
}

} // namespace

bool FileLedger::Enter(const WriterWatch::News& news) {
    const bool wasWell = !failure_;
    switch (news.event) {
    case kWriterEventOpened:
        ++opened_;
        finishing_.reset();
        observer_.Opened({opened_, news.status.szPath, news.status.szTemporaryPath, begin_});
        break;
    case kWriterEventFinishing:
        finishing_ = news.status.dFinished;
        break;
    case kWriterEventClosed:
        finishing_ = 1; // until the next clip or the end
        EnterClosed(news);
        break;
    default:
        break;
    }
    if (news.status.nError != kWriterErrorNone && !failure_) {
        failure_.emplace(CategoryOf(news.status.nError), TextOf(news.status), ReasonOf(news.status.nError));
        failed_ = news.status.szPath;
    }
    // What remains of the file is known now.
    if (news.event == kWriterEventClosed && !failed_.empty() && failed_ == news.status.szPath)
        failure_.emplace(failure_->Kind(), TextOf(news.status), failure_->Why());
    return !(wasWell && failure_);
}

std::optional<std::string> FileLedger::FindMissing() const {
    for (const Entry& entry : complete_) {
        const FileIdentity now = IdentityOf(entry.path);
        if (entry.identity.exists && now == entry.identity)
            continue;
        if (!now.exists)
            return fmt::format("\"{}\" was written but stands there no more: it vanished meanwhile",
                               entry.path);
        return fmt::format("\"{}\" was written, but another file stands there now", entry.path);
    }
    return std::nullopt;
}

void FileLedger::EnterClosed(const WriterWatch::News& news) {
    const WriterStatus& file = news.status;
    if (file.nState != kWriterFileComplete)
        return;
    complete_.push_back({file.szPath, news.identity});
    if (news.identity.exists && news.identity.size != file.llBytesWritten && !failure_) {
        failure_.emplace(Category::kOutput,
                         fmt::format("\"{}\" has {} bytes, but {} were written into it", file.szPath,
                                     news.identity.size, file.llBytesWritten));
    }
    bytes_ += file.llBytesWritten;
    observer_.Closed({opened_, file.szPath, file.dVideoWritten, file.dAudioWritten, file.llBytesWritten,
                      file.llPicturesReceived});
    if (const std::string missing = MissingFrom(file); !missing.empty() && !failure_)
        failure_.emplace(Category::kInternal, missing);
}

} // namespace movieconv
