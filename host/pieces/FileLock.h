// Keeps two processes from working on the same files at once.
#ifndef MOVIECONV_HOST_PIECES_FILELOCK_H
#define MOVIECONV_HOST_PIECES_FILELOCK_H

#include "text/Descriptor.h"

#include <optional>
#include <string>

namespace movieconv {

/// Holds a file or folder that is there, if nobody else does, for as long as the object exists. A process
/// that is killed holds nothing any more.
class FileLock {
public:
    enum class State {
        kHeld,
        kElsewhere, ///< Another process holds it, or another FileLock.
        kUnknown,   ///< Its file system knows no locks.
        kRefused,   ///< There is none, or it may not be held.
    };

    explicit FileLock(const std::string& path);
    State Result() const { return state_; }

private:
    const text::Descriptor file_;
    const State state_;
};

/// The right to work on a plan and its pieces, or on clips and their list: an empty file beside it, which
/// goes away in the end.
class RunLock {
public:
    /// Throws Failure when another run has it, or it cannot be had. Where there are no locks, everybody gets
    /// it.
    explicit RunLock(const std::string& guarded);
    RunLock(const RunLock&) = delete;
    RunLock& operator=(const RunLock&) = delete;
    ~RunLock();

private:
    bool Take();

    const std::string path_;
    std::optional<FileLock> lock_;
};

} // namespace movieconv

#endif
