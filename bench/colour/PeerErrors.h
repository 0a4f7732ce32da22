// How far libyuv's colours are from exact ones.
#ifndef MOVIECONV_BENCH_COLOUR_PEERERRORS_H
#define MOVIECONV_BENCH_COLOUR_PEERERRORS_H

namespace bench {

/// Runs each peer that computes colours over all 2^24 of them and prints its largest and mean difference from
/// the equations, and from BT.601 in real numbers; for comparison, the equations' own from the latter.
void printPeerErrors();

} // namespace bench

#endif
