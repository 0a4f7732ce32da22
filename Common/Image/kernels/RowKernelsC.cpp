// The plain kernels: the equations of PixelEquations.h and nothing else. Every other level is tested against
// this file.
#include "Common/Image/PixelEquations.h"
#include "Common/Image/kernels/RowKernels.h"

#include <algorithm>

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
void RgbTo420(Planes420 target, Rows source, Size size) {
    using E = Equations;
    ForRowPairs(target, source, size.height, [&](PlanesPair to, RowPair rgb, ptrdiff_t, ptrdiff_t) {
        for (ptrdiff_t x = 0; x < size.width; x += 2) {
            const ptrdiff_t next = std::min(x + 1, size.width - 1);
            const Bgr a = LoadPixel(rgb.first + kPixelBytes * x);
            const Bgr b = LoadPixel(rgb.first + kPixelBytes * next);
            const Bgr c = LoadPixel(rgb.second + kPixelBytes * x);
            const Bgr d = LoadPixel(rgb.second + kPixelBytes * next);
            to.y.first[x] = Luma<E>(a);
            to.y.first[next] = Luma<E>(b);
            to.y.second[x] = Luma<E>(c);
            to.y.second[next] = Luma<E>(d);
            to.u[x / 2] = Byte((Cb<E>(a) + Cb<E>(b) + Cb<E>(c) + Cb<E>(d)) >> 2);
            to.v[x / 2] = Byte((Cr<E>(a) + Cr<E>(b) + Cr<E>(c) + Cr<E>(d)) >> 2);
        }
    });
}

void Bgra32To420(Planes420 target, Rows alpha, Rows bgra, Size size) {
    RgbTo420<FastRgbToYuv, 4>(target, bgra, size);
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        uint8_t* const to = alpha[row];
        const uint8_t* const from = bgra[row];
        for (ptrdiff_t x = 0; x < size.width; ++x)
            to[x] = from[4 * x + 3];
    }
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
void RgbFrom420(Rows target, Planes420 source, Size size) {
    ForRowPairs(source, target, size.height, [&](PlanesPair from, RowPair rgb, ptrdiff_t, ptrdiff_t) {
        for (ptrdiff_t x = 0; x < size.width; ++x) {
            const BlockColour<Equations> colour(from.u[x / 2], from.v[x / 2]);
            uint8_t* const first = rgb.first + Pixel::kBytes * x;
            uint8_t* const second = rgb.second + Pixel::kBytes * x;
            colour.StorePixel(first, from.y.first[x]);
            colour.StorePixel(second, from.y.second[x]);
            Pixel::StoreFourth(first);
            Pixel::StoreFourth(second);
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
void PackedTo420(Planes420 target, Rows source, Size size) {
    using G = Group<kOrder>;
    ForRowPairs(target, source, size.height, [&](PlanesPair to, RowPair packed, ptrdiff_t, ptrdiff_t) {
        for (ptrdiff_t x = 0; x < size.width; x += 2) {
            const uint8_t* const first = packed.first + 2 * x;
            const uint8_t* const second = packed.second + 2 * x;
            to.y.first[x] = first[G::kY0];
            to.y.first[x + 1] = first[G::kY1];
            to.y.second[x] = second[G::kY0];
            to.y.second[x + 1] = second[G::kY1];
            to.u[x / 2] = Byte((first[G::kU] + second[G::kU]) >> 1);
            to.v[x / 2] = Byte((first[G::kV] + second[G::kV]) >> 1);
        }
    });
}

template <PackedOrder kOrder>
void PackedFrom420(Rows target, Planes420 source, Size size) {
    using G = Group<kOrder>;
    ForRowPairs(source, target, size.height, [&](PlanesPair from, RowPair packed, ptrdiff_t, ptrdiff_t) {
        for (ptrdiff_t x = 0; x < size.width; x += 2) {
            const uint8_t u = from.u[x / 2];
            const uint8_t v = from.v[x / 2];
            G::Store(packed.first + 2 * x, from.y.first[x], from.y.first[x + 1], u, v);
            G::Store(packed.second + 2 * x, from.y.second[x], from.y.second[x + 1], u, v);
        }
    });
}

template <PackedOrder kOrder>
void PackedFromBgr24(Rows target, Rows source, Size size) {
    using E = FastRgbToYuv;
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        uint8_t* const packed = target[row];
        const uint8_t* const rgb = source[row];
        for (ptrdiff_t x = 0; x < size.width; x += 2) {
            const Bgr a = LoadPixel(rgb + 3 * x);
            const Bgr b = LoadPixel(rgb + 3 * std::min(x + 1, size.width - 1));
            Group<kOrder>::Store(packed + 2 * x, Luma<E>(a), Luma<E>(b), Byte((Cb<E>(a) + Cb<E>(b)) >> 1),
                                 Byte((Cr<E>(a) + Cr<E>(b)) >> 1));
        }
    }
}

template <PackedOrder kOrder>
void Bgr24FromPacked(Rows target, Rows source, Size size) {
    using G = Group<kOrder>;
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        uint8_t* const rgb = target[row];
        const uint8_t* const packed = source[row];
        for (ptrdiff_t x = 0; x < size.width; x += 2) {
            const uint8_t* const group = packed + 2 * x;
            const BlockColour<FastYuvToRgb> colour(group[G::kU], group[G::kV]);
            colour.StorePixel(rgb + 3 * x, group[G::kY0]);
            if (x + 1 < size.width)
                colour.StorePixel(rgb + 3 * (x + 1), group[G::kY1]);
        }
    }
}

void SwapPacked(Rows target, Rows source, Size size) {
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        uint8_t* const to = target[row];
        const uint8_t* const from = source[row];
        for (ptrdiff_t i = 0; i < 2 * size.width; i += 2) {
            to[i] = from[i + 1];
            to[i + 1] = from[i];
        }
    }
}

void Copy(Rows target, Rows source, Size size) {
    for (ptrdiff_t row = 0; row < size.height; ++row)
        std::copy_n(source[row], size.width, target[row]);
}

void Halve(Rows target, Rows source, Size size) {
    ForRowPairs(size.height, [&](ptrdiff_t row0, ptrdiff_t row1, ptrdiff_t half) {
        const RowPair from = source.Pair(row0, row1);
        uint8_t* const to = target[half];
        for (ptrdiff_t x = 0; x < size.width; x += 2) {
            const ptrdiff_t next = std::min(x + 1, size.width - 1);
            to[x / 2] = Byte((from.first[x] + from.first[next] + from.second[x] + from.second[next]) >> 2);
        }
    });
}

void Doubled(Rows target, Rows source, Size size) {
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        const RowPair to = target.Pair(2 * row, 2 * row + 1);
        const uint8_t* const from = source[row];
        for (ptrdiff_t x = 0; x < size.width; ++x) {
            to.first[2 * x] = to.first[2 * x + 1] = from[x];
            to.second[2 * x] = to.second[2 * x + 1] = from[x];
        }
    }
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
