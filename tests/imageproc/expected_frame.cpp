// The table of kernels once more, written apart from the library's: as questions in the order in
// which a reader asks them, with plane turns pixel by pixel.

#include "imageproc/expected_frame.h"

#include <dlfcn.h>
#include <gtest/gtest.h>

#include <vector>

#include "vidshow/kernels.h"

namespace imageproc_test {

void* VectorKernel(const std::string& family, uint32_t matrix) {
    std::string name = family;
    const size_t place = name.find('#');
    if (place == std::string::npos) {
        name += std::to_string(matrix);
    } else {
        name.replace(place, 1, std::to_string(matrix));
    }
    void* const kernel = dlsym(RTLD_DEFAULT, name.c_str());
    EXPECT_NE(kernel, nullptr) << name;
    return kernel;
}

uint32_t ExpectedCase(const QZ_IMAGEPROC_INIT_PARAMS& q) {
    const uint32_t w = q.u32InWidth, h = q.u32InHeight, dw = q.u32OutWidth, dh = q.u32OutHeight;
    if (w == dw && h == dh) return 0;
    if (q.u32RotationType == 0 && q.u32ResizeAlgorithm == 1) {
        if (dw == w + w && dh == h + h) return 4;
        if (dw + dw == 5 * w && dh == h + h) return 5;
        if (w == 320 && h == 240 && dw == 480 && dh == 272) return 7;
        if (dw + dw == 3 * w) return 6;
    }
    if (w < dw) return h < dh ? 2 : 1;
    return w > dw && h > dh ? 3 : 1;
}

namespace {

using ToPacked = int32_t (*)(uint8_t* const*, const uint32_t*, void*, uint32_t, int32_t, int32_t);
using ToPackedWith = int32_t (*)(uint8_t* const*, const uint32_t*, void*, uint32_t, int32_t,
                                 int32_t, uint32_t);
using ToPlanes = int32_t (*)(const void*, uint32_t, uint8_t* const*, const uint32_t*, int32_t,
                             int32_t);

struct Frame {
    const QZ_IMAGEPROC_INIT_PARAMS& q;
    QZ_IMAGEPROC_PARAMSET* p;
    const Planes& s;
    const Planes& d;
    uint32_t resize;
    bool turned;
    bool adjusted;
    int32_t w, h, dw, dh;
    void* to;
    uint32_t ds;
    uint32_t a;
    const QZ_ROTATION_WALKER* walker;

    void* Main(const char* limited, const char* full) const {
        return VectorKernel(q.u32YuvRange == 1 ? full : limited, q.u32ColorMatrix);
    }
};

// Rotation 1 anticlockwise, 2 clockwise, 3 half a turn.
void TurnPixels(uint32_t rotation, const uint8_t* src, size_t ss, uint8_t* dst, size_t ds, size_t w,
                size_t h, size_t bytes) {
    for (size_t y = 0; y < h; ++y) {
        for (size_t x = 0; x < w; ++x) {
            const size_t column = rotation == 1 ? y : rotation == 2 ? h - 1 - y : w - 1 - x;
            const size_t row = rotation == 1 ? w - 1 - x : rotation == 2 ? x : h - 1 - y;
            for (size_t b = 0; b < bytes; ++b) {
                dst[row * ds + column * bytes + b] = src[y * ss + x * bytes + b];
            }
        }
    }
}

void ToRgb565(const Frame& f) {
    const auto& [plane, stride] = f.s;
    uint32_t* const* lines = f.p->pLines;
    if (f.turned) {
        if (f.resize == 0) {
            _QZYCbCr420ToRGB565Rot(f.p, plane, stride, f.w, f.h);
        } else if (f.resize == 2) {
            const auto* word = f.walker->word;
            _QZYCbCr420ToRGB565RszUpRot(
                f.p, lines, plane, stride, f.w, f.h, reinterpret_cast<void*>(word[2]),
                static_cast<int32_t>(word[1] / 2), static_cast<int32_t>(word[0] / 2), f.dw, f.dh);
        } else {
            _QZYCbCr420ToRGB565RszRot(f.p, plane, stride, f.w, f.h, f.dw, f.dh);
        }
        return;
    }
    switch (f.resize) {
        case 0:
            if (f.adjusted) {
                _QZYCbCr420ToRGB565(f.p, plane, stride, f.w, f.h, f.to, f.ds);
            } else {
                reinterpret_cast<ToPacked>(
                    f.Main("_YCbCr420ToRGB565_P3C2_", "_YUV420ToRGB565_P3C2_"))(plane, stride, f.to,
                                                                                f.ds, f.w, f.h);
            }
            break;
        case 2:
        case 4: {
            const auto kernel = f.q.u32ResizeAlgorithm == 0   ? _QZYCbCr420ToRGB565RszUp_Nearest
                                : f.q.u32ResizeAlgorithm == 3 ? _QZYCbCr420ToRGB565RszUp_NearLinear
                                                              : _QZYCbCr420ToRGB565RszUp;
            kernel(f.p, lines, plane, stride, f.w, f.h, f.to, f.ds, f.dw, f.dh);
            break;
        }
        case 5:
            _QZYCbCr420ToRGB565Case1(f.p, lines, plane, stride, f.w, f.to, f.ds, f.dh);
            break;
        case 6:
            _QZYCbCr420ToRGB565Case2(f.p, lines, plane, stride, f.w, f.h, f.to, f.ds, f.dh);
            break;
        case 7:
            _QZYCbCr420ToRGB565Case3(f.p, lines[0], lines[1], plane, stride, f.to, f.ds);
            break;
        default:
            _QZYCbCr420ToRGB565Rsz(f.p, plane, stride, f.w, f.h, f.to, f.ds, f.dw, f.dh);
    }
}

void ToArgb32(const Frame& f) {
    const auto& [plane, stride] = f.s;
    uint32_t* const* lines = f.p->pLines;
    if (f.turned && f.resize != 0) {
        _QZYCbCr420ToARGB32RszRot(f.p, plane, stride, f.w, f.h, f.dw, f.dh, f.a);
    } else if (f.turned) {
        _QZYCbCr420ToARGB32Rot(f.p, plane, stride, f.w, f.h, f.a);
    } else if (f.resize == 2 || f.resize == 4 || f.resize == 7) {
        _QZYCbCr420ToARGB32RszUp(f.p, lines, plane, stride, f.w, f.h, f.to, f.ds, f.dw, f.dh, f.a);
    } else if (f.resize == 5) {
        _QZYCbCr420ToARGB32Case1(f.p, lines, plane, stride, f.w, f.to, f.ds, f.dh, f.a);
    } else if (f.resize == 6) {
        _QZYCbCr420ToARGB32Case2(f.p, lines, plane, stride, f.w, f.h, f.to, f.ds, f.dh, f.a);
    } else if (f.resize != 0) {
        _QZYCbCr420ToARGB32Rsz(f.p, plane, stride, f.w, f.h, f.to, f.ds, f.dw, f.dh, f.a);
    } else if (f.adjusted) {
        _QZYCbCr420ToARGB32(f.p, plane, stride, f.w, f.h, f.to, f.ds, f.a);
    } else {
        reinterpret_cast<ToPackedWith>(f.Main("_YCbCr420ToARGB32_P3C4_", "_YUV420ToARGB32_P3C4_"))(
            plane, stride, f.to, f.ds, f.w, f.h, f.a);
    }
}

void ToRgb888(const Frame& f) {
    const auto& [plane, stride] = f.s;
    if (f.adjusted) {
        _QZYCbCr420ToRGB888(f.p, plane, stride, f.w, f.h, f.to, f.ds);
    } else {
        reinterpret_cast<ToPacked>(f.Main("_YCbCr420ToRGB888_P3C3_", "_YUV420ToRGB888_P3C3_"))(
            plane, stride, f.to, f.ds, f.w, f.h);
    }
}

void ToRgb5551(const Frame& f) {
    const auto& [plane, stride] = f.s;
    const uint32_t key = f.p->u32ColorKey;
    if (f.adjusted) {
        _QZYCbCr420ToRGB555(f.p, plane, stride, f.w, f.h, f.to, f.ds, key);
    } else {
        reinterpret_cast<ToPackedWith>(
            f.Main("_YCbCr420ToRGB5551_P3C2_", "_YUV420ToRGB5551_P3C2_"))(plane, stride, f.to, f.ds,
                                                                          f.w, f.h, key);
    }
}

void PlanesToPlanes(const Frame& f) {
    const auto& [plane, stride] = f.s;
    const auto& [to, ds] = f.d;
    const bool resized = f.resize != 0;
    if (f.adjusted) {
        if (f.turned && resized) {
            _QZYCbCr420RszRotAdjust(f.p, plane, stride, f.w, f.h, f.dw, f.dh);
        } else if (f.turned) {
            _QZYCbCr420RotAdjust(f.p, plane, stride, f.w, f.h);
        } else if (resized) {
            _QZYCbCr420RszAdjust(f.p, plane, stride, f.w, f.h, to, ds, f.dw, f.dh);
        } else {
            _QZYCbCrAdjust(f.p, plane, stride, f.w, f.h, to, ds);
        }
    } else if (f.turned && resized) {
        _QZYCbCr420RszRot(f.walker, plane, stride, f.w, f.h, f.dw, f.dh);
    } else if (f.turned && f.q.u32RotationType <= 3) {
        for (int i = 0; i < 3; ++i) {
            const size_t half = i ? 2 : 1;
            TurnPixels(f.q.u32RotationType, plane[i], stride[i], to[i], ds[i],
                       static_cast<size_t>(f.w) / half, static_cast<size_t>(f.h) / half, 1);
        }
    } else if (f.turned) {
        _QZYCbCr420Rot(f.walker, plane, stride, f.w, f.h);
    } else if (resized) {
        _QZYCbCr420Rsz(plane, stride, f.w, f.h, to, ds, f.dw, f.dh);
    } else {
        _QZYCbCr420Copy(plane, stride, f.w, f.h, to, ds);
    }
}

// RGB to 4:2:0. Turned pictures are cut to multiples of 8, and their planes are read with the cut
// width although they were written with the full one; what was not written is 0.
void RgbToPlanes(const Frame& f, const char* limited, const char* full, uint32_t mostRotation) {
    const auto convert = reinterpret_cast<ToPlanes>(f.Main(limited, full));
    const uint32_t rotation = f.q.u32RotationType;
    if (rotation == 0 || rotation > mostRotation) {
        convert(f.s.plane[0], f.s.stride[0], f.d.plane, f.d.stride, f.w, f.h);
        return;
    }
    const uint32_t width = static_cast<uint32_t>(f.w);
    const size_t area = static_cast<size_t>(f.w) * static_cast<size_t>(f.h);
    std::vector<uint8_t> y(area), cb(area / 4), cr(area / 4);
    uint8_t* const planes[3] = {y.data(), cb.data(), cr.data()};
    const uint32_t strides[3] = {width, width / 2, width / 2};
    const size_t w8 = width & ~7u;
    const size_t h8 = static_cast<size_t>(f.h) & ~size_t{7};
    convert(f.s.plane[0], f.s.stride[0], planes, strides, static_cast<int32_t>(w8),
            static_cast<int32_t>(h8));
    for (int i = 0; i < 3; ++i) {
        const size_t half = i ? 2 : 1;
        TurnPixels(rotation, planes[i], w8 / half, f.d.plane[i], f.d.stride[i], w8 / half,
                   h8 / half, 1);
    }
}

void Rgb565ToRgb565(const Frame& f) {
    const uint32_t rotation = f.q.u32RotationType;
    if (f.resize == 0 && (rotation == 1 || rotation == 2)) {
        TurnPixels(rotation, f.s.plane[0], f.s.stride[0], f.d.plane[0], f.ds,
                   static_cast<size_t>(f.w), static_cast<size_t>(f.h), 2);
    } else {
        _QZRGB565RszRot(f.walker, f.s.plane[0], static_cast<int32_t>(f.s.stride[0]) / 2, f.w, f.h,
                        f.dw, f.dh);
    }
}

}  // namespace

void RunExpectedFrame(const QZ_IMAGEPROC_INIT_PARAMS& q, QZ_IMAGEPROC_PARAMSET* p,
                      const Planes& src, const Planes& dst) {
    const Frame f = {q,
                     p,
                     src,
                     dst,
                     ExpectedCase(q),
                     q.u32RotationType != 0,
                     p->u32AdjustActive != 0,
                     static_cast<int32_t>(q.u32InWidth),
                     static_cast<int32_t>(q.u32InHeight),
                     static_cast<int32_t>(q.u32OutWidth),
                     static_cast<int32_t>(q.u32OutHeight),
                     dst.plane[0],
                     dst.stride[0],
                     q.u32Alpha,
                     static_cast<const QZ_ROTATION_WALKER*>(p->pWalker)};
    const int32_t signedStrides[3] = {static_cast<int32_t>(dst.stride[0]),
                                      static_cast<int32_t>(dst.stride[1]),
                                      static_cast<int32_t>(dst.stride[2])};
    ASSERT_EQ(_QZ_RotationInit(p, dst.plane, f.dw, f.dh, signedStrides), 0);
    const int32_t srcStride = static_cast<int32_t>(src.stride[0]);
    switch (q.u32CscType) {
        case 0:
            return PlanesToPlanes(f);
        case 3:
            return ToRgb565(f);
        case 4:
            return ToRgb888(f);
        case 5:
            return ToArgb32(f);
        case 6:
            _QZYCbCr420ToYUY2(f.to, f.ds, src.plane, src.stride, f.w, f.h);
            return;
        case 7:
            _QZYCbCr420ToUYVY(f.to, f.ds, src.plane, src.stride, f.w, f.h);
            return;
        case 8:
            _QZYCbCr420ToNV12(src.plane, src.stride, f.w, f.h, dst.plane, dst.stride);
            return;
        case 10:
            return ToRgb5551(f);
        case 259:
            if (f.resize == 0) {
                _QZYCbCr422ToRGB565(p, src.plane, src.stride, f.w, f.h, f.to, f.ds);
            } else {
                _QZYCbCr422ToRGB565Rsz(p, src.plane, src.stride, f.w, f.h, f.to, f.ds, f.dw, f.dh);
            }
            return;
        case 515:
            _QZYCbCr444ToRGB565RszRot(p, src.plane, src.stride, f.w, f.h, f.dw, f.dh);
            return;
        case 516:
            _QZYCbCr444ToRGB888RszRot(p, src.plane, src.stride, f.w, f.h, f.dw, f.dh);
            return;
        case 517:
            _QZYCbCr444ToARGB32RszRot(p, src.plane, src.stride, f.w, f.h, f.dw, f.dh, f.a);
            return;
        case 768:
            return RgbToPlanes(f, "_QZRGB565ToYCbCr420_C2P3_", "_QZRGB565ToYUV420_C2P3_", 2);
        case 771:
            return Rgb565ToRgb565(f);
        case 773:
            _QZRGB565ToARGB32(src.plane[0], srcStride / 2, f.to, static_cast<int32_t>(f.ds) / 4,
                              f.w, f.h, f.a);
            return;
        case 1027:
            _QZRGB888ToRGB565RszRot(f.walker, src.plane[0], srcStride, f.w, f.h, f.dw, f.dh);
            return;
        case 1028:
            _QZRGB888RszRot(f.walker, src.plane[0], srcStride, f.w, f.h, f.dw, f.dh);
            return;
        case 1280:
            return RgbToPlanes(f, "_QZARGB32ToYCbCr420_C4P3_", "_QZARGB32ToYUV420_C4P3_", 3);
        case 2048:
            _QZNV12ToYCbCr420(src.plane, src.stride, f.w, f.h, dst.plane, dst.stride);
            return;
        case 2051:
            reinterpret_cast<ToPacked>(f.Main("_NV12ToRGB565_P3C2_", "_NV12FRToRGB565_P3C2_"))(
                src.plane, src.stride, f.to, f.ds, f.w, f.h);
            return;
        case 2304:
            return RgbToPlanes(f, "_QZABGR32ToYCbCr420_C4P3_", "_QZABGR32ToYUV420_C4P3_", 3);
        default:
            FAIL() << "no conversion " << q.u32CscType;
    }
}

}  // namespace imageproc_test
