// vidshow-compare: its figures are worked out here once more, from the definitions and the samples
// of the files that it gets; FFmpeg's own filter agrees about PSNR.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>
#include <regex>

#include "playkit/clips.h"
#include "playkit/image.h"
#include "playkit/process.h"
#include "playkit/reference.h"

namespace {

using namespace playkit;
using testing::HasSubstr;
using testing::MatchesRegex;

constexpr int kWidth = 48;
constexpr int kHeight = 32;

// The number behind a name in one of the components of the JSON object.
double figure(const std::string& json, const std::string& component, const std::string& name) {
    const std::regex pattern("\"" + component + "\": \\{[^}]*\"" + name + "\": ([-0-9.]+|null)");
    std::smatch found;
    if (!std::regex_search(json, found, pattern)) {
        ADD_FAILURE() << name << " of " << component << " is not in " << json;
        return 0;
    }
    return found[1] == "null" ? std::nan("") : std::stod(found[1]);
}

double meanSquare(const std::vector<uint8_t>& a, const std::vector<uint8_t>& b) {
    double sum = 0;
    for (size_t i = 0; i < a.size(); ++i)
        sum += (a[i] - b[i]) * (a[i] - b[i]);
    return sum / static_cast<double>(a.size());
}

// The window's weight so far from its middle in both directions, not yet divided by their sum.
double weight(int dx, int dy) {
    return std::exp(-(dx * dx + dy * dy) / (2 * 1.5 * 1.5));
}

// The index at one place, by the two-dimensional window, mean first and variance from it.
double similarityAt(const std::vector<uint8_t>& a, const std::vector<uint8_t>& b, int width, int x,
                    int y) {
    const double c1 = 2.55 * 2.55;
    const double c2 = 7.65 * 7.65;
    const auto each = [=](auto visit) {
        for (int dy = -5; dy <= 5; ++dy) {
            for (int dx = -5; dx <= 5; ++dx)
                visit(static_cast<size_t>((y + dy) * width + x + dx), weight(dx, dy));
        }
    };
    double total = 0;
    double meanA = 0;
    double meanB = 0;
    each([&](size_t i, double w) {
        total += w;
        meanA += w * a[i];
        meanB += w * b[i];
    });
    meanA /= total;
    meanB /= total;
    double varianceA = 0;
    double varianceB = 0;
    double covariance = 0;
    each([&](size_t i, double w) {
        varianceA += w / total * (a[i] - meanA) * (a[i] - meanA);
        varianceB += w / total * (b[i] - meanB) * (b[i] - meanB);
        covariance += w / total * (a[i] - meanA) * (b[i] - meanB);
    });
    return (2 * meanA * meanB + c1) * (2 * covariance + c2) /
           ((meanA * meanA + meanB * meanB + c1) * (varianceA + varianceB + c2));
}

double similarity(const std::vector<uint8_t>& a, const std::vector<uint8_t>& b, int width,
                  int height) {
    double sum = 0;
    for (int y = 5; y < height - 5; ++y) {
        for (int x = 5; x < width - 5; ++x)
            sum += similarityAt(a, b, width, x, y);
    }
    return sum / ((width - 10) * (height - 10));
}

class Compare : public testing::Test {
  protected:
    // A lossless clip and one that an encoder has spoilt.
    void makeBoth(int frames) const {
        makeLossless(m_a, {kWidth, kHeight}, frames);
        makeClip(m_b, {kWidth, kHeight}, frames,
                 {"-c:v", "mpeg4", "-q:v", "12", "-pix_fmt", "yuv420p"});
    }

    // A Y4M file of one frame of 4:2:0.
    std::string picture(const std::string& name, const std::string& planes, int width,
                        int height) const {
        const std::string path = m_folder.path(name);
        writeFile(path, "YUV4MPEG2 W" + std::to_string(width) + " H" + std::to_string(height) +
                            " F25:1 Ip A1:1 C420\nFRAME\n" + planes);
        return path;
    }

    std::string json(const std::string& a, const std::string& b) const {
        const Outcome outcome = compare({a, b, "--json"});
        EXPECT_EQ(outcome.status, 0) << outcome.err;
        EXPECT_EQ(outcome.err, "");
        EXPECT_THAT(outcome.out, MatchesRegex("\\{[^\n]*\\}\n"));
        return outcome.out;
    }

    void expectRefused(const std::vector<std::string>& arguments, const std::string& words) const {
        const Outcome outcome = compare(arguments);
        EXPECT_EQ(outcome.status, 1);
        EXPECT_EQ(outcome.out, "");
        EXPECT_THAT(outcome.err, MatchesRegex("vidshow-compare: [^\n]+\n"));
        EXPECT_THAT(outcome.err, HasSubstr(words));
    }

    TempFolder m_folder;
    const std::string m_a = m_folder.path("a.mkv");
    const std::string m_b = m_folder.path("b.avi");
};

TEST_F(Compare, PsnrIsThatOfItsDefinition) {
    makeBoth(3);
    const std::vector<RawFrame> a = decodeAll(m_a);
    const std::vector<RawFrame> b = decodeAll(m_b);
    const std::string result = json(m_a, m_b);
    const char* const names[] = {"Y", "Cb", "Cr"};
    double all = 0;
    for (size_t i = 0; i < 3; ++i) {
        double mean = 0;
        for (size_t n = 0; n < 3; ++n)
            mean += meanSquare(a.at(n).planes[i], b.at(n).planes[i]) / 3;
        EXPECT_GT(mean, 0);
        EXPECT_NEAR(figure(result, names[i], "mse"), mean, 1e-6);
        EXPECT_NEAR(figure(result, names[i], "psnr"), 20 * std::log10(255 / std::sqrt(mean)), 1e-5);
        all += mean * (i == 0 ? 4 : 1) / 6;  // luma has four of six samples
    }
    EXPECT_NEAR(figure(result, "all", "psnr"), 10 * std::log10(255 * 255 / all), 1e-5);
}

TEST_F(Compare, SsimIsThatOfItsDefinition) {
    makeBoth(2);
    const std::vector<RawFrame> a = decodeAll(m_a);
    const std::vector<RawFrame> b = decodeAll(m_b);
    const std::string result = json(m_a, m_b);
    const char* const names[] = {"Y", "Cb", "Cr"};
    for (size_t i = 0; i < 3; ++i) {
        const int part = i == 0 ? 1 : 2;
        double sum = 0;
        for (size_t n = 0; n < 2; ++n)
            sum += similarity(a.at(n).planes[i], b.at(n).planes[i], kWidth / part, kHeight / part);
        EXPECT_LT(sum / 2, 0.9999);
        EXPECT_NEAR(figure(result, names[i], "ssim"), sum / 2, 1e-6);
    }
}

TEST_F(Compare, FfmpegsFilterAgreesAboutPsnr) {
    makeBoth(3);
    const Outcome filter =
        run({"ffmpeg", "-hide_banner", "-i", m_b, "-i", m_a, "-lavfi", "psnr", "-f", "null", "-"});
    std::smatch found;
    const std::regex pattern("PSNR y:([0-9.]+) u:([0-9.]+) v:([0-9.]+) average:([0-9.]+)");
    ASSERT_TRUE(std::regex_search(filter.err, found, pattern)) << filter.err;
    const std::string result = json(m_a, m_b);
    const char* const names[] = {"Y", "Cb", "Cr", "all"};
    for (size_t i = 0; i < 4; ++i)
        EXPECT_NEAR(figure(result, names[i], "psnr"), std::stod(found[i + 1]), 1e-4) << names[i];
}

TEST_F(Compare, SameSamplesAreInfinitelyGood) {
    makeLossless(m_a, {kWidth, kHeight}, 2);
    const std::string result = json(m_a, m_a);
    EXPECT_EQ(figure(result, "Y", "mse"), 0);
    EXPECT_TRUE(std::isnan(figure(result, "Y", "psnr")));
    EXPECT_EQ(figure(result, "Y", "ssim"), 1);
    EXPECT_THAT(compare({m_a, m_a}).out, HasSubstr(" inf "));
}

// Constant pictures have no variance: what is left of the index is (2ab + c1) / (a^2 + b^2 + c1).
TEST_F(Compare, FlatPicturesHaveTheIndexOfTheirMeans) {
    const std::string chroma(16 * 16 / 2, static_cast<char>(128));
    const std::string a = picture("a.y4m", std::string(16 * 16, 100) + chroma, 16, 16);
    const std::string b = picture("b.y4m", std::string(16 * 16, 110) + chroma, 16, 16);
    const std::string result = json(a, b);
    EXPECT_NEAR(figure(result, "Y", "mse"), 100, 1e-6);
    EXPECT_NEAR(figure(result, "Y", "psnr"), 28.130804, 1e-6);  // 10 log10(650.25)
    EXPECT_NEAR(figure(result, "Y", "ssim"), 22006.5025 / 22106.5025, 1e-6);
    EXPECT_TRUE(std::isnan(figure(result, "Cb", "ssim"))) << "8 x 8 holds no window";
}

TEST_F(Compare, LayoutInMemoryDoesNotMatter) {
    const std::string planar = m_folder.path("planar.mkv");
    const std::string pairs = m_folder.path("pairs.nut");
    makeLossless(planar, {kWidth, kHeight}, 2);
    ffmpeg({"-i", planar, "-c:v", "rawvideo", "-pix_fmt", "nv12", pairs});
    EXPECT_EQ(figure(json(planar, pairs), "all", "mse"), 0);
}

TEST_F(Compare, PicturesOfRgbHaveTheirThreeChannels) {
    const std::string a = m_folder.path("a.png");
    const std::string b = m_folder.path("b.png");
    makeClip(a, {kWidth, kHeight}, 1, {"-pix_fmt", "rgb24"});
    ffmpeg({"-i", a, "-vf", "lutrgb=g='clip(val+3,0,255)'", "-pix_fmt", "rgb24", b});
    const std::string result = json(a, b);
    EXPECT_EQ(figure(result, "R", "mse"), 0);
    EXPECT_GT(figure(result, "G", "mse"), 0);
    EXPECT_EQ(figure(result, "B", "mse"), 0);
}

TEST_F(Compare, DeeperSamplesHaveTheirOwnPeak) {
    const std::string a = m_folder.path("a10.mkv");
    const std::string b = m_folder.path("b10.mkv");
    makeLossless(a, {kWidth, kHeight}, 1, "yuv420p10le");
    ffmpeg({"-i", a, "-vf", "lutyuv=y='clip(val+4,0,1023)'", "-c:v", "ffv1", "-pix_fmt",
            "yuv420p10le", b});
    const std::string result = json(a, b);
    EXPECT_THAT(result, HasSubstr("\"peak\": 1023,"));
    EXPECT_NEAR(figure(result, "Y", "psnr"),
                10 * std::log10(1023.0 * 1023 / figure(result, "Y", "mse")), 1e-4);
    EXPECT_NEAR(figure(result, "Y", "mse"), 16, 1e-6);
}

// One sample differs in each plane: by 5 in luma, by 20 in Cb, by -40 in Cr.
TEST_F(Compare, DifferencePictureShowsWhere) {
    std::string planes = std::string(32 * 16, 100) + std::string(32 * 16 / 2, 120);
    const std::string a = picture("a.y4m", planes, 32, 16);
    planes[32 * 3 + 7] = 105;
    planes[32 * 16 + 16 * 2 + 5] = static_cast<char>(140);
    planes[32 * 16 * 5 / 4 + 16 * 6 + 1] = 80;
    const std::string b = picture("b.y4m", planes, 32, 16);
    const std::string png = m_folder.path("difference.png");
    ASSERT_EQ(compare({a, b, "--difference", png, "--gain", "10"}).status, 0);
    const Image image = readPng(png);
    ASSERT_EQ(image.width, 32);
    ASSERT_EQ(image.height, 16);
    for (int y = 0; y < 16; ++y) {
        for (int x = 0; x < 32; ++x) {
            const Rgb seen = image.at(x, y);
            EXPECT_EQ(seen.green, x == 7 && y == 3 ? 50 : 0);
            EXPECT_EQ(seen.blue, x / 2 == 5 && y / 2 == 2 ? 200 : 0);
            EXPECT_EQ(seen.red, x / 2 == 1 && y / 2 == 6 ? 255 : 0);  // 400 is too much to show
        }
    }
}

TEST_F(Compare, DifferencePictureIsOfTheWorstFrame) {
    const auto frame = [](int level) {
        return "FRAME\n" + std::string(16 * 16, static_cast<char>(level)) + std::string(128, 'x');
    };
    const std::string header = "YUV4MPEG2 W16 H16 F25:1 Ip A1:1 C420\n";
    const std::string a = m_folder.path("a.y4m");
    const std::string b = m_folder.path("b.y4m");
    writeFile(a, header + frame(50) + frame(50) + frame(50));
    writeFile(b, header + frame(51) + frame(57) + frame(52));
    const std::string png = m_folder.path("difference.png");
    ASSERT_EQ(compare({a, b, "--difference", png, "--gain", "1"}).status, 0);
    EXPECT_EQ(readPng(png).at(0, 0).green, 7);
}

TEST_F(Compare, OffsetAlignsTheFrames) {
    const std::string counting = m_folder.path("counting.mkv");
    makeCounting(counting, {32, 32}, 6, 25);
    const std::string late = m_folder.path("late.mkv");
    ffmpeg({"-i", counting, "-vf", "trim=start_frame=2,setpts=PTS-STARTPTS", "-c:v", "ffv1", late});
    const Outcome forward = compare({late, counting, "--offset", "2", "--json"});
    EXPECT_EQ(forward.status, 0) << forward.err;
    EXPECT_EQ(figure(forward.out, "all", "mse"), 0);
    const Outcome back = compare({counting, late, "--offset", "-2", "--json"});
    EXPECT_EQ(back.status, 0) << back.err;
    EXPECT_EQ(figure(back.out, "all", "mse"), 0);
    expectRefused({late, counting, "--offset", "7"}, "ends before the offset");
}

TEST_F(Compare, ShorterClipIsComparedAsFarAsItGoes) {
    const std::string three = m_folder.path("three.mkv");
    const std::string five = m_folder.path("five.mkv");
    makeLossless(three, {32, 32}, 3);
    makeLossless(five, {32, 32}, 5);
    const Outcome outcome = compare({three, five, "--json"});
    EXPECT_EQ(outcome.status, 3);
    EXPECT_THAT(outcome.out, HasSubstr("\"frames\": 3,"));
    EXPECT_THAT(outcome.err, HasSubstr("three.mkv ends after 3 compared frames"));
    EXPECT_EQ(compare({three, five, "--frames", "3"}).status, 0);
}

TEST_F(Compare, WhatDoesNotCompareIsToldInOneLine) {
    const std::string other = m_folder.path("other.mkv");
    makeLossless(m_a, {kWidth, kHeight}, 1);
    makeLossless(other, {kWidth, kHeight + 2}, 1);
    expectRefused({m_a, other}, "48x32 yuv420p and 48x34 yuv420p do not compare");
    makeLossless(other, {kWidth, kHeight}, 1, "yuv444p");
    expectRefused({m_a, other}, "48x32 yuv420p and 48x32 yuv444p do not compare");
    makeLossless(other, {kWidth, kHeight}, 1, "yuv420p10le");
    expectRefused({m_a, other}, "yuv420p10le do not compare");
    expectRefused({m_a, m_folder.path("none.mkv")}, "cannot read");
    expectRefused({m_a, m_a, "--difference", m_folder.path("no/such/folder.png")}, "folder.png");
}

TEST_F(Compare, WrongUseIsRefused) {
    for (const std::vector<std::string>& wrong : {std::vector<std::string>{},
                                                  {"one"},
                                                  {"a", "b", "c"},
                                                  {"a", "b", "--gain", "0"},
                                                  {"a", "b", "--offset", "x"},
                                                  {"a", "b", "--frames", "0"}}) {
        EXPECT_EQ(compare(wrong).status, 2);
    }
}

}  // namespace
