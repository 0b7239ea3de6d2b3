// AVX2 form of the fused kernels' inner loops: words of 256 bits.

#include <immintrin.h>

#include <cstddef>

#include "kernels/fused_backend.h"

namespace vidshow {
namespace {
namespace fused_avx2 {

using std::size_t;

constexpr int32_t kPixels = 16;

#include "kernels/x86/bits256.h"

#include "kernels/x86/pixels256.h"

#include "kernels/x86/pixels.h"

#include "kernels/x86/fused_ops.h"

W PackedInOrder(D a, D b) {
    return _mm256_permute4x64_epi64(_mm256_packs_epi32(a, b), 0xD8);
}
EvenOdd LoadPairs(const uint16_t* p) {
    const D a = Load(p), b = Load(p + kPixels);
    return {PackedInOrder(LowHalves(a), LowHalves(b)), PackedInOrder(HighHalves(a), HighHalves(b))};
}
B Packed(W first, W second) {
    return Parted(_mm256_permute4x64_epi64(PackWords(first, second), 0xD8));
}
W WidenBytes(const uint8_t* p) {
    return _mm256_cvtepu8_epi16(_mm_loadu_si128(reinterpret_cast<const __m128i*>(p)));
}
__m128i LoadHalf(const void* p) {
    return _mm_loadu_si128(static_cast<const __m128i*>(p));
}
/// What a register's halves pick from.
V Spans(const void* low, const void* high) {
    return _mm256_inserti128_si256(_mm256_castsi128_si256(LoadHalf(low)), LoadHalf(high), 1);
}

D WeighTaps(const uint16_t* columns, const WordTaps& taps, size_t group) {
    const V spans = Spans(columns + taps.first[group], columns + taps.first[group + 1]);
    const V pairs = _mm256_shuffle_epi8(spans, Load(taps.order[group]));
    return Shr<6>(_mm256_madd_epi16(pairs, Load(taps.weights[group])));
}
void PickColumns(const uint16_t* columns, const WordTaps& taps, size_t group, uint8_t* out) {
    const V words =
        _mm256_packus_epi32(WeighTaps(columns, taps, group), WeighTaps(columns, taps, group + 2));
    const V bytes = PackWords(words, words);
    const V joined = _mm256_permutevar8x32_epi32(bytes, _mm256_setr_epi32(0, 4, 1, 5, 0, 4, 1, 5));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out), _mm256_castsi256_si128(joined));
}

struct Step : JoinedStep {
    size_t next;

    Step(const ByteTaps& taps, size_t group)
        : JoinedStep(taps, group), next(taps.first[group + 1]) {}
    W Weigh(const uint8_t* plane) const { return WeighSpans(Spans(plane + first, plane + next)); }
};

#include "kernels/fused_body.h"

}  // namespace fused_avx2
}  // namespace

constexpr FusedBackend kAvx2Fused = fused_avx2::MakeBackend();

}  // namespace vidshow
