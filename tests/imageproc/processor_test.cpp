#include <gtest/gtest.h>

#include "imageproc/support.h"
#include "testkit/capture.h"

namespace {

using imageproc_test::Params;
using imageproc_test::Processor;

constexpr uint32_t kCopy = QZ_IMAGEPROC_CSC_YCBCR420_TO_YCBCR420;

TEST(ImageProcessorCreate, WantsAnEmptySlotAndARecord) {
    const QZ_IMAGEPROC_INIT_PARAMS params = Params(kCopy, 16, 16, 16, 16);
    EXPECT_EQ(QZ_IMAGEPROC_Create(nullptr, 0, &params), E_INVALIDARG);
    void* handle = nullptr;
    EXPECT_EQ(QZ_IMAGEPROC_Create(&handle, 0, nullptr), E_INVALIDARG);
    EXPECT_EQ(handle, nullptr);
    int occupant = 0;
    handle = &occupant;
    EXPECT_EQ(QZ_IMAGEPROC_Create(&handle, 0, &params), E_INVALIDARG);
    EXPECT_EQ(handle, &occupant);
}

TEST(ImageProcessorCreate, Odd174x100WorksOn172x100AndSaysSoOnce) {
    testkit::StdoutCapture capture;
    const Processor p(Params(kCopy, 174, 100, 174, 100));
    EXPECT_EQ(capture.text(), "mis-aligned resolution found, patching...\n");
    ASSERT_EQ(p.result, S_OK);
    EXPECT_EQ(p->u32GivenInWidth, 174u);
    EXPECT_EQ(p->u32InWidth, 172u);
    EXPECT_EQ(p->u32InHeight, 100u);
    EXPECT_EQ(p->u32OutWidth, 172u);
}

}  // namespace
