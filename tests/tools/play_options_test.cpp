// The command line: what it tells, and what it refuses.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "playkit/process.h"

namespace {

using namespace playkit;
using testing::HasSubstr;
using testing::MatchesRegex;

constexpr int kUsage = 2;

// Wrong use: one line that names what is wrong, nothing played, status 2.
void expectRefused(const std::vector<std::string>& arguments, const std::string& word) {
    const Outcome outcome = play(arguments);
    EXPECT_EQ(outcome.status, kUsage);
    EXPECT_EQ(outcome.out, "");
    EXPECT_THAT(outcome.err, MatchesRegex("vidshow-play: [^\n]+\n"));
    EXPECT_THAT(outcome.err, HasSubstr(word));
}

TEST(PlayOptions, HelpNamesEveryOption) {
    const Outcome outcome = play({"--help"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.err, "");
    for (const char* option : {"CLIP", "--window", "--pick", "--path", "--deinterlace", "--matrix",
                               "--range", "--frames", "--no-pace", "--version", "Exit status"}) {
        EXPECT_THAT(outcome.out, HasSubstr(option));
    }
}

TEST(PlayOptions, VersionIsTheLibrarys) {
    const Outcome outcome = play({"--version"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.err, "");
    EXPECT_THAT(outcome.out, MatchesRegex("vidshow-play 1\\.[^\n]*Version:1\\.0\\.10461\\.1\n"));
}

TEST(PlayOptions, ClipIsRequired) {
    expectRefused({}, "CLIP");
}

TEST(PlayOptions, UnknownOptionIsRefused) {
    expectRefused({VIDSHOW_SAMPLE, "--loop"}, "--loop");
}

TEST(PlayOptions, SecondClipIsRefused) {
    expectRefused({VIDSHOW_SAMPLE, "another.mp4"}, "another.mp4");
}

TEST(PlayOptions, UnknownValuesAreRefused) {
    expectRefused({VIDSHOW_SAMPLE, "--path", "hardware"}, "hardware");
    expectRefused({VIDSHOW_SAMPLE, "--deinterlace", "yadif"}, "yadif");
    expectRefused({VIDSHOW_SAMPLE, "--matrix", "bt2020"}, "bt2020");
    expectRefused({VIDSHOW_SAMPLE, "--range", "wide"}, "wide");
}

TEST(PlayOptions, UnknownWindowsAreRefused) {
    for (const char* window : {"x11", "png", "png:", "y4m", "y4m:", "memory:x", "sdl:x", ""}) {
        SCOPED_TRACE(window);
        expectRefused({VIDSHOW_SAMPLE, "--window", window}, "--window");
    }
}

TEST(PlayOptions, CountsAreWholeNumbersFromOneOn) {
    for (const char* count : {"0", "-1", "x", "1.5", "00", "99999999999999999999"}) {
        SCOPED_TRACE(count);
        expectRefused({VIDSHOW_SAMPLE, "--frames", count}, "--frames");
        expectRefused({VIDSHOW_SAMPLE, "--pick", std::string("1,") + count}, "--pick");
    }
}

TEST(PlayOptions, ValueMayNotBeMissing) {
    expectRefused({VIDSHOW_SAMPLE, "--frames"}, "--frames");
}

}  // namespace
