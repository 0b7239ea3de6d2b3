// Copies, plane resizes and the further conversions beside libswscale and libyuv, each with its
// vector code and without it, on the same pictures in the same run.
//
// usage: formats_bench [substring of the row's name]

#include <cstring>
#include <memory>

#include "bench/compare.h"
#include "libyuv.h"
#include "vidshow/kernels.h"

extern "C" {
#include <libavutil/cpu.h>
#include <libswscale/swscale.h>
}

namespace {

struct Size {
    int w, h;
};

/// The bytes of a picture: up to three planes.
struct Layout {
    const char* name;
    AVPixelFormat swscale;
    int planes;
    int bytes[3];            // a sample of each plane
    int across[3], down[3];  // pixels a sample
};

constexpr Layout k420{"4:2:0", AV_PIX_FMT_YUV420P, 3, {1, 1, 1}, {1, 2, 2}, {1, 2, 2}};
constexpr Layout k422{"4:2:2", AV_PIX_FMT_YUV422P, 3, {1, 1, 1}, {1, 2, 2}, {1, 1, 1}};
constexpr Layout k444{"4:4:4", AV_PIX_FMT_YUV444P, 3, {1, 1, 1}, {1, 1, 1}, {1, 1, 1}};
constexpr Layout kNv12{"NV12", AV_PIX_FMT_NV12, 2, {1, 2, 0}, {1, 2, 1}, {1, 2, 1}};
constexpr Layout kYuy2{"YUY2", AV_PIX_FMT_YUYV422, 1, {2, 0, 0}, {1, 1, 1}, {1, 1, 1}};
constexpr Layout kUyvy{"UYVY", AV_PIX_FMT_UYVY422, 1, {2, 0, 0}, {1, 1, 1}, {1, 1, 1}};
constexpr Layout kRgb565{"RGB565", AV_PIX_FMT_RGB565LE, 1, {2, 0, 0}, {1, 1, 1}, {1, 1, 1}};
constexpr Layout kRgb888{"RGB888", AV_PIX_FMT_BGR24, 1, {3, 0, 0}, {1, 1, 1}, {1, 1, 1}};
constexpr Layout kArgb32{"ARGB32", AV_PIX_FMT_BGRA, 1, {4, 0, 0}, {1, 1, 1}, {1, 1, 1}};

/// A picture with some detail, rows without padding.
struct Picture {
    Picture(const Layout& l, Size s) : layout(l), size(s) {
        for (int i = 0; i < l.planes; ++i) {
            const size_t stride = static_cast<size_t>(s.w / l.across[i] * l.bytes[i]);
            const size_t bytes = stride * static_cast<size_t>(s.h / l.down[i]);
            memory[i].resize(kPage + bytes);
            planes[i] = memory[i].data() + Stagger();
            strides[i] = static_cast<uint32_t>(stride);
            for (size_t k = 0; k < bytes; ++k)
                planes[i][k] = static_cast<uint8_t>(16 + k * 7 % 220);
        }
    }
    int stride(int i) const { return static_cast<int>(strides[i]); }

    /// No two planes begin at the same place of a page: string instructions suffer from that.
    static size_t Stagger() {
        static size_t last = 0;
        return last = (last + 13 * 64) % kPage;
    }

    static constexpr size_t kPage = 4096;
    Layout layout;
    Size size;
    std::vector<uint8_t> memory[3];
    uint8_t* planes[3] = {};
    uint32_t strides[3] = {};
};

struct Job;
using Run = std::function<void(Job&)>;

/// One row of the table.
struct Job {
    const char* name;
    Layout from, to;
    Size in, out;  // before the turn
    uint32_t rotation;
    Run ours;
    bool swscale;  // has it
    Run libyuv;    // empty if it has not

    bool Quarter() const { return rotation == 1 || rotation == 2; }
    bool Scales() const { return in.w != out.w || in.h != out.h; }

    /// The pictures, a processor with tables and walker, and room for intermediate pictures.
    void Prepare() {
        src = std::make_shared<Picture>(from, in);
        const Size turned = Quarter() ? Size{out.h, out.w} : out;
        dst = std::make_shared<Picture>(to, turned);
        scaled = std::make_shared<Picture>(from, out);
        argb = std::make_shared<Picture>(kArgb32, out);
        set_transtable(csc_coef[0], luma, cb, cr, 128, 128, 128);
        for (int i = 0; i < 256; ++i) {
            map[i] = static_cast<uint8_t>(255 - i);
        }
        p.pTransLuma = luma, p.pTransCb = cb, p.pTransCr = cr;
        p.pAdjustLumaTable = p.pAdjustChromaTable = map;
        p.pWalker = &walker;
        p.u32RotationType = rotation;
        p.u32CscType = to.bytes[0] == 1   ? QZ_IMAGEPROC_FMT_YCBCR420
                       : to.bytes[0] == 2 ? QZ_IMAGEPROC_FMT_RGB565
                       : to.bytes[0] == 3 ? QZ_IMAGEPROC_FMT_RGB888
                                          : QZ_IMAGEPROC_FMT_ARGB32;
        const int32_t strides[3] = {dst->stride(0), dst->stride(1), dst->stride(2)};
        _QZ_RotationInit(&p, dst->planes, out.w, out.h, strides);
    }

    std::shared_ptr<Picture> src{}, dst{}, scaled{}, argb{};
    QZ_IMAGEPROC_PARAMSET p{};
    QZ_ROTATION_WALKER walker{};
    uint16_t luma[256]{};
    uint32_t cb[256]{}, cr[256]{};
    uint8_t map[256]{};
};

#define SRC(j) j.src->planes, j.src->strides, j.in.w, j.in.h
#define DST(j) j.dst->planes, j.dst->strides
#define YUV(pic)                                                                         \
    (pic).planes[0], (pic).stride(0), (pic).planes[1], (pic).stride(1), (pic).planes[2], \
        (pic).stride(2)
#define YU(pic) (pic).planes[0], (pic).stride(0), (pic).planes[1], (pic).stride(1)
#define PACKED(j) j.dst->planes[0], j.dst->strides[0]
#define OUT(j) j.dst->planes[0], j.dst->stride(0)

/// libyuv scales plane by plane; nothing to do where the size stays.
Picture& LibyuvScaled(Job& j) {
    if (!j.Scales()) return *j.src;
    for (int i = 0; i < j.from.planes; ++i) {
        libyuv::ScalePlane(j.src->planes[i], j.src->stride(i), j.in.w / j.from.across[i],
                           j.in.h / j.from.down[i], j.scaled->planes[i], j.scaled->stride(i),
                           j.out.w / j.from.across[i], j.out.h / j.from.down[i],
                           libyuv::kFilterBilinear);
    }
    return *j.scaled;
}

bench::Work Swscale(Job& j, bool vectors) {
    if (!j.swscale) return {};
    av_force_cpu_flags(vectors ? -1 : 0);
    std::shared_ptr<SwsContext> context(
        sws_getContext(j.in.w, j.in.h, j.from.swscale, j.out.w, j.out.h, j.to.swscale,
                       j.Scales() ? SWS_BILINEAR : SWS_POINT, nullptr, nullptr, nullptr),
        sws_freeContext);
    av_force_cpu_flags(-1);
    return [&j, context] {
        const int from[3] = {j.src->stride(0), j.src->stride(1), j.src->stride(2)};
        const int to[3] = {j.dst->stride(0), j.dst->stride(1), j.dst->stride(2)};
        sws_scale(context.get(), j.src->planes, from, 0, j.in.h, j.dst->planes, to);
    };
}

bench::Work Libyuv(Job& j, bool vectors) {
    if (!j.libyuv) return {};
    return [&j, vectors] {
        libyuv::MaskCpuFlags(vectors ? -1 : 1);
        j.libyuv(j);
    };
}

constexpr Size kHd{1280, 720}, kHalf{640, 360}, kSd{852, 480};

Job SameSize(const char* name, const Layout& from, const Layout& to, Run ours, bool swscale,
             Run libyuv) {
    return {name, from, to, kHd, kHd, 0, ours, swscale, libyuv};
}

std::vector<Job> RepackingJobs() {
    return {
        SameSize(
            "420Copy", k420, k420, [](Job& j) { _QZYCbCr420Copy(SRC(j), DST(j)); }, true,
            [](Job& j) { libyuv::I420Copy(YUV(*j.src), YUV(*j.dst), j.in.w, j.in.h); }),
        SameSize(
            "420ToNV12", k420, kNv12, [](Job& j) { _QZYCbCr420ToNV12(SRC(j), DST(j)); }, true,
            [](Job& j) { libyuv::I420ToNV12(YUV(*j.src), YU(*j.dst), j.in.w, j.in.h); }),
        SameSize(
            "NV12To420", kNv12, k420, [](Job& j) { _QZNV12ToYCbCr420(SRC(j), DST(j)); }, true,
            [](Job& j) { libyuv::NV12ToI420(YU(*j.src), YUV(*j.dst), j.in.w, j.in.h); }),
        SameSize(
            "420ToYUY2", k420, kYuy2, [](Job& j) { _QZYCbCr420ToYUY2(PACKED(j), SRC(j)); }, true,
            [](Job& j) { libyuv::I420ToYUY2(YUV(*j.src), OUT(j), j.in.w, j.in.h); }),
        SameSize(
            "420ToUYVY", k420, kUyvy, [](Job& j) { _QZYCbCr420ToUYVY(PACKED(j), SRC(j)); }, true,
            [](Job& j) { libyuv::I420ToUYVY(YUV(*j.src), OUT(j), j.in.w, j.in.h); }),
        SameSize("420Adjust", k420, k420, [](Job& j) { _QZYCbCrAdjust(&j.p, SRC(j), DST(j)); },
                 false, {}),
        SameSize(
            "RGB565ToARGB32", kRgb565, kArgb32,
            [](Job& j) {
                _QZRGB565ToARGB32(j.src->planes[0], j.in.w, j.dst->planes[0], j.in.w, j.in.w,
                                  j.in.h, 255);
            },
            true,
            [](Job& j) {
                libyuv::RGB565ToARGB(j.src->planes[0], j.src->stride(0), OUT(j), j.in.w, j.in.h);
            }),
    };
}

std::vector<Job> ResizeJobs(Size in, Size out) {
    const auto job = [=](const char* name, const Layout& from, const Layout& to, uint32_t type,
                         Run ours, Run libyuv) {
        const bool adjusts = std::strstr(name, "Adjust") != nullptr;
        return Job{name, from, to, in, out, type, ours, type == 0 && !adjusts, libyuv};
    };
    const auto pack = [](auto convert) {
        return [convert](Job& j) {
            convert(YUV(LibyuvScaled(j)), j.dst->planes[0], j.dst->stride(0), j.out.w, j.out.h);
        };
    };
    return {
        job(
            "420Rsz", k420, k420, 0,
            [](Job& j) { _QZYCbCr420Rsz(SRC(j), DST(j), j.out.w, j.out.h); },
            [](Job& j) {
                libyuv::I420Scale(YUV(*j.src), j.in.w, j.in.h, YUV(*j.dst), j.out.w, j.out.h,
                                  libyuv::kFilterBilinear);
            }),
        job("420RszAdjust", k420, k420, 0,
            [](Job& j) { _QZYCbCr420RszAdjust(&j.p, SRC(j), DST(j), j.out.w, j.out.h); }, {}),
        job(
            "420RszRot, clockwise", k420, k420, 2,
            [](Job& j) { _QZYCbCr420RszRot(&j.walker, SRC(j), j.out.w, j.out.h); },
            [](Job& j) {
                libyuv::I420Rotate(YUV(LibyuvScaled(j)), YUV(*j.dst), j.out.w, j.out.h,
                                   libyuv::kRotate90);
            }),
        job(
            "422ToRGB565Rsz", k422, kRgb565, 0,
            [](Job& j) { _QZYCbCr422ToRGB565Rsz(&j.p, SRC(j), PACKED(j), j.out.w, j.out.h); },
            pack(libyuv::I422ToRGB565)),
        job("444ToRGB565RszRot, straight", k444, kRgb565, 0,
            [](Job& j) { _QZYCbCr444ToRGB565RszRot(&j.p, SRC(j), j.out.w, j.out.h); }, {}),
        job(
            "444ToRGB888RszRot, straight", k444, kRgb888, 0,
            [](Job& j) { _QZYCbCr444ToRGB888RszRot(&j.p, SRC(j), j.out.w, j.out.h); },
            pack(libyuv::I444ToRGB24)),
        job(
            "444ToARGB32RszRot, straight", k444, kArgb32, 0,
            [](Job& j) { _QZYCbCr444ToARGB32RszRot(&j.p, SRC(j), j.out.w, j.out.h, 255); },
            pack(libyuv::I444ToARGB)),
        job(
            "444ToARGB32RszRot, clockwise", k444, kArgb32, 2,
            [](Job& j) { _QZYCbCr444ToARGB32RszRot(&j.p, SRC(j), j.out.w, j.out.h, 255); },
            [](Job& j) {
                Picture& scaled = LibyuvScaled(j);
                libyuv::I444ToARGB(YUV(scaled), j.argb->planes[0], j.argb->stride(0), j.out.w,
                                   j.out.h);
                libyuv::ARGBRotate(j.argb->planes[0], j.argb->stride(0), OUT(j), j.out.w, j.out.h,
                                   libyuv::kRotate90);
            }),
        job("RGB565RszRot, straight", kRgb565, kRgb565, 0,
            [](Job& j) {
                _QZRGB565RszRot(&j.walker, j.src->planes[0], j.in.w, j.in.w, j.in.h, j.out.w,
                                j.out.h);
            },
            {}),
        job("RGB888RszRot, straight", kRgb888, kRgb888, 0,
            [](Job& j) {
                _QZRGB888RszRot(&j.walker, j.src->planes[0], j.src->stride(0), j.in.w, j.in.h,
                                j.out.w, j.out.h);
            },
            {}),
        job("RGB888ToRGB565RszRot, straight", kRgb888, kRgb565, 0,
            [](Job& j) {
                _QZRGB888ToRGB565RszRot(&j.walker, j.src->planes[0], j.src->stride(0), j.in.w,
                                        j.in.h, j.out.w, j.out.h);
            },
            {}),
    };
}

void Measure(Job& job, const char* wanted) {
    const std::string name = bench::RowName(job.name, job.in, job.out);
    if (!bench::IsWanted(name, wanted)) return;
    job.Prepare();
    bench::PrintRace(name, static_cast<double>(job.out.w) * job.out.h,
                     {[&] { job.ours(job); }, Swscale(job, true), Libyuv(job, true),
                      Swscale(job, false), Libyuv(job, false)});
}

}  // namespace

int main(int argc, char** argv) {
    const char* wanted = argc > 1 ? argv[1] : nullptr;
    bench::PrintHead(bench::kPeers);
    for (Job& job : RepackingJobs())
        Measure(job, wanted);
    for (const auto& [in, out] :
         {std::pair(kHd, kHd), std::pair(kHalf, kHd), std::pair(kHd, kHalf), std::pair(kHd, kSd)}) {
        for (Job& job : ResizeJobs(in, out))
            Measure(job, wanted);
    }
    return 0;
}
