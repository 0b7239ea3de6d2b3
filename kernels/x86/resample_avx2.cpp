// AVX2 form of resampling by rows: 16 source columns, 32 output columns a step.

#include <immintrin.h>

#include <cstring>

#include "kernels/resample_backend.h"

namespace vidshow {
namespace {
namespace resample_avx2 {

using std::memcpy;

constexpr size_t kWords = 16;
constexpr int32_t kGroups = 8;
using V = __m256i;

template <typename Item>
V Load(const Item* p) {
    return _mm256_loadu_si256(reinterpret_cast<const V*>(p));
}
template <typename Item>
__m128i LoadHalf(const Item* p) {
    return _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
}
V LoadWide(const uint8_t* p) {
    return _mm256_cvtepu8_epi16(LoadHalf(p));
}

struct Weights {
    V above, below;
};

Weights WeightsOf(uint32_t weight) {
    const auto below = static_cast<int16_t>(weight);
    return {_mm256_set1_epi16(static_cast<int16_t>(32 - below)), _mm256_set1_epi16(below)};
}
void MeanStep(uint16_t* out, const uint8_t* a, const uint8_t* b, const Weights& w) {
    const V sum = _mm256_add_epi16(_mm256_mullo_epi16(LoadWide(a), w.above),
                                   _mm256_mullo_epi16(LoadWide(b), w.below));
    const V mean = _mm256_srli_epi16(_mm256_add_epi16(sum, _mm256_set1_epi16(2)), 2);
    _mm256_storeu_si256(reinterpret_cast<V*>(out), mean);
}

/// Groups g and g + 1, four levels each in words of 32 bits.
V TwoGroups(const uint16_t* blended, const NearTaps& taps, int32_t g) {
    const V words =
        _mm256_inserti128_si256(_mm256_castsi128_si256(LoadHalf(blended + taps.first[g])),
                                LoadHalf(blended + taps.first[g + 1]), 1);
    const V pairs = _mm256_shuffle_epi8(words, Load(taps.pairs[g / 2].order));
    const V sums = _mm256_madd_epi16(pairs, Load(taps.pairs[g / 2].weights));
    return _mm256_srli_epi32(_mm256_add_epi32(sums, _mm256_set1_epi32(128)), 8);
}
// Packing keeps to the halves of a register, so that even groups end up before odd ones.
void PickStep(uint8_t* out, const uint16_t* blended, const NearTaps& taps, int32_t g) {
    const V low = _mm256_packus_epi32(TwoGroups(blended, taps, g), TwoGroups(blended, taps, g + 2));
    const V high =
        _mm256_packus_epi32(TwoGroups(blended, taps, g + 4), TwoGroups(blended, taps, g + 6));
    const V levels = _mm256_permutevar8x32_epi32(_mm256_packus_epi16(low, high),
                                                 _mm256_setr_epi32(0, 4, 1, 5, 2, 6, 3, 7));
    _mm256_storeu_si256(reinterpret_cast<V*>(out), levels);
}

#include "kernels/resample_body.h"

}  // namespace resample_avx2
}  // namespace

constexpr ResampleBackend kAvx2Resample = {resample_avx2::BlendRows, resample_avx2::PickColumns};

}  // namespace vidshow
