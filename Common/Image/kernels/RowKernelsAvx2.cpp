// AVX2: two lanes.
#include "Common/Image/kernels/LaneKernels.h"

#include <immintrin.h>

namespace image {
namespace {

struct Avx2 {
    using Vec = __m256i;
    using Cached = Avx2;

    static const RowKernels& Lower() { return kSse41Kernels; }

    static Vec Lane(const LaneBytes& bytes) {
        return _mm256_broadcastsi128_si256(_mm_loadu_si128(reinterpret_cast<const __m128i*>(bytes.data())));
    }
    static Vec Set8(int value) { return _mm256_set1_epi8(static_cast<char>(value)); }
    static Vec Set16(int value) { return _mm256_set1_epi16(static_cast<int16_t>(value)); }
    static Vec Set32(int32_t value) { return _mm256_set1_epi32(value); }
    static Vec SetPair(int low, int high) {
        return Set32((low & 0xFFFF) | static_cast<int>(static_cast<unsigned>(high) << 16));
    }

    static Vec And(Vec a, Vec b) { return _mm256_and_si256(a, b); }
    static Vec Or(Vec a, Vec b) { return _mm256_or_si256(a, b); }
    static Vec Xor(Vec a, Vec b) { return _mm256_xor_si256(a, b); }
    static Vec Add8(Vec a, Vec b) { return _mm256_add_epi8(a, b); }
    static Vec Add16(Vec a, Vec b) { return _mm256_add_epi16(a, b); }
    static Vec AddSat16(Vec a, Vec b) { return _mm256_adds_epi16(a, b); }
    static Vec Sub16(Vec a, Vec b) { return _mm256_sub_epi16(a, b); }
    static Vec Add32(Vec a, Vec b) { return _mm256_add_epi32(a, b); }
    static Vec MulHigh16(Vec a, Vec b) { return _mm256_mulhi_epi16(a, b); }
    static Vec MulRounded16(Vec a, Vec b) { return _mm256_mulhrs_epi16(a, b); }
    static Vec MulAdd16(Vec a, Vec b) { return _mm256_madd_epi16(a, b); }
    static Vec MulAddU8S8(Vec a, Vec b) { return _mm256_maddubs_epi16(a, b); }
    static Vec Average16(Vec a, Vec b) { return _mm256_avg_epu16(a, b); }
    static Vec PackS32(Vec a, Vec b) { return _mm256_packs_epi32(a, b); }
    static Vec PackS16(Vec a, Vec b) { return _mm256_packs_epi16(a, b); }
    static Vec PackUs16(Vec a, Vec b) { return _mm256_packus_epi16(a, b); }
    static Vec Shuffle8(Vec a, Vec indices) { return _mm256_shuffle_epi8(a, indices); }
    static Vec UnpackLo8(Vec a, Vec b) { return _mm256_unpacklo_epi8(a, b); }
    static Vec UnpackHi8(Vec a, Vec b) { return _mm256_unpackhi_epi8(a, b); }
    static Vec UnpackLo16(Vec a, Vec b) { return _mm256_unpacklo_epi16(a, b); }
    static Vec UnpackHi16(Vec a, Vec b) { return _mm256_unpackhi_epi16(a, b); }
    static Vec Blend8(Vec a, Vec b, Vec mask) { return _mm256_blendv_epi8(a, b, mask); }

    static Vec EvenDwords(Vec a, Vec b) { return ShuffleDwords<_MM_SHUFFLE(2, 0, 2, 0)>(a, b); }
    static Vec OddDwords(Vec a, Vec b) { return ShuffleDwords<_MM_SHUFFLE(3, 1, 3, 1)>(a, b); }
    /// The upper half of each lane of a, then the lower one of b.
    static Vec MiddleHalves(Vec a, Vec b) { return ShuffleDwords<_MM_SHUFFLE(1, 0, 3, 2)>(a, b); }
    template <int kOrder>
    static Vec ShuffleDwords(Vec a, Vec b) {
        return _mm256_castps_si256(_mm256_shuffle_ps(_mm256_castsi256_ps(a), _mm256_castsi256_ps(b), kOrder));
    }

    template <int kMask>
    static Vec Blend16(Vec a, Vec b) {
        return _mm256_blend_epi16(a, b, kMask);
    }
    template <int kBits>
    static Vec Sll16(Vec a) {
        return _mm256_slli_epi16(a, kBits);
    }
    template <int kBits>
    static Vec Srl16(Vec a) {
        return _mm256_srli_epi16(a, kBits);
    }
    template <int kBits>
    static Vec Sra16(Vec a) {
        return _mm256_srai_epi16(a, kBits);
    }
    template <int kBits>
    static Vec Srl32(Vec a) {
        return _mm256_srli_epi32(a, kBits);
    }

    static __m128i LoadLane(const uint8_t* p) { return _mm_loadu_si128(reinterpret_cast<const __m128i*>(p)); }
    static __m128i LowLane(Vec a) { return _mm256_castsi256_si128(a); }
    static __m128i HighLane(Vec a) { return _mm256_extracti128_si256(a, 1); }
    static Vec Join(__m128i low, __m128i high) {
        return _mm256_inserti128_si256(_mm256_castsi128_si256(low), high, 1);
    }

    static Vec Load(const uint8_t* p) { return _mm256_loadu_si256(reinterpret_cast<const Vec*>(p)); }
    /// The 16 bytes at p and those `distance` further on, which is at least 16, by two loads that overlap
    /// what lies between: a blend takes any of four pipes, an insertion one only.
    static Vec LoadLanes(const uint8_t* p, ptrdiff_t distance) {
        return _mm256_blend_epi32(Load(p), Load(p + distance - 16), 0xF0);
    }
    static Vec LoadAlternating(const uint8_t* even, const uint8_t* odd) {
        return _mm256_or_si256(_mm256_cvtepu8_epi16(LoadLane(even)),
                               Sll16<8>(_mm256_cvtepu8_epi16(LoadLane(odd))));
    }

    /// Four bytes for each lane in turns, where 16 for each would come one after the other.
    static Vec LoadByFours(const uint8_t* p) {
        return _mm256_permutevar8x32_epi32(Load(p), _mm256_setr_epi32(0, 2, 4, 6, 1, 3, 5, 7));
    }
    /// Four bytes, two of them even, for each lane in turns.
    static Vec LoadAlternatingByFours(const uint8_t* even, const uint8_t* odd) {
        const Vec evenPlaces = _mm256_setr_epi8(0, -1, 1, -1, 4, -1, 5, -1, 8, -1, 9, -1, 12, -1, 13, -1, //
                                                2, -1, 3, -1, 6, -1, 7, -1, 10, -1, 11, -1, 14, -1, 15, -1);
        const Vec oddPlaces = _mm256_setr_epi8(-1, 0, -1, 1, -1, 4, -1, 5, -1, 8, -1, 9, -1, 12, -1, 13, //
                                               -1, 2, -1, 3, -1, 6, -1, 7, -1, 10, -1, 11, -1, 14, -1, 15);
        return _mm256_or_si256(Shuffle8(_mm256_broadcastsi128_si256(LoadLane(even)), evenPlaces),
                               Shuffle8(_mm256_broadcastsi128_si256(LoadLane(odd)), oddPlaces));
    }

    /// The second and third 8 bytes exchanged.
    static Vec ExchangeMiddle(Vec a) { return _mm256_permute4x64_epi64(a, _MM_SHUFFLE(3, 1, 2, 0)); }

    static void Store(uint8_t* p, Vec a) { _mm256_storeu_si256(reinterpret_cast<Vec*>(p), a); }
    static void StoreLane(uint8_t* p, __m128i a) { _mm_storeu_si128(reinterpret_cast<__m128i*>(p), a); }
    static void StoreHalf(uint8_t* p, Vec a) { StoreLane(p, LowLane(a)); }
    static void StoreHalves(uint8_t* low, uint8_t* high, Vec a) {
        StoreLane(low, LowLane(a));
        StoreLane(high, HighLane(a));
    }

    static Vec LowLanes(Vec a, Vec b) { return _mm256_permute2x128_si256(a, b, 0x20); }
    static Vec HighLanes(Vec a, Vec b) { return _mm256_permute2x128_si256(a, b, 0x31); }

    /// Lanes that follow each other through the parts, all low ones and then all high ones, as vectors with
    /// their offsets in bytes.
    template <class Take>
    static void ForVectors(const Vec (&parts)[2], const Take& take) {
        take(0, LowLanes(parts[0], parts[1]));
        take(32, HighLanes(parts[0], parts[1]));
    }
    template <class Take>
    static void ForVectors(const Vec (&parts)[3], const Take& take) {
        take(0, LowLanes(parts[0], parts[1]));
        take(32, _mm256_blend_epi32(parts[2], parts[0], 0xF0));
        take(64, HighLanes(parts[1], parts[2]));
    }
    template <size_t kParts>
    static void StoreLanes(uint8_t* p, const Vec (&parts)[kParts]) {
        ForVectors(parts, [p](ptrdiff_t offset, Vec a) { Store(p + offset, a); });
    }
    static void FinishPicture() {}
};

/// Targets that no cache holds: written past the caches. Where whole vectors are aligned, by these, else by
/// their halves: allocated memory is aligned to 16 bytes.
struct Avx2Large : Avx2 {
    static void StoreLane(uint8_t* p, __m128i a) { _mm_stream_si128(reinterpret_cast<__m128i*>(p), a); }
    static void Store(uint8_t* p, Vec a) {
        if (reinterpret_cast<uintptr_t>(p) % sizeof a == 0) {
            _mm256_stream_si256(reinterpret_cast<Vec*>(p), a);
            return;
        }
        StoreLane(p, LowLane(a));
        StoreLane(p + 16, HighLane(a));
    }
    static void StoreHalf(uint8_t* p, Vec a) { StoreLane(p, LowLane(a)); }
    static void StoreHalves(uint8_t* low, uint8_t* high, Vec a) {
        StoreLane(low, LowLane(a));
        StoreLane(high, HighLane(a));
    }
    template <size_t kParts>
    static void StoreLanes(uint8_t* p, const Vec (&parts)[kParts]) {
        ForVectors(parts, [p](ptrdiff_t offset, Vec a) { Store(p + offset, a); });
    }

    static void FinishPicture() { _mm_sfence(); }
};

constexpr RowKernels kLargeKernels = MakeLaneKernels<Avx2Large>();

} // namespace

constinit const RowKernels kAvx2Kernels = MakeLaneKernels<Avx2>(&kLargeKernels);

} // namespace image
