// How the exported routines see pictures, and the walks over their rows.
#ifndef MOVIECONV_COMMON_IMAGE_PICTUREVIEWS_H
#define MOVIECONV_COMMON_IMAGE_PICTUREVIEWS_H

#include "Common/Image/kernels/RowKernels.h"

#include <cstddef>
#include <cstdint>

namespace image {

/// Rows of a picture or plane from the top: the first byte of row 0, and the signed distance to the next row.
struct Rows {
    uint8_t* first;
    ptrdiff_t step;

    uint8_t* operator[](ptrdiff_t row) const { return first + row * step; }

    bool AlignedTo(ptrdiff_t bytes) const {
        return reinterpret_cast<uintptr_t>(first) % static_cast<uintptr_t>(bytes) == 0 && step % bytes == 0;
    }

    /// The same rows beginning at another row and byte.
    Rows At(ptrdiff_t row, ptrdiff_t byte) const { return {(*this)[row] + byte, step}; }

    RowPair<uint8_t> Targets(ptrdiff_t row0, ptrdiff_t row1) const { return {(*this)[row0], (*this)[row1]}; }
    RowPair<const uint8_t> Sources(ptrdiff_t row0, ptrdiff_t row1) const {
        return {(*this)[row0], (*this)[row1]};
    }
};

/// The rows of a picture whose top row is the last of `height` rows in memory.
inline Rows BottomUp(uint8_t* bits, ptrdiff_t pitch, ptrdiff_t height) {
    return {bits + (height - 1) * pitch, -pitch};
}

/// A planar 4:2:0 picture.
struct Planes420 {
    Rows y, u, v;

    /// The same picture beginning at a pixel; halves of odd positions round toward zero.
    Planes420 At(ptrdiff_t column, ptrdiff_t row) const {
        return {y.At(row, column), u.At(row / 2, column / 2), v.At(row / 2, column / 2)};
    }
};

/// A packed picture with its size in pixels.
struct Picture {
    Rows rows;
    ptrdiff_t width;
    ptrdiff_t height;
    ptrdiff_t pixelBytes;

    int64_t Pixels() const { return int64_t{width} * height; }

    /// The picture without an odd last column and row.
    Picture WholeBlocks() const { return {rows, width & ~ptrdiff_t{1}, height & ~ptrdiff_t{1}, pixelBytes}; }
};

/// Calls visit(row0, row1, chromaRow) for every pair of rows. An odd last row comes as a pair with itself:
/// averaging a row with itself gives exactly the average of the pixels that exist, and writing it twice
/// writes the same bytes.
template <class Visit>
void ForRowPairs(ptrdiff_t height, Visit visit) {
    for (ptrdiff_t row = 0; row < height; row += 2)
        visit(row, row + 1 < height ? row + 1 : row, row / 2);
}

/// Calls visit(target, source, bytes) for rows of `bytes` bytes that are treated alike, all at once where
/// they join up.
template <class Visit>
void ForRows(Rows target, Rows source, ptrdiff_t bytes, ptrdiff_t height, Visit visit) {
    if (target.step == bytes && source.step == bytes) {
        visit(target.first, source.first, bytes * height);
        return;
    }
    for (ptrdiff_t row = 0; row < height; ++row)
        visit(target[row], source[row], bytes);
}

} // namespace image

#endif
