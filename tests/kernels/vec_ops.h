#pragma once

// The lane operations of one back end, wrapped so that bytes go in and come out. The order of lanes
// and the form of channels are a back end's own, so an operation that makes them is called together
// with one that stores them.

#include <cstdint>

namespace vec_ops {

enum Layout { k565, k5551, k888, k8888, kSpread };
enum Field { kLow8, kMid8, kHigh8 };

struct Ops {
    int step;  ///< pixels; a chroma row has half as many samples

    /// LoadLuma, LoadChroma, Offset, AddTerm, MinusTimes, Double, Channel: the levels of
    /// luma gain + offset + chroma plus - chroma minus, four times each
    void (*levels)(const uint8_t* luma, int gain, const uint8_t* chroma, int offset, int plus,
                   int minus, uint8_t* out);
    /// LoadPairs: one half of each pair as a level, four times, for two pixels
    void (*pairs)(const uint8_t* pairs, bool second, uint8_t* out);
    /// The stores, with levels a, b, c
    void (*store)(Layout layout, const uint8_t* a, const uint8_t* b, const uint8_t* c, int extra,
                  uint8_t* out);
    /// LoadWords, Times, PlusTimes, MinusTimes, StoreBytes: of field x: start - x minus + x plus,
    /// where start is 0 or x times
    void (*field)(const uint8_t* words, Field field, int times, int plus, int minus, uint8_t* out);
    /// LoadWords, StoreBytes
    void (*narrow)(const uint8_t* words, int offset, uint8_t* out);
    /// LoadWords, EvenWords, StoreHalf
    void (*narrowEven)(const uint8_t* words, int offset, uint8_t* out);
    /// LoadQuads, LumaWeights, LumaSums, StoreBytes
    void (*luma)(const uint8_t* quads, int a, int b, int c, uint8_t* out);
    /// LoadQuads, ChromaWeights, EvenSums, StoreHalf
    void (*chroma)(const uint8_t* quads, int a, int b, int c, uint8_t* out);
    /// BlendQuad, AverageQuad
    void (*blend)(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int w);
    void (*average)(const uint32_t* upper, const uint32_t* lower, uint32_t* out);
};

extern const Ops kScalar, kNeon, kSse41, kAvx2;

}  // namespace vec_ops
