// Brightness, contrast and saturation. Kernels with RGB output see them through the translation
// tables, kernels from 4:2:0 to 4:2:0 through two tables of 256 samples that are made here.

#include <cstdlib>

#include "imageproc/fixed_point.h"
#include "imageproc/processor.h"

namespace vidshow {
namespace {

constexpr size_t kTableBytes = 256;

// A setting above neutral acts as its distance's square, so that the upper half of a slider reaches
// much farther than the lower one.
int32_t Gain(int32_t setting, int32_t slope) {
    const int32_t s = Clamp(setting, 0, 255);
    if (s <= kNeutral) return s;
    return (((s - kNeutral) * (s - kNeutral) * slope) >> 7) + kNeutral;
}

void FillLuma(uint8_t* table, int32_t brightness, int32_t contrast) {
    const int32_t offset = 2 * (Clamp(brightness, 0, 255) - kNeutral);
    const int32_t gain = Gain(contrast, 3);
    for (int32_t i = 0; i < 256; ++i) {
        table[i] = static_cast<uint8_t>(Clamp(offset + ((i * gain) >> 7), 0, 255));
    }
}

void FillChroma(uint8_t* table, int32_t saturation) {
    const double factor = Gain(saturation, 7) / 128.0;
    for (int32_t i = 0; i < 256; ++i) {
        table[i] = static_cast<uint8_t>(TruncateClamped((i - 128) * factor + 128, 0, 255));
    }
}

bool AllocateTables(QZ_IMAGEPROC_PARAMSET& processor) {
    if (processor.pAdjustBlock) return true;
    processor.pAdjustBlock = static_cast<uint8_t*>(std::malloc(2 * kTableBytes));
    if (!processor.pAdjustBlock) return false;
    processor.pAdjustLumaTable = processor.pAdjustBlock;
    processor.pAdjustChromaTable = processor.pAdjustBlock + kTableBytes;
    return true;
}

void Store(QZ_IMAGEPROC_PARAMSET& processor, const int32_t values[3], bool active) {
    processor.i32Brightness = values[0];
    processor.i32Contrast = values[1];
    processor.i32Saturation = values[2];
    processor.u32AdjustActive = active ? 1 : 0;
    RebuildTransTables(processor, values[0], values[1], values[2]);
}

}  // namespace

void FreeAdjustTables(QZ_IMAGEPROC_PARAMSET& processor) {
    std::free(processor.pAdjustBlock);
    processor.pAdjustBlock = nullptr;
    processor.pAdjustLumaTable = nullptr;
    processor.pAdjustChromaTable = nullptr;
}

}  // namespace vidshow

extern "C" int32_t SetImgColorAdjust(QZ_IMAGEPROC_PARAMSET* processor, const int32_t values[3]) {
    using namespace vidshow;
    const auto all = [values](int32_t a, int32_t b, int32_t c) {
        return values[0] == a && values[1] == b && values[2] == c;
    };
    if (all(processor->i32Brightness, processor->i32Contrast, processor->i32Saturation)) return 0;
    if (all(kNeutral, kNeutral, kNeutral)) {
        Store(*processor, values, false);
        return 0;
    }
    if (!AllocateTables(*processor)) return -1;
    Store(*processor, values, true);
    FillLuma(processor->pAdjustLumaTable, values[0], values[1]);
    FillChroma(processor->pAdjustChromaTable, values[2]);
    return 0;
}

extern "C" int32_t GetImgColorAdjust(QZ_IMAGEPROC_PARAMSET* processor, uint32_t values[3]) {
    values[0] = static_cast<uint32_t>(processor->i32Brightness);
    values[1] = static_cast<uint32_t>(processor->i32Contrast);
    values[2] = static_cast<uint32_t>(processor->i32Saturation);
    return _CheckCapability_depend(static_cast<int32_t>(processor->u32CscType),
                                   processor->u32ResizeCase, processor->u32RotationType);
}

extern "C" int32_t _CheckCapability_depend(int32_t conversion, uint32_t /*resizeCase*/,
                                           uint32_t rotation) {
    constexpr int32_t kAvailable = 0;
    constexpr int32_t kUnavailable = -3;
    const uint32_t code = static_cast<uint32_t>(conversion);
    if (vidshow::InputFormat(code) > QZ_IMAGEPROC_FMT_YCBCR444) return kUnavailable;
    switch (code) {
        case QZ_IMAGEPROC_CSC_YCBCR420_TO_YUY2:
        case QZ_IMAGEPROC_CSC_YCBCR420_TO_UYVY:
        case QZ_IMAGEPROC_CSC_YCBCR420_TO_NV12:
            return kUnavailable;
        case QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB565:
            return rotation == QZ_IMAGEPROC_ROTATE_NONE ? kUnavailable : kAvailable;
        default:
            return kAvailable;
    }
}
