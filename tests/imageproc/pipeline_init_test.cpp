#include <gtest/gtest.h>

#include <algorithm>
#include <iterator>

#include "imageproc/expected_frame.h"
#include "imageproc/support.h"
#include "testkit/capture.h"

namespace {

using imageproc_test::Params;
using imageproc_test::Processor;
using imageproc_test::VectorKernel;

constexpr uint32_t kCodes[] = {0,   3,   4,   5,   6,    7,    8,    10,   259,  515, 516,
                               517, 768, 771, 773, 1027, 1028, 1280, 2048, 2051, 2304};
constexpr char kNoConversion[] =
    "Unsupport image format conversion! \n"
    "Fail to init the platform dependent part wit ret = 0xfffffffd!\n";
constexpr char kNoRotation[] =
    "Unsupport image rotation type! \n"
    "Fail to init the platform dependent part wit ret = 0xfffffffd!\n";
constexpr char kNotThis[] =
    "Unsupport conversion!\n"
    "Fail to init the platform dependent part wit ret = 0xfffffffd!\n";
constexpr char kKeyMessage[] = "QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551 u32ColorKey = 0x101! \n";

struct Outcome {
    HRESULT result;
    bool made;
    std::string text;
};

Outcome Create(const QZ_IMAGEPROC_INIT_PARAMS& params) {
    testkit::StdoutCapture capture;
    const Processor p(params);
    return {p.result, p.handle() != nullptr, capture.text()};
}

bool Exists(uint32_t code) {
    return std::find(std::begin(kCodes), std::end(kCodes), code) != std::end(kCodes);
}

TEST(PipelineInit, MakesTheTwentyOneConversions) {
    for (const uint32_t code : kCodes) {
        const Outcome o = Create(Params(code, 16, 16, 16, 16));
        EXPECT_EQ(o.result, S_OK) << code;
        EXPECT_EQ(o.text,
                  code == 10 ? "QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551 u32ColorKey = 0x101! \n" : "")
            << code;
    }
}

TEST(PipelineInit, RefusesEveryOtherCode) {
    std::vector<uint32_t> codes;
    for (uint32_t code = 0; code < 4096; ++code)
        codes.push_back(code);
    for (const uint32_t code : kCodes) {
        codes.insert(codes.end(), {code + 0x1000, code + 0x10000, code + 0x80000000});
    }
    codes.push_back(0xFFFFFFFF);
    for (const uint32_t code : codes) {
        if (Exists(code)) continue;
        const Outcome o = Create(Params(code, 16, 16, 16, 16));
        ASSERT_EQ(o.result, E_FAIL) << code;
        ASSERT_FALSE(o.made) << code;
        ASSERT_EQ(o.text, kNoConversion) << code;
    }
}

TEST(PipelineInit, Yuy2InputFailsAtCreation) {
    for (uint32_t output = 0; output <= 10; ++output) {
        EXPECT_EQ(Create(Params(6 << 8 | output, 16, 16, 16, 16)).text, kNoConversion);
    }
}

TEST(PipelineInit, RefusesRotationsAbove5) {
    for (const uint32_t code : kCodes) {
        for (const uint32_t rotation : {6u, 7u, 32u, 0xFFFFFFFFu}) {
            QZ_IMAGEPROC_INIT_PARAMS params = Params(code, 16, 16, 16, 16);
            params.u32RotationType = rotation;
            const Outcome o = Create(params);
            EXPECT_EQ(o.result, E_FAIL) << code;
            EXPECT_EQ(o.text, code == 10 ? std::string(kKeyMessage) + kNotThis : kNoRotation)
                << code;
        }
    }
}

TEST(PipelineInit, AnUnknownConversionComesBeforeABadRotation) {
    QZ_IMAGEPROC_INIT_PARAMS params = Params(1, 16, 16, 16, 16);
    params.u32RotationType = 6;
    EXPECT_EQ(Create(params).text, kNoConversion);
}

TEST(PipelineInit, Rgb5551IsNeitherTurnedNorResized) {
    for (uint32_t rotation = 1; rotation <= 5; ++rotation) {
        QZ_IMAGEPROC_INIT_PARAMS params = Params(10, 16, 16, 16, 16);
        params.u32RotationType = rotation;
        const Outcome o = Create(params);
        EXPECT_EQ(o.result, E_FAIL);
        EXPECT_EQ(o.text, std::string(kKeyMessage) + kNotThis) << "the key is announced first";
    }
    for (const uint32_t size : {12u, 20u}) {
        EXPECT_EQ(Create(Params(10, 16, 16, size, size)).result, E_FAIL);
        EXPECT_EQ(Create(Params(10, 16, 16, 16, size)).text, std::string(kKeyMessage) + kNotThis);
    }
}

TEST(PipelineInit, Rgb5551TranslatesItsKeyAtCreation) {
    QZ_IMAGEPROC_INIT_PARAMS params = Params(10, 16, 16, 16, 16);
    params.u32ColorKey = 0x00EB8080;
    testkit::StdoutCapture capture;
    const Processor p(params);
    EXPECT_EQ(capture.text(), "QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551 u32ColorKey = 0xffff! \n");
    ASSERT_EQ(p.result, S_OK);
    EXPECT_EQ(p->u32ColorKey, 0xFFFFu);
}

uint32_t CaseOf(uint32_t w, uint32_t h, uint32_t dw, uint32_t dh, uint32_t algorithm = 1,
                uint32_t rotation = 0) {
    QZ_IMAGEPROC_INIT_PARAMS params = Params(3, w, h, dw, dh);
    params.u32ResizeAlgorithm = algorithm;
    params.u32RotationType = rotation;
    const Processor p(params);
    EXPECT_EQ(p.result, S_OK);
    return p->u32ResizeCase;
}

TEST(ResizeCase, ExactRatiosHaveCasesOfTheirOwn) {
    EXPECT_EQ(CaseOf(320, 240, 640, 480), 4u);
    EXPECT_EQ(CaseOf(320, 240, 800, 480), 5u);
    EXPECT_EQ(CaseOf(320, 240, 480, 360), 6u);
    EXPECT_EQ(CaseOf(320, 240, 480, 272), 7u);
}

TEST(ResizeCase, OneAndAHalfWideIgnoresTheHeight) {
    EXPECT_EQ(CaseOf(320, 240, 480, 100), 6u);
    EXPECT_EQ(CaseOf(320, 240, 480, 240), 6u) << "mixed before";
    EXPECT_EQ(CaseOf(320, 240, 480, 4000), 6u);
    EXPECT_EQ(CaseOf(320, 240, 480, 276), 6u);
    EXPECT_EQ(CaseOf(320, 236, 480, 272), 6u) << "not the one geometry of case 7";
}

TEST(ResizeCase, NearMissesKeepWhatTheComparisonSaid) {
    EXPECT_EQ(CaseOf(320, 240, 644, 480), 2u);
    EXPECT_EQ(CaseOf(320, 240, 640, 484), 2u);
    EXPECT_EQ(CaseOf(320, 240, 800, 484), 2u);
    EXPECT_EQ(CaseOf(320, 240, 804, 480), 2u);
    EXPECT_EQ(CaseOf(320, 240, 484, 360), 2u);
    EXPECT_EQ(CaseOf(640, 480, 320, 240), 3u);
    EXPECT_EQ(CaseOf(320, 240, 640, 200), 1u);
}

TEST(ResizeCase, AnEmptyPictureMayTurnIntoAnyRatio) {
    EXPECT_EQ(CaseOf(0, 16, 0, 32), 4u) << "0 is twice 0";
    EXPECT_EQ(CaseOf(0, 16, 0, 8), 6u);
    EXPECT_EQ(CaseOf(0, 16, 0, 16), 0u) << "equal sizes are never refined";
}

TEST(ResizeCase, OnlyLinearUprightProcessorsAreRefined) {
    for (const uint32_t algorithm : {0u, 2u, 3u, 4u, 0xFFFFFFFFu}) {
        EXPECT_EQ(CaseOf(320, 240, 640, 480, algorithm), 2u) << algorithm;
        EXPECT_EQ(CaseOf(320, 240, 480, 100, algorithm), 1u) << algorithm;
    }
    for (uint32_t rotation = 1; rotation <= 5; ++rotation) {
        EXPECT_EQ(CaseOf(320, 240, 640, 480, 1, rotation), 2u) << rotation;
        EXPECT_EQ(CaseOf(320, 240, 480, 272, 1, rotation), 2u) << rotation;
        EXPECT_EQ(CaseOf(320, 240, 480, 100, 1, rotation), 1u) << rotation;
    }
}

TEST(ResizeCase, EveryConversionIsRefinedAlike) {
    for (const uint32_t code : kCodes) {
        if (code == 10) continue;
        const Processor p(Params(code, 16, 16, 32, 32));
        EXPECT_EQ(p->u32ResizeCase, 4u) << code;
    }
}

TEST(PipelineInit, LineBuffersAreOfTheWiderPicture) {
    const Processor same(Params(3, 16, 16, 16, 16));
    EXPECT_EQ(same->pLineBlock, nullptr) << "none for equal sizes";
    EXPECT_EQ(same->pLines[0], nullptr);
    for (const uint32_t width : {8u, 40u}) {
        const Processor p(Params(3, 16, 16, width, 12));
        ASSERT_EQ(p.result, S_OK);
        for (int i = 1; i < 4; ++i) {
            EXPECT_EQ(p->pLines[i] - p->pLines[i - 1],
                      static_cast<ptrdiff_t>(std::max(width, 16u) + 4));
        }
    }
}

// Which entries of the vector kernel table a conversion is made with.
TEST(PipelineInit, ChoosesTheVectorKernelsByMatrixAndRange) {
    struct {
        uint32_t code;
        const char* main[2];
        const char* line[2];
    } const expected[] = {
        {3, {"_YCbCr420ToRGB565_P3C2_", "_YUV420ToRGB565_P3C2_"}, {}},
        {4, {"_YCbCr420ToRGB888_P3C3_", "_YUV420ToRGB888_P3C3_"}, {}},
        {5, {"_YCbCr420ToARGB32_P3C4_", "_YUV420ToARGB32_P3C4_"}, {}},
        {10, {"_YCbCr420ToRGB5551_P3C2_", "_YUV420ToRGB5551_P3C2_"}, {}},
        {768, {"_QZRGB565ToYCbCr420_C2P3_", "_QZRGB565ToYUV420_C2P3_"}, {}},
        {1280, {"_QZARGB32ToYCbCr420_C4P3_", "_QZARGB32ToYUV420_C4P3_"}, {}},
        {2304, {"_QZABGR32ToYCbCr420_C4P3_", "_QZABGR32ToYUV420_C4P3_"}, {}},
        {2051, {"_NV12ToRGB565_P3C2_", "_NV12FRToRGB565_P3C2_"}, {}},
        {259, {}, {"_convert_ycbcr2rgb_#_neon", "_convert_yuv2rgb_#_neon"}},
        {515, {}, {"_convert_ycbcr2rgb_#_neon", "_convert_yuv2rgb_#_neon"}},
        {516, {}, {"_convert_ycbcr2rgb_#_neon", "_convert_yuv2rgb_#_neon"}},
        {517, {}, {"_convert_ycbcr2rgb_#_neon", "_convert_yuv2rgb_#_neon"}},
        {0, {}, {}},
        {6, {}, {}},
        {7, {}, {}},
        {8, {}, {}},
        {771, {}, {}},
        {773, {}, {}},
        {1027, {}, {}},
        {1028, {}, {}},
        {2048, {}, {}},
    };
    ASSERT_EQ(std::size(expected), std::size(kCodes));
    testkit::StdoutCapture capture;
    for (const auto& e : expected) {
        for (uint32_t n = 0; n < 8; ++n) {
            QZ_IMAGEPROC_INIT_PARAMS params = Params(e.code, 16, 16, 16, 16);
            params.u32ColorMatrix = n % 4;
            params.u32YuvRange = n / 4;
            const Processor p(params);
            ASSERT_EQ(p.result, S_OK);
            const char* const main = e.main[n / 4];
            const char* const line = e.line[n / 4];
            EXPECT_EQ(p->pfnMain, main ? VectorKernel(main, n % 4) : nullptr) << e.code << ' ' << n;
            EXPECT_EQ(p->pfnLine, line ? VectorKernel(line, n % 4) : nullptr) << e.code << ' ' << n;
        }
    }
}

}  // namespace
