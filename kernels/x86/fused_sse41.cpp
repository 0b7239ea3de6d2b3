// SSE4.1 form of the fused kernels' inner loops: words of 128 bits.

#include <smmintrin.h>

#include <cstddef>

#include "kernels/fused_backend.h"

namespace vidshow {
namespace {
namespace fused_sse41 {

using std::size_t;

constexpr int32_t kPixels = 8;

#include "kernels/x86/bits128.h"

#include "kernels/x86/pixels128.h"

#include "kernels/x86/pixels.h"

#include "kernels/x86/fused_ops.h"

EvenOdd LoadPairs(const uint16_t* p) {
    const D a = Load(p), b = Load(p + kPixels);
    return {_mm_packs_epi32(LowHalves(a), LowHalves(b)),
            _mm_packs_epi32(HighHalves(a), HighHalves(b))};
}
B Packed(W first, W second) {
    return Parted(PackWords(first, second));
}
W WidenBytes(const uint8_t* p) {
    return _mm_cvtepu8_epi16(_mm_loadl_epi64(reinterpret_cast<const V*>(p)));
}
D WeighTaps(const uint16_t* columns, const WordTaps& taps, size_t group) {
    const V pairs = _mm_shuffle_epi8(Load(columns + taps.first[group]), Load(taps.order[group]));
    return Shr<6>(_mm_madd_epi16(pairs, Load(taps.weights[group])));
}
void PickColumns(const uint16_t* columns, const WordTaps& taps, size_t group, uint8_t* out) {
    const V words =
        _mm_packus_epi32(WeighTaps(columns, taps, group), WeighTaps(columns, taps, group + 1));
    _mm_storel_epi64(reinterpret_cast<V*>(out), PackWords(words, words));
}

using Step = JoinedStep;

#include "kernels/fused_body.h"

}  // namespace fused_sse41
}  // namespace

constexpr FusedBackend kSse41Fused = fused_sse41::MakeBackend();

}  // namespace vidshow
