#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "imageproc/support.h"
#include "testkit/guarded_buffer.h"

namespace {

using imageproc_test::Params;
using imageproc_test::Processor;

// A processor whose conversion code is changed after creation, so that every pair of formats can be
// asked, and planes that are large enough for any of them.
class ProcessFrame : public testing::Test {
  protected:
    HRESULT Run() {
        return QZ_IMAGEPROC_ProcessFrame(p.handle(), src, srcStride, dst, dstStride, &frame);
    }
    HRESULT RunAs(uint32_t code) {
        p->u32CscType = code;
        return Run();
    }

    Processor p{Params(QZ_IMAGEPROC_CSC_YCBCR420_TO_YCBCR420, 16, 16, 16, 16)};
    std::vector<uint8_t> in = std::vector<uint8_t>(3 * 16 * 64, 0x33);
    std::vector<uint8_t> out = std::vector<uint8_t>(3 * 16 * 64, 0xEE);
    uint8_t* src[3] = {&in[0], &in[1024], &in[2048]};
    uint8_t* dst[3] = {&out[0], &out[1024], &out[2048]};
    uint32_t srcStride[3] = {64, 64, 64};
    uint32_t dstStride[3] = {64, 64, 64};
    QZ_IMAGEPROC_FRAME_PARAMS frame = {12, 1, 0};
};

TEST_F(ProcessFrame, NullHandleOrRecordIs1) {
    EXPECT_EQ(QZ_IMAGEPROC_ProcessFrame(nullptr, src, srcStride, dst, dstStride, &frame), 1);
    EXPECT_EQ(QZ_IMAGEPROC_ProcessFrame(p.handle(), src, srcStride, dst, dstStride, nullptr), 1);
}

TEST_F(ProcessFrame, ARecordOf13BytesIs2) {
    frame.u32Size = 13;
    EXPECT_EQ(Run(), 2);
    frame.u32Size = 0xFFFFFFFF;
    EXPECT_EQ(Run(), 2);
    frame.u32Size = 12;
    EXPECT_EQ(Run(), 0);
}

TEST_F(ProcessFrame, ReadsOnlyTheBytesThatTheRecordSays) {
    for (const uint32_t size : {4u, 8u}) {
        testkit::GuardedBuffer memory(size);
        std::memset(memory.data(), 0, size);
        std::memcpy(memory.data(), &size, 4);
        EXPECT_EQ(QZ_IMAGEPROC_ProcessFrame(
                      p.handle(), src, srcStride, dst, dstStride,
                      static_cast<QZ_IMAGEPROC_FRAME_PARAMS*>(static_cast<void*>(memory.data()))),
                  0);
    }
}

TEST_F(ProcessFrame, AMissingModeCountsAs0) {
    frame.u32Size = 8;
    frame.u32DeinterlaceMode = 5;
    EXPECT_EQ(Run(), 0);
    EXPECT_EQ(p->u32DeinterlaceMode, 0u);
}

TEST_F(ProcessFrame, CopiesAPicture) {
    EXPECT_EQ(Run(), 0);
    EXPECT_EQ(out[0], 0x33);
    EXPECT_EQ(out[15 * 64 + 15], 0x33);
    EXPECT_EQ(out[15 * 64 + 16], 0xEE);
    EXPECT_EQ(out[1024 + 7 * 64 + 7], 0x33);
    EXPECT_EQ(out[2048 + 7 * 64 + 8], 0xEE);
}

uint32_t Planes(uint32_t format) {
    return format <= 2 ? 3 : format == 8 ? 2 : 1;
}

TEST_F(ProcessFrame, ReportsAMissingPlaneAndAZeroStrideByFormat) {
    for (uint32_t input = 0; input <= 9; ++input) {
        const HRESULT missing = Planes(input) == 3 ? 3 : Planes(input) == 2 ? 5 : 7;
        for (uint32_t i = 0; i < Planes(input); ++i) {
            uint8_t* const plane = src[i];
            src[i] = nullptr;
            srcStride[i] = 0;
            EXPECT_EQ(RunAs(input << 8), missing) << "format " << input << " plane " << i;
            src[i] = plane;
            EXPECT_EQ(RunAs(input << 8), missing + 1) << "format " << input << " plane " << i;
            srcStride[i] = 64;
        }
    }
    for (uint32_t output = 0; output <= 10; ++output) {
        const HRESULT missing = Planes(output) == 3 ? 9 : Planes(output) == 2 ? 11 : 13;
        for (uint32_t i = 0; i < Planes(output); ++i) {
            uint8_t* const plane = dst[i];
            dst[i] = nullptr;
            dstStride[i] = 0;
            EXPECT_EQ(RunAs(output), missing) << "format " << output << " plane " << i;
            dst[i] = plane;
            EXPECT_EQ(RunAs(output), missing + 1) << "format " << output << " plane " << i;
            dstStride[i] = 64;
        }
    }
}

TEST_F(ProcessFrame, ZeroSourceStrideOfAThreePlaneInputIs4) {
    srcStride[0] = 0;
    EXPECT_EQ(Run(), 4);
}

TEST_F(ProcessFrame, InputIsCheckedBeforeOutput) {
    src[0] = nullptr;
    dst[0] = nullptr;
    EXPECT_EQ(Run(), 3);
    src[0] = &in[0];
    EXPECT_EQ(Run(), 9);
    srcStride[2] = 0;
    EXPECT_EQ(RunAs(11), 4) << "a bad source comes before a bad output format";
}

TEST_F(ProcessFrame, AFormatOutOfRangeIsUnexpected) {
    for (const uint32_t input : {10u, 11u, 255u, 0xFFFFFFu}) {
        EXPECT_EQ(RunAs(input << 8), E_UNEXPECTED) << input;
    }
    for (const uint32_t output : {11u, 12u, 255u})
        EXPECT_EQ(RunAs(output), E_UNEXPECTED) << output;
}

TEST_F(ProcessFrame, MissingArraysCountAsMissingPlanesAndZeroStrides) {
    EXPECT_EQ(QZ_IMAGEPROC_ProcessFrame(p.handle(), nullptr, srcStride, dst, dstStride, &frame), 3);
    EXPECT_EQ(QZ_IMAGEPROC_ProcessFrame(p.handle(), src, nullptr, dst, dstStride, &frame), 4);
    EXPECT_EQ(QZ_IMAGEPROC_ProcessFrame(p.handle(), src, srcStride, nullptr, dstStride, &frame), 9);
    EXPECT_EQ(QZ_IMAGEPROC_ProcessFrame(p.handle(), src, srcStride, dst, nullptr, &frame), 10);
}

TEST_F(ProcessFrame, StoresTheModeBeforeThePlanesAreChecked) {
    src[0] = nullptr;
    frame.u32DeinterlaceMode = 4;
    EXPECT_EQ(Run(), 3);
    EXPECT_EQ(p->u32DeinterlaceMode, 4u);
    frame.u32DeinterlaceMode = 0;
    EXPECT_EQ(Run(), 3);
    EXPECT_EQ(p->u32DeinterlaceMode, 4u) << "0 keeps the mode";
    frame.u32DeinterlaceMode = 0xFFFFFFFF;
    EXPECT_EQ(Run(), 3);
    EXPECT_EQ(p->u32DeinterlaceMode, 0xFFFFFFFFu);
}

TEST_F(ProcessFrame, OnlyPlanarInputsTakeAMode) {
    src[0] = nullptr;
    for (uint32_t input = 0; input <= 12; ++input) {
        p->u32CscType = input << 8;
        p->u32DeinterlaceMode = 7;
        frame.u32DeinterlaceMode = 3;
        Run();
        EXPECT_EQ(p->u32DeinterlaceMode, input <= 2 ? 3u : 0u) << input;
        p->u32DeinterlaceMode = 7;
        frame.u32DeinterlaceMode = 0;
        Run();
        EXPECT_EQ(p->u32DeinterlaceMode, 7u) << input;
    }
}

}  // namespace
