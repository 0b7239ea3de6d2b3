#pragma once

// 4:2:0 to RGB by our kernels, called directly, and by libswscale and libyuv: what the benchmarks
// of that work share.

#include <memory>

#include "bench/compare.h"
#include "libyuv.h"
#include "vidshow/kernels.h"

extern "C" {
#include <libavutil/cpu.h>
#include <libswscale/swscale.h>
}

namespace bench {

constexpr uint32_t kAlpha = 255;

enum Format { kRgb565, kRgb888, kArgb32, kRgb5551 };

struct Size {
    int w, h;
};

inline int BytesOf(Format format) {
    return format == kRgb888 ? 3 : format == kArgb32 ? 4 : 2;
}

/// A picture with some detail, one stride a plane, with the rows behind it that `Case1` reads.
struct Planes {
    explicit Planes(Size whole)
        : size(whole),
          y(static_cast<size_t>(size.w) * static_cast<size_t>(size.h + 2)),
          cb(y.size() / 4),
          cr(y.size() / 4) {
        for (size_t i = 0; i < y.size(); ++i)
            y[i] = static_cast<uint8_t>(16 + i * 7 % 220);
        for (size_t i = 0; i < cb.size(); ++i) {
            cb[i] = static_cast<uint8_t>(64 + i * 3 % 128);
            cr[i] = static_cast<uint8_t>(64 + i * 5 % 128);
        }
    }

    Size size;
    std::vector<uint8_t> y, cb, cr;
    uint8_t* planes[3] = {y.data(), cb.data(), cr.data()};
    uint32_t strides[3] = {static_cast<uint32_t>(size.w), static_cast<uint32_t>(size.w / 2),
                           static_cast<uint32_t>(size.w / 2)};
};

/// One job: a picture from `in` to `out` pixels, turned by `rotation`.
struct Job {
    std::string name;
    Format format;
    Size in;
    Size out;
    uint32_t rotation;
    int swscaleFlags;
    libyuv::FilterMode filter;
    /// Runs the kernel.
    std::function<void(struct Ours&)> ours;

    bool Scales() const { return in.w != out.w || in.h != out.h; }
};

/// A processor made by hand: tables, line buffers, walker.
struct Ours {
    explicit Ours(const Job& job)
        : from(job.in),
          to(job.out),
          stride(static_cast<uint32_t>((job.rotation ? to.h : to.w) * BytesOf(job.format))),
          picture(static_cast<size_t>(to.w) * static_cast<size_t>(to.h) *
                  static_cast<size_t>(BytesOf(job.format))),
          lineBlock(4 * static_cast<size_t>(std::max(from.w, to.w) + 4)) {
        set.pTransLuma = luma;
        set.pTransCb = cb;
        set.pTransCr = cr;
        set_transtable(csc_coef[0], luma, cb, cr, 128, 128, 128);
        for (size_t i = 0; i < 4; ++i)
            set.pLines[i] = &lineBlock[i * (lineBlock.size() / 4)];
        const intptr_t p = BytesOf(job.format), s = static_cast<intptr_t>(stride);
        const intptr_t start = reinterpret_cast<intptr_t>(picture.data()) + p * (to.h - 1);
        walker = {{2 * s, -2 * p, start, start + s, start - p, start + s - p}};  // clockwise
        set.pWalker = &walker;
    }

    Size from, to;
    uint32_t stride;
    std::vector<uint8_t> picture;
    std::vector<uint32_t> lineBlock;
    Planes src{from};
    uint16_t luma[256];
    uint32_t cb[256], cr[256];
    QZ_ROTATION_WALKER walker;
    QZ_IMAGEPROC_PARAMSET set{};
};

inline AVPixelFormat SwscaleFormat(Format format) {
    switch (format) {
        case kRgb888:
            return AV_PIX_FMT_BGR24;
        case kArgb32:
            return AV_PIX_FMT_BGRA;
        case kRgb5551:
            return AV_PIX_FMT_RGB555LE;  // the bits stand elsewhere, the work is the same
        default:
            return AV_PIX_FMT_RGB565LE;
    }
}

/// libswscale, or nothing where it has no equal: it does not turn pictures.
inline Work Swscale(const Job& job, bool vectors) {
    if (job.rotation != 0) return {};
    av_force_cpu_flags(vectors ? -1 : 0);
    std::shared_ptr<SwsContext> context(
        sws_getContext(job.in.w, job.in.h, AV_PIX_FMT_YUV420P, job.out.w, job.out.h,
                       SwscaleFormat(job.format), job.swscaleFlags, nullptr, nullptr, nullptr),
        sws_freeContext);
    av_force_cpu_flags(-1);
    auto src = std::make_shared<Planes>(job.in);
    const int stride = job.out.w * BytesOf(job.format);
    auto out = std::make_shared<std::vector<uint8_t>>(
        static_cast<size_t>(stride) * static_cast<size_t>(job.out.h) + 64);
    return [=] {
        const int strides[3] = {job.in.w, job.in.w / 2, job.in.w / 2};
        uint8_t* planes[1] = {out->data()};
        sws_scale(context.get(), src->planes, strides, 0, job.in.h, planes, &stride);
    };
}

inline int LibyuvPack(Format format, const Planes& s, uint8_t* out, int stride) {
    const auto* const* p = s.planes;
    const int w = s.size.w, h = s.size.h;
    switch (format) {
        case kRgb888:
            return libyuv::I420ToRGB24(p[0], w, p[1], w / 2, p[2], w / 2, out, stride, w, h);
        case kArgb32:
            return libyuv::I420ToARGB(p[0], w, p[1], w / 2, p[2], w / 2, out, stride, w, h);
        case kRgb5551:
            return libyuv::I420ToARGB1555(p[0], w, p[1], w / 2, p[2], w / 2, out, stride, w, h);
        default:
            return libyuv::I420ToRGB565(p[0], w, p[1], w / 2, p[2], w / 2, out, stride, w, h);
    }
}

/// libyuv: scaled and turned as planes, then packed. Each step is left out where nothing changes.
inline Work Libyuv(const Job& job, bool vectors) {
    auto src = std::make_shared<Planes>(job.in);
    auto scaled = std::make_shared<Planes>(job.out);
    const Size turnedSize = job.rotation ? Size{job.out.h, job.out.w} : job.out;
    auto turned = std::make_shared<Planes>(turnedSize);
    const int stride = turnedSize.w * BytesOf(job.format);
    auto out = std::make_shared<std::vector<uint8_t>>(static_cast<size_t>(stride) *
                                                      static_cast<size_t>(turnedSize.h));
    return [=] {
        libyuv::MaskCpuFlags(vectors ? -1 : 1);
        const Planes* last = src.get();
        const auto step = [&](const std::shared_ptr<Planes>& to, auto run) {
            const int w = last->size.w, w2 = to->size.w;
            run(last->planes[0], w, last->planes[1], w / 2, last->planes[2], w / 2, to->planes[0],
                w2, to->planes[1], w2 / 2, to->planes[2], w2 / 2);
            last = to.get();
        };
        if (job.Scales()) {
            step(scaled, [&](auto y, int sy, auto u, int su, auto v, int sv, auto dy, int dsy,
                             auto du, int dsu, auto dv, int dsv) {
                libyuv::I420Scale(y, sy, u, su, v, sv, job.in.w, job.in.h, dy, dsy, du, dsu, dv,
                                  dsv, job.out.w, job.out.h, job.filter);
            });
        }
        if (job.rotation) {
            step(turned, [&](auto y, int sy, auto u, int su, auto v, int sv, auto dy, int dsy,
                             auto du, int dsu, auto dv, int dsv) {
                libyuv::I420Rotate(y, sy, u, su, v, sv, dy, dsy, du, dsu, dv, dsv, job.out.w,
                                   job.out.h, libyuv::kRotate90);
            });
        }
        LibyuvPack(job.format, *last, out->data(), stride);
    };
}

#define PLAIN(o) &o.set, o.src.planes, o.src.strides, o.from.w, o.from.h
#define LINES(o) &o.set, o.set.pLines, o.src.planes, o.src.strides, o.from.w
#define OUT(o) o.picture.data(), o.stride

}  // namespace bench
