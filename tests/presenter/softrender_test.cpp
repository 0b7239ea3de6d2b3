// The software renderer's record: init, converter, render, uninit.

#include "vidshow/softrender.h"

#include <android/native_window.h>
#include <gtest/gtest.h>
#include <vidshow-host/window.h>

#include <cerrno>
#include <cstdio>
#include <string>
#include <utility>
#include <vector>

#include "presenter/log_capture.h"
#include "presenter/yuv_frame.h"
#include "testkit/capture.h"
#include "vidshow/imageproc.h"

// One test asks for more memory than there is, and wants to be told so.
extern "C" __attribute__((visibility("default"))) const char* __asan_default_options() {
    return "allocator_may_return_null=1";
}

namespace {

using Lines = std::vector<std::string>;
using vidshow::host::Call;
using vidshow::host::Frame;
using vidshow::host::Window;

constexpr uint32_t kWidth = 48;
constexpr uint32_t kHeight = 32;
constexpr uint8_t kFill = 0x5A;

// A pointer as printf's %p shows it.
std::string Shown(const void* p) {
    char text[32];
    std::snprintf(text, sizeof text, "%p", p);
    return text;
}

class SoftRenderTest : public testing::Test {
  protected:
    SoftRenderTest() : window(Options()) {
        window.onFrame([this](const Frame& seen) {
            ++posted;
            shown.assign(seen.bits, seen.bits + seen.bytes);
            stride = seen.stride;
        });
    }
    ~SoftRenderTest() override {
        qz_nativewindow_uninit(&g_SoftRenderer);
        g_SoftRenderer = {};
    }

    static vidshow::host::WindowOptions Options() {
        vidshow::host::WindowOptions options;
        options.fill = kFill;
        return options;
    }

    void* Init(uint32_t fourcc, uint32_t width = kWidth, uint32_t height = kHeight) {
        return qz_nativewindow_init(window.get(), width, height, fourcc);
    }
    int32_t Render(void* handle, uint32_t width = kWidth, uint32_t height = kHeight,
                   uint32_t mode = 0) {
        return qz_nativewindow_render(handle, frame.voidPlanes(), frame.strides(), width, height, 0,
                                      mode);
    }
    Lines UndrawableLines() const {
        return {
            "[render_this_frame #]:render_this_frame fail",
            "[render_this_frame #]:pRender->Handler =" + Shown(g_SoftRenderer.Handler),
            "[render_this_frame #]:pRender->Converter =" + Shown(g_SoftRenderer.Converter),
            "[render_this_frame #]:pRender->InWidth = " + std::to_string(g_SoftRenderer.InWidth),
            "[render_this_frame #]:pRender->InHeight = " + std::to_string(g_SoftRenderer.InHeight)};
    }
    bool IsUndrawn() const {
        for (const uint8_t byte : shown) {
            if (byte != kFill) return false;
        }
        return !shown.empty();
    }
    static const QZ_IMAGEPROC_PARAMSET& Processor(const ANDROID_SOFTRENDER& render) {
        return *static_cast<const QZ_IMAGEPROC_PARAMSET*>(render.Converter);
    }

    LogCapture log;
    Window window;
    Window otherWindow;
    YuvFrame frame{kWidth, kHeight, 2};
    int posted = 0;
    std::vector<uint8_t> shown;
    int32_t stride = 0;
};

TEST_F(SoftRenderTest, TopByteAloneDeterminesThePath) {
    for (const uint32_t rest : {0u, 0x00FFFFFFu, 0x00040107u, 0x00020200u}) {
        EXPECT_EQ(qz_nativewindow_determin(nullptr, nullptr, 0, 0, rest), 1);
        for (const uint32_t top : {0x01u, 0x7Fu, 0x80u, 0xFFu}) {
            EXPECT_EQ(qz_nativewindow_determin(frame.voidPlanes(), frame.strides(), 1, 2,
                                               top << 24 | rest),
                      0);
        }
    }
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(SoftRenderTest, NullWindowIsInvalid) {
    EXPECT_EQ(qz_nativewindow_init(nullptr, kWidth, kHeight, 0), nullptr);
    EXPECT_EQ(log.take(), Lines{"[qz_nativewindow_init #]:invalid window "});
}

TEST_F(SoftRenderTest, InitConfiguresWindowAndRecord) {
    EXPECT_EQ(Init(0x00000104), &g_SoftRenderer) << "the handle is the record's address";
    EXPECT_EQ(g_SoftRenderer.dwSize, sizeof(ANDROID_SOFTRENDER));
    EXPECT_EQ(g_SoftRenderer.InWidth, 48);
    EXPECT_EQ(g_SoftRenderer.InHeight, 32);
    EXPECT_EQ(g_SoftRenderer.Fourcc, 0x104u);
    EXPECT_EQ(g_SoftRenderer.Handler, window.get());
    EXPECT_NE(g_SoftRenderer.Converter, nullptr);
    EXPECT_EQ(window.state().strongCount, 2);
    EXPECT_EQ(window.state().width, 48);
    EXPECT_EQ(window.state().height, 32);
    EXPECT_EQ(window.state().format, 0x32315659);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(SoftRenderTest, SameWindowAgainIsANoOp) {
    void* const handle = Init(0);
    void* const converter = g_SoftRenderer.Converter;
    EXPECT_EQ(Init(0x00020207, 1920, 1080), handle);
    EXPECT_EQ(g_SoftRenderer.Converter, converter);
    EXPECT_EQ(g_SoftRenderer.InWidth, 48);
    EXPECT_EQ(g_SoftRenderer.Fourcc, 0u);
    EXPECT_EQ(window.state().width, 48);
    EXPECT_EQ(window.state().strongCount, 2);
    EXPECT_EQ(window.state().calls[static_cast<size_t>(Call::setBuffersGeometry)], 1u);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(SoftRenderTest, AnotherWindowTakesOverAndReleasesNothing) {
    Init(0);
    void* const first = g_SoftRenderer.Converter;
    EXPECT_EQ(qz_nativewindow_init(otherWindow.get(), 64, 16, 0x00000001), &g_SoftRenderer);
    EXPECT_EQ(g_SoftRenderer.Handler, otherWindow.get());
    EXPECT_NE(g_SoftRenderer.Converter, first);
    EXPECT_EQ(g_SoftRenderer.InWidth, 64);
    EXPECT_EQ(window.state().strongCount, 2) << "not released";
    EXPECT_EQ(otherWindow.state().strongCount, 2);
    EXPECT_EQ(Processor({0, 0, 0, 0, nullptr, first}).u32InWidth, 48u) << "not destroyed";
    ReleaseConverter(first);

    qz_nativewindow_uninit(&g_SoftRenderer);
    ANativeWindow_release(window.get());
    EXPECT_EQ(window.state().strongCount, 1);
}

TEST_F(SoftRenderTest, RefusedGeometryKeepsTheReferenceAndClearsTheRecord) {
    Init(0);
    void* const first = g_SoftRenderer.Converter;
    otherWindow.fail(Call::setBuffersGeometry, -EINVAL);
    EXPECT_EQ(qz_nativewindow_init(otherWindow.get(), 64, 16, 1), nullptr);
    EXPECT_EQ(
        log.take(),
        Lines{"[qz_nativewindow_init #]:native_window_set_buffers_geometry err = 0xffffffea"});
    EXPECT_EQ(otherWindow.state().strongCount, 2);
    EXPECT_EQ(g_SoftRenderer.dwSize, sizeof(ANDROID_SOFTRENDER));
    EXPECT_EQ(g_SoftRenderer.Handler, nullptr);
    EXPECT_EQ(g_SoftRenderer.Converter, nullptr);
    EXPECT_EQ(g_SoftRenderer.InWidth, 0);
    EXPECT_EQ(g_SoftRenderer.InHeight, 0);
    EXPECT_EQ(g_SoftRenderer.Fourcc, 0u);
    ReleaseConverter(first);
    ANativeWindow_release(window.get());
    ANativeWindow_release(otherWindow.get());
}

TEST_F(SoftRenderTest, ColourFormatFourHasNoConverterAndIsSilent) {
    EXPECT_EQ(Init(0x00040000), &g_SoftRenderer);
    EXPECT_EQ(g_SoftRenderer.Converter, nullptr);
    EXPECT_EQ(log.take(), Lines());
    EXPECT_EQ(Render(&g_SoftRenderer), 0);
    EXPECT_EQ(log.take(), UndrawableLines());
    EXPECT_EQ(posted, 1);
    EXPECT_TRUE(IsUndrawn());
}

TEST_F(SoftRenderTest, ColourFormatTwoIsPostedUndrawn) {
    EXPECT_EQ(Init(0x00020000), &g_SoftRenderer) << "init succeeds";
    EXPECT_EQ(log.take(), Lines{"[CreateConverter #]: unsupport input color format = 2"});
    EXPECT_EQ(g_SoftRenderer.Converter, nullptr);
    for (int i = 1; i <= 2; ++i) {
        EXPECT_EQ(Render(&g_SoftRenderer), 0);
        EXPECT_EQ(log.take(), UndrawableLines());
        EXPECT_EQ(posted, i);
        EXPECT_TRUE(IsUndrawn());
    }
}

TEST_F(SoftRenderTest, RangeTwoIsPostedUndrawn) {
    EXPECT_EQ(Init(0x00000200), &g_SoftRenderer);
    EXPECT_EQ(log.take(), Lines{"[CreateConverter #]: unsupport input yuv range = 2"});
    EXPECT_EQ(Render(&g_SoftRenderer), 0);
    EXPECT_EQ(log.take(), UndrawableLines());
    EXPECT_TRUE(IsUndrawn());
}

TEST_F(SoftRenderTest, EveryOtherColourAndRangeIsRefused) {
    ANDROID_SOFTRENDER render = {0, 16, 16, 0, nullptr, nullptr};
    for (uint32_t value = 0; value < 256; ++value) {
        render.Fourcc = value << 16 | 0x0500;
        CreateConverter(&render);
        EXPECT_EQ(log.take(), value < 2
                                  ? Lines{"[CreateConverter #]: unsupport input yuv range = 5"}
                                  : Lines{"[CreateConverter #]: unsupport input color format = " +
                                          std::to_string(value)});
        EXPECT_EQ(render.Converter, nullptr);
        render.Fourcc = value << 8;
        CreateConverter(&render);
        EXPECT_EQ(log.take(), value < 2
                                  ? Lines()
                                  : Lines{"[CreateConverter #]: unsupport input yuv range = " +
                                          std::to_string(value)});
        EXPECT_EQ(render.Converter != nullptr, value < 2);
    }
}

TEST_F(SoftRenderTest, CreateConverterDropsTheOldOneFirst) {
    Init(0);
    ASSERT_NE(g_SoftRenderer.Converter, nullptr);
    g_SoftRenderer.Fourcc = 0x00030000;
    CreateConverter(&g_SoftRenderer);
    EXPECT_EQ(g_SoftRenderer.Converter, nullptr) << "before it looked at the new format";
    EXPECT_EQ(log.take(), Lines{"[CreateConverter #]: unsupport input color format = 3"});
}

TEST_F(SoftRenderTest, ConverterIsMadeAsTheFormatCodeSays) {
    for (uint32_t matrix = 0; matrix < 256; ++matrix) {
        for (const uint32_t range : {0u, 1u}) {
            SCOPED_TRACE(testing::Message() << "matrix " << matrix << ", range " << range);
            ANDROID_SOFTRENDER render = {0, 64, 24, range << 8 | matrix, nullptr, nullptr};
            CreateConverter(&render);
            ASSERT_NE(render.Converter, nullptr);
            const QZ_IMAGEPROC_PARAMSET& made = Processor(render);
            const uint32_t index = matrix == 1 ? 1 : matrix == 4 ? 3 : matrix == 7 ? 2 : 0;
            EXPECT_EQ(made.u32ColorMatrix, index);
            EXPECT_EQ(made.u32FullRange, range);
            EXPECT_EQ(made.u32CscType, 0u);
            EXPECT_EQ(made.u32RotationType, 0u);
            EXPECT_EQ(made.u32ResizeAlgorithm, 1u);
            EXPECT_EQ(made.u32GivenInWidth, 64u);
            EXPECT_EQ(made.u32GivenInHeight, 24u);
            EXPECT_EQ(made.u32GivenOutWidth, 64u);
            EXPECT_EQ(made.u32GivenOutHeight, 24u);
            EXPECT_EQ(made.u32Alpha, 0u);
            EXPECT_EQ(made.u32ColorKey, 0u);
            ReleaseConverter(render.Converter);
        }
    }
}

TEST_F(SoftRenderTest, TwoPlanesBecomeRgb565) {
    ANDROID_SOFTRENDER render = {0, 64, 24, 0x00010000, nullptr, nullptr};
    CreateConverter(&render);
    ASSERT_NE(render.Converter, nullptr);
    EXPECT_EQ(Processor(render).u32CscType, 2051u);
    ReleaseConverter(render.Converter);
}

TEST_F(SoftRenderTest, CreationThatFailsIsLogged) {
    // A size whose temporary planes cannot be had.
    ANDROID_SOFTRENDER render = {0, 0x7FFFFFF0, 0x7FFFFFF0, 0, nullptr, nullptr};
    testkit::StdoutCapture out;
    CreateConverter(&render);
    EXPECT_EQ(render.Converter, nullptr);
    EXPECT_EQ(log.take(), Lines{"[CreateConverter #]: fail to create image processor"});
}

TEST_F(SoftRenderTest, ReleaseConverterOfNullDoesNothing) {
    ReleaseConverter(nullptr);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(SoftRenderTest, FrameIsDrawnAndThePaddingUntouched) {
    ASSERT_NE(Init(0), nullptr);
    ASSERT_EQ(Render(&g_SoftRenderer), 0);
    ASSERT_EQ(posted, 1);
    ASSERT_EQ(stride, 64);
    std::vector<uint8_t> expected(64 * 32 + 2 * 32 * 16, kFill);
    const auto put = [&expected](const Plane& plane, size_t at, size_t pitch) {
        for (size_t row = 0; row < plane.height; ++row) {
            std::memcpy(&expected[at + row * pitch], &plane.samples[row * plane.width],
                        plane.width);
        }
    };
    put(frame.y(), 0, 64);
    put(frame.cr(), 64 * 32, 32);
    put(frame.cb(), 64 * 32 + 32 * 16, 32);
    EXPECT_EQ(shown, expected);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(SoftRenderTest, OtherHandlesAreRefused) {
    void* const handle = Init(0);
    ANDROID_SOFTRENDER copy = g_SoftRenderer;
    for (void* const wrong : {static_cast<void*>(nullptr), static_cast<void*>(&copy),
                              static_cast<void*>(window.get())}) {
        EXPECT_EQ(Render(wrong), -1);
        EXPECT_EQ(log.take(), Lines{"[qz_nativewindow_render #]:render, invalid handler"});
        qz_nativewindow_uninit(wrong);
        EXPECT_EQ(log.take(), Lines{"[qz_nativewindow_uninit #]:uninit invalid surface"});
    }
    EXPECT_EQ(posted, 0);
    EXPECT_EQ(window.state().calls[static_cast<size_t>(Call::lock)], 0u);
    EXPECT_EQ(Render(handle), 0);
}

TEST_F(SoftRenderTest, RenderOnAnEmptyRecordFails) {
    EXPECT_EQ(Render(&g_SoftRenderer), -1);
    EXPECT_EQ(log.take(), Lines{"[qz_nativewindow_render #]:ANativeWindow_lock err = 0xffffffea"});
}

TEST_F(SoftRenderTest, FailedLockAndFailedPost) {
    void* const handle = Init(0);
    window.fail(Call::lock, -ENODEV);
    EXPECT_EQ(Render(handle), -1);
    EXPECT_EQ(log.take(), Lines{"[qz_nativewindow_render #]:ANativeWindow_lock err = 0xffffffed"});
    EXPECT_EQ(window.state().calls[static_cast<size_t>(Call::unlockAndPost)], 0u);
    window.fail(Call::unlockAndPost, -ENODEV);
    EXPECT_EQ(Render(handle), -1);
    EXPECT_EQ(log.take(),
              Lines{"[qz_nativewindow_render #]:ANativeWindow_unlockAndPost err = 0xffffffed"});
    EXPECT_EQ(posted, 0);
    EXPECT_EQ(Render(handle), 0);
    EXPECT_EQ(posted, 1);
}

TEST_F(SoftRenderTest, FrameOfAnotherSizeIsPostedUndrawn) {
    void* const handle = Init(0);
    const std::pair<uint32_t, uint32_t> sizes[] = {{44, 32}, {48, 28}, {52, 32}, {48, 36}, {0, 0}};
    for (const auto& [width, height] : sizes) {
        shown.clear();
        EXPECT_EQ(Render(handle, width, height), 0);
        EXPECT_EQ(log.take(), UndrawableLines());
        EXPECT_TRUE(IsUndrawn());
        EXPECT_EQ(Init(0, width, height), handle) << "does not help while the window is the same";
    }
    EXPECT_EQ(posted, 5);
    EXPECT_EQ(Render(handle), 0);
    EXPECT_FALSE(IsUndrawn());
}

TEST_F(SoftRenderTest, FormatCodeOfAFrameIsNotLookedAt) {
    void* const handle = Init(0);
    EXPECT_EQ(qz_nativewindow_render(handle, frame.voidPlanes(), frame.strides(), kWidth, kHeight,
                                     0xFF020203, 0),
              0);
    EXPECT_FALSE(IsUndrawn());
    EXPECT_EQ(g_SoftRenderer.Fourcc, 0u);
}

TEST_F(SoftRenderTest, DeinterlaceModeZeroKeepsTheConvertersMode) {
    void* const handle = Init(0);
    EXPECT_EQ(Render(handle, kWidth, kHeight, 2), 0);
    EXPECT_EQ(Processor(g_SoftRenderer).u32DeinterlaceMode, 2u);
    EXPECT_EQ(Render(handle, kWidth, kHeight, 0), 0);
    EXPECT_EQ(Processor(g_SoftRenderer).u32DeinterlaceMode, 2u);
    EXPECT_EQ(Render(handle, kWidth, kHeight, 1), 0);
    EXPECT_EQ(Processor(g_SoftRenderer).u32DeinterlaceMode, 1u);
}

TEST_F(SoftRenderTest, UninitEmptiesTheRecordOnce) {
    Init(0);
    qz_nativewindow_uninit(&g_SoftRenderer);
    EXPECT_EQ(g_SoftRenderer.Handler, nullptr);
    EXPECT_EQ(g_SoftRenderer.Converter, nullptr);
    EXPECT_EQ(window.state().strongCount, 1);
    qz_nativewindow_uninit(&g_SoftRenderer);
    EXPECT_EQ(window.state().strongCount, 1);
    EXPECT_EQ(log.take(), Lines());
    EXPECT_EQ(Init(0, 64, 64), &g_SoftRenderer) << "the same window with a new size";
    EXPECT_EQ(g_SoftRenderer.InWidth, 64);
}

}  // namespace
