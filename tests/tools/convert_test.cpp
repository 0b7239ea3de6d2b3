// What vidshow-convert writes is what the engine makes of the same planes, and what it does not do
// it says.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <utility>

#include "playkit/clips.h"
#include "playkit/image.h"
#include "playkit/process.h"
#include "playkit/reference.h"
#include "playkit/terminal.h"
#include "playkit/y4m.h"
#include "vidshow/imageproc.h"

namespace {

using namespace playkit;
using testing::HasSubstr;
using testing::MatchesRegex;

constexpr int kWidth = 64;
constexpr int kHeight = 48;
constexpr size_t kLuma = size_t{kWidth} * kHeight;

// A picture of 4:2:0 in a file of raw planes.
class Convert : public testing::Test {
  protected:
    Convert() {
        for (size_t i = 0; i < kLuma * 3 / 2; ++i) {
            m_planes.push_back(static_cast<char>(16 + (i * 2654435761u >> 7) % 220));
        }
        writeFile(m_input, m_planes);
    }

    std::vector<std::string> arguments(const std::vector<std::string>& more) const {
        std::vector<std::string> all = {m_input, m_output, "--size", "64x48"};
        all.insert(all.end(), more.begin(), more.end());
        return all;
    }

    std::string converted(const std::vector<std::string>& more) const {
        const Outcome outcome = convert(arguments(more));
        EXPECT_EQ(outcome.status, 0);
        EXPECT_EQ(outcome.err, "");
        EXPECT_EQ(outcome.out, "");
        return readFile(m_output);
    }

    void expectRefused(const std::vector<std::string>& more, const std::string& words) const {
        const Outcome outcome = convert(arguments(more));
        EXPECT_EQ(outcome.status, 1);
        EXPECT_EQ(outcome.out, "");
        EXPECT_THAT(outcome.err, MatchesRegex("vidshow-convert: [^\n]+\n"));
        EXPECT_THAT(outcome.err, HasSubstr(words));
    }

    TempFolder m_folder;
    const std::string m_input = m_folder.path("in.yuv");
    const std::string m_output = m_folder.path("out.raw");
    std::string m_planes;
};

QZ_IMAGEPROC_INIT_PARAMS paramsFor(uint32_t conversion) {
    QZ_IMAGEPROC_INIT_PARAMS params = {};
    params.u32Size = sizeof params;
    params.u32CscType = conversion;
    params.u32ResizeAlgorithm = QZ_IMAGEPROC_RESIZE_LINEAR;
    params.u32InWidth = params.u32OutWidth = kWidth;
    params.u32InHeight = params.u32OutHeight = kHeight;
    params.u32Alpha = 255;
    return params;
}

// A plane of its own with two rows of zeros behind it: one fixed enlargement reads so far.
std::string planeOf(const std::string& planes, size_t start, size_t width, size_t rows) {
    return planes.substr(start, width * rows) + std::string(2 * width, '\0');
}

uint8_t* bytesOf(std::string* plane) {
    return reinterpret_cast<uint8_t*>(plane->data());
}

// The engine, called directly; one packed plane of rows of `stride` bytes.
std::string byEngine(const QZ_IMAGEPROC_INIT_PARAMS& params, const std::string& planes,
                     uint32_t stride, uint32_t rows, const uint32_t* adjustment = nullptr,
                     uint32_t mode = 0) {
    void* handle = nullptr;
    EXPECT_EQ(QZ_IMAGEPROC_Create(&handle, 0, &params), 0);
    if (adjustment != nullptr) {
        EXPECT_EQ(QZ_IMAGEPROC_Set(handle, QZ_IMAGEPROC_PROPID_COLORADJUST, adjustment, 12), 0);
    }
    std::string result(size_t{stride} * rows, '\0');
    std::string y = planeOf(planes, 0, kWidth, kHeight);
    std::string cb = planeOf(planes, kLuma, kWidth / 2, kHeight / 2);
    std::string cr = planeOf(planes, kLuma * 5 / 4, kWidth / 2, kHeight / 2);
    uint8_t* const src[3] = {bytesOf(&y), bytesOf(&cb), bytesOf(&cr)};
    const uint32_t srcStride[3] = {kWidth, kWidth / 2, kWidth / 2};
    uint8_t* const dst[3] = {bytesOf(&result), nullptr, nullptr};
    const uint32_t dstStride[3] = {stride, 0, 0};
    const QZ_IMAGEPROC_FRAME_PARAMS frame = {sizeof frame, 0, mode};
    EXPECT_EQ(QZ_IMAGEPROC_ProcessFrame(handle, src, srcStride, dst, dstStride, &frame), 0);
    QZ_IMAGEPROC_Destroy(handle);
    return result;
}

TEST_F(Convert, EveryPackedOutputIsTheEngines) {
    const struct {
        const char* name;
        uint32_t conversion;
        uint32_t bytes;
    } outputs[] = {{"rgb565", QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB565, 2},
                   {"rgb888", QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB888, 3},
                   {"argb32", QZ_IMAGEPROC_CSC_YCBCR420_TO_ARGB32, 4},
                   {"yuy2", QZ_IMAGEPROC_CSC_YCBCR420_TO_YUY2, 2},
                   {"uyvy", QZ_IMAGEPROC_CSC_YCBCR420_TO_UYVY, 2}};
    for (const auto& output : outputs) {
        SCOPED_TRACE(output.name);
        EXPECT_TRUE(converted({"--to", output.name}) == byEngine(paramsFor(output.conversion),
                                                                 m_planes, kWidth * output.bytes,
                                                                 kHeight));
    }
}

TEST_F(Convert, TurnAndResizeAreTheEngines) {
    QZ_IMAGEPROC_INIT_PARAMS params = paramsFor(QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB565);
    params.u32RotationType = QZ_IMAGEPROC_ROTATE_90C;
    params.u32ResizeAlgorithm = QZ_IMAGEPROC_RESIZE_NEAREST;
    params.u32OutWidth = 96;
    params.u32OutHeight = 80;
    EXPECT_TRUE(converted({"--to", "rgb565", "--rotate", "90", "--resize", "96x80", "--algorithm",
                           "nearest"}) == byEngine(params, m_planes, 80 * 2, 96));
}

TEST_F(Convert, FixedEnlargementThatReadsBehindItsSourceIsTheEngines) {
    QZ_IMAGEPROC_INIT_PARAMS params = paramsFor(QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB565);
    params.u32OutWidth = 160;
    params.u32OutHeight = 96;
    EXPECT_TRUE(converted({"--to", "rgb565", "--resize", "160x96"}) ==
                byEngine(params, m_planes, 320, 96));
}

TEST_F(Convert, DeinterlacingIsTheEngines) {
    const QZ_IMAGEPROC_INIT_PARAMS params = paramsFor(QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB565);
    constexpr uint32_t kBlend = 4;
    const std::string expected = byEngine(params, m_planes, kWidth * 2, kHeight, nullptr, kBlend);
    EXPECT_TRUE(converted({"--to", "rgb565", "--deinterlace", "blend"}) == expected);
    EXPECT_FALSE(converted({"--to", "rgb565"}) == expected);
}

TEST_F(Convert, ColorKeyIsNotSeen) {
    std::string grey(kLuma, 100);
    grey += std::string(kLuma / 2, static_cast<char>(128));
    writeFile(m_input, grey);
    const std::string unseen(kLuma * 2, '\0');
    EXPECT_TRUE(converted({"--to", "rgb5551", "--color-key", "648080"}) == unseen);
    EXPECT_FALSE(converted({"--to", "rgb5551", "--color-key", "f08080"}) == unseen);
}

TEST_F(Convert, ColoursAreTheEngines) {
    QZ_IMAGEPROC_INIT_PARAMS params = paramsFor(QZ_IMAGEPROC_CSC_YCBCR420_TO_ARGB32);
    params.u32ColorMatrix = QZ_IMAGEPROC_MATRIX_BT709;
    params.u32YuvRange = 1;
    params.u32Alpha = 77;
    EXPECT_TRUE(converted({"--to", "argb32", "--matrix", "bt709", "--range", "full", "--alpha",
                           "77"}) == byEngine(params, m_planes, kWidth * 4, kHeight));
}

TEST_F(Convert, AdjustmentIsTheEngines) {
    const uint32_t adjustment[3] = {150, 90, 200};
    EXPECT_TRUE(converted({"--to", "argb32", "--brightness", "150", "--contrast", "90",
                           "--saturation", "200"}) ==
                byEngine(paramsFor(QZ_IMAGEPROC_CSC_YCBCR420_TO_ARGB32), m_planes, kWidth * 4,
                         kHeight, adjustment));
}

TEST_F(Convert, UprightRgb565IsAdjustedAtItsSizeAndResized) {
    const uint32_t adjustment[3] = {128, 90, 200};
    const std::vector<std::string> adjusted = {"--to", "rgb565",       "--contrast",
                                               "90",   "--saturation", "200"};
    QZ_IMAGEPROC_INIT_PARAMS params = paramsFor(QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB565);
    const std::string same = converted(adjusted);
    EXPECT_TRUE(same == byEngine(params, m_planes, kWidth * 2, kHeight, adjustment));
    EXPECT_FALSE(same == converted({"--to", "rgb565"}));

    std::vector<std::string> resized = adjusted;
    resized.insert(resized.end(), {"--resize", "96x80"});
    params.u32OutWidth = 96;
    params.u32OutHeight = 80;
    const std::string larger = converted(resized);
    EXPECT_TRUE(larger == byEngine(params, m_planes, 96 * 2, 80, adjustment));
    EXPECT_FALSE(larger == converted({"--to", "rgb565", "--resize", "96x80"}));
}

TEST_F(Convert, AdjustmentThatTheEngineSaysItLacksIsRefused) {
    expectRefused({"--to", "nv12", "--contrast", "90"}, "takes no brightness");
}

TEST_F(Convert, Nv12InterleavesChroma) {
    std::string expected = m_planes.substr(0, kLuma);
    for (size_t i = 0; i < kLuma / 4; ++i) {
        expected += m_planes[kLuma + i];
        expected += m_planes[kLuma * 5 / 4 + i];
    }
    EXPECT_TRUE(converted({"--to", "nv12"}) == expected);
}

TEST_F(Convert, MirrorExchangesLeftAndRight) {
    const std::string result = converted({"--to", "yuv420p", "--mirror", "h"});
    ASSERT_EQ(result.size(), m_planes.size());
    for (int y = 0; y < kHeight; ++y) {
        for (int x = 0; x < kWidth; ++x) {
            const size_t row = static_cast<size_t>(y) * kWidth;
            ASSERT_EQ(result[row + static_cast<size_t>(x)],
                      m_planes[row + static_cast<size_t>(kWidth - 1 - x)]);
        }
    }
}

TEST_F(Convert, PngHoldsThePixels) {
    const std::string png = m_folder.path("out.png");
    ASSERT_EQ(convert({m_input, png, "--size", "64x48"}).status, 0);
    const Image image = readPng(png);
    ASSERT_EQ(image.width, kWidth);
    ASSERT_EQ(image.height, kHeight);
    std::string bgr =
        byEngine(paramsFor(QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB888), m_planes, kWidth * 3, kHeight);
    for (size_t i = 0; i < bgr.size(); i += 3)
        std::swap(bgr[i], bgr[i + 2]);
    EXPECT_TRUE(std::string(image.bytes.begin(), image.bytes.end()) == bgr);
}

TEST_F(Convert, SecondPictureOfAPngGetsANumber) {
    writeFile(m_input, m_planes + m_planes);
    ASSERT_EQ(convert({m_input, m_folder.path("out.png"), "--size", "64x48"}).status, 0);
    EXPECT_THAT(readFile(m_folder.path("out-2.png")), HasSubstr("PNG"));
}

TEST_F(Convert, MissingConversionNamesThoseThatThereAre) {
    expectRefused({"--format", "nv12", "--to", "argb32"},
                  "does not convert nv12 to argb32; from nv12 it has: yuv420p, rgb565");
    writeFile(m_input, m_planes + m_planes);
    expectRefused({"--format", "yuy2", "--to", "rgb565"}, "from yuy2 it has: nothing");
}

TEST_F(Convert, WhatAConversionDoesNotDoIsRefused) {
    expectRefused({"--to", "rgb888", "--resize", "32x32"}, "cannot be resized");
    expectRefused({"--to", "nv12", "--rotate", "180"}, "cannot be turned");
    expectRefused({"--format", "nv12", "--to", "rgb565", "--deinterlace", "bob"},
                  "cannot be deinterlaced");
}

TEST_F(Convert, BadInputIsOneLine) {
    const Outcome missing = convert({m_folder.path("none.mp4"), m_output});
    EXPECT_EQ(missing.status, 1);
    EXPECT_THAT(missing.err, MatchesRegex("vidshow-convert: cannot read [^\n]+\n"));
    writeFile(m_input, m_planes.substr(1));
    expectRefused({}, "there is no whole picture in");
}

TEST_F(Convert, CutInputConvertsWhatThereIs) {
    writeFile(m_input, m_planes + m_planes.substr(1));
    const Outcome outcome = convert(arguments({}));
    EXPECT_EQ(outcome.status, 3);
    EXPECT_THAT(outcome.err, HasSubstr("ends in the middle of a picture"));
    EXPECT_TRUE(readFile(m_output) == m_planes);
}

TEST_F(Convert, WrongUseIsRefused) {
    for (const std::vector<std::string>& wrong : {std::vector<std::string>{"--resize", "10"},
                                                  {"--to", "rgb30"},
                                                  {"--rotate", "45"},
                                                  {"--rotate", "90", "--mirror", "h"},
                                                  {"--brightness", "256"},
                                                  {"--color-key", "12345"},
                                                  {"--frames", "0"},
                                                  {"--as", "nothing"},
                                                  {"--encoder-option", "crf"}}) {
        const Outcome outcome = convert(arguments(wrong));
        EXPECT_EQ(outcome.status, 2) << wrong[1];
        EXPECT_THAT(outcome.err, MatchesRegex("vidshow-convert: [^\n]+\n"));
    }
    EXPECT_EQ(convert({m_input}).status, 2);
}

TEST_F(Convert, InfoTellsTheChoiceWithoutConverting) {
    const Outcome outcome =
        convert({m_input, "--size", "64x48", "--info", "--to", "rgb565", "--resize", "128x96"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_THAT(outcome.out, HasSubstr("yuv420p to rgb565, code 3"));
    EXPECT_THAT(outcome.out, HasSubstr("resize case: 4"));
}

TEST_F(Convert, InfoNamesTheKernelAndWhatLedToIt) {
    const struct {
        std::vector<std::string> request;
        const char* kernel;
        const char* why;
    } cases[] = {{{"--to", "rgb565"},
                  "_YCbCr420ToRGB565_P3C2_0",
                  "not turned; same size; colours not adjusted"},
                 {{"--to", "argb32", "--range", "full", "--matrix", "bt709"},
                  "_YUV420ToARGB32_P3C4_1",
                  "not turned; same size; colours not adjusted"},
                 {{"--to", "rgb565", "--contrast", "90"},
                  "_QZYCbCr420ToRGB565",
                  "not turned; same size; colours adjusted"},
                 {{"--to", "rgb565", "--resize", "96x80", "--algorithm", "nearest"},
                  "_QZYCbCr420ToRGB565RszUp_Nearest",
                  "not turned; both sides larger; algorithm nearest"},
                 {{"--to", "argb32", "--rotate", "90", "--resize", "32x24"},
                  "_QZYCbCr420ToARGB32RszRot",
                  "90 degrees clockwise; both sides smaller"},
                 {{"--to", "nv12"}, "_QZYCbCr420ToNV12", "the only one of this conversion"}};
    for (const auto& wanted : cases) {
        std::vector<std::string> arguments = {m_input, "--size", "64x48", "--info"};
        arguments.insert(arguments.end(), wanted.request.begin(), wanted.request.end());
        EXPECT_THAT(convert(arguments).out, HasSubstr("\nkernel: " + std::string(wanted.kernel) +
                                                      "\nwhy: " + wanted.why + "\n"));
    }
}

TEST_F(Convert, ProgressIsShownOnATerminalAlone) {
    constexpr int kMany = 20000;
    const std::string planes(16 * 16 * 3 / 2, 'x');
    std::string many;
    for (int i = 0; i < kMany; ++i)
        many += planes;
    writeFile(m_input, many);
    const std::vector<std::string> arguments = {m_input, m_output,        "--size",
                                                "16x16", "--deinterlace", "x"};
    EXPECT_EQ(convert(arguments).err, "");
    // However fast the machine: a pipe that nobody empties holds the converter up.
    std::vector<std::string> command = {"/bin/sh", "-c",
                                        std::string(VIDSHOW_CONVERT) + " " + m_input +
                                            " - --size 16x16 | { sleep 1; cat; } > /dev/null"};
    EXPECT_THAT(runOnTerminal(command), HasSubstr(" of 20000 frames"));
}

TEST_F(Convert, JsonIsOneObject) {
    const Outcome outcome = convert(arguments({"--json", "--to", "rgb565"}));
    EXPECT_THAT(
        outcome.out,
        MatchesRegex("\\{[^{}\n]*\"code\": 3,[^{}\n]*\"kernel\": \"_YCbCr420ToRGB565_P3C2_0\","
                     " \"why\": \"[^\"\n]+\",[^{}\n]*\"frames\": 1,[^{}\n]*\\}\n"));
}

TEST_F(Convert, StandardOutputHoldsPixelsAlone) {
    const Outcome outcome = convert({m_input, "-", "--size", "64x48", "--json"});
    EXPECT_TRUE(outcome.out == m_planes);
    EXPECT_THAT(outcome.err, HasSubstr("\"code\": 0"));
}

TEST_F(Convert, ClipArrivesWholeInY4m) {
    const std::string clip = m_folder.path("clip.mkv");
    const std::string y4m = m_folder.path("out.y4m");
    makeLossless(clip, {64, 48}, 3);
    ASSERT_EQ(convert({clip, y4m}).status, 0);
    expectSameFrames(readY4m(y4m).frames, decodeAll(clip));
}

TEST_F(Convert, FramesStopsAfterThatMany) {
    writeFile(m_input, m_planes + m_planes + m_planes);
    EXPECT_TRUE(converted({"--frames", "2"}) == m_planes + m_planes);
}

TEST_F(Convert, SizesAreCutToMultiplesOfFour) {
    std::string expected;  // of 62 x 48 and chroma of 31 x 24: 60 x 48 and 30 x 24
    size_t at = 0;
    for (const auto& plane : {Size{62, 48}, Size{31, 24}, Size{31, 24}}) {
        for (int y = 0; y < plane.height; ++y, at += static_cast<size_t>(plane.width)) {
            expected += m_planes.substr(at, static_cast<size_t>(plane.width == 62 ? 60 : 30));
        }
    }
    writeFile(m_input, m_planes.substr(0, at));
    ASSERT_EQ(convert({m_input, m_output, "--size", "62x48"}).status, 0);
    EXPECT_TRUE(readFile(m_output) == expected);
}

}  // namespace
