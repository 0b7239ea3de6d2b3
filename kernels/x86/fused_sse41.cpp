// SSE4.1 form of the fused kernels' inner loops: 8 pixels a step.

#include <smmintrin.h>

#include <cstddef>

#include "kernels/fused_backend.h"

namespace vidshow {
namespace {
namespace fused_sse41 {

using std::size_t;

constexpr int32_t kPixels = 8;

#include "kernels/x86/bits128.h"

#include "kernels/x86/fused_ops.h"

void StorePairs(uint8_t* p, W low, W high) {
    Store(p, _mm_unpacklo_epi16(low, high));
    Store(p + sizeof(V), _mm_unpackhi_epi16(low, high));
}
D LumaLevels(V samples, D slope, D offset) {
    return ShrSigned<kLumaShift>(Add(Mul(_mm_cvtepu8_epi32(samples), slope), offset));
}
W LumaTerms(const uint8_t* p, D slope, D offset) {
    const V samples = _mm_loadl_epi64(reinterpret_cast<const V*>(p));
    return PackUnsigned(LumaLevels(samples, slope, offset),
                        LumaLevels(_mm_srli_si128(samples, 4), slope, offset));
}
D Halved(const uint8_t* p) {
    return _mm_cvtepu8_epi32(_mm_loadu_si32(p));
}
W WidenBytes(const uint8_t* p) {
    return _mm_cvtepu8_epi16(_mm_loadl_epi64(reinterpret_cast<const V*>(p)));
}
D WeighPairs(const uint16_t* columns, const WordTaps& taps, size_t group) {
    const V pairs = _mm_shuffle_epi8(Load(columns + taps.first[group]), Load(taps.order[group]));
    return Shr<6>(_mm_madd_epi16(pairs, Load(taps.weights[group])));
}
void PickColumns(const uint16_t* columns, const WordTaps& taps, size_t group, uint8_t* out) {
    const V words =
        PackUnsigned(WeighPairs(columns, taps, group), WeighPairs(columns, taps, group + 1));
    _mm_storel_epi64(reinterpret_cast<V*>(out), _mm_packus_epi16(words, words));
}
void NarrowWords(uint8_t* p, W v) {
    _mm_storel_epi64(reinterpret_cast<V*>(p), _mm_packus_epi16(v, v));
}

struct Step {
    size_t first;
    V order, weights;

    Step(const ByteTaps& taps, size_t group)
        : first(taps.first[group]),
          order(Load(taps.order[group])),
          weights(Load(taps.weights[group])) {}
    W Weigh(const uint8_t* plane) const {
        return _mm_maddubs_epi16(_mm_shuffle_epi8(Load(plane + first), order), weights);
    }
};
using JoinedStep = Step;

#include "kernels/fused_body.h"

}  // namespace fused_sse41
}  // namespace

constexpr FusedBackend kSse41Fused = fused_sse41::MakeBackend();

}  // namespace vidshow
