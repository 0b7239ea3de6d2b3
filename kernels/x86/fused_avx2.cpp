// AVX2 form of the fused kernels' inner loops: 16 pixels a step.

#include <immintrin.h>

#include <cstddef>

#include "kernels/fused_backend.h"

namespace vidshow {
namespace {
namespace fused_avx2 {

using std::size_t;

constexpr int32_t kPixels = 16;

#include "kernels/x86/bits256.h"

#include "kernels/x86/fused_ops.h"

void StorePairs(uint8_t* p, W low, W high) {
    const V first = _mm256_unpacklo_epi16(low, high), second = _mm256_unpackhi_epi16(low, high);
    Store(p, _mm256_permute2x128_si256(first, second, 0x20));
    Store(p + sizeof(V), _mm256_permute2x128_si256(first, second, 0x31));
}
/// Terms of samples kFirst.. + 3 and kFirst + 8.. + 3, which packing puts back in line.
template <int kFirst>
D LumaLevels(V samples, D slope, D offset) {
    // The upper bytes of a lane get none.
    constexpr int kNone = static_cast<int>(0x80808000), n = kNone + kFirst;
    const V order = _mm256_setr_epi32(n, n + 1, n + 2, n + 3, n + 8, n + 9, n + 10, n + 11);
    const V sums = Add(Mul(_mm256_shuffle_epi8(samples, order), slope), offset);
    return ShrSigned<kLumaShift>(sums);
}
W LumaTerms(const uint8_t* p, D slope, D offset) {
    const V samples =
        _mm256_broadcastsi128_si256(_mm_loadu_si128(reinterpret_cast<const __m128i*>(p)));
    return PackUnsigned(LumaLevels<0>(samples, slope, offset),
                        LumaLevels<4>(samples, slope, offset));
}
D Halved(const uint8_t* p) {
    return _mm256_cvtepu8_epi32(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(p)));
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

D WeighPairs(const uint16_t* columns, const WordTaps& taps, size_t group) {
    const V spans = Spans(columns + taps.first[group], columns + taps.first[group + 1]);
    const V pairs = _mm256_shuffle_epi8(spans, Load(taps.order[group]));
    return Shr<6>(_mm256_madd_epi16(pairs, Load(taps.weights[group])));
}
void PickColumns(const uint16_t* columns, const WordTaps& taps, size_t group, uint8_t* out) {
    const V words =
        PackUnsigned(WeighPairs(columns, taps, group), WeighPairs(columns, taps, group + 2));
    const V bytes = _mm256_packus_epi16(words, words);
    const V joined = _mm256_permutevar8x32_epi32(bytes, _mm256_setr_epi32(0, 4, 1, 5, 0, 4, 1, 5));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out), _mm256_castsi256_si128(joined));
}
void NarrowWords(uint8_t* p, W v) {
    const V bytes = _mm256_permute4x64_epi64(_mm256_packus_epi16(v, v), 0x08);
    _mm_storeu_si128(reinterpret_cast<__m128i*>(p), _mm256_castsi256_si128(bytes));
}

struct JoinedStep {
    size_t first;
    V order, weights;

    JoinedStep(const ByteTaps& taps, size_t group)
        : first(taps.first[group]),
          order(Load(taps.order[group])),
          weights(Load(taps.weights[group])) {}
    W WeighSpans(V spans) const {
        return _mm256_maddubs_epi16(_mm256_shuffle_epi8(spans, order), weights);
    }
    W Weigh(const uint8_t* plane) const {
        return WeighSpans(_mm256_broadcastsi128_si256(LoadHalf(plane + first)));
    }
};
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
