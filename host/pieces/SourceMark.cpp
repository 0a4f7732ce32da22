#include "host/pieces/Plan.h"

#include "host/convert/Failure.h"
#include "host/pieces/Descriptor.h"
#include "host/pieces/Digest.h"

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

SourceMark MarkOf(const std::string& path) {
    const Descriptor file(open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
    struct stat status {};
    if (file.Number() < 0 || fstat(file.Number(), &status) != 0)
        throw CannotRead(path, std::strerror(errno));
    if (!S_ISREG(status.st_mode))
        throw Failure(Category::kSource,
                      fmt::format("\"{}\" is not a file but a pipe, a device or a folder: it cannot be read "
                                  "once for every piece",
                                  path));
    SourceMark mark;
    mark.path = std::filesystem::absolute(path).lexically_normal().string();
    mark.bytes = status.st_size;
    mark.modified = int64_t{status.st_mtim.tv_sec} * kNanoseconds + status.st_mtim.tv_nsec;
    const int64_t edge = std::min(mark.bytes, kEdge);
    mark.head = EdgeOf(path, file.Number(), 0, edge);
    mark.tail = EdgeOf(path, file.Number(), mark.bytes - edge, edge);
    return mark;
}

void CheckAgainst(const Plan& plan) {
    const SourceMark now = MarkOf(plan.source.path);
    std::string what;
    if (now.bytes != plan.source.bytes)
        what = fmt::format("it has {} bytes, not {}", now.bytes, plan.source.bytes);
    else if (now.head != plan.source.head || now.tail != plan.source.tail)
        what = "it holds something else";
    else if (now.modified != plan.source.modified)
        what = "it was written to since";
    if (!what.empty())
        throw Failure(Category::kSource,
                      fmt::format("\"{}\" is not the source that was planned: {}", plan.source.path, what));
    for (const auto& [name, version] : CurrentVersions()) {
        const auto planned = plan.versions.find(name);
        if (planned == plan.versions.end() || planned->second != version)
            throw Failure(Category::kRequest,
                          fmt::format("the plan was made with {} {}, here is {}: the pieces would not fit",
                                      name, planned == plan.versions.end() ? "unknown" : planned->second,
                                      version));
    }
}

} // namespace movieconv
