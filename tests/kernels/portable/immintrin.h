#pragma once

// Found in front of the compiler's own header where AVX-512 code is built for processors without
// it: SIMDe computes every instruction with whatever there is.

#define SIMDE_ENABLE_NATIVE_ALIASES
#include <simde/x86/avx512.h>
#include <simde/x86/sse4.1.h>

/// Not in every SIMDe.
static inline __m512i WidenBytes(__m256i bytes) {
    const __m512i mixed = _mm512_permutexvar_epi64(_mm512_setr_epi64(0, 0, 1, 0, 2, 0, 3, 0),
                                                   _mm512_castsi256_si512(bytes));
    return _mm512_unpacklo_epi8(mixed, _mm512_set1_epi32(0));
}
#undef _mm512_cvtepu8_epi16
#define _mm512_cvtepu8_epi16(bytes) WidenBytes(bytes)

// Some give this name the parameters of its masked form.
#undef _mm512_madd_epi16
#define _mm512_madd_epi16(a, b) simde_mm512_madd_epi16(a, b)
