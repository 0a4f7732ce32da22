#include "host/source/CompanionFiles.h"

#include "host/source/SourceError.h"

#include <algorithm>
#include <filesystem>
#include <fmt/format.h>
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
    const auto refuse = [&](const char* reason) {
        return SourceError(fmt::format("it names \"{}\", {}", url, reason));
    };
    std::error_code failed;
    const std::string path = PathOf(url);
    if (path.empty())
        throw refuse("which is not a file's name");
    const fs::path real = fs::canonical(path, failed);
    const fs::path source = failed ? fs::path() : fs::canonical(source_, failed);
    if (failed)
        throw refuse(allowed_ ? "which does not exist" : "another file");
    if (real == source)
        return real.string();
    if (!allowed_)
        throw refuse("another file");
    if (!LiesBelow(real, source.parent_path()))
        throw refuse("which lies outside its folder");
    if (!fs::is_regular_file(real, failed))
        throw refuse("which is no regular file");
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
            throw SourceError(fmt::format("it names \"{}\" over and over", url));
        auto file = self.Open(path);
        *io = file->Io();
        self.open_[*io] = std::move(file);
        return 0;
    } catch (const SourceError& refusal) {
        if (self.refusal_.empty())
            self.refusal_ = refusal.what();
        return AVERROR(EACCES);
    } catch (const std::system_error& error) {
        if (self.refusal_.empty())
            self.refusal_ = fmt::format("it names \"{}\": {}", url, error.code().message());
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
