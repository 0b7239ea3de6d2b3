// Strides, sizes and planes of the buffers that a window hands out.

#include <gtest/gtest.h>

#include <cstring>

#include "android/native_window.h"
#include "vidshow-host/window.h"

namespace {

using vidshow::host::Frame;
using vidshow::host::kFormatYv12;
using vidshow::host::Window;
using vidshow::host::WindowOptions;

struct Layout {
    int32_t width;
    int32_t height;
    int32_t format;
    int32_t strideAlign;
    int32_t stride;  // expected, pixels
    size_t bytes;    // expected
};

void PrintTo(const Layout& layout, std::ostream* out) {
    *out << layout.width << "x" << layout.height << " format " << layout.format << " align "
         << layout.strideAlign;
}

class BufferLayout : public testing::TestWithParam<Layout> {};

TEST_P(BufferLayout, StrideIsPaddedAndTheBufferIsWhole) {
    const Layout& expected = GetParam();
    WindowOptions options;
    options.strideAlign = expected.strideAlign;
    Window window(options);
    ASSERT_EQ(ANativeWindow_setBuffersGeometry(window.get(), expected.width, expected.height,
                                               expected.format),
              0);
    size_t bytes = 0;
    uint8_t last = 0;
    window.onFrame([&](const Frame& frame) {
        bytes = frame.bytes;
        last = frame.bits[frame.bytes - 1];
    });
    ANativeWindow_Buffer buffer;
    ASSERT_EQ(ANativeWindow_lock(window.get(), &buffer, nullptr), 0);
    EXPECT_EQ(buffer.stride, expected.stride);
    EXPECT_EQ(buffer.width, expected.width);
    EXPECT_EQ(buffer.height, expected.height);
    std::memset(buffer.bits, 0xEE, expected.bytes);  // an address sanitizer knows the true size
    ASSERT_EQ(ANativeWindow_unlockAndPost(window.get()), 0);
    EXPECT_EQ(bytes, expected.bytes);
    EXPECT_EQ(last, 0xEE);
}

INSTANTIATE_TEST_SUITE_P(
    Yv12, BufferLayout,
    testing::Values(
        // stride x height, then two planes of (half the stride, up to 16) x half the height
        Layout{640, 480, kFormatYv12, 32, 640, 640 * 480 + 2 * 320 * 240},
        Layout{1920, 1080, kFormatYv12, 32, 1920, 1920 * 1080 + 2 * 960 * 540},
        Layout{328, 4, kFormatYv12, 8, 328, 328 * 4 + 2 * 176 * 2},
        Layout{33, 3, kFormatYv12, 2, 34, 34 * 3 + 2 * 32 * 2},
        Layout{1, 1, kFormatYv12, 64, 64, 64 + 2 * 32},
        Layout{2, 2, kFormatYv12, 2, 2, 2 * 2 + 2 * 16},
        Layout{100, 10, kFormatYv12, 24, 120, 120 * 10 + 2 * 64 * 5},  // no power of two
        Layout{7, 2, kFormatYv12, 0, 8, 8 * 2 + 2 * 16}));             // 2 is the least padding

INSTANTIATE_TEST_SUITE_P(Packed, BufferLayout,
                         testing::Values(Layout{30, 5, WINDOW_FORMAT_RGBA_8888, 32, 32, 32 * 5 * 4},
                                         Layout{30, 5, WINDOW_FORMAT_RGBX_8888, 16, 32, 32 * 5 * 4},
                                         Layout{33, 5, WINDOW_FORMAT_RGB_565, 32, 64, 64 * 5 * 2},
                                         Layout{33, 5, 3, 32, 64, 64 * 5 * 3},    // RGB 888
                                         Layout{33, 5, 5, 32, 64, 64 * 5 * 4}));  // BGRA 8888

}  // namespace
