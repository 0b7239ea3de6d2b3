// Deinterlacing in front of a conversion: which picture the kernel gets, and that no byte outside
// the processor's image is touched, whatever the pitches.

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <vector>

#include "imageproc/support.h"
#include "kernels/deinterlace_model.h"

namespace {

using imageproc_test::Params;
using imageproc_test::Processor;
using namespace deinterlace_test;
using Placement = GuardedBuffer::Placement;

constexpr uint32_t kModes[] = {1, 2, 3, 4, 5, 6, 7, 9};

/// Source planes of `lines` whole pitches each, between unmapped pages.
struct Planes {
    Planes(std::mt19937& random, const uint32_t pitch[3], const int lines[3], Placement placement) {
        for (int i = 0; i < 3; ++i) {
            memory[i] = std::make_unique<GuardedBuffer>(pitch[i] * static_cast<size_t>(lines[i]),
                                                        placement, uint8_t{0xEE});
            plane[i] = memory[i]->data();
            stride[i] = pitch[i];
            testkit::FillSamples(random, plane[i], memory[i]->size());
        }
    }
    std::unique_ptr<GuardedBuffer> memory[3];
    uint8_t* plane[3];
    uint32_t stride[3];
};

/// Lines of a plane that the frame's model makes of source planes.
class Expected {
  public:
    Expected(const Planes& src, const Planes& dst, const Request& r, const int lines[3]) {
        std::vector<uint8_t> memory;
        Layout from, to;
        const auto add = [&](const Planes& p, Layout& layout) {
            for (int i = 0; i < 3; ++i) {
                layout.plane[i] = memory.size();
                layout.pitch[i] = p.stride[i];
                memory.insert(memory.end(), p.plane[i],
                              p.plane[i] + p.stride[i] * static_cast<size_t>(lines[i]));
            }
        };
        add(src, from);
        add(dst, to);
        Model model(memory, from, to, r);
        model.run();
        for (int i = 0; i < 3; ++i) {
            const auto start = model.bytes.begin() + static_cast<ptrdiff_t>(to.plane[i]);
            plane[i].assign(start, start + static_cast<ptrdiff_t>(to.pitch[i]) *
                                               static_cast<ptrdiff_t>(lines[i]));
        }
    }
    std::vector<uint8_t> plane[3];
};

QZ_IMAGEPROC_PARAMSET Record(int chroma, int w, int h, uint32_t mode) {
    QZ_IMAGEPROC_PARAMSET p = {};
    p.u32CscType = static_cast<uint32_t>(chroma) << 8;
    p.u32InWidth = static_cast<uint32_t>(w);
    p.u32InHeight = static_cast<uint32_t>(h);
    p.u32DeinterlaceMode = mode;
    return p;
}

TEST(DeinterlaceFrame, TouchesNothingOutsideThePlanesWhateverThePitch) {
    std::mt19937 random = testkit::Random(3480);
    for (const Placement placement : {Placement::end, Placement::start}) {
        for (int chroma = 0; chroma <= 2; ++chroma) {
            for (const int w : {4, 12, 16, 52}) {
                for (const int h : {2, 4, 12}) {
                    // Below, equal to, above and far above the image's stride.
                    for (const uint32_t pad : {0u, 3u, 12u, 16u, 200u}) {
                        const bool half = chroma < 2;
                        const uint32_t stride = static_cast<uint32_t>((w + 15) / 16 * 16);
                        const uint32_t chromaWidth = static_cast<uint32_t>(half ? w / 2 : w);
                        const uint32_t from[3] = {static_cast<uint32_t>(w) + pad, chromaWidth + pad,
                                                  chromaWidth + pad};
                        const uint32_t to[3] = {stride, stride, stride};
                        const int lines[3] = {h, chroma == 0 ? h / 2 : h, chroma == 0 ? h / 2 : h};
                        for (const uint32_t mode : {1u, 2u, 3u, 4u, 5u, 6u}) {
                            Planes src(random, from, lines, placement);
                            Planes dst(random, to, lines, placement);
                            const Request r = {static_cast<Mode>(mode), chroma, w, h, 0, true};
                            const Expected expected(src, dst, r, lines);
                            QZ_IMAGEPROC_PARAMSET p = Record(chroma, w, h, mode);
                            ASSERT_EQ(QZ_DeInterlace(&p, src.plane, src.stride, dst.plane, to), 0);
                            for (int i = 0; i < 3; ++i) {
                                ASSERT_TRUE(std::equal(expected.plane[i].begin(),
                                                       expected.plane[i].end(), dst.plane[i]))
                                    << r << " plane " << i << " pad " << pad;
                            }
                        }
                    }
                }
            }
        }
    }
}

TEST(DeinterlaceFrame, EverySampleOfTheImageIsMade) {
    std::mt19937 random = testkit::Random(3481);
    const uint32_t pitch[3] = {60, 60, 60}, to[3] = {64, 64, 64};
    for (int chroma = 0; chroma <= 2; ++chroma) {
        const int lines[3] = {12, chroma == 0 ? 6 : 12, chroma == 0 ? 6 : 12};
        const size_t width[3] = {52, chroma < 2 ? 26u : 52u, chroma < 2 ? 26u : 52u};
        for (const uint32_t mode : kModes) {
            Planes src(random, pitch, lines, Placement::end),
                one(random, to, lines, Placement::end), two(random, to, lines, Placement::end);
            QZ_IMAGEPROC_PARAMSET p = Record(chroma, 52, 12, mode);
            QZ_DeInterlace(&p, src.plane, src.stride, one.plane, to);
            QZ_DeInterlace(&p, src.plane, src.stride, two.plane, to);
            for (int i = 0; i < 3; ++i) {
                for (int y = 0; y < lines[i]; ++y) {
                    ASSERT_TRUE(std::equal(one.plane[i] + 64 * y, one.plane[i] + 64 * y + width[i],
                                           two.plane[i] + 64 * y))
                        << "format " << chroma << " mode " << mode << " plane " << i << " line "
                        << y;
                }
            }
        }
    }
}

TEST(DeinterlaceFrame, OtherInputFormatsAreRefused) {
    uint8_t byte[64] = {};
    uint8_t* planes[3] = {byte, byte, byte};
    const uint32_t strides[3] = {4, 4, 4};
    for (int format = 3; format <= 10; ++format) {
        QZ_IMAGEPROC_PARAMSET p = Record(format, 4, 4, 1);
        EXPECT_EQ(QZ_DeInterlace(&p, planes, strides, planes, strides), -1) << format;
        p.u32DeinterlaceMode = 0;
        EXPECT_EQ(QZ_DeInterlace(&p, planes, strides, planes, strides), -1) << format;
    }
}

TEST(DeinterlaceFrame, Mode0CopiesNothing) {
    uint8_t in[64] = {1}, out[64] = {};
    uint8_t* src[3] = {in, in, in};
    uint8_t* dst[3] = {out, out, out};
    const uint32_t strides[3] = {4, 4, 4};
    QZ_IMAGEPROC_PARAMSET p = Record(0, 4, 4, 0);
    EXPECT_EQ(QZ_DeInterlace(&p, src, strides, dst, strides), 0);
    EXPECT_EQ(out[0], 0);
}

TEST(DeinterlaceFrame, FieldsOf444PassThroughWhereAModeSkipsThem) {
    std::mt19937 random = testkit::Random(3482);
    const uint32_t pitch[3] = {16, 16, 16};
    const int lines[3] = {8, 8, 8};
    for (const uint32_t mode : {2u, 3u, 4u, 5u}) {
        Planes src(random, pitch, lines, Placement::end), dst(random, pitch, lines, Placement::end);
        QZ_IMAGEPROC_PARAMSET p = Record(2, 16, 8, mode);
        EXPECT_EQ(QZ_DeInterlace(&p, src.plane, src.stride, dst.plane, pitch), 0);
        for (int i = 0; i < 3; ++i)
            EXPECT_TRUE(std::equal(src.plane[i], src.plane[i] + 128, dst.plane[i])) << mode;
    }
}

// ---- whole frames
// --------------------------------------------------------------------------------

class DeinterlacedFrame : public testing::Test {
  protected:
    static constexpr uint32_t kW = 52, kH = 24, kPitch = 64;

    DeinterlacedFrame() : out(3 * kPitch * kH, 0) {
        std::mt19937 random = testkit::Random(3483);
        in.resize(3 * kPitch * kH);
        testkit::FillSamples(random, in.data(), in.size());
    }

    HRESULT run(const Processor& p, uint32_t mode) {
        uint8_t* src[3] = {&in[0], &in[kPitch * kH], &in[2 * kPitch * kH]};
        uint8_t* dst[3] = {&out[0], &out[kPitch * kH], &out[2 * kPitch * kH]};
        const uint32_t stride[3] = {kPitch, kPitch, kPitch};
        const QZ_IMAGEPROC_FRAME_PARAMS frame = {12, 1, mode};
        return QZ_IMAGEPROC_ProcessFrame(p.handle(), src, stride, dst, stride, &frame);
    }

    std::vector<uint8_t> in, out;
};

TEST_F(DeinterlacedFrame, TheKernelReadsTheImage) {
    for (const uint32_t mode : kModes) {
        const Processor p(Params(0, kW, kH, kW, kH));
        ASSERT_EQ(run(p, mode), 0) << mode;
        for (uint32_t plane = 0; plane < 3; ++plane) {
            const uint32_t w = plane ? kW / 2 : kW, h = plane ? kH / 2 : kH;
            for (uint32_t y = 0; y < h; ++y) {
                const uint8_t* const image =
                    p->pDeinterlacePlanes[plane] + y * p->u32DeinterlaceStride;
                const uint8_t* const made = &out[(plane * kH + y) * kPitch];
                ASSERT_TRUE(std::equal(image, image + w, made)) << mode << " plane " << plane;
            }
        }
        EXPECT_FALSE(std::equal(out.begin(), out.begin() + kPitch * 2, in.begin()) && mode != 6 &&
                     mode != 7)
            << mode;
    }
}

TEST_F(DeinterlacedFrame, TheModeStaysForFramesThatAskForNone) {
    const Processor p(Params(0, kW, kH, kW, kH));
    ASSERT_EQ(run(p, 2), 0);
    const std::vector<uint8_t> discarded = out;
    std::fill(out.begin(), out.end(), uint8_t{0});
    ASSERT_EQ(run(p, 0), 0);
    EXPECT_EQ(out, discarded);
    ASSERT_EQ(run(p, 4), 0);
    EXPECT_NE(out, discarded);
}

TEST_F(DeinterlacedFrame, WithoutAModeTheSourceIsConverted) {
    const Processor p(Params(0, kW, kH, kW, kH));
    ASSERT_EQ(run(p, 0), 0);
    for (uint32_t y = 0; y < kH; ++y)
        ASSERT_TRUE(std::equal(&in[y * kPitch], &in[y * kPitch] + kW, &out[y * kPitch]));
}

TEST_F(DeinterlacedFrame, FastWithAWidthOf6StillSucceeds) {
    const Processor p(Params(0, 8, 8, 8, 8));
    p->u32InWidth = 6;
    EXPECT_EQ(picture_deinterlace_fast(nullptr, nullptr, 0, 6, 8), -1);
    std::fill(p->pDeinterlacePlanes[0], p->pDeinterlacePlanes[0] + 128, uint8_t{0x55});
    EXPECT_EQ(run(p, 1), 0);
    EXPECT_EQ(out[0], 0x55) << "what the image held before";
}

TEST_F(DeinterlacedFrame, ARefusalEndsTheFrame) {
    const Processor p(Params(768, 16, 16, 16, 16));
    p->u32DeinterlaceMode = 1;  // never stored for this input
    EXPECT_EQ(run(p, 0), 15);
    EXPECT_EQ(out[0], 0);
}

TEST_F(DeinterlacedFrame, ModesReachOtherConversions) {
    for (const uint32_t code : {3u, 259u, 515u}) {
        const Processor p(Params(code, 16, 16, 16, 16));
        ASSERT_EQ(run(p, 0), 0);
        const std::vector<uint8_t> plain = out;
        ASSERT_EQ(run(p, 6), 0) << code;
        EXPECT_NE(out, plain) << code;
    }
}

}  // namespace
