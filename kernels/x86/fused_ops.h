// The fused kernels' vocabulary on x86, as far as it is the same for every width of its registers.
// No #pragma once, no includes: included inside a back end's unnamed namespace, behind bits128.h or
// bits256.h. Interleaving and packing work within 128 bits, both ways alike.

using W = V;
using D = V;

W LoadWords(const uint16_t* p) {
    return Load(p);
}
void StoreWords(uint8_t* p, W v) {
    Store(p, v);
}
W SetWords(int x) {
    return VIDSHOW_MM(set1_epi16)(static_cast<int16_t>(x));
}
W AddW(W a, W b) {
    return VIDSHOW_MM(add_epi16)(a, b);
}
W MulW(W a, W b) {
    return VIDSHOW_MM(mullo_epi16)(a, b);
}
W AddSat(W a, W b) {
    return VIDSHOW_MM(adds_epu16)(a, b);
}
W SubSat(W a, W b) {
    return VIDSHOW_MM(subs_epu16)(a, b);
}
W Min(W a, W b) {
    return VIDSHOW_MM(min_epu16)(a, b);
}
W AndW(W a, W b) {
    return And(a, b);
}
W OrW(W a, W b) {
    return Or(a, b);
}
template <int kBits>
W ShlW(W v) {
    return VIDSHOW_MM(slli_epi16)(v, kBits);
}
template <int kBits>
W ShrW(W v) {
    return VIDSHOW_MM(srli_epi16)(v, kBits);
}
W LowWords(W a, W b) {
    return VIDSHOW_MM(unpacklo_epi16)(a, b);
}
W HighWords(W a, W b) {
    return VIDSHOW_MM(unpackhi_epi16)(a, b);
}
W PackUnsigned(D low, D high) {
    return VIDSHOW_MM(packus_epi32)(low, high);
}

void PickGroup(const uint8_t* span, const uint8_t* order, uint8_t* out) {
    const __m128i numbers = _mm_loadl_epi64(reinterpret_cast<const __m128i*>(order));
    const __m128i bytes = _mm_loadu_si128(reinterpret_cast<const __m128i*>(span));
    _mm_storel_epi64(reinterpret_cast<__m128i*>(out), _mm_shuffle_epi8(bytes, numbers));
}

W LevelsTo565(W r, W g, W b) {
    const W most = SetWords(0x7FFF);
    const W red = And(ShlW<1>(Min(r, most)), SetWords(0xF800));
    const W green = And(ShrW<4>(Min(g, most)), SetWords(0x07E0));
    return Or(Or(red, green), ShrW<10>(Min(b, most)));
}
void StorePairs(uint8_t* p, W low, W high);
void StoreQuads(uint8_t* p, W b, W g, W r, W a) {
    // Above 32767 a level is above 255, and packing cuts it.
    const V blueRed = VIDSHOW_MM(packus_epi16)(ShrW<7>(b), ShrW<7>(r));
    const V greenAlpha = VIDSHOW_MM(packus_epi16)(ShrW<7>(g), a);
    StorePairs(p, VIDSHOW_MM(unpacklo_epi8)(blueRed, greenAlpha),
               VIDSHOW_MM(unpackhi_epi8)(blueRed, greenAlpha));
}

/// Weights of the upper and the lower row, in turn.
using ByteWeights = V;
constexpr int32_t kBytes = static_cast<int32_t>(sizeof(V));

ByteWeights WeightsOf(int32_t weight) {
    return SetWords(weight << 8 | (32 - weight));
}
void BlendStep(const uint8_t* upper, const uint8_t* lower, ByteWeights weights, uint8_t* out) {
    const V a = Load(upper), b = Load(lower);
    const V low = VIDSHOW_MM(maddubs_epi16)(VIDSHOW_MM(unpacklo_epi8)(a, b), weights);
    const V high = VIDSHOW_MM(maddubs_epi16)(VIDSHOW_MM(unpackhi_epi8)(a, b), weights);
    Store(out, VIDSHOW_MM(packus_epi16)(ShrW<5>(low), ShrW<5>(high)));
}

D Set(uint32_t x) {
    return VIDSHOW_MM(set1_epi32)(static_cast<int>(x));
}
D Add(D a, D b) {
    return VIDSHOW_MM(add_epi32)(a, b);
}
D Sub(D a, D b) {
    return VIDSHOW_MM(sub_epi32)(a, b);
}
D Mul(D a, D b) {
    return VIDSHOW_MM(mullo_epi32)(a, b);
}
template <int kBits>
D Shl(D v) {
    return VIDSHOW_MM(slli_epi32)(v, kBits);
}
template <int kBits>
D Shr(D v) {
    return VIDSHOW_MM(srli_epi32)(v, kBits);
}
template <int kBits>
D ShrSigned(D v) {
    return VIDSHOW_MM(srai_epi32)(v, kBits);
}

D OnLine(D samples, D slope, D offset) {
    const D sum = Add(Mul(samples, slope), offset);
    return VIDSHOW_MM(sign_epi32)(Shr<kChromaShift>(VIDSHOW_MM(abs_epi32)(sum)), sum);
}

struct Term {
    W up, down;
};
struct Terms {
    Term red, green, blue;
};
Terms MakeTerms(D red, D green, D blue) {
    const D zero = Set(0);
    const W up = PackUnsigned(red, blue);
    const W down = PackUnsigned(Sub(zero, red), Sub(zero, blue));
    const W both = PackUnsigned(green, Sub(zero, green));
    return {{LowWords(up, up), LowWords(down, down)},
            {LowWords(both, both), HighWords(both, both)},
            {HighWords(up, up), HighWords(down, down)}};
}
