// Runs the program as a user would.
#ifndef MOVIECONV_TESTS_SUPPORT_PROGRAM_H
#define MOVIECONV_TESTS_SUPPORT_PROGRAM_H

#include "tests/support/Process.h"

#include <string>
#include <sys/types.h>
#include <vector>

namespace program {

using Result = ProcessResult;

/// Runs a program, its name first, to its end.
Result Run(const std::vector<std::string>& command);

/// Runs movieconv to its end: with the preset classic, whose encoders take the least time, unless the
/// arguments name one.
Result Call(const std::vector<std::string>& arguments);

/// A movieconv that runs beside the test, with the same preset.
class Running {
public:
    /// On a terminal, standard output and standard error come together and keys can be pressed.
    Running(const std::vector<std::string>& arguments, bool terminal);
    Running(const Running&) = delete;
    Running& operator=(const Running&) = delete;
    ~Running();

    /// Reads what it prints until the regular expression `pattern` has matched once more since the last call.
    /// False when it ended before. A position can be passed over between two lines of progress: ask for a
    /// range.
    bool WaitFor(const std::string& pattern);

    /// False when it ended instead.
    bool WaitUntilSuspended() const;

    /// Fills the pipe that it prints into, so that it waits at its next line until what it printed is read.
    void Jam() const;

    /// Whether it has come to its end, which Finish has still to take.
    bool HasEnded() const;

    /// Whether its terminal shows what is typed, as it does without the program.
    bool Echoes() const;

    void Signal(int signal) const;
    void Press(const std::string& keys) const;
    Result Finish();

private:
    bool ReadSome();

    pid_t child_ = -1;
    int output_ = -1;
    std::string printed_;
    std::size_t seen_ = 0;
};

} // namespace program

#endif
