// Planar 4:2:0 (I420) to a picture that viewers open, resized on the way:
//     desktop_converter IN.yuv WIDTH HEIGHT OUT.ppm NEWWIDTH NEWHEIGHT
// Without arguments it makes a picture of its own and prints some pixels. Sizes are multiples of 4.

#include <cstdio>
#include <cstdlib>
#include <vector>

#include "vidshow/imageproc.h"

namespace {

using Bytes = std::vector<uint8_t>;

struct Size {
    uint32_t width, height;
};

// Bytes B, G, R, A; empty when the engine refuses.
Bytes ToPixels(Bytes yuv, Size from, Size to) {
    QZ_IMAGEPROC_INIT_PARAMS params{};
    params.u32Size = sizeof params;
    params.u32CscType = QZ_IMAGEPROC_CSC_YCBCR420_TO_ARGB32;
    params.u32ResizeAlgorithm = QZ_IMAGEPROC_RESIZE_LINEAR;
    params.u32InWidth = from.width;
    params.u32InHeight = from.height;
    params.u32OutWidth = to.width;
    params.u32OutHeight = to.height;
    params.u32Alpha = 255;
    params.u32ColorMatrix = QZ_IMAGEPROC_MATRIX_BT601;
    void* processor = nullptr;  // one for as many frames as there are
    if (QZ_IMAGEPROC_Create(&processor, 0, &params) != 0) return {};

    const size_t luma = size_t{from.width} * from.height;
    uint8_t* const planes[3] = {yuv.data(), yuv.data() + luma, yuv.data() + luma * 5 / 4};
    const uint32_t strides[3] = {from.width, from.width / 2, from.width / 2};
    Bytes pixels(size_t{to.width} * to.height * 4);
    uint8_t* const out[3] = {pixels.data(), nullptr, nullptr};
    const uint32_t outStrides[3] = {to.width * 4, 0, 0};
    const QZ_IMAGEPROC_FRAME_PARAMS frame{sizeof frame, 0, 0};
    if (QZ_IMAGEPROC_ProcessFrame(processor, planes, strides, out, outStrides, &frame) != 0)
        pixels.clear();
    QZ_IMAGEPROC_Destroy(processor);
    return pixels;
}

int ConvertFile(char** names, Size from, Size to) {
    Bytes yuv(size_t{from.width} * from.height * 3 / 2);
    std::FILE* const in = std::fopen(names[1], "rb");
    if (in == nullptr || std::fread(yuv.data(), 1, yuv.size(), in) != yuv.size()) return 1;
    std::fclose(in);
    const Bytes pixels = ToPixels(yuv, from, to);
    std::FILE* const out = std::fopen(names[4], "wb");
    if (out == nullptr || pixels.empty()) return 1;
    std::fprintf(out, "P6\n%u %u\n255\n", to.width, to.height);
    for (size_t i = 0; i < pixels.size(); i += 4) {
        const uint8_t rgb[3] = {pixels[i + 2], pixels[i + 1], pixels[i]};
        std::fwrite(rgb, 1, sizeof rgb, out);
    }
    return std::fclose(out);
}

uint32_t Number(const char* text) {
    return static_cast<uint32_t>(std::strtoul(text, nullptr, 10));
}

}  // namespace

int main(int argc, char** argv) {
    if (argc == 7)
        return ConvertFile(argv, {Number(argv[2]), Number(argv[3])},
                           {Number(argv[5]), Number(argv[6])});

    Bytes yuv(64 * 48 * 3 / 2, 128);  // white to the left, black to the right
    for (size_t i = 0; i < 64 * 48; ++i)
        yuv[i] = i % 64 < 32 ? 235 : 16;
    const Bytes pixels = ToPixels(yuv, {64, 48}, {48, 32});
    if (pixels.empty()) return 1;
    for (size_t x = 0; x < 48; x += 47) {
        const uint8_t* const p = &pixels[(16 * 48 + x) * 4];
        std::printf("column %zu: red %d, green %d, blue %d, alpha %d\n", x, p[2], p[1], p[0], p[3]);
    }
    return 0;
}
