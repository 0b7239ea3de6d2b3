// Clips of other pixel forms are brought to 8-bit planar 4:2:0.

#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>

#include "playkit/clips.h"
#include "playkit/image.h"
#include "playkit/process.h"
#include "playkit/reference.h"
#include "playkit/y4m.h"

namespace {

using namespace playkit;

class PlayFormats : public testing::Test {
  protected:
    // Plays the clip and returns its only frame.
    RawFrame shown() {
        const std::string file = m_folder.path("shown.y4m");
        const Outcome outcome = play({m_clip, "--window", "y4m:" + file});
        EXPECT_EQ(outcome.status, 0);
        EXPECT_EQ(outcome.err, "");
        m_file = readY4m(file);
        EXPECT_EQ(m_file.frames.size(), 1u);
        return m_file.frames.at(0);
    }

    // Luma of the clip, brought to 8 bits by ffmpeg where it has more.
    std::vector<uint8_t> clipLuma() {
        const std::string raw = m_folder.path("luma.raw");
        ffmpeg({"-i", m_clip, "-vf", "extractplanes=y,format=gray", "-f", "rawvideo", raw});
        const std::string bytes = readFile(raw);
        return {bytes.begin(), bytes.end()};
    }

    TempFolder m_folder;
    const std::string m_clip = m_folder.path("clip.mkv");
    Y4m m_file;
};

TEST_F(PlayFormats, LumaOfOtherChromaFormsIsUnchanged) {
    for (const char* form : {"yuv422p", "yuv444p", "yuv410p", "yuv411p", "yuva420p"}) {
        SCOPED_TRACE(form);
        makeLossless(m_clip, {99, 66}, 1, form);
        EXPECT_TRUE(shown().planes[0] == clipLuma());
        EXPECT_EQ(y4mTag(m_file, 'X'), "COLORRANGE=LIMITED");
    }
}

TEST_F(PlayFormats, FullRangeStaysFull) {
    makeClip(m_clip, {99, 66}, 1, {"-c:v", "ffv1", "-pix_fmt", "yuv422p", "-color_range", "pc"});
    EXPECT_TRUE(shown().planes[0] == clipLuma());
    EXPECT_EQ(y4mTag(m_file, 'X'), "COLORRANGE=FULL");
}

TEST_F(PlayFormats, TenBitsAreRoundedToEight) {
    makeLossless(m_clip, {64, 48}, 1, "yuv420p");
    const RawFrame eight = decodeAll(m_clip).at(0);
    const std::string deep = m_folder.path("deep.mkv");
    ffmpeg({"-i", m_clip, "-c:v", "ffv1", "-pix_fmt", "yuv420p10le", deep});
    const std::string file = m_folder.path("shown.y4m");
    EXPECT_EQ(play({deep, "--window", "y4m:" + file}).status, 0);
    expectSameFrames(readY4m(file).frames, {eight});  // 8 bits widened to 10 come back as they were
}

TEST_F(PlayFormats, GreyUsesTheWholeRange) {
    makeLossless(m_clip, {64, 48}, 1, "gray");
    const RawFrame frame = shown();
    EXPECT_TRUE(frame.planes[0] == clipLuma());
    EXPECT_TRUE(frame.planes[1] == std::vector<uint8_t>(frame.planes[1].size(), 128));
    EXPECT_TRUE(frame.planes[2] == std::vector<uint8_t>(frame.planes[2].size(), 128));
    EXPECT_EQ(y4mTag(m_file, 'X'), "COLORRANGE=FULL");
}

// Every field of flat colour arrives as BT.601 defines it, limited range.
TEST_F(PlayFormats, RgbBecomesBt601) {
    for (const char* form : {"rgb24", "bgra", "gbrp"}) {
        SCOPED_TRACE(form);
        makeFourFields(m_clip, {64, 48}, 1, 25,
                       {"-c:v", std::string(form) == "rgb24" ? "png" : "ffv1", "-pix_fmt", form});
        const RawFrame frame = shown();
        expectNear(colourAt(frame, 16, 12, kBt601), {255, 0, 0}, 3);
        expectNear(colourAt(frame, 48, 12, kBt601), {0, 128, 0}, 3);
        expectNear(colourAt(frame, 16, 36, kBt601), {0, 0, 255}, 3);
        expectNear(colourAt(frame, 48, 36, kBt601), {255, 255, 0}, 3);
    }
}

TEST_F(PlayFormats, PaletteBecomesBt601) {
    makeFourFields(m_clip, {64, 48}, 1, 25,
                   {"-c:v", "png", "-vf", "split[a][b];[a]palettegen[p];[b][p]paletteuse",
                    "-pix_fmt", "pal8"});
    const RawFrame frame = shown();
    expectNear(colourAt(frame, 16, 12, kBt601), {255, 0, 0}, 4);
    expectNear(colourAt(frame, 48, 36, kBt601), {255, 255, 0}, 4);
}

}  // namespace
