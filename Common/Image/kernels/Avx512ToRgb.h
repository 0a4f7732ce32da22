// 4:2:0 to RGB with AVX-512.
//
// 64 pixels as bytes. They stand in an order in which unpacking within lanes of 128 bits gives 32-bit pixels
// in memory order: byte 4 k + j of lane L is pixel 16 k + 4 L + j.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_AVX512TORGB_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_AVX512TORGB_H

#include "Common/Image/kernels/Avx512Registers.h"

namespace image {
namespace {

constexpr int PixelAt(int place) {
    return place % 16 / 4 * 16 + place / 16 * 4 + place % 4;
}
constexpr int PlaceOf(int pixel) {
    return pixel / 4 % 4 * 16 + pixel / 16 * 4 + pixel % 4;
}

/// The chroma terms of the pixels 0 to 7 of each lane, and of 8 to 15.
struct Terms {
    explicit Terms(__m512i words)
        : low(_mm512_unpacklo_epi16(words, words)), high(_mm512_unpackhi_epi16(words, words)) {}
    __m512i low, high;
};

inline __m512i Plus(__m512i words, int constant) {
    return _mm512_add_epi16(words, _mm512_set1_epi16(static_cast<int16_t>(constant)));
}

/// ofU * (U - 128) + ofV * (V - 128) from such bytes, alternating.
inline __m512i Weighted(__m512i centred, int ofU, int ofV) {
    return _mm512_maddubs_epi16(_mm512_set1_epi16(static_cast<int16_t>(ofU | ofV << 8)), centred);
}

/// The same of U and V themselves with a constant, shifted.
template <class Form>
__m512i Rest(__m512i centred, int ofU, int ofV, int constant) {
    return _mm512_srai_epi16(Plus(Weighted(centred, ofU, ofV), constant + 128 * (ofU + ofV)), Form::kShift);
}

template <class Form>
__m512i RedTerm(__m512i centred) {
    const __m512i whole = Weighted(centred, 0, Form::kRedWhole);
    return _mm512_add_epi16(Plus(whole, Form::kRedConstant + 128 * Form::kRedWhole),
                            Rest<Form>(centred, 0, Form::kRedRest, Form::kRedRestConstant));
}

/// The whole factors of green are negative, the weights are not.
template <class Form>
__m512i GreenTerm(__m512i centred) {
    const __m512i whole = Weighted(centred, -Form::kGreenUWhole, -Form::kGreenVWhole);
    const __m512i rest = Rest<Form>(centred, Form::kGreenURest, Form::kGreenVRest, Form::kGreenRestConstant);
    return Plus(_mm512_sub_epi16(rest, whole),
                Form::kGreenConstant + 128 * (Form::kGreenUWhole + Form::kGreenVWhole));
}

template <class Form>
__m512i BlueRestTerm(__m512i centred) {
    const __m512i whole = Weighted(centred, Form::kBlueWhole, 0);
    return _mm512_add_epi16(Plus(whole, Form::kBlueConstant + 128 * Form::kBlueWhole),
                            Rest<Form>(centred, Form::kBlueRest, 0, Form::kBlueRestConstant));
}

/// All that 32 chroma samples give their pixels, from bytes of U and V, alternating.
template <class Form>
struct ChromaTerms {
    explicit ChromaTerms(__m512i uv) : ChromaTerms(Centred{_mm512_xor_si512(uv, _mm512_set1_epi8(-128))}) {}
    Terms red, green, blue, blueRest;

private:
    struct Centred {
        __m512i bytes;
    };
    explicit ChromaTerms(Centred uv)
        : red(RedTerm<Form>(uv.bytes)),
          green(GreenTerm<Form>(uv.bytes)),
          blue(_mm512_slli_epi16(uv.bytes, 8)),
          blueRest(BlueRestTerm<Form>(uv.bytes)) {}
};

/// Bytes of 64 pixels.
struct Rgb {
    __m512i blue, green, red;
};

inline __m512i Component(__m512i low, __m512i high) {
    return _mm512_packus_epi16(_mm512_srai_epi16(low, 7), _mm512_srai_epi16(high, 7));
}

template <class Form>
Rgb ToRgb(__m512i y, const ChromaTerms<Form>& terms) {
    const __m512i centred = _mm512_xor_si512(y, _mm512_set1_epi8(-128));
    const __m512i weights = BytePairs(Form::kLumaWeight, Form::kLumaConstant);
    const __m512i constant = _mm512_set1_epi8(127);
    const __m512i low = _mm512_maddubs_epi16(weights, _mm512_unpacklo_epi8(centred, constant));
    const __m512i high = _mm512_maddubs_epi16(weights, _mm512_unpackhi_epi8(centred, constant));
    const auto add = [&](const Terms& chroma) {
        return Component(_mm512_adds_epi16(low, chroma.low), _mm512_adds_epi16(high, chroma.high));
    };
    const __m512i blueLow = _mm512_adds_epi16(_mm512_adds_epi16(low, terms.blue.low), terms.blueRest.low);
    const __m512i blueHigh = _mm512_adds_epi16(_mm512_adds_epi16(high, terms.blue.high), terms.blueRest.high);
    return {Component(blueLow, blueHigh), add(terms.green), add(terms.red)};
}

/// One of the three parts of 64 pixels of three bytes.
template <int kThird>
struct Bgr24Third {
    __m512i operator()(const Rgb& rgb) const {
        const __m512i blueGreen = PermutePair(rgb.blue, rgb.green, places_, kPlaces.FromSecond());
        return _mm512_mask_permutexvar_epi8(blueGreen, kReds, places_, rgb.red);
    }

private:
    static constexpr int Component(int i) { return (64 * kThird + i) % 3; }
    static constexpr Table kPlaces =
        MakeTable([](int i) { return PlaceOf((64 * kThird + i) / 3) + (Component(i) == 1 ? 64 : 0); });
    static constexpr uint64_t kReds = [] {
        uint64_t mask = 0;
        for (int i = 0; i < 64; ++i)
            mask |= uint64_t{Component(i) == 2} << i;
        return mask;
    }();
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
    Bgr24Third<0> first_;
    Bgr24Third<1> second_;
    Bgr24Third<2> third_;
};

/// Pixels of four bytes; the fourth becomes 255, or is not stored at all.
template <class Memory, bool kOpaque>
class Bgr32Target {
public:
    static constexpr bool kReads = !kOpaque;

    template <class Columns>
    void operator()(Columns columns, uint8_t* row, ptrdiff_t x, const Rgb& rgb) const {
        const __m512i fourth = _mm512_set1_epi8(-1);
        const __m512i blueGreen[2] = {_mm512_unpacklo_epi8(rgb.blue, rgb.green),
                                      _mm512_unpackhi_epi8(rgb.blue, rgb.green)};
        const __m512i redFourth[2] = {_mm512_unpacklo_epi8(rgb.red, fourth),
                                      _mm512_unpackhi_epi8(rgb.red, fourth)};
        for (int half = 0; half < 2; ++half) {
            const ptrdiff_t skipped = 128 * half;
            uint8_t* const target = row + 4 * x + skipped;
            const ptrdiff_t bytes = 4 * columns.count - skipped;
            StorePixels(columns, target, bytes, _mm512_unpacklo_epi16(blueGreen[half], redFourth[half]));
            StorePixels(columns, target + 64, bytes - 64,
                        _mm512_unpackhi_epi16(blueGreen[half], redFourth[half]));
        }
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
};

/// Bytes of U and V, alternating, in the order of the pixels.
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
    static constexpr Table kPlaces = MakeTable([](int i) { return PixelAt(i) / 2 + i % 2 * 32; });
    __m512i places_ = kPlaces.Load();
};

template <class Memory, class Target, class Form, From420 RowKernels::*kKernel>
void RgbFrom420(Rows rgb, Planes420 source, Size size) {
    if (IsNarrow<kStep>(size))
        return (kAvx2Kernels.*kKernel)(rgb, source, size);
    // Groups of four pixels, as 32-bit places.
    static constexpr Table kLuma = MakeTable([](int i) { return i % 4 == 0 ? PixelAt(i) / 4 : 0; });
    const ChromaPairs chroma;
    const Target store;
    const __m512i order = kLuma.Load();
    ForRowPairs(source, rgb, size.height, [&](PlanesPair from, RowPair to, ptrdiff_t, ptrdiff_t) {
        ForSteps<kStep>(size.width, [&](ptrdiff_t x, auto columns) {
            const ChromaTerms<Form> terms(chroma(columns, from.u, from.v, x));
            const auto luma = [&](const uint8_t* row) {
                return _mm512_permutexvar_epi32(order, Load(columns, row + x, columns.count));
            };
            if constexpr (Target::kReads) {
                PrefetchRow(to.first + 2 * rgb.step + 4 * x, 4 * kStep);
                PrefetchRow(to.second + 2 * rgb.step + 4 * x, 4 * kStep);
            }
            store(columns, to.first, x, ToRgb<Form>(luma(from.y.first), terms));
            store(columns, to.second, x, ToRgb<Form>(luma(from.y.second), terms));
        });
    });
    Memory::Finish();
}

} // namespace
} // namespace image

#endif
