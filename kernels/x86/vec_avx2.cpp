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
using V = __m256i;
using B = __m256i;  // widened to 16 bits
struct Wide {
    V lo, hi;
};

V Load(const uint8_t* p) {
    return _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p));
}
void Store(uint8_t* p, V v) {
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(p), v);
}
V Set(int x) {
    return _mm256_set1_epi16(static_cast<int16_t>(x));
}
B SetBytes(uint8_t x) {
    return Set(x);
}
V And(V a, int mask) {
    return _mm256_and_si256(a, Set(mask));
}
V Or(V a, V b) {
    return _mm256_or_si256(a, b);
}

V Times(B a, B b) {
    return _mm256_mullo_epi16(a, b);
}
V MinusTimes(V v, B a, B b) {
    return _mm256_sub_epi16(v, Times(a, b));
}

B LoadChroma(const uint8_t* p) {
    return _mm256_cvtepu8_epi16(_mm_loadu_si128(reinterpret_cast<const __m128i*>(p)));
}
void LoadPairs(const uint8_t* p, B& first, B& second) {
    const V pairs = Load(p);
    first = And(pairs, 0xFF);
    second = _mm256_srli_epi16(pairs, 8);
}
Wide LoadLuma(const uint8_t* p, B k) {
    const V bytes = Load(p);
    return {Times(And(bytes, 0xFF), k), Times(_mm256_srli_epi16(bytes, 8), k)};
}

// Channels for words are clamped with two unsigned saturations. A chroma term carries kBias more
// than its value, so that what passes 16383 saturates at 65535; taking kBias away again stops at 0.
constexpr int kBias = 65535 - 16383;
V Offset(int x, vec::ForWords) {
    return Set(x + kBias);
}
V AddTerm(V term, B a, B b, vec::ForWords) {
    return _mm256_adds_epu16(term, Times(a, b));
}
V Channel(V y, V term, vec::ForWords) {
    return _mm256_subs_epu16(_mm256_adds_epu16(y, term), Set(kBias));
}

// Channels for bytes are signed sums; the pack that narrows them clamps them.
V Offset(int x, vec::ForBytes) {
    return Set(x);
}
V AddTerm(V term, B a, B b, vec::ForBytes) {
    return _mm256_add_epi16(term, Times(a, b));
}
V Channel(V y, V term, vec::ForBytes) {
    return _mm256_adds_epi16(y, term);
}
Wide Double(V t) {
    return {t, t};
}

/// The 16-byte halves in order: a's and b's lower ones, then their upper ones.
void StoreHalves(uint8_t* out, V a, V b, int apart = 32) {
    Store(out, _mm256_permute2x128_si256(a, b, 0x20));
    Store(out + apart, _mm256_permute2x128_si256(a, b, 0x31));
}
/// Words of even and of odd pixels.
void StoreWords(uint8_t* out, V even, V odd) {
    StoreHalves(out, _mm256_unpacklo_epi16(even, odd), _mm256_unpackhi_epi16(even, odd));
}

// Channels for words have 14 bits: the level in bits 13-6.
constexpr int kTop5At11 = 0xF800, kTop6At5 = 0x07E0, kTop5At6 = 0x07C0;
constexpr int kTop6At10 = 0xFC00;

V Pack565(V a, V b, V c) {
    return Or(Or(And(_mm256_slli_epi16(a, 2), kTop5At11), And(_mm256_srli_epi16(b, 3), kTop6At5)),
              _mm256_srli_epi16(c, 9));
}
void Store565(uint8_t* out, Wide a, Wide b, Wide c) {
    StoreWords(out, Pack565(a.lo, b.lo, c.lo), Pack565(a.hi, b.hi, c.hi));
}

// Bit 0 holds a bit of c until it is set.
V Pack5551(V a, V b, V c, V key) {
    const V ab =
        Or(And(_mm256_slli_epi16(a, 2), kTop5At11), And(_mm256_srli_epi16(b, 3), kTop5At6));
    const V pixel = Or(Or(ab, _mm256_srli_epi16(c, 8)), Set(1));
    return _mm256_andnot_si256(_mm256_cmpeq_epi16(pixel, key), pixel);
}
void Store5551(uint8_t* out, Wide a, Wide b, Wide c, V key) {
    StoreWords(out, Pack5551(a.lo, b.lo, c.lo, key), Pack5551(a.hi, b.hi, c.hi, key));
}

/// The levels as bytes: in each half the even pixels, then the odd ones.
V Levels(Wide a) {
    return _mm256_packus_epi16(_mm256_srai_epi16(a.lo, 6), _mm256_srai_epi16(a.hi, 6));
}
V SetHalves(__m128i x) {
    return _mm256_broadcastsi128_si256(x);
}

/// Of 48 bytes a0 b0 c0 a1 ..., those of one channel fall on places that differ modulo 16. So one
/// shuffle a channel serves all three 16-byte parts, and blends by place modulo 3 finish them.
void Store888(uint8_t* out, Wide a, Wide b, Wide c) {
    const V first = _mm256_shuffle_epi8(
        Levels(a), SetHalves(_mm_setr_epi8(0, 13, 3, 8, 6, 11, 1, 14, 4, 9, 7, 12, 2, 15, 5, 10)));
    const V second = _mm256_shuffle_epi8(
        Levels(b), SetHalves(_mm_setr_epi8(10, 0, 13, 3, 8, 6, 11, 1, 14, 4, 9, 7, 12, 2, 15, 5)));
    const V third = _mm256_shuffle_epi8(
        Levels(c), SetHalves(_mm_setr_epi8(5, 10, 0, 13, 3, 8, 6, 11, 1, 14, 4, 9, 7, 12, 2, 15)));
    const V places1 = SetHalves(_mm_setr_epi8(0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0));
    const V places2 = SetHalves(_mm_setr_epi8(0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0));
    const auto part = [&](V at0, V at1, V at2) {
        return _mm256_blendv_epi8(_mm256_blendv_epi8(at0, at1, places1), at2, places2);
    };
    const V part0 = part(first, second, third);
    const V part1 = part(second, third, first);
    const V part2 = part(third, first, second);
    Store(out, _mm256_permute2x128_si256(part0, part1, 0x20));
    Store(out + 32, _mm256_permute2x128_si256(part2, part0, 0x30));
    Store(out + 64, _mm256_permute2x128_si256(part1, part2, 0x31));
}

/// 32-bit pixels 0-3 | 16-19, 4-7 | 20-23, 8-11 | 24-27, 12-15 | 28-31.
void StorePixels(uint8_t* out, V q0, V q1, V q2, V q3) {
    StoreHalves(out, q0, q1, 64);
    StoreHalves(out + 32, q2, q3, 64);
}

void Store8888(uint8_t* out, Wide a, Wide b, Wide c, V d) {
    const V order = SetHalves(_mm_setr_epi8(0, 8, 1, 9, 2, 10, 3, 11, 4, 12, 5, 13, 6, 14, 7, 15));
    const auto levels = [&](Wide x) { return _mm256_shuffle_epi8(Levels(x), order); };
    const V first = levels(a), second = levels(b), third = levels(c);
    const V fourth = Or(And(d, 0xFF), _mm256_slli_epi16(d, 8));
    const V ab0 = _mm256_unpacklo_epi8(first, second), ab1 = _mm256_unpackhi_epi8(first, second);
    const V cd0 = _mm256_unpacklo_epi8(third, fourth), cd1 = _mm256_unpackhi_epi8(third, fourth);
    StorePixels(out, _mm256_unpacklo_epi16(ab0, cd0), _mm256_unpackhi_epi16(ab0, cd0),
                _mm256_unpacklo_epi16(ab1, cd1), _mm256_unpackhi_epi16(ab1, cd1));
}

V SpreadLower(V b, V c) {
    return Or(And(_mm256_slli_epi16(b, 2), kTop6At10), _mm256_srli_epi16(c, 9));
}
V SpreadUpper(V a) {
    return And(_mm256_srli_epi16(a, 3), kTop6At5);
}
void StoreSpread(uint8_t* out, Wide a, Wide b, Wide c) {
    const Wide lower = {SpreadLower(b.lo, c.lo), SpreadLower(b.hi, c.hi)};
    const Wide upper = {SpreadUpper(a.lo), SpreadUpper(a.hi)};
    const V even0 = _mm256_unpacklo_epi16(lower.lo, upper.lo);
    const V even1 = _mm256_unpackhi_epi16(lower.lo, upper.lo);
    const V odd0 = _mm256_unpacklo_epi16(lower.hi, upper.hi);
    const V odd1 = _mm256_unpackhi_epi16(lower.hi, upper.hi);
    StorePixels(out, _mm256_unpacklo_epi32(even0, odd0), _mm256_unpackhi_epi32(even0, odd0),
                _mm256_unpacklo_epi32(even1, odd1), _mm256_unpackhi_epi32(even1, odd1));
}

struct Words {
    V lo, hi;
};
struct Quads {
    V part[4];  // 8 pixels each
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
    return {_mm256_set1_epi32((a & 0xFF) | (b & 0xFF) << 8 | (c & 0xFF) << 16 | d << 24)};
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
    const V blueRed = _mm256_blendv_epi8(_mm256_slli_epi16(p, 3), p, Set(0xFF00));
    const V green = And(_mm256_srli_epi16(p, 3), 0xFF);
    return _mm256_add_epi16(_mm256_maddubs_epi16(blueRed, w.blueRed), Times(green, w.green));
}

/// Sums of two neighbouring lanes, as 32-bit numbers.
V AddPairs(V x) {
    return _mm256_madd_epi16(x, Set(1));
}

// Sums stand as the instructions leave them, said by pixel; the stores put them in order.
struct WordSums {  // 0-15, 16-31
    V lo, hi;
};
struct QuadSums {  // 0-3, 8-11 | 4-7, 12-15 and 16-19, 24-27 | 20-23, 28-31
    V lo, hi;
};
struct EvenWordSums {  // 0-6, 16-22 | 8-14, 24-30, even ones; negated
    V v;
};
struct EvenQuadSums {  // 0, 2, 8, 10, 16, 18, 24, 26 | 4, 6, 12, 14, 20, 22, 28, 30; negated
    V v;
};

WordSums LumaSums(const Words& p, const WordWeights& w) {
    return {WordSum(p.lo, w), WordSum(p.hi, w)};
}
EvenWordSums EvenSums(const Words& p, const WordWeights& w) {
    const V zero = _mm256_setzero_si256();
    return {WordSum(_mm256_packus_epi32(_mm256_blend_epi16(p.lo, zero, 0xAA),
                                        _mm256_blend_epi16(p.hi, zero, 0xAA)),
                    w)};
}
QuadSums LumaSums(const Quads& p, const QuadWeights& w) {
    const V twiceSecond =
        SetHalves(_mm_setr_epi8(0, 1, 2, 1, 4, 5, 6, 5, 8, 9, 10, 9, 12, 13, 14, 13));
    const auto products = [&](V pixels) {
        return _mm256_maddubs_epi16(_mm256_shuffle_epi8(pixels, twiceSecond), w.bytes);
    };
    const auto sums = [&](V x, V y) {  // up to 65025: packed as unsigned numbers
        return _mm256_packus_epi32(AddPairs(products(x)), AddPairs(products(y)));
    };
    return {sums(p.part[0], p.part[1]), sums(p.part[2], p.part[3])};
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

/// (x + 128) >> 8, or the same of -x, as signed bytes: a product by 128 / 32768, rounded. The sum
/// that would give 128 saturates in the pack.
constexpr int kPlus = 128, kMinus = -128;
V Narrow(V x, V y, int sign) {
    return _mm256_packs_epi16(_mm256_mulhrs_epi16(x, Set(sign)), _mm256_mulhrs_epi16(y, Set(sign)));
}
V AddBytes(V bytes, V offset) {
    return _mm256_add_epi8(bytes, offset);
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

}  // namespace lanes_avx2
}  // namespace

constexpr VectorBackend kAvx2Backend = lanes_avx2::MakeBackend("avx2");

}  // namespace vidshow
