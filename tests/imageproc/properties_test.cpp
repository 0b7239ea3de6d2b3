#include <gtest/gtest.h>

#include <cstring>

#include "imageproc/support.h"
#include "testkit/capture.h"

namespace {

using imageproc_test::Params;
using imageproc_test::Processor;

constexpr uint32_t kAdjust = QZ_IMAGEPROC_PROPID_COLORADJUST;
constexpr uint32_t kKey = QZ_IMAGEPROC_PROPID_COLORKEY;
constexpr HRESULT kUnknown = static_cast<HRESULT>(0x80070490u);

class Properties : public testing::Test {
  protected:
    Processor p{Params(QZ_IMAGEPROC_CSC_YCBCR420_TO_YCBCR420, 16, 16, 16, 16)};
};

TEST_F(Properties, ANullHandleIsRefused) {
    uint32_t data[3] = {1, 2, 3};
    uint32_t size = 0;
    EXPECT_EQ(QZ_IMAGEPROC_Set(nullptr, kAdjust, data, 12), E_INVALIDARG);
    EXPECT_EQ(QZ_IMAGEPROC_Get(nullptr, kAdjust, data, 12, &size), E_INVALIDARG);
    EXPECT_EQ(QZ_IMAGEPROC_Reset(nullptr), E_INVALIDARG);
    EXPECT_EQ(QZ_IMAGEPROC_Destroy(nullptr), E_INVALIDARG);
}

TEST_F(Properties, AdjustTakesUpToTwelveBytesAndWritesThemBack) {
    const uint32_t data[3] = {100, 150, 200};
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kAdjust, data, 13), E_INVALIDARG);
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kAdjust, nullptr, 12), E_INVALIDARG);
    EXPECT_EQ(p->i32Brightness, 128);
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kAdjust, data, 12), S_OK);
    uint32_t out[4] = {9, 9, 9, 9};
    uint32_t size = 0;
    EXPECT_EQ(QZ_IMAGEPROC_Get(p.handle(), kAdjust, out, 16, &size), S_OK);
    EXPECT_EQ(size, 12u);
    EXPECT_EQ(out[0], 100u);
    EXPECT_EQ(out[1], 150u);
    EXPECT_EQ(out[2], 200u);
    EXPECT_EQ(out[3], 9u);
}

TEST_F(Properties, Adjust8BytesSetsSaturation0) {
    const uint32_t data[2] = {100, 150};
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kAdjust, data, 8), S_OK);
    EXPECT_EQ(p->i32Brightness, 100);
    EXPECT_EQ(p->i32Contrast, 150);
    EXPECT_EQ(p->i32Saturation, 0);
}

TEST_F(Properties, AdjustOfNoBytesIsAllZero) {
    const uint32_t data = 100;
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kAdjust, &data, 0), S_OK);
    EXPECT_EQ(p->i32Brightness, 0);
    EXPECT_EQ(p->i32Contrast, 0);
    EXPECT_EQ(p->i32Saturation, 0);
    EXPECT_EQ(p->u32AdjustActive, 1u);
}

TEST_F(Properties, AdjustOfAnOddSizeTakesThatManyBytes) {
    const uint8_t data[5] = {1, 2, 0, 0, 7};
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kAdjust, data, 5), S_OK);
    EXPECT_EQ(p->i32Brightness, 0x201);
    EXPECT_EQ(p->i32Contrast, 7);
    EXPECT_EQ(p->i32Saturation, 0);
}

TEST_F(Properties, GetAdjustWantsRoomForTwelveBytes) {
    uint32_t out[3] = {9, 9, 9};
    uint32_t size = 77;
    EXPECT_EQ(QZ_IMAGEPROC_Get(p.handle(), kAdjust, out, 11, &size), E_INVALIDARG);
    EXPECT_EQ(QZ_IMAGEPROC_Get(p.handle(), kAdjust, nullptr, 12, &size), E_INVALIDARG);
    EXPECT_EQ(size, 77u);
    EXPECT_EQ(out[0], 9u);
    EXPECT_EQ(QZ_IMAGEPROC_Get(p.handle(), kAdjust, out, 12, nullptr), S_OK);
    EXPECT_EQ(out[0], 128u);
}

TEST_F(Properties, GetAdjustWritesTheValuesAndFailsWhereTheyAreNotApplied) {
    p->u32CscType = QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB565;
    const uint32_t data[3] = {100, 150, 200};
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kAdjust, data, 12), S_OK) << "setting is not refused";
    uint32_t out[3] = {};
    uint32_t size = 0;
    EXPECT_EQ(QZ_IMAGEPROC_Get(p.handle(), kAdjust, out, 12, &size), E_FAIL);
    EXPECT_EQ(size, 12u);
    EXPECT_EQ(std::memcmp(out, data, 12), 0);
    p->u32RotationType = QZ_IMAGEPROC_ROTATE_90C;
    EXPECT_EQ(QZ_IMAGEPROC_Get(p.handle(), kAdjust, out, 12, &size), S_OK);
}

TEST_F(Properties, TheKeyIsStoredAsItIsForOtherOutputs) {
    const uint32_t key[2] = {0x00EB8080, 5};
    testkit::StdoutCapture capture;
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kKey, key, 8), S_OK);
    EXPECT_EQ(capture.text(), "");
    uint32_t out[2] = {9, 9};
    uint32_t size = 0;
    EXPECT_EQ(QZ_IMAGEPROC_Get(p.handle(), kKey, out, 8, &size), S_OK);
    EXPECT_EQ(size, 4u);
    EXPECT_EQ(out[0], 0x00EB8080u);
    EXPECT_EQ(out[1], 9u);
}

TEST_F(Properties, TheKeyIsTranslatedForRgb5551AndReadsBackTranslated) {
    p->u32CscType = QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551;
    const uint32_t key = 0x00EB8080;
    testkit::StdoutCapture capture;
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kKey, &key, 4), S_OK);
    EXPECT_EQ(capture.text(), "QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551 u32ColorKey = 0xffff! \n");
    uint32_t out = 0;
    EXPECT_EQ(QZ_IMAGEPROC_Get(p.handle(), kKey, &out, 4, nullptr), S_OK);
    EXPECT_EQ(out, 0xFFFFu);
}

TEST_F(Properties, TheKeyWantsFourBytes) {
    uint32_t key = 5;
    uint32_t size = 77;
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kKey, &key, 3), E_INVALIDARG);
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kKey, nullptr, 4), E_INVALIDARG);
    EXPECT_EQ(QZ_IMAGEPROC_Get(p.handle(), kKey, &key, 3, &size), E_INVALIDARG);
    EXPECT_EQ(QZ_IMAGEPROC_Get(p.handle(), kKey, nullptr, 4, &size), E_INVALIDARG);
    EXPECT_EQ(size, 77u);
    EXPECT_EQ(p->u32ColorKey, 0u);
}

TEST_F(Properties, AnUnknownIdIsNamedAndRefused) {
    for (const uint32_t id : {0u, 3u, 0xABCDEFu}) {
        uint32_t data[3] = {1, 2, 3};
        uint32_t size = 77;
        char expected[64];
        std::snprintf(expected, sizeof expected, "invalid propid = 0x%x!\ninvalid propid = 0x%x!\n",
                      id, id);
        testkit::StdoutCapture capture;
        EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), id, data, 12), kUnknown);
        EXPECT_EQ(QZ_IMAGEPROC_Get(p.handle(), id, data, 12, &size), kUnknown);
        EXPECT_EQ(capture.text(), expected);
        EXPECT_EQ(size, 77u);
    }
}

TEST_F(Properties, ResetSwitchesAdjustmentOffAndFreesItsTables) {
    const uint32_t data[3] = {100, 150, 200};
    const uint16_t neutral = p->pTransLuma[200];
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kAdjust, data, 12), S_OK);
    EXPECT_NE(p->pTransLuma[200], neutral);
    EXPECT_EQ(QZ_IMAGEPROC_Reset(p.handle()), S_OK);
    EXPECT_EQ(p->u32AdjustActive, 0u);
    EXPECT_EQ(p->pAdjustBlock, nullptr);
    EXPECT_EQ(p->pAdjustLumaTable, nullptr);
    EXPECT_EQ(p->pAdjustChromaTable, nullptr);
    EXPECT_EQ(p->pTransLuma[200], neutral);
    EXPECT_EQ(p->i32Brightness, 100) << "the stored values stay";
    EXPECT_EQ(p->i32Contrast, 150);
    EXPECT_EQ(p->i32Saturation, 200);
}

TEST_F(Properties, AfterResetTheSameValuesChangeNothingAndOthersDo) {
    uint32_t data[3] = {100, 150, 200};
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kAdjust, data, 12), S_OK);
    EXPECT_EQ(QZ_IMAGEPROC_Reset(p.handle()), S_OK);
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kAdjust, data, 12), S_OK);
    EXPECT_EQ(p->u32AdjustActive, 0u);
    EXPECT_EQ(p->pAdjustBlock, nullptr);
    data[1] = 151;
    EXPECT_EQ(QZ_IMAGEPROC_Set(p.handle(), kAdjust, data, 12), S_OK);
    EXPECT_EQ(p->u32AdjustActive, 1u);
    EXPECT_NE(p->pAdjustBlock, nullptr);
}

TEST_F(Properties, ResetUsesTheRangeOfTheProcessor) {
    QZ_IMAGEPROC_INIT_PARAMS params = Params(0, 16, 16, 16, 16);
    params.u32YuvRange = 1;
    const Processor full(params);
    const uint32_t data[3] = {100, 150, 200};
    EXPECT_EQ(QZ_IMAGEPROC_Set(full.handle(), kAdjust, data, 12), S_OK);
    EXPECT_EQ(QZ_IMAGEPROC_Reset(full.handle()), S_OK);
    EXPECT_EQ(full->pTransLuma[255], 255 * 128);
    EXPECT_EQ(full->pTransCb[0], 0u) << "full range does not centre chroma";
}

TEST_F(Properties, ResetOfAFreshProcessorIsHarmless) {
    EXPECT_EQ(QZ_IMAGEPROC_Reset(p.handle()), S_OK);
    EXPECT_EQ(QZ_IMAGEPROC_Reset(p.handle()), S_OK);
}

}  // namespace
