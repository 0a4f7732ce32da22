// How far the output's clock, which counts the bytes of sound, is from the stamps of the source's blocks.
#ifndef MOVIECONV_ENGINE_SOUNDCLOCK_H
#define MOVIECONV_ENGINE_SOUNDCLOCK_H

#include "engine/Arithmetic.h"
#include "media/MediaRecords.h"

#include <algorithm>
#include <cstdint>
#include <limits>

/// Counts over all clips of a conversion. Times count 100 ns.
class SoundClock {
public:
    /// A block of `bytes` with this stamp is written, `bytesPerSecond` of them a second.
    void Add(int64_t stamp, int32_t bytes, int32_t bytesPerSecond) {
        if (!begun)
            origin = stamp;
        begun = true;
        const int64_t moved = WrapSub(Truncate<int64_t>(seconds * kTicksPerSecond), WrapSub(stamp, origin));
        shift = std::max(moved, -std::numeric_limits<int64_t>::max()); // its magnitude has a value
        if (bytesPerSecond > 0)
            seconds += static_cast<double>(bytes) / bytesPerSecond;
    }

    /// What the last block, and a picture after it, was moved by against the first one; positive: later.
    int64_t Shift() const { return shift; }

private:
    bool begun = false;
    int64_t origin = 0;
    double seconds = 0.0;
    int64_t shift = 0;
};

#endif
