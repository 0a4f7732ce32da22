// The movie's clock: signed counts of 100 ns from the start of the source.
#ifndef MOVIECONV_HOST_SOURCE_MEDIATIME_H
#define MOVIECONV_HOST_SOURCE_MEDIATIME_H

#include "media/MediaRecords.h"

#include <cmath>
#include <cstdint>

namespace movieconv {

/// Seconds that a stream is told to last at least: the engine takes a shorter one for absent.
constexpr double kShortestTold = 0.001;

inline int64_t ToMediaTime(double seconds) {
    return std::llround(seconds * kTicksPerSecond);
}
inline double ToSeconds(int64_t mediaTime) {
    return static_cast<double>(mediaTime) / kTicksPerSecond;
}

} // namespace movieconv

#endif
