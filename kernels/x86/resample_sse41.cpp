// SSE4.1 form of resampling by rows: 8 source columns, 16 output columns a step.

#include <smmintrin.h>

#include <cstring>

#include "kernels/resample_backend.h"

namespace vidshow {
namespace {
namespace resample_sse41 {

using std::memcpy;

constexpr size_t kWords = 8;
constexpr int32_t kGroups = 4;
using V = __m128i;

template <typename Item>
V Load(const Item* p) {
    return _mm_loadu_si128(reinterpret_cast<const V*>(p));
}
V LoadWide(const uint8_t* p) {
    return _mm_cvtepu8_epi16(_mm_loadl_epi64(reinterpret_cast<const V*>(p)));
}
void StoreWords(uint16_t* p, V v) {
    _mm_storeu_si128(reinterpret_cast<V*>(p), v);
}
V SetWords(int x) {
    return _mm_set1_epi16(static_cast<int16_t>(x));
}
V Add(V a, V b) {
    return _mm_add_epi16(a, b);
}
V Mul(V a, V b) {
    return _mm_mullo_epi16(a, b);
}
template <int n>
V ShiftRight(V v) {
    return _mm_srli_epi16(v, n);
}

/// Four levels in words of 32 bits.
V Group(const uint16_t* blended, const NearTaps& taps, int32_t g) {
    const V pairs = _mm_shuffle_epi8(Load(blended + taps.first[g]), Load(taps.order[g]));
    const V sums = _mm_madd_epi16(pairs, Load(taps.weights[g]));
    return _mm_srli_epi32(_mm_add_epi32(sums, _mm_set1_epi32(128)), 8);
}
void PickStep(uint8_t* out, const uint16_t* blended, const NearTaps& taps, int32_t g) {
    const V low = _mm_packus_epi32(Group(blended, taps, g), Group(blended, taps, g + 1));
    const V high = _mm_packus_epi32(Group(blended, taps, g + 2), Group(blended, taps, g + 3));
    _mm_storeu_si128(reinterpret_cast<V*>(out), _mm_packus_epi16(low, high));
}

#include "kernels/x86/resample_body.h"

}  // namespace resample_sse41
}  // namespace

constexpr ResampleBackend kSse41Resample = {resample_sse41::BlendRows, resample_sse41::PickColumns};

}  // namespace vidshow
