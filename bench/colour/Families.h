// The colour routines that are measured, each with the nearest call of libyuv.
#ifndef MOVIECONV_BENCH_COLOUR_FAMILIES_H
#define MOVIECONV_BENCH_COLOUR_FAMILIES_H

#include "bench/colour/Pictures.h"

#include <array>
#include <span>

namespace bench {

constexpr int kSizes[][2] = {{640, 480}, {1920, 1080}, {3840, 2160}};

/// How much faster than the peer a routine shall be at each of `kSizes`, on whatever level.
using Goals = std::array<double, std::size(kSizes)>;

/// What a routine does to the samples: whether it computes, and so gains from vectors, and from which cube of
/// inputs.
enum class Kind { RgbToYuv, YuvToRgb, Average, Move };

struct Family {
    const char* name;
    Kind kind;
    void (*ours)(Pictures&);
    const char* peerName;
    void (*peer)(Pictures&);
    Goals goals;
    void (*accurate)(Pictures&) = nullptr; ///< By swscale; null where the routine computes no colours.
};

std::span<const Family> families();

} // namespace bench

#endif
