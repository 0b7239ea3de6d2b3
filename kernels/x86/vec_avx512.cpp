// AVX-512BW back end of the vector kernels: 32 lanes, 64 pixels a step.
//
// The lanes of a Wide are the even pixels in lo and the odd ones in hi: luma parts so without a
// shuffle, and both take the same chroma. Interleaves and packs work within 128-bit blocks. Most
// orders that come of it are put right by seeing a register as four rows of four 32-bit parts, and
// exchanging rows and columns.

#include <immintrin.h>

#include <cstring>

#include "kernels/vec_backend.h"

namespace vidshow {
namespace {
namespace lanes_avx512 {

using std::memcpy;

constexpr int kLanes = 32, kQuadStep = 64;

#include "kernels/x86/bits512.h"

#include "kernels/x86/vec_words.h"

/// The bits of a where the mask has ones, those of b elsewhere.
V Select(int mask, V a, V b) {
    return _mm512_ternarylogic_epi32(Set(mask), a, b, 0xCA);
}
V Transpose(V v) {
    return _mm512_permutexvar_epi32(
        _mm512_setr_epi32(0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15), v);
}
V Repeat(__m128i x) {
    return _mm512_broadcast_i32x4(x);
}

V UpperBytes(V a, V b) {
    return Select(0xFF00, a, b);
}

#include "kernels/x86/vec_ops.h"

B LoadChroma(const uint8_t* p) {
    return _mm512_cvtepu8_epi16(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(p)));
}

// Channels for bytes are those for words.
V Offset(int x, vec::ForBytes) {
    return Offset(x, vec::ForWords());
}
V AddTerm(V term, B a, B b, vec::ForBytes) {
    return AddTerm(term, a, b, vec::ForWords());
}
V Channel(V y, V term, vec::ForBytes) {
    return Channel(y, term, vec::ForWords());
}

/// Words of even and of odd pixels.
void StoreWords(uint8_t* out, V even, V odd) {
    const V order = _mm512_setr_epi64(0, 4, 1, 5, 2, 6, 3, 7);
    const V e = _mm512_permutexvar_epi64(order, even), o = _mm512_permutexvar_epi64(order, odd);
    Store(out, _mm512_unpacklo_epi16(e, o));
    Store(out + 64, _mm512_unpackhi_epi16(e, o));
}

V Pack565(V a, V b, V c) {
    const V ab = Select(kTop5At11, _mm512_slli_epi16(a, 2), _mm512_srli_epi16(b, 3));
    return Select(kTop5At11 | kTop6At5, ab, _mm512_srli_epi16(c, 9));
}
void Store565(uint8_t* out, Wide a, Wide b, Wide c) {
    StoreWords(out, Pack565(a.lo, b.lo, c.lo), Pack565(a.hi, b.hi, c.hi));
}

V Pack5551(V a, V b, V c, V key) {
    const V ab = Select(kTop5At11, _mm512_slli_epi16(a, 2), _mm512_srli_epi16(b, 3));
    const V abc = Select(kTop5At11 | kTop5At6, ab, _mm512_srli_epi16(c, 8));
    const V pixel = Or(abc, Set(1));  // bit 0 held a bit of c
    const V difference = _mm512_xor_si512(pixel, key);
    return _mm512_maskz_mov_epi16(_mm512_test_epi16_mask(difference, difference), pixel);
}
void Store5551(uint8_t* out, Wide a, Wide b, Wide c, V key) {
    StoreWords(out, Pack5551(a.lo, b.lo, c.lo, key), Pack5551(a.hi, b.hi, c.hi, key));
}

/// The levels as bytes, pixel by pixel.
V Levels(Wide a) {
    return Select(0x00FF, _mm512_srli_epi16(a.lo, 6), _mm512_slli_epi16(a.hi, 2));
}

/// Of 48 bytes a0 b0 c0 a1 ..., those of one channel fall on places that differ modulo 16. So one
/// shuffle a channel serves all three 16-byte parts, and blends by place modulo 3 finish them.
void Store888(uint8_t* out, Wide a, Wide b, Wide c) {
    const auto spread = [](Wide x, __m128i places) {
        return _mm512_shuffle_epi8(Levels(x), Repeat(places));
    };
    const V first = spread(a, _mm_setr_epi8(0, 11, 6, 1, 12, 7, 2, 13, 8, 3, 14, 9, 4, 15, 10, 5));
    const V second = spread(b, _mm_setr_epi8(5, 0, 11, 6, 1, 12, 7, 2, 13, 8, 3, 14, 9, 4, 15, 10));
    const V third = spread(c, _mm_setr_epi8(10, 5, 0, 11, 6, 1, 12, 7, 2, 13, 8, 3, 14, 9, 4, 15));
    const auto part = [](V at0, V at1, V at2) {  // 16 places in every block
        const V one = _mm512_mask_blend_epi8(0x2492249224922492, at0, at1);
        return _mm512_mask_blend_epi8(0x4924492449244924, one, at2);
    };
    const V part0 = part(first, second, third);
    const V part1 = part(second, third, first);
    const V part2 = part(third, first, second);
    // Blocks by their parts and numbers there: 00 10 20 01, 11 21 02 12, 22 03 13 23.
    const auto blocks = [](V x, int b0, int b1, int b2, int b3, V y) {
        return _mm512_permutex2var_epi64(x,
                                         _mm512_setr_epi64(2 * b0, 2 * b0 + 1, 2 * b1, 2 * b1 + 1,
                                                           2 * b2, 2 * b2 + 1, 2 * b3, 2 * b3 + 1),
                                         y);
    };
    Store(out, blocks(blocks(part0, 0, 4, 0, 1, part1), 0, 1, 4, 3, part2));
    Store(out + 64, blocks(blocks(part1, 1, 5, 0, 2, part2), 0, 1, 6, 3, part0));
    Store(out + 128, blocks(blocks(part2, 2, 7, 0, 3, part0), 0, 1, 7, 3, part1));
}

/// Transposed beforehand, so that two interleaves leave pixels 0-15, 16-31 and so on.
void Store8888(uint8_t* out, Wide a, Wide b, Wide c, V d) {
    const V first = Transpose(Levels(a)), second = Transpose(Levels(b));
    const V third = Transpose(Levels(c)), fourth = Or(And(d, 0xFF), _mm512_slli_epi16(d, 8));
    const V ab0 = _mm512_unpacklo_epi8(first, second), ab1 = _mm512_unpackhi_epi8(first, second);
    const V cd0 = _mm512_unpacklo_epi8(third, fourth), cd1 = _mm512_unpackhi_epi8(third, fourth);
    Store(out, _mm512_unpacklo_epi16(ab0, cd0));
    Store(out + 64, _mm512_unpackhi_epi16(ab0, cd0));
    Store(out + 128, _mm512_unpacklo_epi16(ab1, cd1));
    Store(out + 192, _mm512_unpackhi_epi16(ab1, cd1));
}

V SpreadLower(V b, V c) {
    return Transpose(Select(kTop6At10, _mm512_slli_epi16(b, 2), _mm512_srli_epi16(c, 9)));
}
V SpreadUpper(V a) {
    return Transpose(And(_mm512_srli_epi16(a, 3), kTop6At5));
}
void StoreSpread(uint8_t* out, Wide a, Wide b, Wide c) {
    const Wide lower = {SpreadLower(b.lo, c.lo), SpreadLower(b.hi, c.hi)};
    const Wide upper = {SpreadUpper(a.lo), SpreadUpper(a.hi)};
    const V even0 = _mm512_unpacklo_epi16(lower.lo, upper.lo);
    const V even1 = _mm512_unpackhi_epi16(lower.lo, upper.lo);
    const V odd0 = _mm512_unpacklo_epi16(lower.hi, upper.hi);
    const V odd1 = _mm512_unpackhi_epi16(lower.hi, upper.hi);
    Store(out, _mm512_unpacklo_epi32(even0, odd0));
    Store(out + 64, _mm512_unpackhi_epi32(even0, odd0));
    Store(out + 128, _mm512_unpacklo_epi32(even1, odd1));
    Store(out + 192, _mm512_unpackhi_epi32(even1, odd1));
}

// Where pixels stand in the sums: of words 0-31, 32-63; of quads, block q, 4q .. 4q + 3 and the
// same
// + 16, and 32 further.
struct EvenPixelSums {  // block q: four even pixels, and those 32 further; negated
    V v;
};

EvenPixelSums EvenSums(const Words& p, const WordWeights& w) {
    const V evens = _mm512_set1_epi32(0xFFFF);
    return {WordSum(
        _mm512_packus_epi32(_mm512_and_si512(p.lo, evens), _mm512_and_si512(p.hi, evens)), w)};
}
EvenPixelSums EvenSums(const Quads& p, const QuadWeights& w) {
    const V evens = _mm512_setr_epi32(0, 2, 4, 6, 8, 10, 12, 14, 16, 18, 20, 22, 24, 26, 28, 30);
    const auto products = [&](V x, V y) {
        return _mm512_maddubs_epi16(_mm512_permutex2var_epi32(x, evens, y), w.bytes);
    };
    return {_mm512_packs_epi32(AddPairs(products(p.part[0], p.part[1])),
                               AddPairs(products(p.part[2], p.part[3])))};
}

void StoreLuma(uint8_t*& out, WordSums s, V offset) {
    const V order = _mm512_setr_epi64(0, 2, 4, 6, 1, 3, 5, 7);
    Put(out, AddBytes(_mm512_permutexvar_epi64(order, Narrow(s.lo, s.hi, kPlus)), offset));
}
void StoreLuma(uint8_t*& out, QuadSums s, V offset) {
    Put(out, AddBytes(Transpose(Narrow(s.lo, s.hi, kPlus)), offset));
}
void StoreChroma(uint8_t*& cbOut, uint8_t*& crOut, EvenPixelSums cb, EvenPixelSums cr, V offset) {
    const V both = AddBytes(Transpose(Narrow(cb.v, cr.v, kMinus)), offset);
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(cbOut), _mm512_castsi512_si256(both));
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(crOut), _mm512_extracti64x4_epi64(both, 1));
    cbOut += kLanes;
    crOut += kLanes;
}

#include "kernels/vec_body.h"

}  // namespace lanes_avx512
}  // namespace

constexpr VectorBackend kAvx512Backend = lanes_avx512::MakeBackend("avx512");

}  // namespace vidshow
