// The window that vidshowsink opens on a desktop.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <string>
#include <vector>

#include "playkit/image.h"
#include "playkit/process.h"
#include "playkit/screen.h"

namespace {

using namespace playkit;
using testing::HasSubstr;

constexpr Rgb kColour = {192, 64, 32};
constexpr Size kPicture = {320, 240};
constexpr int kTolerance = 6;  // two conversions on the way, of 8 bits each

// gst-launch with an endless clip of one colour, shown on a screen.
class SinkWindow : public testing::Test {
  protected:
    SinkWindow()
        : m_launch({VIDSHOW_GST_LAUNCH, "-q", "videotestsrc", "is-live=true", "pattern=solid-color",
                    "foreground-color=0xffc04020", "!",
                    "video/x-raw,format=I420,width=320,height=240,framerate=25/1", "!",
                    "vidshowsink", "sync=false"},
                   environment()),
          m_window(m_screen.waitForWindow("vidshowsink")) {}

    Environment environment() const {
        Environment all = m_screen.environment();
        all.emplace_back("GST_PLUGIN_PATH", VIDSHOW_GSTREAMER_FOLDER);
        all.emplace_back("GST_REGISTRY", m_folder.path("registry.bin"));
        return all;
    }

    bool waitForColourAt(int x, int y) {
        return waitUntil([&] {
            const Rgb seen = m_screen.grab(m_window).at(x, y);
            return std::abs(seen.red - kColour.red) <= kTolerance &&
                   std::abs(seen.green - kColour.green) <= kTolerance &&
                   std::abs(seen.blue - kColour.blue) <= kTolerance;
        });
    }

    TempFolder m_folder;
    Screen m_screen;
    Process m_launch;
    Screen::WindowId m_window;
};

TEST_F(SinkWindow, ShowsThePictureInItsSize) {
    ASSERT_NE(m_window, 0u);
    EXPECT_TRUE(waitUntil([&] {
        const Size size = m_screen.size(m_window);
        return size.width == kPicture.width && size.height == kPicture.height;
    }));
    for (const int x : {0, kPicture.width / 2, kPicture.width - 1}) {
        for (const int y : {0, kPicture.height / 2, kPicture.height - 1})
            EXPECT_TRUE(waitForColourAt(x, y)) << x << ", " << y;
    }
}

TEST_F(SinkWindow, ClosingItEndsTheClipWithAnError) {
    ASSERT_NE(m_window, 0u);
    ASSERT_TRUE(waitForColourAt(1, 1));
    m_screen.close(m_window);
    const Outcome outcome = m_launch.wait();
    EXPECT_GT(outcome.status, 0);
    EXPECT_THAT(outcome.err, HasSubstr("the window was closed"));
}

}  // namespace
