#include "host/pieces/SourceMark.h"

#include "host/convert/Failure.h"
#include "host/pieces/Digest.h"
#include "host/source/BurnWish.h"
#include "text/Descriptor.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <filesystem>
#include <fmt/format.h>
#include <sys/stat.h>
#include <unistd.h>

namespace movieconv {
namespace {

constexpr int64_t kEdge = 64 * 1024;
constexpr int64_t kNanoseconds = 1'000'000'000;

Failure CannotRead(const std::string& path, const std::string& reason) {
    return {Category::kSource, fmt::format("cannot read \"{}\": {}", path, reason)};
}

std::string EdgeOf(const std::string& path, int descriptor, int64_t offset, int64_t size) {
    Digest digest;
    if (!AddFile(digest, descriptor, offset, size))
        throw CannotRead(path, errno != 0 ? std::strerror(errno) : "it became shorter meanwhile");
    return digest.Hex();
}

} // namespace

/// Behind a link ".." leads elsewhere than the names tell; other links may change, and stay as they are.
std::string AbsolutePath(const std::string& path) {
    const std::filesystem::path whole = std::filesystem::absolute(path);
    if (std::find(whole.begin(), whole.end(), "..") == whole.end())
        return whole.lexically_normal().string();
    return (std::filesystem::weakly_canonical(whole.parent_path()) / whole.filename()).string();
}

SourceMark MarkOf(const std::string& path) {
    const text::Descriptor file(open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
    struct stat status {};
    if (file.Number() < 0 || fstat(file.Number(), &status) != 0)
        throw CannotRead(path, std::strerror(errno));
    if (!S_ISREG(status.st_mode))
        throw Failure(Category::kSource,
                      fmt::format("\"{}\" is not a file but a pipe, a device or a folder: it cannot be read "
                                  "once for every piece",
                                  path));
    SourceMark mark;
    mark.path = AbsolutePath(path);
    mark.bytes = status.st_size;
    mark.modified = int64_t{status.st_mtim.tv_sec} * kNanoseconds + status.st_mtim.tv_nsec;
    const int64_t edge = std::min(mark.bytes, kEdge);
    mark.head = EdgeOf(path, file.Number(), 0, edge);
    mark.tail = EdgeOf(path, file.Number(), mark.bytes - edge, edge);
    return mark;
}

std::vector<SourceMark> MarkTexts(Request& request) {
    std::vector<std::string*> names;
    for (SubtitleFileWish& wish : request.subtitleFiles)
        names.push_back(&wish.path);
    if (!request.burnSubtitles.empty() && !NamesStream({request.burnSubtitles, {}}))
        names.push_back(&request.burnSubtitles);
    std::vector<SourceMark> marks;
    for (std::string* name : names) {
        try {
            marks.push_back(MarkOf(*name));
        } catch (const Failure& failure) {
            throw Failure(Category::kRequest, failure.Words());
        }
        *name = marks.back().path;
    }
    return marks;
}

} // namespace movieconv
