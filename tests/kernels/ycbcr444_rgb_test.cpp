#include "kernels/resize_model.h"
#include "kernels/rgb_model.h"

namespace {

using namespace kernel_test;

PlaneSizes Sizes444(int32_t w, int32_t h) {
    return {w, h, w, h};
}

uint32_t OutputFormat(Format format) {
    return format == Format::rgb565   ? QZ_IMAGEPROC_FMT_RGB565
           : format == Format::rgb888 ? QZ_IMAGEPROC_FMT_RGB888
                                      : QZ_IMAGEPROC_FMT_ARGB32;
}

int32_t Convert(Format format, QZ_IMAGEPROC_PARAMSET* p, const Source& src, const Resize& r) {
    switch (format) {
        case Format::rgb565:
            return _QZYCbCr444ToRGB565RszRot(p, src.planes, src.strides, r.w, r.h, r.dw, r.dh);
        case Format::rgb888:
            return _QZYCbCr444ToRGB888RszRot(p, src.planes, src.strides, r.w, r.h, r.dw, r.dh);
        default:
            return _QZYCbCr444ToARGB32RszRot(p, src.planes, src.strides, r.w, r.h, r.dw, r.dh,
                                             kAlpha);
    }
}

class RgbFrom444 : public testing::TestWithParam<std::tuple<Format, Placement>> {
  protected:
    Format format() const { return std::get<0>(GetParam()); }
    Placement placement() const { return std::get<1>(GetParam()); }
};

TEST_P(RgbFrom444, EveryPixelHasItsOwnChromaAtAnySizeAndTurn) {
    std::mt19937 random = testkit::Random(1);
    const int bytes = BytesOf(format());
    for (const Resize& r : kResizes) {
        for (uint32_t type = 0; type < 6; ++type) {
            SCOPED_TRACE(Describe(r) << ", type " << type);
            Processor p;
            p.UseRandomTables(random);
            Source src(random, Sizes444(r.w, r.h), {1, 0, 4}, placement());
            const bool quarter = IsQuarterTurn(type);
            const int32_t rowBytes = (quarter ? r.dh : r.dw) * bytes;
            const uint32_t stride = static_cast<uint32_t>(rowBytes + 6);
            // The half turn ends flush with the padded rows, so the last row has its padding.
            const bool flush = type == QZ_IMAGEPROC_ROTATE_180;
            Canvas dst(random, flush ? static_cast<int32_t>(stride) : rowBytes,
                       quarter ? r.dw : r.dh, stride, placement());
            for (int32_t y = 0; y < r.dh; ++y) {
                const Position row = PixelPosition(y, r.h, r.dh);
                for (int32_t x = 0; x < r.dw; ++x) {
                    const Position column = PixelPosition(x, r.w, r.dw);
                    const auto mean = [&](int i) {
                        return RoundedMean(column, row, SampleOf(src.plane[i]));
                    };
                    dst.ExpectAt(TurnedOffset(type, x, y, r.dw, r.dh, stride, bytes),
                                 ModelPixel(p, format(), mean(0), mean(1), mean(2)), bytes);
                }
            }
            QZ_ROTATION_WALKER walker;
            p.set.pWalker = &walker;
            p.set.u32CscType = QZ_IMAGEPROC_FMT_YCBCR444 << 8 | OutputFormat(format());
            p.set.u32RotationType = type;
            uint8_t* const planes[3] = {dst.data(), nullptr, nullptr};
            const int32_t strides[3] = {static_cast<int32_t>(stride), 0, 0};
            ASSERT_EQ(0, _QZ_RotationInit(&p.set, planes, r.dw, r.dh, strides));
            ASSERT_EQ(0, Convert(format(), &p.set, src, r));
            ASSERT_TRUE(dst.Check());
        }
    }
}

TEST_P(RgbFrom444, MissingPlanesTablesOrWalkerAreRefused) {
    std::mt19937 random = testkit::Random(2);
    for (int missing = 0; missing < 8; ++missing) {
        Processor p;
        Source src(random, Sizes444(4, 4), {}, placement());
        Canvas dst(random, 16, 4, 16, placement());
        p.UseWalker(PackedWalker(0, dst.data(), 4, 4, 16, BytesOf(format())));
        if (missing < 3) src.planes[missing] = nullptr;
        if (missing == 3) p.set.pTransLuma = nullptr;
        if (missing == 4) p.set.pTransCb = nullptr;
        if (missing == 5) p.set.pTransCr = nullptr;
        if (missing == 6) p.set.pWalker = nullptr;
        EXPECT_EQ(-1, Convert(format(), missing == 7 ? nullptr : &p.set, src, {4, 4, 4, 4}));
        EXPECT_TRUE(dst.Check());
    }
}

TEST_P(RgbFrom444, EmptySizesWriteNothing) {
    std::mt19937 random = testkit::Random(3);
    Processor p;
    Source src(random, Sizes444(4, 4), {}, placement());
    Canvas dst(random, 16, 4, 16, placement());
    p.UseWalker(PackedWalker(0, dst.data(), 4, 4, 16, BytesOf(format())));
    for (const Resize& r :
         {Resize{0, 4, 4, 4}, Resize{4, 0, 4, 4}, Resize{4, 4, 0, 4}, Resize{4, 4, 4, -1}}) {
        EXPECT_EQ(0, Convert(format(), &p.set, src, r));
    }
    EXPECT_TRUE(dst.Check());
}

INSTANTIATE_TEST_SUITE_P(Formats, RgbFrom444,
                         testing::Combine(testing::Values(Format::rgb565, Format::rgb888,
                                                          Format::argb32),
                                          testing::ValuesIn(kPlacements)));

}  // namespace
