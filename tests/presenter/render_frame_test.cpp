// Where render_this_frame puts the planes, on buffers of every kind of stride.

#include <gtest/gtest.h>
#include <sys/mman.h>
#include <vidshow-host/window.h>

#include "presenter/log_capture.h"
#include "presenter/yuv_frame.h"
#include "testkit/guarded_buffer.h"
#include "vidshow/imageproc.h"
#include "vidshow/softrender.h"

namespace {

using Lines = std::vector<std::string>;
using testkit::GuardedBuffer;
using vidshow::host::Window;

constexpr uint8_t kFill = 0xA5;

class RenderFrameTest : public testing::Test {
  protected:
    ~RenderFrameTest() override { ReleaseConverter(render.Converter); }

    void Configure(int32_t width, int32_t height, uint32_t fourcc = 0) {
        ReleaseConverter(render.Converter);
        render = {sizeof render, width, height, fourcc, window.get(), nullptr};
        CreateConverter(&render);
        ASSERT_NE(render.Converter, nullptr);
    }
    int32_t Draw(YuvFrame& frame, int32_t stride, void* bits) {
        const ANativeWindow_Buffer buffer = {9999, 9999, stride, 0, bits, {}};
        return render_this_frame(&render, frame.voidPlanes(), frame.strides(), render.InWidth,
                                 render.InHeight, buffer, 0);
    }

    LogCapture log;
    Window window;
    ANDROID_SOFTRENDER render = {};  // the function takes any record
};

TEST_F(RenderFrameTest, StridesThatAreMultiplesOf32LeaveNoGapAndNoOverlap) {
    for (const int32_t stride : {64, 96, 128}) {
        SCOPED_TRACE(stride);
        constexpr int32_t height = 20;
        Configure(60, height);
        YuvFrame frame(60, height, 3);
        const size_t luma = static_cast<size_t>(stride) * height;
        const size_t chroma = luma / 4;
        GuardedBuffer buffer(luma + 2 * chroma, GuardedBuffer::Placement::end, kFill);
        EXPECT_EQ(Draw(frame, stride, buffer.data()), 0);

        std::vector<uint8_t> expected(buffer.size(), kFill);
        const auto put = [&expected](const Plane& plane, size_t at, size_t pitch) {
            for (size_t row = 0; row < plane.height; ++row) {
                std::memcpy(&expected[at + row * pitch], &plane.samples[row * plane.width],
                            plane.width);
            }
        };
        const size_t pitch = static_cast<size_t>(stride);
        put(frame.y(), 0, pitch);
        put(frame.cr(), luma, pitch / 2);
        put(frame.cb(), luma + chroma, pitch / 2);
        EXPECT_EQ(std::vector<uint8_t>(buffer.data(), buffer.data() + buffer.size()), expected);
    }
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(RenderFrameTest, Stride328HasPitches336And176AndOffsetsOfTheStride) {
    constexpr size_t h = 4;
    Configure(328, h);
    YuvFrame frame(328, h, 4);
    GuardedBuffer buffer(328 * h + 2 * 88 * h, GuardedBuffer::Placement::end, kFill);
    EXPECT_EQ(Draw(frame, 328, buffer.data()), 0);

    // Luma rows 336 apart reach 8 x 3 bytes into the first chroma plane; which of the two is left
    // there is not looked at.
    const size_t overlap = 336 * (h - 1) + 328 - 328 * h;
    ASSERT_EQ(overlap, 24u);
    const uint8_t* const cr = buffer.data() + 328 * h;
    const uint8_t* const cb = cr + 88 * h;
    for (size_t row = 0; row < h; ++row) {
        const size_t inPlane = row + 1 < h ? 328 : 328 - overlap;
        EXPECT_EQ(std::memcmp(buffer.data() + row * 336, &frame.y().samples[row * 328], inPlane), 0)
            << "luma row " << row;
    }
    for (size_t row = 0; row < h / 2; ++row) {
        const size_t from = row == 0 ? overlap : 0;
        EXPECT_EQ(
            std::memcmp(cr + row * 176 + from, &frame.cr().samples[row * 164 + from], 164 - from),
            0)
            << "Cr row " << row;
    }
    EXPECT_TRUE(frame.cb().isAt(cb, 176));
    for (size_t row = 0; row < h / 2; ++row) {
        for (size_t x = 164; x < 176; ++x)
            EXPECT_EQ(cb[row * 176 + x], kFill);
    }
}

TEST_F(RenderFrameTest, OddStrideHalvesBeforeRounding) {
    // 37 / 2 = 18, rounded up 32; (37 + 15) / 16 * 16 = 48.
    constexpr size_t h = 8;
    Configure(16, h);
    YuvFrame frame(16, h, 5);
    GuardedBuffer buffer(37 * h + 16 * h + 32 * h / 2, GuardedBuffer::Placement::end, kFill);
    EXPECT_EQ(Draw(frame, 37, buffer.data()), 0);
    const uint8_t* const cr = buffer.data() + 37 * h;
    EXPECT_TRUE(frame.cb().isAt(cr + 16 * h, 32));
    for (size_t row = 0; row < 6; ++row) {
        EXPECT_EQ(std::memcmp(buffer.data() + row * 48, &frame.y().samples[row * 16], 16), 0);
    }
    EXPECT_EQ(std::memcmp(cr + 3 * 32, &frame.cr().samples[3 * 8], 8), 0);
}

TEST_F(RenderFrameTest, SmallAndSmallNegativeStridesDrawNothing) {
    Configure(16, 4);
    YuvFrame frame(16, 4, 6);
    // Up to 1 the chroma pitch is 0; negative ones divide truncating, down to -61 for chroma.
    for (const int32_t stride : {1, 0, -1, -8, -15, -16, -30, -31, -61}) {
        GuardedBuffer buffer(4096, GuardedBuffer::Placement::end, kFill);
        EXPECT_EQ(Draw(frame, stride, buffer.data() + 2048), 0) << stride;
        for (size_t i = 0; i < buffer.size(); ++i)
            ASSERT_EQ(buffer[i], kFill) << stride;
    }
    EXPECT_EQ(log.take(), Lines()) << "the processor's refusal is not logged";
}

TEST_F(RenderFrameTest, Stride2HasTheSmallestPitches) {
    Configure(4, 4);
    YuvFrame frame(4, 4, 7);
    // Pitches 16 and 16, offsets 8 and 8 + 32.
    GuardedBuffer buffer(8 + 32 + 16 + 2, GuardedBuffer::Placement::end, kFill);
    EXPECT_EQ(Draw(frame, 2, buffer.data()), 0);
    EXPECT_TRUE(frame.cb().isAt(buffer.data() + 40, 16));
    EXPECT_EQ(std::memcmp(buffer.data(), frame.y().samples.data(), 4), 0);
}

TEST_F(RenderFrameTest, ChromaOffsetIsHalvedUnsigned) {
    if (sizeof(void*) == 4) GTEST_SKIP() << "the offset wraps around the address space";
    // With height -4 and chroma pitch 32 the product is -128, as unsigned halved 2^31 - 64.
    Configure(16, 4);
    YuvFrame frame(16, 4, 8);
    const size_t total = (size_t{1} << 31) + 8192;
    void* const block = mmap(nullptr, total, PROT_READ | PROT_WRITE,
                             MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
    ASSERT_NE(block, MAP_FAILED);
    uint8_t* const bits = static_cast<uint8_t*>(block) + 4096;
    render.InHeight = -4;
    EXPECT_EQ(Draw(frame, 64, bits), 0);
    uint8_t* const cr = bits - 64 * 4;
    EXPECT_TRUE(frame.y().isAt(bits, 64));
    EXPECT_TRUE(frame.cr().isAt(cr, 32));
    EXPECT_TRUE(frame.cb().isAt(cr + 0x7FFFFFC0, 32));
    munmap(block, total);
}

TEST_F(RenderFrameTest, TwoPlanesAreDrawnAs16BitPixelsIntoTheFirst) {
    constexpr size_t w = 16;
    constexpr size_t h = 4;
    Configure(w, h, 0x00010000);
    // White, so that rows of 32 bytes that lie 32 bytes apart show where they are.
    std::vector<uint8_t> luma(w * h, 235);
    std::vector<uint8_t> chroma(w * h / 2, 128);
    void* planes[3] = {luma.data(), chroma.data(), nullptr};
    DWORD strides[3] = {w, w, 0};
    GuardedBuffer buffer(32 * h + 2 * 16 * h / 2, GuardedBuffer::Placement::end, kFill);
    const ANativeWindow_Buffer out = {0, 0, 32, 0, buffer.data(), {}};
    EXPECT_EQ(render_this_frame(&render, planes, strides, w, h, out, 0), 0);
    for (size_t i = 0; i < 32 * h; ++i)
        EXPECT_EQ(buffer[i], 0xFF) << i;
    for (size_t i = 32 * h; i < buffer.size(); ++i)
        EXPECT_EQ(buffer[i], kFill) << i;
}

TEST_F(RenderFrameTest, NullBitsAndNullPlanesAreLeftToTheProcessor) {
    Configure(16, 4);
    YuvFrame frame(16, 4, 9);
    EXPECT_EQ(Draw(frame, 32, nullptr), 0);
    GuardedBuffer buffer(32 * 4 * 3 / 2, GuardedBuffer::Placement::end, kFill);
    void* planes[3] = {frame.planes()[0], nullptr, frame.planes()[2]};
    const ANativeWindow_Buffer out = {0, 0, 32, 0, buffer.data(), {}};
    EXPECT_EQ(render_this_frame(&render, planes, frame.strides(), 16, 4, out, 0), 0);
    for (size_t i = 0; i < buffer.size(); ++i)
        ASSERT_EQ(buffer[i], kFill);
}

TEST_F(RenderFrameTest, MissingWindowOrConverterOrAnotherSizeIsLoggedAndNotDrawn) {
    YuvFrame frame(16, 4, 10);
    GuardedBuffer buffer(32 * 4 * 3 / 2, GuardedBuffer::Placement::end, kFill);
    const ANativeWindow_Buffer out = {0, 0, 32, 0, buffer.data(), {}};
    const auto draw = [&](int32_t width, int32_t height) {
        EXPECT_EQ(
            render_this_frame(&render, frame.voidPlanes(), frame.strides(), width, height, out, 0),
            0);
        const Lines lines = log.take();
        ASSERT_EQ(lines.size(), 5u);
        EXPECT_EQ(lines[0], "[render_this_frame #]:render_this_frame fail");
        EXPECT_EQ(lines[3], "[render_this_frame #]:pRender->InWidth = 16");
        EXPECT_EQ(lines[4], "[render_this_frame #]:pRender->InHeight = 4");
        for (size_t i = 0; i < buffer.size(); ++i)
            ASSERT_EQ(buffer[i], kFill);
    };
    Configure(16, 4);
    draw(12, 4);
    draw(16, 8);
    void* const converter = render.Converter;
    render.Converter = nullptr;
    draw(16, 4);
    render.Converter = converter;
    render.Handler = nullptr;
    draw(16, 4);
}

}  // namespace
