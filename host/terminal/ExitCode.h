// How the program ends. The numbers are part of its interface; the man page lists them.
#ifndef MOVIECONV_HOST_TERMINAL_EXITCODE_H
#define MOVIECONV_HOST_TERMINAL_EXITCODE_H

#include <stdexcept>
#include <string>

namespace movieconv {

enum class ExitCode : int {
    kDone = 0,
    kInternal = 1,
    kUsage = 2,
    kCannotRead = 3,
    kCannotWrite = 4,
    kNoSpace = 5,
    kStopped = 6,
};

/// A failure that ends the program: what, where and what to do, and the exit code for it.
class Failure : public std::runtime_error {
public:
    Failure(ExitCode code, const std::string& text) : std::runtime_error(text), code_(code) {}
    ExitCode Code() const { return code_; }

private:
    ExitCode code_;
};

} // namespace movieconv

#endif
