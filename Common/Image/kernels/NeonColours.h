// The colour equations with NEON, on registers of 16 bytes. For RowKernelsNeon.cpp alone.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_NEONCOLOURS_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_NEONCOLOURS_H

#include "Common/Image/kernels/FixedPoint.h"

#include <arm_neon.h>
#include <cstdint>

namespace image {
namespace {

// RGB to YUV ------------------------------------------------------------------------------------------------

/// 16 pixels.
struct Pixels {
    uint8x16_t blue, green, red;
};

/// The upper bytes of 16 words.
inline uint8x16_t HighBytes(uint16x8_t low, uint16x8_t high) {
    return vuzp2q_u8(vreinterpretq_u8_u16(low), vreinterpretq_u8_u16(high));
}

/// sum + weight * samples, modulo 2^16.
template <int kWeight>
uint16x8_t AddWeighted(uint16x8_t sum, uint8x8_t samples) {
    if constexpr (kWeight > 0)
        return vmlal_u8(sum, samples, vdup_n_u8(kWeight));
    else if constexpr (kWeight < 0)
        return vmlsl_u8(sum, samples, vdup_n_u8(-kWeight));
    else
        return sum;
}

template <int kBits>
uint16x8_t AddShifted(uint16x8_t sum, uint16x8_t rests) {
    return vreinterpretq_u16_s16(
        vsraq_n_s16(vreinterpretq_s16_u16(sum), vreinterpretq_s16_u16(rests), kBits));
}

template <class Form>
uint16x8_t LumaWords(uint8x8_t blue, uint8x8_t green, uint8x8_t red) {
    using F = Form;
    uint16x8_t wholes = vdupq_n_u16(F::kRounding);
    wholes = AddWeighted<F::kYOfBlue.whole>(wholes, blue);
    wholes = AddWeighted<F::kYOfGreen.whole>(wholes, green);
    wholes = AddWeighted<F::kYOfRed.whole>(wholes, red);
    uint16x8_t rests = vdupq_n_u16(0);
    rests = AddWeighted<F::kYOfBlue.rest>(rests, blue);
    rests = AddWeighted<F::kYOfGreen.rest>(rests, green);
    rests = AddWeighted<F::kYOfRed.rest>(rests, red);
    return AddShifted<F::kRestBits>(wholes, rests);
}

template <class Form>
uint8x16_t Luma(const Pixels& p) {
    const uint16x8_t low = LumaWords<Form>(vget_low_u8(p.blue), vget_low_u8(p.green), vget_low_u8(p.red));
    const uint16x8_t high = LumaWords<Form>(vget_high_u8(p.blue), vget_high_u8(p.green), vget_high_u8(p.red));
    return vaddq_u8(HighBytes(low, high), vdupq_n_u8(16));
}

/// Centred values, a word for each of 8 pixels in the upper byte.
struct ChromaWords {
    uint16x8_t cb, cr;
};

/// The weights of chroma in the lanes of one register: the compiler, if it knew their values, would fill a
/// register with each of them, and again in every turn of a loop, because there are too many.
template <class Form>
class ChromaWeights {
public:
    ChromaWeights() {
        using F = Form;
        const int16_t weights[8] = {F::kCbOfBlue.whole, F::kCbOfRed.whole,  F::kCbOfBlue.rest,
                                    F::kCbOfRed.rest,   F::kCrOfBlue.whole, F::kCrOfRed.whole,
                                    F::kCrOfBlue.rest,  F::kCrOfRed.rest};
        weights_ = vreinterpretq_u16_s16(vld1q_s16(weights));
        asm("" : "+w"(weights_));
    }

    ChromaWords operator()(uint8x8_t blue, uint8x8_t green, uint8x8_t red) const {
        using F = Form;
        const uint16x8_t ofBlue = vsubl_u8(blue, green);
        const uint16x8_t ofRed = vsubl_u8(red, green);
        const uint16x8_t rounding = vdupq_n_u16(F::kRounding);
        const uint16x8_t rest = F::kCrSum == 0 ? vdupq_n_u16(0) : vmovl_u8(green);
        return {
            AddShifted<F::kRestBits>(Sum<0>(rounding, ofBlue, ofRed), Sum<2>(vdupq_n_u16(0), ofBlue, ofRed)),
            AddShifted<F::kRestBits>(Sum<4>(rounding, ofBlue, ofRed), Sum<6>(rest, ofBlue, ofRed))};
    }

private:
    template <int kWeight>
    uint16x8_t Sum(uint16x8_t start, uint16x8_t ofBlue, uint16x8_t ofRed) const {
        return vmlaq_laneq_u16(vmlaq_laneq_u16(start, ofBlue, weights_, kWeight), ofRed, weights_,
                               kWeight + 1);
    }

    uint16x8_t weights_;
};

/// Centred values of 16 pixels.
struct PixelChroma {
    int8x16_t cb, cr;
};

template <class Form>
PixelChroma Chroma(const ChromaWeights<Form>& weights, const Pixels& p) {
    const ChromaWords low = weights(vget_low_u8(p.blue), vget_low_u8(p.green), vget_low_u8(p.red));
    const ChromaWords high = weights(vget_high_u8(p.blue), vget_high_u8(p.green), vget_high_u8(p.red));
    return {vreinterpretq_s8_u8(HighBytes(low.cb, high.cb)), vreinterpretq_s8_u8(HighBytes(low.cr, high.cr))};
}

/// Stored samples from sums of 1 << kLog2 centred values.
template <int kLog2>
uint8x8_t StoredSamples(int16x8_t sums) {
    return vadd_u8(vreinterpret_u8_s8(vshrn_n_s16(sums, kLog2)), vdup_n_u8(128));
}

// YUV to RGB ------------------------------------------------------------------------------------------------

/// What 8 chroma samples give each of their pixels.
struct ChromaTerms {
    int16x8_t red, green, blue, blueRest;
};

/// Words of centred samples, the seed of their term below each.
inline int16x8_t WithSeed(const SeededTerm& term, uint8x8_t samples) {
    const uint8x8_t centred = veor_u8(samples, vdup_n_u8(0x80));
    const uint8x8_t seeds = vdup_n_u8(static_cast<uint8_t>(term.seed));
    return vreinterpretq_s16_u8(vzip1q_u8(vcombine_u8(seeds, seeds), vcombine_u8(centred, centred)));
}

inline int16x8_t Product(const SeededTerm& term, int16x8_t samples, int constant) {
    return vaddq_s16(vqrdmulhq_n_s16(samples, static_cast<int16_t>(term.weight)),
                     vdupq_n_s16(static_cast<int16_t>(constant)));
}

template <class Form>
ChromaTerms MakeTerms(uint8x8_t u, uint8x8_t v) {
    using F = Form;
    const auto constant = [](int value) { return vdupq_n_u16(static_cast<uint16_t>(value)); };
    const uint16x8_t wholes =
        AddWeighted<F::kGreenVWhole>(AddWeighted<F::kGreenUWhole>(constant(F::kGreenConstant), u), v);
    const uint16x8_t rests =
        AddWeighted<F::kGreenVRest>(AddWeighted<F::kGreenURest>(constant(F::kGreenRestConstant), u), v);
    const int16x8_t blue = WithSeed(F::kBlue, u);
    return {Product(F::kRed, WithSeed(F::kRed, v), F::kRed.constant),
            vreinterpretq_s16_u16(vsraq_n_u16(wholes, rests, F::kShift)), // rests are never negative
            blue, Product(F::kBlue, blue, F::kBlueRestConstant)};
}

template <class Form>
int16x8_t LumaTerm(uint8x8_t y) {
    return vreinterpretq_s16_u16(
        AddWeighted<Form::kLumaWeight>(vdupq_n_u16(static_cast<uint16_t>(-Form::kBias)), y));
}

/// 16 components of pixels of which the even ones and the odd ones come apart.
inline uint8x16_t Components(int16x8_t even, int16x8_t odd) {
    const uint8x16_t kPixelOrder{0, 8, 1, 9, 2, 10, 3, 11, 4, 12, 5, 13, 6, 14, 7, 15};
    return vqtbl1q_u8(vqshrun_high_n_s16(vqshrun_n_s16(even, 7), odd, 7), kPixelOrder);
}

/// 16 pixels.
template <class Form>
Pixels ToRgb(uint8x8_t evenY, uint8x8_t oddY, const ChromaTerms& terms) {
    const int16x8_t even = LumaTerm<Form>(evenY);
    const int16x8_t odd = LumaTerm<Form>(oddY);
    const auto components = [&](int16x8_t chroma) {
        return Components(vqaddq_s16(even, chroma), vqaddq_s16(odd, chroma));
    };
    const auto blue = [&](int16x8_t luma) {
        return vqaddq_s16(vqaddq_s16(luma, terms.blue), terms.blueRest);
    };
    return {Components(blue(even), blue(odd)), components(terms.green), components(terms.red)};
}

} // namespace
} // namespace image

#endif
