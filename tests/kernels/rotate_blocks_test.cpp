#include "kernels/planar_fixture.h"

namespace {

using namespace kernel_test;

using Kernel = int32_t (*)(const uint8_t*, int32_t, uint8_t*, int32_t, int32_t, int32_t);

struct Block {
    const char* name;
    Kernel kernel;
    uint32_t turn;
    int32_t bytes;  // a pixel
    int32_t tile;   // pixels
};

constexpr Block kBlocks[] = {
    {"90C_u8", QZ_ImageRotate_90C_u8, QZ_IMAGEPROC_ROTATE_90C, 1, 8},
    {"90AC_u8", QZ_ImageRotate_90AC_u8, QZ_IMAGEPROC_ROTATE_90AC, 1, 8},
    {"180_u8", QZ_ImageRotate_180_u8, QZ_IMAGEPROC_ROTATE_180, 1, 8},
    {"90C_u16", QZ_ImageRotate_90C_u16, QZ_IMAGEPROC_ROTATE_90C, 2, 8},
    {"90AC_u16", QZ_ImageRotate_90AC_u16, QZ_IMAGEPROC_ROTATE_90AC, 2, 8},
    {"90C_u32", QZ_ImageRotate_90C_u32, QZ_IMAGEPROC_ROTATE_90C, 4, 4},
    {"90AC_u32", QZ_ImageRotate_90AC_u32, QZ_IMAGEPROC_ROTATE_90AC, 4, 4},
};

int32_t RoundUp(int32_t size, int32_t tile) {
    return (size + tile - 1) / tile * tile;
}

class RotateBlocks : public testing::TestWithParam<std::tuple<Block, Placement>> {
  protected:
    const Block& block() const { return std::get<0>(GetParam()); }
    Placement placement() const { return std::get<1>(GetParam()); }
    bool quarter() const { return IsQuarterTurn(block().turn); }

    /// Turns w x h pixels and compares all of the destination's memory, tile by tile in the order
    /// stated, so that where overhang falls on visible pixels the later tile wins here too.
    void Check(int32_t w, int32_t h, uint32_t srcPad, uint32_t dstPad) {
        const int32_t tile = block().tile, bytes = block().bytes;
        const int32_t wide = RoundUp(w, tile), tall = RoundUp(h, tile);
        std::mt19937 random = testkit::Random(static_cast<uint32_t>(w * 1000 + h));
        Plane src(random, wide * bytes, tall, static_cast<uint32_t>(wide * bytes) + srcPad,
                  placement());

        // Room for the overhang on every side; where the size is whole tiles there is none.
        const int32_t columns = quarter() ? h : w, rows = quarter() ? w : h;
        const int32_t besides = quarter() ? tall - h : wide - w;
        const int32_t above = quarter() ? wide - w : tall - h;
        const int32_t rowBytes = (columns + 2 * besides) * bytes;
        Canvas dst(random, rowBytes, rows + 2 * above, static_cast<uint32_t>(rowBytes) + dstPad,
                   placement());
        for (int32_t ty = 0; ty < h; ty += tile) {
            for (int32_t tx = 0; tx < w; tx += tile) {
                for (int32_t i = 0; i < tile * tile; ++i) {
                    const int32_t x = tx + i % tile, y = ty + i / tile;
                    const Spot to = Turned(block().turn, {x, y}, w, h);
                    uint32_t pixel = 0;
                    std::memcpy(&pixel, &src.at(x * bytes, y), static_cast<size_t>(bytes));
                    dst.Expect(besides + to.x, above + to.y, pixel, bytes);
                }
            }
        }
        const int32_t stride = static_cast<int32_t>(dst.stride());
        ASSERT_EQ(0, block().kernel(src.data(), static_cast<int32_t>(src.stride()),
                                    dst.data() + above * stride + besides * bytes, stride, w, h));
        ASSERT_TRUE(dst.Check()) << w << " x " << h;
    }
};

TEST_P(RotateBlocks, WholeTilesTouchNothingOutsideTheTwoPlanes) {
    for (int32_t across : {1, 2, 3, 5}) {
        for (int32_t down : {1, 2, 4, 8, 9, 13}) {
            Check(across * block().tile, down * block().tile, 0, 0);
            Check(across * block().tile, down * block().tile, 3, 5);
        }
    }
}

TEST_P(RotateBlocks, PartOfATileIsTurnedAsAWholeOne) {
    for (int32_t w = 1; w <= 2 * block().tile + 1; ++w) {
        for (int32_t h = 1; h <= 2 * block().tile + 1; ++h) {
            Check(w, h, 1, 2);
        }
    }
}

TEST_P(RotateBlocks, PartOfATileBehindAStripOfRows) {
    for (int32_t w = 1; w <= block().tile + 1; ++w) {
        for (int32_t h : {15, 16, 17, 31, 32, 33, 40, 63, 64, 65, 100})
            Check(w, h, 1, 2);
    }
}

TEST_P(RotateBlocks, Width12TakesTheColumnsOfWholeTiles) {
    std::mt19937 random = testkit::Random(12);
    const int32_t tile = block().tile, bytes = block().bytes, turned = RoundUp(12, tile);
    Plane src(random, turned * bytes, tile, static_cast<uint32_t>(turned * bytes), placement());
    Canvas dst(random, 64, 32, 64, placement());
    std::memset(src.data(), 200, static_cast<size_t>(turned * tile * bytes));
    std::memset(dst.data(), 100, 64 * 32);
    ASSERT_EQ(0, block().kernel(src.data(), static_cast<int32_t>(src.stride()),
                                dst.data() + 16 * 64 + 16, 64, 12, tile));
    EXPECT_EQ(turned * tile * bytes, std::count(dst.data(), dst.data() + 64 * 32, 200));
}

TEST_P(RotateBlocks, WithoutPixelsNothingIsTouched) {
    std::mt19937 random = testkit::Random(13);
    Plane src(random, 64, 8, 64, placement());
    Canvas dst(random, 64, 16, 64, placement());
    for (const Spot& size : {Spot{0, 8}, Spot{8, 0}, Spot{-8, 8}}) {
        EXPECT_EQ(0, block().kernel(src.data(), 64, dst.data(), 64, size.x, size.y));
    }
    EXPECT_TRUE(dst.Check());
}

INSTANTIATE_TEST_SUITE_P(Kernels, RotateBlocks,
                         testing::Combine(testing::ValuesIn(kBlocks),
                                          testing::ValuesIn(kPlacements)),
                         [](const auto& test) {
                             return std::string(std::get<0>(test.param).name) + '_' +
                                    PlacementName(std::get<1>(test.param));
                         });

TEST(RotateBlocksByHand, SixteenByEightClockwise_FirstRowIsTheFirstColumnFromTheBottom) {
    uint8_t src[8][16], dst[16][8];
    for (int y = 0; y < 8; ++y) {
        for (int x = 0; x < 16; ++x) {
            src[y][x] = static_cast<uint8_t>(16 * y + x);
        }
    }
    ASSERT_EQ(0, QZ_ImageRotate_90C_u8(src[0], 16, dst[0], 8, 16, 8));
    const uint8_t firstRow[] = {112, 96, 80, 64, 48, 32, 16, 0};
    EXPECT_EQ(0, std::memcmp(firstRow, dst[0], sizeof firstRow));
    EXPECT_EQ(127, dst[15][0]);
}

TEST(RotateBlocksByHand, Width12WithBytesMovesSixteenColumns) {
    uint8_t src[8][16] = {}, dst[16][8] = {};
    for (int x = 0; x < 16; ++x) {
        src[7][x] = static_cast<uint8_t>(x + 1);
    }
    ASSERT_EQ(0, QZ_ImageRotate_90C_u8(src[0], 16, dst[0], 8, 12, 8));
    for (int x = 0; x < 16; ++x) {
        EXPECT_EQ(x + 1, dst[x][0]);
    }
}

}  // namespace
