// Every conversion x rotation x size relation x algorithm x matrix x range x adjustment: what the
// processor writes is what the kernel writes that the reader's table names.

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <vector>

#include "imageproc/expected_frame.h"
#include "imageproc/support.h"
#include "testkit/capture.h"
#include "testkit/random.h"

namespace {

using namespace imageproc_test;

constexpr uint32_t kCodes[] = {0,   3,   4,   5,   6,    7,    8,    10,   259,  515, 516,
                               517, 768, 771, 773, 1027, 1028, 1280, 2048, 2051, 2304};

struct Geometry {
    uint32_t inWidth, inHeight, outWidth, outHeight;
};
// One for each resize case that a linear, upright processor can have, in the cases' order; no size
// is a multiple of 8 where the case allows it.
constexpr Geometry kGeometries[] = {
    {12, 20, 12, 20}, {12, 20, 20, 12}, {12, 20, 20, 28}, {20, 12, 12, 8},
    {12, 20, 24, 40}, {16, 12, 40, 24}, {16, 12, 24, 8},
};
constexpr Geometry kPal = {320, 240, 480, 272};

// Planes that are large enough for every format of a geometry, turned or not.
class Picture {
  public:
    Picture(const Geometry& g, uint8_t fill) {
        const uint32_t side = std::max({g.inWidth, g.inHeight, g.outWidth, g.outHeight});
        const uint32_t stride[3] = {4 * side + 16, 2 * side + 12, 2 * side + 12};
        // Two rows more: one conversion reads them.
        for (size_t i = 0; i < 3; ++i) {
            m_bytes[i].assign(size_t{stride[i]} * (side + 2), fill);
            planes.plane[i] = m_bytes[i].data();
            planes.stride[i] = stride[i];
        }
    }
    void FillRandom(uint32_t salt) {
        std::mt19937 random = testkit::Random(salt);
        for (auto& plane : m_bytes)
            testkit::FillSamples(random, plane.data(), plane.size());
    }
    void Fill(uint8_t value) {
        for (auto& plane : m_bytes)
            std::fill(plane.begin(), plane.end(), value);
    }
    bool operator==(const Picture& other) const { return m_bytes == other.m_bytes; }

    Planes planes;

  private:
    std::array<std::vector<uint8_t>, 3> m_bytes;
};

class Walk {
  public:
    explicit Walk(const Geometry& g)
        : m_geometry(g), m_src(g, 0), m_actual(g, 0), m_expected(g, 0) {
        m_src.FillRandom(g.inWidth * 1000 + g.outWidth);
    }

    void Conversion(uint32_t code, uint32_t rotation, uint32_t algorithm) {
        for (uint32_t matrix = 0; matrix < 4; ++matrix) {
            for (uint32_t range = 0; range < 2; ++range)
                Variant(code, rotation, algorithm, matrix, range);
        }
    }

  private:
    void Variant(uint32_t code, uint32_t rotation, uint32_t algorithm, uint32_t matrix,
                 uint32_t range) {
        QZ_IMAGEPROC_INIT_PARAMS params = Params(code, m_geometry.inWidth, m_geometry.inHeight,
                                                 m_geometry.outWidth, m_geometry.outHeight);
        params.u32RotationType = rotation;
        params.u32ResizeAlgorithm = algorithm;
        params.u32ColorMatrix = matrix;
        params.u32YuvRange = range;
        params.u32Alpha = 0x7F;
        params.u32ColorKey = 0x00EB8080;
        SCOPED_TRACE(testing::Message()
                     << "code " << code << " rotation " << rotation << " from "
                     << m_geometry.inWidth << " to " << m_geometry.outWidth << " algorithm "
                     << algorithm << " matrix " << matrix << " range " << range);
        const Processor p(params);
        if (code == 10 && (rotation != 0 || ExpectedCase(params) != 0)) {
            ASSERT_EQ(p.result, E_FAIL);
            return;
        }
        const Processor reference(params);
        ASSERT_EQ(p.result, S_OK);
        ASSERT_EQ(reference.result, S_OK);
        ASSERT_EQ(p->u32ResizeCase, ExpectedCase(params));
        Compare(params, p, reference);
        const uint32_t adjust[3] = {140, 150, 100};
        ASSERT_EQ(QZ_IMAGEPROC_Set(p.handle(), 1, adjust, 12), S_OK);
        ASSERT_EQ(QZ_IMAGEPROC_Set(reference.handle(), 1, adjust, 12), S_OK);
        Compare(params, p, reference);
    }

    void Compare(const QZ_IMAGEPROC_INIT_PARAMS& params, const Processor& p,
                 const Processor& reference) {
        m_actual.Fill(0xA5);
        m_expected.Fill(0xA5);
        const QZ_IMAGEPROC_FRAME_PARAMS frame = {12, 0, 0};
        ASSERT_EQ(QZ_IMAGEPROC_ProcessFrame(p.handle(), m_src.planes.plane, m_src.planes.stride,
                                            m_actual.planes.plane, m_actual.planes.stride, &frame),
                  S_OK);
        RunExpectedFrame(params, &reference.record(), m_src.planes, m_expected.planes);
        ASSERT_TRUE(m_actual == m_expected) << "adjusted: " << p->u32AdjustActive;
    }

    const Geometry m_geometry;
    Picture m_src;
    Picture m_actual;
    Picture m_expected;
};

class PipelineWalk : public testing::TestWithParam<uint32_t> {};

TEST_P(PipelineWalk, RunsTheNamedKernel) {
    testkit::StdoutCapture capture;  // keys are announced
    for (const Geometry& geometry : kGeometries) {
        Walk walk(geometry);
        for (uint32_t rotation = 0; rotation <= 5; ++rotation) {
            for (uint32_t algorithm = 0; algorithm <= 3; ++algorithm) {
                walk.Conversion(GetParam(), rotation, algorithm);
                if (HasFatalFailure()) return;
            }
        }
    }
}

// Larger, and so only where it is a case of its own.
TEST_P(PipelineWalk, RunsTheNamedKernelFrom320x240To480x272) {
    testkit::StdoutCapture capture;
    Walk(kPal).Conversion(GetParam(), 0, 1);
}

INSTANTIATE_TEST_SUITE_P(EveryConversion, PipelineWalk, testing::ValuesIn(kCodes),
                         testing::PrintToStringParamName());

// The geometries above really are one for each case.
TEST(PipelineWalkGeometries, CoverEveryResizeCase) {
    for (uint32_t i = 0; i < 7; ++i) {
        const Geometry& g = kGeometries[i];
        const Processor p(Params(0, g.inWidth, g.inHeight, g.outWidth, g.outHeight));
        EXPECT_EQ(p->u32ResizeCase, i);
    }
    const Processor p(Params(0, kPal.inWidth, kPal.inHeight, kPal.outWidth, kPal.outHeight));
    EXPECT_EQ(p->u32ResizeCase, 7u);
}

}  // namespace
