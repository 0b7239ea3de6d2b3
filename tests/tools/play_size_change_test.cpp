// Clips that change their size on the way.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

#include "playkit/clips.h"
#include "playkit/image.h"
#include "playkit/process.h"
#include "playkit/reference.h"
#include "playkit/y4m.h"

namespace {

using namespace playkit;
using testing::HasSubstr;
using testing::MatchesRegex;

constexpr int kFramesEach = 5;

class PlaySizeChange : public testing::TestWithParam<const char*> {
  protected:
    // Three streams of H.264 behind each other: sizes of whole blocks and others.
    PlaySizeChange() {
        std::string bytes;
        for (const Size& size : kSizes) {
            const std::string part = m_folder.path("part.h264");
            makeClip(part, size, kFramesEach, {"-c:v", "libx264", "-pix_fmt", "yuv420p"});
            bytes += readFile(part);
        }
        writeFile(m_clip, bytes);
    }

    const std::vector<Size> kSizes = {{160, 120}, {98, 66}, {320, 240}};
    TempFolder m_folder;
    const std::string m_clip = m_folder.path("clip.h264");
};

INSTANTIATE_TEST_SUITE_P(Play, PlaySizeChange, testing::Values("software", "decoder"),
                         [](const auto& path) { return std::string(path.param); });

TEST_P(PlaySizeChange, EveryPartIsWrittenWhole) {
    const Outcome outcome =
        play({m_clip, "--window", "y4m:" + m_folder.path("out.y4m"), "--path", GetParam()});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.err, "");
    EXPECT_THAT(outcome.out, HasSubstr("out-3.y4m"));
    const std::vector<RawFrame> expected = decodeAll(m_clip);
    ASSERT_EQ(expected.size(), 3u * kFramesEach);
    std::vector<RawFrame> shown;
    size_t part = 0;
    for (const char* name : {"out.y4m", "out-2.y4m", "out-3.y4m"}) {
        const Y4m file = readY4m(m_folder.path(name));
        EXPECT_EQ(y4mTag(file, 'W'), std::to_string(kSizes[part].width));
        EXPECT_EQ(y4mTag(file, 'H'), std::to_string(kSizes[part].height));
        shown.insert(shown.end(), file.frames.begin(), file.frames.end());
        ++part;
    }
    expectSameFrames(shown, expected);
}

TEST_P(PlaySizeChange, PicturesHaveTheirFramesSize) {
    const std::string pictures = m_folder.path("pictures");
    const Outcome outcome =
        play({m_clip, "--window", "png:" + pictures, "--pick", "1,6,11", "--path", GetParam()});
    EXPECT_EQ(outcome.status, 0);
    size_t part = 0;
    for (const char* name : {"/frame-000001.png", "/frame-000006.png", "/frame-000011.png"}) {
        const Image image = readPng(pictures + name);
        EXPECT_EQ(image.width, kSizes[part].width);
        EXPECT_EQ(image.height, kSizes[part].height);
        ++part;
    }
}

TEST_P(PlaySizeChange, StandardOutputHoldsOneSize) {
    const Outcome outcome = play({m_clip, "--window", "y4m:-", "--path", GetParam()});
    EXPECT_EQ(outcome.status, 1);
    EXPECT_THAT(outcome.err, MatchesRegex("vidshow-play: [^\n]*changes its size[^\n]*\n"));
}

}  // namespace
