#include "host/pieces/FileLock.h"

#include "host/convert/Failure.h"
#include "host/pieces/OutputNames.h"

#include <cerrno>
#include <fcntl.h>
#include <fmt/format.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

namespace movieconv {
namespace {

// On network file systems a lock takes the right to write.
constexpr int kLockFlags = O_RDWR | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK;

FileLock::State Lock(int descriptor) {
    if (descriptor < 0)
        return FileLock::State::kUnknown;
    if (flock(descriptor, LOCK_EX | LOCK_NB) == 0)
        return FileLock::State::kHeld;
    return errno == EWOULDBLOCK ? FileLock::State::kElsewhere : FileLock::State::kUnknown;
}

bool IsEmptyFile(const std::string& path) {
    struct stat status {};
    return lstat(path.c_str(), &status) == 0 && S_ISREG(status.st_mode) && status.st_size == 0;
}

} // namespace

FileLock::FileLock(const std::string& path)
    : file_(open(path.c_str(), kLockFlags)), state_(Lock(file_.Number())) {}

PlanLock::PlanLock(const std::string& planPath) : path_(LockPathFor(planPath)) {
    while (!Take()) {
    }
    if (lock_->Result() == FileLock::State::kElsewhere)
        throw Failure(
            Category::kOutput,
            fmt::format("another run is working on \"{}\" and its pieces; wait until it ends, or give "
                        "the output another name",
                        planPath));
}

/// False when whoever held it removed it in between: what is held has no name then.
bool PlanLock::Take() {
    const text::Descriptor made(open(path_.c_str(), kLockFlags | O_CREAT, 0666));
    lock_.emplace(path_);
    struct stat before {};
    struct stat now {};
    return lock_->Result() == FileLock::State::kElsewhere || fstat(made.Number(), &before) != 0 ||
           (stat(path_.c_str(), &now) == 0 && before.st_dev == now.st_dev && before.st_ino == now.st_ino);
}

/// Others' files of that name are not empty.
PlanLock::~PlanLock() {
    if (IsEmptyFile(path_))
        unlink(path_.c_str());
}

} // namespace movieconv
