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
using V = __m128i;
using B = __m128i;  // widened to 16 bits
struct Wide {
    V lo, hi;
};

V Load(const uint8_t* p) {
    return _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
}
void Store(uint8_t* p, V v) {
    _mm_storeu_si128(reinterpret_cast<__m128i*>(p), v);
}
V Set(int x) {
    return _mm_set1_epi16(static_cast<int16_t>(x));
}
B SetBytes(uint8_t x) {
    return Set(x);
}
V And(V a, int mask) {
    return _mm_and_si128(a, Set(mask));
}
V Or(V a, V b) {
    return _mm_or_si128(a, b);
}

V Times(B a, B b) {
    return _mm_mullo_epi16(a, b);
}
V MinusTimes(V v, B a, B b) {
    return _mm_sub_epi16(v, Times(a, b));
}

B LoadChroma(const uint8_t* p) {
    return _mm_cvtepu8_epi16(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(p)));
}
void LoadPairs(const uint8_t* p, B& first, B& second) {
    const V pairs = Load(p);
    first = And(pairs, 0xFF);
    second = _mm_srli_epi16(pairs, 8);
}
Wide LoadLuma(const uint8_t* p, B k) {
    const V bytes = Load(p);
    return {Times(And(bytes, 0xFF), k), Times(_mm_srli_epi16(bytes, 8), k)};
}

// Channels for words are clamped with two unsigned saturations. A chroma term carries kBias more
// than its value, so that what passes 16383 saturates at 65535; taking kBias away again stops at 0.
constexpr int kBias = 65535 - 16383;
V Offset(int x, vec::ForWords) {
    return Set(x + kBias);
}
V AddTerm(V term, B a, B b, vec::ForWords) {
    return _mm_adds_epu16(term, Times(a, b));
}
V Channel(V y, V term, vec::ForWords) {
    return _mm_subs_epu16(_mm_adds_epu16(y, term), Set(kBias));
}

// Channels for bytes are signed sums; the pack that narrows them clamps them.
V Offset(int x, vec::ForBytes) {
    return Set(x);
}
V AddTerm(V term, B a, B b, vec::ForBytes) {
    return _mm_add_epi16(term, Times(a, b));
}
V Channel(V y, V term, vec::ForBytes) {
    return _mm_adds_epi16(y, term);
}
Wide Double(V t) {
    return {t, t};
}

/// Words of even and of odd pixels.
void StoreWords(uint8_t* out, V even, V odd) {
    Store(out, _mm_unpacklo_epi16(even, odd));
    Store(out + 16, _mm_unpackhi_epi16(even, odd));
}

// Channels for words have 14 bits: the level in bits 13-6.
constexpr int kTop5At11 = 0xF800, kTop6At5 = 0x07E0, kTop5At6 = 0x07C0;
constexpr int kTop6At10 = 0xFC00;

V Pack565(V a, V b, V c) {
    return Or(Or(And(_mm_slli_epi16(a, 2), kTop5At11), And(_mm_srli_epi16(b, 3), kTop6At5)),
              _mm_srli_epi16(c, 9));
}
void Store565(uint8_t* out, Wide a, Wide b, Wide c) {
    StoreWords(out, Pack565(a.lo, b.lo, c.lo), Pack565(a.hi, b.hi, c.hi));
}

// Bit 0 holds a bit of c until it is set.
V Pack5551(V a, V b, V c, V key) {
    const V ab = Or(And(_mm_slli_epi16(a, 2), kTop5At11), And(_mm_srli_epi16(b, 3), kTop5At6));
    const V pixel = Or(Or(ab, _mm_srli_epi16(c, 8)), Set(1));
    return _mm_andnot_si128(_mm_cmpeq_epi16(pixel, key), pixel);
}
void Store5551(uint8_t* out, Wide a, Wide b, Wide c, V key) {
    StoreWords(out, Pack5551(a.lo, b.lo, c.lo, key), Pack5551(a.hi, b.hi, c.hi, key));
}

/// The levels as bytes: the even pixels, then the odd ones.
V Levels(Wide a) {
    return _mm_packus_epi16(_mm_srai_epi16(a.lo, 6), _mm_srai_epi16(a.hi, 6));
}

/// Of 48 bytes a0 b0 c0 a1 ..., those of one channel fall on places that differ modulo 16. So one
/// shuffle a channel serves all three 16-byte parts, and blends by place modulo 3 finish them.
void Store888(uint8_t* out, Wide a, Wide b, Wide c) {
    const V first = _mm_shuffle_epi8(
        Levels(a), _mm_setr_epi8(0, 13, 3, 8, 6, 11, 1, 14, 4, 9, 7, 12, 2, 15, 5, 10));
    const V second = _mm_shuffle_epi8(
        Levels(b), _mm_setr_epi8(10, 0, 13, 3, 8, 6, 11, 1, 14, 4, 9, 7, 12, 2, 15, 5));
    const V third = _mm_shuffle_epi8(
        Levels(c), _mm_setr_epi8(5, 10, 0, 13, 3, 8, 6, 11, 1, 14, 4, 9, 7, 12, 2, 15));
    const V places1 = _mm_setr_epi8(0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0);
    const V places2 = _mm_setr_epi8(0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0);
    const auto part = [&](V at0, V at1, V at2) {
        return _mm_blendv_epi8(_mm_blendv_epi8(at0, at1, places1), at2, places2);
    };
    Store(out, part(first, second, third));
    Store(out + 16, part(second, third, first));
    Store(out + 32, part(third, first, second));
}

/// 32-bit pixels, 4 in each.
void StorePixels(uint8_t* out, V q0, V q1, V q2, V q3) {
    Store(out, q0);
    Store(out + 16, q1);
    Store(out + 32, q2);
    Store(out + 48, q3);
}

void Store8888(uint8_t* out, Wide a, Wide b, Wide c, V d) {
    const V order = _mm_setr_epi8(0, 8, 1, 9, 2, 10, 3, 11, 4, 12, 5, 13, 6, 14, 7, 15);
    const auto levels = [&](Wide x) { return _mm_shuffle_epi8(Levels(x), order); };
    const V first = levels(a), second = levels(b), third = levels(c);
    const V fourth = Or(And(d, 0xFF), _mm_slli_epi16(d, 8));
    const V ab0 = _mm_unpacklo_epi8(first, second), ab1 = _mm_unpackhi_epi8(first, second);
    const V cd0 = _mm_unpacklo_epi8(third, fourth), cd1 = _mm_unpackhi_epi8(third, fourth);
    StorePixels(out, _mm_unpacklo_epi16(ab0, cd0), _mm_unpackhi_epi16(ab0, cd0),
                _mm_unpacklo_epi16(ab1, cd1), _mm_unpackhi_epi16(ab1, cd1));
}

V SpreadLower(V b, V c) {
    return Or(And(_mm_slli_epi16(b, 2), kTop6At10), _mm_srli_epi16(c, 9));
}
V SpreadUpper(V a) {
    return And(_mm_srli_epi16(a, 3), kTop6At5);
}
void StoreSpread(uint8_t* out, Wide a, Wide b, Wide c) {
    const Wide lower = {SpreadLower(b.lo, c.lo), SpreadLower(b.hi, c.hi)};
    const Wide upper = {SpreadUpper(a.lo), SpreadUpper(a.hi)};
    const V even0 = _mm_unpacklo_epi16(lower.lo, upper.lo);
    const V even1 = _mm_unpackhi_epi16(lower.lo, upper.lo);
    const V odd0 = _mm_unpacklo_epi16(lower.hi, upper.hi);
    const V odd1 = _mm_unpackhi_epi16(lower.hi, upper.hi);
    StorePixels(out, _mm_unpacklo_epi32(even0, odd0), _mm_unpackhi_epi32(even0, odd0),
                _mm_unpacklo_epi32(even1, odd1), _mm_unpackhi_epi32(even1, odd1));
}

struct Words {
    V lo, hi;
};
struct Quads {
    V part[4];  // 4 pixels each
};
V Take(const uint8_t*& p) {
    p += sizeof(V);
    return Load(p - sizeof(V));
}
void Put(uint8_t*& p, V v) {
    Store(p, v);
    p += sizeof(V);
}

/// Words: bytes for blue and red, side by side, and lanes for green. Quads: bytes only; luma's
/// weight of the second byte is parted between the second and fourth place, because bytes are
/// signed here and a pair of products must stay within 128 * 255. Chroma weights are negated, since
/// 128 has no signed byte, but -128 has; StoreChroma turns the sums' sign.
struct WordWeights {
    V blueRed, green;
};
struct QuadWeights {
    V bytes;
};
WordWeights SetWords(int a, int b, int c) {
    return {Set((c & 0xFF) | a * 256), Set(b)};
}
WordWeights LumaWords(int a, int b, int c) {
    return SetWords(a, b, c);
}
WordWeights ChromaWords(int a, int b, int c) {
    return SetWords(-a, -b, -c);
}
QuadWeights SetQuads(int a, int b, int c, int d) {
    return {_mm_set1_epi32((a & 0xFF) | (b & 0xFF) << 8 | (c & 0xFF) << 16 | d << 24)};
}
QuadWeights LumaQuads(int a, int b, int c) {
    const int first = b < 128 - a ? b : a == 0 ? 127 : 128 - a;
    return SetQuads(a, first, c, b - first);
}
QuadWeights ChromaQuads(int a, int b, int c) {
    return SetQuads(-a, -b, -c, 0);
}

Words LoadPixels(const uint8_t*& p, const WordWeights&) {
    const V lo = Take(p);
    return {lo, Take(p)};
}
Quads LoadPixels(const uint8_t*& p, const QuadWeights&) {
    Quads quads;
    for (V& part : quads.part)
        part = Take(p);
    return quads;
}

/// Of 16-bit pixels: bits 4-0 shifted up by 3 in the lower byte, bits 15-8 in the upper one.
V WordSum(V p, const WordWeights& w) {
    const V blueRed = _mm_blendv_epi8(_mm_slli_epi16(p, 3), p, Set(0xFF00));
    const V green = And(_mm_srli_epi16(p, 3), 0xFF);
    return _mm_add_epi16(_mm_maddubs_epi16(blueRed, w.blueRed), Times(green, w.green));
}

/// Sums of two neighbouring lanes, as 32-bit numbers.
V AddPairs(V x) {
    return _mm_madd_epi16(x, Set(1));
}

struct EvenWordSums {  // negated
    V v;
};
using EvenQuadSums = EvenWordSums;

Wide LumaSums(const Words& p, const WordWeights& w) {
    return {WordSum(p.lo, w), WordSum(p.hi, w)};
}
EvenWordSums EvenSums(const Words& p, const WordWeights& w) {
    const V zero = _mm_setzero_si128();
    return {WordSum(
        _mm_packus_epi32(_mm_blend_epi16(p.lo, zero, 0xAA), _mm_blend_epi16(p.hi, zero, 0xAA)), w)};
}
Wide LumaSums(const Quads& p, const QuadWeights& w) {
    const V twiceSecond = _mm_setr_epi8(0, 1, 2, 1, 4, 5, 6, 5, 8, 9, 10, 9, 12, 13, 14, 13);
    const auto products = [&](V pixels) {
        return _mm_maddubs_epi16(_mm_shuffle_epi8(pixels, twiceSecond), w.bytes);
    };
    const auto sums = [&](V x, V y) {  // up to 65025: packed as unsigned numbers
        return _mm_packus_epi32(AddPairs(products(x)), AddPairs(products(y)));
    };
    return {sums(p.part[0], p.part[1]), sums(p.part[2], p.part[3])};
}
EvenQuadSums EvenSums(const Quads& p, const QuadWeights& w) {
    const auto products = [&](V x, V y) {
        const __m128 evens = _mm_shuffle_ps(_mm_castsi128_ps(x), _mm_castsi128_ps(y), 0x88);
        return _mm_maddubs_epi16(_mm_castps_si128(evens), w.bytes);
    };
    return {_mm_packs_epi32(AddPairs(products(p.part[0], p.part[1])),
                            AddPairs(products(p.part[2], p.part[3])))};
}

/// (x + 128) >> 8, or the same of -x, as signed bytes: a product by 128 / 32768, rounded. The sum
/// that would give 128 saturates in the pack.
constexpr int kPlus = 128, kMinus = -128;
V Narrow(V x, V y, int sign) {
    return _mm_packs_epi16(_mm_mulhrs_epi16(x, Set(sign)), _mm_mulhrs_epi16(y, Set(sign)));
}
V AddBytes(V bytes, V offset) {
    return _mm_add_epi8(bytes, offset);
}
void StoreLuma(uint8_t*& out, Wide s, V offset) {
    Put(out, AddBytes(Narrow(s.lo, s.hi, kPlus), offset));
}
void StoreChroma(uint8_t*& cbOut, uint8_t*& crOut, EvenWordSums cb, EvenWordSums cr, V offset) {
    const V both = AddBytes(Narrow(cb.v, cr.v, kMinus), offset);
    _mm_storel_epi64(reinterpret_cast<__m128i*>(cbOut), both);
    _mm_storel_epi64(reinterpret_cast<__m128i*>(crOut), _mm_unpackhi_epi64(both, both));
    cbOut += kLanes;
    crOut += kLanes;
}

__m128i LoadQuad(const uint32_t* p) {
    return _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
}
void StoreQuad(uint32_t* p, __m128i v) {
    _mm_storeu_si128(reinterpret_cast<__m128i*>(p), _mm_and_si128(v, _mm_set1_epi32(0x07E0FC1F)));
}
void BlendQuad(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t w) {
    const __m128i above = _mm_mullo_epi32(LoadQuad(upper), _mm_set1_epi32(32 - w));
    const __m128i below = _mm_mullo_epi32(LoadQuad(lower), _mm_set1_epi32(w));
    StoreQuad(out, _mm_srli_epi32(_mm_add_epi32(above, below), 5));
}
void AverageQuad(const uint32_t* upper, const uint32_t* lower, uint32_t* out) {
    StoreQuad(out, _mm_srli_epi32(_mm_add_epi32(LoadQuad(upper), LoadQuad(lower)), 1));
}

#include "kernels/vec_body.h"

}  // namespace lanes_sse41
}  // namespace

constexpr VectorBackend kSse41Backend = lanes_sse41::MakeBackend("sse41");

}  // namespace vidshow
