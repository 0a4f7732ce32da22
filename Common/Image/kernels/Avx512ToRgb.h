// 4:2:0 to RGB with AVX-512.
//
// 64 pixels as bytes, as packing their words gives them: in every lane of 128 bits 16 pixels, first the even
// ones, then the odd ones. The terms of chroma then serve the even and the odd pixels as they are.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_AVX512TORGB_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_AVX512TORGB_H

#include "Common/Image/kernels/Avx512Registers.h"

namespace image {
namespace {

constexpr int PlaceOf(int pixel) {
    return pixel / 16 * 16 + pixel % 2 * 8 + pixel % 16 / 2;
}

inline __m512i Plus(__m512i words, int constant) {
    return _mm512_add_epi16(words, _mm512_set1_epi16(static_cast<int16_t>(constant)));
}

/// ofU * (U - 128) + ofV * (V - 128) from such bytes, alternating.
inline __m512i Weighted(__m512i centred, int ofU, int ofV) {
    return _mm512_maddubs_epi16(_mm512_set1_epi16(static_cast<int16_t>(ofU | ofV << 8)), centred);
}

/// The whole factors of green are negative, the weights are not.
template <class Form>
__m512i GreenTerm(__m512i centred) {
    const __m512i whole = Weighted(centred, -Form::kGreenUWhole, -Form::kGreenVWhole);
    const __m512i rest = Plus(Weighted(centred, Form::kGreenURest, Form::kGreenVRest),
                              Form::kGreenRestConstant + 128 * (Form::kGreenURest + Form::kGreenVRest));
    return Plus(_mm512_sub_epi16(_mm512_srai_epi16(rest, Form::kShift), whole),
                Form::kGreenConstant + 128 * (Form::kGreenUWhole + Form::kGreenVWhole));
}

/// (words & mask) ^ constant.
inline __m512i MaskThenXor(__m512i words, int mask, int constant) {
    constexpr int kXorAnd = 0x78; // a ^ (b & c)
    return _mm512_ternarylogic_epi32(_mm512_set1_epi16(static_cast<int16_t>(constant)), words,
                                     _mm512_set1_epi16(static_cast<int16_t>(mask)), kXorAnd);
}

/// All that 32 chroma samples give their pixels, from bytes of U and V, alternating.
template <class Form>
struct ChromaTerms {
    explicit ChromaTerms(__m512i uv) {
        constexpr int kCentre = 0x8000;
        const __m512i v = MaskThenXor(uv, 0xFF00, kCentre | Form::kRed.seed);
        red = Plus(_mm512_mulhrs_epi16(v, _mm512_set1_epi16(Form::kRed.weight)), Form::kRed.constant);
        green = GreenTerm<Form>(_mm512_xor_si512(uv, _mm512_set1_epi8(-128)));
        blue = _mm512_xor_si512(_mm512_slli_epi16(uv, 8),
                                _mm512_set1_epi16(static_cast<int16_t>(kCentre | Form::kBlue.seed)));
        blueRest =
            Plus(_mm512_mulhrs_epi16(blue, _mm512_set1_epi16(Form::kBlue.weight)), Form::kBlueRestConstant);
    }

    __m512i red, green, blue, blueRest;
};

/// Bytes of 64 pixels.
struct Rgb {
    __m512i blue, green, red;
};

/// Of 64 pixels from bytes of Y in memory order.
template <class Form>
Rgb ToRgb(__m512i y, const ChromaTerms<Form>& terms) {
    // A sample, centred, and 127 beside it.
    const __m512i even = _mm512_maddubs_epi16(BytePairs(Form::kLumaWeight, Form::kLumaConstant),
                                              MaskThenXor(y, 0x00FF, 0x7F80));
    const __m512i odd = _mm512_maddubs_epi16(BytePairs(Form::kLumaConstant, Form::kLumaWeight),
                                             MaskThenXor(y, 0xFF00, 0x807F));
    const auto component = [](__m512i evenSums, __m512i oddSums) {
        return _mm512_packus_epi16(_mm512_srai_epi16(evenSums, 7), _mm512_srai_epi16(oddSums, 7));
    };
    const auto add = [&](__m512i term) {
        return component(_mm512_adds_epi16(even, term), _mm512_adds_epi16(odd, term));
    };
    const auto blue = [&](__m512i luma) {
        return _mm512_adds_epi16(_mm512_adds_epi16(luma, terms.blue), terms.blueRest);
    };
    return {component(blue(even), blue(odd)), add(terms.green), add(terms.red)};
}

/// 64 bytes of 64 pixels of three or four bytes, from byte 64 kPart on. A fourth byte is 255.
template <int kBytes, int kPart>
class RgbPart {
public:
    __m512i operator()(const Rgb& rgb) const {
        // What no register gives is the place itself.
#ifdef MOVIECONV_PERMUTE_PAIRS
        const __m512i blueGreen =
            _mm512_mask2_permutex2var_epi8(rgb.blue, places_, Bytes(0) | Bytes(1), rgb.green);
#else
        const __m512i blue = _mm512_mask_permutexvar_epi8(places_, Bytes(0), places_, rgb.blue);
        const __m512i blueGreen = _mm512_mask_permutexvar_epi8(blue, Bytes(1), places_, rgb.green);
#endif
        return _mm512_mask_permutexvar_epi8(blueGreen, Bytes(2), places_, rgb.red);
    }

private:
    static constexpr int ComponentAt(int i) {
        return (64 * kPart + i) % kBytes;
    }
    static constexpr Table kPlaces = MakeTable([](int i) {
        const int place = PlaceOf((64 * kPart + i) / kBytes);
        return ComponentAt(i) == 3 ? 255 : place + (ComponentAt(i) == 1 ? 64 : 0);
    });
    static constexpr uint64_t Bytes(int component) {
        uint64_t mask = 0;
        for (int i = 0; i < 64; ++i)
            mask |= uint64_t{ComponentAt(i) == component} << i;
        return mask;
    }
    __m512i places_ = kPlaces.Load();
};

template <class Memory>
class Bgr24Target {
public:
    static constexpr bool kReads = false;

    template <class Columns>
    void operator()(Columns columns, uint8_t* row, ptrdiff_t x, const Rgb& rgb) const {
        uint8_t* const target = row + 3 * x;
        const ptrdiff_t bytes = 3 * columns.count;
        Store<Memory>(columns, target, bytes, first_(rgb));
        Store<Memory>(columns, target + 64, bytes - 64, second_(rgb));
        Store<Memory>(columns, target + 128, bytes - 128, third_(rgb));
    }

private:
    RgbPart<3, 0> first_;
    RgbPart<3, 1> second_;
    RgbPart<3, 2> third_;
};

/// Pixels of four bytes; the fourth becomes 255, or is not stored at all.
template <class Memory, bool kOpaque>
class Bgr32Target {
public:
    static constexpr bool kReads = !kOpaque;

    template <class Columns>
    void operator()(Columns columns, uint8_t* row, ptrdiff_t x, const Rgb& rgb) const {
        uint8_t* const target = row + 4 * x;
        const ptrdiff_t bytes = 4 * columns.count;
        StorePixels(columns, target, bytes, first_(rgb));
        StorePixels(columns, target + 64, bytes - 64, second_(rgb));
        StorePixels(columns, target + 128, bytes - 128, third_(rgb));
        StorePixels(columns, target + 192, bytes - 192, fourth_(rgb));
    }

private:
    template <class Columns>
    static void StorePixels(Columns columns, uint8_t* target, ptrdiff_t bytes, __m512i pixels) {
        constexpr uint64_t kColours = 0x7777777777777777;
        if constexpr (kOpaque)
            Store<Memory>(columns, target, bytes, pixels);
        else if constexpr (Columns::kMasked)
            _mm512_mask_storeu_epi8(target, Bits(bytes) & kColours, pixels);
        else
            _mm512_mask_storeu_epi8(target, kColours, pixels);
    }

    RgbPart<4, 0> first_;
    RgbPart<4, 1> second_;
    RgbPart<4, 2> third_;
    RgbPart<4, 3> fourth_;
};

/// Bytes of U and V, alternating.
class ChromaPairs {
public:
    template <class Columns>
    __m512i operator()(Columns columns, const uint8_t* u, const uint8_t* v, ptrdiff_t x) const {
        const ptrdiff_t samples = (columns.count + 1) / 2;
        const __m512i both = _mm512_inserti64x4(_mm512_castsi256_si512(LoadHalf(columns, u + x / 2, samples)),
                                                LoadHalf(columns, v + x / 2, samples), 1);
        return _mm512_permutexvar_epi8(places_, both);
    }

private:
    static constexpr Table kPlaces = MakeTable([](int i) { return i / 2 + i % 2 * 32; });
    __m512i places_ = kPlaces.Load();
};

template <class Memory, class Target, class Form, From420 RowKernels::*kKernel>
void RgbFrom420(Rows rgb, Planes420 source, Size size) {
    if (IsNarrow<kStep>(size))
        return (kAvx2Kernels.*kKernel)(rgb, source, size);
    const ChromaPairs chroma;
    const Target store;
    ForRowPairs(source, rgb, size.height, [&](PlanesPair from, RowPair to, ptrdiff_t, ptrdiff_t) {
        ForSteps<kStep>(size.width, [&](ptrdiff_t x, auto columns) {
            const ChromaTerms<Form> terms(chroma(columns, from.u, from.v, x));
            const auto luma = [&](const uint8_t* row) { return Load(columns, row + x, columns.count); };
            if constexpr (Target::kReads)
                PrefetchRows(to, 4 * x + 2 * rgb.step, 4 * kStep);
            if constexpr (Memory::kPastCaches)
                PrefetchRows(from.y, x + 2 * source.y.step, kStep);
            store(columns, to.first, x, ToRgb<Form>(luma(from.y.first), terms));
            store(columns, to.second, x, ToRgb<Form>(luma(from.y.second), terms));
        });
    });
    Memory::Finish();
}

} // namespace
} // namespace image

#endif
