// Creation when the choice of the matrices fails. Ours accepts everything, so this program brings a
// choice of its own.

#include <gtest/gtest.h>

#include "imageproc/support.h"
#include "testkit/capture.h"

extern "C" __attribute__((visibility("default"))) int32_t UpdateColorMatrix(QZ_IMAGEPROC_PARAMSET*,
                                                                            uint32_t matrixIndex,
                                                                            uint32_t) {
    return matrixIndex == 3 ? -1 : 0;
}

namespace {

TEST(ImageProcessorCreate, ARefusedMatrixIsUnexpected) {
    QZ_IMAGEPROC_INIT_PARAMS params = imageproc_test::Params(0, 16, 16, 16, 16);
    params.u32ColorMatrix = 3;
    testkit::StdoutCapture capture;
    const imageproc_test::Processor p(params);
    EXPECT_EQ(capture.text(), "Unexpected color matrix index or yuv range!\n");
    EXPECT_EQ(p.result, E_UNEXPECTED);
    EXPECT_EQ(p.handle(), nullptr);
}

}  // namespace
