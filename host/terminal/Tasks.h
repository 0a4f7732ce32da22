// What is done instead of converting.
#ifndef MOVIECONV_HOST_TERMINAL_TASKS_H
#define MOVIECONV_HOST_TERMINAL_TASKS_H

#include "host/terminal/ExitCode.h"
#include "host/terminal/Options.h"
#include "host/terminal/StandardStreams.h"

#include <optional>

namespace movieconv {

/// Does it, and prints what it gives; nothing when something is to be converted. Throws Failure.
std::optional<ExitCode> DoWithoutConverting(const Options& options, const StandardStreams& streams);

} // namespace movieconv

#endif
