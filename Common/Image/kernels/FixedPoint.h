// The equations of PixelEquations.h in the forms that 16-bit multiplications take. Both sets, fast and
// simple, become the same instructions with other constants. Each form is exact for every byte input.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_FIXEDPOINT_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_FIXEDPOINT_H

#include <cstdint>

namespace image {

/// RGB to YUV. A sum is scaled by 2^16 / 2^kBits, so that the result is the upper half of a 32-bit lane,
/// rounded toward minus infinity: no shift, and nothing of the fraction left to carry. A pixel is the bytes
/// B, R, G, R: byte weights make two words of them, and word weights the sum of these. The inner and outer
/// weights are factors of the scaled ones, chosen so that red, which stands in both words, gets its own:
///   Y - 16 = (outerBlue * (innerBlue * B + besideBlue * R)
///             + outerGreen * (innerGreen * G + besideGreen * R) + rounding) >> 16.
/// The weights of U add up to 0, so U needs only B - R and G - R. Those of V add up to kCrSum, so that times
/// R is missing.
template <int kBitsOfSet, int kYRed, int kYGreen, int kYBlue, int kCbRed, int kCbGreen, int kCbBlue,
          int kCrRed, int kCrGreen, int kCrBlue, int kRoundingOfSet, int kInnerBlue, int kBesideBlue,
          int kInnerGreen, int kBesideGreen>
struct RgbToYuvForm {
    static constexpr int kScale = 1 << (16 - kBitsOfSet);
    static constexpr int kYInnerBlue = kInnerBlue;
    static constexpr int kYBesideBlue = kBesideBlue;
    static constexpr int kYInnerGreen = kInnerGreen;
    static constexpr int kYBesideGreen = kBesideGreen;
    static constexpr int kYOuterBlue = kYBlue * kScale / kInnerBlue;
    static constexpr int kYOuterGreen = kYGreen * kScale / kInnerGreen;
    static constexpr int kCbBlueWeight = kCbBlue * kScale;
    static constexpr int kCbGreenWeight = kCbGreen * kScale;
    static constexpr int kCrBlueWeight = kCrBlue * kScale;
    static constexpr int kCrGreenWeight = kCrGreen * kScale;
    static constexpr int kCrSum = (kCrRed + kCrGreen + kCrBlue) * kScale;
    static constexpr int kRounding = kRoundingOfSet * kScale;

    static_assert(kYOuterBlue * kInnerBlue == kYBlue * kScale);
    static_assert(kYOuterGreen * kInnerGreen == kYGreen * kScale);
    static_assert(kYOuterBlue * kBesideBlue + kYOuterGreen * kBesideGreen == kYRed * kScale);
    static_assert(kYOuterBlue <= INT16_MAX && kYOuterGreen <= INT16_MAX);
    static_assert(kCbRed + kCbGreen + kCbBlue == 0);
    static_assert(kCbBlueWeight <= INT16_MAX && kCrGreenWeight >= INT16_MIN);
};

using FastRgbForm =
    RgbToYuvForm<14, 4211, 8258, 1606, -2425, -4768, 7193, 7193, -6029, -1163, 0, 11, -56, 2, 3>;
using SimpleRgbForm = RgbToYuvForm<10, 263, 516, 100, -152, -298, 450, 450, -377, -73, 512, 1, -58, 4, 47>;

/// RGB to YUV for multiplications of bytes into 16-bit lanes. A weight is whole * 2^kRestBits + rest, and
///   component = (sum of wholes + (sum of rests >> kRestBits)) >> 8,
/// so that the result is the upper byte of a lane: both sums fit 16 bits, and what the first shift drops is
/// less than the last place of the wholes. The weights of U add up to 0, so U needs only B - G and R - G;
/// those of V add up to kCrSum, so that times G is missing.
template <int kBitsOfSet, int kYRed, int kYGreen, int kYBlue, int kCbRed, int kCbGreen, int kCbBlue,
          int kCrRed, int kCrGreen, int kCrBlue, int kRoundingOfSet>
struct SplitRgbForm {
    static constexpr int kRestBits = kBitsOfSet - 8;
    static constexpr int Whole(int weight) { return (weight + (1 << (kRestBits - 1))) >> kRestBits; }
    static constexpr int Rest(int weight) { return weight - Whole(weight) * (1 << kRestBits); }

    struct Weights {
        int whole, rest;
    };
    static constexpr Weights Split(int weight) { return {Whole(weight), Rest(weight)}; }
    static constexpr Weights kYOfBlue = Split(kYBlue), kYOfGreen = Split(kYGreen), kYOfRed = Split(kYRed);
    static constexpr Weights kCbOfBlue = Split(kCbBlue), kCbOfRed = Split(kCbRed);
    static constexpr Weights kCrOfBlue = Split(kCrBlue), kCrOfRed = Split(kCrRed);
    static constexpr int kCrSum = kCrRed + kCrGreen + kCrBlue;
    static constexpr int kRounding = kRoundingOfSet >> kRestBits;

    static_assert(kRounding << kRestBits == kRoundingOfSet);
    static_assert(kCbRed + kCbGreen + kCbBlue == 0);
    static_assert(kCrSum == 0 || kCrSum == 1);
    static_assert(255 * (kYOfBlue.whole + kYOfGreen.whole + kYOfRed.whole) + kRounding <= UINT16_MAX - 255);
    static_assert(255 * kCbOfBlue.whole + kRounding <= INT16_MAX - 255);
    static_assert(255 * kCrOfRed.whole + kRounding <= INT16_MAX - 255);
};

using FastSplitForm = SplitRgbForm<14, 4211, 8258, 1606, -2425, -4768, 7193, 7193, -6029, -1163, 0>;
using SimpleSplitForm = SplitRgbForm<10, 263, 516, 100, -152, -298, 450, 450, -377, -73, 512>;

/// A product of words as processors round it: half of the upper word of twice the product, to the nearest.
constexpr int RoundedProduct(int a, int b) {
    return (a * b + (1 << 14)) >> 15;
}

/// What a sample of U or V gives by one multiplication of words. The seed is the byte below the sample: it
/// moves the multiplication's rounding to where the equation rounds.
struct SeededTerm {
    int weight, seed, constant;

    constexpr int operator()(int sample) const {
        return RoundedProduct((sample - 128) * 256 + seed, weight) + constant;
    }
};

/// The term that is (factor * sample + offset) >> shift for every sample.
constexpr SeededTerm MakeSeededTerm(int factor, int offset, int shift) {
    const auto equation = [=](int sample) { return (factor * sample + offset) >> shift; };
    for (int seed = 0; seed < 256; ++seed) {
        SeededTerm term{factor << (7 - shift), seed, 0};
        term.constant = equation(0) - term(0);
        int sample = 0;
        while (sample < 256 && term(sample) == equation(sample))
            ++sample;
        if (sample == 256)
            return term;
    }
    throw "no seed makes this term exact";
}

/// YUV to RGB in 16-bit lanes: component = clamp((luma + chroma) >> 7) with
///   luma = 149 * Y - kBias and chroma = the term of the equation >> (its bits - 7), + kBias.
/// The sum may leave 16 bits only where the clamp gives the same as a saturated sum. That holds for red and
/// green for every bias from 5228 to 9147. The term of blue does not fit 16 bits: it is split into
/// (U - 128) * 256 + seed, which is added first, and the rest, which is never negative. Green depends on two
/// samples: a term factor * x + offset, to be shifted right by s, is (factor >> s) * x + (offset >> s) + (the
/// remainders >> s).
template <int kBitsOfSet, int kLumaOfSet, int kRedV, int kRedOffset, int kGreenU, int kGreenV,
          int kGreenOffset, int kBlueU, int kBlueOffset>
struct YuvToRgbForm {
    static constexpr int kShift = kBitsOfSet - 7;
    static constexpr int kLumaWeight = 149;
    static constexpr int kLumaConstant = 100; // times 127, see kBias
    static constexpr int kBias = 128 * kLumaWeight - 127 * kLumaConstant;
    static_assert(kLumaOfSet == kLumaWeight << kShift && kBias >= 5228 && kBias <= 9147);

    static constexpr int Whole(int value) { return value >> kShift; }
    static constexpr int Rest(int value) { return value & ((1 << kShift) - 1); }
    static constexpr int Scaled(int value) { return value * (1 << kShift); }

    static constexpr SeededTerm kRed = MakeSeededTerm(kRedV, kRedOffset + Scaled(kBias), kShift);

    static constexpr int kGreenUWhole = Whole(kGreenU), kGreenURest = Rest(kGreenU);
    static constexpr int kGreenVWhole = Whole(kGreenV), kGreenVRest = Rest(kGreenV);
    static constexpr int kGreenConstant = Whole(kGreenOffset) + kBias,
                         kGreenRestConstant = Rest(kGreenOffset);

    static constexpr SeededTerm kBlue =
        MakeSeededTerm(kBlueU - Scaled(256), kBlueOffset + Scaled(128 * 256 + kBias), kShift);
    static constexpr int kBlueRestConstant = kBlue.constant - kBlue.seed;
    static_assert(kBlue(0) >= kBlue.seed);
};

using FastYuvForm = YuvToRgbForm<13, 9536, 13074, -1826095, -3203, -6660, 1109918, 16532, -2268594>;
using SimpleYuvForm = YuvToRgbForm<10, 1192, 1634, -227712, -401, -833, 139392, 2065, -282880>;

} // namespace image

#endif
