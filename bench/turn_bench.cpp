// Quarter turns, half turns and mirrors of planes and packed pictures, beside libyuv and
// libavfilter, on the same pictures in the same run; a size that the processor's caches hold, and
// one that they do not.
//
// usage: turn_bench [substring of the row's name]

#include <cstring>
#include <memory>
#include <string>

#include "bench/compare.h"
#include "bench/filter_graph.h"
#include "libyuv.h"
#include "vidshow/kernels.h"

namespace {

constexpr int kRounds = 21;

struct Size {
    int w, h;
};

/// What is turned: one plane of pixels of so many bytes, or planar 4:2:0.
struct Layout {
    const char* name;
    AVPixelFormat format;
    int planes;
    int bytes;
};

constexpr Layout kBytes{"8 bits", AV_PIX_FMT_GRAY8, 1, 1};
constexpr Layout kWords{"16 bits", AV_PIX_FMT_RGB565LE, 1, 2};
constexpr Layout kPixels{"32 bits", AV_PIX_FMT_BGRA, 1, 4};
constexpr Layout k420{"4:2:0", AV_PIX_FMT_YUV420P, 3, 1};

/// Rows without padding.
struct Picture {
    Picture(const Layout& l, Size s) {
        for (int i = 0; i < l.planes; ++i) {
            const int shrink = i == 0 ? 1 : 2;
            strides[i] = static_cast<uint32_t>(s.w / shrink * l.bytes);
            memory[i].resize(size_t{strides[i]} * static_cast<size_t>(s.h / shrink));
            for (size_t k = 0; k < memory[i].size(); ++k)
                memory[i][k] = static_cast<uint8_t>(16 + k * 7 % 220);
            planes[i] = memory[i].data();
        }
    }
    int stride(int i) const { return static_cast<int>(strides[i]); }

    std::vector<uint8_t> memory[3];
    uint8_t* planes[3] = {};
    uint32_t strides[3] = {};
};

/// One row of the table.
struct Job {
    const Layout& layout;
    uint32_t turn;
    Size size;
    Picture src, dst;
    QZ_ROTATION_WALKER walker{};

    static bool IsQuarter(uint32_t turn) {
        return turn == QZ_IMAGEPROC_ROTATE_90AC || turn == QZ_IMAGEPROC_ROTATE_90C;
    }

    Job(const Layout& l, uint32_t t, Size s)
        : layout(l), turn(t), size(s), src(l, s), dst(l, IsQuarter(t) ? Size{s.h, s.w} : s) {
        QZ_IMAGEPROC_PARAMSET p = {};
        p.pWalker = &walker;
        p.u32RotationType = turn;
        p.u32CscType = QZ_IMAGEPROC_FMT_YCBCR420;
        const int32_t strides[3] = {dst.stride(0), dst.stride(1), dst.stride(2)};
        _QZ_RotationInit(&p, dst.planes, size.w, size.h, strides);
    }
};

using Run = void (*)(Job&);

#define BLOCK(j) \
    j.src.planes[0], j.src.stride(0), j.dst.planes[0], j.dst.stride(0), j.size.w, j.size.h
#define YUV(pic)                                                                         \
    (pic).planes[0], (pic).stride(0), (pic).planes[1], (pic).stride(1), (pic).planes[2], \
        (pic).stride(2)

void Turn420(Job& j) {
    _QZYCbCr420Rot(&j.walker, j.src.planes, j.src.strides, j.size.w, j.size.h);
}

uint16_t* Words(uint8_t* bytes) {
    return static_cast<uint16_t*>(static_cast<void*>(bytes));
}

template <libyuv::RotationMode kMode>
void YuvBytes(Job& j) {
    libyuv::RotatePlane(BLOCK(j), kMode);
}
template <libyuv::RotationMode kMode>
void YuvWords(Job& j) {
    libyuv::RotatePlane_16(Words(j.src.planes[0]), j.src.stride(0) / 2, Words(j.dst.planes[0]),
                           j.dst.stride(0) / 2, j.size.w, j.size.h, kMode);
}
template <libyuv::RotationMode kMode>
void YuvPixels(Job& j) {
    libyuv::ARGBRotate(BLOCK(j), kMode);
}
template <libyuv::RotationMode kMode>
void Yuv420(Job& j) {
    libyuv::I420Rotate(YUV(j.src), YUV(j.dst), j.size.w, j.size.h, kMode);
}

bench::Work Avfilter(const Job& job, const char* filters) {
    auto graph =
        std::make_shared<bench::FilterGraph>(job.size.w, job.size.h, job.layout.format, filters);
    AVFrame* const frame = graph->input();
    for (int i = 0; i < job.layout.planes; ++i) {
        const int rows = i == 0 ? job.size.h : job.size.h / 2;
        std::memset(frame->data[i], 100, static_cast<size_t>(frame->linesize[i] * rows));
    }
    return [=] { graph->Run(); };
}

void Measure(const char* wanted, const char* name, const Layout& layout, uint32_t turn, Size size,
             Run ours, Run libyuv, const char* filters) {
    const std::string row = std::string(layout.name) + ", " + name + " " + std::to_string(size.w) +
                            "x" + std::to_string(size.h);
    if (wanted != nullptr && row.find(wanted) == std::string::npos) return;
    Job job(layout, turn, size);
    bench::PrintRow(row, size.w * size.h,
                    bench::Race({{"ours", [&] { ours(job); }},
                                 {"libyuv", [&] { libyuv(job); }},
                                 {"libavfilter", Avfilter(job, filters)}},
                                kRounds));
}

}  // namespace

int main(int argc, char** argv) {
    using namespace libyuv;
    const char* const wanted = argc > 1 ? argv[1] : nullptr;
    const auto measure = [&](const char* name, const Layout& layout, uint32_t turn, Size size,
                             Run ours, Run libyuv, const char* filters) {
        Measure(wanted, name, layout, turn, size, ours, libyuv, filters);
    };
    constexpr const char *kClockwise = "transpose=clock", *kAnticlockwise = "transpose=cclock",
                         *kHalf = "hflip,vflip";
    bench::PrintHead({"ours", "libyuv", "libavfilter"});
    for (const Size s : {Size{640, 480}, Size{1920, 1080}}) {
        measure(
            "clockwise", kBytes, 2, s, [](Job& j) { QZ_ImageRotate_90C_u8(BLOCK(j)); },
            YuvBytes<kRotate90>, kClockwise);
        measure(
            "anticlockwise", kBytes, 1, s, [](Job& j) { QZ_ImageRotate_90AC_u8(BLOCK(j)); },
            YuvBytes<kRotate270>, kAnticlockwise);
        measure(
            "half a turn", kBytes, 3, s, [](Job& j) { QZ_ImageRotate_180_u8(BLOCK(j)); },
            YuvBytes<kRotate180>, kHalf);
        measure(
            "clockwise", kWords, 2, s, [](Job& j) { QZ_ImageRotate_90C_u16(BLOCK(j)); },
            YuvWords<kRotate90>, kClockwise);
        measure(
            "anticlockwise", kWords, 1, s, [](Job& j) { QZ_ImageRotate_90AC_u16(BLOCK(j)); },
            YuvWords<kRotate270>, kAnticlockwise);
        measure(
            "clockwise", kPixels, 2, s, [](Job& j) { QZ_ImageRotate_90C_u32(BLOCK(j)); },
            YuvPixels<kRotate90>, kClockwise);
        measure(
            "anticlockwise", kPixels, 1, s, [](Job& j) { QZ_ImageRotate_90AC_u32(BLOCK(j)); },
            YuvPixels<kRotate270>, kAnticlockwise);
        measure("clockwise", k420, 2, s, Turn420, Yuv420<kRotate90>, kClockwise);
        measure("half a turn", k420, 3, s, Turn420, Yuv420<kRotate180>, kHalf);
        measure(
            "left and right exchanged", k420, 4, s, Turn420,
            [](Job& j) { I420Mirror(YUV(j.src), YUV(j.dst), j.size.w, j.size.h); }, "hflip");
        measure(
            "top and bottom exchanged", k420, 5, s, Turn420,
            [](Job& j) { I420Copy(YUV(j.src), YUV(j.dst), j.size.w, -j.size.h); }, "vflip,copy");
    }
    return 0;
}
