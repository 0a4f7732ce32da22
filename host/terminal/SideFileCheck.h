// The files that the user has the program write beside the output: log, preview and plan.
#ifndef MOVIECONV_HOST_TERMINAL_SIDEFILECHECK_H
#define MOVIECONV_HOST_TERMINAL_SIDEFILECHECK_H

#include "host/terminal/Options.h"

namespace movieconv {

/// Throws Failure when the log, the preview or the plan would be written over what the program reads, or over
/// what else it writes, or the log over one of the others, or the preview over what is no preview.
void CheckSideFiles(const Options& options);

} // namespace movieconv

#endif
