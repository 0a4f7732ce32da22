// Looks at the output's place before anything is written.
#ifndef MOVIECONV_HOST_CONVERT_OUTPUTCHECK_H
#define MOVIECONV_HOST_CONVERT_OUTPUTCHECK_H

#include "host/terminal/Options.h"

#include <cstdint>
#include <string>

namespace movieconv {

/// Throws Failure when the output, or a clip of it, would replace the input or an existing file without
/// leave, cannot be written where it is to go, or has a name that is too long for the file system or of which
/// no clip names can be made.
void CheckOutput(const Options& options);

/// Throws Failure when the log or the preview would be written over the source, the output, a clip of it or
/// its temporary file, or over each other, or the preview over what is no preview.
void CheckSideFiles(const Options& options);

/// Bytes that an ordinary user can still write to the file system of `folder`; -1 when it cannot be told.
int64_t FreeBytes(const std::string& folder);

} // namespace movieconv

#endif
