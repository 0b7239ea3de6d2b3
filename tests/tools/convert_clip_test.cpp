// vidshow-convert's clips: what FFmpeg's libraries write holds the engine's pictures, and what
// nothing encodes is refused.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "playkit/clips.h"
#include "playkit/process.h"
#include "playkit/reference.h"
#include "playkit/y4m.h"

namespace {

using namespace playkit;
using testing::HasSubstr;
using testing::MatchesRegex;

class ConvertClip : public testing::Test {
  protected:
    ConvertClip() { makeLossless(m_clip, {96, 64}, 5); }

    // What ffprobe says of the first stream of video, "name=value" a line.
    std::string probed(const std::string& path, const std::string& entries) const {
        return run({"ffprobe", "-v", "error", "-count_frames", "-select_streams", "v",
                    "-show_entries", "stream=" + entries, "-of", "default=noprint_wrappers=1",
                    path})
            .out;
    }

    void expectRefused(const std::vector<std::string>& arguments, int status,
                       const std::string& words) const {
        const Outcome outcome = convert(arguments);
        EXPECT_EQ(outcome.status, status);
        EXPECT_THAT(outcome.err, MatchesRegex("vidshow-convert: [^\n]+\n"));
        EXPECT_THAT(outcome.err, HasSubstr(words));
    }

    TempFolder m_folder;
    const std::string m_clip = m_folder.path("in.mkv");
};

TEST_F(ConvertClip, LosslessEncoderKeepsEverySample) {
    const std::string out = m_folder.path("out.mkv");
    const std::string y4m = m_folder.path("out.y4m");
    const std::vector<std::string> turned = {"--rotate", "180"};
    ASSERT_EQ(convert({m_clip, out, "--encoder", "ffv1", turned[0], turned[1]}).status, 0);
    ASSERT_EQ(convert({m_clip, y4m, turned[0], turned[1]}).status, 0);
    const std::vector<RawFrame> frames = decodeAll(out);
    ASSERT_EQ(frames.size(), 5u);
    expectSameFrames(frames, readY4m(y4m).frames);
}

TEST_F(ConvertClip, ExtensionChoosesContainerAndEncoder) {
    const struct {
        const char* name;
        const char* codec;
    } kinds[] = {
        {"out.mp4", "h264"}, {"out.mkv", "h264"}, {"out.avi", "mpeg4"}, {"out.gif", "gif"}};
    for (const auto& kind : kinds) {
        SCOPED_TRACE(kind.name);
        const std::string out = m_folder.path(kind.name);
        const Outcome outcome = convert({m_clip, out});
        EXPECT_EQ(outcome.status, 0) << outcome.err;
        EXPECT_EQ(
            probed(out, "codec_name,width,height,nb_read_frames"),
            "codec_name=" + std::string(kind.codec) + "\nwidth=96\nheight=64\nnb_read_frames=5\n");
    }
}

TEST_F(ConvertClip, PaceAndColoursStandInTheFile) {
    const std::string out = m_folder.path("out.mp4");
    ASSERT_EQ(convert({m_clip, out, "--matrix", "bt709", "--range", "limited"}).status, 0);
    EXPECT_EQ(probed(out, "color_range,color_space,avg_frame_rate"),
              "color_range=tv\ncolor_space=bt709\navg_frame_rate=25/1\n");
}

TEST_F(ConvertClip, PictureFilesAreNumbered) {
    ASSERT_EQ(convert({m_clip, m_folder.path("out.bmp"), "--frames", "2"}).status, 0);
    EXPECT_THAT(readFile(m_folder.path("out.bmp")), testing::StartsWith("BM"));
    EXPECT_THAT(readFile(m_folder.path("out-2.bmp")), testing::StartsWith("BM"));
    EXPECT_EQ(readFile(m_folder.path("out-3.bmp")), "");
}

// JPEG's readers take samples for full range, so black is 0 there.
TEST_F(ConvertClip, JpegGetsFullRange) {
    const std::string black = m_folder.path("black.yuv");
    const std::string out = m_folder.path("out.jpg");
    writeFile(black, std::string(64 * 64, 16) + std::string(64 * 64 / 2, static_cast<char>(128)));
    ASSERT_EQ(convert({black, out, "--size", "64x64"}).status, 0);
    const std::vector<RawFrame> frames = decodeAll(out);
    ASSERT_EQ(frames.size(), 1u);
    EXPECT_EQ(frames[0].planes[0][0], 0);
}

TEST_F(ConvertClip, EncoderOptionsReachTheEncoder) {
    const std::string fine = m_folder.path("fine.mkv");
    const std::string coarse = m_folder.path("coarse.mkv");
    ASSERT_EQ(convert({m_clip, fine, "--encoder-option", "crf=10"}).status, 0);
    ASSERT_EQ(convert({m_clip, coarse, "--encoder-option", "crf=45"}).status, 0);
    EXPECT_GT(readFile(fine).size(), readFile(coarse).size());
}

TEST_F(ConvertClip, RgbIsRepackedForTheEncoder) {
    const std::string out = m_folder.path("out.mkv");
    ASSERT_EQ(convert({m_clip, out, "--encoder", "ffv1", "--to", "rgb565"}).status, 0);
    EXPECT_THAT(probed(out, "nb_read_frames"), "nb_read_frames=5\n");
    const std::string seen = m_folder.path("seen.mkv");
    ASSERT_EQ(convert({m_clip, seen, "--encoder", "png", "--to", "rgb5551"}).status, 0);
    EXPECT_THAT(probed(seen, "pix_fmt"), "pix_fmt=rgba\n");
}

TEST_F(ConvertClip, SizeThatChangesOnTheWayGoesToASecondFile) {
    const std::string first = m_folder.path("a.ts");
    const std::string second = m_folder.path("b.ts");
    makeClip(first, {96, 64}, 3, {"-c:v", "mpeg2video"});
    makeClip(second, {64, 48}, 2, {"-c:v", "mpeg2video"});
    const std::string both = m_folder.path("both.ts");
    writeFile(both, readFile(first) + readFile(second));
    const Outcome outcome = convert({both, m_folder.path("out.avi")});
    EXPECT_THAT(outcome.err, testing::Not(HasSubstr("cannot")));
    EXPECT_EQ(probed(m_folder.path("out.avi"), "width"), "width=96\n");
    EXPECT_EQ(probed(m_folder.path("out-2.avi"), "width"), "width=64\n");
}

TEST_F(ConvertClip, StandardOutputTakesAContainerThatFlows) {
    const Outcome outcome = convert({m_clip, "-", "--as", "mkv", "--encoder", "ffv1"});
    ASSERT_EQ(outcome.status, 0) << outcome.err;
    const std::string out = m_folder.path("out.mkv");
    writeFile(out, outcome.out);
    expectSameFrames(decodeAll(out), decodeAll(m_clip));
}

TEST_F(ConvertClip, WhatNothingEncodesIsRefused) {
    expectRefused({m_clip, m_folder.path("out.foo")}, 2, "nothing here writes .foo");
    expectRefused({m_clip, m_folder.path("out.wav")}, 1, ".wav files hold no video");
    expectRefused({m_clip, m_folder.path("out.mp3")}, 1, ".mp3 files hold no video");
    expectRefused({m_clip, m_folder.path("out.mkv"), "--encoder", "aac"}, 1,
                  "no video encoder named aac");
    expectRefused({m_clip, m_folder.path("out.mkv"), "--encoder", "nothing"}, 1,
                  "no video encoder named nothing");
    expectRefused({m_clip, m_folder.path("out.mkv"), "--encoder-option", "nothing=1"}, 1,
                  "knows no option nothing");
    expectRefused({m_clip, m_folder.path("no/such/folder/out.mkv")}, 1, "cannot write");
    expectRefused({m_clip, "-", "--as", "bmp"}, 1, "pictures are files");
}

TEST_F(ConvertClip, NamesWithoutAContainerGetPlanes) {
    const size_t bytes = 5 * 96 * 64 * 3 / 2;
    for (const char* name : {"out", "out.raw", "out.yuv", "out.yuv420p"}) {
        ASSERT_EQ(convert({m_clip, m_folder.path(name)}).status, 0);
        EXPECT_EQ(readFile(m_folder.path(name)).size(), bytes) << name;
    }
    ASSERT_EQ(convert({m_clip, m_folder.path("out.foo"), "--as", "raw"}).status, 0);
    EXPECT_EQ(readFile(m_folder.path("out.foo")).size(), bytes);
}

}  // namespace
