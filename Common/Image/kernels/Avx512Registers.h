// What the AVX-512 kernels share. For RowKernelsAvx512.cpp alone, as are the other headers of that name.
//
// A row is a number of whole steps and one part of a step, which is the same code with its loads and stores
// masked by the byte: masked-off bytes are neither read nor written, and do not fault. Bytes are put in their
// places by permutations over whole registers.
#ifndef MOVIECONV_COMMON_IMAGE_KERNELS_AVX512REGISTERS_H
#define MOVIECONV_COMMON_IMAGE_KERNELS_AVX512REGISTERS_H

#include "Common/Image/kernels/FixedPoint.h"
#include "Common/Image/kernels/RowKernels.h"

#include <array>
#include <immintrin.h>

namespace image {
namespace {

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

inline uint64_t Bits(ptrdiff_t count) {
    if (count >= 64)
        return ~uint64_t{0};
    return count <= 0 ? 0 : (uint64_t{1} << count) - 1;
}

/// Columns of most steps, each a byte of a register.
inline constexpr int kStep = 64;

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
    static constexpr bool kPastCaches = false;
    static void Store(uint8_t* target, __m512i value) { _mm512_storeu_si512(target, value); }
    static void Finish() {}
};

/// Past the caches, for targets that none of them holds: whole cache lines where the target begins with one,
/// else their quarters, because allocated memory is aligned to 16 bytes.
struct Streamed {
    static constexpr bool kPastCaches = true;
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

/// The bytes of two registers at the given places; `fromSecond` marks those with places in the second. AMD's
/// processors permute two registers as fast as one, Intel's take three operations for it.
inline __m512i PermutePair(__m512i first, __m512i second, __m512i places, uint64_t fromSecond) {
#ifdef MOVIECONV_PERMUTE_PAIRS
    static_cast<void>(fromSecond);
    return _mm512_permutex2var_epi8(first, places, second);
#else
    return _mm512_mask_permutexvar_epi8(_mm512_permutexvar_epi8(places, first), fromSecond, places, second);
#endif
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
inline __m512i Words(int low, int high) {
    return _mm512_set1_epi32(static_cast<int>((static_cast<uint32_t>(high) << 16) | (low & 0xFFFF)));
}
inline __m512i BytePairs(int low, int high) {
    return _mm512_set1_epi16(static_cast<int16_t>(high * 256 + (low & 0xFF)));
}

inline constexpr uint64_t kOddBytes = 0xAAAAAAAAAAAAAAAA;

/// Where the samples of pixel p stand in a packed row.
template <PackedOrder kOrder>
struct Packed {
    static constexpr int kLuma = kOrder == kYuy2 ? 0 : 1;
    static constexpr int kChroma = 1 - kLuma;
    static constexpr int Y(int p) { return 2 * p + kLuma; }
    static constexpr int U(int p) { return 2 * (p & ~1) + kChroma; }
    static constexpr int V(int p) { return U(p) + 2; }
};

} // namespace
} // namespace image

#endif
