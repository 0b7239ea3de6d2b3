// Planar 4:2:0 at another size, beside zimg, libswscale and libyuv, all of them bilinear, on the
// same pictures in the same run.
//
// usage: plane_bench [substring of the row's name]

#include <zimg.h>

#include <cstdlib>
#include <memory>
#include <string>

#include "bench/compare.h"
#include "libyuv.h"
#include "vidshow/kernels.h"

extern "C" {
#include <libswscale/swscale.h>
}

namespace {

constexpr int kRounds = 21;
constexpr size_t kAlignment = 64;  // zimg's wish, good for all

struct Size {
    int w, h;
};

struct Picture {
    explicit Picture(Size s) : size(s) {
        for (int i = 0; i < 3; ++i) {
            const size_t width = static_cast<size_t>(i == 0 ? s.w : s.w / 2);
            const size_t height = static_cast<size_t>(i == 0 ? s.h : s.h / 2);
            const size_t stride = (width + kAlignment - 1) / kAlignment * kAlignment;
            planes[i] = static_cast<uint8_t*>(std::aligned_alloc(kAlignment, stride * height));
            strides[i] = static_cast<uint32_t>(stride);
            for (size_t k = 0; k < stride * height; ++k)
                planes[i][k] = static_cast<uint8_t>(16 + k * 7 % 220);
        }
    }
    ~Picture() {
        for (uint8_t* plane : planes)
            std::free(plane);
    }
    Picture(const Picture&) = delete;
    Picture& operator=(const Picture&) = delete;

    int stride(int i) const { return static_cast<int>(strides[i]); }

    Size size;
    uint8_t* planes[3];
    uint32_t strides[3];
};

using Shared = std::shared_ptr<Picture>;

bench::Work Ours(const Shared& src, const Shared& dst) {
    return [=] {
        _QZYCbCr420Rsz(src->planes, src->strides, src->size.w, src->size.h, dst->planes,
                       dst->strides, dst->size.w, dst->size.h);
    };
}

bench::Work Libyuv(const Shared& src, const Shared& dst) {
    return [=] {
        libyuv::I420Scale(src->planes[0], src->stride(0), src->planes[1], src->stride(1),
                          src->planes[2], src->stride(2), src->size.w, src->size.h, dst->planes[0],
                          dst->stride(0), dst->planes[1], dst->stride(1), dst->planes[2],
                          dst->stride(2), dst->size.w, dst->size.h, libyuv::kFilterBilinear);
    };
}

bench::Work Swscale(const Shared& src, const Shared& dst) {
    const std::shared_ptr<SwsContext> context(
        sws_getContext(src->size.w, src->size.h, AV_PIX_FMT_YUV420P, dst->size.w, dst->size.h,
                       AV_PIX_FMT_YUV420P, SWS_FAST_BILINEAR, nullptr, nullptr, nullptr),
        sws_freeContext);
    return [=] {
        const int from[3] = {src->stride(0), src->stride(1), src->stride(2)};
        const int to[3] = {dst->stride(0), dst->stride(1), dst->stride(2)};
        sws_scale(context.get(), src->planes, from, 0, src->size.h, dst->planes, to);
    };
}

zimg_image_format ZimgFormat(Size size) {
    zimg_image_format format;
    zimg_image_format_default(&format, ZIMG_API_VERSION);
    format.width = static_cast<unsigned>(size.w);
    format.height = static_cast<unsigned>(size.h);
    format.pixel_type = ZIMG_PIXEL_BYTE;
    format.color_family = ZIMG_COLOR_YUV;
    format.subsample_w = format.subsample_h = 1;
    format.pixel_range = ZIMG_RANGE_LIMITED;
    return format;
}

bench::Work Zimg(const Shared& src, const Shared& dst) {
    zimg_graph_builder_params params;
    zimg_graph_builder_params_default(&params, ZIMG_API_VERSION);
    params.resample_filter = params.resample_filter_uv = ZIMG_RESIZE_BILINEAR;
    params.dither_type = ZIMG_DITHER_NONE;
    params.cpu_type = ZIMG_CPU_AUTO_64B;
    const zimg_image_format from = ZimgFormat(src->size), to = ZimgFormat(dst->size);
    const std::shared_ptr<zimg_filter_graph> graph(zimg_filter_graph_build(&from, &to, &params),
                                                   zimg_filter_graph_free);
    size_t bytes = 0;
    zimg_filter_graph_get_tmp_size(graph.get(), &bytes);
    bytes = (bytes + kAlignment - 1) / kAlignment * kAlignment;
    const std::shared_ptr<void> room(std::aligned_alloc(kAlignment, bytes), std::free);
    return [=] {
        zimg_image_buffer_const in = {ZIMG_API_VERSION, {}};
        zimg_image_buffer out = {ZIMG_API_VERSION, {}};
        for (int i = 0; i < 3; ++i) {
            in.plane[i] = {src->planes[i], src->stride(i), ZIMG_BUFFER_MAX};
            out.plane[i] = {dst->planes[i], dst->stride(i), ZIMG_BUFFER_MAX};
        }
        zimg_filter_graph_process(graph.get(), &in, &out, room.get(), nullptr, nullptr, nullptr,
                                  nullptr);
    };
}

void Measure(const char* wanted, Size from, Size to) {
    const auto text = [](Size s) { return std::to_string(s.w) + "x" + std::to_string(s.h); };
    const std::string row = text(from) + " to " + text(to);
    if (wanted != nullptr && row.find(wanted) == std::string::npos) return;
    const auto src = std::make_shared<Picture>(from), dst = std::make_shared<Picture>(to);
    bench::PrintRow(row, to.w * to.h,
                    bench::Race({{"ours", Ours(src, dst)},
                                 {"zimg", Zimg(src, dst)},
                                 {"libswscale", Swscale(src, dst)},
                                 {"libyuv", Libyuv(src, dst)}},
                                kRounds));
}

}  // namespace

int main(int argc, char** argv) {
    const char* const wanted = argc > 1 ? argv[1] : nullptr;
    bench::PrintHead({"ours", "zimg", "libswscale", "libyuv"});
    const Size sizes[][2] = {{{1280, 720}, {1920, 1080}}, {{640, 480}, {960, 480}},
                             {{320, 240}, {800, 480}},    {{640, 360}, {1280, 720}},
                             {{1920, 1080}, {1280, 720}}, {{1280, 720}, {852, 480}},
                             {{1280, 720}, {640, 360}}};
    for (const auto& [from, to] : sizes)
        Measure(wanted, from, to);
    return 0;
}
