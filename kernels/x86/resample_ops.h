// Resampling's vocabulary on x86, the same for every width of its registers. No #pragma once, no
// includes: included inside a back end's unnamed namespace, behind bits128.h or bits256.h and
// LoadWide(p), which gives bytes as words.

#include "kernels/x86/words.h"

struct Weights {
    V above, below;
};

Weights WeightsOf(uint32_t weight) {
    const int below = static_cast<int>(weight);
    return {SetWords(32 - below), SetWords(below)};
}
void MeanStep(uint16_t* out, const uint8_t* a, const uint8_t* b, const Weights& w) {
    const V sum = AddW(MulW(LoadWide(a), w.above), MulW(LoadWide(b), w.below));
    Store(reinterpret_cast<uint8_t*>(out), ShrW<2>(AddW(sum, SetWords(2))));
}

/// Levels in words of 32 bits from the words of two taps each.
V Levels(V taps, V weights) {
    const V sums = VIDSHOW_MM(madd_epi16)(taps, weights);
    return VIDSHOW_MM(srli_epi32)(VIDSHOW_MM(add_epi32)(sums, VIDSHOW_MM(set1_epi32)(128)), 8);
}

V PickRow(const uint16_t* blended, const NearTaps::Pair* pairs);

/// Of the pairs that give kGroups groups: these groups of every row.
void PickStep(uint8_t* out, ptrdiff_t stride, const uint16_t* blended, ptrdiff_t step,
              const NearTaps::Pair* pairs) {
    for (int32_t r = 0; r < kBandRows; ++r, out += stride, blended += step)
        Store(out, PickRow(blended, pairs));
}
