// Look-ups in the table of the vector kernels: 30 groups of four, a member a colour matrix. Groups
// of limited and full range lie side by side.

#include "kernels/vec_table.h"

#include "vidshow/imageproc.h"

namespace {

// Where the families of groups begin.
constexpr uint32_t kRgbToYuv = 0;
constexpr uint32_t kLineConverters = 24;
constexpr uint32_t kToRgb565 = 40;
constexpr uint32_t kToRgb888 = 56;
constexpr uint32_t kToArgb32 = 72;
constexpr uint32_t kToRgb5551 = 88;
constexpr uint32_t kNv12ToRgb565 = 104;
constexpr uint32_t kEntries = 120;

void* Entry(uint32_t family, uint32_t kind, uint32_t m, uint32_t r) {
    const uint32_t index = family + (kind * 2 + r) * 4 + m;
    return index < kEntries ? vidshow::kVectorKernels[index] : nullptr;
}

}  // namespace

extern "C" void* GetPFN_rgb2yuv(uint32_t kind, uint32_t m, uint32_t r) {
    return Entry(kRgbToYuv, kind, m, r);
}

extern "C" void* GetPFN_convert(uint32_t kind, uint32_t m, uint32_t r) {
    return Entry(kLineConverters, kind, m, r);
}

extern "C" void* GetPFN_yuv2rgb(uint32_t format, uint32_t m, uint32_t r) {
    switch (format) {
        case QZ_IMAGEPROC_FMT_RGB565:
            return Entry(kToRgb565, 0, m, r);
        case QZ_IMAGEPROC_FMT_RGB888:
            return Entry(kToRgb888, 0, m, r);
        case QZ_IMAGEPROC_FMT_ARGB32:
            return Entry(kToArgb32, 0, m, r);
        case QZ_IMAGEPROC_FMT_RGB5551:
            return Entry(kToRgb5551, 0, m, r);
        default:
            return nullptr;
    }
}

extern "C" void* GetPFN_nv122rgb(uint32_t format, uint32_t m, uint32_t r) {
    return format == QZ_IMAGEPROC_FMT_RGB565 ? Entry(kNv12ToRgb565, 0, m, r) : nullptr;
}
