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

struct Weights {
    V above, below;
};

Weights WeightsOf(uint32_t weight) {
    const auto below = static_cast<int16_t>(weight);
    return {_mm_set1_epi16(static_cast<int16_t>(32 - below)), _mm_set1_epi16(below)};
}
void MeanStep(uint16_t* out, const uint8_t* a, const uint8_t* b, const Weights& w) {
    const V sum =
        _mm_add_epi16(_mm_mullo_epi16(LoadWide(a), w.above), _mm_mullo_epi16(LoadWide(b), w.below));
    const V mean = _mm_srli_epi16(_mm_add_epi16(sum, _mm_set1_epi16(2)), 2);
    _mm_storeu_si128(reinterpret_cast<V*>(out), mean);
}

/// Four levels in words of 32 bits, of the first or the second group of a pair.
V Group(const uint16_t* words, const NearTaps::Pair& pair, int second) {
    const V pairs = _mm_shuffle_epi8(Load(words), Load(pair.order + second * 16));
    const V sums = _mm_madd_epi16(pairs, Load(pair.weights + second * 8));
    return _mm_srli_epi32(_mm_add_epi32(sums, _mm_set1_epi32(128)), 8);
}
V TwoGroups(const uint16_t* blended, const NearTaps& taps, int32_t g) {
    const NearTaps::Pair& pair = taps.pairs[g / 2];
    return _mm_packus_epi32(Group(blended + taps.first[g], pair, 0),
                            Group(blended + taps.first[g + 1], pair, 1));
}
void PickStep(uint8_t* out, const uint16_t* blended, const NearTaps& taps, int32_t g) {
    const V levels = _mm_packus_epi16(TwoGroups(blended, taps, g), TwoGroups(blended, taps, g + 2));
    _mm_storeu_si128(reinterpret_cast<V*>(out), levels);
}

#include "kernels/resample_body.h"

}  // namespace resample_sse41
}  // namespace

constexpr ResampleBackend kSse41Resample = {resample_sse41::BlendRows, resample_sse41::PickColumns};

}  // namespace vidshow
