// Holds the routines that are about to be measured against the equations and against the plain kernels.
#ifndef MOVIECONV_BENCH_COLOUR_EXACTNESS_H
#define MOVIECONV_BENCH_COLOUR_EXACTNESS_H

#include "bench/colour/Levels.h"

namespace bench {

/// Runs every routine on every level over all 2^24 colours, and over random pictures of odd and even sizes.
/// @return whether all were right in every bit; says on standard error which were not.
bool checkExactness(const std::vector<Level>& levels);

} // namespace bench

#endif
