#include <gtest/gtest.h>

#include "imageproc/expected_frame.h"

namespace {

using imageproc_test::VectorKernel;

TEST(GetPFN, Rgb2YuvGoesByKindAndRange) {
    const char* const families[3][2] = {
        {"_QZRGB565ToYCbCr420_C2P3_", "_QZRGB565ToYUV420_C2P3_"},
        {"_QZARGB32ToYCbCr420_C4P3_", "_QZARGB32ToYUV420_C4P3_"},
        {"_QZABGR32ToYCbCr420_C4P3_", "_QZABGR32ToYUV420_C4P3_"},
    };
    for (uint32_t kind = 0; kind < 3; ++kind) {
        for (uint32_t r = 0; r < 2; ++r) {
            for (uint32_t m = 0; m < 4; ++m) {
                EXPECT_EQ(GetPFN_rgb2yuv(kind, m, r), VectorKernel(families[kind][r], m));
            }
        }
    }
}

TEST(GetPFN, ConvertGoesByOrderAndRange) {
    const char* const families[2][2] = {
        {"_convert_ycbcr2rgb_#_neon", "_convert_yuv2rgb_#_neon"},
        {"_convert_ycbcr2bgr_#_neon", "_convert_yuv2bgr_#_neon"},
    };
    for (uint32_t kind = 0; kind < 2; ++kind) {
        for (uint32_t r = 0; r < 2; ++r) {
            for (uint32_t m = 0; m < 4; ++m) {
                EXPECT_EQ(GetPFN_convert(kind, m, r), VectorKernel(families[kind][r], m));
            }
        }
    }
}

TEST(GetPFN, Yuv2RgbKnowsFourFormats) {
    struct {
        uint32_t format;
        const char* families[2];
    } const formats[] = {
        {3, {"_YCbCr420ToRGB565_P3C2_", "_YUV420ToRGB565_P3C2_"}},
        {4, {"_YCbCr420ToRGB888_P3C3_", "_YUV420ToRGB888_P3C3_"}},
        {5, {"_YCbCr420ToARGB32_P3C4_", "_YUV420ToARGB32_P3C4_"}},
        {10, {"_YCbCr420ToRGB5551_P3C2_", "_YUV420ToRGB5551_P3C2_"}},
    };
    for (const auto& f : formats) {
        for (uint32_t r = 0; r < 2; ++r) {
            for (uint32_t m = 0; m < 4; ++m) {
                EXPECT_EQ(GetPFN_yuv2rgb(f.format, m, r), VectorKernel(f.families[r], m));
            }
        }
    }
    for (uint32_t format = 0; format < 20; ++format) {
        if (format == 3 || format == 4 || format == 5 || format == 10) continue;
        EXPECT_EQ(GetPFN_yuv2rgb(format, 0, 0), nullptr) << format;
    }
}

TEST(GetPFN, Nv122RgbKnowsRgb565Alone) {
    for (uint32_t m = 0; m < 4; ++m) {
        EXPECT_EQ(GetPFN_nv122rgb(3, m, 0), VectorKernel("_NV12ToRGB565_P3C2_", m));
        EXPECT_EQ(GetPFN_nv122rgb(3, m, 1), VectorKernel("_NV12FRToRGB565_P3C2_", m));
    }
    for (uint32_t format = 0; format < 20; ++format) {
        if (format == 3) continue;
        EXPECT_EQ(GetPFN_nv122rgb(format, 0, 0), nullptr) << format;
    }
}

TEST(GetPFN, BeyondTheTableThereIsNothing) {
    EXPECT_EQ(GetPFN_rgb2yuv(15, 0, 0), nullptr);
    EXPECT_EQ(GetPFN_rgb2yuv(0, 120, 0), nullptr);
    EXPECT_EQ(GetPFN_convert(12, 0, 0), nullptr);
    EXPECT_EQ(GetPFN_nv122rgb(3, 16, 0), nullptr);
}

}  // namespace
