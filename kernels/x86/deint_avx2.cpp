// AVX2 form of deinterlacing's line operations: 32 bytes a step.

#include <immintrin.h>

#include <cstring>

#include "kernels/deint_backend.h"

namespace vidshow {
namespace {
namespace deint_avx2 {

using std::memcpy;

constexpr int32_t kBytes = 32;
constexpr bool kTwoAtOnce = true;
using V = __m256i;

V Load(const uint8_t* p) {
    return _mm256_loadu_si256(reinterpret_cast<const V*>(p));
}
void Store(uint8_t* p, V v) {
    _mm256_storeu_si256(reinterpret_cast<V*>(p), v);
}
V Set8(int x) {
    return _mm256_set1_epi8(static_cast<char>(x));
}
V Set16(int x) {
    return _mm256_set1_epi16(static_cast<int16_t>(x));
}
V And(V a, V b) {
    return _mm256_and_si256(a, b);
}
V Xor(V a, V b) {
    return _mm256_xor_si256(a, b);
}
V Sub8(V a, V b) {
    return _mm256_sub_epi8(a, b);
}
V AverageUp(V a, V b) {
    return _mm256_avg_epu8(a, b);
}
V Min(V a, V b) {
    return _mm256_min_epu8(a, b);
}
V Max(V a, V b) {
    return _mm256_max_epu8(a, b);
}
V Equal(V a, V b) {
    return _mm256_cmpeq_epi8(a, b);
}
V Blend(V a, V b, V takeB) {
    return _mm256_blendv_epi8(a, b, takeB);
}
V Low(V a, V b) {
    return _mm256_unpacklo_epi8(a, b);
}
V High(V a, V b) {
    return _mm256_unpackhi_epi8(a, b);
}
V Pack(V low, V high) {
    return _mm256_packus_epi16(low, high);
}
V MultiplyAddPairs(V bytes, V factors) {
    return _mm256_maddubs_epi16(bytes, factors);
}
V Add16(V a, V b) {
    return _mm256_add_epi16(a, b);
}
V SubClamped16(V a, V b) {
    return _mm256_subs_epu16(a, b);
}
V ShiftRightSigned3(V a) {
    return _mm256_srai_epi16(a, 3);
}
V ShiftRight4(V a) {
    return _mm256_srli_epi16(a, 4);
}
V Differences(V a, V b) {
    return _mm256_sad_epu8(a, b);
}

#include "kernels/x86/deint_ops.h"

#include "kernels/deint_body.h"

}  // namespace deint_avx2
}  // namespace

constexpr DeintBackend kAvx2Deint = deint_avx2::MakeBackend();

}  // namespace vidshow
