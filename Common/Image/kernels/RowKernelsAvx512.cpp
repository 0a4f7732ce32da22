// Kernels for processors with AVX-512 F, BW, VL, VBMI and VNNI.
#include "Common/Image/kernels/Avx512FromRgb.h"
#include "Common/Image/kernels/Avx512Registers.h"
#include "Common/Image/kernels/Avx512ToRgb.h"

namespace image {
namespace {

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
    static constexpr Table kLuma = MakeTable([](int i) { return Order::Y(i); });
    static constexpr Table kChroma = MakeTable([](int i) { return i % 2 == 0 ? Order::U(i) : Order::V(i); });
    const Bgr24Target<Memory> store;
    const Pick luma(kLuma);
    const Pick chroma(kChroma);
    for (ptrdiff_t row = 0; row < size.height; ++row) {
        uint8_t* const target = rgb[row];
        const uint8_t* const source = packed[row];
        ForSteps<kStep>(size.width, [&](ptrdiff_t x, auto columns) {
            const PackedRun run = LoadPacked<kOrder>(columns, source, x);
            const ChromaTerms<Form> terms(chroma(run));
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
    ForRowPairs(target, packed, size.height, [&](PlanesPair to, RowPair from, ptrdiff_t, ptrdiff_t) {
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
    ForRowPairs(source, packed, size.height, [&](PlanesPair from, RowPair to, ptrdiff_t, ptrdiff_t) {
        ForSteps<kStep>(size.width, [&](ptrdiff_t x, auto columns) {
            if constexpr (Memory::kPastCaches)
                PrefetchRows(from.y, x + 2 * source.y.step, kStep);
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
        const auto from = source.Pair(row0, row1);
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
        const auto to = target.Pair(2 * row, 2 * row + 1);
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