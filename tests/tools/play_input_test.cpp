// Clips that are not what they should be.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>

#include "playkit/clips.h"
#include "playkit/process.h"
#include "playkit/reference.h"
#include "playkit/y4m.h"

namespace {

using namespace playkit;
using testing::HasSubstr;
using testing::MatchesRegex;

constexpr int kFailed = 1;
constexpr int kDamaged = 3;
const char kOneLine[] = "vidshow-play: [^\n]+\n";

void expectUnplayable(const std::string& clip, const std::string& reason) {
    const Outcome outcome = play({clip, "--window", "memory"});
    EXPECT_EQ(outcome.status, kFailed);
    EXPECT_EQ(outcome.out, "");
    EXPECT_THAT(outcome.err, MatchesRegex(kOneLine));
    EXPECT_THAT(outcome.err, HasSubstr(clip));
    EXPECT_THAT(outcome.err, HasSubstr(reason));
}

TEST(PlayInput, MissingFile) {
    expectUnplayable("/nowhere/clip.mp4", "No such file");
}

TEST(PlayInput, Folder) {
    TempFolder folder;
    expectUnplayable(folder.path(""), "directory");
}

TEST(PlayInput, EmptyFile) {
    TempFolder folder;
    writeFile(folder.path("empty.mp4"), "");
    expectUnplayable(folder.path("empty.mp4"), "empty");
}

TEST(PlayInput, TextFile) {
    TempFolder folder;
    std::string text;
    for (int i = 0; i < 5000; ++i)
        text += "line " + std::to_string(i) + "\n";
    for (const char* name : {"text.mp4", "text", "text.md"}) {
        writeFile(folder.path(name), text);
        expectUnplayable(folder.path(name), "");
    }
}

TEST(PlayInput, TerminalRecordingIsNoVideo) {
    TempFolder folder;
    writeFile(folder.path("text.ans"), "\033[1mbold\033[0m plain\r\n");
    expectUnplayable(folder.path("text.ans"), "no video");
}

TEST(PlayInput, SoundAlone) {
    TempFolder folder;
    const std::string clip = folder.path("sound.wav");
    ffmpeg({"-f", "lavfi", "-i", "sine=duration=0.2", clip});
    expectUnplayable(clip, "no video");
}

TEST(PlayInput, CoverPictureIsNoVideo) {
    TempFolder folder;
    const std::string picture = folder.path("cover.png");
    const std::string clip = folder.path("song.mp4");
    ffmpeg({"-f", "lavfi", "-i", "color=size=32x32", "-frames:v", "1", picture});
    ffmpeg({"-f", "lavfi", "-i", "sine=duration=0.2", "-i", picture, "-map", "0", "-map", "1",
            "-c:v", "copy", "-disposition:v", "attached_pic", clip});
    expectUnplayable(clip, "no video");
}

// A play list may name anything on the net; a clip is one file.
TEST(PlayInput, PlayListOpensNoConnection) {
    TempFolder folder;
    const std::string clip = folder.path("list.m3u8");
    writeFile(clip,
              "#EXTM3U\n#EXT-X-TARGETDURATION:1\n#EXTINF:1,\nhttp://127.0.0.1:9/a.ts\n"
              "#EXT-X-ENDLIST\n");
    expectUnplayable(clip, "");
}

TEST(PlayInput, NameWithColonIsAFile) {
    TempFolder folder;
    const std::string clip = folder.path("http:colon.mkv");
    makeLossless(clip, {16, 16}, 1);
    EXPECT_EQ(play({clip, "--window", "memory"}).status, 0);
}

// What was read before the cut is shown, unchanged.
void expectBeginningShown(const std::string& whole, const std::string& cut) {
    TempFolder folder;
    const std::string file = folder.path("shown.y4m");
    const Outcome outcome = play({cut, "--window", "y4m:" + file});
    EXPECT_EQ(outcome.status, kDamaged);
    EXPECT_THAT(outcome.err, MatchesRegex(kOneLine));
    EXPECT_THAT(outcome.err, HasSubstr("cut off"));
    const std::vector<RawFrame> frames = decodeAll(whole);
    std::vector<RawFrame> shown = readY4m(file).frames;
    EXPECT_GT(shown.size(), frames.size() / 4);
    EXPECT_LT(shown.size(), frames.size());
    EXPECT_THAT(outcome.out, HasSubstr(std::to_string(shown.size()) + " frames shown"));
    shown.pop_back();  // the last one may have been cut itself
    expectSameFrames(shown,
                     {frames.begin(), frames.begin() + static_cast<ptrdiff_t>(shown.size())});
}

std::string cutInHalf(const TempFolder& folder, const std::string& whole) {
    const std::string bytes = readFile(whole);
    const std::string cut = folder.path("cut" + std::filesystem::path(whole).extension().string());
    writeFile(cut, bytes.substr(0, bytes.size() / 2));
    return cut;
}

TEST(PlayInput, CutMp4ShowsItsBeginning) {
    TempFolder folder;
    expectBeginningShown(VIDSHOW_SAMPLE, cutInHalf(folder, VIDSHOW_SAMPLE));
}

TEST(PlayInput, CutMatroskaShowsItsBeginning) {
    TempFolder folder;
    const std::string whole = folder.path("whole.mkv");
    makeLossless(whole, {64, 48}, 40);
    expectBeginningShown(whole, cutInHalf(folder, whole));
}

TEST(PlayInput, CutClipGivesPicturesOfWhatItHas) {
    TempFolder folder;
    const std::string pictures = folder.path("pictures");
    const Outcome outcome =
        play({cutInHalf(folder, VIDSHOW_SAMPLE), "--window", "png:" + pictures});
    EXPECT_EQ(outcome.status, kDamaged);
    // Up to twelve and the contact sheet; the frame at the cut may not decode.
    EXPECT_GE(listFolder(pictures).size(), 12u);
}

TEST(PlayInput, ClipCutBeforeItsFirstFrame) {
    TempFolder folder;
    const std::string clip = folder.path("start.mkv");
    makeLossless(folder.path("whole.mkv"), {64, 48}, 2);
    const std::string bytes = readFile(folder.path("whole.mkv"));
    writeFile(clip, bytes.substr(0, 700));
    expectUnplayable(clip, "");
}

TEST(PlayInput, DamageInTheMiddleIsTold) {
    TempFolder folder;
    const std::string clip = folder.path("hurt.ts");
    makeClip(clip, {320, 240}, 50, {"-c:v", "mpeg2video", "-g", "10"});
    std::string bytes = readFile(clip);
    for (size_t i = bytes.size() / 2; i < bytes.size() / 2 + 3000; ++i) {
        bytes[i] = static_cast<char>(bytes[i] ^ 0x5A);
    }
    writeFile(clip, bytes);
    const Outcome outcome = play({clip, "--window", "memory", "--no-pace"});
    EXPECT_EQ(outcome.status, kDamaged);
    EXPECT_THAT(outcome.err, MatchesRegex(kOneLine));
    EXPECT_THAT(outcome.err, HasSubstr("damaged"));
}

}  // namespace
