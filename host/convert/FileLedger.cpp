#include "host/convert/FileLedger.h"

#include "host/convert/Amounts.h"
#include "host/convert/Room.h"
#include "host/convert/WritersWords.h"
#include "host/sentence/Say.h"
#include "text/Path.h"

#include <algorithm>
#include <cmath>

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
Sentence TellFailure(const WriterStatus& failure) {
    Sentence what = WritersWords(failure);
    if (failure.nError == kWriterErrorNoSpace) {
        const int64_t free = FreeBytes(text::FolderOf(failure.szPath));
        what =
            Say("{}; {} were written, {} are free: make room or choose another disk", what,
                SayAmount(FormatBytes(failure.llBytesWritten)), SayAmount(FormatBytes(free > 0 ? free : 0)));
    }
    const std::string path = failure.szPath;
    const std::string left = failure.szTemporaryPath;
    return left.empty()
               ? Say("cannot write \"{}\": {}", path, what)
               : Say("cannot write \"{}\": {}; what was written so far is in \"{}\"", path, what, left);
}

/// Compares a complete file with what was sent into it. Empty when everything is there.
Sentence MissingFrom(const WriterStatus& file) {
    const auto lacks = [](double written, double received, double frame) {
        return std::abs(written - received) > std::max(kLengthTolerance, frame);
    };
    const std::string path = file.szPath;
    const double picture =
        file.dVideoWritten / static_cast<double>(std::max<int64_t>(1, file.llPicturesWritten));
    if (lacks(file.dVideoWritten, file.dVideoReceived, picture))
        return Say("\"{}\" holds {:.3f} s of pictures, but {:.3f} s were sent into it", path,
                   file.dVideoWritten, file.dVideoReceived);
    if (lacks(file.dAudioWritten, file.dAudioReceived, 0))
        return Say("\"{}\" holds {:.3f} s of sound, but {:.3f} s were sent into it", path, file.dAudioWritten,
                   file.dAudioReceived);
    return {};
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
        failure_.emplace(CategoryOf(news.status.nError), TellFailure(news.status),
                         ReasonOf(news.status.nError));
        failed_ = news.status.szPath;
    }
    // What remains of the file is known now.
    if (news.event == kWriterEventClosed && !failed_.empty() && failed_ == news.status.szPath)
        failure_.emplace(failure_->Kind(), TellFailure(news.status), failure_->Why());
    return !(wasWell && failure_);
}

std::optional<Sentence> FileLedger::FindMissing() const {
    for (const Entry& entry : complete_) {
        const FileIdentity now = IdentityOf(entry.path);
        if (entry.identity.exists && now == entry.identity)
            continue;
        if (!now.exists)
            return Say("\"{}\" was written but stands there no more: it vanished meanwhile", entry.path);
        return Say("\"{}\" was written, but another file stands there now", entry.path);
    }
    return std::nullopt;
}

void FileLedger::EnterClosed(const WriterWatch::News& news) {
    const WriterStatus& file = news.status;
    if (file.nState != kWriterFileComplete)
        return;
    complete_.push_back({file.szPath, news.identity});
    if (news.identity.exists && news.identity.size != file.llBytesWritten && !failure_) {
        failure_.emplace(Category::kOutput, Say("\"{}\" has {} bytes, but {} were written into it",
                                                file.szPath, news.identity.size, file.llBytesWritten));
    }
    if (file.nWidth > 0 && file.llPicturesReceived == 0)
        withoutPictures_.emplace_back(file.szPath);
    bytes_ += file.llBytesWritten;
    observer_.Closed({opened_, file.szPath, file.dVideoWritten, file.dAudioWritten, file.llBytesWritten,
                      file.llPicturesReceived});
    if (const Sentence missing = MissingFrom(file); !missing.IsEmpty() && !failure_)
        failure_.emplace(Category::kInternal, missing);
}

} // namespace movieconv
