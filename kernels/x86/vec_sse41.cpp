// SSE4.1 back end of the vector kernels: 8 lanes, 16 pixels a step.
//
// The lanes of a Wide are the even pixels in lo and the odd ones in hi: luma parts so without a
// shuffle, and both take the same chroma. Sums are in order.

#include <smmintrin.h>

#include <cstring>

#include "kernels/vec_backend.h"

namespace vidshow {
namespace {
namespace lanes_sse41 {

using std::memcpy;

constexpr int kLanes = 8, kQuadStep = 16;

#include "kernels/x86/bits128.h"

#include "kernels/x86/pixels128.h"

#include "kernels/x86/pixels.h"

#include "kernels/x86/vec_words.h"

V UpperBytes(V a, V b) {
    return _mm_blendv_epi8(b, a, Set(0xFF00));
}
#include "kernels/x86/vec_ops.h"

B LoadChroma(const uint8_t* p) {
    return _mm_cvtepu8_epi16(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(p)));
}

void StoreWords(uint8_t* out, V even, V odd) {
    StoreBlocks(out, _mm_unpacklo_epi16(even, odd), _mm_unpackhi_epi16(even, odd));
}
V Unless(V pixel, V key) {
    return _mm_andnot_si128(_mm_cmpeq_epi16(pixel, key), pixel);
}

#include "kernels/x86/vec_stores.h"

struct EvenSum {  // in order; negated
    V v;
};
EvenSum EvenSums(const Words& p, const WordWeights& w) {
    const V zero = _mm_setzero_si128();
    return {WordSum(
        _mm_packus_epi32(_mm_blend_epi16(p.lo, zero, 0xAA), _mm_blend_epi16(p.hi, zero, 0xAA)), w)};
}
EvenSum EvenSums(const Quads& p, const QuadWeights& w) {
    const auto products = [&](V x, V y) {
        const __m128 evens = _mm_shuffle_ps(_mm_castsi128_ps(x), _mm_castsi128_ps(y), 0x88);
        return _mm_maddubs_epi16(_mm_castps_si128(evens), w.bytes);
    };
    return {_mm_packs_epi32(AddPairs(products(p.part[0], p.part[1])),
                            AddPairs(products(p.part[2], p.part[3])))};
}

template <class Sums>
void StoreLuma(uint8_t*& out, Sums s, V offset) {
    Put(out, AddBytes(Narrow(s.lo, s.hi, kPlus), offset));
}
void StoreChroma(uint8_t*& cbOut, uint8_t*& crOut, EvenSum cb, EvenSum cr, V offset) {
    const V both = AddBytes(Narrow(cb.v, cr.v, kMinus), offset);
    _mm_storel_epi64(reinterpret_cast<__m128i*>(cbOut), both);
    _mm_storel_epi64(reinterpret_cast<__m128i*>(crOut), _mm_unpackhi_epi64(both, both));
    cbOut += kLanes;
    crOut += kLanes;
}

#include "kernels/vec_body.h"

}  // namespace lanes_sse41
}  // namespace

constexpr VectorBackend kSse41Backend = lanes_sse41::MakeBackend("sse41");

}  // namespace vidshow
