#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <iterator>

#include "imageproc/support.h"
#include "testkit/capture.h"
#include "testkit/guarded_buffer.h"
#include "vidshow/kernels.h"

namespace {

using imageproc_test::Params;
using imageproc_test::Processor;

constexpr uint32_t kCopy = QZ_IMAGEPROC_CSC_YCBCR420_TO_YCBCR420;
constexpr char kPatching[] = "mis-aligned resolution found, patching...\n";

TEST(ImageProcessorCreate, WantsAnEmptySlotAndARecord) {
    const QZ_IMAGEPROC_INIT_PARAMS params = Params(kCopy, 16, 16, 16, 16);
    EXPECT_EQ(QZ_IMAGEPROC_Create(nullptr, 0, &params), E_INVALIDARG);
    void* handle = nullptr;
    EXPECT_EQ(QZ_IMAGEPROC_Create(&handle, 0, nullptr), E_INVALIDARG);
    EXPECT_EQ(handle, nullptr);
    int occupant = 0;
    handle = &occupant;
    EXPECT_EQ(QZ_IMAGEPROC_Create(&handle, 0, &params), E_INVALIDARG);
    EXPECT_EQ(handle, &occupant);
}

TEST(ImageProcessorCreate, RefusesARecordAbove48Bytes) {
    QZ_IMAGEPROC_INIT_PARAMS params = Params(kCopy, 16, 16, 16, 16);
    for (const uint32_t size : {49u, 52u, 0xFFFFFFFFu}) {
        params.u32Size = size;
        void* handle = nullptr;
        EXPECT_EQ(QZ_IMAGEPROC_Create(&handle, 0, &params), E_INVALIDARG) << size;
        EXPECT_EQ(handle, nullptr);
    }
}

TEST(ImageProcessorCreate, ReadsOnlyTheBytesThatTheRecordSays) {
    testkit::GuardedBuffer memory(36);  // up to u32Alpha; one byte more would fault
    QZ_IMAGEPROC_INIT_PARAMS params = Params(kCopy, 16, 16, 16, 16);
    params.u32Size = 36;
    params.u32Alpha = 0x55;
    params.u32ColorKey = 0x123456;
    params.u32ColorMatrix = 3;
    params.u32YuvRange = 1;
    std::memcpy(memory.data(), &params, memory.size());
    void* handle = nullptr;
    ASSERT_EQ(
        QZ_IMAGEPROC_Create(
            &handle, 0, static_cast<QZ_IMAGEPROC_INIT_PARAMS*>(static_cast<void*>(memory.data()))),
        S_OK);
    const auto& p = *static_cast<const QZ_IMAGEPROC_PARAMSET*>(handle);
    EXPECT_EQ(p.u32Alpha, 0x55u);
    EXPECT_EQ(p.u32ColorKey, 0u) << "what is missing counts as 0";
    EXPECT_EQ(p.u32ColorMatrix, 0u);
    EXPECT_EQ(p.u32FullRange, 0u);
    EXPECT_EQ(QZ_IMAGEPROC_Destroy(handle), S_OK);
}

TEST(ImageProcessorCreate, ARecordThatStopsInsideAFieldGivesItsLowBytes) {
    QZ_IMAGEPROC_INIT_PARAMS params = Params(kCopy, 16, 16, 16, 16);
    params.u32Size = 38;
    params.u32ColorKey = 0x12345678;
    const Processor p(params);
    ASSERT_EQ(p.result, S_OK);
    EXPECT_EQ(p->u32ColorKey, 0x5678u);
}

TEST(ImageProcessorCreate, AnEmptyRecordIsAnEmptyCopy) {
    QZ_IMAGEPROC_INIT_PARAMS params = Params(515, 16, 16, 16, 16);
    params.u32Size = 0;
    const Processor p(params);
    ASSERT_EQ(p.result, S_OK);
    EXPECT_EQ(p->u32CscType, kCopy);
    EXPECT_EQ(p->u32InWidth, 0u);
}

TEST(ImageProcessorCreate, TheReservedArgumentIsNotRead) {
    const QZ_IMAGEPROC_INIT_PARAMS params = Params(kCopy, 16, 16, 16, 16);
    void* handle = nullptr;
    ASSERT_EQ(QZ_IMAGEPROC_Create(&handle, 0xFFFFFFFF, &params), S_OK);
    QZ_IMAGEPROC_Destroy(handle);
}

TEST(ImageProcessorCreate, Odd174x100WorksOn172x100AndSaysSoOnce) {
    testkit::StdoutCapture capture;
    const Processor p(Params(kCopy, 174, 100, 174, 100));
    EXPECT_EQ(capture.text(), kPatching);
    ASSERT_EQ(p.result, S_OK);
    EXPECT_EQ(p->u32GivenInWidth, 174u);
    EXPECT_EQ(p->u32GivenInHeight, 100u);
    EXPECT_EQ(p->u32GivenOutWidth, 174u);
    EXPECT_EQ(p->u32GivenOutHeight, 100u);
    EXPECT_EQ(p->u32InWidth, 172u);
    EXPECT_EQ(p->u32InHeight, 100u);
    EXPECT_EQ(p->u32OutWidth, 172u);
    EXPECT_EQ(p->u32OutHeight, 100u);
}

TEST(ImageProcessorCreate, AnyOneOfTheSizesPatchesAllFour) {
    for (int odd = 0; odd < 4; ++odd) {
        for (uint32_t low = 1; low < 4; ++low) {
            uint32_t size[4] = {32, 48, 64, 80};
            size[odd] += low;
            testkit::StdoutCapture capture;
            const Processor p(Params(kCopy, size[0], size[1], size[2], size[3]));
            EXPECT_EQ(capture.text(), kPatching) << odd;
            ASSERT_EQ(p.result, S_OK);
            EXPECT_EQ(p->u32InWidth, 32u);
            EXPECT_EQ(p->u32InHeight, 48u);
            EXPECT_EQ(p->u32OutWidth, 64u);
            EXPECT_EQ(p->u32OutHeight, 80u);
        }
    }
}

TEST(ImageProcessorCreate, SizesThatDifferOnlyInTheLowBitsAreEqual) {
    testkit::StdoutCapture capture;
    const Processor p(Params(kCopy, 33, 49, 34, 51));
    ASSERT_EQ(p.result, S_OK);
    EXPECT_EQ(p->u32ResizeCase, 0u) << "all further work uses the rounded sizes";
}

TEST(ImageProcessorCreate, AlignedSizesSayNothing) {
    testkit::StdoutCapture capture;
    const Processor p(Params(kCopy, 32, 48, 64, 80));
    EXPECT_EQ(capture.text(), "");
}

TEST(ImageProcessorCreate, StoresWhatItWasGiven) {
    QZ_IMAGEPROC_INIT_PARAMS params = Params(kCopy, 16, 32, 48, 64);
    params.u32RotationType = 4;
    params.u32ResizeAlgorithm = 0x80000007;
    params.u32Alpha = 0x1FF;
    params.u32ColorKey = 0x00ABCDEF;
    params.u32ColorMatrix = 2;
    params.u32YuvRange = 1;
    testkit::StdoutCapture capture;
    const Processor p(params);
    EXPECT_EQ(capture.text(), "") << "the key is translated for RGB5551 alone";
    ASSERT_EQ(p.result, S_OK);
    EXPECT_EQ(p->u32CscType, kCopy);
    EXPECT_EQ(p->u32RotationType, 4u);
    EXPECT_EQ(p->u32ResizeAlgorithm, 0x80000007u);
    EXPECT_EQ(p->u32Alpha, 0x1FFu);
    EXPECT_EQ(p->u32ColorKey, 0x00ABCDEFu);
    EXPECT_EQ(p->u32ColorMatrix, 2u);
    EXPECT_EQ(p->u32FullRange, 1u);
    EXPECT_EQ(p->pYuvToRgb, csc_coef[9]);
    EXPECT_EQ(p->pRgbToYuv, csc_coef[11]);
    EXPECT_EQ(p->i32Brightness, 128);
    EXPECT_EQ(p->i32Contrast, 128);
    EXPECT_EQ(p->i32Saturation, 128);
    EXPECT_EQ(p->u32AdjustActive, 0u);
    EXPECT_EQ(p->pAdjustBlock, nullptr);
    EXPECT_EQ(p->u32DeinterlaceMode, 0u);
    EXPECT_EQ(p->pReservedBlock, nullptr);
}

TEST(ImageProcessorCreate, TheDeinterlaceImageHasFourAlignedPlanes) {
    const Processor p(Params(kCopy, 36, 20, 36, 20));
    ASSERT_EQ(p.result, S_OK);
    EXPECT_EQ(p->u32DeinterlaceStride, 48u) << "the width rounded up to 16";
    EXPECT_EQ(p->u32DeinterlaceHeight, 20u);
    const uintptr_t block = reinterpret_cast<uintptr_t>(p->pDeinterlaceBlock);
    for (size_t i = 0; i < 4; ++i) {
        EXPECT_EQ(reinterpret_cast<uintptr_t>(p->pDeinterlacePlanes[i]),
                  (block + 15) / 16 * 16 + i * 48 * 20);
    }
    // The last byte of the last plane is ours.
    p->pDeinterlacePlanes[3][48 * 20 - 1] = 1;
}

TEST(ImageProcessorCreate, ComparesTheSizes) {
    struct {
        uint32_t inWidth, inHeight, outWidth, outHeight, expected;
    } const cases[] = {
        {320, 240, 320, 240, 0}, {320, 240, 324, 244, 2}, {640, 480, 320, 240, 3},
        {320, 240, 640, 200, 1}, {320, 240, 320, 244, 1}, {320, 240, 324, 240, 1},
        {320, 240, 320, 236, 1}, {320, 240, 316, 240, 1}, {320, 240, 316, 244, 1},
        {0, 0, 0, 0, 0},         {0, 0, 4, 4, 2},
    };
    for (const auto& c : cases) {
        QZ_IMAGEPROC_INIT_PARAMS params =
            Params(kCopy, c.inWidth, c.inHeight, c.outWidth, c.outHeight);
        params.u32ResizeAlgorithm = QZ_IMAGEPROC_RESIZE_NEAREST;  // no refinement
        const Processor p(params);
        ASSERT_EQ(p.result, S_OK);
        EXPECT_EQ(p->u32ResizeCase, c.expected)
            << c.inWidth << 'x' << c.inHeight << " to " << c.outWidth << 'x' << c.outHeight;
    }
}

TEST(ImageProcessorCreate, SizesAreComparedSigned) {
    QZ_IMAGEPROC_INIT_PARAMS params = Params(kCopy, 16, 16, 0xFFFFFFF0, 0xFFFFFFF0);
    params.u32ResizeAlgorithm = QZ_IMAGEPROC_RESIZE_NEAREST;
    const Processor p(params);
    ASSERT_EQ(p.result, S_OK);
    EXPECT_EQ(p->u32ResizeCase, 3u) << "-16 is smaller than 16";
}

// 4 x 2^32 x 2^32 bytes fit no address, so there is no memory for the image.
TEST(ImageProcessorCreate, AnImageBeyondEveryAddressIsOutOfMemory) {
    testkit::StdoutCapture capture;
    const Processor p(Params(kCopy, 0xFFFFFFFC, 0xFFFFFFFC, 16, 16));
    EXPECT_EQ(capture.text(), "Fail to allocate memory for temp image buf for deinterlaced!\n");
    EXPECT_EQ(p.result, E_OUTOFMEMORY);
    EXPECT_EQ(p.handle(), nullptr);
}

TEST(ImageProcessorCreate, TheWalkerHasItsRecordsSize) {
    const Processor p(Params(kCopy, 16, 16, 16, 16));
    ASSERT_EQ(p.result, S_OK);
    EXPECT_EQ(p->u32WalkerSize, 13 * sizeof(void*));
    EXPECT_NE(p->pWalker, nullptr);
}

TEST(ImageProcessor, TheRecordKeepsTheOrderOfItsFields) {
#define AT(field) offsetof(QZ_IMAGEPROC_PARAMSET, field)
    const size_t offsets[] = {AT(u32CscType),
                              AT(u32RotationType),
                              AT(u32ResizeAlgorithm),
                              AT(u32ResizeCase),
                              AT(u32ColorMatrix),
                              AT(u32FullRange),
                              AT(pYuvToRgb),
                              AT(pRgbToYuv),
                              AT(i32Brightness),
                              AT(i32Contrast),
                              AT(i32Saturation),
                              AT(u32AdjustActive),
                              AT(pAdjustBlock),
                              AT(pAdjustLumaTable),
                              AT(pAdjustChromaTable),
                              AT(pTransBlock),
                              AT(pTransLuma),
                              AT(pTransCb),
                              AT(pTransCr),
                              AT(pReservedBlock),
                              AT(u32GivenInWidth),
                              AT(u32GivenInHeight),
                              AT(u32GivenOutWidth),
                              AT(u32GivenOutHeight),
                              AT(u32InWidth),
                              AT(u32InHeight),
                              AT(u32OutWidth),
                              AT(u32OutHeight),
                              AT(pLineBlock),
                              AT(pLines[0]),
                              AT(pLines[1]),
                              AT(pLines[2]),
                              AT(pLines[3]),
                              AT(u32Alpha),
                              AT(u32ColorKey),
                              AT(u32DeinterlaceMode),
                              AT(pDeinterlaceBlock),
                              AT(pDeinterlacePlanes[0]),
                              AT(pDeinterlacePlanes[1]),
                              AT(pDeinterlacePlanes[2]),
                              AT(pDeinterlacePlanes[3]),
                              AT(u32DeinterlaceStride),
                              AT(u32DeinterlaceHeight),
                              AT(u32WalkerSize),
                              AT(pWalker),
                              AT(pfnMain),
                              AT(pfnLine)};
#undef AT
    EXPECT_TRUE(std::is_sorted(std::begin(offsets), std::end(offsets)));
    if (sizeof(void*) == 4) {
        EXPECT_EQ(sizeof(QZ_IMAGEPROC_PARAMSET), 4 * std::size(offsets)) << "a word each";
    }
}

TEST(ImageProcessor, InterfaceIdentifier) {
    EXPECT_EQ(IID_QZ_IMAGEPROC_C.Data1, 0x17A12BC8u);
    EXPECT_EQ(IID_QZ_IMAGEPROC_C.Data2, 0xDF53);
    EXPECT_EQ(IID_QZ_IMAGEPROC_C.Data3, 0x4AC7);
    const uint8_t tail[8] = {0xBA, 0xCF, 0xE8, 0x54, 0x74, 0x24, 0x27, 0xAE};
    EXPECT_EQ(std::memcmp(IID_QZ_IMAGEPROC_C.Data4, tail, sizeof tail), 0);
}

}  // namespace
