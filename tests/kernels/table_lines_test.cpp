// Lines found in translation tables give every entry back, and all the engine's own tables have
// them: were one to lose its lines, it would fall back to look-ups without a word.

#include "kernels/table_lines.h"

#include <gtest/gtest.h>

#include <array>

#include "testkit/random.h"
#include "vidshow/imageproc.h"

namespace {

using vidshow::Cut;
using vidshow::Line;
using vidshow::TableLines;

using Entries = std::array<int32_t, 256>;

constexpr Cut kLevels = {0, 65535, 14}, kHalf = {-32768, 32767, 15};
constexpr Cut kUncut = {INT32_MIN, INT32_MAX, 15};

/// What the line says of a sample, in plain integers: the quotient is truncated towards zero. A
/// sum of more than 32 bits says nothing.
int64_t Entry(const Line& line, int i, Cut cut) {
    const int64_t sum = int64_t{line.slope} * i + line.offset;
    if (sum < INT32_MIN || sum > INT32_MAX) return INT64_MAX;
    const int64_t entry = sum / (1 << cut.shift);
    return entry < cut.low ? cut.low : entry > cut.high ? cut.high : entry;
}

testing::AssertionResult Gives(const Line& line, const Entries& entries, Cut cut) {
    for (int i = 0; i < 256; ++i) {
        if (Entry(line, i, cut) != entries[static_cast<size_t>(i)]) {
            return testing::AssertionFailure() << "entry " << i;
        }
    }
    return testing::AssertionSuccess();
}

testing::AssertionResult HasLine(const Entries& entries, Cut cut) {
    Line line{};
    if (!vidshow::FindLine(entries.data(), cut, line)) return testing::AssertionFailure() << "none";
    return Gives(line, entries, cut);
}

/// The three tables of a processor.
struct Tables {
    uint16_t luma[256];
    uint32_t cb[256], cr[256];

    Tables(int matrix, int brightness, int contrast, int saturation) {
        const auto build = matrix % 4 == 0 ? set_transtable : set_transtable_fullrange;
        build(csc_coef[matrix], luma, cb, cr, brightness, contrast, saturation);
    }

    testing::AssertionResult AreLines() const {
        TableLines lines{};
        if (!vidshow::FindTableLines(luma, cb, cr, lines)) {
            return testing::AssertionFailure() << "none";
        }
        Entries levels, high[2], low[2];
        for (size_t i = 0; i < 256; ++i) {
            levels[i] = luma[i];
            high[0][i] = static_cast<int16_t>(cb[i] >> 16);
            high[1][i] = static_cast<int16_t>(cr[i] >> 16);
            low[0][i] = static_cast<int16_t>(cb[i] & 0xFFFF);
            low[1][i] = static_cast<int16_t>(cr[i] & 0xFFFF);
        }
        const testing::AssertionResult results[] = {
            Gives(lines.luma, levels, kLevels), Gives(lines.blue, high[0], kHalf),
            Gives(lines.red, high[1], kHalf), Gives(lines.cbToGreen, low[0], kUncut),
            Gives(lines.crToGreen, low[1], kUncut)};
        for (const auto& result : results) {
            if (!result) return result;
        }
        return testing::AssertionSuccess();
    }
    bool HaveLines() const {
        TableLines lines{};
        return vidshow::FindTableLines(luma, cb, cr, lines);
    }
};

constexpr int kMatrices[] = {0, 1, 4, 5, 8, 9, 12, 13};

TEST(TableLines, TheEnginesTablesAreLines) {
    for (int matrix : kMatrices)
        EXPECT_TRUE(Tables(matrix, 128, 128, 128).AreLines()) << "matrix " << matrix;
}

TEST(TableLines, AdjustedTablesAreLines) {
    for (int matrix : kMatrices) {
        for (int setting = 0; setting < 256; setting += 15) {
            EXPECT_TRUE(Tables(matrix, setting, 128, 128).AreLines())
                << "matrix " << matrix << ", brightness " << setting;
            EXPECT_TRUE(Tables(matrix, 128, setting, 128).AreLines())
                << "matrix " << matrix << ", contrast " << setting;
            EXPECT_TRUE(Tables(matrix, 128, 128, setting).AreLines())
                << "matrix " << matrix << ", saturation " << setting;
            EXPECT_TRUE(Tables(matrix, 255 - setting, setting, setting * 7 % 256).AreLines())
                << "matrix " << matrix << ", all " << setting;
        }
    }
}

TEST(TableLines, TablesBentInOneEntryHaveNone) {
    for (size_t bent : {0u, 40u, 128u, 200u, 255u}) {
        Tables tables(0, 128, 128, 128);
        tables.luma[bent] = static_cast<uint16_t>(tables.luma[bent] + 2);
        EXPECT_FALSE(tables.HaveLines()) << bent;
    }
    for (size_t bent : {1u, 40u, 127u, 200u, 254u}) {
        for (const uint32_t by : {0x20000u, 2u}) {
            Tables tables(0, 128, 128, 128);
            tables.cb[bent] += by;
            EXPECT_FALSE(tables.HaveLines()) << bent << ", " << by;
            tables.cb[bent] -= by;
            tables.cr[bent] += by;
            EXPECT_FALSE(tables.HaveLines()) << bent << ", " << by;
        }
    }
}

TEST(TableLines, RandomEntriesHaveNone) {
    auto random = testkit::Random(5);
    for (int round = 0; round < 100; ++round) {
        Entries entries;
        for (int32_t& entry : entries)
            entry = static_cast<uint16_t>(random());
        Line line{};
        EXPECT_FALSE(vidshow::FindLine(entries.data(), kLevels, line));
    }
}

TEST(TableLines, SlopesOfAnySizeAndSign) {
    for (int slope : {-250, -3, 0, 1, 2, 100, 256, 257}) {
        for (const Cut cut : {kLevels, kHalf}) {
            if (slope > 250 && cut.shift > 14) continue;  // the sums would leave 32 bits
            Entries entries;
            for (int i = 0; i < 256; ++i) {
                const int entry = 1000 + slope * i + (slope < 0 ? cut.high - 1500 : 0);
                entries[static_cast<size_t>(i)] = entry < cut.low    ? cut.low
                                                  : entry > cut.high ? cut.high
                                                                     : entry;
            }
            EXPECT_TRUE(HasLine(entries, cut)) << slope << ", from " << cut.low;
        }
    }
}

TEST(TableLines, EntriesThatAreAllCutHaveOne) {
    for (const Cut cut : {kLevels, kHalf}) {
        Entries entries;
        entries.fill(cut.low);
        EXPECT_TRUE(HasLine(entries, cut));
        entries.fill(cut.high);
        EXPECT_TRUE(HasLine(entries, cut));
    }
}

// A line is truncated towards zero: around it there is room for twice as much.
TEST(TableLines, ZeroIsTheWidestEntry) {
    Entries entries;
    for (int i = 0; i < 256; ++i)
        entries[static_cast<size_t>(i)] = (i - 128) / 4;  // -32 .. 31, seven zeros
    EXPECT_TRUE(HasLine(entries, kHalf));
    for (int i = 0; i < 256; ++i)
        entries[static_cast<size_t>(i)] = (i >> 2) - 32;  // rounded down: four zeros
    EXPECT_FALSE(HasLine(entries, kHalf));
}

}  // namespace
