// The instruction-set levels as the benchmark names them, with what libyuv has to do without on each.
#ifndef MOVIECONV_BENCH_COLOUR_LEVELS_H
#define MOVIECONV_BENCH_COLOUR_LEVELS_H

#include "Common/Image/kernels/RowKernels.h"

#include <iterator>
#include <vector>

namespace bench {

struct Level {
    const char* name;
    image::KernelLevel kernels;
    int libyuvFlags; ///< What libyuv may use at most.
};

/// The levels that this processor has, the plain one first.
std::vector<Level> levels();

/// Makes the colour routines, and libyuv, work on a level from now on.
void use(const Level& level);

} // namespace bench

#endif
