// Where the pictures go, what is said at the end, and outputs that cannot be written.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>

#include "playkit/clips.h"
#include "playkit/process.h"
#include "playkit/reference.h"
#include "playkit/terminal.h"
#include "playkit/y4m.h"

namespace {

using namespace playkit;
using testing::HasSubstr;
using testing::MatchesRegex;

constexpr int kFailed = 1;
const char kClosing[] =
    "[0-9]+ frames shown, [0-9]+ dropped, [0-9]+ failed, [0-9]+\\.[0-9][0-9][0-9] ms per Present\n";

class PlayOutput : public testing::Test {
  protected:
    PlayOutput() { makeLossless(m_clip, {64, 48}, kFrames); }

    static constexpr int kFrames = 25;  // one second
    TempFolder m_folder;
    const std::string m_clip = m_folder.path("clip.mkv");
};

TEST_F(PlayOutput, ClosingLineCountsTheFrames) {
    const Outcome outcome = play({m_clip, "--window", "memory", "--no-pace"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.err, "");
    EXPECT_THAT(outcome.out, MatchesRegex(kClosing));
    EXPECT_THAT(outcome.out, HasSubstr("25 frames shown, 0 dropped, 0 failed"));
}

TEST_F(PlayOutput, FramesStopsTheClip) {
    const Outcome outcome = play({m_clip, "--window", "memory", "--no-pace", "--frames", "3"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_THAT(outcome.out, HasSubstr("3 frames shown, 0 dropped"));
}

TEST_F(PlayOutput, MoreFramesThanTheClipHasIsNoFault) {
    const Outcome outcome = play({m_clip, "--window", "memory", "--no-pace", "--frames", "1000"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_THAT(outcome.out, HasSubstr("25 frames shown"));
}

// The last frame is due 24/25 of a second after the first.
TEST_F(PlayOutput, MemoryKeepsTheClipsPace) {
    const auto start = std::chrono::steady_clock::now();
    const Outcome outcome = play({m_clip, "--window", "memory"});
    const std::chrono::duration<double> passed = std::chrono::steady_clock::now() - start;
    EXPECT_GE(passed.count(), 0.95);
    int shown = 0;
    int dropped = 0;
    ASSERT_EQ(std::sscanf(outcome.out.c_str(), "%d frames shown, %d dropped", &shown, &dropped), 2);
    EXPECT_EQ(shown + dropped, kFrames);
}

TEST_F(PlayOutput, Y4mGoesToStandardOutput) {
    const Outcome outcome = play({m_clip, "--window", "y4m:-"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_THAT(outcome.err, MatchesRegex(kClosing));
    writeFile(m_folder.path("out.y4m"), outcome.out);
    expectSameFrames(readY4m(m_folder.path("out.y4m")).frames, decodeAll(m_clip));
}

TEST_F(PlayOutput, Y4mHeaderTellsTheClip) {
    const std::string clip = m_folder.path("wide.mkv");
    makeClip(clip, {64, 48}, 1,
             {"-c:v", "ffv1", "-vf", "setsar=4/3", "-pix_fmt", "yuv420p", "-color_range", "pc"});
    play({clip, "--window", "y4m:" + m_folder.path("out.y4m")});
    const Y4m file = readY4m(m_folder.path("out.y4m"));
    EXPECT_EQ(y4mTag(file, 'F'), "25:1");
    EXPECT_EQ(y4mTag(file, 'A'), "4:3");
    EXPECT_EQ(y4mTag(file, 'I'), "p");
    EXPECT_EQ(y4mTag(file, 'X'), "COLORRANGE=FULL");
}

void expectUnwritable(const std::string& clip, const std::string& window) {
    const Outcome outcome = play({clip, "--window", window});
    EXPECT_EQ(outcome.status, kFailed);
    EXPECT_EQ(outcome.out, "");
    EXPECT_THAT(outcome.err, MatchesRegex("vidshow-play: cannot [^\n]+\n"));
}

TEST_F(PlayOutput, UnwritableY4m) {
    expectUnwritable(m_clip, "y4m:/nowhere/out.y4m");
    expectUnwritable(m_clip, "y4m:" + m_folder.path(""));
}

TEST_F(PlayOutput, FullDisk) {
    expectUnwritable(m_clip, "y4m:/dev/full");
}

TEST_F(PlayOutput, PicturesWantAFolder) {
    writeFile(m_folder.path("file"), "");
    expectUnwritable(m_clip, "png:" + m_folder.path("file"));
    expectUnwritable(m_clip, "png:" + m_folder.path("file/folder"));
}

TEST_F(PlayOutput, WindowWithoutDisplay) {
    expectUnwritable(m_clip, "sdl");
}

TEST_F(PlayOutput, WithoutDisplayPicturesAreMade) {
    Environment environment = withoutDisplay();
    environment.emplace_back("TMPDIR", m_folder.path(""));
    const Outcome outcome = run({VIDSHOW_PLAY, m_clip}, environment);
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.err, "");
    ASSERT_THAT(outcome.out, testing::StartsWith("pictures in " + m_folder.path("")));
    const size_t start = std::string("pictures in ").size();
    const std::string place = outcome.out.substr(start, outcome.out.find('\n') - start);
    EXPECT_EQ(listFolder(place).size(), 13u);
}

TEST_F(PlayOutput, UnreachableDisplayCountsAsNone) {
    const Environment environment = {
        {"DISPLAY", ":9999"},
        {"WAYLAND_DISPLAY", ""},
        {"TMPDIR", m_folder.path("")},
        {"LSAN_OPTIONS", "detect_leaks=0"}};  // the desktop's own libraries leave memory behind
    const Outcome outcome = run({VIDSHOW_PLAY, m_clip}, environment);
    EXPECT_EQ(outcome.status, 0);
    EXPECT_THAT(outcome.out, HasSubstr("pictures in "));
}

TEST_F(PlayOutput, DecoderBuffersAreNotDeinterlaced) {
    const Outcome outcome = play(
        {m_clip, "--window", "memory", "--no-pace", "--path", "decoder", "--deinterlace", "blend"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_THAT(outcome.err, MatchesRegex("vidshow-play: [^\n]*--deinterlace has no effect\n"));
    EXPECT_THAT(outcome.out, HasSubstr("25 frames shown"));
}

TEST_F(PlayOutput, TerminalSeesProgress) {
    const std::string seen = runOnTerminal({VIDSHOW_PLAY, m_clip, "--window", "memory"});
    EXPECT_THAT(seen, HasSubstr("of 25 frames"));
    EXPECT_THAT(seen, HasSubstr(" %"));
    EXPECT_THAT(seen, HasSubstr("25 frames shown"));
}

}  // namespace
