// The window on the desktop: what is seen in it, and what its keys do.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>
#include <optional>

#include "playkit/clips.h"
#include "playkit/image.h"
#include "playkit/process.h"
#include "playkit/reference.h"
#include "playkit/screen.h"

namespace {

using namespace playkit;
using testing::EndsWith;
using testing::HasSubstr;
using testing::StartsWith;

constexpr Size kClip = {320, 240};
constexpr int kTolerance = 6;  // display conversion is made for speed
const Rgb kBlack = {0, 0, 0};

class PlaySdl : public testing::Test {
  protected:
    // Starts the player and waits for its window.
    void start(const std::vector<std::string>& options = {}) {
        std::vector<std::string> command = {VIDSHOW_PLAY, m_clip};
        command.insert(command.end(), options.begin(), options.end());
        m_player.emplace(command, m_screen.environment());
        m_window = m_screen.waitForWindow("clip.");
        ASSERT_NE(m_window, 0u) << m_player->wait().err;
    }

    // Ends it by a key and checks that it ends well.
    Outcome quit(const std::string& key = "q") {
        m_screen.press(m_window, key);
        const Outcome outcome = m_player->wait();
        EXPECT_EQ(outcome.status, 0);
        EXPECT_EQ(outcome.err, "");
        EXPECT_THAT(outcome.out, HasSubstr(" frames shown, "));
        return outcome;
    }

    Rgb pixel(int x, int y) { return m_screen.grab(m_window).at(x, y); }

    bool waitForPixel(int x, int y, const Rgb& wanted) {
        return waitUntil([&] {
            const Rgb seen = pixel(x, y);
            return std::abs(seen.red - wanted.red) <= kTolerance &&
                   std::abs(seen.green - wanted.green) <= kTolerance &&
                   std::abs(seen.blue - wanted.blue) <= kTolerance;
        });
    }

    // The fields of a still clip are seen in this place of the window.
    void expectFieldsAt(int left, int top, const Size& size) {
        const RawFrame frame = decodeAll(m_clip).at(0);
        for (const int i : {1, 3}) {
            for (const int j : {1, 3}) {
                const Rgb expected =
                    colourAt(frame, frame.width * i / 4, frame.height * j / 4, kBt601);
                const int x = left + size.width * i / 4;
                const int y = top + size.height * j / 4;
                SCOPED_TRACE(testing::Message() << x << ", " << y);
                EXPECT_TRUE(waitForPixel(x, y, expected));
                expectNear(pixel(x, y), expected, kTolerance);
            }
        }
    }

    // The frame of a counting clip that is seen.
    int frameSeen() {
        return static_cast<int>(std::lround(pixel(100, 100).green * 219.0 / 255 / 2));
    }

    // Stops the clip and returns the frame that stays.
    int pause() {
        m_screen.press(m_window, "space");
        int seen = -1;
        int times = 0;
        // Twenty looks take as long as several frames.
        EXPECT_TRUE(waitUntil([&] {
            const int now = frameSeen();
            times = now == seen ? times + 1 : 0;
            seen = now;
            return times == 20;
        }));
        return seen;
    }

    bool waitForTitle(const std::string& end) {
        return waitUntil([&] {
            const std::string title = m_screen.title(m_window);
            return title.size() >= end.size() &&
                   title.compare(title.size() - end.size(), end.size(), end) == 0;
        });
    }

    TempFolder m_folder;
    const std::string m_clip = m_folder.path("clip.mkv");
    Screen m_screen;
    std::optional<Process> m_player;
    Screen::WindowId m_window = 0;
};

TEST_F(PlaySdl, PictureIsSeenInItsOwnSize) {
    makeFourFields(m_clip, kClip, 60, 1);
    start();
    EXPECT_EQ(m_screen.size(m_window).width, kClip.width);
    EXPECT_EQ(m_screen.size(m_window).height, kClip.height);
    expectFieldsAt(0, 0, kClip);
    quit();
}

TEST_F(PlaySdl, DecoderBuffersAreSeenToo) {
    makeFourFields(m_clip, {318, 241}, 60, 1);
    start({"--path", "decoder", "--window", "sdl"});
    expectFieldsAt(0, 0, {318, 241});
    EXPECT_TRUE(waitForTitle(" - decoder buffers"));
    quit();
}

TEST_F(PlaySdl, WideWindowHasBarsAtItsSides) {
    makeFourFields(m_clip, kClip, 60, 1);
    start();
    m_screen.resize(m_window, {600, 240});
    expectFieldsAt(140, 0, kClip);
    for (const int x : {0, 70, 137, 462, 599})
        expectNear(pixel(x, 120), kBlack, 0);
    quit();
}

TEST_F(PlaySdl, TallWindowHasBarsAboveAndBelow) {
    makeFourFields(m_clip, kClip, 60, 1);
    start();
    m_screen.resize(m_window, {480, 560});
    expectFieldsAt(0, 100, {480, 360});
    for (const int y : {0, 50, 97, 462, 559})
        expectNear(pixel(240, y), kBlack, 0);
    quit();
}

TEST_F(PlaySdl, PixelsKeepTheirShape) {
    makeFourFields(m_clip, kClip, 60, 1,
                   {"-vf", "setsar=2", "-c:v", "ffv1", "-pix_fmt", "yuv420p"});
    start();
    EXPECT_EQ(m_screen.size(m_window).width, 2 * kClip.width);
    EXPECT_EQ(m_screen.size(m_window).height, kClip.height);
    expectFieldsAt(0, 0, {2 * kClip.width, kClip.height});
    quit();
}

TEST_F(PlaySdl, LargePictureFitsOnTheScreen) {
    makeFourFields(m_clip, {1000, 700}, 30, 1);
    start({"--matrix", "bt601"});
    const Size size = m_screen.size(m_window);
    EXPECT_LE(size.width, 800);
    EXPECT_EQ(size.height, (size.width * 7 + 5) / 10);
    expectFieldsAt(0, 0, size);
    quit();
}

TEST_F(PlaySdl, ClipMayChangeItsSize) {
    std::string bytes;
    for (const Size& size : {kClip, Size{98, 194}}) {
        const std::string part = m_folder.path("part.h264");
        makeFourFields(part, size, 100, 25,
                       {"-c:v", "libx264", "-preset", "ultrafast", "-pix_fmt", "yuv420p"});
        bytes += readFile(part);
    }
    writeFile(m_clip, bytes);
    start();
    EXPECT_TRUE(waitForPixel(60, 60, {255, 0, 0}));
    EXPECT_TRUE(waitForPixel(60, 60, kBlack));  // 121 wide now, in the middle
    EXPECT_TRUE(waitForPixel(130, 60, {255, 0, 0}));
    EXPECT_EQ(m_screen.size(m_window).width, kClip.width);
    quit();
}

TEST_F(PlaySdl, TitleTellsClipRateAndMode) {
    makeCounting(m_clip, kClip, 100, 5);
    start();
    EXPECT_TRUE(waitForTitle(" fps - off"));
    EXPECT_THAT(m_screen.title(m_window), StartsWith("clip.mkv - "));
    double rate = 0;
    EXPECT_TRUE(waitUntil([&] {
        const std::string title = m_screen.title(m_window);
        return std::sscanf(title.c_str(), "clip.mkv - %lf fps", &rate) == 1 && rate > 0;
    }));
    EXPECT_LE(rate, 7.5);  // five a second, counted over half a second at least
    quit();
}

TEST_F(PlaySdl, SpaceStopsAndGoesOn) {
    makeCounting(m_clip, kClip, 100, 10);
    start();
    EXPECT_TRUE(waitUntil([&] { return frameSeen() >= 2; }));
    const int stopped = pause();
    m_screen.press(m_window, "space");
    EXPECT_TRUE(waitUntil([&] { return frameSeen() > stopped; }));
    quit();
}

TEST_F(PlaySdl, ArrowsSeekFiveSeconds) {
    makeCounting(m_clip, kClip, 100, 5);
    start();
    EXPECT_TRUE(waitUntil([&] { return frameSeen() >= 1; }));
    const int stopped = pause();
    ASSERT_LT(stopped, 40);
    m_screen.press(m_window, "Right");
    EXPECT_TRUE(waitUntil([&] { return frameSeen() == stopped + 25; }));
    m_screen.press(m_window, "Right");
    EXPECT_TRUE(waitUntil([&] { return frameSeen() == stopped + 50; }));
    m_screen.press(m_window, "Left");
    EXPECT_TRUE(waitUntil([&] { return frameSeen() == stopped + 25; }));
    quit();
}

TEST_F(PlaySdl, SeekingBeforeTheStartShowsTheStart) {
    makeCounting(m_clip, kClip, 100, 10);
    start();
    EXPECT_TRUE(waitUntil([&] { return frameSeen() >= 2; }));
    const int stopped = pause();
    ASSERT_LT(stopped, 50);
    m_screen.press(m_window, "Left");
    EXPECT_TRUE(waitUntil([&] { return frameSeen() == 0; }));
    quit();
}

TEST_F(PlaySdl, SeekingPastTheEndEnds) {
    makeCounting(m_clip, kClip, 20, 5);
    start();
    m_screen.press(m_window, "Right");
    EXPECT_EQ(m_player->wait().status, 0);
}

TEST_F(PlaySdl, DGoesThroughTheModesAndRoundAgain) {
    makeCombed(m_clip, kClip, 100, 1);
    start();
    for (const char* mode :
         {"fast", "discard", "bob", "blend", "mean", "linear", "x", "off", "fast"}) {
        m_screen.press(m_window, "d");
        EXPECT_TRUE(waitForTitle(std::string(" - ") + mode)) << m_screen.title(m_window);
    }
    quit();
}

TEST_F(PlaySdl, AModeShowsWhilePlaying) {
    makeCombed(m_clip, kClip, 600, 10);
    start();
    EXPECT_TRUE(waitForPixel(100, 101, kBlack));
    m_screen.press(m_window, "d");
    EXPECT_TRUE(waitForPixel(100, 101, {255, 255, 255})) << "fast makes the black lines white";
    quit();
}

TEST_F(PlaySdl, EscapeEnds) {
    makeFourFields(m_clip, kClip, 60, 1);
    start();
    quit("Escape");
}

TEST_F(PlaySdl, ClosingTheWindowEnds) {
    makeFourFields(m_clip, kClip, 60, 1);
    start();
    m_screen.close(m_window);
    EXPECT_EQ(m_player->wait().status, 0);
}

TEST_F(PlaySdl, FAsksForFullScreen) {
    makeFourFields(m_clip, kClip, 60, 1);
    start();
    EXPECT_FALSE(m_screen.fullScreenAsked());
    m_screen.press(m_window, "f");
    EXPECT_TRUE(waitUntil([&] { return m_screen.fullScreenAsked(); }));
    quit();
}

TEST_F(PlaySdl, EndsWithTheClip) {
    makeFourFields(m_clip, kClip, 10, 10);
    start();
    const Outcome outcome = m_player->wait();
    EXPECT_EQ(outcome.status, 0);
    int shown = 0;
    int dropped = 0;
    ASSERT_EQ(std::sscanf(outcome.out.c_str(), "%d frames shown, %d dropped", &shown, &dropped), 2);
    EXPECT_EQ(shown + dropped, 10);
    EXPECT_GE(shown, 2);
}

}  // namespace
