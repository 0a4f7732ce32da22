#include "host/pieces/FileLock.h"

#include "host/convert/Failure.h"
#include "host/pieces/OutputNames.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <fmt/format.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

namespace movieconv {
namespace {

/// On network file systems a lock takes the right to write, which nobody has to another user's file, nor to a
/// folder. Where a file may be made, a folder is something else in its place.
int OpenToLock(const std::string& path, int further) {
    constexpr int kFlags = O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK;
    const int descriptor = open(path.c_str(), O_RDWR | kFlags | further, 0666);
    const bool mayBeRead = errno == EACCES || (errno == EISDIR && (further & O_CREAT) == 0);
    return descriptor < 0 && mayBeRead ? open(path.c_str(), O_RDONLY | kFlags) : descriptor;
}

FileLock::State Lock(int descriptor) {
    if (descriptor < 0)
        return FileLock::State::kRefused;
    if (flock(descriptor, LOCK_EX | LOCK_NB) == 0)
        return FileLock::State::kHeld;
    switch (errno) {
    case EWOULDBLOCK:
        return FileLock::State::kElsewhere;
    case ENOLCK:
    case ENOSYS:
    case EOPNOTSUPP:
        return FileLock::State::kUnknown;
    default:
        return FileLock::State::kRefused;
    }
}

Failure CannotLock(const std::string& path) {
    return {Category::kOutput, fmt::format("cannot lock \"{}\": {}", path, std::strerror(errno))};
}

bool IsEmptyFile(const std::string& path) {
    struct stat status {};
    return lstat(path.c_str(), &status) == 0 && S_ISREG(status.st_mode) && status.st_size == 0;
}

} // namespace

FileLock::FileLock(const std::string& path) : file_(OpenToLock(path, 0)), state_(Lock(file_.Number())) {}

RunLock::RunLock(const std::string& guarded) : path_(LockPathFor(guarded)) {
    while (!Take()) {
    }
    if (lock_ && lock_->Result() == FileLock::State::kElsewhere)
        throw Failure(
            Category::kOutput,
            fmt::format(
                "another run is working on \"{}\"; wait until it ends, or give the output another name",
                guarded));
}

/// False when whoever held it removed it in between: what is held has no name then.
bool RunLock::Take() {
    const text::Descriptor made(OpenToLock(path_, O_CREAT));
    struct stat before {};
    struct stat now {};
    if (made.Number() < 0 && errno == ENAMETOOLONG) // nor is there a list or plan of such a name
        return true;
    if (made.Number() < 0 || fstat(made.Number(), &before) != 0)
        throw CannotLock(path_);
    lock_.emplace(path_);
    const int error = errno;
    const bool same =
        lstat(path_.c_str(), &now) == 0 && before.st_dev == now.st_dev && before.st_ino == now.st_ino;
    errno = error;
    if (same && lock_->Result() == FileLock::State::kRefused)
        throw CannotLock(path_);
    return same || lock_->Result() == FileLock::State::kElsewhere;
}

/// Others' files of that name are not empty.
RunLock::~RunLock() {
    if (IsEmptyFile(path_))
        unlink(path_.c_str());
}

} // namespace movieconv
