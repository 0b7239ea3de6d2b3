#pragma once

#include "vidshow/imageproc.h"

namespace vidshow {

/// Neutral brightness, contrast and saturation.
constexpr int32_t kNeutral = 128;

/// How input and output size compare. Creation tells the first four apart; the fixed ratios replace
/// them where a kernel of their own serves.
enum ResizeCase : uint32_t {
    kCaseEqual = 0,
    kCaseMixed = 1,
    kCaseLarger = 2,
    kCaseSmaller = 3,
    kCase2x2 = 4,       ///< twice as wide, twice as high
    kCase5Half2 = 5,    ///< 2.5 times as wide, twice as high
    kCase3Half = 6,     ///< 1.5 times as wide, whatever the heights
    kCase320To480 = 7,  ///< 320 x 240 to 480 x 272
};

/// Input and output format of a conversion code.
constexpr uint32_t InputFormat(uint32_t conversion) {
    return conversion >> 8;
}
constexpr uint32_t OutputFormat(uint32_t conversion) {
    return conversion & 0xFF;
}

/// Stores a colour key, translated where the output format wants it so.
void StoreColorKey(QZ_IMAGEPROC_PARAMSET& processor, uint32_t key);

/// Refills the translation tables from the processor's matrix and range.
void RebuildTransTables(QZ_IMAGEPROC_PARAMSET& processor, int32_t brightness, int32_t contrast,
                        int32_t saturation);

/// Frees the adjustment block; the tables in it are gone.
void FreeAdjustTables(QZ_IMAGEPROC_PARAMSET& processor);

}  // namespace vidshow
