// Pictures and the contact sheet.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "playkit/clips.h"
#include "playkit/image.h"
#include "playkit/process.h"
#include "playkit/reference.h"

namespace {

using namespace playkit;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::MatchesRegex;

// The contact sheet's margins.
constexpr int kGap = 8;
constexpr int kGrey = 32;

class PlayPng : public testing::Test {
  protected:
    TempFolder m_folder;
    const std::string m_clip = m_folder.path("clip.mkv");
    const std::string m_pictures = m_folder.path("deep/pictures");

    Outcome pictures(std::vector<std::string> options = {}) {
        options.insert(options.begin(), {m_clip, "--window", "png:" + m_pictures});
        return play(options);
    }
    Image frame(const char* number) { return readPng(m_pictures + "/frame-" + number + ".png"); }
};

TEST_F(PlayPng, ChosenFramesAreWritten) {
    makeLossless(m_clip, {64, 48}, 10);
    const Outcome outcome = pictures({"--pick", "7,2,7"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.err, "");
    EXPECT_THAT(outcome.out, HasSubstr("pictures in " + m_pictures + "\n"));
    EXPECT_THAT(listFolder(m_pictures),
                ElementsAre("contact-sheet.png", "frame-000002.png", "frame-000007.png"));
}

TEST_F(PlayPng, WithoutChoiceTheyAreSpread) {
    makeLossless(m_clip, {64, 48}, 24);
    EXPECT_EQ(pictures().status, 0);
    const std::vector<std::string> names = listFolder(m_pictures);
    ASSERT_EQ(names.size(), 13u);
    EXPECT_EQ(names[1], "frame-000002.png");  // the second of every two
    EXPECT_EQ(names[2], "frame-000004.png");
    EXPECT_EQ(names[12], "frame-000024.png");
}

TEST_F(PlayPng, ShortClipGivesEveryFrame) {
    makeLossless(m_clip, {64, 48}, 2);
    EXPECT_EQ(pictures().status, 0);
    EXPECT_THAT(listFolder(m_pictures),
                ElementsAre("contact-sheet.png", "frame-000001.png", "frame-000002.png"));
}

TEST_F(PlayPng, FramesLimitsTheSpread) {
    makeLossless(m_clip, {64, 48}, 24);
    EXPECT_EQ(pictures({"--frames", "1"}).status, 0);
    EXPECT_THAT(listFolder(m_pictures), ElementsAre("contact-sheet.png", "frame-000001.png"));
}

TEST_F(PlayPng, FrameThatIsNotThereIsTold) {
    makeLossless(m_clip, {64, 48}, 5);
    const Outcome outcome = pictures({"--pick", "2,9"});
    EXPECT_EQ(outcome.status, 1);
    EXPECT_THAT(outcome.err, MatchesRegex("vidshow-play: [^\n]*no frame 9\n"));
    EXPECT_THAT(outcome.out, HasSubstr("5 frames shown"));
    EXPECT_THAT(listFolder(m_pictures), ElementsAre("contact-sheet.png", "frame-000002.png"));
}

TEST_F(PlayPng, NoneOfTheChosenFrames) {
    makeLossless(m_clip, {64, 48}, 5);
    const Outcome outcome = pictures({"--pick", "9"});
    EXPECT_EQ(outcome.status, 1);
    EXPECT_THAT(outcome.err, MatchesRegex("vidshow-play: none of[^\n]*\n"));
}

// The middle of each of the four fields has its colour, by the matrix's definition.
void expectFields(const Image& image, const RawFrame& frame, const Weights& weights,
                  bool fullRange = false) {
    ASSERT_EQ(image.width, frame.width);
    ASSERT_EQ(image.height, frame.height);
    for (const int x : {frame.width / 4, frame.width * 3 / 4}) {
        for (const int y : {frame.height / 4, frame.height * 3 / 4}) {
            SCOPED_TRACE(testing::Message() << x << ", " << y);
            expectNear(image.at(x, y), colourAt(frame, x, y, weights, fullRange), 2);
        }
    }
}

TEST_F(PlayPng, ColoursAreTheClips) {
    makeFourFields(m_clip, {64, 48}, 1, 25);
    EXPECT_EQ(pictures().status, 0);
    const std::vector<RawFrame> frames = decodeAll(m_clip);
    expectFields(frame("000001"), frames.at(0), kBt601);
    const Rgb red = frame("000001").at(16, 12);
    expectNear(red, {255, 0, 0}, 6);
}

TEST_F(PlayPng, ColoursOfPaddedSizes) {
    makeFourFields(m_clip, {75, 53}, 1, 25);
    EXPECT_EQ(pictures().status, 0);
    expectFields(frame("000001"), decodeAll(m_clip).at(0), kBt601);
}

TEST_F(PlayPng, MatrixCanBeChosen) {
    makeFourFields(m_clip, {64, 48}, 1, 25);
    const std::vector<RawFrame> frames = decodeAll(m_clip);
    const std::pair<const char*, Weights> matrices[] = {
        {"bt601", kBt601}, {"bt709", kBt709}, {"smpte240m", kSmpte240m}, {"fcc", kFcc}};
    for (const auto& [name, weights] : matrices) {
        SCOPED_TRACE(name);
        EXPECT_EQ(pictures({"--matrix", name}).status, 0);
        expectFields(frame("000001"), frames.at(0), weights);
    }
}

TEST_F(PlayPng, RangeCanBeChosen) {
    makeFourFields(m_clip, {64, 48}, 1, 25);
    EXPECT_EQ(pictures({"--range", "full"}).status, 0);
    expectFields(frame("000001"), decodeAll(m_clip).at(0), kBt601, true);
}

TEST_F(PlayPng, MatrixAndRangeAreTheClips) {
    makeFourFields(m_clip, {64, 48}, 1, 25,
                   {"-vf", "scale=out_color_matrix=bt709:out_range=pc", "-c:v", "ffv1", "-pix_fmt",
                    "yuv420p", "-colorspace", "bt709", "-color_range", "pc"});
    EXPECT_EQ(pictures().status, 0);
    const Image image = frame("000001");
    expectFields(image, decodeAll(m_clip).at(0), kBt709, true);
    expectNear(image.at(48, 36), {255, 255, 0}, 3);
}

TEST_F(PlayPng, ClipsOf720LinesAreBt709UnlessTheySay) {
    makeFourFields(m_clip, {96, 720}, 1, 25);
    EXPECT_EQ(pictures().status, 0);
    expectFields(frame("000001"), decodeAll(m_clip).at(0), kBt709);
}

TEST_F(PlayPng, ContactSheetShowsThePictures) {
    makeFourFields(m_clip, {64, 48}, 5, 25);
    EXPECT_EQ(pictures({"--pick", "1,2,3,4,5"}).status, 0);
    const Image sheet = readPng(m_pictures + "/contact-sheet.png");
    ASSERT_EQ(sheet.width, kGap + 3 * (64 + kGap));  // five pictures: three columns, two rows
    ASSERT_EQ(sheet.height, kGap + 2 * (48 + kGap));
    const Rgb grey = {kGrey, kGrey, kGrey};
    const RawFrame raw = decodeAll(m_clip).at(0);
    for (int i = 0; i < 5; ++i) {
        const int left = kGap + i % 3 * (64 + kGap);
        const int top = kGap + i / 3 * (48 + kGap);
        expectNear(sheet.at(left + 16, top + 12), colourAt(raw, 16, 12, kBt601), 2);
        expectNear(sheet.at(left + 48, top + 36), colourAt(raw, 48, 36, kBt601), 2);
        expectNear(sheet.at(left - 1, top - 1), grey, 0);
    }
    expectNear(sheet.at(kGap + 2 * (64 + kGap) + 20, kGap + 48 + kGap + 20), grey, 0);
}

// Large pictures become at most 320 by 320, as they are seen: these pixels are twice as wide.
TEST_F(PlayPng, ContactSheetKeepsTheShape) {
    makeFourFields(m_clip, {400, 100}, 1, 25,
                   {"-vf", "setsar=2", "-c:v", "ffv1", "-pix_fmt", "yuv420p"});
    EXPECT_EQ(pictures().status, 0);
    const Image sheet = readPng(m_pictures + "/contact-sheet.png");
    EXPECT_EQ(sheet.width, kGap + 320 + kGap);
    EXPECT_EQ(sheet.height, kGap + 40 + kGap);
}

}  // namespace
