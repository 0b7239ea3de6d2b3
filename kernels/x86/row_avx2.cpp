// AVX2 form of the row moves: 32 bytes a step.

#include <immintrin.h>

#include <cstring>

#include "kernels/row_backend.h"

namespace vidshow {
namespace {
namespace rows_avx2 {

using std::memcpy;

constexpr size_t kBytes = 32;

#include "kernels/x86/bits256.h"

// Bytes move within 128 bits, which then change places.
template <int kPixel>
V Reverse(V v) {
    if constexpr (kPixel == 4) {
        return _mm256_permutevar8x32_epi32(v, _mm256_setr_epi32(7, 6, 5, 4, 3, 2, 1, 0));
    } else {
        const __m128i order =
            kPixel == 1 ? _mm_set_epi8(0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15)
                        : _mm_set_epi8(1, 0, 3, 2, 5, 4, 7, 6, 9, 8, 11, 10, 13, 12, 15, 14);
        const V turned = _mm256_shuffle_epi8(v, _mm256_broadcastsi128_si256(order));
        return _mm256_permute4x64_epi64(turned, _MM_SHUFFLE(1, 0, 3, 2));
    }
}

void StorePairs(uint8_t* p, V a, V b) {
    const V low = _mm256_unpacklo_epi8(a, b), high = _mm256_unpackhi_epi8(a, b);
    Store(p, _mm256_permute2x128_si256(low, high, 0x20));
    Store(p + kBytes, _mm256_permute2x128_si256(low, high, 0x31));
}
V Packed(V low, V high) {
    return _mm256_permute4x64_epi64(_mm256_packus_epi16(low, high), _MM_SHUFFLE(3, 1, 2, 0));
}
void LoadPairs(const uint8_t* p, V* a, V* b) {
    const V low = Load(p), high = Load(p + kBytes), first = _mm256_set1_epi16(0x00FF);
    *a = Packed(And(low, first), And(high, first));
    *b = Packed(_mm256_srli_epi16(low, 8), _mm256_srli_epi16(high, 8));
}

#include "kernels/row_body.h"

}  // namespace rows_avx2
}  // namespace

constexpr RowBackend kAvx2Rows = rows_avx2::MakeBackend();

}  // namespace vidshow
