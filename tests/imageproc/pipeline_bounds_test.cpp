// No conversion reads or writes outside its pictures, and none leaves a pixel unwritten: every
// plane ends at an unmapped page, then begins at one, and every frame is made twice over different
// bytes.

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <vector>

#include "imageproc/expected_frame.h"
#include "imageproc/picture_sizes.h"
#include "imageproc/support.h"
#include "testkit/capture.h"
#include "testkit/guarded_buffer.h"
#include "testkit/random.h"

namespace {

using namespace imageproc_test;
using Placement = testkit::GuardedBuffer::Placement;

bool GoesThroughWalker(const QZ_IMAGEPROC_INIT_PARAMS& q) {
    return imageproc_test::GoesThroughWalker(q.u32CscType);
}

Size Extent(const QZ_IMAGEPROC_INIT_PARAMS& q) {
    return imageproc_test::Extent(q.u32CscType, q.u32RotationType, {q.u32InWidth, q.u32InHeight},
                                  {q.u32OutWidth, q.u32OutHeight});
}

// One plane in memory of its own. `slackRows` may be read below the picture.
class Plane {
  public:
    Plane(const Size& s, uint32_t stride, Placement placement, uint32_t slackRows, bool padLastRow)
        : m_size(s),
          m_stride(stride),
          m_memory(Bytes(s.h + slackRows, padLastRow ? stride : s.w), placement) {}

    uint8_t* data() { return m_memory.data(); }
    uint32_t stride() const { return m_stride; }
    void Fill(uint8_t value) { std::fill_n(m_memory.data(), m_memory.size(), value); }
    void FillRandom(std::mt19937& random) {
        testkit::FillSamples(random, m_memory.data(), m_memory.size());
    }
    std::vector<uint8_t> bytes() const {
        return std::vector<uint8_t>(m_memory.data(), m_memory.data() + m_memory.size());
    }
    // The visible bytes, when every row begins `offset` bytes in.
    std::vector<uint8_t> Visible(uint32_t offset) const {
        std::vector<uint8_t> all;
        for (size_t y = 0; y < m_size.h; ++y) {
            const uint8_t* row = m_memory.data() + y * m_stride + offset;
            all.insert(all.end(), row, row + m_size.w);
        }
        return all;
    }
    // Whether everything else still holds `value`.
    bool RestIs(uint8_t value, uint32_t offset) const {
        for (size_t i = 0; i < m_memory.size(); ++i) {
            const size_t column = i % m_stride;
            const bool visible =
                i / m_stride < m_size.h && column >= offset && column < size_t{offset} + m_size.w;
            if (!visible && m_memory[i] != value) return false;
        }
        return true;
    }

  private:
    size_t Bytes(uint32_t rows, uint32_t lastRow) const {
        return rows ? size_t{rows - 1} * m_stride + lastRow : 0;
    }
    const Size m_size;
    const uint32_t m_stride;
    testkit::GuardedBuffer m_memory;
};

// Bytes behind a row, of which as many count as make the stride a multiple of 4.
constexpr uint32_t kUsualPad = 15;
constexpr uint32_t kNoPad = 3;
constexpr uint32_t kLargePad = 515;

class Picture {
  public:
    Picture(uint32_t format, const Size& s, Placement placement, uint32_t slackRows,
            bool padLastRow, uint32_t pad = kUsualPad) {
        for (const Size& plane : PlanesOf(format, s)) {
            const uint32_t slack = m_planes.empty() ? slackRows : slackRows / 2;
            const uint32_t stride = std::max((plane.w + pad) / 4 * 4, 4u);
            m_planes.push_back(
                std::make_unique<Plane>(plane, stride, placement, slack, padLastRow));
        }
        for (size_t i = 0; i < m_planes.size(); ++i) {
            planes.plane[i] = m_planes[i]->data();
            planes.stride[i] = m_planes[i]->stride();
        }
    }
    std::vector<std::unique_ptr<Plane>>& all() { return m_planes; }

    Planes planes = {};

  private:
    std::vector<std::unique_ptr<Plane>> m_planes;
};

// Whether pixels may be left as they were.
enum class Unwritten { refused, allowed };

class Bounds {
  public:
    Bounds(const QZ_IMAGEPROC_INIT_PARAMS& params, Placement placement, uint32_t pad = kUsualPad)
        : m_params(params),
          m_flushAtEnd(GoesThroughWalker(params) && params.u32RotationType == 3),
          m_src(params.u32CscType >> 8, {params.u32InWidth, params.u32InHeight}, placement,
                ExpectedCase(params) == 5 ? 2 : 0, false, pad),
          m_dst(params.u32CscType & 255, Extent(params), placement, 0, m_flushAtEnd, pad) {
        std::mt19937 random = testkit::Random(params.u32CscType);
        for (auto& plane : m_src.all())
            plane->FillRandom(random);
    }

    void Check(bool adjusted, Unwritten unwritten = Unwritten::refused) {
        const Processor p(m_params);
        ASSERT_EQ(p.result, S_OK);
        const uint32_t neutral = 128;
        const uint32_t values[3] = {adjusted ? 140 : neutral, neutral, adjusted ? 100 : neutral};
        ASSERT_EQ(QZ_IMAGEPROC_Set(p.handle(), 1, values, 12), S_OK);
        const auto source = Bytes(m_src);
        const auto first = RunOver(p, 0x00);
        const auto second = RunOver(p, 0xFF);
        if (unwritten == Unwritten::refused) {
            EXPECT_TRUE(first == second) << "a pixel was left unwritten";
        }
        EXPECT_EQ(Bytes(m_src), source) << "the source was written";
    }

  private:
    using Contents = std::vector<std::vector<uint8_t>>;
    static Contents Bytes(Picture& picture) {
        Contents all;
        for (auto& plane : picture.all())
            all.push_back(plane->bytes());
        return all;
    }

    Contents RunOver(const Processor& p, uint8_t fill) {
        for (auto& plane : m_dst.all())
            plane->Fill(fill);
        const QZ_IMAGEPROC_FRAME_PARAMS frame = {12, 0, 0};
        EXPECT_EQ(QZ_IMAGEPROC_ProcessFrame(p.handle(), m_src.planes.plane, m_src.planes.stride,
                                            m_dst.planes.plane, m_dst.planes.stride, &frame),
                  S_OK);
        Contents visible;
        const auto sizes = PlanesOf(m_params.u32CscType & 255, Extent(m_params));
        for (size_t i = 0; i < sizes.size(); ++i) {
            Plane& plane = *m_dst.all()[i];
            const uint32_t offset = m_flushAtEnd ? plane.stride() - sizes[i].w : 0;
            EXPECT_TRUE(plane.RestIs(fill, offset)) << "plane " << i << " outside the picture";
            visible.push_back(plane.Visible(offset));
        }
        return visible;
    }

    const QZ_IMAGEPROC_INIT_PARAMS m_params;
    const bool m_flushAtEnd;
    Picture m_src;
    Picture m_dst;
};

void CheckGeometry(uint32_t code, const Size& in, const Size& out,
                   Unwritten unwritten = Unwritten::refused, uint32_t pad = kUsualPad) {
    for (uint32_t rotation = 0; rotation <= 5; ++rotation) {
        for (const uint32_t algorithm : {0u, 1u, 3u}) {
            QZ_IMAGEPROC_INIT_PARAMS params = Params(code, in.w, in.h, out.w, out.h);
            params.u32RotationType = rotation;
            params.u32ResizeAlgorithm = algorithm;
            if (code == 10 && (rotation != 0 || ExpectedCase(params) != 0)) continue;
            if (ExpectedCase(params) == 0 && algorithm != 1) continue;
            SCOPED_TRACE(testing::Message() << "code " << code << " rotation " << rotation
                                            << " algorithm " << algorithm << ' ' << in.w << 'x'
                                            << in.h << " to " << out.w << 'x' << out.h);
            for (const Placement placement : {Placement::end, Placement::start}) {
                Bounds bounds(params, placement, pad);
                bounds.Check(false, unwritten);
                bounds.Check(true, unwritten);
            }
            if (testing::Test::HasFailure()) return;
        }
    }
}

class PipelineBounds : public testing::TestWithParam<uint32_t> {};

TEST_P(PipelineBounds, EqualSizesStayInsideTheirPlanes) {
    testkit::StdoutCapture capture;
    for (const uint32_t w : {4u, 8u, 12u, 20u, 32u, 36u}) {
        for (const uint32_t h : {4u, 8u, 12u, 28u})
            CheckGeometry(GetParam(), {w, h}, {w, h});
    }
}

TEST_P(PipelineBounds, ResizedPicturesStayInsideTheirPlanes) {
    testkit::StdoutCapture capture;
    CheckGeometry(GetParam(), {12, 20}, {20, 12});
    CheckGeometry(GetParam(), {12, 20}, {20, 28});
    CheckGeometry(GetParam(), {20, 12}, {12, 8});
    CheckGeometry(GetParam(), {12, 20}, {24, 40});
    CheckGeometry(GetParam(), {16, 12}, {40, 24});
    CheckGeometry(GetParam(), {16, 12}, {24, 8});
    CheckGeometry(GetParam(), {16, 12}, {24, 28});
    CheckGeometry(GetParam(), {4, 4}, {60, 64});
    CheckGeometry(GetParam(), {60, 64}, {4, 4});
}

TEST_P(PipelineBounds, PitchesFarAboveTheWidthStayInsideTheirPlanes) {
    testkit::StdoutCapture capture;
    const Size size = {12, 8};
    CheckGeometry(GetParam(), size, size, Unwritten::refused, kLargePad);
    CheckGeometry(GetParam(), size, {20, 12}, Unwritten::refused, kLargePad);
    CheckGeometry(GetParam(), {16, 12}, {40, 24}, Unwritten::refused, kLargePad);
}

INSTANTIATE_TEST_SUITE_P(EveryConversion, PipelineBounds, testing::ValuesIn(kCodes),
                         testing::PrintToStringParamName());

// Pictures without pixels, on either side. Their planes exist, but every byte of them is out of
// bounds.
TEST_P(PipelineBounds, EmptyPicturesTouchNothing) {
    testkit::StdoutCapture capture;
    const Size full = {16, 12};
    for (const Size& empty : {Size{0, 0}, Size{0, 12}, Size{16, 0}}) {
        CheckGeometry(GetParam(), empty, empty);
        CheckGeometry(GetParam(), full, empty);
        CheckGeometry(GetParam(), empty, full, Unwritten::allowed);
    }
}

// With nothing to step along, an enlargement read in front of its line buffers.
TEST(PipelineBoundsEmptySource, IsNotEnlarged) {
    testkit::StdoutCapture capture;
    for (const uint32_t code : {0u, 3u, 5u}) {
        for (const Size& empty : {Size{0, 44}, Size{44, 0}, Size{0, 0}}) {
            const Processor p(Params(code, empty.w, empty.h, 48, 88));
            ASSERT_EQ(p.result, S_OK);
            Picture src(0, empty, Placement::end, 0, false);
            Picture dst(code & 255, {48, 88}, Placement::end, 0, false);
            for (auto& plane : dst.all())
                plane->Fill(0x5A);
            const QZ_IMAGEPROC_FRAME_PARAMS frame = {12, 0, 0};
            EXPECT_EQ(QZ_IMAGEPROC_ProcessFrame(p.handle(), src.planes.plane, src.planes.stride,
                                                dst.planes.plane, dst.planes.stride, &frame),
                      S_OK);
            for (auto& plane : dst.all()) {
                const std::vector<uint8_t> bytes = plane->bytes();
                EXPECT_TRUE(std::all_of(bytes.begin(), bytes.end(), [](uint8_t byte) {
                    return byte == 0x5A;
                })) << code;
            }
        }
    }
}

// 320 x 240 to 480 x 272 has kernels of its own.
TEST(PipelineBounds320To480, StaysInsideItsPlanes) {
    for (const uint32_t code : {3u, 5u}) {
        Bounds bounds(Params(code, 320, 240, 480, 272), Placement::end);
        bounds.Check(false);
    }
}

// A full picture height that is no multiple of the tile, and chroma planes of half of it.
TEST(PipelineBounds1080, TurnsStayInsideTheirPlanes) {
    for (const uint32_t code : {0u, 771u, 768u, 1280u}) {
        for (uint32_t rotation = 1; rotation <= 3; ++rotation) {
            QZ_IMAGEPROC_INIT_PARAMS params = Params(code, 64, 1080, 64, 1080);
            params.u32RotationType = rotation;
            SCOPED_TRACE(testing::Message() << code << ' ' << rotation);
            for (const Placement placement : {Placement::end, Placement::start}) {
                Bounds(params, placement).Check(false);
            }
        }
    }
}

// Turns take RGB by blocks of eight pixels; what is left of a row must come from inside it.
TEST(PipelineBoundsRgb, TurnsOfWidthsThatAreNoMultiplesOf8StayInsideTheirPlanes) {
    testkit::StdoutCapture capture;
    for (const uint32_t code : imageproc_test::kCodes) {
        const uint32_t from = code >> 8;
        if (from < QZ_IMAGEPROC_FMT_RGB565 || from == QZ_IMAGEPROC_FMT_NV12) continue;
        for (const uint32_t w : {4u, 12u, 28u, 44u, 60u}) {
            for (const uint32_t h : {4u, 12u, 20u})
                CheckGeometry(code, {w, h}, {w, h}, Unwritten::refused, kNoPad);
        }
    }
}

}  // namespace
