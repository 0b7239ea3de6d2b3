// The vocabulary of the vector kernels on x86, as far as it is the same for every width of the
// registers. No #pragma once, no includes: included inside a back end's unnamed namespace, behind
// vec_words.h and
//
//   UpperBytes(a, b)             the upper byte of every lane of a, the lower one of b
//   Repeat(x)                    128 bits in every 128 bits of a V

/// Both rows are asked for this many bytes ahead: their many streams are more than the processor
/// follows by itself.
constexpr int kAhead = 1024;

B SetBytes(uint8_t x) {
    return Set(x);
}
V Times(B a, B b) {
    return VIDSHOW_MM(mullo_epi16)(a, b);
}
V MinusTimes(V v, B a, B b) {
    return VIDSHOW_MM(sub_epi16)(v, Times(a, b));
}
template <int kBits>
V ShiftRight(V v) {
    return VIDSHOW_MM(srli_epi16)(v, kBits);
}
template <int kBits>
V ShiftLeft(V v) {
    return VIDSHOW_MM(slli_epi16)(v, kBits);
}

void LoadPairs(const uint8_t* p, B& first, B& second) {
    const V pairs = Load(p);
    first = And(pairs, 0xFF);
    second = ShiftRight<8>(pairs);
}
Wide LoadLuma(const uint8_t* p, B k) {
    const V bytes = Load(p);
    return {Times(And(bytes, 0xFF), k), Times(ShiftRight<8>(bytes), k)};
}
Wide Double(V t) {
    return {t, t};
}

// Channels that are clamped with two unsigned saturations: a chroma term carries kBias more than
// its value, so that what passes 16383 saturates at 65535; taking kBias away again stops at 0.
constexpr int kBias = 65535 - 16383;
V Offset(int x, vec::ForWords) {
    return Set(x + kBias);
}
V AddTerm(V term, B a, B b, vec::ForWords) {
    return VIDSHOW_MM(adds_epu16)(term, Times(a, b));
}
V Channel(V y, V term, vec::ForWords) {
    return VIDSHOW_MM(subs_epu16)(VIDSHOW_MM(adds_epu16)(y, term), Set(kBias));
}
// They have 14 bits: the level in bits 13-6.
constexpr int kTop5At11 = 0xF800, kTop6At5 = 0x07E0, kTop5At6 = 0x07C0;
constexpr int kTop6At10 = 0xFC00;

struct Words {
    V lo, hi;
};
struct Quads {
    V part[4];
};

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
WordWeights LumaWords(int a, int b, int c) {
    return {Set((c & 0xFF) | a * 256), Set(b)};
}
WordWeights ChromaWords(int a, int b, int c) {
    return LumaWords(-a, -b, -c);
}
QuadWeights SetQuads(int a, int b, int c, int d) {
    return {VIDSHOW_MM(set1_epi32)((a & 0xFF) | (b & 0xFF) << 8 | (c & 0xFF) << 16 | d << 24)};
}
QuadWeights LumaQuads(int a, int b, int c) {
    const int first = b < 128 - a ? b : a == 0 ? 127 : 128 - a;
    return SetQuads(a, first, c, b - first);
}
QuadWeights ChromaQuads(int a, int b, int c) {
    return SetQuads(-a, -b, -c, 0);
}

V Take(const uint8_t*& p) {
    p += sizeof(V);
    return Load(p - sizeof(V));
}
void Put(uint8_t*& p, V v) {
    Store(p, v);
    p += sizeof(V);
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
    const V blueRed = UpperBytes(p, ShiftLeft<3>(p));
    const V green = And(ShiftRight<3>(p), 0xFF);
    return VIDSHOW_MM(add_epi16)(VIDSHOW_MM(maddubs_epi16)(blueRed, w.blueRed),
                                 Times(green, w.green));
}
/// Sums of two neighbouring lanes, as 32-bit numbers.
V AddPairs(V x) {
    return VIDSHOW_MM(madd_epi16)(x, Set(1));
}

// Sums stand as the instructions leave them; the stores put them in order.
struct WordSums {
    V lo, hi;
};
struct QuadSums {
    V lo, hi;
};
WordSums LumaSums(const Words& p, const WordWeights& w) {
    return {WordSum(p.lo, w), WordSum(p.hi, w)};
}
QuadSums LumaSums(const Quads& p, const QuadWeights& w) {
    const V twiceSecond =
        Repeat(_mm_setr_epi8(0, 1, 2, 1, 4, 5, 6, 5, 8, 9, 10, 9, 12, 13, 14, 13));
    const auto products = [&](V pixels) {
        return VIDSHOW_MM(maddubs_epi16)(VIDSHOW_MM(shuffle_epi8)(pixels, twiceSecond), w.bytes);
    };
    const auto sums = [&](V x, V y) {  // up to 65025: packed as unsigned numbers
        return VIDSHOW_MM(packus_epi32)(AddPairs(products(x)), AddPairs(products(y)));
    };
    return {sums(p.part[0], p.part[1]), sums(p.part[2], p.part[3])};
}

/// (x + 128) >> 8, or the same of -x, as signed bytes: a product by 128 / 32768, rounded. The sum
/// that would give 128 saturates in the pack.
constexpr int kPlus = 128, kMinus = -128;
V Narrow(V x, V y, int sign) {
    return VIDSHOW_MM(packs_epi16)(VIDSHOW_MM(mulhrs_epi16)(x, Set(sign)),
                                   VIDSHOW_MM(mulhrs_epi16)(y, Set(sign)));
}
V AddBytes(V bytes, V offset) {
    return VIDSHOW_MM(add_epi8)(bytes, offset);
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
