// Times and sizes as sentences for people show them.
#ifndef MOVIECONV_HOST_CONVERT_AMOUNTS_H
#define MOVIECONV_HOST_CONVERT_AMOUNTS_H

#include <cstdint>
#include <string>

namespace movieconv {

/// "h:mm:ss", with milliseconds "h:mm:ss.fff". Not below 0 and not above a thousand million seconds.
std::string FormatTime(double seconds, bool milliseconds = false);

/// "812 B", "3.1 kB", "41.3 MB", powers of 1000.
std::string FormatBytes(int64_t bytes);

/// "1.2 GB to 1.9 GB".
std::string FormatByteRange(int64_t least, int64_t most);

} // namespace movieconv

#endif
