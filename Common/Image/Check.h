// The checks of the exported routines: always compiled in, with a line number that belongs to the check and
// stays with it wherever the code moves.
#ifndef MOVIECONV_COMMON_IMAGE_CHECK_H
#define MOVIECONV_COMMON_IMAGE_CHECK_H

namespace image {

/// Writes the failed check to standard error and aborts.
[[noreturn]] void CheckFailed(unsigned line, const char* condition);

} // namespace image

#define CHECK_AT(line, condition)                                                                            \
    ((condition) ? static_cast<void>(0) : ::image::CheckFailed(line, #condition))

#endif
