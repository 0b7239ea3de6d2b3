// Every deinterlacing mode by its name: what each makes of a picture that is one comb from top to
// bottom, even lines white and odd lines black.

#include <gtest/gtest.h>

#include <string>

#include "playkit/clips.h"
#include "playkit/process.h"
#include "playkit/y4m.h"

namespace {

using namespace playkit;

constexpr Size kClip = {64, 48};
constexpr int kWhite = 235, kBlack = 16, kHalf = (kWhite + kBlack) / 2;

/// Luma of four lines. Even lines are white in all modes but two.
struct Lines {
    const char* mode;
    int second, middleEven, middleOdd, last;
};

// The five taps of `fast` see the first line twice, and the last one three times.
constexpr int kFastSecond = (4 * (kWhite + kWhite) + 2 * kBlack - (kWhite + kBlack) + 4) / 8;
constexpr int kFastLast = (4 * (kWhite + kBlack) + 2 * kBlack - (kBlack + kBlack) + 4) / 8;

constexpr Lines kModes[] = {
    {"off", kBlack, kWhite, kBlack, kBlack},     {"fast", kFastSecond, kWhite, kWhite, kFastLast},
    {"discard", kWhite, kWhite, kWhite, kWhite}, {"bob", kWhite, kWhite, kWhite, kBlack},
    {"blend", kHalf, kHalf, kHalf, kHalf},       {"mean", kHalf, kHalf, kHalf, kHalf},
    {"linear", kWhite, kWhite, kWhite, kBlack},  {"x", kWhite, kWhite, kWhite, kWhite}};

class PlayDeinterlace : public testing::TestWithParam<Lines> {};

INSTANTIATE_TEST_SUITE_P(Modes, PlayDeinterlace, testing::ValuesIn(kModes),
                         [](const auto& mode) { return std::string(mode.param.mode); });

TEST_P(PlayDeinterlace, ByName) {
    TempFolder folder;
    const std::string clip = folder.path("comb.mkv"), shown = folder.path("shown.y4m");
    makeCombed(clip, kClip, 3, 25);
    const Outcome outcome =
        play({clip, "--window", "y4m:" + shown, "--deinterlace", GetParam().mode});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.err, "");
    const auto frames = readY4m(shown).frames;
    ASSERT_EQ(frames.size(), 3u);
    for (const auto& frame : frames) {
        const auto luma = [&](int line) {
            return int{frame.planes[0][static_cast<size_t>(line * kClip.width + 30)]};
        };
        EXPECT_EQ(luma(1), GetParam().second);
        EXPECT_EQ(luma(24), GetParam().middleEven);
        EXPECT_EQ(luma(25), GetParam().middleOdd);
        EXPECT_EQ(luma(47), GetParam().last);
    }
}

}  // namespace
