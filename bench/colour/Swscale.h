// Conversions by swscale in its accurate mode: the peer for whoever needs exact colours.
#ifndef MOVIECONV_BENCH_COLOUR_SWSCALE_H
#define MOVIECONV_BENCH_COLOUR_SWSCALE_H

#include "bench/colour/Pictures.h"

namespace bench {

enum class Layout { Rgb24, Rgb32, Packed, Planes };

/// From a layout of the sources to one of the targets, with accurate rounding and chroma at full resolution
/// inside. Not for several threads at once.
void convertAccurately(Pictures& p, Layout from, Layout to);

} // namespace bench

#endif
