#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>

#include "testkit/capture.h"
#include "vidshow/imageproc.h"

namespace {

uint32_t Translate5551(uint32_t key) {
    testkit::StdoutCapture capture;
    CalcColorKey(&key);
    return key;
}

TEST(CalcColorKey, BlackAndWhite) {
    EXPECT_EQ(Translate5551(0x00108080), 0x0001u);
    EXPECT_EQ(Translate5551(0x00EB8080), 0xFFFFu);
}

TEST(CalcColorKey, SaysTheResultAndReturnsWhatPrintfReturned) {
    testkit::StdoutCapture capture;
    uint32_t key = 0x00EB8080;
    const int32_t result = CalcColorKey(&key);
    const std::string text = capture.text();
    EXPECT_EQ(text, "QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551 u32ColorKey = 0xffff! \n");
    EXPECT_EQ(result, static_cast<int32_t>(text.size()));
}

TEST(CalcColorKey, FollowsItsFormulaForEveryLevelAndChroma) {
    testkit::StdoutCapture capture;
    const auto channel = [](int sum) {
        int level = sum < 0 ? -(-sum / 64) : sum / 64;
        level = std::min(level, 255);
        return static_cast<uint32_t>(std::max(level, 0) >> 3);
    };
    for (int y = 0; y < 256; y += 3) {
        for (int u = 0; u < 256; u += 5) {
            for (int v = 0; v < 256; v += 5) {
                const uint32_t red = channel(74 * y + 102 * v - 13984);
                const uint32_t green = channel(74 * y + 25 * u - 52 * v + 2272);
                const uint32_t blue = channel(74 * y + 129 * u - 17440);
                uint32_t key = static_cast<uint32_t>(y << 16 | u << 8 | v);
                CalcColorKey(&key);
                ASSERT_EQ(key, red << 11 | green << 6 | blue << 1 | 1) << y << ' ' << u << ' ' << v;
            }
        }
    }
}

// Cb adds to green: a key that is rich in Cb comes out greener, not less green.
TEST(CalcColorKey, CbAddsToGreenAsClientsExpect) {
    const uint32_t low = Translate5551(0x00500080) >> 6 & 31;
    const uint32_t high = Translate5551(0x0050FF80) >> 6 & 31;
    EXPECT_EQ(low, 3u);    // (5920 - 6656 + 2272) / 64 = 24
    EXPECT_EQ(high, 15u);  // (5920 + 6375 - 6656 + 2272) / 64 = 123
}

TEST(CalcColorKey, TheTopByteDoesNotMatter) {
    EXPECT_EQ(Translate5551(0xFFEB8080), 0xFFFFu);
}

uint32_t Translate565(uint32_t key) {
    uint32_t out = 0;
    EXPECT_EQ(QZ_TranslateColorKey(3, key, &out), 0);
    return out;
}

TEST(TranslateColorKey, BlackIs0) {
    EXPECT_EQ(Translate565(0x00108080), 0u);
}

TEST(TranslateColorKey, ANegativeRedSumSaturatesUpward) {
    EXPECT_EQ(Translate565(0x00108010) >> 11, 31u);
}

TEST(TranslateColorKey, NullAndOtherFormats) {
    EXPECT_EQ(QZ_TranslateColorKey(3, 0, nullptr), E_INVALIDARG);
    EXPECT_EQ(QZ_TranslateColorKey(5, 0, nullptr), E_INVALIDARG);
    for (uint32_t format = 0; format < 300; ++format) {
        if (format == 3) continue;
        uint32_t out = 0xDEADBEEF;
        EXPECT_EQ(QZ_TranslateColorKey(format, 0x00108080, &out), E_FAIL) << format;
        EXPECT_EQ(out, 0xDEADBEEFu);
    }
}

// The single-precision constants are exact multiples of 2^-25, so integers recompute the key.
struct Reference565 {
    static int64_t Rounded(int64_t n, int64_t k, int64_t low, int64_t high) {
        const int64_t one = int64_t{1} << 25;  // k is in units of 2^-25
        return std::clamp((2 * n * k + one) / (2 * one), low, high);
    }
    static int64_t Term(int64_t sample, int64_t k) {
        return Rounded((sample - 128) * 64, k, -32768, 32767);
    }
    static uint32_t Limit(int64_t value, uint32_t maximum) {
        return value < 0 || value > maximum ? maximum : static_cast<uint32_t>(value);
    }
    static int64_t FloorShift(int64_t value, int bits) {
        const int64_t divisor = int64_t{1} << bits;
        return value >= 0 ? value / divisor : -((-value + divisor - 1) / divisor);
    }
};

TEST(TranslateColorKey, FollowsItsFormulaForEveryLevelAndChroma) {
    const auto units = [](float k) { return static_cast<int64_t>(k * 33554432.0f); };  // 2^25
    using R = Reference565;
    for (int y = 0; y < 256; y += 3) {
        for (int u = 0; u < 256; u += 5) {
            for (int v = 0; v < 256; v += 5) {
                const int64_t luma = R::Rounded((y - 16) * 128, units(1.1644f), 0, 65535);
                const int64_t red = R::Term(v, units(1.596f));
                const int64_t green = R::Term(v, units(-0.813f)) + R::Term(u, units(-0.3918f));
                const int64_t blue = R::Term(u, units(2.0172f));
                const uint32_t expected = R::Limit(R::FloorShift(luma + red, 10), 31) << 11 |
                                          R::Limit(R::FloorShift(luma + 2 * green, 9), 63) << 5 |
                                          R::Limit(R::FloorShift(luma + blue, 10), 31);
                const uint32_t key = static_cast<uint32_t>(y << 16 | u << 8 | v);
                ASSERT_EQ(Translate565(key), expected) << y << ' ' << u << ' ' << v;
            }
        }
    }
}

}  // namespace
