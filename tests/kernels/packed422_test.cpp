#include "kernels/planar_fixture.h"

namespace {

using namespace kernel_test;

using Kernel = int32_t (*)(void*, uint32_t, uint8_t* const[3], const uint32_t[3], int32_t, int32_t);

/// A kernel and where the samples of a pair of pixels lie in its four bytes.
struct Order {
    const char* name;
    Kernel kernel;
    int y0, cb, y1, cr;
};

constexpr Order kOrders[] = {
    {"YUY2", _QZYCbCr420ToYUY2, 0, 1, 2, 3},
    {"UYVY", _QZYCbCr420ToUYVY, 1, 0, 3, 2},
};

class Packed422 : public testing::TestWithParam<std::tuple<Order, Placement>> {
  protected:
    const Order& order() const { return std::get<0>(GetParam()); }
    Placement placement() const { return std::get<1>(GetParam()); }

    static uint32_t At(int place, uint8_t sample) {
        return static_cast<uint32_t>(sample) << (8 * place);
    }

    void Expect(Source& src, int32_t w, int32_t h, Canvas& dst) const {
        for (int32_t y = 0; y < h; ++y) {
            for (int32_t x = 0; x < w; x += 2) {
                const uint8_t y0 = src.plane[0].at(x, y);
                const uint8_t y1 = x + 1 < w ? src.plane[0].at(x + 1, y) : y0;
                dst.Expect(x / 2, y,
                           At(order().y0, y0) | At(order().y1, y1) |
                               At(order().cb, src.plane[1].at(x / 2, y / 2)) |
                               At(order().cr, src.plane[2].at(x / 2, y / 2)),
                           4);
            }
        }
    }
};

TEST_P(Packed422, PairsShareTheirChromaAndRowPairsTheirChromaRow) {
    std::mt19937 random = testkit::Random(1);
    for (int32_t w = 1; w <= 35; ++w) {
        for (int32_t h : {1, 2, 3, 6}) {
            // Chroma strides are multiples of 4; luma's has no such rule.
            const PlaneSizes size = Sizes420(w, h);
            const uint32_t toWord = static_cast<uint32_t>(-size.cw) % 4;
            Source src(random, size, {1, toWord, toWord + 4}, placement());
            Canvas dst(random, 4 * size.cw, h, static_cast<uint32_t>(4 * size.cw + 3), placement());
            Expect(src, w, h, dst);
            ASSERT_EQ(0, order().kernel(dst.data(), dst.stride(), src.planes, src.strides, w, h));
            ASSERT_TRUE(dst.Check()) << w << " x " << h;
        }
    }
}

TEST_P(Packed422, ChromaStridesAreRoundedDownToWholeWords) {
    std::mt19937 random = testkit::Random(2);
    for (uint32_t extra = 0; extra < 4; ++extra) {
        Source src(random, Sizes420(8, 6), {1, 0, 4}, placement());
        Canvas dst(random, 16, 6, 16, placement());
        Expect(src, 8, 6, dst);
        src.strides[1] += extra;
        src.strides[2] += extra;
        ASSERT_EQ(0, order().kernel(dst.data(), dst.stride(), src.planes, src.strides, 8, 6));
        ASSERT_TRUE(dst.Check()) << extra;
    }
}

TEST_P(Packed422, AnOddWidthEndsWithAWholePairThatRepeatsTheLastSample) {
    std::mt19937 random = testkit::Random(3);
    Source src(random, Sizes420(3, 1), {}, placement());
    src.plane[0].at(2, 0) = 30;
    src.plane[1].at(1, 0) = 2;
    src.plane[2].at(1, 0) = 102;
    Canvas dst(random, 8, 1, 8, placement());
    ASSERT_EQ(0, order().kernel(dst.data(), 8, src.planes, src.strides, 3, 1));
    const uint8_t* pair = dst.data() + 4;
    EXPECT_EQ(30, pair[order().y0]);
    EXPECT_EQ(30, pair[order().y1]);
    EXPECT_EQ(2, pair[order().cb]);
    EXPECT_EQ(102, pair[order().cr]);
}

TEST_P(Packed422, AMissingPlaneIsRefused) {
    std::mt19937 random = testkit::Random(4);
    for (int missing = 0; missing < 4; ++missing) {
        Source src(random, Sizes420(8, 2), {}, placement());
        Canvas dst(random, 16, 2, 16, placement());
        if (missing < 3) src.planes[missing] = nullptr;
        EXPECT_EQ(-1, order().kernel(missing == 3 ? nullptr : dst.data(), 16, src.planes,
                                     src.strides, 8, 2));
        EXPECT_TRUE(dst.Check());
    }
}

TEST_P(Packed422, EmptySizesWriteNothing) {
    std::mt19937 random = testkit::Random(5);
    Source src(random, Sizes420(8, 2), {}, placement());
    Canvas dst(random, 16, 2, 16, placement());
    for (const Spot& size : {Spot{0, 2}, Spot{8, 0}, Spot{-1, 2}}) {
        EXPECT_EQ(0, order().kernel(dst.data(), 16, src.planes, src.strides, size.x, size.y));
    }
    EXPECT_TRUE(dst.Check());
}

INSTANTIATE_TEST_SUITE_P(Orders, Packed422,
                         testing::Combine(testing::ValuesIn(kOrders),
                                          testing::ValuesIn(kPlacements)),
                         [](const auto& test) {
                             return std::string(std::get<0>(test.param).name) + '_' +
                                    PlacementName(std::get<1>(test.param));
                         });

}  // namespace
