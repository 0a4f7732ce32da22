// The unit of the time stamps in VideoImage and AudioFrame.
#ifndef MOVIECONV_WRITER_MEDIATIME_H
#define MOVIECONV_WRITER_MEDIATIME_H

#include <cstdint>

namespace writer {

/// 100 ns units in a second.
inline constexpr int64_t kUnitsPerSecond = 10'000'000;

} // namespace writer

#endif
