// The files that the program writes beside the output: log and preview.
#ifndef MOVIECONV_HOST_TERMINAL_SIDEFILECHECK_H
#define MOVIECONV_HOST_TERMINAL_SIDEFILECHECK_H

#include "host/terminal/Options.h"

namespace movieconv {

/// Throws Failure when the log or the preview would be written over what the program reads, or over
/// what else it writes, or over each other, or the preview over what is no preview.
void CheckSideFiles(const Options& options);

} // namespace movieconv

#endif
