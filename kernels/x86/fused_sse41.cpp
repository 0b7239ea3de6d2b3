// SSE4.1 form of the fused kernels' inner loops: 8 pixels a step.

#include <smmintrin.h>

#include <cstddef>

#include "kernels/fused_backend.h"

namespace vidshow {
namespace {
namespace fused_sse41 {

using std::size_t;

constexpr int32_t kPixels = 8;
constexpr size_t kLanes = 4;
using V = __m128i;
using W = V;
using D = V;

W LoadWords(const uint16_t* p) {
    return _mm_loadu_si128(reinterpret_cast<const V*>(p));
}
void StoreWords(uint8_t* p, W v) {
    _mm_storeu_si128(reinterpret_cast<V*>(p), v);
}
W SetWords(int x) {
    return _mm_set1_epi16(static_cast<int16_t>(x));
}
W AddSat(W a, W b) {
    return _mm_adds_epu16(a, b);
}
W SubSat(W a, W b) {
    return _mm_subs_epu16(a, b);
}
W Min(W a, W b) {
    return _mm_min_epu16(a, b);
}
V And(V a, V b) {
    return _mm_and_si128(a, b);
}
V Or(V a, V b) {
    return _mm_or_si128(a, b);
}
W AndW(W a, W b) {
    return And(a, b);
}
W OrW(W a, W b) {
    return Or(a, b);
}
template <int kBits>
W ShlW(W v) {
    return _mm_slli_epi16(v, kBits);
}
template <int kBits>
W ShrW(W v) {
    return _mm_srli_epi16(v, kBits);
}
W LowWords(W a, W b) {
    return _mm_unpacklo_epi16(a, b);
}
W PackUnsigned(D low, D high) {
    return _mm_packus_epi32(low, high);
}

V LoadAny(const void* p) {
    return _mm_loadu_si128(static_cast<const V*>(p));
}
D Load(const uint32_t* p) {
    return _mm_loadu_si128(reinterpret_cast<const V*>(p));
}
void Store(uint8_t* p, D v) {
    _mm_storeu_si128(reinterpret_cast<V*>(p), v);
}
D Set(uint32_t x) {
    return _mm_set1_epi32(static_cast<int>(x));
}
D Add(D a, D b) {
    return _mm_add_epi32(a, b);
}
D Sub(D a, D b) {
    return _mm_sub_epi32(a, b);
}
D Mul(D a, D b) {
    return _mm_mullo_epi32(a, b);
}
template <int kBits>
D Shl(D v) {
    return _mm_slli_epi32(v, kBits);
}
template <int kBits>
D Shr(D v) {
    return _mm_srli_epi32(v, kBits);
}
template <int kBits>
D ShrSigned(D v) {
    return _mm_srai_epi32(v, kBits);
}
void StorePairs(uint8_t* p, W low, W high) {
    Store(p, _mm_unpacklo_epi16(low, high));
    Store(p + sizeof(V), _mm_unpackhi_epi16(low, high));
}
D LumaLevels(V samples, D slope, D offset) {
    return ShrSigned<kLineShift>(Add(Mul(_mm_cvtepu8_epi32(samples), slope), offset));
}
W LumaTerms(const uint8_t* p, D slope, D offset) {
    const V samples = _mm_loadl_epi64(reinterpret_cast<const V*>(p));
    return PackUnsigned(LumaLevels(samples, slope, offset),
                        LumaLevels(_mm_srli_si128(samples, 4), slope, offset));
}
W WidenBytes(const uint8_t* p) {
    return _mm_cvtepu8_epi16(_mm_loadl_epi64(reinterpret_cast<const V*>(p)));
}
W AddW(W a, W b) {
    return _mm_add_epi16(a, b);
}
W MulW(W a, W b) {
    return _mm_mullo_epi16(a, b);
}
D WeighPairs(const uint16_t* columns, int32_t quad, const ColumnPicks& picks) {
    const V pairs =
        _mm_shuffle_epi8(LoadAny(columns + picks.first[quad]), LoadAny(picks.bytes[quad]));
    return _mm_madd_epi16(pairs, LoadAny(picks.weight[quad]));
}
void StoreBytes(uint8_t* p, D v) {
    const V words = PackUnsigned(v, v);
    _mm_storeu_si32(p, _mm_packus_epi16(words, words));
}
D Pick(const uint32_t* p, D index) {
    // Byte b of word i is byte 4 i + b.
    const V bytes = Add(Mul(index, Set(0x04040404)), Set(0x03020100));
    return _mm_shuffle_epi8(Load(p), bytes);
}
void StoreLow(uint8_t* p, D v) {
    _mm_storel_epi64(reinterpret_cast<V*>(p), PackUnsigned(v, v));
}

#include "kernels/x86/fused_ops.h"

#include "kernels/fused_body.h"

}  // namespace fused_sse41
}  // namespace

constexpr FusedBackend kSse41Fused = fused_sse41::MakeBackend();

}  // namespace vidshow
