// Every conversion that exists, as tables: which kernel runs is decided here and nowhere else. The
// first row whose conditions hold serves the frame.

#include "imageproc/conversions.h"

#include "imageproc/plane_turn.h"
#include "imageproc/processor.h"
#include "imageproc/rgb_to_planar.h"
#include "vidshow/kernels.h"

namespace vidshow {
namespace {

constexpr uint32_t Bit(uint32_t value) {
    return value < 32 ? 1u << value : 0;
}
template <typename... Values>
constexpr uint32_t Only(Values... values) {
    return (Bit(values) | ...);
}

// Rotations
constexpr uint32_t kUpright = Only(QZ_IMAGEPROC_ROTATE_NONE);
constexpr uint32_t kTurned = ~kUpright;
constexpr uint32_t k90AC = Only(QZ_IMAGEPROC_ROTATE_90AC);
constexpr uint32_t k90C = Only(QZ_IMAGEPROC_ROTATE_90C);
constexpr uint32_t k180 = Only(QZ_IMAGEPROC_ROTATE_180);
constexpr uint32_t kMirrored = Only(QZ_IMAGEPROC_ROTATE_MIRROR_H, QZ_IMAGEPROC_ROTATE_MIRROR_V);

// Resize cases
constexpr uint32_t kSameSize = Only(kCaseEqual);
constexpr uint32_t kResized = ~kSameSize;
constexpr uint32_t kLarger = Only(kCaseLarger);
constexpr uint32_t kUp = Only(kCaseLarger, kCase2x2);
constexpr uint32_t k5Half2 = Only(kCase5Half2);
constexpr uint32_t k3Half = Only(kCase3Half);
constexpr uint32_t k320To480 = Only(kCase320To480);
constexpr uint32_t kFree = Only(kCaseMixed, kCaseSmaller);

// Resize algorithms
constexpr uint32_t kNearest = Only(QZ_IMAGEPROC_RESIZE_NEAREST);
constexpr uint32_t kNearLinear = Only(QZ_IMAGEPROC_RESIZE_NEARLINEAR);

// Colour adjustment
constexpr uint32_t kPlain = Only(0u);
constexpr uint32_t kAdjusted = Only(1u);

// What some kernels take besides, behind everything else.
using P = QZ_IMAGEPROC_PARAMSET;
constexpr auto kAlpha = &P::u32Alpha;
constexpr auto kKey = &P::u32ColorKey;

// How a kernel takes its arguments. The names of the rows below follow the kernels'.

template <auto kernel, auto... tail>
int32_t ToPacked(const FrameJob& f) {
    return kernel(f.p, f.src, f.ss, f.w, f.h, f.dst[0], f.ds[0], (f.p->*tail)...);
}

template <auto kernel, auto... tail>
int32_t Resize(const FrameJob& f) {
    return kernel(f.p, f.src, f.ss, f.w, f.h, f.dst[0], f.ds[0], f.dw, f.dh, (f.p->*tail)...);
}

template <auto kernel, auto... tail>
int32_t Turn(const FrameJob& f) {
    return kernel(f.p, f.src, f.ss, f.w, f.h, (f.p->*tail)...);
}

template <auto kernel, auto... tail>
int32_t ResizeTurned(const FrameJob& f) {
    return kernel(f.p, f.src, f.ss, f.w, f.h, f.dw, f.dh, (f.p->*tail)...);
}

template <auto kernel, auto... tail>
int32_t Enlarge(const FrameJob& f) {
    return kernel(f.p, f.p->pLines, f.src, f.ss, f.w, f.h, f.dst[0], f.ds[0], f.dw, f.dh,
                  (f.p->*tail)...);
}

// The walker's steps are for two source pixels or rows; this kernel wants those for one.
template <auto kernel>
int32_t EnlargeTurned(const FrameJob& f) {
    const intptr_t* const walker = static_cast<const QZ_ROTATION_WALKER*>(f.p->pWalker)->word;
    const int32_t down = static_cast<int32_t>(walker[1]) / 2;
    const int32_t across = static_cast<int32_t>(walker[0]) / 2;
    return kernel(f.p, f.p->pLines, f.src, f.ss, f.w, f.h, reinterpret_cast<void*>(walker[2]), down,
                  across, f.dw, f.dh);
}

template <auto kernel, auto... tail>
int32_t Enlarge5Half2(const FrameJob& f) {
    return kernel(f.p, f.p->pLines, f.src, f.ss, f.w, f.dst[0], f.ds[0], f.dh, (f.p->*tail)...);
}

template <auto kernel, auto... tail>
int32_t Enlarge3Half(const FrameJob& f) {
    return kernel(f.p, f.p->pLines, f.src, f.ss, f.w, f.h, f.dst[0], f.ds[0], f.dh,
                  (f.p->*tail)...);
}

template <auto kernel>
int32_t Enlarge320To480(const FrameJob& f) {
    return kernel(f.p, f.p->pLines[0], f.p->pLines[1], f.src, f.ss, f.dst[0], f.ds[0]);
}

// The main vector kernel with one packed output.
template <auto... tail>
int32_t Vector(const FrameJob& f) {
    using Kernel = int32_t (*)(uint8_t* const src[3], const uint32_t ss[3], void* dst, uint32_t d,
                               int32_t w, int32_t h, decltype(+(f.p->*tail))...);
    return reinterpret_cast<Kernel>(f.p->pfnMain)(f.src, f.ss, f.dst[0], f.ds[0], f.w, f.h,
                                                  (f.p->*tail)...);
}

template <auto kernel>
int32_t Copy(const FrameJob& f) {
    return kernel(f.src, f.ss, f.w, f.h, f.dst, f.ds);
}

template <auto kernel>
int32_t Adjust(const FrameJob& f) {
    return kernel(f.p, f.src, f.ss, f.w, f.h, f.dst, f.ds);
}

template <auto kernel>
int32_t ResizePlanes(const FrameJob& f) {
    return kernel(f.src, f.ss, f.w, f.h, f.dst, f.ds, f.dw, f.dh);
}

template <auto kernel>
int32_t ResizePlanesAdjusted(const FrameJob& f) {
    return kernel(f.p, f.src, f.ss, f.w, f.h, f.dst, f.ds, f.dw, f.dh);
}

const QZ_ROTATION_WALKER* Walker(const FrameJob& f) {
    return static_cast<const QZ_ROTATION_WALKER*>(f.p->pWalker);
}

template <auto kernel>
int32_t WalkPlanes(const FrameJob& f) {
    return kernel(Walker(f), f.src, f.ss, f.w, f.h);
}

template <auto kernel>
int32_t ResizeWalkPlanes(const FrameJob& f) {
    return kernel(Walker(f), f.src, f.ss, f.w, f.h, f.dw, f.dh);
}

template <const PlaneTurn& turn>
int32_t TurnPlanes(const FrameJob& f) {
    TurnPlane(turn, f.src[0], f.ss[0], f.dst[0], f.ds[0], f.w, f.h);
    TurnPlane(turn, f.src[1], f.ss[1], f.dst[1], f.ds[1], f.w / 2, f.h / 2);
    TurnPlane(turn, f.src[2], f.ss[2], f.dst[2], f.ds[2], f.w / 2, f.h / 2);
    return kDone;
}

template <const PlaneTurn& turn>
int32_t TurnPacked(const FrameJob& f) {
    TurnPlane(turn, f.src[0], f.ss[0], f.dst[0], f.ds[0], f.w, f.h);
    return kDone;
}

template <auto kernel>
int32_t To422(const FrameJob& f) {
    return kernel(f.dst[0], f.ds[0], f.src, f.ss, f.w, f.h);
}

// A packed source; its stride is given in units of `bytes`.
template <auto kernel, uint32_t bytes>
int32_t ResizeWalkPacked(const FrameJob& f) {
    const int32_t stride = static_cast<int32_t>(f.ss[0] / bytes);
    return kernel(Walker(f), f.src[0], stride, f.w, f.h, f.dw, f.dh);
}

// Both strides in pixels.
template <auto kernel>
int32_t Expand565(const FrameJob& f) {
    return kernel(f.src[0], static_cast<int32_t>(f.ss[0] / 2), f.dst[0],
                  static_cast<int32_t>(f.ds[0] / 4), f.w, f.h, f.p->u32Alpha);
}

template <const PlaneTurn& turn>
int32_t FromRgbTurned(const FrameJob& f) {
    return ConvertRgbToPlanarTurned(f, turn);
}

// How a row runs, and what that is called.
#define RUN(...) __VA_ARGS__, #__VA_ARGS__

constexpr Row kYCbCr420ToRgb565[] = {
    {kTurned, kSameSize, kAny, kAny, RUN(Turn<_QZYCbCr420ToRGB565Rot>)},
    {kTurned, kLarger, kAny, kAny, RUN(EnlargeTurned<_QZYCbCr420ToRGB565RszUpRot>)},
    {kTurned, kResized, kAny, kAny, RUN(ResizeTurned<_QZYCbCr420ToRGB565RszRot>)},
    {kUpright, kUp, kNearest, kAny, RUN(Enlarge<_QZYCbCr420ToRGB565RszUp_Nearest>)},
    {kUpright, kUp, kNearLinear, kAny, RUN(Enlarge<_QZYCbCr420ToRGB565RszUp_NearLinear>)},
    {kUpright, kUp, kAny, kAny, RUN(Enlarge<_QZYCbCr420ToRGB565RszUp>)},
    {kUpright, k5Half2, kAny, kAny, RUN(Enlarge5Half2<_QZYCbCr420ToRGB565Case1>)},
    {kUpright, k3Half, kAny, kAny, RUN(Enlarge3Half<_QZYCbCr420ToRGB565Case2>)},
    {kUpright, k320To480, kAny, kAny, RUN(Enlarge320To480<_QZYCbCr420ToRGB565Case3>)},
    {kUpright, kFree, kAny, kAny, RUN(Resize<_QZYCbCr420ToRGB565Rsz>)},
    {kUpright, kSameSize, kAny, kAdjusted, RUN(ToPacked<_QZYCbCr420ToRGB565>)},
    {kUpright, kSameSize, kAny, kPlain, RUN(Vector<>)},
};

// There is no kernel of its own for 320 x 240 to 480 x 272, and no choice of algorithm.
constexpr Row kYCbCr420ToArgb32[] = {
    {kTurned, kResized, kAny, kAny, RUN(ResizeTurned<_QZYCbCr420ToARGB32RszRot, kAlpha>)},
    {kTurned, kSameSize, kAny, kAny, RUN(Turn<_QZYCbCr420ToARGB32Rot, kAlpha>)},
    {kUpright, kUp | k320To480, kAny, kAny, RUN(Enlarge<_QZYCbCr420ToARGB32RszUp, kAlpha>)},
    {kUpright, k5Half2, kAny, kAny, RUN(Enlarge5Half2<_QZYCbCr420ToARGB32Case1, kAlpha>)},
    {kUpright, k3Half, kAny, kAny, RUN(Enlarge3Half<_QZYCbCr420ToARGB32Case2, kAlpha>)},
    {kUpright, kFree, kAny, kAny, RUN(Resize<_QZYCbCr420ToARGB32Rsz, kAlpha>)},
    {kUpright, kSameSize, kAny, kAdjusted, RUN(ToPacked<_QZYCbCr420ToARGB32, kAlpha>)},
    {kUpright, kSameSize, kAny, kPlain, RUN(Vector<kAlpha>)},
};

// Neither turned nor resized: clients rely on it.
constexpr Row kYCbCr420ToRgb888[] = {
    {kAny, kAny, kAny, kAdjusted, RUN(ToPacked<_QZYCbCr420ToRGB888>)},
    {kAny, kAny, kAny, kPlain, RUN(Vector<>)},
};

// Creation lets nothing but upright pictures of equal size pass.
constexpr Row kYCbCr420ToRgb5551[] = {
    {kAny, kAny, kAny, kAdjusted, RUN(ToPacked<_QZYCbCr420ToRGB555, kKey>)},
    {kAny, kAny, kAny, kPlain, RUN(Vector<kKey>)},
};

constexpr Row kYCbCr420ToYCbCr420[] = {
    {kUpright, kResized, kAny, kAdjusted, RUN(ResizePlanesAdjusted<_QZYCbCr420RszAdjust>)},
    {kUpright, kSameSize, kAny, kAdjusted, RUN(Adjust<_QZYCbCrAdjust>)},
    {kTurned, kResized, kAny, kAdjusted, RUN(ResizeTurned<_QZYCbCr420RszRotAdjust>)},
    {kTurned, kSameSize, kAny, kAdjusted, RUN(Turn<_QZYCbCr420RotAdjust>)},
    {kUpright, kResized, kAny, kPlain, RUN(ResizePlanes<_QZYCbCr420Rsz>)},
    {kUpright, kSameSize, kAny, kPlain, RUN(Copy<_QZYCbCr420Copy>)},
    {kTurned, kResized, kAny, kPlain, RUN(ResizeWalkPlanes<_QZYCbCr420RszRot>)},
    {k90C, kSameSize, kAny, kPlain, RUN(TurnPlanes<kTurn90C>)},
    {k90AC, kSameSize, kAny, kPlain, RUN(TurnPlanes<kTurn90AC>)},
    {k180, kSameSize, kAny, kPlain, RUN(TurnPlanes<kTurn180>)},
    {kMirrored, kSameSize, kAny, kPlain, RUN(WalkPlanes<_QZYCbCr420Rot>)},
};

constexpr Row kYCbCr420ToYuy2[] = {{kAny, kAny, kAny, kAny, RUN(To422<_QZYCbCr420ToYUY2>)}};
constexpr Row kYCbCr420ToUyvy[] = {{kAny, kAny, kAny, kAny, RUN(To422<_QZYCbCr420ToUYVY>)}};
constexpr Row kYCbCr420ToNv12[] = {{kAny, kAny, kAny, kAny, RUN(Copy<_QZYCbCr420ToNV12>)}};
constexpr Row kNv12ToYCbCr420[] = {{kAny, kAny, kAny, kAny, RUN(Copy<_QZNV12ToYCbCr420>)}};
constexpr Row kNv12ToRgb565[] = {{kAny, kAny, kAny, kAny, RUN(Vector<>)}};

constexpr Row kYCbCr422ToRgb565[] = {
    {kAny, kResized, kAny, kAny, RUN(Resize<_QZYCbCr422ToRGB565Rsz>)},
    {kAny, kSameSize, kAny, kAny, RUN(ToPacked<_QZYCbCr422ToRGB565>)},
};
constexpr Row kYCbCr444ToRgb565[] = {
    {kAny, kAny, kAny, kAny, RUN(ResizeTurned<_QZYCbCr444ToRGB565RszRot>)},
};
constexpr Row kYCbCr444ToRgb888[] = {
    {kAny, kAny, kAny, kAny, RUN(ResizeTurned<_QZYCbCr444ToRGB888RszRot>)},
};
constexpr Row kYCbCr444ToArgb32[] = {
    {kAny, kAny, kAny, kAny, RUN(ResizeTurned<_QZYCbCr444ToARGB32RszRot, kAlpha>)},
};

constexpr Row kRgb565ToArgb32[] = {{kAny, kAny, kAny, kAny, RUN(Expand565<_QZRGB565ToARGB32>)}};
constexpr Row kRgb565ToRgb565[] = {
    {k90C, kSameSize, kAny, kAny, RUN(TurnPacked<kTurn90C_u16>)},
    {k90AC, kSameSize, kAny, kAny, RUN(TurnPacked<kTurn90AC_u16>)},
    {kAny, kAny, kAny, kAny, RUN(ResizeWalkPacked<_QZRGB565RszRot, 2>)},
};
constexpr Row kRgb888ToRgb565[] = {
    {kAny, kAny, kAny, kAny, RUN(ResizeWalkPacked<_QZRGB888ToRGB565RszRot, 1>)},
};
constexpr Row kRgb888ToRgb888[] = {
    {kAny, kAny, kAny, kAny, RUN(ResizeWalkPacked<_QZRGB888RszRot, 1>)},
};

// RGB to 4:2:0 is never resized or mirrored, and RGB565 takes half a turn for none: clients rely on
// it.
constexpr Row kRgb565ToYCbCr420[] = {
    {k90AC, kAny, kAny, kAny, RUN(FromRgbTurned<kTurn90AC>)},
    {k90C, kAny, kAny, kAny, RUN(FromRgbTurned<kTurn90C>)},
    {kAny, kAny, kAny, kAny, RUN(ConvertRgbToPlanar)},
};
constexpr Row kRgb32ToYCbCr420[] = {
    {k90AC, kAny, kAny, kAny, RUN(FromRgbTurned<kTurn90AC>)},
    {k90C, kAny, kAny, kAny, RUN(FromRgbTurned<kTurn90C>)},
    {k180, kAny, kAny, kAny, RUN(FromRgbTurned<kTurn180>)},
    {kAny, kAny, kAny, kAny, RUN(ConvertRgbToPlanar)},
};

#undef RUN

constexpr Lookup kNone = {};
constexpr Lookup kTo565 = {GetPFN_yuv2rgb, QZ_IMAGEPROC_FMT_RGB565};
constexpr Lookup kTo888 = {GetPFN_yuv2rgb, QZ_IMAGEPROC_FMT_RGB888};
constexpr Lookup kTo8888 = {GetPFN_yuv2rgb, QZ_IMAGEPROC_FMT_ARGB32};
constexpr Lookup kTo5551 = {GetPFN_yuv2rgb, QZ_IMAGEPROC_FMT_RGB5551};
constexpr Lookup kNv12To565 = {GetPFN_nv122rgb, QZ_IMAGEPROC_FMT_RGB565};
constexpr Lookup kFrom565 = {GetPFN_rgb2yuv, 0};
constexpr Lookup kFromArgb = {GetPFN_rgb2yuv, 1};
constexpr Lookup kFromAbgr = {GetPFN_rgb2yuv, 2};
constexpr Lookup kLine = {GetPFN_convert, 0};

constexpr Conversion kConversions[] = {
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_YCBCR420, kNone, kNone, kYCbCr420ToYCbCr420},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB565, kTo565, kNone, kYCbCr420ToRgb565},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB888, kTo888, kNone, kYCbCr420ToRgb888},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_ARGB32, kTo8888, kNone, kYCbCr420ToArgb32},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_YUY2, kNone, kNone, kYCbCr420ToYuy2},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_UYVY, kNone, kNone, kYCbCr420ToUyvy},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_NV12, kNone, kNone, kYCbCr420ToNv12},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551, kTo5551, kNone, kYCbCr420ToRgb5551},
    {QZ_IMAGEPROC_CSC_YCBCR422_TO_RGB565, kNone, kLine, kYCbCr422ToRgb565},
    {QZ_IMAGEPROC_CSC_YCBCR444_TO_RGB565, kNone, kLine, kYCbCr444ToRgb565},
    {QZ_IMAGEPROC_CSC_YCBCR444_TO_RGB888, kNone, kLine, kYCbCr444ToRgb888},
    {QZ_IMAGEPROC_CSC_YCBCR444_TO_ARGB32, kNone, kLine, kYCbCr444ToArgb32},
    {QZ_IMAGEPROC_CSC_RGB565_TO_YCBCR420, kFrom565, kNone, kRgb565ToYCbCr420},
    {QZ_IMAGEPROC_CSC_RGB565_TO_RGB565, kNone, kNone, kRgb565ToRgb565},
    {QZ_IMAGEPROC_CSC_RGB565_TO_ARGB32, kNone, kNone, kRgb565ToArgb32},
    {QZ_IMAGEPROC_CSC_RGB888_TO_RGB565, kNone, kNone, kRgb888ToRgb565},
    {QZ_IMAGEPROC_CSC_RGB888_TO_RGB888, kNone, kNone, kRgb888ToRgb888},
    {QZ_IMAGEPROC_CSC_ARGB32_TO_YCBCR420, kFromArgb, kNone, kRgb32ToYCbCr420},
    {QZ_IMAGEPROC_CSC_NV12_TO_YCBCR420, kNone, kNone, kNv12ToYCbCr420},
    {QZ_IMAGEPROC_CSC_NV12_TO_RGB565, kNv12To565, kNone, kNv12ToRgb565},
    {QZ_IMAGEPROC_CSC_ABGR32_TO_YCBCR420, kFromAbgr, kNone, kRgb32ToYCbCr420},
};

bool Holds(uint32_t condition, uint32_t value) {
    return condition == kAny || (condition & Bit(value)) != 0;
}

}  // namespace

const Conversion* FindConversion(uint32_t code) {
    for (const Conversion& conversion : kConversions) {
        if (conversion.code == code) return &conversion;
    }
    return nullptr;
}

const Row* ChooseRow(const Conversion& conversion, const QZ_IMAGEPROC_PARAMSET& p) {
    const uint32_t adjust = p.u32AdjustActive ? 1 : 0;
    for (size_t i = 0; i < conversion.rowCount; ++i) {
        const Row& row = conversion.rows[i];
        if (Holds(row.rotations, p.u32RotationType) && Holds(row.cases, p.u32ResizeCase) &&
            Holds(row.algorithms, p.u32ResizeAlgorithm) && Holds(row.adjust, adjust)) {
            return &row;
        }
    }
    return nullptr;
}

}  // namespace vidshow
