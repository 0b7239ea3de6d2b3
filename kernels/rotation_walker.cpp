// Where the pixels of a turned picture go. A turn is described by two unit vectors: how far one
// source pixel across, and one source row down, move in the destination. A negative component means
// that the walk starts at the far edge in that direction; steps and start addresses follow.

#include "vidshow/kernels.h"

namespace {

struct Turn {
    int8_t acrossColumns, acrossRows;
    int8_t downColumns, downRows;
};

// clang-format off
constexpr Turn kTurns[] = {
    { 1,  0,   0,  1},  // none
    { 0, -1,   1,  0},  // 90 degrees anticlockwise
    { 0,  1,  -1,  0},  // 90 degrees clockwise
    {-1,  0,   0, -1},  // 180 degrees
    {-1,  0,   0,  1},  // left and right exchanged
    { 1,  0,   0, -1},  // top and bottom exchanged
};
// clang-format on
constexpr uint32_t kTurnCount = sizeof kTurns / sizeof kTurns[0];
static_assert(kTurnCount == QZ_IMAGEPROC_ROTATE_MIRROR_V + 1, "one turn a rotation type");

constexpr int32_t kPlanar = 0;
constexpr int32_t kNoLayout = -1;

/// Bytes a pixel of an output format, or one of the two values above.
int32_t PixelSize(uint32_t format) {
    switch (format) {
        case QZ_IMAGEPROC_FMT_YCBCR420:
            return kPlanar;
        case QZ_IMAGEPROC_FMT_RGB565:
        case QZ_IMAGEPROC_FMT_YUY2:
        case QZ_IMAGEPROC_FMT_UYVY:
        case QZ_IMAGEPROC_FMT_NV12:
        case QZ_IMAGEPROC_FMT_RGB5551:
            return 2;
        case QZ_IMAGEPROC_FMT_RGB888:
            return 3;
        case QZ_IMAGEPROC_FMT_ARGB32:
            return 4;
        default:
            return kNoLayout;
    }
}

/// A walk over one plane, one source pixel or row a step.
struct Walk {
    intptr_t across, down;  // bytes
    intptr_t start;         // address
};

Walk WalkPlane(uint32_t type, uint8_t* plane, intptr_t stride, intptr_t pixelSize, intptr_t width,
               intptr_t height) {
    const Turn turn = kTurns[type];
    const bool quarter = turn.acrossColumns == 0;
    const intptr_t lastColumn = (quarter ? height : width) - 1;
    const intptr_t lastRow = (quarter ? width : height) - 1;
    Walk walk;
    walk.across = turn.acrossColumns * pixelSize + turn.acrossRows * stride;
    walk.down = turn.downColumns * pixelSize + turn.downRows * stride;
    walk.start = reinterpret_cast<intptr_t>(plane);
    if (turn.acrossColumns < 0 || turn.downColumns < 0) walk.start += pixelSize * lastColumn;
    if (turn.acrossRows < 0 || turn.downRows < 0) walk.start += stride * lastRow;
    return walk;
}

void FillPacked(QZ_ROTATION_WALKER& walker, uint32_t type, uint8_t* dst, intptr_t stride,
                intptr_t pixelSize, intptr_t width, intptr_t height) {
    Walk walk = WalkPlane(type, dst, stride, pixelSize, width, height);
    if (type == QZ_IMAGEPROC_ROTATE_180) {
        // Kept because clients rely on it: the picture ends flush with each padded row.
        walk.start = reinterpret_cast<intptr_t>(dst) + stride * height - pixelSize;
    }
    intptr_t* word = walker.word;
    word[0] = 2 * walk.across;
    word[1] = 2 * walk.down;
    word[2] = walk.start;
    word[3] = walk.start + walk.across;
    word[4] = walk.start + walk.down;
    word[5] = walk.start + walk.across + walk.down;
}

void FillPlanar(QZ_ROTATION_WALKER& walker, uint32_t type, uint8_t* const dst[3],
                const int32_t stride[3], intptr_t width, intptr_t height) {
    constexpr int kSteps[3] = {0, 6, 8};
    constexpr int kStart = 10;
    for (int i = 0; i < 3; ++i) {
        const intptr_t shrink = i == 0 ? 1 : 2;
        const Walk walk = WalkPlane(type, dst[i], stride[i], 1, width / shrink, height / shrink);
        walker.word[kSteps[i]] = walk.across;
        walker.word[kSteps[i] + 1] = walk.down;
        walker.word[kStart + i] = walk.start;
    }
}

}  // namespace

extern "C" int32_t _QZ_RotationInit(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const dst[3],
                                    int32_t outWidth, int32_t outHeight,
                                    const int32_t dstStride[3]) {
    if (p == nullptr || p->pWalker == nullptr) return -1;
    const int32_t pixelSize = PixelSize(p->u32CscType & 0xFF);
    const uint32_t type = p->u32RotationType;
    if (pixelSize == kNoLayout || type >= kTurnCount) return -3;
    QZ_ROTATION_WALKER& walker = *static_cast<QZ_ROTATION_WALKER*>(p->pWalker);
    if (pixelSize == kPlanar) {
        FillPlanar(walker, type, dst, dstStride, outWidth, outHeight);
    } else {
        FillPacked(walker, type, dst[0], dstStride[0], pixelSize, outWidth, outHeight);
    }
    return 0;
}
