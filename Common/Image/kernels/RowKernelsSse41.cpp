// SSE4.1: one lane.
#include "Common/Image/kernels/LaneKernels.h"

#include <smmintrin.h>

namespace image {
namespace {

struct Sse41 {
    using Vec = __m128i;
    using Cached = Sse41;

    static const RowKernels& Lower() { return kPlainKernels; }

    static Vec Load(const uint8_t* p) { return _mm_loadu_si128(reinterpret_cast<const Vec*>(p)); }
    static Vec LoadLanes(const uint8_t* p, ptrdiff_t) { return Load(p); }
    static Vec LoadHalf(const uint8_t* p) { return _mm_loadl_epi64(reinterpret_cast<const Vec*>(p)); }
    static Vec LoadAlternating(const uint8_t* even, const uint8_t* odd) {
        return UnpackLo8(LoadHalf(even), LoadHalf(odd));
    }

    static Vec LoadByFours(const uint8_t* p) { return Load(p); }
    static Vec LoadAlternatingByFours(const uint8_t* even, const uint8_t* odd) {
        return LoadAlternating(even, odd);
    }

    /// Of longer vectors, the second and third 8 bytes exchanged.
    static Vec ExchangeMiddle(Vec a) { return a; }

    static void Store(uint8_t* p, Vec a) { _mm_storeu_si128(reinterpret_cast<Vec*>(p), a); }
    template <size_t kParts, class Take>
    static void ForVectors(const Vec (&parts)[kParts], const Take& take) {
        for (size_t i = 0; i < kParts; ++i)
            take(16 * i, parts[i]);
    }
    template <size_t kParts>
    static void StoreLanes(uint8_t* p, const Vec (&parts)[kParts]) {
        ForVectors(parts, [p](size_t offset, Vec a) { Store(p + offset, a); });
    }
    static void StoreHalf(uint8_t* p, Vec a) { _mm_storel_epi64(reinterpret_cast<Vec*>(p), a); }
    static void StoreHalves(uint8_t* low, uint8_t* high, Vec a) {
        StoreHalf(low, a);
        StoreHalf(high, _mm_unpackhi_epi64(a, a));
    }

    static void FinishPicture() {}

    static Vec Lane(const LaneBytes& bytes) {
        return _mm_loadu_si128(reinterpret_cast<const Vec*>(bytes.data()));
    }
    static Vec Set8(int value) { return _mm_set1_epi8(static_cast<char>(value)); }
    static Vec Set16(int value) { return _mm_set1_epi16(static_cast<int16_t>(value)); }
    static Vec Set32(int32_t value) { return _mm_set1_epi32(value); }
    static Vec SetPair(int low, int high) {
        return Set32((low & 0xFFFF) | static_cast<int>(static_cast<unsigned>(high) << 16));
    }

    static Vec And(Vec a, Vec b) { return _mm_and_si128(a, b); }
    static Vec Or(Vec a, Vec b) { return _mm_or_si128(a, b); }
    static Vec Xor(Vec a, Vec b) { return _mm_xor_si128(a, b); }
    static Vec Add8(Vec a, Vec b) { return _mm_add_epi8(a, b); }
    static Vec Add16(Vec a, Vec b) { return _mm_add_epi16(a, b); }
    static Vec AddSat16(Vec a, Vec b) { return _mm_adds_epi16(a, b); }
    static Vec Sub16(Vec a, Vec b) { return _mm_sub_epi16(a, b); }
    static Vec Add32(Vec a, Vec b) { return _mm_add_epi32(a, b); }
    static Vec MulHigh16(Vec a, Vec b) { return _mm_mulhi_epi16(a, b); }
    static Vec MulRounded16(Vec a, Vec b) { return _mm_mulhrs_epi16(a, b); }
    static Vec MulAdd16(Vec a, Vec b) { return _mm_madd_epi16(a, b); }
    static Vec MulAddU8S8(Vec a, Vec b) { return _mm_maddubs_epi16(a, b); }
    static Vec Average16(Vec a, Vec b) { return _mm_avg_epu16(a, b); }
    static Vec PackS32(Vec a, Vec b) { return _mm_packs_epi32(a, b); }
    static Vec PackS16(Vec a, Vec b) { return _mm_packs_epi16(a, b); }
    static Vec PackUs16(Vec a, Vec b) { return _mm_packus_epi16(a, b); }
    static Vec Shuffle8(Vec a, Vec indices) { return _mm_shuffle_epi8(a, indices); }
    static Vec UnpackLo8(Vec a, Vec b) { return _mm_unpacklo_epi8(a, b); }
    static Vec UnpackHi8(Vec a, Vec b) { return _mm_unpackhi_epi8(a, b); }
    static Vec UnpackLo16(Vec a, Vec b) { return _mm_unpacklo_epi16(a, b); }
    static Vec UnpackHi16(Vec a, Vec b) { return _mm_unpackhi_epi16(a, b); }
    static Vec Blend8(Vec a, Vec b, Vec mask) { return _mm_blendv_epi8(a, b, mask); }

    static Vec EvenDwords(Vec a, Vec b) { return ShuffleDwords<_MM_SHUFFLE(2, 0, 2, 0)>(a, b); }
    static Vec OddDwords(Vec a, Vec b) { return ShuffleDwords<_MM_SHUFFLE(3, 1, 3, 1)>(a, b); }
    /// The upper half of each lane of a, then the lower one of b.
    static Vec MiddleHalves(Vec a, Vec b) { return ShuffleDwords<_MM_SHUFFLE(1, 0, 3, 2)>(a, b); }
    template <int kOrder>
    static Vec ShuffleDwords(Vec a, Vec b) {
        return _mm_castps_si128(_mm_shuffle_ps(_mm_castsi128_ps(a), _mm_castsi128_ps(b), kOrder));
    }

    template <int kMask>
    static Vec Blend16(Vec a, Vec b) {
        return _mm_blend_epi16(a, b, kMask);
    }
    template <int kBits>
    static Vec Sll16(Vec a) {
        return _mm_slli_epi16(a, kBits);
    }
    template <int kBits>
    static Vec Srl16(Vec a) {
        return _mm_srli_epi16(a, kBits);
    }
    template <int kBits>
    static Vec Sra16(Vec a) {
        return _mm_srai_epi16(a, kBits);
    }
    template <int kBits>
    static Vec Srl32(Vec a) {
        return _mm_srli_epi32(a, kBits);
    }
};

} // namespace

constinit const RowKernels kSse41Kernels = MakeLaneKernels<Sse41>();

} // namespace image
