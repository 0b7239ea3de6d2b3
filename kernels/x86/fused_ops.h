// The fused kernels' vocabulary on x86, as far as it is the same for every width of its registers.
// No #pragma once, no includes: included inside a back end's unnamed namespace, behind pixels.h.

#include "kernels/x86/words.h"

using W = V;
using B = V;
using D = V;  // words of 32 bits

struct EvenOdd {
    W even, odd;
};

void StoreWords(uint8_t* p, W v) {
    Store(p, v);
}
W SetFraction(int x) {
    return SetWords(2 * x);
}
W TimesFraction(W v, W fraction) {
    return VIDSHOW_MM(mulhi_epu16)(v, fraction);
}
W AddSigned(W a, W b) {
    return VIDSHOW_MM(adds_epi16)(a, b);
}
W AndW(W a, W b) {
    return And(a, b);
}
W OrW(W a, W b) {
    return Or(a, b);
}
EvenOdd WidenPairs(const uint8_t* p) {
    const V bytes = Load(p);
    return {And(bytes, SetWords(0xFF)), ShrW<8>(bytes)};
}

B SetBytes(int x) {
    return VIDSHOW_MM(set1_epi8)(static_cast<char>(x));
}
// Of what words shift from one byte into the other nothing is left.
template <int kBits>
B ShlB(B v) {
    return And(ShlW<kBits>(v), SetBytes(0xFF << kBits));
}
template <int kBits>
B ShrB(B v) {
    return And(ShrW<kBits>(v), SetBytes(0xFF >> kBits));
}

void StoreBytes(uint8_t* p, B v) {
    Store(p, InOrder(v));
}

template <int kBits>
B Channel(const EvenOdd& levels) {
    constexpr int kShift = 14 - kBits;
    const B bytes = PackWords(ShrSignedW<kShift>(levels.even), ShrSignedW<kShift>(levels.odd));
    return kBits == 8 ? bytes : VIDSHOW_MM(min_epu8)(bytes, SetBytes((1 << kBits) - 1));
}

/// From 16 bytes in order in every 128 bits.
B Parted(V bytes) {
    return Shuffled(bytes, _mm_setr_epi8(0, 2, 4, 6, 8, 10, 12, 14, 1, 3, 5, 7, 9, 11, 13, 15));
}
void StorePairs(uint8_t* p, W low, W high) {
    StoreBlocks(p, VIDSHOW_MM(unpacklo_epi16)(low, high), VIDSHOW_MM(unpackhi_epi16)(low, high));
}
/// Red and the upper bits of green, alike in both.
B UpperBytes(B r, B g) {
    return Or(And(r, SetBytes(0xF8)), ShrB<5>(g));
}
void StoreRgb565(uint8_t* p, B r, B g, B b) {
    StoreTwos(p, Or(And(ShlW<3>(g), SetBytes(0xE0)), ShrB<3>(b)), UpperBytes(r, g));
}
void StoreRgb5551(uint8_t* p, B r, B g, B b) {
    const B low = Or(And(ShlW<3>(g), SetBytes(0xC0)), And(ShrW<2>(b), SetBytes(0x3E)));
    StoreTwos(p, Or(low, SetBytes(1)), UpperBytes(r, g));
}

void PickGroup(const uint8_t* span, const uint8_t* order, uint8_t* out) {
    const __m128i numbers = _mm_loadl_epi64(reinterpret_cast<const __m128i*>(order));
    const __m128i bytes = _mm_loadu_si128(reinterpret_cast<const __m128i*>(span));
    _mm_storel_epi64(reinterpret_cast<__m128i*>(out), _mm_shuffle_epi8(bytes, numbers));
}

/// Weights of the upper and the lower row, in turn.
using ByteWeights = V;
constexpr int32_t kBytes = static_cast<int32_t>(sizeof(V));

ByteWeights WeightsOf(int32_t weight) {
    return SetWords(weight << 8 | (32 - weight));
}
void BlendStep(const uint8_t* upper, const uint8_t* lower, ByteWeights weights, uint8_t* out) {
    const V a = Load(upper), b = Load(lower);
    const V low = WeighPairs(LowBytes(a, b), weights);
    const V high = WeighPairs(HighBytes(a, b), weights);
    Store(out, PackWords(ShrW<5>(low), ShrW<5>(high)));
}

template <int kBits>
D Shr(D v) {
    return VIDSHOW_MM(srli_epi32)(v, kBits);
}
D HighHalves(D v) {
    return VIDSHOW_MM(srai_epi32)(v, 16);
}
D LowHalves(D v) {
    return HighHalves(VIDSHOW_MM(slli_epi32)(v, 16));
}

/// Taps of a step's columns, which all pick from the same 16 bytes.
struct JoinedStep {
    size_t first;
    V order, weights;

    JoinedStep(const ByteTaps& taps, size_t group)
        : first(taps.first[group]),
          order(Load(taps.order[group])),
          weights(Load(taps.weights[group])) {}
    W WeighSpans(V spans) const {
        return WeighPairs(VIDSHOW_MM(shuffle_epi8)(spans, order), weights);
    }
    W Weigh(const uint8_t* plane) const {
        return WeighSpans(Repeat(_mm_loadu_si128(reinterpret_cast<const __m128i*>(plane + first))));
    }
};
