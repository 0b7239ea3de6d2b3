// Lines found in translation tables give every entry back, and all the engine's own tables have
// them: were one to lose its lines, it would fall back to look-ups without a word.

#include "kernels/table_lines.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <thread>
#include <vector>

#include "testkit/random.h"
#include "vidshow/imageproc.h"

namespace {

using vidshow::Line;
using vidshow::TableLines;

using Levels = std::array<uint16_t, 256>;
using Terms = std::array<int16_t, 256>;

bool Find(const Levels& entries, Line& line) {
    return vidshow::FindLumaLine(entries.data(), line);
}
bool Find(const Terms& entries, Line& line) {
    return vidshow::FindChromaLine(entries.data(), line);
}

uint32_t Word(int x) {
    return static_cast<uint32_t>(x) & 0xFFFF;
}

/// What words of 16 bits make of a sample, step by step as registers do.
uint32_t Rise(const Line& line, uint32_t sample) {
    const uint32_t shifted = sample + Word(line.phase), fraction = Word(line.fraction);
    EXPECT_TRUE(shifted < 32768 && fraction < 32768) << "not signed words";
    return (Word(line.whole) * sample + (shifted * fraction >> 15)) & 0xFFFF;
}
int Entry(const Line& line, uint32_t sample, uint16_t) {
    const int level = static_cast<int>(Rise(line, sample)) + line.offset;
    return level < 0 ? 0 : level > 65535 ? 65535 : level;
}
int Entry(const Line& line, uint32_t sample, int16_t) {
    const int word = static_cast<int>((Rise(line, sample) + Word(line.offset)) & 0xFFFF);
    return word < 32768 ? word : word - 65535;
}

template <class Entries>
testing::AssertionResult Gives(const Line& line, const Entries& entries) {
    for (size_t i = 0; i < 256; ++i) {
        if (Entry(line, static_cast<uint32_t>(i), entries[i]) != entries[i]) {
            return testing::AssertionFailure() << "entry " << i;
        }
    }
    return testing::AssertionSuccess();
}

template <class Entries>
testing::AssertionResult HasLine(const Entries& entries) {
    Line line{};
    if (!Find(entries, line)) return testing::AssertionFailure() << "none";
    return Gives(line, entries);
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
        Levels levels;
        Terms high[2], low[2];
        for (size_t i = 0; i < 256; ++i) {
            levels[i] = luma[i];
            high[0][i] = static_cast<int16_t>(cb[i] >> 16);
            high[1][i] = static_cast<int16_t>(cr[i] >> 16);
            low[0][i] = static_cast<int16_t>(cb[i] & 0xFFFF);
            low[1][i] = static_cast<int16_t>(cr[i] & 0xFFFF);
        }
        const testing::AssertionResult results[] = {
            Gives(lines.luma, levels), Gives(lines.blue, high[0]), Gives(lines.red, high[1]),
            Gives(lines.cbToGreen, low[0]), Gives(lines.crToGreen, low[1])};
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

// Within what words of 16 bits hold: a rise from black to white, or a term, of less than 65536 /
// 128 or 32768 / 64 levels.
TEST(TableLines, AdjustedTablesAreLines) {
    for (int matrix : kMatrices) {
        const bool limited = matrix % 4 == 0;
        const int mostContrast = limited ? 219 : 255, mostSaturation = limited ? 230 : 135;
        for (int setting = 0; setting < 256; setting += 15) {
            const int contrast = setting * mostContrast / 255;
            const int saturation = setting * mostSaturation / 255;
            EXPECT_TRUE(Tables(matrix, setting, 128, 128).AreLines())
                << "matrix " << matrix << ", brightness " << setting;
            EXPECT_TRUE(Tables(matrix, 128, contrast, 128).AreLines())
                << "matrix " << matrix << ", contrast " << contrast;
            EXPECT_TRUE(Tables(matrix, 128, 128, saturation).AreLines())
                << "matrix " << matrix << ", saturation " << saturation;
            EXPECT_TRUE(Tables(matrix, 255 - setting, contrast, saturation * 7 % 129).AreLines())
                << "matrix " << matrix << ", all " << setting;
        }
    }
}

TEST(TableLines, WhatLeavesSixteenBitsHasNone) {
    EXPECT_FALSE(Tables(0, 128, 255, 128).HaveLines());
    EXPECT_FALSE(Tables(0, 128, 128, 255).HaveLines());
    EXPECT_FALSE(Tables(1, 128, 128, 160).HaveLines());
}

// What is remembered is the entries, not where they stood.
TEST(TableLines, TablesAreLookedAtAnewWhenTheyChange) {
    Tables tables(0, 128, 128, 128);
    const auto recalls = [&](TableLines& lines) {
        return vidshow::RecallTableLines(tables.luma, tables.cb, tables.cr, lines);
    };
    for (int round = 0; round < 3; ++round) {
        TableLines found{}, recalled{};
        ASSERT_TRUE(vidshow::FindTableLines(tables.luma, tables.cb, tables.cr, found));
        ASSERT_TRUE(recalls(recalled));
        EXPECT_EQ(std::memcmp(&found, &recalled, sizeof found), 0);
        for (uint32_t* table : {tables.cb, tables.cr}) {
            table[77] += 3;
            EXPECT_FALSE(recalls(recalled));
            EXPECT_FALSE(recalls(recalled));
            table[77] -= 3;
        }
        tables.luma[200] += 3;
        EXPECT_FALSE(recalls(recalled));
        tables.luma[200] -= 3;
        tables = Tables(round == 0 ? 4 : 8, 100, 140, 110);
    }
}

TEST(TableLines, ThreadsRecallTheirOwn) {
    std::vector<std::thread> threads;
    for (const int matrix : {0, 4, 8, 12}) {
        threads.emplace_back([=] {
            const Tables tables(matrix, 128, 128, 128);
            TableLines found{};
            vidshow::FindTableLines(tables.luma, tables.cb, tables.cr, found);
            for (int round = 0; round < 300; ++round) {
                TableLines lines{};
                EXPECT_TRUE(vidshow::RecallTableLines(tables.luma, tables.cb, tables.cr, lines));
                EXPECT_EQ(std::memcmp(&found, &lines, sizeof found), 0);
            }
        });
    }
    for (std::thread& thread : threads)
        thread.join();
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
        Levels levels;
        Terms terms;
        for (size_t i = 0; i < 256; ++i) {
            levels[i] = static_cast<uint16_t>(random());
            terms[i] = static_cast<int16_t>(random());
        }
        Line line{};
        EXPECT_FALSE(Find(levels, line));
        EXPECT_FALSE(Find(terms, line));
    }
}

TEST(TableLines, SlopesAndHeightsOfAnyFineness) {
    constexpr double kFine = 1 << 12;  // of the slope; heights are finer
    auto random = testkit::Random(6);
    const auto fraction = [&] { return static_cast<double>(random() % 65536) / 65536; };
    for (int round = 0; round < 3000; ++round) {
        const double slope = std::floor((2 * 127 * fraction() - 127) * kFine) / kFine;
        const double rise = std::floor(220 * fraction() * kFine) / kFine;
        const double zero = 256 * fraction(), height = 30000 * fraction() - 20000;
        Levels levels;
        Terms terms;
        for (size_t i = 0; i < 256; ++i) {
            const double sample = static_cast<double>(i);
            terms[i] = static_cast<int16_t>(slope * (sample - zero));
            const double level = rise * sample + height;
            levels[i] = static_cast<uint16_t>(level < 0 ? 0 : level > 65535 ? 65535 : level);
        }
        EXPECT_TRUE(HasLine(terms)) << slope << " from " << zero;
        EXPECT_TRUE(HasLine(levels)) << rise << " from " << height;
    }
}

// Slopes as fine as a fraction can say leave the height next to no room: not all have a phase, but
// what is found is right.
TEST(TableLines, WhatIsFoundForTheFinestSlopesIsRight) {
    auto random = testkit::Random(7);
    int found = 0;
    for (int round = 0; round < 3000; ++round) {
        const auto slope = static_cast<int64_t>(random() % (100 << 15) | 1);
        const auto height = static_cast<int64_t>(random() % (1 << 20));
        Terms terms;
        for (size_t i = 0; i < 256; ++i)
            terms[i] = static_cast<int16_t>((slope * static_cast<int64_t>(i) + height) >> 15);
        Line line{};
        if (!Find(terms, line)) continue;
        ++found;
        EXPECT_TRUE(Gives(line, terms)) << slope << " / 32768 from " << height << " / 32768";
    }
    EXPECT_GT(found, 2500);
}

TEST(TableLines, WholeSlopesOfAnySizeAndSign) {
    for (int slope : {-127, -3, 0, 1, 2, 100, 127}) {
        Terms terms;
        Levels levels;
        for (int i = 0; i < 256; ++i) {
            terms[static_cast<size_t>(i)] = static_cast<int16_t>(slope * (i - 128));
            const int level = 2 * std::abs(slope) * i - 1000;
            levels[static_cast<size_t>(i)] = static_cast<uint16_t>(level < 0 ? 0 : level);
        }
        EXPECT_TRUE(HasLine(terms)) << slope;
        EXPECT_TRUE(HasLine(levels)) << 2 * std::abs(slope);
    }
}

TEST(TableLines, FallingLumaHasNone) {
    Levels levels;
    for (int i = 0; i < 256; ++i)
        levels[static_cast<size_t>(i)] = static_cast<uint16_t>(40000 - 100 * i);
    Line line{};
    EXPECT_FALSE(Find(levels, line));
}

TEST(TableLines, LumaThatIsAllCutHasOne) {
    Levels levels;
    for (const bool white : {false, true}) {
        levels.fill(white ? UINT16_MAX : 0);
        EXPECT_TRUE(HasLine(levels));
    }
}

// From black to white at once: every slope from 65536 on would do, and none fits a word.
TEST(TableLines, StepsHaveNone) {
    for (size_t black = 1; black < 255; ++black) {
        Levels levels;
        for (size_t i = 0; i < 256; ++i)
            levels[i] = i < black ? 0 : UINT16_MAX;
        Line line{};
        EXPECT_FALSE(Find(levels, line)) << black;
    }
}

// Cut at both ends, as contrast does.
TEST(TableLines, LumaThatIsCutAtBothEndsHasOne) {
    Levels levels;
    for (int i = 0; i < 256; ++i) {
        const int level = 250 * i - 20000;
        levels[static_cast<size_t>(i)] = static_cast<uint16_t>(std::max(level, 0));
    }
    EXPECT_TRUE(HasLine(levels));
    for (int i = 0; i < 256; ++i) {
        const int level = 250 * i + 20000;
        levels[static_cast<size_t>(i)] = static_cast<uint16_t>(std::min(level, 65535));
    }
    EXPECT_TRUE(HasLine(levels));
}

// A line is truncated towards zero: around it there is room for twice as much.
TEST(TableLines, ZeroIsTheWidestTerm) {
    Terms terms;
    for (int i = 0; i < 256; ++i)
        terms[static_cast<size_t>(i)] = static_cast<int16_t>((i - 128) / 4);  // seven zeros
    EXPECT_TRUE(HasLine(terms));
    for (int i = 0; i < 256; ++i)
        terms[static_cast<size_t>(i)] = static_cast<int16_t>((i >> 2) - 32);  // four zeros
    EXPECT_FALSE(HasLine(terms));
}

}  // namespace
