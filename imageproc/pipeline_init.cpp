// What a conversion needs once: its vector kernels, the resize case refined to the fixed ratios
// that have kernels of their own, line buffers and the rotation walker.

#include <algorithm>
#include <cstdio>
#include <cstdlib>

#include "imageproc/conversions.h"
#include "imageproc/memory.h"
#include "imageproc/processor.h"
#include "vidshow/kernels.h"

namespace vidshow {
namespace {

int32_t Refuse(const char* message, int32_t result) {
    std::puts(message);
    return result;
}

// Sizes are signed; products of them are formed without overflow.
struct Sizes {
    explicit Sizes(const QZ_IMAGEPROC_PARAMSET& p)
        : inWidth(static_cast<int32_t>(p.u32InWidth)),
          inHeight(static_cast<int32_t>(p.u32InHeight)),
          outWidth(static_cast<int32_t>(p.u32OutWidth)),
          outHeight(static_cast<int32_t>(p.u32OutHeight)) {}
    int64_t inWidth;
    int64_t inHeight;
    int64_t outWidth;
    int64_t outHeight;
};

uint32_t RefineCase(const Sizes& s, uint32_t given) {
    const bool twiceAsHigh = s.outHeight == 2 * s.inHeight;
    if (s.outWidth == 2 * s.inWidth && twiceAsHigh) return kCase2x2;
    if (2 * s.outWidth == 5 * s.inWidth && twiceAsHigh) return kCase5Half2;
    if (s.inWidth == 320 && s.inHeight == 240 && s.outWidth == 480 && s.outHeight == 272) {
        return kCase320To480;
    }
    // The heights are not compared: clients rely on it.
    if (2 * s.outWidth == 3 * s.inWidth) return kCase3Half;
    return given;
}

// Four lines with room for the wider of source and destination and four entries more, which the
// horizontal kernels may read. A near-linear enlargement doubles its lines.
bool AllocateLines(QZ_IMAGEPROC_PARAMSET& p, const Sizes& s) {
    constexpr size_t kLines = 4;
    constexpr size_t kAlignment = 4;
    const bool doubled =
        p.u32ResizeAlgorithm == QZ_IMAGEPROC_RESIZE_NEARLINEAR && p.u32ResizeCase == kCaseLarger;
    const uint64_t entries = static_cast<uint64_t>(std::max(s.inWidth, s.outWidth) + 4);
    const uint64_t lineBytes = entries * sizeof(uint32_t) * (doubled ? 2 : 1);
    p.pLineBlock = AllocateZeroed(kLines, lineBytes, kAlignment);
    if (!p.pLineBlock) return false;
    uint8_t* const start = AlignUp(p.pLineBlock, kAlignment);
    for (size_t i = 0; i < kLines; ++i) {
        p.pLines[i] = ItemsAt<uint32_t>(start + i * static_cast<size_t>(lineBytes));
    }
    return true;
}

static_assert(sizeof(void*) != 4 || sizeof(QZ_ROTATION_WALKER) == 52, "thirteen words");

int32_t AllocateWalker(QZ_IMAGEPROC_PARAMSET& p) {
    p.u32WalkerSize = sizeof(QZ_ROTATION_WALKER);
    p.pWalker = std::calloc(1, sizeof(QZ_ROTATION_WALKER));
    return p.pWalker ? kDone : Refuse("fail to init rotation param! ", kNoMemory);
}

}  // namespace
}  // namespace vidshow

extern "C" int32_t _ImgPrcInit_depend(QZ_IMAGEPROC_PARAMSET* processor) {
    using namespace vidshow;
    QZ_IMAGEPROC_PARAMSET& p = *processor;
    const Conversion* const conversion = FindConversion(p.u32CscType);
    if (!conversion) return Refuse("Unsupport image format conversion! ", kUnsupported);
    if (p.u32CscType == QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551 &&
        (p.u32RotationType != QZ_IMAGEPROC_ROTATE_NONE || p.u32ResizeCase != kCaseEqual)) {
        return Refuse("Unsupport conversion!", kUnsupported);
    }
    p.pfnMain = conversion->mainKernel(p);
    p.pfnLine = conversion->lineKernel(p);
    if (p.u32RotationType > QZ_IMAGEPROC_ROTATE_MIRROR_V) {
        return Refuse("Unsupport image rotation type! ", kUnsupported);
    }
    if (p.u32ResizeCase == kCaseEqual) return AllocateWalker(p);

    const Sizes sizes(p);
    if (p.u32RotationType == QZ_IMAGEPROC_ROTATE_NONE &&
        p.u32ResizeAlgorithm == QZ_IMAGEPROC_RESIZE_LINEAR) {
        p.u32ResizeCase = RefineCase(sizes, p.u32ResizeCase);
    }
    if (!AllocateLines(p, sizes)) return Refuse("fail to alloc line buffer!", kNoMemory);
    return AllocateWalker(p);
}
