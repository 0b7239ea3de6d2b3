#pragma once

// The lane operations of one back end, wrapped so that bytes go in and come out. The order of lanes
// and the form of channels are a back end's own, so an operation that makes them is called together
// with one that stores them.

#include <cstdint>

namespace vec_ops {

enum Layout { k565, k5551, k888, k8888, kSpread };

/// luma gain + offset + chroma plus - chroma minus
struct Terms {
    int gain, offset, plus, minus;
};

/// Of the channels from the top bits down, or of the first three bytes.
struct Factors {
    int y[3], cb[3], cr[3];
};

/// Where a step goes: luma of an upper and of a lower row, chroma.
struct Planes {
    uint8_t *upper, *lower, *cb, *cr;
};

struct Ops {
    int step;      ///< pixels; a chroma row has half as many samples
    int quadStep;  ///< of 32 bits

    /// LoadLuma, LoadChroma, Offset, AddTerm, MinusTimes, Double, Channel: the levels of the terms,
    /// four bytes each (the last 0), and as the three fields of 16-bit pixels
    void (*levels)(const Terms& terms, const uint8_t* luma, const uint8_t* chroma, uint8_t* levels,
                   uint8_t* words);
    /// LoadPairs: one half of each pair as a level, four times, for two pixels
    void (*pairs)(const uint8_t* pairs, bool second, uint8_t* out);
    /// The stores, with levels a, b, c
    void (*store)(Layout layout, const uint8_t* a, const uint8_t* b, const uint8_t* c, int extra,
                  uint8_t* out);
    /// LumaWords, ChromaWords and what makes planes with them: LoadPixels, LumaSums, EvenSums,
    /// StoreLuma, StoreChroma, or a StepsToPlanes of the back end's own
    void (*planesOfWords)(const uint8_t* words, const Factors& factors, int offset,
                          const Planes& out);
    /// The same with LumaQuads, ChromaQuads
    void (*planesOfQuads)(const uint8_t* quads, const Factors& factors, int offset,
                          const Planes& out);
    /// BlendQuad, AverageQuad
    void (*blend)(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int w);
    void (*average)(const uint32_t* upper, const uint32_t* lower, uint32_t* out);
};

extern const Ops kScalar, kNeon, kSse41, kAvx2, kAvx512, kAvx512Portable;

}  // namespace vec_ops
