// The plain kernels: the equations of PixelEquations.h and nothing else. Every other level is tested against
// this file.
#include "Common/Image/PixelEquations.h"
#include "Common/Image/kernels/RowKernels.h"

#include <algorithm>
#include <cstring>

namespace image {
namespace {

uint8_t Byte(int value) {
    return static_cast<uint8_t>(value);
}
uint8_t Clamped(int value) {
    return Byte(std::clamp(value, 0, 255));
}

/// A pixel in memory order.
struct Bgr {
    uint8_t b, g, r;
};

Bgr LoadPixel(const uint8_t* p) {
    return {p[0], p[1], p[2]};
}

/// A block of 2 x 2 pixels and the place of its chroma; beyond an odd width or height the last column or row
/// comes again.
struct Block {
    ptrdiff_t column0, column1, row0, row1;
    ptrdiff_t column, row;
};

template <class Visit>
void ForBlocks(Size size, Visit visit) {
    ForRowPairs(size.height, [&](ptrdiff_t row0, ptrdiff_t row1, ptrdiff_t row) {
        for (ptrdiff_t x = 0; x < size.width; x += 2)
            visit(Block{x, std::min(x + 1, size.width - 1), row0, row1, x / 2, row});
    });
}

template <class Equations>
uint8_t Luma(Bgr p) {
    return Byte(Equations::Y(p.r, p.g, p.b));
}

template <class Equations>
int Cb(Bgr p) {
    return Equations::U(p.r, p.g, p.b);
}

template <class Equations>
int Cr(Bgr p) {
    return Equations::V(p.r, p.g, p.b);
}

template <class Equations, int kPixelBytes>
void RgbTo420(Planes420 target, Rows rgb, Size size) {
    using E = Equations;
    ForBlocks(size, [&](Block at) {
        const Bgr a = LoadPixel(rgb[at.row0] + kPixelBytes * at.column0);
        const Bgr b = LoadPixel(rgb[at.row0] + kPixelBytes * at.column1);
        const Bgr c = LoadPixel(rgb[at.row1] + kPixelBytes * at.column0);
        const Bgr d = LoadPixel(rgb[at.row1] + kPixelBytes * at.column1);
        target.y[at.row0][at.column0] = Luma<E>(a);
        target.y[at.row0][at.column1] = Luma<E>(b);
        target.y[at.row1][at.column0] = Luma<E>(c);
        target.y[at.row1][at.column1] = Luma<E>(d);
        target.u[at.row][at.column] = Byte((Cb<E>(a) + Cb<E>(b) + Cb<E>(c) + Cb<E>(d)) >> 2);
        target.v[at.row][at.column] = Byte((Cr<E>(a) + Cr<E>(b) + Cr<E>(c) + Cr<E>(d)) >> 2);
    });
}

void Bgra32To420(Planes420 target, Rows alpha, Rows bgra, Size size) {
    RgbTo420<FastRgbToYuv, 4>(target, bgra, size);
    for (ptrdiff_t row = 0; row < size.height; ++row)
        for (ptrdiff_t x = 0; x < size.width; ++x)
            alpha[row][x] = bgra[row][4 * x + 3];
}

/// The chroma terms of a block, for each of its pixels.
template <class Equations>
class BlockColour {
public:
    BlockColour(uint8_t u, uint8_t v)
        : red(Equations::Red(v)), green(Equations::Green(u, v)), blue(Equations::Blue(u)) {}

    void StorePixel(uint8_t* target, uint8_t y) const {
        const auto luma = Equations::Luma(y);
        target[0] = Clamped(Component<Equations>(luma, blue));
        target[1] = Clamped(Component<Equations>(luma, green));
        target[2] = Clamped(Component<Equations>(luma, red));
    }

private:
    decltype(Equations::Luma(0)) red, green, blue;
};

struct Bgr24Pixel {
    static constexpr int kBytes = 3;
    static void StoreFourth(uint8_t*) {}
};
struct BgrxPixel {
    static constexpr int kBytes = 4;
    static void StoreFourth(uint8_t*) {}
};
struct BgraPixel {
    static constexpr int kBytes = 4;
    static void StoreFourth(uint8_t* pixel) { pixel[3] = 255; }
};

template <class Equations, class Pixel>
void RgbFrom420(Rows rgb, Planes420 source, Size size) {
    ForBlocks(size, [&](Block at) {
        const BlockColour<Equations> colour(source.u[at.row][at.column], source.v[at.row][at.column]);
        for (const ptrdiff_t row : {at.row0, at.row1}) {
            for (const ptrdiff_t x : {at.column0, at.column1}) {
                uint8_t* const pixel = rgb[row] + Pixel::kBytes * x;
                colour.StorePixel(pixel, source.y[row][x]);
                Pixel::StoreFourth(pixel);
            }
        }
    });
}

/// Where the four samples stand in a group.
template <PackedOrder kOrder>
struct Group {
    static constexpr int kY0 = kOrder == kYuy2 ? 0 : 1;
    static constexpr int kU = kOrder == kYuy2 ? 1 : 0;
    static constexpr int kY1 = kY0 + 2;
    static constexpr int kV = kU + 2;

    static void Store(uint8_t* group, uint8_t y0, uint8_t y1, uint8_t u, uint8_t v) {
        group[kY0] = y0;
        group[kU] = u;
        group[kY1] = y1;
        group[kV] = v;
    }
};

template <PackedOrder kOrder>
void PackedTo420(Planes420 target, Rows packed, Size size) {
    using G = Group<kOrder>;
    ForBlocks(size, [&](Block at) {
        const uint8_t* const first = packed[at.row0] + 2 * at.column0;
        const uint8_t* const second = packed[at.row1] + 2 * at.column0;
        target.y[at.row0][at.column0] = first[G::kY0];
        target.y[at.row0][at.column1] = first[G::kY1];
        target.y[at.row1][at.column0] = second[G::kY0];
        target.y[at.row1][at.column1] = second[G::kY1];
        target.u[at.row][at.column] = Byte((first[G::kU] + second[G::kU]) >> 1);
        target.v[at.row][at.column] = Byte((first[G::kV] + second[G::kV]) >> 1);
    });
}

template <PackedOrder kOrder>
void PackedFrom420(Rows packed, Planes420 source, Size size) {
    ForBlocks(size, [&](Block at) {
        for (const ptrdiff_t row : {at.row0, at.row1}) {
            const uint8_t* const y = source.y[row];
            Group<kOrder>::Store(packed[row] + 2 * at.column0, y[at.column0], y[at.column1],
                                 source.u[at.row][at.column], source.v[at.row][at.column]);
        }
    });
}

/// Calls visit(row, x, next) for every two neighbouring pixels of a row; beyond an odd width the last one
/// comes again.
template <class Visit>
void ForGroups(Size size, Visit visit) {
    for (ptrdiff_t row = 0; row < size.height; ++row)
        for (ptrdiff_t x = 0; x < size.width; x += 2)
            visit(row, x, std::min(x + 1, size.width - 1));
}

template <PackedOrder kOrder>
void PackedFromBgr24(Rows packed, Rows rgb, Size size) {
    using E = FastRgbToYuv;
    ForGroups(size, [&](ptrdiff_t row, ptrdiff_t x, ptrdiff_t next) {
        const Bgr a = LoadPixel(rgb[row] + 3 * x);
        const Bgr b = LoadPixel(rgb[row] + 3 * next);
        Group<kOrder>::Store(packed[row] + 2 * x, Luma<E>(a), Luma<E>(b), Byte((Cb<E>(a) + Cb<E>(b)) >> 1),
                             Byte((Cr<E>(a) + Cr<E>(b)) >> 1));
    });
}

template <PackedOrder kOrder>
void Bgr24FromPacked(Rows rgb, Rows packed, Size size) {
    using G = Group<kOrder>;
    ForGroups(size, [&](ptrdiff_t row, ptrdiff_t x, ptrdiff_t next) {
        const uint8_t* const group = packed[row] + 2 * x;
        const BlockColour<FastYuvToRgb> colour(group[G::kU], group[G::kV]);
        colour.StorePixel(rgb[row] + 3 * x, group[G::kY0]);
        if (next != x)
            colour.StorePixel(rgb[row] + 3 * next, group[G::kY1]);
    });
}

void SwapPacked(Rows target, Rows source, Size size) {
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        for (ptrdiff_t i = 0; i < 2 * size.width; i += 2) {
            target[row][i] = source[row][i + 1];
            target[row][i + 1] = source[row][i];
        }
    }
}

void Copy(Rows target, Rows source, Size size) {
    for (ptrdiff_t row = 0; row < size.height; ++row)
        std::memcpy(target[row], source[row], static_cast<size_t>(size.width));
}

void Halve(Rows target, Rows source, Size size) {
    ForBlocks(size, [&](Block at) {
        const uint8_t* const first = source[at.row0];
        const uint8_t* const second = source[at.row1];
        target[at.row][at.column] =
            Byte((first[at.column0] + first[at.column1] + second[at.column0] + second[at.column1]) >> 2);
    });
}

void Doubled(Rows target, Rows source, Size size) {
    for (ptrdiff_t row = 0; row < size.height; ++row)
        for (ptrdiff_t x = 0; x < size.width; ++x)
            for (uint8_t* const doubled : {target[2 * row] + 2 * x, target[2 * row + 1] + 2 * x})
                doubled[0] = doubled[1] = source[row][x];
}

} // namespace

constinit const RowKernels kPlainKernels = {
    .bgr32To420 = RgbTo420<FastRgbToYuv, 4>,
    .bgr24To420 = RgbTo420<FastRgbToYuv, 3>,
    .bgr24To420Simple = RgbTo420<SimpleRgbToYuv, 3>,
    .bgra32To420 = Bgra32To420,
    .bgr24From420 = RgbFrom420<FastYuvToRgb, Bgr24Pixel>,
    .bgr24From420Simple = RgbFrom420<SimpleYuvToRgb, Bgr24Pixel>,
    .bgrxFrom420 = RgbFrom420<FastYuvToRgb, BgrxPixel>,
    .bgraFrom420 = RgbFrom420<FastYuvToRgb, BgraPixel>,
    .packedTo420 = {PackedTo420<kUyvy>, PackedTo420<kYuy2>},
    .packedFrom420 = {PackedFrom420<kUyvy>, PackedFrom420<kYuy2>},
    .packedFromBgr24 = {PackedFromBgr24<kUyvy>, PackedFromBgr24<kYuy2>},
    .bgr24FromPacked = {Bgr24FromPacked<kUyvy>, Bgr24FromPacked<kYuy2>},
    .swapPacked = SwapPacked,
    .copy = Copy,
    .halve = Halve,
    .doubled = Doubled,
};

} // namespace image
