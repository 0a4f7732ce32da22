// Which options go together.
#ifndef MOVIECONV_HOST_TERMINAL_OPTIONCHECKS_H
#define MOVIECONV_HOST_TERMINAL_OPTIONCHECKS_H

#include "host/terminal/Options.h"

namespace movieconv {

/// Whether the task takes the options of an output; the others leave them unread.
bool NeedsOutput(Task task);

/// Throws Failure (kRequest) when something is missing or options contradict each other. The preset must not
/// be applied yet: what it says gives way to options.
void CheckOptions(const Options& options);

} // namespace movieconv

#endif
