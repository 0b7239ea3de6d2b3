// Vector kernels beside libyuv and libswscale: one thread, the same run, the same pictures. Prints
// one line per conversion and picture: our time, and each peer's over ours.
//
// usage: vector_bench [--backend NAME] [--rounds N]
//
// In cache: 640 x 480, over and over. Out of cache: 1920 x 1080, a ring of pictures larger than any
// cache. The peers' arithmetic differs in the last bits; formats and sizes are the same.

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <random>
#include <string>
#include <vector>

extern "C" {
#include <libswscale/swscale.h>
}
#include <libyuv.h>

#include "bench/compare.h"
#include "kernels/vec_backend.h"
#include "vidshow/kernels.h"

namespace {

/// One picture's memory: planes Y, Cb, Cr; planes Y and pairs; packed pixels.
struct Frame {
    std::vector<uint8_t> yuv, packed;
    uint8_t* planes[3];
    uint32_t strides[3];
    uint32_t packedStride;
};

struct Picture {
    int width, height;
    size_t ring;
    const char* name;
};

constexpr Picture kPictures[] = {{640, 480, 1, "640x480 in cache"},
                                 {1920, 1080, 8, "1920x1080 out of cache"}};

struct Row {
    const char* name;
    int bytes;  // of a packed pixel
    bool nv12, toPlanes;
    std::function<void(Frame&, int, int)> ours, libyuv;
    AVPixelFormat source, target;
};

Frame MakeFrame(const Row& row, int w, int h, std::mt19937& random) {
    Frame f;
    const size_t luma = static_cast<size_t>(w) * static_cast<size_t>(h);
    f.yuv.resize(luma * 3 / 2);
    f.packed.resize(luma * static_cast<size_t>(row.bytes));
    for (uint8_t& b : f.yuv)
        b = static_cast<uint8_t>(random());
    for (uint8_t& b : f.packed)
        b = static_cast<uint8_t>(random());
    f.planes[0] = f.yuv.data();
    f.planes[1] = f.planes[0] + luma;
    f.planes[2] = row.nv12 ? nullptr : f.planes[1] + luma / 4;
    f.strides[0] = static_cast<uint32_t>(w);
    f.strides[1] = f.strides[2] = static_cast<uint32_t>(row.nv12 ? w : w / 2);
    f.packedStride = static_cast<uint32_t>(w * row.bytes);
    return f;
}

int Int(uint32_t x) {
    return static_cast<int>(x);
}

template <class Kernel>
std::function<void(Frame&, int, int)> ToPixels(Kernel* kernel) {
    return [=](Frame& f, int w, int h) {
        kernel(f.planes, f.strides, f.packed.data(), f.packedStride, w, h);
    };
}
template <class Kernel>
std::function<void(Frame&, int, int)> ToPixels(Kernel* kernel, uint32_t extra) {
    return [=](Frame& f, int w, int h) {
        kernel(f.planes, f.strides, f.packed.data(), f.packedStride, w, h, extra);
    };
}
template <class Kernel>
std::function<void(Frame&, int, int)> ToPlanes(Kernel* kernel) {
    return [=](Frame& f, int w, int h) {
        kernel(f.packed.data(), f.packedStride, f.planes, f.strides, w, h);
    };
}

using FromI420 = int(const uint8_t*, int, const uint8_t*, int, const uint8_t*, int, uint8_t*, int,
                     int, int);
std::function<void(Frame&, int, int)> PeerFrom(FromI420* kernel) {
    return [=](Frame& f, int w, int h) {
        kernel(f.planes[0], Int(f.strides[0]), f.planes[1], Int(f.strides[1]), f.planes[2],
               Int(f.strides[2]), f.packed.data(), Int(f.packedStride), w, h);
    };
}
using ToI420 = int(const uint8_t*, int, uint8_t*, int, uint8_t*, int, uint8_t*, int, int, int);
std::function<void(Frame&, int, int)> PeerTo(ToI420* kernel) {
    return [=](Frame& f, int w, int h) {
        kernel(f.packed.data(), Int(f.packedStride), f.planes[0], Int(f.strides[0]), f.planes[1],
               Int(f.strides[1]), f.planes[2], Int(f.strides[2]), w, h);
    };
}
void PeerNv12(Frame& f, int w, int h) {
    libyuv::NV12ToRGB565(f.planes[0], Int(f.strides[0]), f.planes[1], Int(f.strides[1]),
                         f.packed.data(), Int(f.packedStride), w, h);
}

std::vector<Row> Rows() {
    constexpr AVPixelFormat kI420 = AV_PIX_FMT_YUV420P;
    return {
        {"4:2:0 -> RGB565", 2, false, false, ToPixels(_YCbCr420ToRGB565_P3C2_0),
         PeerFrom(libyuv::I420ToRGB565), kI420, AV_PIX_FMT_RGB565LE},
        {"4:2:0 -> RGB5551", 2, false, false, ToPixels(_YCbCr420ToRGB5551_P3C2_0, 1),
         PeerFrom(libyuv::I420ToARGB1555), kI420, AV_PIX_FMT_RGB555LE},
        {"NV12 -> RGB565", 2, true, false, ToPixels(_NV12ToRGB565_P3C2_0), PeerNv12,
         AV_PIX_FMT_NV12, AV_PIX_FMT_RGB565LE},
        {"4:2:0 -> RGB888", 3, false, false, ToPixels(_YCbCr420ToRGB888_P3C3_0),
         PeerFrom(libyuv::I420ToRGB24), kI420, AV_PIX_FMT_BGR24},
        {"4:2:0 -> ARGB32", 4, false, false, ToPixels(_YCbCr420ToARGB32_P3C4_0, 255),
         PeerFrom(libyuv::I420ToARGB), kI420, AV_PIX_FMT_BGRA},
        {"RGB565 -> 4:2:0", 2, false, true, ToPlanes(_QZRGB565ToYCbCr420_C2P3_0),
         PeerTo(libyuv::RGB565ToI420), AV_PIX_FMT_RGB565LE, kI420},
        {"ARGB32 -> 4:2:0", 4, false, true, ToPlanes(_QZARGB32ToYCbCr420_C4P3_0),
         PeerTo(libyuv::ARGBToI420), AV_PIX_FMT_BGRA, kI420},
        {"ABGR32 -> 4:2:0", 4, false, true, ToPlanes(_QZABGR32ToYCbCr420_C4P3_0),
         PeerTo(libyuv::ABGRToI420), AV_PIX_FMT_RGBA, kI420},
    };
}

std::function<void(Frame&, int, int)> PeerSws(const Row& row, int w, int h) {
    SwsContext* const context = sws_getContext(w, h, row.source, w, h, row.target,
                                               SWS_FAST_BILINEAR, nullptr, nullptr, nullptr);
    if (context == nullptr) {
        std::fprintf(stderr, "libswscale has no %s\n", row.name);
        std::exit(1);
    }
    return [context, toPlanes = row.toPlanes](Frame& f, int, int height) {
        uint8_t* packed[3] = {f.packed.data(), nullptr, nullptr};
        const int packedStrides[3] = {Int(f.packedStride), 0, 0};
        const int strides[3] = {Int(f.strides[0]), Int(f.strides[1]), Int(f.strides[2])};
        if (toPlanes) {
            sws_scale(context, packed, packedStrides, 0, height, f.planes, strides);
        } else {
            sws_scale(context, f.planes, strides, 0, height, packed, packedStrides);
        }
    };
}

void Measure(const Row& row, const Picture& picture, int rounds) {
    std::mt19937 random(1);
    std::vector<Frame> ring;
    for (size_t i = 0; i < picture.ring; ++i) {
        ring.push_back(MakeFrame(row, picture.width, picture.height, random));
    }
    // The next picture of the ring every time: out of cache, all others lie between two visits.
    const auto work = [&](const std::function<void(Frame&, int, int)>& run) -> bench::Work {
        return [&, run, i = size_t{0}]() mutable {
            run(ring[i++ % ring.size()], picture.width, picture.height);
        };
    };
    bench::PrintRow(std::string(row.name) + ", " + picture.name, picture.width * picture.height,
                    bench::Race({{"ours", work(row.ours)},
                                 {"libyuv", work(row.libyuv)},
                                 {"libswscale", work(PeerSws(row, picture.width, picture.height))}},
                                rounds));
}

}  // namespace

int main(int argc, char** argv) {
    int rounds = 25;
    for (int i = 1; i + 1 < argc; i += 2) {
        if (std::strcmp(argv[i], "--rounds") == 0) rounds = std::max(1, std::atoi(argv[i + 1]));
        if (std::strcmp(argv[i], "--backend") != 0) continue;
        const vidshow::VectorBackend* const backend = vidshow::FindVectorBackend(argv[i + 1]);
        if (backend == nullptr) {
            std::fprintf(stderr, "no back end %s here\n", argv[i + 1]);
            return 1;
        }
        vidshow::UseVectorBackend(backend);
    }
    std::printf("Back end %s\n\n", vidshow::ActiveVectorBackend().name);
    bench::PrintHead({"ours", "libyuv", "libswscale"});
    for (const Row& row : Rows()) {
        for (const Picture& picture : kPictures)
            Measure(row, picture, rounds);
    }
}
