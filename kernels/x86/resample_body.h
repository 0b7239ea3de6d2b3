// The loops of resampling by rows, written once. No #pragma once, no includes: every back end
// includes this file inside its own unnamed namespace, behind its operations.
//
// Vocabulary that a back end defines:
//
//   V                        kWords words of 16 bits
//   LoadWide(p)              kWords bytes as words
//   StoreWords(p, v), SetWords(x), Add(a, b), Mul(a, b), ShiftRight<n>(v)
//   kGroups                  groups of four columns a step
//   PickStep(out, blended, taps, g)  kGroups groups from group g on

V Mean(V a, V b, V above, V below) {
    return ShiftRight<2>(Add(Add(Mul(a, above), Mul(b, below)), SetWords(2)));
}

void BlendRows(uint16_t* out, const uint8_t* a, const uint8_t* b, uint32_t weight, size_t count) {
    const V above = SetWords(static_cast<int>(32 - weight));
    const V below = SetWords(static_cast<int>(weight));
    if (count < kWords) {
        uint8_t copy[2][kWords] = {};
        memcpy(copy[0], a, count);
        memcpy(copy[1], b, count);
        StoreWords(out, Mean(LoadWide(copy[0]), LoadWide(copy[1]), above, below));
        return;
    }
    // The last step ends with the rows, over what the one before it has done already.
    const size_t last = count - kWords;
    for (size_t i = 0; i < last; i += kWords)
        StoreWords(out + i, Mean(LoadWide(a + i), LoadWide(b + i), above, below));
    StoreWords(out + last, Mean(LoadWide(a + last), LoadWide(b + last), above, below));
}

void PickColumns(uint8_t* out, const uint16_t* blended, const NearTaps& taps, int32_t groups) {
    for (int32_t g = 0; g < groups; g += kGroups)
        PickStep(out + g * NearTaps::kGroup, blended, taps, g);
}
