// What an image processor takes from the heap, beside the sum of its blocks, as a table.

#include <malloc.h>

#include <algorithm>
#include <cstdio>

#include "vidshow/imageproc.h"

namespace {

struct Sizes {
    uint32_t inWidth, inHeight, outWidth, outHeight;
};

size_t InUse() {
    const struct mallinfo2 info = mallinfo2();
    return info.uordblks + info.hblkhd;  // those that are mapped by themselves, too
}

/// The record, the picture that deinterlacing writes, the translation tables, the line buffers of
/// what is resized, and the walker.
size_t Formula(const Sizes& s, uint32_t algorithm) {
    const size_t picture = size_t{4} * ((s.inWidth + 15) / 16 * 16) * s.inHeight + 15;
    const bool resized = s.inWidth != s.outWidth || s.inHeight != s.outHeight;
    const bool larger = s.outWidth > s.inWidth && s.outHeight > s.inHeight;
    const size_t words = algorithm == QZ_IMAGEPROC_RESIZE_NEARLINEAR && larger ? 8 : 4;
    const size_t lines = words * 4 * (std::max(s.inWidth, s.outWidth) + 4) + 4;
    return sizeof(QZ_IMAGEPROC_PARAMSET) + picture + 2564 + (resized ? lines : 0) +
           13 * sizeof(void*);
}

void Measure(const Sizes& s, uint32_t algorithm) {
    QZ_IMAGEPROC_INIT_PARAMS params = {};
    params.u32Size = sizeof params;
    params.u32InWidth = s.inWidth;
    params.u32InHeight = s.inHeight;
    params.u32OutWidth = s.outWidth;
    params.u32OutHeight = s.outHeight;
    params.u32ResizeAlgorithm = algorithm;
    const size_t before = InUse();
    void* processor = nullptr;
    if (QZ_IMAGEPROC_Create(&processor, 0, &params) != S_OK) {
        std::printf("| %ux%u to %ux%u: refused |\n", s.inWidth, s.inHeight, s.outWidth,
                    s.outHeight);
        return;
    }
    std::printf("| %ux%u to %ux%u%s | %zu | %zu |\n", s.inWidth, s.inHeight, s.outWidth,
                s.outHeight, algorithm == QZ_IMAGEPROC_RESIZE_NEARLINEAR ? ", near-linear" : "",
                InUse() - before, Formula(s, algorithm));
    QZ_IMAGEPROC_Destroy(processor);
}

}  // namespace

int main() {
    std::puts("| processor | bytes taken | its blocks |\n|---|--:|--:|");
    for (const Sizes& s : {Sizes{176, 144, 176, 144},
                           {640, 480, 960, 480},
                           {320, 240, 800, 480},
                           {1280, 720, 1920, 1080},
                           {1920, 1080, 1280, 720},
                           {3840, 2160, 3840, 2160}}) {
        Measure(s, QZ_IMAGEPROC_RESIZE_LINEAR);
    }
    Measure({1280, 720, 1920, 1080}, QZ_IMAGEPROC_RESIZE_NEARLINEAR);
}
