// AVX2 back end of the vector kernels: 16 lanes, 32 pixels a step.
//
// The lanes of a Wide are the even pixels in lo and the odd ones in hi: luma parts so without a
// shuffle, and both take the same chroma. Interleaves and packs work within 128-bit halves, so the
// stores put halves in order, too; sums have orders of their own, said where they are made.

#include <immintrin.h>

#include <cstring>

#include "kernels/vec_backend.h"

namespace vidshow {
namespace {
namespace lanes_avx2 {

using std::memcpy;

constexpr int kLanes = 16, kQuadStep = 32;

#include "kernels/x86/bits256.h"

#include "kernels/x86/pixels256.h"

#include "kernels/x86/pixels.h"

#include "kernels/x86/vec_words.h"

V UpperBytes(V a, V b) {
    return _mm256_blendv_epi8(b, a, Set(0xFF00));
}
#include "kernels/x86/vec_ops.h"

B LoadChroma(const uint8_t* p) {
    return _mm256_cvtepu8_epi16(_mm_loadu_si128(reinterpret_cast<const __m128i*>(p)));
}

void StoreWords(uint8_t* out, V even, V odd) {
    StoreBlocks(out, _mm256_unpacklo_epi16(even, odd), _mm256_unpackhi_epi16(even, odd));
}
V Unless(V pixel, V key) {
    return _mm256_andnot_si256(_mm256_cmpeq_epi16(pixel, key), pixel);
}

#include "kernels/x86/vec_stores.h"

// Where pixels stand in the sums: of words 0-15, 16-31; of quads 0-3, 8-11 | 4-7, 12-15 and 16-19,
// 24-27 | 20-23, 28-31.
struct EvenWordSums {  // 0-6, 16-22 | 8-14, 24-30, even ones; negated
    V v;
};
struct EvenQuadSums {  // 0, 2, 8, 10, 16, 18, 24, 26 | 4, 6, 12, 14, 20, 22, 28, 30; negated
    V v;
};

EvenWordSums EvenSums(const Words& p, const WordWeights& w) {
    const V zero = _mm256_setzero_si256();
    return {WordSum(_mm256_packus_epi32(_mm256_blend_epi16(p.lo, zero, 0xAA),
                                        _mm256_blend_epi16(p.hi, zero, 0xAA)),
                    w)};
}
EvenQuadSums EvenSums(const Quads& p, const QuadWeights& w) {
    const auto products = [&](V x, V y) {
        const __m256 evens =
            _mm256_shuffle_ps(_mm256_castsi256_ps(x), _mm256_castsi256_ps(y), 0x88);
        return _mm256_maddubs_epi16(_mm256_castps_si256(evens), w.bytes);
    };
    return {_mm256_packs_epi32(AddPairs(products(p.part[0], p.part[1])),
                               AddPairs(products(p.part[2], p.part[3])))};
}

void StoreLuma(uint8_t*& out, WordSums s, V offset) {
    Put(out, AddBytes(_mm256_permute4x64_epi64(Narrow(s.lo, s.hi, kPlus), 0xD8), offset));
}
void StoreLuma(uint8_t*& out, QuadSums s, V offset) {
    const __m256i order = _mm256_setr_epi32(0, 4, 1, 5, 2, 6, 3, 7);
    Put(out, AddBytes(_mm256_permutevar8x32_epi32(Narrow(s.lo, s.hi, kPlus), order), offset));
}

void PutLow(uint8_t*& p, __m128i v) {
    _mm_storeu_si128(reinterpret_cast<__m128i*>(p), v);
    p += sizeof v;
}
void StoreChroma(uint8_t*& cbOut, uint8_t*& crOut, EvenWordSums cb, EvenWordSums cr, V offset) {
    const V both = AddBytes(Narrow(cb.v, cr.v, kMinus), offset);
    const __m128i lower = _mm256_castsi256_si128(both), upper = _mm256_extracti128_si256(both, 1);
    PutLow(cbOut, _mm_unpacklo_epi32(lower, upper));
    PutLow(crOut, _mm_unpackhi_epi32(lower, upper));
}
void StoreChroma(uint8_t*& cbOut, uint8_t*& crOut, EvenQuadSums cb, EvenQuadSums cr, V offset) {
    const V both = AddBytes(Narrow(cb.v, cr.v, kMinus), offset);
    const __m128i lower = _mm256_castsi256_si128(both), upper = _mm256_extracti128_si256(both, 1);
    PutLow(cbOut, _mm_unpacklo_epi16(lower, upper));
    PutLow(crOut, _mm_unpackhi_epi16(lower, upper));
}

#include "kernels/vec_body.h"

}  // namespace lanes_avx2
}  // namespace

constexpr VectorBackend kAvx2Backend = lanes_avx2::MakeBackend("avx2");

}  // namespace vidshow
