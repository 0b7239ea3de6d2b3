// Lines found in luma tables give every entry back, and all the engine's own tables have one.

#include "kernels/luma_line.h"

#include <gtest/gtest.h>

#include <array>

#include "testkit/random.h"
#include "vidshow/imageproc.h"

namespace {

using Table = std::array<uint16_t, 256>;

/// What the line says of a sample, in plain integers.
int64_t Entry(const vidshow::LumaLine& line, int i) {
    const int64_t sum = int64_t{line.slope} * i + line.offset;
    EXPECT_GE(sum, INT32_MIN);
    EXPECT_LE(sum, INT32_MAX);
    const int64_t level = sum >= 0 ? sum / 16384 : -((-sum + 16383) / 16384);
    return level < 0 ? 0 : level > 65535 ? 65535 : level;
}

testing::AssertionResult HasLine(const Table& table) {
    vidshow::LumaLine line{};
    if (!vidshow::FindLumaLine(table.data(), line)) return testing::AssertionFailure() << "none";
    for (int i = 0; i < 256; ++i) {
        if (Entry(line, i) != table[static_cast<size_t>(i)]) {
            return testing::AssertionFailure() << "entry " << i;
        }
    }
    return testing::AssertionSuccess();
}

// Black pictures are the exception: no line is looked for where all entries are clamped.
bool IsFlat(const Table& table) {
    return table.front() == table.back() && (table[0] == 0 || table[0] == 65535);
}

TEST(LumaLine, TheEnginesTablesAreLines) {
    Table table;
    std::array<uint32_t, 256> cb, cr;
    int tried = 0;
    for (int matrix : {0, 1, 4, 5, 8, 9, 12, 13}) {
        const auto build = matrix % 4 == 0 ? set_transtable : set_transtable_fullrange;
        for (int brightness = 0; brightness < 256; brightness += 17) {
            for (int contrast = 0; contrast < 256; contrast += 5) {
                build(csc_coef[matrix], table.data(), cb.data(), cr.data(), brightness, contrast,
                      128);
                if (IsFlat(table)) continue;
                ++tried;
                ASSERT_TRUE(HasLine(table))
                    << "matrix " << matrix << ", " << brightness << ", " << contrast;
            }
        }
        build(csc_coef[matrix], table.data(), cb.data(), cr.data(), 128, 128, 128);
        EXPECT_TRUE(HasLine(table)) << "neutral, matrix " << matrix;
    }
    EXPECT_GT(tried, 1000);
}

TEST(LumaLine, BentTablesHaveNone) {
    Table table;
    std::array<uint32_t, 256> cb, cr;
    for (size_t bent : {0u, 40u, 128u, 200u, 255u}) {
        set_transtable(csc_coef[0], table.data(), cb.data(), cr.data(), 128, 128, 128);
        table[bent] = static_cast<uint16_t>(table[bent] + 2);
        vidshow::LumaLine line{};
        EXPECT_FALSE(vidshow::FindLumaLine(table.data(), line)) << bent;
    }
}

TEST(LumaLine, RandomTablesHaveNone) {
    auto random = testkit::Random(5);
    for (int round = 0; round < 100; ++round) {
        Table table;
        for (uint16_t& entry : table)
            entry = static_cast<uint16_t>(random());
        vidshow::LumaLine line{};
        EXPECT_FALSE(vidshow::FindLumaLine(table.data(), line));
    }
}

TEST(LumaLine, StepsOfAnySizeAndSign) {
    for (int slope : {-250, -3, 0, 1, 2, 100, 256, 257}) {
        Table table;
        for (int i = 0; i < 256; ++i) {
            const int level = 1000 + slope * i + (slope < 0 ? 64000 : 0);
            table[static_cast<size_t>(i)] = static_cast<uint16_t>(level < 0       ? 0
                                                                  : level > 65535 ? 65535
                                                                                  : level);
        }
        EXPECT_TRUE(HasLine(table)) << slope;
    }
}

}  // namespace
