// All 2^24 colours as pictures, and what the equations make of them.
#ifndef MOVIECONV_BENCH_COLOUR_COLOURCUBE_H
#define MOVIECONV_BENCH_COLOUR_COLOURCUBE_H

#include "bench/colour/Pictures.h"

namespace bench {

// A slice of the cube is a picture of 2x2 blocks, one for each pair of values of two components.
inline constexpr int kBlocks = 256;
inline constexpr int kSliceSize = 2 * kBlocks;

struct Triple {
    int a, b, c;
    bool operator==(const Triple&) const = default;
};

/// Y, U and V as the routines promise them.
Triple yuvOf(int b, int g, int r);
/// B, G and R.
Triple bgrOf(int y, int u, int v);

/// Paints slice 0 to 255 into every source. Blue and U grow with the column, green and Y with the row; red
/// and V are the slice.
void paintSlice(Pictures& p, int slice);

} // namespace bench

#endif
