// RGB to 4:2:0 and to packed 4:2:2 with AVX-512.
//
// A lane of 32 bits holds a pixel as the bytes B, R, G, R. Its Y and its centred Cb and Cr come out as byte 2
// of a lane.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_AVX512FROMRGB_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_AVX512FROMRGB_H

#include "Common/Image/kernels/Avx512Registers.h"

namespace image {
namespace {

/// 16 pixels' components, each in byte 2 of its lane. What is above that byte is not to be looked at.
struct Components {
    __m512i y, cb, cr;
};

template <class Form>
class RgbToYuv {
public:
    Components operator()(__m512i pixels) const {
        const __m512i luma = _mm512_maddubs_epi16(pixels, yInner_);
        const __m512i differences = _mm512_maddubs_epi16(pixels, BytePairs(1, -1));
        return {_mm512_dpwssd_epi32(yStart_, luma, yOuter_), _mm512_dpwssd_epi32(rounding_, differences, cb_),
                _mm512_dpwssd_epi32(CrStart(pixels), differences, cr_)};
    }

private:
    __m512i CrStart(__m512i pixels) const {
        if constexpr (Form::kCrSum == 0)
            return rounding_;
        // 4 R, and of G what is less than the step of a sum
        static_assert(Form::kCrSum == 0 || (Form::kCrSum == 4 && Form::kScale == 4 && Form::kRounding == 0));
        return _mm512_srli_epi32(pixels, 22);
    }

    __m512i yStart_ = _mm512_set1_epi32((16 << 16) + Form::kRounding);
    __m512i yInner_ = Words((Form::kYInnerBlue & 0xFF) | Form::kYBesideBlue * 256,
                            (Form::kYInnerGreen & 0xFF) | Form::kYBesideGreen * 256);
    __m512i yOuter_ = Words(Form::kYOuterBlue, Form::kYOuterGreen);
    __m512i rounding_ = _mm512_set1_epi32(Form::kRounding);
    __m512i cb_ = Words(Form::kCbBlueWeight, Form::kCbGreenWeight);
    __m512i cr_ = Words(Form::kCrBlueWeight, Form::kCrGreenWeight);
};

/// The order B, R, G, R: which byte of a pixel stands at byte i of its lane.
constexpr int ComponentAt(int i) {
    constexpr int kOrder[4] = {0, 2, 1, 2};
    return kOrder[i % 4];
}

/// 32 pixels of a row.
struct PixelRun {
    __m512i first, second;
};

/// Reads pixels of four bytes.
class Bgr32 {
public:
    static constexpr int kBytes = 4;

    template <class Columns>
    PixelRun operator()(Columns columns, const uint8_t* row, ptrdiff_t x) const {
        const uint8_t* const source = row + 4 * x;
        return {_mm512_shuffle_epi8(Load(columns, source, 4 * columns.count), places_),
                _mm512_shuffle_epi8(Load(columns, source + 64, 4 * columns.count - 64), places_)};
    }

private:
    static constexpr Table kPlaces = MakeTable([](int i) { return i % 16 / 4 * 4 + ComponentAt(i); });
    __m512i places_ = kPlaces.Load();
};

/// Reads pixels of three bytes. The second load begins 16 bytes early, so that it ends with the run.
class Bgr24 {
public:
    static constexpr int kBytes = 3;

    template <class Columns>
    PixelRun operator()(Columns columns, const uint8_t* row, ptrdiff_t x) const {
        const uint8_t* const source = row + 3 * x;
        const __m512i first = Load(columns, source, 3 * columns.count);
        const __m512i second = Load(columns, source + kSecond, 3 * columns.count - kSecond);
        return {_mm512_permutexvar_epi8(places_, first), _mm512_permutexvar_epi8(placesLater_, second)};
    }

private:
    static constexpr int kSecond = 32;
    static constexpr int kLater = 3 * 16 - kSecond;
    static constexpr Table kPlaces = MakeTable([](int i) { return i / 4 * 3 + ComponentAt(i); });
    static constexpr Table kPlacesLater =
        MakeTable([](int i) { return i / 4 * 3 + ComponentAt(i) + kLater; });
    __m512i places_ = kPlaces.Load();
    __m512i placesLater_ = kPlacesLater.Load();
};

/// Byte `byte` of the 32 lanes of two registers, in the low half.
template <int kByte>
class GatherByte {
public:
    __m256i operator()(__m512i first, __m512i second) const {
        return _mm512_castsi512_si256(PermutePair(first, second, places_, kPlaces.FromSecond()));
    }

private:
    static constexpr Table kPlaces = MakeTable([](int i) { return (4 * i + kByte) & 127; });
    __m512i places_ = kPlaces.Load();
};

/// Places of bytes in a register pair of one lane a pixel. Where the row ends with an odd column, in the 32
/// bits of the result that belong to it, the bytes that `back` marks with 4 come from the lane before.
template <class Columns>
__m512i RepeatLastPixel(Columns columns, __m512i places, int back) {
    if constexpr (Columns::kMasked) {
        if (columns.count % 2 != 0) {
            const auto last = static_cast<__mmask16>(1U << (columns.count / 2));
            return _mm512_mask_sub_epi32(places, last, places, _mm512_set1_epi32(back));
        }
    }
    return places;
}

/// Puts the values of neighbouring pixels together: lane i has those of pixels 2i and 2i + 1 of one register
/// pair in its low word, of another in its high word.
class GatherPairs {
public:
    template <class Columns>
    explicit GatherPairs(Columns columns) : places_(RepeatLastPixel(columns, kPlaces.Load(), 0x04000400)) {}

    __m512i operator()(__m512i low0, __m512i low1, __m512i high0, __m512i high1) const {
        constexpr uint64_t kFromSecond = kPlaces.FromSecond();
        const __m512i low = PermutePair(low0, low1, places_, kFromSecond);
#ifdef MOVIECONV_PERMUTE_PAIRS
        return _mm512_mask_blend_epi8(kHighWords, low, PermutePair(high0, high1, places_, kFromSecond));
#else
        const __m512i first = _mm512_mask_permutexvar_epi8(low, kHighWords & ~kFromSecond, places_, high0);
        return _mm512_mask_permutexvar_epi8(first, kHighWords & kFromSecond, places_, high1);
#endif
    }

private:
    static constexpr uint64_t kHighWords = 0xCCCCCCCCCCCCCCCC;
    static constexpr Table kPlaces = MakeTable([](int i) { return 4 * (i / 4 * 2 + i % 2) + 2; });
    __m512i places_;
};

inline constexpr int kRgbStep = 32;

/// Writes 4:2:0 from two rows of pixels that `Read` knows how to read.
template <class Form, class Read>
class To420Step {
public:
    template <class Columns>
    void operator()(Columns columns, const PlanesPair& target, RowPair rgb, ptrdiff_t x,
                    ptrdiff_t toNextRows) const {
        PrefetchRows(rgb, Read::kBytes * x + toNextRows, Read::kBytes * kRgbStep);
        const PixelRun upper = read_(columns, rgb.first, x);
        const Components a = convert_(upper.first);
        const Components b = convert_(upper.second);
        StoreHalf(columns, target.y.first + x, columns.count, gatherY_(a.y, b.y));
        const PixelRun lower = read_(columns, rgb.second, x);
        const Components c = convert_(lower.first);
        const Components d = convert_(lower.second);
        StoreHalf(columns, target.y.second + x, columns.count, gatherY_(c.y, d.y));

        const GatherPairs gather(columns);
        const __m512i cb = SumOfFour(gather(a.cb, b.cb, c.cb, d.cb));
        const __m512i cr = SumOfFour(gather(a.cr, b.cr, c.cr, d.cr));
        const __m512i chroma = PermutePair(cb, cr, gatherChroma_, kChroma.FromSecond());
        const ptrdiff_t samples = (columns.count + 1) / 2;
        StoreQuarter(columns, target.u + x / 2, samples, _mm512_castsi512_si128(chroma));
        StoreQuarter(columns, target.v + x / 2, samples, _mm512_extracti32x4_epi32(chroma, 1));
    }

private:
    /// 64 times the sum of a lane's centred bytes and the offset: the stored average is byte 1.
    __m512i SumOfFour(__m512i bytes) const {
        return _mm512_dpbusd_epi32(_mm512_set1_epi32(128 << 8), _mm512_set1_epi8(64), bytes);
    }

    static constexpr Table kChroma = MakeTable([](int i) { return (i % 32 < 16 ? 0 : 64) + i % 16 * 4 + 1; });
    Read read_;
    RgbToYuv<Form> convert_;
    GatherByte<2> gatherY_;
    __m512i gatherChroma_ = kChroma.Load();
};

template <class Form, class Read, To420 RowKernels::*kKernel>
void RgbTo420(Planes420 target, Rows rgb, Size size) {
    if (IsNarrow<kRgbStep>(size))
        return (kAvx2Kernels.*kKernel)(target, rgb, size);
    const To420Step<Form, Read> convert;
    ForRowPairs(target, rgb, size.height, [&](PlanesPair to, RowPair from, ptrdiff_t, ptrdiff_t) {
        ForSteps<kRgbStep>(size.width,
                           [&](ptrdiff_t x, auto columns) { convert(columns, to, from, x, 2 * rgb.step); });
    });
}

template <class Columns>
void StoreAlpha(Columns columns, uint8_t* alpha, const uint8_t* bgra, ptrdiff_t x,
                const GatherByte<3>& gather) {
    const uint8_t* const source = bgra + 4 * x;
    StoreHalf(
        columns, alpha + x, columns.count,
        gather(Load(columns, source, 4 * columns.count), Load(columns, source + 64, 4 * columns.count - 64)));
}

inline void Bgra32To420(Planes420 target, Rows alpha, Rows bgra, Size size) {
    if (IsNarrow<kRgbStep>(size))
        return kAvx2Kernels.bgra32To420(target, alpha, bgra, size);
    const To420Step<FastRgbForm, Bgr32> convert;
    const GatherByte<3> gather;
    ForRowPairs(target, bgra, size.height, [&](PlanesPair to, RowPair from, ptrdiff_t row0, ptrdiff_t row1) {
        uint8_t* const alpha0 = alpha[row0];
        uint8_t* const alpha1 = alpha[row1];
        ForSteps<kRgbStep>(size.width, [&](ptrdiff_t x, auto columns) {
            convert(columns, to, from, x, 2 * bgra.step);
            StoreAlpha(columns, alpha0, from.first, x, gather);
            StoreAlpha(columns, alpha1, from.second, x, gather);
        });
    });
}

template <class Memory, PackedOrder kOrder>
void PackedFromBgr24(Rows packed, Rows rgb, Size size) {
    if (IsNarrow<kRgbStep>(size))
        return kAvx2Kernels.packedFromBgr24[kOrder](packed, rgb, size);
    static constexpr Table kLuma = MakeTable([](int i) { return 4 * (i / 2) + 2; });
    constexpr uint64_t kChromaBytes = kOrder == kYuy2 ? kOddBytes : ~kOddBytes;
    const Bgr24 read;
    const RgbToYuv<FastRgbForm> convert;
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        uint8_t* const target = packed[row];
        const uint8_t* const source = rgb[row];
        ForSteps<kRgbStep>(size.width, [&](ptrdiff_t x, auto columns) {
            PrefetchRow(source + 3 * x + rgb.step, 3 * kRgbStep);
            const PixelRun run = read(columns, source, x);
            const Components a = convert(run.first);
            const Components b = convert(run.second);
            const __m512i lumaPlaces = RepeatLastPixel(columns, kLuma.Load(), 0x04040000);
            const __m512i luma = PermutePair(a.y, b.y, lumaPlaces, kLuma.FromSecond());
            const GatherPairs gather(columns);
            // 128 times the sum of two and the offset: the stored average is byte 1
            const __m512i averages =
                _mm512_add_epi16(_mm512_maddubs_epi16(_mm512_set1_epi8(-128), gather(a.cb, b.cb, a.cr, b.cr)),
                                 _mm512_set1_epi16(-0x8000));
            const __m512i chroma = kOrder == kYuy2 ? averages : _mm512_srli_epi16(averages, 8);
            Store<Memory>(columns, target + 2 * x, 4 * ((columns.count + 1) / 2),
                          _mm512_mask_blend_epi8(kChromaBytes, luma, chroma));
        });
    }
    Memory::Finish();
}

} // namespace
} // namespace image

#endif
