#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

#include "imageproc/support.h"

namespace {

using imageproc_test::Params;
using imageproc_test::Processor;

class PipelineFrame : public testing::Test {
  protected:
    HRESULT Run(const Processor& p) {
        return QZ_IMAGEPROC_ProcessFrame(p.handle(), src, stride, dst, stride, &frame);
    }
    int32_t RunDirectly(const Processor& p) {
        return _ImgPrcOneFrame_depend(&p.record(), src, stride, dst, stride);
    }

    std::vector<uint8_t> in = std::vector<uint8_t>(3 * 64 * 128, 0x80);
    std::vector<uint8_t> out = std::vector<uint8_t>(3 * 64 * 128, 0xEE);
    uint8_t* src[3] = {&in[0], &in[64 * 128], &in[2 * 64 * 128]};
    uint8_t* dst[3] = {&out[0], &out[64 * 128], &out[2 * 64 * 128]};
    const uint32_t stride[3] = {128, 128, 128};
    QZ_IMAGEPROC_FRAME_PARAMS frame = {12, 1, 0};
};

TEST_F(PipelineFrame, WithoutAWalkerItIsAnInternalFailure) {
    const Processor p(Params(0, 16, 16, 16, 16));
    void* const walker = p->pWalker;
    p->pWalker = nullptr;
    EXPECT_EQ(RunDirectly(p), -1);
    EXPECT_EQ(Run(p), 15);
    EXPECT_EQ(out[0], 0xEE);
    p->pWalker = walker;
    EXPECT_EQ(Run(p), 0);
}

TEST_F(PipelineFrame, AnOutputWithoutAWalkerLayoutIsNotImplemented) {
    const Processor p(Params(0, 16, 16, 16, 16));
    for (const uint32_t code : {1u, 2u, 9u}) {  // 4:2:2, 4:4:4, ABGR32
        p->u32CscType = code;
        EXPECT_EQ(RunDirectly(p), -3) << code;
        EXPECT_EQ(Run(p), E_NOTIMPL) << code;
    }
}

TEST_F(PipelineFrame, AConversionThatDoesNotExistIsNotImplemented) {
    const Processor p(Params(0, 16, 16, 16, 16));
    p->u32CscType = 256;  // 4:2:2 to 4:2:0: the output has a layout, the conversion has no kernel
    EXPECT_EQ(RunDirectly(p), -3);
    EXPECT_EQ(Run(p), E_NOTIMPL);
    EXPECT_EQ(out[0], 0xEE);
}

TEST_F(PipelineFrame, ARotationAbove5IsNotImplemented) {
    const Processor p(Params(0, 16, 16, 16, 16));
    p->u32RotationType = 6;
    EXPECT_EQ(Run(p), E_NOTIMPL);
}

TEST_F(PipelineFrame, AConversionWithoutAMatchingRowDoesNothingAndSucceeds) {
    const Processor p(Params(3, 16, 16, 16, 16));
    p->u32ResizeCase = 8;
    EXPECT_EQ(RunDirectly(p), 0);
    EXPECT_EQ(out[0], 0xEE);
}

TEST_F(PipelineFrame, TheWalkerIsSetUpForEveryFrame) {
    const Processor p(Params(3, 16, 16, 16, 16));
    auto* const word = static_cast<intptr_t*>(p->pWalker);
    EXPECT_EQ(Run(p), 0);
    EXPECT_EQ(word[0], 4);
    EXPECT_EQ(word[1], 256);
    EXPECT_EQ(word[2], reinterpret_cast<intptr_t>(dst[0]));
    dst[0] += 2;
    EXPECT_EQ(Run(p), 0);
    EXPECT_EQ(word[2], reinterpret_cast<intptr_t>(dst[0]));
}

TEST_F(PipelineFrame, ADeinterlaceModeMakesTheKernelReadTheImage) {
    const Processor p(Params(0, 16, 16, 16, 16));
    in[128] = 0x20;  // the first sample of a line that `discard` drops
    frame.u32DeinterlaceMode = 2;
    EXPECT_EQ(Run(p), 0);
    EXPECT_EQ(out[128], 0x80);
    EXPECT_EQ(p->pDeinterlacePlanes[0][p->u32DeinterlaceStride], 0x80);
}

TEST_F(PipelineFrame, KernelResultsAreIgnored) {
    const Processor p(Params(3, 16, 16, 32, 32));
    ASSERT_EQ(p->u32ResizeCase, 4u);
    uint32_t* lines[4];
    for (int i = 0; i < 4; ++i) {
        lines[i] = p->pLines[i];
        p->pLines[i] = nullptr;
    }
    EXPECT_EQ(RunDirectly(p), 0) << "the kernel itself gives -1 without its line buffers";
    for (int i = 0; i < 4; ++i)
        p->pLines[i] = lines[i];
}

TEST_F(PipelineFrame, Rgb888IsNeitherTurnedNorScaled) {
    QZ_IMAGEPROC_INIT_PARAMS params = Params(4, 16, 16, 24, 8);
    params.u32RotationType = 2;
    const Processor p(params);
    in[0] = 255;  // one bright pixel in the top left corner
    EXPECT_EQ(Run(p), 0);
    EXPECT_GT(out[0], out[3]);
    EXPECT_EQ(out[3], out[15 * 128 + 15 * 3]) << "16 x 16 pixels are written";
    EXPECT_NE(out[15 * 128 + 15 * 3], 0xEE);
    EXPECT_EQ(out[16 * 3], 0xEE);
    EXPECT_EQ(out[16 * 128], 0xEE);
}

TEST_F(PipelineFrame, Rgb565ToPlanarIgnoresHalfATurnAndArgb32DoesNot) {
    QZ_IMAGEPROC_INIT_PARAMS params = Params(768, 16, 16, 16, 16);
    params.u32RotationType = 3;
    std::fill(in.begin(), in.end(), uint8_t{0});
    std::fill_n(in.begin(), 4, uint8_t{0xFF});  // two white pixels, or one
    const Processor p565(params);
    EXPECT_EQ(Run(p565), 0);
    EXPECT_GT(out[0], 200);
    EXPECT_EQ(out[15 * 128 + 15], 16);
    params.u32CscType = 1280;
    const Processor p8888(params);
    EXPECT_EQ(Run(p8888), 0);
    EXPECT_EQ(out[0], 16);
    EXPECT_GT(out[15 * 128 + 15], 200);
}

TEST_F(PipelineFrame, AdjustmentChoosesTheTableKernelsUntilReset) {
    const Processor p(Params(0, 16, 16, 16, 16));
    const uint32_t darker[3] = {100, 128, 128};
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), 1, darker, 12), S_OK);
    EXPECT_EQ(Run(p), 0);
    EXPECT_EQ(out[0], 0x80 - 2 * 28);
    EXPECT_EQ(QZ_IMAGEPROC_Reset(p.handle()), S_OK);
    EXPECT_EQ(Run(p), 0);
    EXPECT_EQ(out[0], 0x80);
}

}  // namespace
