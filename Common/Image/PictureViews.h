// How routines and kernels see pictures, and the walks over their rows.
//
// The kernels of every instruction set call these functions. They are always inlined, so that nothing
// compiled for one instruction set is shared with another.
#ifndef MOVIECONV_COMMON_IMAGE_PICTUREVIEWS_H
#define MOVIECONV_COMMON_IMAGE_PICTUREVIEWS_H

#include <cstddef>
#include <cstdint>

namespace image {

/// Two rows that share chroma; the same row twice at the end of an odd height.
struct RowPair {
    uint8_t* first;
    uint8_t* second;
};

/// Rows of a picture or plane from the top: the first byte of row 0, and the signed distance to the next row.
struct Rows {
    uint8_t* first;
    ptrdiff_t step;

    [[gnu::always_inline]] uint8_t* operator[](ptrdiff_t row) const { return first + row * step; }

    bool AlignedTo(ptrdiff_t bytes) const {
        return reinterpret_cast<uintptr_t>(first) % static_cast<uintptr_t>(bytes) == 0 && step % bytes == 0;
    }

    /// The same rows beginning at another row and byte.
    [[gnu::always_inline]] Rows At(ptrdiff_t row, ptrdiff_t byte) const {
        return {(*this)[row] + byte, step};
    }

    [[gnu::always_inline]] RowPair Pair(ptrdiff_t row0, ptrdiff_t row1) const {
        return {(*this)[row0], (*this)[row1]};
    }
};

/// The rows of a picture whose top row is the last of `height` rows in memory.
inline Rows BottomUp(uint8_t* bits, ptrdiff_t pitch, ptrdiff_t height) {
    return {bits + (height - 1) * pitch, -pitch};
}

/// Columns and rows.
struct Size {
    ptrdiff_t width;
    ptrdiff_t height;
};

/// A planar 4:2:0 picture.
struct Planes420 {
    Rows y, u, v;

    /// The same picture beginning at a pixel; halves of odd positions round toward zero.
    [[gnu::always_inline]] Planes420 At(ptrdiff_t column, ptrdiff_t row) const {
        return {y.At(row, column), u.At(row / 2, column / 2), v.At(row / 2, column / 2)};
    }
};

/// Two rows of luma and the row of chroma that they share.
struct PlanesPair {
    RowPair y;
    uint8_t* u;
    uint8_t* v;
};

/// A packed picture with its size in pixels.
struct Picture {
    Rows rows;
    Size size;
    ptrdiff_t pixelBytes;

    int64_t Bytes() const { return int64_t{size.width} * size.height * pixelBytes; }

    /// The picture without an odd last column and row.
    Picture WholeBlocks() const {
        return {rows, {size.width & ~ptrdiff_t{1}, size.height & ~ptrdiff_t{1}}, pixelBytes};
    }
};

/// Asks for bytes that will be needed a pair of rows later. Processors foresee what is read along a row, not
/// where the next one begins when it lies before this one. Outside the picture it does no harm.
[[gnu::always_inline]] inline void PrefetchRow(const uint8_t* p, ptrdiff_t bytes) {
    constexpr ptrdiff_t kCacheLine = 64;
    for (ptrdiff_t i = 0; i < bytes; i += kCacheLine)
        __builtin_prefetch(p + i, 0, 2);
}

[[gnu::always_inline]] inline void PrefetchRows(RowPair rows, ptrdiff_t distance, ptrdiff_t bytes) {
    PrefetchRow(rows.first + distance, bytes);
    PrefetchRow(rows.second + distance, bytes);
}

/// Calls visit(row0, row1, chromaRow) for every pair of rows. An odd last row comes as a pair with itself:
/// averaging a row with itself gives exactly the average of the pixels that exist, and writing it twice
/// writes the same bytes.
template <class Visit>
[[gnu::always_inline]] inline void ForRowPairs(ptrdiff_t height, Visit visit) {
    for (ptrdiff_t row = 0; row < height; row += 2)
        visit(row, row + 1 < height ? row + 1 : row, row / 2);
}

/// Calls visit(planes, packed, row0, row1) for every pair of rows of a picture that is both planar and
/// packed, the one made from the other.
template <class Visit>
[[gnu::always_inline]] inline void ForRowPairs(const Planes420& planes, Rows packed, ptrdiff_t height,
                                               Visit visit) {
    ForRowPairs(height, [&](ptrdiff_t row0, ptrdiff_t row1, ptrdiff_t half) {
        visit(PlanesPair{planes.y.Pair(row0, row1), planes.u[half], planes.v[half]}, packed.Pair(row0, row1),
              row0, row1);
    });
}

} // namespace image

#endif
