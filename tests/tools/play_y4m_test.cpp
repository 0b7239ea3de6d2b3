// What arrives at the window is the clip: every sample of every frame.

#include <gtest/gtest.h>

#include "playkit/clips.h"
#include "playkit/process.h"
#include "playkit/reference.h"
#include "playkit/y4m.h"

namespace {

using namespace playkit;

// Plays a clip into a file and compares the file with the clip. Returns the clip's frames.
std::vector<RawFrame> expectWhole(const std::string& clip, const std::string& path) {
    TempFolder folder;
    const std::string file = folder.path("shown.y4m");
    const Outcome outcome = play({clip, "--window", "y4m:" + file, "--path", path});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.err, "");
    const std::vector<RawFrame> expected = decodeAll(clip);
    EXPECT_FALSE(expected.empty());
    expectSameFrames(readY4m(file).frames, expected);
    return expected;
}

class Paths : public testing::TestWithParam<const char*> {};

INSTANTIATE_TEST_SUITE_P(Play, Paths, testing::Values("software", "decoder"),
                         [](const auto& path) { return std::string(path.param); });

TEST_P(Paths, SampleClipArrivesWhole) {
    expectWhole(VIDSHOW_SAMPLE, GetParam());
}

void expectSizesWhole(const std::vector<Size>& sizes, const std::string& path) {
    TempFolder folder;
    for (const Size& size : sizes) {
        const std::string name = std::to_string(size.width) + "x" + std::to_string(size.height);
        SCOPED_TRACE(name);
        const std::string clip = folder.path(name + ".mkv");
        makeLossless(clip, size, 2);
        const std::vector<RawFrame> frames = expectWhole(clip, path);
        ASSERT_EQ(frames.size(), 2u);
        EXPECT_EQ(frames[0].width, size.width);
        EXPECT_EQ(frames[0].height, size.height);
    }
}

TEST_P(Paths, SizesOfWholeBlocksArriveWhole) {
    expectSizesWhole({{320, 240}, {64, 36}, {16, 16}, {4, 4}}, GetParam());
}

TEST_P(Paths, SizesThatAreNotMultiplesOfFourArriveWhole) {
    expectSizesWhole({{174, 100}, {100, 174}, {178, 102}, {2, 2}}, GetParam());
}

TEST_P(Paths, OddSizesArriveWhole) {
    expectSizesWhole({{175, 101}, {173, 100}, {176, 99}, {1, 1}, {3, 5}}, GetParam());
}

TEST_P(Paths, FramesStopsAfterThatMany) {
    TempFolder folder;
    const std::string file = folder.path("shown.y4m");
    const Outcome outcome =
        play({VIDSHOW_SAMPLE, "--window", "y4m:" + file, "--path", GetParam(), "--frames", "7"});
    EXPECT_EQ(outcome.status, 0);
    std::vector<RawFrame> expected = decodeAll(VIDSHOW_SAMPLE);
    expected.resize(7);
    expectSameFrames(readY4m(file).frames, expected);
}

}  // namespace
