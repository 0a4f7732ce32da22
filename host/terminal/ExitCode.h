// How the program ends, and what it adds to what a conversion tells. The numbers are part of its interface;
// the man page lists them.
#ifndef MOVIECONV_HOST_TERMINAL_EXITCODE_H
#define MOVIECONV_HOST_TERMINAL_EXITCODE_H

#include "host/convert/Failure.h"
#include "host/convert/Observer.h"
#include "host/presets/Preset.h"

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

ExitCode CodeOf(Category category);
ExitCode CodeOf(const Verdict& verdict);

/// Of a preset that was asked for.
Failure FailureOf(const PresetError& error);

/// What to tell the user of the program: with the option or the key that helps.
std::string Explain(const Failure& failure);
std::string Explain(const Warning& warning);

} // namespace movieconv

#endif
