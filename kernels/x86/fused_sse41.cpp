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

#define VIDSHOW_MM(name) _mm_##name
V LoadAny(const void* p) {
    return _mm_loadu_si128(static_cast<const V*>(p));
}
void Store(uint8_t* p, V v) {
    _mm_storeu_si128(reinterpret_cast<V*>(p), v);
}
V And(V a, V b) {
    return _mm_and_si128(a, b);
}
V Or(V a, V b) {
    return _mm_or_si128(a, b);
}

#include "kernels/x86/fused_ops.h"

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

#include "kernels/fused_body.h"

#undef VIDSHOW_MM

}  // namespace fused_sse41
}  // namespace

constexpr FusedBackend kSse41Fused = fused_sse41::MakeBackend();

}  // namespace vidshow
