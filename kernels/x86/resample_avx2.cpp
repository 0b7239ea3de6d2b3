// AVX2 form of resampling by rows: 16 source columns, 32 output columns a step.

#include <immintrin.h>

#include <cstddef>
#include <cstring>

#include "kernels/resample_backend.h"

namespace vidshow {
namespace {
namespace resample_avx2 {

using std::memcpy;
using std::ptrdiff_t;

constexpr size_t kWords = 16;
constexpr int32_t kGroups = 8;

#include "kernels/x86/bits256.h"

__m128i LoadHalf(const void* p) {
    return _mm_loadu_si128(static_cast<const __m128i*>(p));
}
V LoadWide(const uint8_t* p) {
    return _mm256_cvtepu8_epi16(LoadHalf(p));
}

#include "kernels/x86/resample_ops.h"

/// The groups of a pair, four levels each in words of 32 bits.
V TwoGroups(const uint16_t* blended, const NearTaps::Pair& pair) {
    const V words =
        _mm256_inserti128_si256(_mm256_castsi128_si256(LoadHalf(blended + pair.first[0])),
                                LoadHalf(blended + pair.first[1]), 1);
    return Levels(_mm256_shuffle_epi8(words, Load(pair.order)), Load(pair.weights));
}
// Packing keeps to the halves of a register, so that even groups end up before odd ones.
V PickRow(const uint16_t* blended, const NearTaps::Pair* pairs) {
    const V low = _mm256_packus_epi32(TwoGroups(blended, pairs[0]), TwoGroups(blended, pairs[1]));
    const V high = _mm256_packus_epi32(TwoGroups(blended, pairs[2]), TwoGroups(blended, pairs[3]));
    return _mm256_permutevar8x32_epi32(_mm256_packus_epi16(low, high),
                                       _mm256_setr_epi32(0, 4, 1, 5, 2, 6, 3, 7));
}

#include "kernels/resample_body.h"

}  // namespace resample_avx2
}  // namespace

constexpr ResampleBackend kAvx2Resample = {resample_avx2::BlendRows, resample_avx2::PickColumns};

}  // namespace vidshow
