// The vector kernels, written once for every instruction set whose vectors are lanes of 128 bits.
//
// A lane works on 16 pixels of its own and never looks at another lane: lane i of a vector holds the pixels
// 16 i to 16 i + 15 of a block, so that bytes, one a pixel, lie in memory order over all lanes. Rows of more
// bytes a pixel are loaded and stored lane by lane. `V` is the instruction set: its vector type and one
// inline function for each instruction, defined without linkage in the file that makes the table, so that
// nothing compiled for one instruction set is shared with another.
//
// Every kernel is flattened: one loop without a call, its constants in registers.
//
// Widths: whole blocks, then the last whole block of an even width once more over what has been written,
// which gives the same bytes. Pictures narrower than a block go to the next lower level. An odd last column
// is made while its row is near: in place where that is short, since a call would make the vectors load their
// constants anew for every row, else by the plain kernels.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_LANEBLOCKS_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_LANEBLOCKS_H

#include "Common/Image/kernels/RowKernels.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <type_traits>

namespace image {
namespace {

/// The contents of one lane, repeated in all.
using LaneBytes = std::array<int8_t, 16>;

/// Pixels of a block.
template <class V>
constexpr ptrdiff_t kLanePixels = sizeof(typename V::Vec);

/// Whether the kernels are those for large targets.
template <class V>
constexpr bool kPastCaches = !std::is_same_v<V, typename V::Cached>;

/// Calls block(x) so that all columns of an even width are covered, and last(done) for an odd column
/// behind them. The width is not less than a block. One place calls the block, so that the compiler keeps
/// its constants in registers.
template <class Block, class Last>
void ForBlocks(ptrdiff_t width, ptrdiff_t blockPixels, Block block, Last last) {
    const ptrdiff_t even = width & ~ptrdiff_t{1};
    const ptrdiff_t lastBlock = even - blockPixels;
    for (ptrdiff_t x = 0; x < lastBlock; x += blockPixels)
        block(x);
    block(lastBlock);
    if (even < width)
        last(even);
}

/// Of an even width.
template <class Block>
void ForBlocks(ptrdiff_t width, ptrdiff_t blockPixels, Block block) {
    ForBlocks(width, blockPixels, block, [](ptrdiff_t) {});
}

/// The size of what is left of a pair of rows.
inline Size LastColumn(ptrdiff_t row0, ptrdiff_t row1) {
    return {1, row1 - row0 + 1};
}

inline RowPair Advance(RowPair rows, ptrdiff_t bytes) {
    return {rows.first + bytes, rows.second + bytes};
}
inline PlanesPair Advance(PlanesPair planes, ptrdiff_t columns) {
    return {Advance(planes.y, columns), planes.u + columns / 2, planes.v + columns / 2};
}

/// Stores the bytes of two vectors alternating.
template <class V>
void StoreInterleaved(uint8_t* p, typename V::Vec even, typename V::Vec odd) {
    const typename V::Vec halves[2] = {V::UnpackLo8(even, odd), V::UnpackHi8(even, odd)};
    V::StoreLanes(p, halves);
}

} // namespace
} // namespace image

#endif
