// Deinterlacing's vocabulary on x86, the same for every width of its registers. No #pragma once, no
// includes: included inside a back end's unnamed namespace, behind bits128.h or bits256.h.

#include "kernels/x86/words.h"

V Set8(int x) {
    return VIDSHOW_MM(set1_epi8)(static_cast<char>(x));
}
V Sub8(V a, V b) {
    return VIDSHOW_MM(sub_epi8)(a, b);
}
V AverageUp(V a, V b) {
    return VIDSHOW_MM(avg_epu8)(a, b);
}
V Min(V a, V b) {
    return VIDSHOW_MM(min_epu8)(a, b);
}
V Max(V a, V b) {
    return VIDSHOW_MM(max_epu8)(a, b);
}
V Equal(V a, V b) {
    return VIDSHOW_MM(cmpeq_epi8)(a, b);
}
V Blend(V a, V b, V takeB) {
    return VIDSHOW_MM(blendv_epi8)(a, b, takeB);
}
V Differences(V a, V b) {
    return VIDSHOW_MM(sad_epu8)(a, b);
}

V Average(V a, V b) {
    return Sub8(AverageUp(a, b), And(Xor(a, b), Set8(1)));
}

/// Pairs of bytes times (first, second), summed. The first factor is unsigned, the second signed.
template <V (*kInterleave)(V, V)>
V Weigh(V x, V y, int first, int second) {
    return WeighPairs(kInterleave(x, y), SetWords((second & 0xFF) << 8 | (first & 0xFF)));
}

// range: -506 to 2554
template <V (*kInterleave)(V, V)>
V FilteredWords(V a, V b, V c, V d, V e) {
    const V sum = AddW(Weigh<kInterleave>(b, d, 4, 4), Weigh<kInterleave>(c, Set8(1), 2, 4));
    return ShrSignedW<3>(AddW(sum, Weigh<kInterleave>(a, e, -1, -1)));
}
V Filtered(V a, V b, V c, V d, V e) {
    return PackWords(FilteredWords<LowBytes>(a, b, c, d, e),
                     FilteredWords<HighBytes>(a, b, c, d, e));
}

// range: 4 to 2044
template <V (*kInterleave)(V, V)>
V MixedWords(V f, V c) {
    return ShrSignedW<3>(AddW(Weigh<kInterleave>(f, c, 5, 3), SetWords(4)));
}
V Rebuilt(V f, V b, V c, V d) {
    const V between = Equal(Max(Min(b, d), Min(Max(b, d), c)), c);
    return Blend(f, PackWords(MixedWords<LowBytes>(f, c), MixedWords<HighBytes>(f, c)), between);
}

struct Sums {
    V between, within;  // 64 bits for each block
};
Sums NoSums() {
    return {Set8(0), Set8(0)};
}
void AddDifferences(Sums& s, V x, V y, V z) {
    s.between = AddW(s.between, Differences(x, y));  // at most 16320: the lowest 16 bits do
    s.within = AddW(s.within, Differences(x, z));
}
void StoreScores(uint16_t* scores, const Sums& s) {
    const V tripled = AddW(s.within, AddW(s.within, s.within));  // at most 48960
    const V against = AddW(s.within, ShrW<4>(tripled));
    uint16_t words[kBytes / 2];
    Store(reinterpret_cast<uint8_t*>(words), SubSat(s.between, against));
    for (int32_t i = 0; i < kBytes / 8; ++i)
        scores[i] = words[4 * i];
}
