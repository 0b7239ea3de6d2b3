// Source rows into line buffers: spread pixels, RGB565 pixels, doubled lines.

#include "kernels/spread_model.h"

namespace {

using namespace kernel_test;

uint32_t SpreadWord(Processor& p, uint8_t y, uint8_t cb, uint8_t cr) {
    return Join(ModelSpread(p, y, cb, cr));
}

/// Runs a line converter on guarded rows of every small width and compares both lines.
template <class Pixel, class Run, class Model>
void CheckConverter(uint32_t salt, Run run, Model model) {
    auto random = testkit::Random(salt);
    for (int32_t w : {2, 4, 6, 8, 30, 66}) {
        for (Placement placement : kPlacements) {
            SCOPED_TRACE(w);
            Processor p;
            p.UseRandomTables(random);
            Picture420 s(random, w, 2, {7, 0, 0}, placement);
            GuardedBuffer upper(static_cast<size_t>(w) * sizeof(Pixel), placement);
            GuardedBuffer lower(static_cast<size_t>(w) * sizeof(Pixel), placement);
            Pixel* lines[2] = {static_cast<Pixel*>(static_cast<void*>(upper.data())),
                               static_cast<Pixel*>(static_cast<void*>(lower.data()))};
            EXPECT_EQ(run(&p.set, s, lines[0], lines[1], w), 0);
            for (int32_t i = 0; i < 2 * w; ++i) {
                const int32_t x = i / 2, y = i % 2;
                ASSERT_EQ(lines[y][x], model(p, s.y.at(x, y), s.cb.at(x / 2, 0), s.cr.at(x / 2, 0)))
                    << x << ", " << y;
            }
        }
    }
}

TEST(Convert, TwoRowsToSpreadPixels) {
    CheckConverter<uint32_t>(
        50,
        [](QZ_IMAGEPROC_PARAMSET* p, Picture420& s, uint32_t* upper, uint32_t* lower, int32_t w) {
            return Convert(p, s.planes[0], s.planes[0] + s.strides[0], s.planes[1], s.planes[2],
                           upper, lower, w);
        },
        SpreadWord);
}

TEST(Convert565, TwoRowsToRgb565) {
    CheckConverter<uint16_t>(
        51,
        [](QZ_IMAGEPROC_PARAMSET* p, Picture420& s, uint16_t* upper, uint16_t* lower, int32_t w) {
            return Convert_565(p, s.planes[0], s.planes[0] + s.strides[0], s.planes[1], s.planes[2],
                               upper, lower, w);
        },
        [](Processor& p, uint8_t y, uint8_t cb, uint8_t cr) {
            return ModelPixel(p, Format::rgb565, y, cb, cr);
        });
}

TEST(Convert, SpreadPixelsKeepTheirGapsEmpty) {
    auto random = testkit::Random(52);
    Processor p;
    p.UseRandomTables(random);
    Picture420 s(random, 512, 2, {}, Placement::end);
    std::vector<uint32_t> upper(512), lower(512);
    Convert(&p.set, s.planes[0], s.planes[0] + 512, s.planes[1], s.planes[2], upper.data(),
            lower.data(), 512);
    for (size_t i = 0; i < 512; ++i) {
        EXPECT_EQ(upper[i] & 0x07E0FC1F, upper[i]);
        EXPECT_EQ(lower[i] & 0x07E0FC1F, lower[i]);
    }
}

TEST(ConvertBlock, TopLeftTopRightBottomLeftBottomRight) {
    auto random = testkit::Random(53);
    for (int round = 0; round < 64; ++round) {
        Processor p;
        p.UseRandomTables(random);
        GuardedBuffer upper(2), lower(2), out(16);
        testkit::FillSamples(random, upper.data(), 2);
        testkit::FillSamples(random, lower.data(), 2);
        const uint8_t cb = static_cast<uint8_t>(random()), cr = static_cast<uint8_t>(random());
        auto* pixels = static_cast<uint32_t*>(static_cast<void*>(out.data()));
        ASSERT_EQ(_convert(&p.set, upper.data(), lower.data(), cb, cr, pixels), 0);
        EXPECT_EQ(pixels[0], SpreadWord(p, upper[0], cb, cr));
        EXPECT_EQ(pixels[1], SpreadWord(p, upper[1], cb, cr));
        EXPECT_EQ(pixels[2], SpreadWord(p, lower[0], cb, cr));
        EXPECT_EQ(pixels[3], SpreadWord(p, lower[1], cb, cr));
    }
}

TEST(DoubleLine, AveragesWithThePixelBeforeAndRepeatsThePixel) {
    auto random = testkit::Random(54);
    for (int32_t w : {0, 1, 2, 3, 4, 9, 32}) {
        for (Placement placement : kPlacements) {
            GuardedBuffer line(static_cast<size_t>(w) * 4, placement);
            auto* spread = static_cast<uint32_t*>(static_cast<void*>(line.data()));
            for (int32_t i = 0; i < w; ++i)
                spread[i] = random() & 0x07E0FC1F;
            GuardedBuffer out(static_cast<size_t>(w) * 4, placement);
            ASSERT_EQ(DoubleLine(spread, static_cast<uint16_t*>(static_cast<void*>(out.data())), w),
                      0);
            for (int32_t i = 0; i < w; ++i) {
                const Channels before = Split(spread[i == 0 ? 0 : i - 1]);
                const Channels pixel = Split(spread[i]);
                const uint32_t average = PackSum(Format::rgb565, Weigh(before, 1, pixel, 1), 2);
                const uint32_t same = PackSum(Format::rgb565, pixel, 1);
                uint16_t pair[2];
                std::memcpy(pair, out.data() + 4 * i, 4);
                ASSERT_EQ(pair[0], average) << i;
                ASSERT_EQ(pair[1], same) << i;
            }
        }
    }
}

}  // namespace
