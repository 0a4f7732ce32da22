// The movie's clock: signed counts of 100 ns from the start of the source.
#ifndef MOVIECONV_HOST_MEDIATIME_H
#define MOVIECONV_HOST_MEDIATIME_H

#include <cmath>
#include <cstdint>

namespace host {

constexpr int64_t kMediaSecond = 10'000'000;

inline int64_t ToMediaTime(double seconds) {
    return std::llround(seconds * kMediaSecond);
}
inline double ToSeconds(int64_t mediaTime) {
    return static_cast<double>(mediaTime) / kMediaSecond;
}

} // namespace host

#endif
