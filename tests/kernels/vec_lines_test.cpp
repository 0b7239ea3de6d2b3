// Two-row converters to spread pixels, and the vector line operations.

#include <gtest/gtest.h>

#include "kernels/kernel_fixture.h"
#include "kernels/vec_backend_env.h"
#include "kernels/vec_model.h"

namespace {

using namespace kernel_test;

using Convert = int32_t(const uint8_t*, const uint8_t*, const uint8_t*, const uint8_t*, uint32_t*,
                        uint32_t*, int32_t);

std::string ConverterName(bool full, bool bgr, int n) {
    return std::string("_convert_") + (full ? "yuv2" : "ycbcr2") + (bgr ? "bgr_" : "rgb_") +
           std::to_string(n) + "_neon";
}

uint32_t* Words(GuardedBuffer& buffer) {
    return static_cast<uint32_t*>(static_cast<void*>(buffer.data()));
}

TEST(VecConvert, EveryEntryAndWidth) {
    std::mt19937 random = testkit::Random(3620);
    for (int entry = 0; entry < 16; ++entry) {
        const bool full = entry & 1, bgr = entry & 2;
        const int n = entry / 4;
        const std::string name = ConverterName(full, bgr, n);
        Convert* const convert = vec_model::Entry<Convert>(name);
        ASSERT_NE(convert, nullptr) << name;
        for (int32_t w = 1; w <= 70; ++w) {
            Picture420 source(random, w, 2, {0, 0, 0}, kPlacements[w % 2]);
            GuardedBuffer lines[2] = {GuardedBuffer(static_cast<size_t>(w) * 4, kPlacements[w % 2]),
                                      GuardedBuffer(static_cast<size_t>(w) * 4)};
            EXPECT_EQ(convert(&source.y.at(0, 0), &source.y.at(0, 1), source.cb.data(),
                              source.cr.data(), Words(lines[0]), Words(lines[1]), w),
                      0);
            for (int32_t i = 0; i < 2 * w; ++i) {
                const int32_t x = i % w, y = i / w;
                const uint32_t expected = vec_model::PackSpread(
                    vec_model::ToLevels(vec_model::kRgbFactors[full][n], source.y.at(x, y),
                                        source.cb.at(x / 2, 0), source.cr.at(x / 2, 0)),
                    bgr);
                ASSERT_EQ(Words(lines[y])[x], expected) << name << " width " << w << " at " << i;
                ASSERT_EQ(expected & ~0x07E0FC1Fu, 0u);
            }
        }
    }
}

TEST(VecConvert, WidthBelow1DoesNothing) {
    uint8_t byte = 1;
    uint32_t word = 0x5A5A5A5A;
    for (const int32_t w : {0, -1}) {
        EXPECT_EQ(_convert_ycbcr2rgb_0_neon(&byte, &byte, &byte, &byte, &word, &word, w), 0);
    }
    EXPECT_EQ(word, 0x5A5A5A5Au);
}

constexpr uint32_t kMask = 0x07E0FC1F;

/// A line of `entries` spread pixels, full ones among them; `noise` fills the bits between too.
void FillLine(std::mt19937& random, GuardedBuffer& line, bool noise) {
    for (size_t i = 0; i < line.size() / 4; ++i) {
        const uint32_t any = i % 5 == 0 ? 0xFFFFFFFFu : static_cast<uint32_t>(random());
        Words(line)[i] = noise ? any : any & kMask;
    }
}

size_t Made(int32_t count) {
    return count < 8 ? 4 : static_cast<size_t>(count / 4 * 4);
}

TEST(VecBlend, EveryWeightCountAndFill) {
    std::mt19937 random = testkit::Random(3621);
    for (int32_t count = 0; count <= 41; ++count) {
        const size_t made = Made(count);
        for (int32_t w = 0; w <= 32; ++w) {
            GuardedBuffer upper(made * 4), lower(made * 4), out(made * 4);
            FillLine(random, upper, w % 2 != 0);
            FillLine(random, lower, w % 2 != 0);
            EXPECT_EQ(_vlerp_neon(Words(upper), Words(lower), Words(out), w, count), 0);
            for (size_t i = 0; i < made; ++i) {
                const uint32_t weight = static_cast<uint32_t>(w);
                ASSERT_EQ(Words(out)[i],
                          (Words(lower)[i] * weight + Words(upper)[i] * (32 - weight)) >> 5 & kMask)
                    << "count " << count << " weight " << w << " entry " << i;
            }
        }
    }
}

TEST(VecBlend, AverageTruncatesAndMasks) {
    std::mt19937 random = testkit::Random(3622);
    for (int32_t count = 0; count <= 41; ++count) {
        const size_t made = Made(count);
        GuardedBuffer upper(made * 4), lower(made * 4), out(made * 4);
        FillLine(random, upper, count % 2 != 0);
        FillLine(random, lower, count % 2 != 0);
        EXPECT_EQ(_vlerp12_neon(Words(upper), Words(lower), Words(out), count), 0);
        for (size_t i = 0; i < made; ++i) {
            ASSERT_EQ(Words(out)[i], (Words(upper)[i] + Words(lower)[i]) >> 1 & kMask) << i;
        }
    }
}

TEST(VecBlend, CountIsRoundedDownButFourAreAlwaysMade) {
    const uint32_t upper[12] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12};
    for (const int32_t count : {-5, 0, 1, 3, 4, 7}) {
        uint32_t blended[12] = {}, averaged[12] = {};
        _vlerp_neon(upper, upper, blended, 7, count);
        _vlerp12_neon(upper, upper, averaged, count);
        for (uint32_t i = 0; i < 12; ++i) {
            EXPECT_EQ(blended[i], i < 4 ? i + 1 : 0) << count;
            EXPECT_EQ(averaged[i], i < 4 ? i + 1 : 0) << count;
        }
    }
}

TEST(VecBlend, WeightsAtTheEndsReproduceALine) {
    uint32_t upper[8], lower[8], out[8];
    for (uint32_t i = 0; i < 8; ++i) {
        upper[i] = (0x12345678u * (i + 1)) & kMask;
        lower[i] = (0x9ABCDEF1u * (i + 1)) & kMask;
    }
    _vlerp_neon(upper, lower, out, 0, 8);
    EXPECT_EQ(std::memcmp(out, upper, sizeof out), 0);
    _vlerp_neon(upper, lower, out, 32, 8);
    EXPECT_EQ(std::memcmp(out, lower, sizeof out), 0);
}

TEST(VecBlend, NeverCarriesBetweenChannels) {
    const uint32_t red[4] = {0x07E00000, 0x07E00000, 0x07E00000, 0x07E00000};
    const uint32_t blue[4] = {0x0000001F, 0x0000001F, 0x0000001F, 0x0000001F};
    for (int32_t w = 0; w <= 32; ++w) {
        uint32_t out[4];
        _vlerp_neon(red, blue, out, w, 4);
        for (const uint32_t pixel : out)
            EXPECT_EQ(pixel & 0x0000FC00u, 0u) << w;
    }
}

TEST(VecBlend, OutputMayBeASource) {
    uint32_t line[8] = {4, 8, 12, 16, 20, 24, 28, 30};
    const uint32_t zero[8] = {};
    _vlerp12_neon(line, zero, line, 8);
    for (uint32_t i = 0; i < 7; ++i)
        EXPECT_EQ(line[i], (i + 1) * 2);
    _vlerp_neon(zero, line, line, 16, 8);
    for (uint32_t i = 0; i < 7; ++i)
        EXPECT_EQ(line[i], i + 1);
}

TEST(VecHlerp, BilinearByTheTopFiveFractionBits) {
    std::mt19937 random = testkit::Random(3623);
    for (int trial = 0; trial < 300; ++trial) {
        const int32_t from = 2 + static_cast<int32_t>(random() % 90);
        const int32_t to = 2 + static_cast<int32_t>(random() % 140);
        const int32_t step = ((from - 1) << 16) / (to - 1);
        const size_t width = static_cast<size_t>(to / 2 * 2);
        GuardedBuffer line(static_cast<size_t>(from + 1) * 4), row(width * 2);
        FillLine(random, line, false);
        EXPECT_EQ(_hlerp_neon(Words(line), static_cast<uint16_t*>(static_cast<void*>(row.data())),
                              step, to),
                  0);
        for (size_t i = 0; i < width; ++i) {
            const uint32_t p = static_cast<uint32_t>(step) * static_cast<uint32_t>(i);
            const uint32_t w = p >> 11 & 31, a = Words(line)[p >> 16],
                           b = Words(line)[(p >> 16) + 1];
            const auto channel = [&](int shift, uint32_t mask) {
                return ((a >> shift & mask) * (32 - w) + (b >> shift & mask) * w) >> 5;
            };
            const uint32_t expected =
                channel(21, 63) >> 1 << 11 | channel(10, 63) << 5 | channel(0, 31);
            uint16_t pixel = 0;
            std::memcpy(&pixel, row.data() + 2 * i, 2);
            ASSERT_EQ(pixel, expected) << from << " to " << to << " at " << i;
        }
    }
}

TEST(VecHlerp, OddWidthIsRoundedDown) {
    const uint32_t line[4] = {0x1F, 0x1F, 0x1F, 0x1F};
    uint16_t row[4] = {7, 7, 7, 7};
    EXPECT_EQ(_hlerp_neon(line, row, 0x8000, 3), 0);
    EXPECT_EQ(row[1], 0x1F);
    EXPECT_EQ(row[2], 7);
    EXPECT_EQ(_hlerp_neon(line, row + 2, 0x8000, 1), 0);
    EXPECT_EQ(row[2], 7);
}

}  // namespace
