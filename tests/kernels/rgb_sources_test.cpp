#include "kernels/resize_model.h"

namespace {

using namespace kernel_test;

/// A kernel of the family, its strides in pixels or bytes.
struct Conversion {
    const char* name;
    int32_t (*kernel)(const QZ_ROTATION_WALKER*, const void*, int32_t, int32_t, int32_t, int32_t,
                      int32_t);
    int fromBytes;
    int toBytes;
    int32_t strideUnit;  // bytes
};

constexpr Conversion kConversions[] = {
    {"RGB565", _QZRGB565RszRot, 2, 2, 2},
    {"RGB888", _QZRGB888RszRot, 3, 3, 1},
    {"RGB888ToRGB565", _QZRGB888ToRGB565RszRot, 3, 2, 1},
};

/// A source of packed pixels whose rows start a whole number of pixels apart where they must.
Plane MakeSource(std::mt19937& random, const Conversion& c, int32_t w, int32_t h, int32_t pad,
                 Placement placement) {
    const int32_t stride = w * c.fromBytes + pad * c.strideUnit;
    return Plane(random, w * c.fromBytes, h, static_cast<uint32_t>(stride), placement);
}

uint32_t Word(Plane& plane, int64_t x, int64_t y) {
    const int32_t at = static_cast<int32_t>(2 * x), row = static_cast<int32_t>(y);
    return plane.at(at, row) + 256u * plane.at(at + 1, row);
}

/// The RGB565 pixel at a position: each field's mean, rounded.
uint32_t Mean565(Plane& src, const Position& x, const Position& y) {
    const auto field = [&](uint32_t unit, uint32_t size) {
        return RoundedMean(x, y,
                           [&](int64_t sx, int64_t sy) {
                               return int64_t{Word(src, sx, sy) / unit % size};
                           }) *
               unit;
    };
    return field(1, 32) + field(32, 64) + field(2048, 32);
}

/// The RGB888 pixel at a position as a word, blue in the low byte.
uint32_t Mean888(Plane& src, const Position& x, const Position& y) {
    uint32_t pixel = 0;
    for (int64_t c = 2; c >= 0; --c) {
        pixel =
            pixel * 256 + RoundedMean(x, y, [&](int64_t sx, int64_t sy) {
                return int64_t{src.at(static_cast<int32_t>(3 * sx + c), static_cast<int32_t>(sy))};
            });
    }
    return pixel;
}

uint32_t Expected(const Conversion& c, Plane& src, const Position& x, const Position& y) {
    if (c.fromBytes == 2) return Mean565(src, x, y);
    const uint32_t pixel = Mean888(src, x, y);
    if (c.toBytes == 3) return pixel;
    return pixel % 256 / 8 + pixel / 256 % 256 / 4 * 32 + pixel / 65536 / 8 * 2048;
}

class RgbSources : public testing::TestWithParam<std::tuple<Conversion, Placement>> {
  protected:
    const Conversion& conversion() const { return std::get<0>(GetParam()); }
    Placement placement() const { return std::get<1>(GetParam()); }
    uint32_t outputFormat() const {
        return conversion().toBytes == 2 ? QZ_IMAGEPROC_FMT_RGB565 : QZ_IMAGEPROC_FMT_RGB888;
    }
};

TEST_P(RgbSources, EveryChannelIsTheRoundedMeanAtAnySizeAndTurn) {
    std::mt19937 random = testkit::Random(1);
    const Conversion& c = conversion();
    for (const Resize& r : kResizes) {
        for (uint32_t type = 0; type < 6; ++type) {
            SCOPED_TRACE(Describe(r) << ", type " << type);
            Plane src = MakeSource(random, c, r.w, r.h, 3, placement());
            const bool quarter = IsQuarterTurn(type);
            const int32_t rowBytes = (quarter ? r.dh : r.dw) * c.toBytes;
            const uint32_t stride = static_cast<uint32_t>(rowBytes + 10);
            const bool flush = type == QZ_IMAGEPROC_ROTATE_180;
            Canvas dst(random, flush ? static_cast<int32_t>(stride) : rowBytes,
                       quarter ? r.dw : r.dh, stride, placement());
            for (int32_t y = 0; y < r.dh; ++y) {
                for (int32_t x = 0; x < r.dw; ++x) {
                    dst.ExpectAt(
                        TurnedOffset(type, x, y, r.dw, r.dh, stride, c.toBytes),
                        Expected(c, src, PixelPosition(x, r.w, r.dw), PixelPosition(y, r.h, r.dh)),
                        c.toBytes);
                }
            }
            QZ_ROTATION_WALKER walker;
            QZ_IMAGEPROC_PARAMSET p{};
            p.pWalker = &walker;
            p.u32CscType = outputFormat();
            p.u32RotationType = type;
            uint8_t* const planes[3] = {dst.data(), nullptr, nullptr};
            const int32_t strides[3] = {static_cast<int32_t>(stride), 0, 0};
            ASSERT_EQ(0, _QZ_RotationInit(&p, planes, r.dw, r.dh, strides));
            const int32_t srcStride = static_cast<int32_t>(src.stride()) / c.strideUnit;
            ASSERT_EQ(0, c.kernel(&walker, src.data(), srcStride, r.w, r.h, r.dw, r.dh));
            ASSERT_TRUE(dst.Check());
        }
    }
}

TEST_P(RgbSources, AMissingSourceOrWalkerIsRefusedAndEmptySizesWriteNothing) {
    std::mt19937 random = testkit::Random(2);
    const Conversion& c = conversion();
    Plane src = MakeSource(random, c, 4, 4, 0, placement());
    const int32_t srcStride = 4 * c.fromBytes / c.strideUnit;
    Canvas dst(random, 4 * c.toBytes, 4, static_cast<uint32_t>(4 * c.toBytes), placement());
    const QZ_ROTATION_WALKER walker = PackedWalker(0, dst.data(), 4, 4, dst.stride(), c.toBytes);
    EXPECT_EQ(-1, c.kernel(nullptr, src.data(), srcStride, 4, 4, 4, 4));
    EXPECT_EQ(-1, c.kernel(&walker, nullptr, srcStride, 4, 4, 4, 4));
    for (const Resize& r :
         {Resize{0, 4, 4, 4}, Resize{4, 0, 4, 4}, Resize{4, 4, 0, 4}, Resize{4, 4, 4, -1}}) {
        EXPECT_EQ(0, c.kernel(&walker, src.data(), srcStride, r.w, r.h, r.dw, r.dh));
    }
    EXPECT_TRUE(dst.Check());
}

INSTANTIATE_TEST_SUITE_P(Kernels, RgbSources,
                         testing::Combine(testing::ValuesIn(kConversions),
                                          testing::ValuesIn(kPlacements)),
                         [](const auto& test) {
                             return std::string(std::get<0>(test.param).name) + '_' +
                                    PlacementName(std::get<1>(test.param));
                         });

class Rgb565ToArgb32 : public testing::TestWithParam<Placement> {};

TEST_P(Rgb565ToArgb32, FieldsGoToTheTopOfTheirBytesAndStridesCountPixels) {
    std::mt19937 random = testkit::Random(3);
    for (int32_t w : {1, 2, 3, 8, 33}) {
        for (int32_t h : {1, 2, 5}) {
            Plane src(random, 2 * w, h, static_cast<uint32_t>(2 * (w + 3)), GetParam());
            Canvas dst(random, 4 * w, h, static_cast<uint32_t>(4 * (w + 5)), GetParam());
            for (int32_t y = 0; y < h; ++y) {
                for (int32_t x = 0; x < w; ++x) {
                    const uint32_t word = Word(src, x, y);
                    dst.Expect(x, y,
                               word % 32 * 8 + word / 32 % 64 * 4 * 256 + word / 2048 * 8 * 65536 +
                                   0xABu * 16777216,
                               4);
                }
            }
            ASSERT_EQ(0, _QZRGB565ToARGB32(src.data(), w + 3, dst.data(), w + 5, w, h, 0xAB));
            ASSERT_TRUE(dst.Check()) << w << " x " << h;
        }
    }
}

TEST_P(Rgb565ToArgb32, EveryWordIsExpanded) {
    std::vector<uint16_t> words(65536);
    for (uint32_t i = 0; i < 65536; ++i) {
        words[i] = static_cast<uint16_t>(i);
    }
    std::vector<uint8_t> pixels(4 * 65536);
    ASSERT_EQ(0, _QZRGB565ToARGB32(words.data(), 65536, pixels.data(), 65536, 65536, 1, 255));
    for (uint32_t i = 0; i < 65536; ++i) {
        const uint8_t expected[] = {static_cast<uint8_t>(i % 32 * 8),
                                    static_cast<uint8_t>(i / 32 % 64 * 4),
                                    static_cast<uint8_t>(i / 2048 * 8), 255};
        ASSERT_EQ(0, std::memcmp(expected, &pixels[4 * i], 4)) << i;
    }
}

TEST_P(Rgb565ToArgb32, MissingPicturesAreRefusedAndEmptySizesWriteNothing) {
    std::mt19937 random = testkit::Random(4);
    Plane src(random, 8, 4, 8, GetParam());
    Canvas dst(random, 16, 4, 16, GetParam());
    EXPECT_EQ(-1, _QZRGB565ToARGB32(nullptr, 4, dst.data(), 4, 4, 4, 0));
    EXPECT_EQ(-1, _QZRGB565ToARGB32(src.data(), 4, nullptr, 4, 4, 4, 0));
    EXPECT_EQ(0, _QZRGB565ToARGB32(src.data(), 4, dst.data(), 4, 0, 4, 0));
    EXPECT_EQ(0, _QZRGB565ToARGB32(src.data(), 4, dst.data(), 4, 4, -1, 0));
    EXPECT_TRUE(dst.Check());
}

INSTANTIATE_TEST_SUITE_P(Guarded, Rgb565ToArgb32, testing::ValuesIn(kPlacements));

}  // namespace
