#include "vidshow/kernels.h"

#include "kernels/plane_kit.h"

namespace {

using namespace testkit;

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

    /// What the kernel is to leave in `dst`.
    Bytes Expected(Picture& src, int32_t w, int32_t h, Plane& dst, int32_t cbStride,
                   int32_t crStride) const {
        Bytes expected = dst.bytes();
        for (int32_t y = 0; y < h; ++y) {
            for (int32_t x = 0; x < w; x += 2) {
                const size_t at = dst.Offset(2 * x, y);
                const auto place = [&](int where, uint8_t value) {
                    expected[at + static_cast<size_t>(where)] = value;
                };
                place(order().y0, src.planes[0].at(x, y));
                place(order().y1, src.planes[0].at(x + 1 < w ? x + 1 : x, y));
                place(order().cb, src.addresses[1][y / 2 * cbStride + x / 2]);
                place(order().cr, src.addresses[2][y / 2 * crStride + x / 2]);
            }
        }
        return expected;
    }
};

TEST_P(Packed422, PairsShareTheirChromaAndRowPairsTheirChromaRow) {
    std::mt19937 random = Random(1);
    for (int32_t w = 1; w <= 35; ++w) {
        for (int32_t h : {1, 2, 3, 6}) {
            // Chroma strides are multiples of 4; luma's has no such rule.
            const int32_t cw = (w + 1) / 2, ch = (h + 1) / 2;
            const int32_t pad = (4 - cw % 4) % 4;
            Picture src(Plane(w, h, 1, placement()), Plane(cw, ch, pad, placement()),
                        Plane(cw, ch, pad + 4, placement()));
            src.Fill(random);
            Plane dst(4 * cw, h, 3, placement());
            dst.Fill(random);
            const Bytes expected = Expected(src, w, h, dst, cw + pad, cw + pad + 4);
            ASSERT_EQ(0,
                      order().kernel(dst.data(), dst.stride(), src.addresses, src.strides, w, h));
            ASSERT_EQ(expected, dst.bytes()) << w << " x " << h;
        }
    }
}

TEST_P(Packed422, ChromaStridesAreRoundedDownToWholeWords) {
    std::mt19937 random = Random(2);
    for (uint32_t extra = 0; extra < 4; ++extra) {
        Picture src(Plane(8, 6, 1, placement()), Plane(4, 3, 0, placement()),
                    Plane(4, 3, 4, placement()));
        src.Fill(random);
        Plane dst(16, 6, 0, placement());
        const Bytes expected = Expected(src, 8, 6, dst, 4, 8);
        src.strides[1] += extra;
        src.strides[2] += extra;
        ASSERT_EQ(0, order().kernel(dst.data(), dst.stride(), src.addresses, src.strides, 8, 6));
        ASSERT_EQ(expected, dst.bytes()) << extra;
    }
}

TEST_P(Packed422, AnOddWidthEndsWithAWholePairThatRepeatsTheLastSample) {
    Picture src(Plane(3, 1, 0, placement()), Plane(2, 1, 2, placement()),
                Plane(2, 1, 2, placement()));
    const uint8_t luma[] = {10, 20, 30};
    std::memcpy(src.addresses[0], luma, sizeof luma);
    src.planes[1].at(0, 0) = 1, src.planes[1].at(1, 0) = 2;
    src.planes[2].at(0, 0) = 101, src.planes[2].at(1, 0) = 102;
    Plane dst(8, 1, 0, placement());
    ASSERT_EQ(0, order().kernel(dst.data(), 8, src.addresses, src.strides, 3, 1));
    EXPECT_EQ(30, dst.at(4 + order().y0, 0));
    EXPECT_EQ(30, dst.at(4 + order().y1, 0));
    EXPECT_EQ(2, dst.at(4 + order().cb, 0));
    EXPECT_EQ(102, dst.at(4 + order().cr, 0));
}

TEST_P(Packed422, AMissingPlaneIsRefused) {
    for (size_t missing = 0; missing < 4; ++missing) {
        Picture src = MakePicture420(8, 2, 0, placement());
        Plane dst(16, 2, 0, placement());
        const Bytes before = dst.Fill(77).bytes();
        if (missing < 3) src.addresses[missing] = nullptr;
        EXPECT_EQ(-1, order().kernel(missing == 3 ? nullptr : dst.data(), 16, src.addresses,
                                     src.strides, 8, 2));
        EXPECT_EQ(before, dst.bytes());
    }
}

TEST_P(Packed422, EmptySizesWriteNothing) {
    Picture src = MakePicture420(8, 2, 0, placement());
    Plane dst(16, 2, 0, placement());
    const Bytes before = dst.Fill(77).bytes();
    EXPECT_EQ(0, order().kernel(dst.data(), 16, src.addresses, src.strides, 0, 2));
    EXPECT_EQ(0, order().kernel(dst.data(), 16, src.addresses, src.strides, 8, 0));
    EXPECT_EQ(0, order().kernel(dst.data(), 16, src.addresses, src.strides, -1, 2));
    EXPECT_EQ(before, dst.bytes());
}

INSTANTIATE_TEST_SUITE_P(
    Orders, Packed422, testing::Combine(testing::ValuesIn(kOrders), testing::ValuesIn(kPlacements)),
    [](const auto& test) {
        return std::string(std::get<0>(test.param).name) + PlacementName(std::get<1>(test.param));
    });

}  // namespace
