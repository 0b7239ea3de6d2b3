// One conversion of a picture of 640 x 480, over and over, for the counting of instructions: this
// library's vector kernels, or libyuv with its NEON rows.
//
// usage: neon_pixels ours|libyuv CONVERSION PASSES
//        neon_pixels list

#include <libyuv.h>

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "vidshow/kernels.h"

namespace {

constexpr int kWidth = 640, kHeight = 480;
constexpr size_t kPixels = size_t{kWidth} * kHeight;

struct Picture {
    std::vector<uint8_t> yuv = std::vector<uint8_t>(kPixels * 3 / 2, 100);
    std::vector<uint8_t> packed = std::vector<uint8_t>(kPixels * 4, 100);
    uint8_t* planes[3] = {yuv.data(), yuv.data() + kPixels, yuv.data() + kPixels * 5 / 4};
    uint8_t* pixels = packed.data();
};

constexpr uint32_t kPlanar[3] = {kWidth, kWidth / 2, kWidth / 2};
constexpr uint32_t kPaired[3] = {kWidth, kWidth, 0};

using FromI420 = int(const uint8_t*, int, const uint8_t*, int, const uint8_t*, int, uint8_t*, int,
                     int, int);
using ToI420 = int(const uint8_t*, int, uint8_t*, int, uint8_t*, int, uint8_t*, int, int, int);

template <FromI420 kPeer, int kBytes>
void PeerFrom(Picture& p) {
    kPeer(p.planes[0], kWidth, p.planes[1], kWidth / 2, p.planes[2], kWidth / 2, p.pixels,
          kWidth * kBytes, kWidth, kHeight);
}
template <ToI420 kPeer, int kBytes>
void PeerTo(Picture& p) {
    kPeer(p.pixels, kWidth * kBytes, p.planes[0], kWidth, p.planes[1], kWidth / 2, p.planes[2],
          kWidth / 2, kWidth, kHeight);
}

struct Conversion {
    const char* name;
    void (*ours)(Picture&);
    void (*libyuv)(Picture&);
};

constexpr Conversion kConversions[] = {
    {"4:2:0-RGB565",
     [](Picture& p) {
         _YCbCr420ToRGB565_P3C2_0(p.planes, kPlanar, p.pixels, kWidth * 2, kWidth, kHeight);
     },
     PeerFrom<libyuv::I420ToRGB565, 2>},
    {"4:2:0-RGB5551",
     [](Picture& p) {
         _YCbCr420ToRGB5551_P3C2_0(p.planes, kPlanar, p.pixels, kWidth * 2, kWidth, kHeight, 1);
     },
     PeerFrom<libyuv::I420ToARGB1555, 2>},
    {"NV12-RGB565",
     [](Picture& p) {
         _NV12ToRGB565_P3C2_0(p.planes, kPaired, p.pixels, kWidth * 2, kWidth, kHeight);
     },
     [](Picture& p) {
         libyuv::NV12ToRGB565(p.planes[0], kWidth, p.planes[1], kWidth, p.pixels, kWidth * 2,
                              kWidth, kHeight);
     }},
    {"4:2:0-RGB888",
     [](Picture& p) {
         _YCbCr420ToRGB888_P3C3_0(p.planes, kPlanar, p.pixels, kWidth * 3, kWidth, kHeight);
     },
     PeerFrom<libyuv::I420ToRGB24, 3>},
    {"4:2:0-ARGB32",
     [](Picture& p) {
         _YCbCr420ToARGB32_P3C4_0(p.planes, kPlanar, p.pixels, kWidth * 4, kWidth, kHeight, 255);
     },
     PeerFrom<libyuv::I420ToARGB, 4>},
    {"RGB565-4:2:0",
     [](Picture& p) {
         _QZRGB565ToYCbCr420_C2P3_0(p.pixels, kWidth * 2, p.planes, kPlanar, kWidth, kHeight);
     },
     PeerTo<libyuv::RGB565ToI420, 2>},
    {"ARGB32-4:2:0",
     [](Picture& p) {
         _QZARGB32ToYCbCr420_C4P3_0(p.pixels, kWidth * 4, p.planes, kPlanar, kWidth, kHeight);
     },
     PeerTo<libyuv::ARGBToI420, 4>},
    {"ABGR32-4:2:0",
     [](Picture& p) {
         _QZABGR32ToYCbCr420_C4P3_0(p.pixels, kWidth * 4, p.planes, kPlanar, kWidth, kHeight);
     },
     PeerTo<libyuv::ABGRToI420, 4>},
};

int List() {
    for (const Conversion& conversion : kConversions)
        std::printf("%s\n", conversion.name);
    return 0;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc == 2 && std::strcmp(argv[1], "list") == 0) return List();
    if (argc != 4) return 2;
    // Set by hand: under the emulator /proc/cpuinfo is that of another processor.
    libyuv::SetCpuFlags(libyuv::kCpuInitialized | libyuv::kCpuHasARM | libyuv::kCpuHasNEON);
    Picture picture;
    for (const Conversion& conversion : kConversions) {
        if (std::strcmp(conversion.name, argv[2]) != 0) continue;
        const auto run = std::strcmp(argv[1], "ours") == 0 ? conversion.ours : conversion.libyuv;
        for (int passes = std::atoi(argv[3]); passes > 0; --passes)
            run(picture);
        return 0;
    }
    return 2;
}
