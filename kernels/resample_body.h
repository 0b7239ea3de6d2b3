// The loops of resampling by rows, written once. No #pragma once, no includes: every back end
// includes this file inside its own unnamed namespace, behind its operations.
//
// Vocabulary that a back end defines:
//
//   kWords                   columns a step of blending
//   Weights, WeightsOf(w)    of the upper and the lower row, 32 - w and w
//   MeanStep(out, a, b, w)   kWords blended words
//   kGroups                  groups of four columns a step of picking
//   PickStep(out, stride, blended, step, pairs)  kGroups groups of every row of a band

void BlendRow(uint16_t* out, const uint8_t* a, const uint8_t* b, uint32_t weight, size_t count) {
    const Weights weights = WeightsOf(weight);
    if (count < kWords) {
        uint8_t copy[2][kWords] = {};
        memcpy(copy[0], a, count);
        memcpy(copy[1], b, count);
        MeanStep(out, copy[0], copy[1], weights);
        return;
    }
    // The last step ends with the rows, over what the one before it has done already.
    const size_t last = count - kWords;
    for (size_t i = 0; i < last; i += kWords)
        MeanStep(out + i, a + i, b + i, weights);
    MeanStep(out + last, a + last, b + last, weights);
}

void BlendRows(uint16_t* out, ptrdiff_t step, const RowTaps& rows, size_t count) {
    for (int32_t r = 0; r < kBandRows; ++r)
        BlendRow(out + r * step, rows.upper[r], rows.lower[r], rows.weight[r], count);
}

void PickColumns(uint8_t* out, ptrdiff_t stride, const uint16_t* blended, ptrdiff_t step,
                 const NearTaps& taps, int32_t groups) {
    for (int32_t g = 0; g < groups; g += kGroups)
        PickStep(out + g * NearTaps::kGroup, stride, blended, step, taps.pairs + g / 2);
}
