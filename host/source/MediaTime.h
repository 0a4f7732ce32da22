// The movie's clock: signed counts of 100 ns from the start of the source.
#ifndef MOVIECONV_HOST_SOURCE_MEDIATIME_H
#define MOVIECONV_HOST_SOURCE_MEDIATIME_H

#include "media/MediaRecords.h"

#include <cmath>
#include <cstdint>

namespace movieconv {

inline int64_t ToMediaTime(double seconds) {
    return std::llround(seconds * kTicksPerSecond);
}
inline double ToSeconds(int64_t mediaTime) {
    return static_cast<double>(mediaTime) / kTicksPerSecond;
}

} // namespace movieconv

#endif
