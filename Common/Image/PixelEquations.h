// The colour equations for one pixel, and their multiplication tables.
//
// Two sets in each direction: the fast one of the picture routines (14 bits to YUV, 13 bits to RGB, rounded
// down) and the simple one of the per-pixel routines (10 bits, rounded to the nearest). Their results differ
// by one step for many colours, so they must never be mixed. All sums are signed 32-bit; shifts round toward
// minus infinity.
#ifndef MOVIECONV_COMMON_IMAGE_PIXELEQUATIONS_H
#define MOVIECONV_COMMON_IMAGE_PIXELEQUATIONS_H

#include <array>
#include <cstddef>
#include <cstdint>

namespace image {

constexpr std::array<int32_t, 256> MultiplicationTable(int32_t factor) {
    std::array<int32_t, 256> table{};
    for (int32_t i = 0; i < 256; ++i)
        table[static_cast<size_t>(i)] = factor * i;
    return table;
}

inline constexpr auto mul_8258 = MultiplicationTable(8258);
inline constexpr auto mul_1606 = MultiplicationTable(1606);
inline constexpr auto mul_7193 = MultiplicationTable(7193);
inline constexpr auto mul_4768 = MultiplicationTable(4768);
inline constexpr auto mul_1163 = MultiplicationTable(1163);
inline constexpr auto mul_9536 = MultiplicationTable(9536);
inline constexpr auto mul_6660 = MultiplicationTable(6660);

/// Y, U and V of one pixel of byte components, as they are stored; U and V carry their offset of 128. In this
/// form the truncated average of any number of pixels' U is the stored sample: the offset is a multiple of
/// what the average drops.
struct FastRgbToYuv {
    static constexpr int Y(uint8_t r, uint8_t g, uint8_t b) {
        return ((4211 * r + mul_8258[g] + mul_1606[b]) >> 14) + 16;
    }
    static constexpr int U(uint8_t r, uint8_t g, uint8_t b) {
        return ((mul_7193[b] - mul_4768[g] - 2425 * r) >> 14) + 128;
    }
    static constexpr int V(uint8_t r, uint8_t g, uint8_t b) {
        return ((mul_7193[r] - 6029 * g - mul_1163[b]) >> 14) + 128;
    }
};

/// The same by the simple equations, which take components of any size; sums wrap at 32 bits. Byte components
/// need no clamp.
struct SimpleRgbToYuv {
    static constexpr int Y(int64_t r, int64_t g, int64_t b) {
        return Shift(263 * r + 516 * g + 100 * b + 16896);
    }
    static constexpr int U(int64_t r, int64_t g, int64_t b) {
        return Shift(-152 * r - 298 * g + 450 * b + 131584);
    }
    static constexpr int V(int64_t r, int64_t g, int64_t b) {
        return Shift(450 * r - 377 * g - 73 * b + 131584);
    }

private:
    static constexpr int Shift(int64_t sum) { return static_cast<int32_t>(sum) >> 10; }
};

/// R, G and B of one pixel before the clamp: a luma term and a chroma term, added and shifted. The chroma
/// terms are shared by the pixels of a block.
struct FastYuvToRgb {
    static constexpr int kShift = 13;
    static constexpr int32_t Luma(uint8_t y) { return mul_9536[y]; }
    static constexpr int32_t Red(int32_t v) { return 13074 * v - 1826095; }
    static constexpr int32_t Green(int32_t u, uint8_t v) { return -3203 * u - mul_6660[v] + 1109918; }
    static constexpr int32_t Blue(int32_t u) { return 16532 * u - 2268594; }
};

/// The same by the simple equations, for samples of any size; the terms are wide, the caller wraps their sum
/// at 32 bits.
struct SimpleYuvToRgb {
    static constexpr int kShift = 10;
    static constexpr int64_t Luma(int64_t y) { return 1192 * y; }
    static constexpr int64_t Red(int64_t v) { return 1634 * v - 227712; }
    static constexpr int64_t Green(int64_t u, int64_t v) { return -401 * u - 833 * v + 139392; }
    static constexpr int64_t Blue(int64_t u) { return 2065 * u - 282880; }
};

/// One component before the clamp.
template <class Equations, class Sum>
constexpr int Component(Sum luma, Sum chroma) {
    return static_cast<int32_t>(luma + chroma) >> Equations::kShift;
}

} // namespace image

#endif
