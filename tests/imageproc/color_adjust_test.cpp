#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <limits>
#include <vector>

#include "imageproc/support.h"

namespace {

using imageproc_test::Params;
using imageproc_test::Processor;

constexpr int32_t kLowest = std::numeric_limits<int32_t>::min();
constexpr int32_t kHighest = std::numeric_limits<int32_t>::max();

int32_t Set(const Processor& p, int32_t b, int32_t c, int32_t s) {
    const int32_t values[3] = {b, c, s};
    return SetImgColorAdjust(&p.record(), values);
}

std::vector<uint32_t> Stored(const Processor& p) {
    uint32_t values[3] = {};
    GetImgColorAdjust(&p.record(), values);
    return {values[0], values[1], values[2]};
}

// What the tables of a processor hold now, all three in one line.
std::vector<uint32_t> TransTables(const Processor& p) {
    std::vector<uint32_t> all(p->pTransLuma, p->pTransLuma + 256);
    all.insert(all.end(), p->pTransCb, p->pTransCb + 256);
    all.insert(all.end(), p->pTransCr, p->pTransCr + 256);
    return all;
}

std::vector<uint32_t> TransTablesFor(const Processor& p, int32_t b, int32_t c, int32_t s) {
    std::vector<uint16_t> luma(256);
    std::vector<uint32_t> cb(256), cr(256);
    const auto build = p->u32FullRange ? set_transtable_fullrange : set_transtable;
    build(p->pYuvToRgb, luma.data(), cb.data(), cr.data(), b, c, s);
    std::vector<uint32_t> all(luma.begin(), luma.end());
    all.insert(all.end(), cb.begin(), cb.end());
    all.insert(all.end(), cr.begin(), cr.end());
    return all;
}

int64_t ReferenceGain(int64_t setting, int64_t slope, int64_t most) {
    if (setting < 0) return 0;
    if (setting > 255) return most;
    if (setting <= 128) return setting;
    return (setting - 128) * (setting - 128) * slope / 128 + 128;
}

int64_t ReferenceLuma(int64_t i, int64_t b, int64_t c) {
    const int64_t offset = b > 255 ? 254 : b < 0 ? -256 : 2 * (b - 128);
    return std::clamp<int64_t>(offset + i * ReferenceGain(c, 3, 506) / 128, 0, 255);
}

int64_t ReferenceChroma(int64_t i, int64_t s) {
    // In 1/128; the division truncates toward zero, as the conversion from a double does.
    const int64_t sum = (i - 128) * ReferenceGain(s, 7, 1010) + 128 * 128;
    return std::clamp<int64_t>(sum / 128, 0, 255);
}

TEST(SetImgColorAdjust, NeutralOnAFreshProcessorDoesNothing) {
    const Processor p(Params(0, 16, 16, 16, 16));
    EXPECT_EQ(Set(p, 128, 128, 128), 0);
    EXPECT_EQ(p->u32AdjustActive, 0u);
    EXPECT_EQ(p->pAdjustBlock, nullptr);
}

TEST(SetImgColorAdjust, Contrast200AllocatesTheBlockAndGives249) {
    const Processor p(Params(0, 16, 16, 16, 16));
    EXPECT_EQ(Set(p, 128, 200, 128), 0);
    ASSERT_NE(p->pAdjustBlock, nullptr);
    EXPECT_EQ(p->pAdjustLumaTable, p->pAdjustBlock);
    EXPECT_EQ(p->pAdjustChromaTable, p->pAdjustBlock + 256);
    EXPECT_EQ(p->u32AdjustActive, 1u);
    EXPECT_EQ(p->pAdjustLumaTable[128], 249);  // (128 x 249) >> 7
    EXPECT_EQ(p->pAdjustLumaTable[100], 194);  // 24900 / 128 = 194.5
    EXPECT_EQ(p->pAdjustLumaTable[255], 255);
}

TEST(SetImgColorAdjust, TablesEqualTheRecomputationForEverySetting) {
    const Processor p(Params(0, 16, 16, 16, 16));
    std::vector<int32_t> settings = {kLowest, -300, -1, 256, 300, kHighest};
    for (int32_t i = 0; i < 256; ++i)
        settings.push_back(i);
    for (size_t n = 0; n < settings.size(); ++n) {
        const int32_t b = settings[n];
        const int32_t c = settings[(n * 7 + 3) % settings.size()];
        const int32_t s = settings[(n * 11 + 5) % settings.size()];
        ASSERT_EQ(Set(p, b, c, s), 0);
        for (int i = 0; i < 256; ++i) {
            ASSERT_EQ(p->pAdjustLumaTable[i], ReferenceLuma(i, b, c))
                << b << ' ' << c << " at " << i;
            ASSERT_EQ(p->pAdjustChromaTable[i], ReferenceChroma(i, s)) << s << " at " << i;
        }
        ASSERT_EQ(TransTables(p), TransTablesFor(p, b, c, s));
    }
}

TEST(SetImgColorAdjust, UpperHalfGrowsQuadratically) {
    const Processor p(Params(0, 16, 16, 16, 16));
    ASSERT_EQ(Set(p, 128, 255, 255), 0);
    // Contrast 506/128 = 3.95, saturation 1010/128 = 7.89.
    EXPECT_EQ(p->pAdjustLumaTable[10], 39);      // 5060 / 128 = 39.5
    EXPECT_EQ(p->pAdjustChromaTable[130], 143);  // 128 + 2 x 7.89 = 143.8
    EXPECT_EQ(p->pAdjustChromaTable[126], 112);  // 128 - 15.78 = 112.2
}

TEST(SetImgColorAdjust, ChromaIsTruncatedTowardZero) {
    const Processor p(Params(0, 16, 16, 16, 16));
    ASSERT_EQ(Set(p, 128, 128, 64), 0);
    EXPECT_EQ(p->pAdjustChromaTable[127], 127);  // 127.5
    EXPECT_EQ(p->pAdjustChromaTable[129], 128);  // 128.5
    EXPECT_EQ(p->pAdjustChromaTable[128], 128);
}

TEST(SetImgColorAdjust, BackToNeutralSwitchesOffAndKeepsTheBlock) {
    const Processor p(Params(0, 16, 16, 16, 16));
    ASSERT_EQ(Set(p, 10, 20, 30), 0);
    const uint8_t* const block = p->pAdjustBlock;
    const std::vector<uint8_t> before(block, block + 512);
    ASSERT_EQ(Set(p, 128, 128, 128), 0);
    EXPECT_EQ(p->u32AdjustActive, 0u);
    EXPECT_EQ(p->pAdjustBlock, block);
    EXPECT_EQ(std::vector<uint8_t>(block, block + 512), before);
    EXPECT_EQ(TransTables(p), TransTablesFor(p, 128, 128, 128));
    EXPECT_EQ(Stored(p), (std::vector<uint32_t>{128, 128, 128}));
}

TEST(SetImgColorAdjust, TheSameTripleChangesNothing) {
    const Processor p(Params(0, 16, 16, 16, 16));
    ASSERT_EQ(Set(p, 10, 20, 30), 0);
    p->pTransLuma[7] = 4711;
    p->pAdjustLumaTable[7] = 47;
    ASSERT_EQ(Set(p, 10, 20, 30), 0);
    EXPECT_EQ(p->pTransLuma[7], 4711) << "tables are not rebuilt";
    EXPECT_EQ(p->pAdjustLumaTable[7], 47);
    ASSERT_EQ(Set(p, 10, 20, 31), 0);
    EXPECT_NE(p->pTransLuma[7], 4711) << "one value of three makes a difference";
}

TEST(SetImgColorAdjust, UsesTheFullRangeBuilderWhereTheProcessorIsFullRange) {
    QZ_IMAGEPROC_INIT_PARAMS params = Params(0, 16, 16, 16, 16);
    params.u32ColorMatrix = 2;
    params.u32YuvRange = 1;
    const Processor p(params);
    ASSERT_EQ(Set(p, 100, 150, 200), 0);
    EXPECT_EQ(TransTables(p), TransTablesFor(p, 100, 150, 200));
    EXPECT_NE(p->pTransCb[0], TransTablesFor(p, 100, 150, 200)[256 + 128]);
    ASSERT_EQ(Set(p, 128, 128, 128), 0);
    EXPECT_EQ(TransTables(p), TransTablesFor(p, 128, 128, 128));
}

TEST(GetImgColorAdjust, CopiesTheStoredValuesEvenWhereTheyDoNotApply) {
    const Processor p(Params(0, 16, 16, 16, 16));
    ASSERT_EQ(Set(p, -7, 1000, 5), 0);
    uint32_t values[3] = {};
    EXPECT_EQ(GetImgColorAdjust(&p.record(), values), 0);
    EXPECT_EQ(values[0], 0xFFFFFFF9u);
    EXPECT_EQ(values[1], 1000u);
    EXPECT_EQ(values[2], 5u);
    p->u32CscType = QZ_IMAGEPROC_CSC_YCBCR420_TO_YUY2;
    std::memset(values, 0, sizeof values);
    EXPECT_EQ(GetImgColorAdjust(&p.record(), values), -3);
    EXPECT_EQ(values[1], 1000u);
    p->u32CscType = QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB565;
    EXPECT_EQ(GetImgColorAdjust(&p.record(), values), -3);
    p->u32RotationType = QZ_IMAGEPROC_ROTATE_180;
    EXPECT_EQ(GetImgColorAdjust(&p.record(), values), 0);
}

TEST(CheckCapability, NamesTheConversionsThatAreNotAdjusted) {
    for (int32_t code = 0; code < 4096; ++code) {
        for (uint32_t rotation = 0; rotation <= 5; ++rotation) {
            const bool planarInput = code < 3 * 256;
            const bool packedOutput = code == 6 || code == 7 || code == 8;
            const bool plainRgb565 = code == 3 && rotation == 0;
            const int32_t expected = planarInput && !packedOutput && !plainRgb565 ? 0 : -3;
            for (const uint32_t resizeCase : {0u, 1u, 7u, 0xFFFFFFFFu}) {
                ASSERT_EQ(_CheckCapability_depend(code, resizeCase, rotation), expected)
                    << code << " rotation " << rotation << " case " << resizeCase;
            }
        }
    }
    EXPECT_EQ(_CheckCapability_depend(-1, 0, 0), -3) << "no such input format";
}

}  // namespace
