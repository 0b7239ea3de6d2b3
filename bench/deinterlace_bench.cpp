// The deinterlacing modes as a processor's frames run them, beside the same line averages and
// copies by libyuv, libpostproc's filters, and libavfilter's w3fdif, on the same 4:2:0 pictures.
//
// usage: deinterlace_bench [substring of the row's name]

#include <cstring>
#include <memory>
#include <random>

#include "bench/compare.h"
#include "bench/filter_graph.h"
#include "libyuv.h"
#include "vidshow/kernels.h"

extern "C" {
#include <libpostproc/postprocess.h>
}

namespace {

constexpr int kRounds = 21;

struct Size {
    int w, h;
};

/// How much of the picture moved between the fields, in tenths of its columns.
enum Motion { still = 0, tenth = 1, all = 10 };

struct Picture {
    explicit Picture(Size s) : size(s) {
        for (int i = 0; i < 3; ++i)
            plane[i].resize(static_cast<size_t>(width(i) * height(i)));
    }
    Picture(Size s, Motion motion) : Picture(s) {
        for (int i = 0; i < 3; ++i)
            fill(i, motion);
    }

    int width(int i) const { return i == 0 ? size.w : size.w / 2; }
    int height(int i) const { return i == 0 ? size.h : size.h / 2; }
    uint8_t* line(int i, int y) { return &plane[i][static_cast<size_t>(y * width(i))]; }

    Size size;
    std::vector<uint8_t> plane[3];
    uint8_t* planes[3] = {};
    uint32_t strides[3] = {};

    Picture& ready() {
        for (int i = 0; i < 3; ++i) {
            planes[i] = plane[i].data();
            strides[i] = static_cast<uint32_t>(width(i));
        }
        return *this;
    }

  private:
    /// Soft vertical stripes; where the picture moved, the bottom field has them further right.
    void fill(int i, Motion motion) {
        std::mt19937 random(static_cast<uint32_t>(i));
        const int w = width(i), moving = w * motion / 10;
        for (int y = 0; y < height(i); ++y) {
            for (int x = 0; x < w; ++x) {
                const int at = x < moving && y % 2 ? x + 12 : x;
                const int level = 128 + (at % 48 < 24 ? at % 24 : 24 - at % 24) * 4 - 48 + y % 7;
                line(i, y)[x] = static_cast<uint8_t>(level + static_cast<int>(random() % 3));
            }
        }
    }
};

using Shared = std::shared_ptr<Picture>;

// ---- ours
// ----------------------------------------------------------------------------------------

bench::Work Ours(const Shared& src, const Shared& dst, uint32_t mode) {
    const Size size = src->size;
    return [=] {
        QZ_IMAGEPROC_PARAMSET p = {};
        p.u32InWidth = static_cast<uint32_t>(size.w);
        p.u32InHeight = static_cast<uint32_t>(size.h);
        p.u32DeinterlaceMode = mode;
        QZ_DeInterlace(&p, src->planes, src->strides, dst->planes, dst->strides);
    };
}

// ---- libyuv
// --------------------------------------------------------------------------------------

struct YuvPlane {
    const uint8_t* s;
    uint8_t* d;
    int w, h;

    /// Every other line from line `from` on, to every other line from `to` on.
    void copy(int from, int to, int lines) const {
        libyuv::CopyPlane(s + from * w, 2 * w, d + to * w, 2 * w, w, lines);
    }
    void average(int a, int b, int to, int step, int lines) const {
        libyuv::InterpolatePlane(s + a * w, step * w, s + b * w, step * w, d + to * w, step * w, w,
                                 lines, 128);
    }
};

void YuvLinear(const YuvPlane& p) {
    p.copy(0, 0, p.h / 2);
    p.average(0, 2, 1, 2, p.h / 2 - 1);
    libyuv::CopyPlane(p.s + (p.h - 1) * p.w, p.w, p.d + (p.h - 1) * p.w, p.w, p.w, 1);
}
void YuvBlend(const YuvPlane& p) {
    libyuv::CopyPlane(p.s, p.w, p.d, p.w, p.w, 1);
    p.average(0, 1, 1, 1, p.h - 1);
}
void YuvMean(const YuvPlane& p) {
    p.average(0, 1, 0, 2, p.h / 2);
    libyuv::CopyPlane(p.d, 2 * p.w, p.d + p.w, 2 * p.w, p.w, p.h / 2);
}
void YuvDiscard(const YuvPlane& p) {
    p.copy(0, 0, p.h / 2);
    p.copy(0, 1, p.h / 2);
}

bench::Work Libyuv(const Shared& src, const Shared& dst, void (*run)(const YuvPlane&)) {
    return [=] {
        for (int i = 0; i < 3; ++i)
            run({src->planes[i], dst->planes[i], src->width(i), src->height(i)});
    };
}

// ---- libpostproc
// ---------------------------------------------------------------------------------

bench::Work Postproc(const Shared& src, const Shared& dst, const char* filter) {
    const Size size = src->size;
    std::shared_ptr<pp_mode> mode(pp_get_mode_by_name_and_quality(filter, PP_QUALITY_MAX),
                                  pp_free_mode);
    std::shared_ptr<pp_context> context(pp_get_context(size.w, size.h, PP_FORMAT_420),
                                        pp_free_context);
    return [=] {
        const uint8_t* from[3] = {src->planes[0], src->planes[1], src->planes[2]};
        const int strides[3] = {src->width(0), src->width(1), src->width(2)};
        pp_postprocess(from, strides, dst->planes, strides, size.w, size.h, nullptr, 0, mode.get(),
                       context.get(), 0);
    };
}

// ---- libavfilter
// ---------------------------------------------------------------------------------

bench::Work Avfilter(const Shared& src, const char* filter) {
    auto graph = std::make_shared<bench::FilterGraph>(src->size.w, src->size.h, AV_PIX_FMT_YUV420P,
                                                      std::string("w3fdif=") + filter);
    AVFrame* const frame = graph->input();
    for (int i = 0; i < 3; ++i) {
        for (int y = 0; y < src->height(i); ++y) {
            std::memcpy(frame->data[i] + y * frame->linesize[i], src->line(i, y),
                        static_cast<size_t>(src->width(i)));
        }
    }
    frame->interlaced_frame = 1;
    frame->top_field_first = 1;
    return [=] { graph->Run(); };
}

// ---- rows
// ----------------------------------------------------------------------------------------

void Measure(const char* wanted, const std::string& name, Size size, Motion motion, uint32_t mode,
             void (*libyuv)(const YuvPlane&), const char* postproc, const char* w3fdif) {
    const std::string row = name + " " + std::to_string(size.w) + "x" + std::to_string(size.h);
    if (wanted != nullptr && row.find(wanted) == std::string::npos) return;
    // One destination for all: where two pictures lie in memory matters more than who fills them.
    auto src = std::make_shared<Picture>(size, motion), dst = std::make_shared<Picture>(size);
    src->ready();
    dst->ready();
    const std::vector<double> seconds =
        bench::Race({{"ours", Ours(src, dst, mode)},
                     {"libyuv", libyuv ? Libyuv(src, dst, libyuv) : bench::Work()},
                     {"libpostproc", postproc ? Postproc(src, dst, postproc) : bench::Work()},
                     {"w3fdif", w3fdif ? Avfilter(src, w3fdif) : bench::Work()}},
                    kRounds);
    bench::PrintRow(row, size.w * size.h, seconds);
}

}  // namespace

int main(int argc, char** argv) {
    const char* const wanted = argc > 1 ? argv[1] : nullptr;
    constexpr const char* kSimple = "filter=simple:mode=frame:parity=tff";
    bench::PrintHead({"ours", "libyuv", "libpostproc", "w3fdif, simple"});
    for (const Size size : {Size{1920, 1080}, Size{640, 480}}) {
        Measure(wanted, "linear", size, all, 6, YuvLinear, "li", nullptr);
        Measure(wanted, "blend", size, all, 4, YuvBlend, nullptr, nullptr);
        Measure(wanted, "mean", size, all, 5, YuvMean, nullptr, nullptr);
        Measure(wanted, "bob", size, all, 3, YuvDiscard, nullptr, nullptr);
        Measure(wanted, "discard", size, all, 2, YuvDiscard, nullptr, nullptr);
        Measure(wanted, "fast", size, all, 1, nullptr, "fd", nullptr);
        Measure(wanted, "x, still,", size, still, 7, nullptr, "md", kSimple);
        Measure(wanted, "x, a tenth moves,", size, tenth, 7, nullptr, "md", kSimple);
        Measure(wanted, "x, everything moves,", size, all, 7, nullptr, "md", kSimple);
    }
    return 0;
}
