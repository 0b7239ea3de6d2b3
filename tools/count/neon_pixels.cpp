// One conversion to a picture of 640 x 480, over and over, for the counting of instructions: this
// library's vector kernels, the same work by its portable forms, or libyuv with its NEON rows.
//
// usage: neon_pixels ours|portable|libyuv CONVERSION PASSES
//        neon_pixels list

#include <libyuv.h>

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "kernels/vec_backend.h"
#include "vidshow/imageproc.h"
#include "vidshow/kernels.h"

namespace {

constexpr int kWidth = 640, kHeight = 480;
constexpr size_t kPixels = size_t{kWidth} * kHeight;
constexpr int kSmallWidth = 426, kSmallHeight = 320;  // two thirds

/// Planar 4:2:0, twice, and packed pixels of up to 32 bits, twice.
struct Picture {
    std::vector<uint8_t> yuv = std::vector<uint8_t>(kPixels * 3, 100);
    std::vector<uint8_t> packed = std::vector<uint8_t>(kPixels * 8, 100);
    uint8_t* planes[3] = {yuv.data(), yuv.data() + kPixels, yuv.data() + kPixels * 5 / 4};
    uint8_t* others[3] = {planes[0] + kPixels * 3 / 2, planes[1] + kPixels * 3 / 2,
                          planes[2] + kPixels * 3 / 2};
    uint8_t* pixels = packed.data();
    uint8_t* otherPixels = pixels + kPixels * 4;

    /// A processor that converts without adjustment, BT.601 in limited range.
    QZ_IMAGEPROC_PARAMSET processor{};
    uint16_t luma[256];
    uint32_t cb[256], cr[256];
    std::vector<uint32_t> line = std::vector<uint32_t>(4 * (kWidth + 2));
    uint32_t* lines[4];

    Picture() {
        set_transtable(csc_coef[0], luma, cb, cr, 128, 128, 128);
        processor.pTransLuma = luma;
        processor.pTransCb = cb;
        processor.pTransCr = cr;
        for (int i = 0; i < 4; ++i)
            lines[i] = line.data() + i * (kWidth + 2);
    }
};

constexpr uint32_t kPlanar[3] = {kWidth, kWidth / 2, kWidth / 2};
constexpr uint32_t kSmall[3] = {kSmallWidth, kSmallWidth / 2, kSmallWidth / 2};
constexpr uint32_t kPaired[3] = {kWidth, kWidth, 0};

using FromI420 = int(const uint8_t*, int, const uint8_t*, int, const uint8_t*, int, uint8_t*, int,
                     int, int);
using ToI420 = int(const uint8_t*, int, uint8_t*, int, uint8_t*, int, uint8_t*, int, int, int);

uint16_t* Words(uint8_t* bytes) {
    return static_cast<uint16_t*>(static_cast<void*>(bytes));
}

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

/// The other planes, from the small picture in the first.
void PeerScaled(Picture& p) {
    libyuv::I420Scale(p.planes[0], kSmallWidth, p.planes[1], kSmallWidth / 2, p.planes[2],
                      kSmallWidth / 2, kSmallWidth, kSmallHeight, p.others[0], kWidth, p.others[1],
                      kWidth / 2, p.others[2], kWidth / 2, kWidth, kHeight,
                      libyuv::kFilterBilinear);
}
template <FromI420 kPeer, int kBytes>
void PeerScaledFrom(Picture& p) {
    PeerScaled(p);
    kPeer(p.others[0], kWidth, p.others[1], kWidth / 2, p.others[2], kWidth / 2, p.pixels,
          kWidth * kBytes, kWidth, kHeight);
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
    {"turn,_8_bits",
     [](Picture& p) {
         QZ_ImageRotate_90C_u8(p.planes[0], kHeight, p.others[0], kWidth, kHeight, kWidth);
     },
     [](Picture& p) {
         libyuv::RotatePlane90(p.planes[0], kHeight, p.others[0], kWidth, kHeight, kWidth);
     }},
    {"turn,_16_bits",
     [](Picture& p) {
         QZ_ImageRotate_90C_u16(p.pixels, kHeight * 2, p.otherPixels, kWidth * 2, kHeight, kWidth);
     },
     [](Picture& p) {
         libyuv::RotatePlane_16(Words(p.pixels), kHeight, Words(p.otherPixels), kWidth, kHeight,
                                kWidth, libyuv::kRotate90);
     }},
    {"turn,_32_bits",
     [](Picture& p) {
         QZ_ImageRotate_90C_u32(p.pixels, kHeight * 4, p.otherPixels, kWidth * 4, kHeight, kWidth);
     },
     [](Picture& p) {
         libyuv::ARGBRotate(p.pixels, kHeight * 4, p.otherPixels, kWidth * 4, kHeight, kWidth,
                            libyuv::kRotate90);
     }},
    {"4:2:0-RGB565_(tables)",
     [](Picture& p) {
         _QZYCbCr420ToRGB565(&p.processor, p.planes, kPlanar, kWidth, kHeight, p.pixels,
                             kWidth * 2);
     },
     PeerFrom<libyuv::I420ToRGB565, 2>},
    {"4:2:0-ARGB32_(tables)",
     [](Picture& p) {
         _QZYCbCr420ToARGB32(&p.processor, p.planes, kPlanar, kWidth, kHeight, p.pixels, kWidth * 4,
                             255);
     },
     PeerFrom<libyuv::I420ToARGB, 4>},
    {"4:2:0_x_1.5",
     [](Picture& p) {
         _QZYCbCr420Rsz(p.planes, kSmall, kSmallWidth, kSmallHeight, p.others, kPlanar, kWidth,
                        kHeight);
     },
     PeerScaled},
    {"4:2:0_x_1.5-RGB565_(RszUp)",
     [](Picture& p) {
         _QZYCbCr420ToRGB565RszUp(&p.processor, p.lines, p.planes, kSmall, kSmallWidth,
                                  kSmallHeight, p.pixels, kWidth * 2, kWidth, kHeight);
     },
     PeerScaledFrom<libyuv::I420ToRGB565, 2>},
    {"4:2:0_x_1.5-ARGB32_(RszUp)",
     [](Picture& p) {
         _QZYCbCr420ToARGB32RszUp(&p.processor, p.lines, p.planes, kSmall, kSmallWidth,
                                  kSmallHeight, p.pixels, kWidth * 4, kWidth, kHeight, 255);
     },
     PeerScaledFrom<libyuv::I420ToARGB, 4>},
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
    if (std::strcmp(argv[1], "portable") == 0) {
        vidshow::UseVectorBackend(vidshow::FindVectorBackend("scalar"));
    }
    Picture picture;
    for (const Conversion& conversion : kConversions) {
        if (std::strcmp(conversion.name, argv[2]) != 0) continue;
        const auto run = std::strcmp(argv[1], "libyuv") == 0 ? conversion.libyuv : conversion.ours;
        for (int passes = std::atoi(argv[3]); passes > 0; --passes)
            run(picture);
        return 0;
    }
    return 2;
}
