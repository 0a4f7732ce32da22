// Stands in for the AVX-512 instructions, so that kernels which use them can be tested on any processor:
// included in front of their source by the build of the tests.
#ifndef MOVIECONV_TESTS_IMAGE_EMULATEAVX512_H
#define MOVIECONV_TESTS_IMAGE_EMULATEAVX512_H

// The compiler's own header first: from here on its names are macros.
#include <immintrin.h>

#define SIMDE_ENABLE_NATIVE_ALIASES
#include <simde/x86/avx512.h>

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace avx512_emulation {

/// Touches the bytes that the mask names and no others, as the instruction does: the rest may be no memory at
/// all.
template <class Vector>
Vector LoadMasked(uint64_t mask, const void* source) {
    unsigned char bytes[sizeof(Vector)] = {};
    for (size_t i = 0; i < sizeof(Vector); ++i)
        if ((mask >> i & 1) != 0)
            bytes[i] = static_cast<const volatile unsigned char*>(source)[i];
    Vector vector;
    std::memcpy(&vector, bytes, sizeof vector);
    return vector;
}

template <class Vector>
void StoreMasked(void* target, uint64_t mask, const Vector& vector) {
    unsigned char bytes[sizeof(Vector)];
    std::memcpy(bytes, &vector, sizeof vector);
    for (size_t i = 0; i < sizeof(Vector); ++i)
        if ((mask >> i & 1) != 0)
            static_cast<volatile unsigned char*>(target)[i] = bytes[i];
}

} // namespace avx512_emulation

#undef _mm512_stream_si512
#undef _mm512_maskz_loadu_epi8
#undef _mm256_maskz_loadu_epi8
#undef _mm512_mask_storeu_epi8
#undef _mm256_mask_storeu_epi8
#undef _mm_mask_storeu_epi8
#define _mm512_stream_si512(target, value) simde_mm512_store_si512(target, value)
#define _mm512_maskz_loadu_epi8(mask, source) avx512_emulation::LoadMasked<simde__m512i>(mask, source)
#define _mm256_maskz_loadu_epi8(mask, source) avx512_emulation::LoadMasked<simde__m256i>(mask, source)
#define _mm512_mask_storeu_epi8(target, mask, vector) avx512_emulation::StoreMasked(target, mask, vector)
#define _mm256_mask_storeu_epi8(target, mask, vector) avx512_emulation::StoreMasked(target, mask, vector)
#define _mm_mask_storeu_epi8(target, mask, vector) avx512_emulation::StoreMasked(target, mask, vector)

#endif
