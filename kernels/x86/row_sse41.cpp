// SSE4.1 form of the row moves: 16 bytes a step.

#include <smmintrin.h>

#include <cstring>

#include "kernels/row_backend.h"

namespace vidshow {
namespace {
namespace rows_sse41 {

using std::memcpy;

constexpr size_t kBytes = 16;

#include "kernels/x86/bits128.h"

template <int kPixel>
V Reverse(V v) {
    if constexpr (kPixel == 1) {
        return _mm_shuffle_epi8(v,
                                _mm_set_epi8(0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15));
    } else if constexpr (kPixel == 2) {
        return _mm_shuffle_epi8(v,
                                _mm_set_epi8(1, 0, 3, 2, 5, 4, 7, 6, 9, 8, 11, 10, 13, 12, 15, 14));
    } else {
        return _mm_shuffle_epi32(v, _MM_SHUFFLE(0, 1, 2, 3));
    }
}

void StorePairs(uint8_t* p, V a, V b) {
    Store(p, _mm_unpacklo_epi8(a, b));
    Store(p + kBytes, _mm_unpackhi_epi8(a, b));
}
void LoadPairs(const uint8_t* p, V* a, V* b) {
    const V low = Load(p), high = Load(p + kBytes), first = _mm_set1_epi16(0x00FF);
    *a = _mm_packus_epi16(And(low, first), And(high, first));
    *b = _mm_packus_epi16(_mm_srli_epi16(low, 8), _mm_srli_epi16(high, 8));
}

#include "kernels/row_body.h"

}  // namespace rows_sse41
}  // namespace

constexpr RowBackend kSse41Rows = rows_sse41::MakeBackend();

}  // namespace vidshow
