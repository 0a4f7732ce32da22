#include "host/source/CompanionFiles.h"

#include "host/sentence/Say.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <filesystem>
#include <new>
#include <system_error>
#include <utility>

namespace movieconv {
namespace {

namespace fs = std::filesystem;

constexpr int kMostOpenings = 16; // of one file while the source is opened; to find out what it is takes two

/// The path behind a name as demultiplexers make it, "file:..." or a path alone. Empty for any other
/// protocol.
std::string PathOf(const std::string& url) {
    const std::string prefix = "file:";
    if (url.compare(0, prefix.size(), prefix) == 0)
        return url.substr(prefix.size());
    const std::size_t end = url.find_first_of(":/");
    return end != std::string::npos && url[end] == ':' ? std::string() : url;
}

bool LiesBelow(const fs::path& path, const fs::path& folder) {
    const auto [inFolder, inPath] = std::mismatch(folder.begin(), folder.end(), path.begin(), path.end());
    return inFolder == folder.end() && inPath != path.end();
}

} // namespace

CompanionFiles::CompanionFiles(std::string path, bool allowed,
                               std::shared_ptr<const Interruption> interruption)
    : source_(std::move(path)), allowed_(allowed), interruption_(std::move(interruption)) {}

void CompanionFiles::Guard(AVFormatContext& context) {
    context.opaque = this;
    context.io_open = OnOpen;
    context.io_close2 = OnClose;
}

std::string CompanionFiles::Permit(const std::string& url) const {
    const Sentence another = Say("it names \"{}\", another file", url);
    std::error_code failed;
    const std::string path = PathOf(url);
    if (path.empty())
        throw SourceError(Say("it names \"{}\", which is not a file's name", url));
    const fs::path real = fs::canonical(path, failed);
    const fs::path source = failed ? fs::path() : fs::canonical(source_, failed);
    if (failed)
        throw SourceError(allowed_ ? Say("it names \"{}\", which does not exist", url) : another);
    if (real == source)
        return real.string();
    if (!allowed_)
        throw SourceError(another);
    if (!LiesBelow(real, source.parent_path()))
        throw SourceError(Say("it names \"{}\", which lies outside its folder", url));
    if (!fs::is_regular_file(real, failed))
        throw SourceError(Say("it names \"{}\", which is no regular file", url));
    return real.string();
}

std::unique_ptr<InputFile> CompanionFiles::Open(const std::string& path) const {
    return std::make_unique<InputFile>(path, Growth::kRead, interruption_);
}

int CompanionFiles::OnOpen(AVFormatContext* context, AVIOContext** io, const char* url, int flags,
                           AVDictionary** /*options*/) {
    auto& self = *static_cast<CompanionFiles*>(context->opaque);
    try {
        if ((flags & AVIO_FLAG_WRITE) != 0)
            return AVERROR(EACCES);
        const std::string path = self.Permit(url);
        if (!self.repetition_ && ++self.openings_[path] > kMostOpenings)
            throw SourceError(Say("it names \"{}\" over and over", url));
        auto file = self.Open(path);
        *io = file->Io();
        self.open_[*io] = std::move(file);
        return 0;
    } catch (const SourceError& refusal) {
        if (self.refusal_.IsEmpty())
            self.refusal_ = refusal.Words();
        return AVERROR(EACCES);
    } catch (const std::system_error& error) {
        if (self.refusal_.IsEmpty())
            self.refusal_ = Say("it names \"{}\": {}", url, error.code().message());
        return AVERROR(error.code().value());
    } catch (const std::bad_alloc&) {
        return AVERROR(ENOMEM);
    }
}

int CompanionFiles::OnClose(AVFormatContext* context, AVIOContext* io) {
    static_cast<CompanionFiles*>(context->opaque)->open_.erase(io);
    return 0;
}

} // namespace movieconv
