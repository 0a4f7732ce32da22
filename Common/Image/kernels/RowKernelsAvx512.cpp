// Kernels for processors with AVX-512 F, BW, VL, VBMI and VNNI.
//
// A row is a number of whole steps and one part of a step, which is the same code with its loads and stores
// masked by the byte: masked-off bytes are neither read nor written, and do not fault. Bytes are put in their
// places by permutations over whole registers.
#include "Common/Image/kernels/FixedPoint.h"
#include "Common/Image/kernels/RowKernels.h"

#include <array>
#include <immintrin.h>

namespace image {
namespace {

// Steps, masks and tables
// ---------------------------------------------------------------------------------------------

/// The columns of one step: all of them, or as many as are left at the end of a row.
template <int kColumns>
struct Whole {
    static constexpr bool kMasked = false;
    static constexpr ptrdiff_t count = kColumns;
};
struct Part {
    static constexpr bool kMasked = true;
    ptrdiff_t count;
};

/// The rows of a 4:2:0 picture that share chroma, or of its target or source.
template <class Byte>
struct PlanesPair {
    RowPair<Byte> y;
    Byte* u;
    Byte* v;
};

/// Whether pictures of this width are cheaper in smaller registers: at most half a step fills.
template <int kColumns>
bool IsNarrow(Size size) {
    return size.width <= kColumns / 2;
}

template <int kColumns, class Step>
void ForSteps(ptrdiff_t width, Step step) {
    ptrdiff_t x = 0;
    for (; x + kColumns <= width; x += kColumns)
        step(x, Whole<kColumns>{});
    if (x < width)
        step(x, Part{width - x});
}

uint64_t Bits(ptrdiff_t count) {
    if (count >= 64)
        return ~uint64_t{0};
    return count <= 0 ? 0 : (uint64_t{1} << count) - 1;
}

/// Columns of most steps, each a byte of a register.
constexpr int kStep = 64;

/// The bytes at `source`, as far as there are any; zeroes behind them.
template <class Columns>
__m512i Load(Columns, const uint8_t* source, ptrdiff_t bytes) {
    if constexpr (Columns::kMasked)
        return _mm512_maskz_loadu_epi8(Bits(bytes), source);
    else
        return _mm512_loadu_si512(source);
}

template <class Columns>
__m256i LoadHalf(Columns, const uint8_t* source, ptrdiff_t bytes) {
    if constexpr (Columns::kMasked)
        return _mm256_maskz_loadu_epi8(static_cast<__mmask32>(Bits(bytes)), source);
    else
        return _mm256_loadu_si256(reinterpret_cast<const __m256i*>(source));
}

/// Where whole registers of packed rows and single planes go.
struct Cached {
    static void Store(uint8_t* target, __m512i value) { _mm512_storeu_si512(target, value); }
    static void Finish() {}
};

/// Past the caches, for targets that none of them holds: whole cache lines where the target begins with one,
/// else their quarters, because allocated memory is aligned to 16 bytes.
struct Streamed {
    static void Store(uint8_t* target, __m512i value) {
        if (reinterpret_cast<uintptr_t>(target) % sizeof value == 0) {
            _mm512_stream_si512(reinterpret_cast<__m512i*>(target), value);
            return;
        }
        auto* const quarters = reinterpret_cast<__m128i*>(target);
        _mm_stream_si128(quarters, _mm512_castsi512_si128(value));
        _mm_stream_si128(quarters + 1, _mm512_extracti32x4_epi32(value, 1));
        _mm_stream_si128(quarters + 2, _mm512_extracti32x4_epi32(value, 2));
        _mm_stream_si128(quarters + 3, _mm512_extracti32x4_epi32(value, 3));
    }
    static void Finish() { _mm_sfence(); }
};

template <class Memory, class Columns>
void Store(Columns, uint8_t* target, ptrdiff_t bytes, __m512i value) {
    if constexpr (Columns::kMasked)
        _mm512_mask_storeu_epi8(target, Bits(bytes), value);
    else
        Memory::Store(target, value);
}

template <class Columns>
void StoreHalf(Columns, uint8_t* target, ptrdiff_t bytes, __m256i value) {
    if constexpr (Columns::kMasked)
        _mm256_mask_storeu_epi8(target, static_cast<__mmask32>(Bits(bytes)), value);
    else
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(target), value);
}

template <class Columns>
void StoreQuarter(Columns, uint8_t* target, ptrdiff_t bytes, __m128i value) {
    if constexpr (Columns::kMasked)
        _mm_mask_storeu_epi8(target, static_cast<__mmask16>(Bits(bytes)), value);
    else
        _mm_storeu_si128(reinterpret_cast<__m128i*>(target), value);
}

/// Asks for what the steps a little further on will read; past the end of a row it does no harm.
void Prefetch(const uint8_t* source) {
    constexpr int kAhead = 2048;
    _mm_prefetch(reinterpret_cast<const char*>(source + kAhead), _MM_HINT_T0);
}

/// Bytes of a register, made at compile time.
struct alignas(64) Table {
    std::array<uint8_t, 64> bytes;

    __m512i Load() const { return _mm512_load_si512(bytes.data()); }

    /// The bytes whose place is in the second register of a pair.
    constexpr uint64_t FromSecond() const {
        uint64_t mask = 0;
        for (size_t i = 0; i < bytes.size(); ++i)
            mask |= uint64_t{bytes[i] / 64U} << i;
        return mask;
    }
};

/// The bytes of two registers at the given places, by a permutation of each: the one of two registers at once
/// takes three operations on some processors.
__m512i PermutePair(__m512i first, __m512i second, __m512i places, uint64_t fromSecond) {
    return _mm512_mask_permutexvar_epi8(_mm512_permutexvar_epi8(places, first), fromSecond, places, second);
}

/// Byte i of the table is what `entry(i)` says.
template <class Entry>
constexpr Table MakeTable(Entry entry) {
    Table table{};
    for (int i = 0; i < 64; ++i)
        table.bytes[static_cast<size_t>(i)] = static_cast<uint8_t>(entry(i));
    return table;
}

/// Two words, or four bytes, that fill every lane of 32 bits.
__m512i Words(int low, int high) {
    return _mm512_set1_epi32(static_cast<int>((static_cast<uint32_t>(high) << 16) | (low & 0xFFFF)));
}
__m512i BytePairs(int low, int high) {
    return _mm512_set1_epi16(static_cast<int16_t>(high * 256 + (low & 0xFF)));
}

constexpr uint64_t kOddBytes = 0xAAAAAAAAAAAAAAAA;

/// Where the samples of pixel p stand in a packed row.
template <PackedOrder kOrder>
struct Packed {
    static constexpr int kLuma = kOrder == kYuy2 ? 0 : 1;
    static constexpr int kChroma = 1 - kLuma;
    static constexpr int Y(int p) { return 2 * p + kLuma; }
    static constexpr int U(int p) { return 2 * (p & ~1) + kChroma; }
    static constexpr int V(int p) { return U(p) + 2; }
};

// RGB to YUV ------------------------------------------------------------------------------------------------
// A lane of 32 bits holds a pixel as the bytes B, R, G, R. A sum starts with its offset of 16 or 128, so that
// the component comes out as byte 2 of its lane.

/// 16 pixels' components, each in byte 2 of its lane.
struct Components {
    __m512i y, cb, cr;
};

template <class Form>
class RgbToYuv {
public:
    Components operator()(__m512i pixels) const {
        const __m512i luma = _mm512_maddubs_epi16(pixels, yInner_);
        const __m512i differences = _mm512_maddubs_epi16(pixels, BytePairs(1, -1));
        return {_mm512_dpwssd_epi32(yStart_, luma, yOuter_),
                _mm512_dpwssd_epi32(chromaStart_, differences, cb_),
                _mm512_dpwssd_epi32(CrStart(pixels), differences, cr_)};
    }

private:
    __m512i CrStart(__m512i pixels) const {
        if constexpr (Form::kCrSum == 0) {
            return chromaStart_;
        } else {
            return _mm512_dpbusd_epi32(chromaStart_, pixels, _mm512_set1_epi32(Form::kCrSum << 8));
        }
    }

    __m512i yStart_ = _mm512_set1_epi32((16 << 16) + Form::kRounding);
    __m512i yInner_ = Words((Form::kYInnerBlue & 0xFF) | Form::kYBesideBlue * 256,
                            (Form::kYInnerGreen & 0xFF) | Form::kYBesideGreen * 256);
    __m512i yOuter_ = Words(Form::kYOuterBlue, Form::kYOuterGreen);
    __m512i chromaStart_ = _mm512_set1_epi32((128 << 16) + Form::kRounding);
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
    template <class Columns>
    PixelRun operator()(Columns columns, const uint8_t* row, ptrdiff_t x) const {
        const uint8_t* const source = row + 4 * x;
        Prefetch(source);
        Prefetch(source + 64);
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
    template <class Columns>
    PixelRun operator()(Columns columns, const uint8_t* row, ptrdiff_t x) const {
        const uint8_t* const source = row + 3 * x;
        Prefetch(source);
        Prefetch(source + 64);
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
        const __m512i first = _mm512_mask_permutexvar_epi8(low, kHighWords & ~kFromSecond, places_, high0);
        return _mm512_mask_permutexvar_epi8(first, kHighWords & kFromSecond, places_, high1);
    }

private:
    static constexpr uint64_t kHighWords = 0xCCCCCCCCCCCCCCCC;
    static constexpr Table kPlaces = MakeTable([](int i) { return 4 * (i / 4 * 2 + i % 2) + 2; });
    __m512i places_;
};

constexpr int kRgbStep = 32;

/// Writes 4:2:0 from two rows of pixels that `Read` knows how to read.
template <class Form, class Read>
class To420Step {
public:
    template <class Columns>
    void operator()(Columns columns, const PlanesPair<uint8_t>& target, RowPair<const uint8_t> rgb,
                    ptrdiff_t x) const {
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
    /// 64 times the sum of a lane's bytes: their truncated average is byte 1.
    __m512i SumOfFour(__m512i bytes) const {
        return _mm512_dpbusd_epi32(_mm512_setzero_si512(), bytes, _mm512_set1_epi8(64));
    }

    static constexpr Table kChroma = MakeTable([](int i) { return (i % 32 < 16 ? 0 : 64) + i % 16 * 4 + 1; });
    Read read_;
    RgbToYuv<Form> convert_;
    GatherByte<2> gatherY_;
    __m512i gatherChroma_ = kChroma.Load();
};

/// Calls visit(target, source, row0, row1) for the pairs of rows of a packed source.
template <class Visit>
void ForTargetPairs(const Planes420& target, Rows source, ptrdiff_t height, Visit visit) {
    ForRowPairs(height, [&](ptrdiff_t row0, ptrdiff_t row1, ptrdiff_t half) {
        visit(PlanesPair<uint8_t>{target.y.Targets(row0, row1), target.u[half], target.v[half]},
              source.Sources(row0, row1), row0, row1);
    });
}

template <class Form, class Read, To420 RowKernels::*kKernel>
void RgbTo420(Planes420 target, Rows rgb, Size size) {
    if (IsNarrow<kRgbStep>(size))
        return (kAvx2Kernels.*kKernel)(target, rgb, size);
    const To420Step<Form, Read> convert;
    ForTargetPairs(target, rgb, size.height, [&](const auto& to, auto from, ptrdiff_t, ptrdiff_t) {
        ForSteps<kRgbStep>(size.width, [&](ptrdiff_t x, auto columns) { convert(columns, to, from, x); });
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

void Bgra32To420(Planes420 target, Rows alpha, Rows bgra, Size size) {
    if (IsNarrow<kRgbStep>(size))
        return kAvx2Kernels.bgra32To420(target, alpha, bgra, size);
    const To420Step<FastRgbForm, Bgr32> convert;
    const GatherByte<3> gather;
    ForTargetPairs(target, bgra, size.height, [&](const auto& to, auto from, ptrdiff_t row0, ptrdiff_t row1) {
        uint8_t* const alpha0 = alpha[row0];
        uint8_t* const alpha1 = alpha[row1];
        ForSteps<kRgbStep>(size.width, [&](ptrdiff_t x, auto columns) {
            convert(columns, to, from, x);
            StoreAlpha(columns, alpha0, from.first, x, gather);
            StoreAlpha(columns, alpha1, from.second, x, gather);
        });
    });
}

// Packed 4:2:2 from RGB -----------------------------------------------------------------------------------

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
            const PixelRun run = read(columns, source, x);
            const Components a = convert(run.first);
            const Components b = convert(run.second);
            const __m512i lumaPlaces = RepeatLastPixel(columns, kLuma.Load(), 0x04040000);
            const __m512i luma = PermutePair(a.y, b.y, lumaPlaces, kLuma.FromSecond());
            const GatherPairs gather(columns);
            const __m512i sums = _mm512_maddubs_epi16(gather(a.cb, b.cb, a.cr, b.cr), _mm512_set1_epi8(1));
            const __m512i chroma = kOrder == kYuy2 ? _mm512_slli_epi16(sums, 7) : _mm512_srli_epi16(sums, 1);
            Store<Memory>(columns, target + 2 * x, 4 * ((columns.count + 1) / 2),
                          _mm512_mask_blend_epi8(kChromaBytes, luma, chroma));
        });
    }
    Memory::Finish();
}

// YUV to RGB ------------------------------------------------------------------------------------------------
// 64 pixels as bytes. They stand in an order in which unpacking within lanes of 128 bits gives 32-bit pixels
// in memory order: byte 4 k + j of lane L is pixel 16 k + 4 L + j.

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

__m512i Times(__m512i words, int factor) {
    return _mm512_mullo_epi16(words, _mm512_set1_epi16(static_cast<int16_t>(factor)));
}
__m512i Plus(__m512i words, int constant) {
    return _mm512_add_epi16(words, _mm512_set1_epi16(static_cast<int16_t>(constant)));
}

template <class Form>
__m512i RedTerm(__m512i v) {
    const __m512i rest =
        _mm512_srai_epi16(Plus(Times(v, Form::kRedRest), Form::kRedRestConstant), Form::kShift);
    return _mm512_add_epi16(Plus(Times(v, Form::kRedWhole), Form::kRedConstant), rest);
}

template <class Form>
__m512i GreenTerm(__m512i u, __m512i v) {
    const __m512i rests = _mm512_add_epi16(Times(u, Form::kGreenURest), Times(v, Form::kGreenVRest));
    const __m512i wholes = _mm512_add_epi16(Times(u, Form::kGreenUWhole), Times(v, Form::kGreenVWhole));
    return _mm512_add_epi16(Plus(wholes, Form::kGreenConstant),
                            _mm512_srai_epi16(Plus(rests, Form::kGreenRestConstant), Form::kShift));
}

template <class Form>
__m512i BlueRestTerm(__m512i u) {
    const __m512i rest =
        _mm512_srai_epi16(Plus(Times(u, Form::kBlueRest), Form::kBlueRestConstant), Form::kShift);
    return _mm512_add_epi16(Plus(Times(u, Form::kBlueWhole), Form::kBlueConstant), rest);
}

/// All that 32 chroma samples give their pixels, from words of U and V.
template <class Form>
struct ChromaTerms {
    ChromaTerms(__m512i u, __m512i v)
        : red(RedTerm<Form>(v)),
          green(GreenTerm<Form>(u, v)),
          blue(_mm512_xor_si512(_mm512_slli_epi16(u, 8), _mm512_set1_epi16(-0x8000))),
          blueRest(BlueRestTerm<Form>(u)) {}
    Terms red, green, blue, blueRest;
};

/// Bytes of 64 pixels.
struct Rgb {
    __m512i blue, green, red;
};

__m512i Component(__m512i low, __m512i high) {
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
    static constexpr Table kPlaces = MakeTable([](int i) { return PlaceOf((64 * kThird + i) / 3); });
    static constexpr uint64_t BytesOf(int component) {
        uint64_t mask = 0;
        for (int i = 0; i < 64; ++i)
            mask |= uint64_t{(64 * kThird + i) % 3 == component} << i;
        return mask;
    }

    __m512i operator()(const Rgb& rgb) const {
        const __m512i blue = _mm512_permutexvar_epi8(places_, rgb.blue);
        const __m512i blueGreen = _mm512_mask_permutexvar_epi8(blue, BytesOf(1), places_, rgb.green);
        return _mm512_mask_permutexvar_epi8(blueGreen, BytesOf(2), places_, rgb.red);
    }

private:
    __m512i places_ = kPlaces.Load();
};

template <class Memory>
class Bgr24Target {
public:
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

/// Chroma bytes as words, in the order of the pixels.
class ChromaWords {
public:
    template <class Columns>
    __m512i operator()(Columns columns, const uint8_t* row, ptrdiff_t x) const {
        const __m256i bytes = LoadHalf(columns, row + x / 2, (columns.count + 1) / 2);
        return _mm512_maskz_permutexvar_epi8(~kOddBytes, places_, _mm512_castsi256_si512(bytes));
    }

private:
    static constexpr Table kPlaces = MakeTable([](int i) { return PixelAt(i) / 2; });
    __m512i places_ = kPlaces.Load();
};

/// Calls visit(target, source) for the pairs of rows of a packed target.
template <class Visit>
void ForSourcePairs(Rows target, const Planes420& source, ptrdiff_t height, Visit visit) {
    ForRowPairs(height, [&](ptrdiff_t row0, ptrdiff_t row1, ptrdiff_t half) {
        visit(target.Targets(row0, row1),
              PlanesPair<const uint8_t>{source.y.Sources(row0, row1), source.u[half], source.v[half]});
    });
}

template <class Memory, class Target, class Form, From420 RowKernels::*kKernel>
void RgbFrom420(Rows rgb, Planes420 source, Size size) {
    if (IsNarrow<kStep>(size))
        return (kAvx2Kernels.*kKernel)(rgb, source, size);
    // Groups of four pixels, as 32-bit places.
    static constexpr Table kLuma = MakeTable([](int i) { return i % 4 == 0 ? PixelAt(i) / 4 : 0; });
    const ChromaWords words;
    const Target store;
    const __m512i order = kLuma.Load();
    ForSourcePairs(rgb, source, size.height, [&](RowPair<uint8_t> to, const auto& from) {
        ForSteps<kStep>(size.width, [&](ptrdiff_t x, auto columns) {
            const ChromaTerms<Form> terms(words(columns, from.u, x), words(columns, from.v, x));
            const auto luma = [&](const uint8_t* row) {
                return _mm512_permutexvar_epi32(order, Load(columns, row + x, columns.count));
            };
            store(columns, to.first, x, ToRgb<Form>(luma(from.y.first), terms));
            store(columns, to.second, x, ToRgb<Form>(luma(from.y.second), terms));
        });
    });
    Memory::Finish();
}

// Packed 4:2:2 ----------------------------------------------------------------------------------------------

/// 64 pixels of a packed row.
struct PackedRun {
    __m512i first, second;
};

/// An odd number of columns ends with the even pixel of its group; what belongs to the odd one is not read.
template <PackedOrder kOrder, class Columns>
PackedRun LoadPacked(Columns columns, const uint8_t* row, ptrdiff_t x) {
    constexpr ptrdiff_t kBytesOfEvenPixel = kOrder == kYuy2 ? 4 : 3;
    const ptrdiff_t bytes = columns.count / 2 * 4 + columns.count % 2 * kBytesOfEvenPixel;
    return {Load(columns, row + 2 * x, bytes), Load(columns, row + 2 * x + 64, bytes - 64)};
}

/// Samples of a packed run.
class Pick {
public:
    explicit Pick(const Table& places) : places_(places.Load()), fromSecond_(places.FromSecond()) {}
    __m512i operator()(const PackedRun& run) const {
        return PermutePair(run.first, run.second, places_, fromSecond_);
    }

private:
    __m512i places_;
    uint64_t fromSecond_;
};

template <class Memory, PackedOrder kOrder>
void Bgr24FromPacked(Rows rgb, Rows packed, Size size) {
    if (IsNarrow<kStep>(size))
        return kAvx2Kernels.bgr24FromPacked[kOrder](rgb, packed, size);
    using Form = FastYuvForm;
    using Order = Packed<kOrder>;
    static constexpr Table kLuma = MakeTable([](int i) { return Order::Y(PixelAt(i)); });
    static constexpr Table kU = MakeTable([](int i) { return Order::U(PixelAt(i)); });
    static constexpr Table kV = MakeTable([](int i) { return Order::V(PixelAt(i)); });
    const Bgr24Target<Memory> store;
    const __m512i lowBytes = _mm512_set1_epi16(0xFF);
    const Pick luma(kLuma);
    const Pick u(kU);
    const Pick v(kV);
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        uint8_t* const target = rgb[row];
        const uint8_t* const source = packed[row];
        ForSteps<kStep>(size.width, [&](ptrdiff_t x, auto columns) {
            const PackedRun run = LoadPacked<kOrder>(columns, source, x);
            const ChromaTerms<Form> terms(_mm512_and_si512(u(run), lowBytes),
                                          _mm512_and_si512(v(run), lowBytes));
            store(columns, target, x, ToRgb<Form>(luma(run), terms));
        });
    }
    Memory::Finish();
}

__m512i TruncatedAverage(__m512i a, __m512i b) {
    constexpr int kDifferenceAndThird = 0x28; // (a ^ b) & c
    const __m512i roundedUp = _mm512_ternarylogic_epi32(a, b, _mm512_set1_epi8(1), kDifferenceAndThird);
    return _mm512_sub_epi8(_mm512_avg_epu8(a, b), roundedUp);
}

template <PackedOrder kOrder>
void PackedTo420(Planes420 target, Rows packed, Size size) {
    if (IsNarrow<kStep>(size))
        return kAvx2Kernels.packedTo420[kOrder](target, packed, size);
    using Order = Packed<kOrder>;
    static constexpr Table kLuma = MakeTable([](int i) { return Order::Y(i); });
    static constexpr Table kChroma =
        MakeTable([](int i) { return i < 32 ? Order::U(2 * i) : Order::V(2 * (i - 32)); });
    const Pick luma(kLuma);
    const Pick chroma(kChroma);
    ForTargetPairs(target, packed, size.height, [&](const auto& to, auto from, ptrdiff_t, ptrdiff_t) {
        ForSteps<kStep>(size.width, [&](ptrdiff_t x, auto columns) {
            const PackedRun upper = LoadPacked<kOrder>(columns, from.first, x);
            const PackedRun lower = LoadPacked<kOrder>(columns, from.second, x);
            Store<Cached>(columns, to.y.first + x, columns.count, luma(upper));
            Store<Cached>(columns, to.y.second + x, columns.count, luma(lower));
            const __m512i uv = TruncatedAverage(chroma(upper), chroma(lower));
            StoreHalf(columns, to.u + x / 2, columns.count / 2, _mm512_castsi512_si256(uv));
            StoreHalf(columns, to.v + x / 2, columns.count / 2, _mm512_extracti64x4_epi64(uv, 1));
        });
    });
}

template <class Memory, PackedOrder kOrder>
void PackedFrom420(Rows packed, Planes420 source, Size size) {
    if (IsNarrow<kStep>(size))
        return kAvx2Kernels.packedFrom420[kOrder](packed, source, size);
    // The second register holds 32 bytes of U, then 32 of V.
    static constexpr auto kPlaces = [](int firstPixel) {
        return MakeTable([=](int i) {
            const int pixel = firstPixel + i / 2;
            if (i % 2 == Packed<kOrder>::kLuma)
                return pixel;
            return 64 + pixel / 2 + (pixel % 2 == 0 ? 0 : 32);
        });
    };
    static constexpr Table kFirst = kPlaces(0);
    static constexpr Table kSecond = kPlaces(32);
    const Pick first(kFirst);
    const Pick second(kSecond);
    ForSourcePairs(packed, source, size.height, [&](RowPair<uint8_t> to, const auto& from) {
        ForSteps<kStep>(size.width, [&](ptrdiff_t x, auto columns) {
            const __m256i u = LoadHalf(columns, from.u + x / 2, columns.count / 2);
            const __m256i v = LoadHalf(columns, from.v + x / 2, columns.count / 2);
            const __m512i chroma = _mm512_inserti64x4(_mm512_castsi256_si512(u), v, 1);
            const auto store = [&](uint8_t* target, const uint8_t* luma) {
                const PackedRun run{Load(columns, luma, columns.count), chroma};
                Store<Memory>(columns, target, 2 * columns.count, first(run));
                Store<Memory>(columns, target + 64, 2 * columns.count - 64, second(run));
            };
            store(to.first + 2 * x, from.y.first + x);
            store(to.second + 2 * x, from.y.second + x);
        });
    });
    Memory::Finish();
}

template <class Memory>
void SwapPacked(Rows target, Rows source, Size size) {
    static constexpr Table kSwapped = MakeTable([](int i) { return i % 16 ^ 1; });
    const __m512i swapped = kSwapped.Load();
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        uint8_t* const to = target[row];
        const uint8_t* const from = source[row];
        ForSteps<32>(size.width, [&](ptrdiff_t x, auto columns) {
            const __m512i bytes = Load(columns, from + 2 * x, 2 * columns.count);
            Store<Memory>(columns, to + 2 * x, 2 * columns.count, _mm512_shuffle_epi8(bytes, swapped));
        });
    }
    Memory::Finish();
}

/// Longer registers gain nothing here.
void Copy(Rows target, Rows source, Size size) {
    kAvx2Kernels.copy(target, source, size);
}

// Planes ----------------------------------------------------------------------------------------------------

constexpr int kHalveStep = 128;

void Halve(Rows target, Rows source, Size size) {
    // 64 times a sum of four has the truncated average in its high byte.
    static constexpr Table kHighBytes = MakeTable([](int i) { return 2 * i + 1; });
    static constexpr Table kEvenTwice = MakeTable([](int i) { return i % 16 & ~1; });
    if (IsNarrow<kHalveStep>(size))
        return kAvx2Kernels.halve(target, source, size);
    const __m512i weights = _mm512_set1_epi8(64);
    const __m512i highBytes = kHighBytes.Load();
    ForRowPairs(size.height, [&](ptrdiff_t row0, ptrdiff_t row1, ptrdiff_t half) {
        const auto from = source.Sources(row0, row1);
        uint8_t* const to = target[half];
        ForSteps<kHalveStep>(size.width, [&](ptrdiff_t x, auto columns) {
            const auto pairSums = [&](const uint8_t* row, ptrdiff_t skipped) {
                const ptrdiff_t bytes = columns.count - skipped;
                __m512i samples = Load(columns, row + x + skipped, bytes);
                if constexpr (decltype(columns)::kMasked) {
                    if (bytes % 2 != 0) {
                        const uint64_t missing = Bits(bytes + 1) ^ Bits(bytes);
                        samples = _mm512_mask_shuffle_epi8(samples, missing, samples, kEvenTwice.Load());
                    }
                }
                return _mm512_maddubs_epi16(samples, weights);
            };
            const __m512i first = _mm512_add_epi16(pairSums(from.first, 0), pairSums(from.second, 0));
            const __m512i second = _mm512_add_epi16(pairSums(from.first, 64), pairSums(from.second, 64));
            Store<Cached>(columns, to + x / 2, (columns.count + 1) / 2,
                          PermutePair(first, second, highBytes, kHighBytes.FromSecond()));
        });
    });
}

void Doubled(Rows target, Rows source, Size size) {
    if (IsNarrow<kStep>(size))
        return kAvx2Kernels.doubled(target, source, size);
    static constexpr Table kFirst = MakeTable([](int i) { return i / 2; });
    static constexpr Table kSecond = MakeTable([](int i) { return 32 + i / 2; });
    const __m512i firstPlaces = kFirst.Load();
    const __m512i secondPlaces = kSecond.Load();
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        const auto to = target.Targets(2 * row, 2 * row + 1);
        const uint8_t* const from = source[row];
        ForSteps<kStep>(size.width, [&](ptrdiff_t x, auto columns) {
            const __m512i samples = Load(columns, from + x, columns.count);
            const __m512i first = _mm512_permutexvar_epi8(firstPlaces, samples);
            const __m512i second = _mm512_permutexvar_epi8(secondPlaces, samples);
            for (uint8_t* const doubled : {to.first + 2 * x, to.second + 2 * x}) {
                Store<Cached>(columns, doubled, 2 * columns.count, first);
                Store<Cached>(columns, doubled + 64, 2 * columns.count - 64, second);
            }
        });
    }
}

template <class Memory>
constexpr RowKernels MakeKernels(const RowKernels* large) {
    using Target24 = Bgr24Target<Memory>;
    return {
        .bgr32To420 = RgbTo420<FastRgbForm, Bgr32, &RowKernels::bgr32To420>,
        .bgr24To420 = RgbTo420<FastRgbForm, Bgr24, &RowKernels::bgr24To420>,
        .bgr24To420Simple = RgbTo420<SimpleRgbForm, Bgr24, &RowKernels::bgr24To420Simple>,
        .bgra32To420 = Bgra32To420,
        .bgr24From420 = RgbFrom420<Memory, Target24, FastYuvForm, &RowKernels::bgr24From420>,
        .bgr24From420Simple = RgbFrom420<Memory, Target24, SimpleYuvForm, &RowKernels::bgr24From420Simple>,
        .bgrxFrom420 = RgbFrom420<Memory, Bgr32Target<Memory, false>, FastYuvForm, &RowKernels::bgrxFrom420>,
        .bgraFrom420 = RgbFrom420<Memory, Bgr32Target<Memory, true>, FastYuvForm, &RowKernels::bgraFrom420>,
        .packedTo420 = {PackedTo420<kUyvy>, PackedTo420<kYuy2>},
        .packedFrom420 = {PackedFrom420<Memory, kUyvy>, PackedFrom420<Memory, kYuy2>},
        .packedFromBgr24 = {PackedFromBgr24<Memory, kUyvy>, PackedFromBgr24<Memory, kYuy2>},
        .bgr24FromPacked = {Bgr24FromPacked<Memory, kUyvy>, Bgr24FromPacked<Memory, kYuy2>},
        .swapPacked = SwapPacked<Memory>,
        .copy = Copy,
        .halve = Halve,
        .doubled = Doubled,
        .large = large,
    };
}

constexpr RowKernels kLargeKernels = MakeKernels<Streamed>(nullptr);

} // namespace

constinit const RowKernels kAvx512Kernels = MakeKernels<Cached>(&kLargeKernels);

} // namespace image
