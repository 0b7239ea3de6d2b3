#include "vidshow/kernels.h"

#include "kernels/plane_kit.h"

namespace {

using namespace testkit;

using Kernel = int32_t (*)(const uint8_t*, int32_t, uint8_t*, int32_t, int32_t, int32_t);

enum class Turn { clockwise, anticlockwise, half };

struct Block {
    const char* name;
    Kernel kernel;
    Turn turn;
    int32_t bytes;  // a pixel
    int32_t tile;   // pixels
};

constexpr Block kBlocks[] = {
    {"90C_u8", QZ_ImageRotate_90C_u8, Turn::clockwise, 1, 8},
    {"90AC_u8", QZ_ImageRotate_90AC_u8, Turn::anticlockwise, 1, 8},
    {"180_u8", QZ_ImageRotate_180_u8, Turn::half, 1, 8},
    {"90C_u16", QZ_ImageRotate_90C_u16, Turn::clockwise, 2, 8},
    {"90AC_u16", QZ_ImageRotate_90AC_u16, Turn::anticlockwise, 2, 8},
    {"90C_u32", QZ_ImageRotate_90C_u32, Turn::clockwise, 4, 4},
    {"90AC_u32", QZ_ImageRotate_90AC_u32, Turn::anticlockwise, 4, 4},
};

struct Spot {
    int32_t column, row;
};

Spot Destination(Turn turn, int32_t x, int32_t y, int32_t w, int32_t h) {
    switch (turn) {
        case Turn::clockwise:
            return {h - 1 - y, x};
        case Turn::anticlockwise:
            return {y, w - 1 - x};
        default:
            return {w - 1 - x, h - 1 - y};
    }
}

int32_t RoundUp(int32_t size, int32_t tile) {
    return (size + tile - 1) / tile * tile;
}

class RotateBlocks : public testing::TestWithParam<std::tuple<Block, Placement>> {
  protected:
    const Block& block() const { return std::get<0>(GetParam()); }
    Placement placement() const { return std::get<1>(GetParam()); }
    bool quarter() const { return block().turn != Turn::half; }

    /// Turns w x h pixels and compares all of the destination's memory, tile by tile in the order
    /// stated, so that where overhang falls on visible pixels the later tile wins here too.
    void Check(int32_t w, int32_t h, int32_t srcPad, int32_t dstPad) {
        const int32_t tile = block().tile, bytes = block().bytes;
        const int32_t wide = RoundUp(w, tile), tall = RoundUp(h, tile);
        std::mt19937 random = Random(static_cast<uint32_t>(w * 1000 + h));
        Plane src(wide * bytes, tall, srcPad, placement());
        src.Fill(random);

        // Room for the overhang on every side; where the size is whole tiles there is none.
        const int32_t columns = quarter() ? h : w, rows = quarter() ? w : h;
        const int32_t besides = quarter() ? tall - h : wide - w;
        const int32_t above = quarter() ? wide - w : tall - h;
        Plane dst((columns + 2 * besides) * bytes, rows + 2 * above, dstPad, placement());
        dst.Fill(random);
        const size_t origin = dst.Offset(besides * bytes, above);

        Bytes expected = dst.bytes();
        for (int32_t ty = 0; ty < h; ty += tile) {
            for (int32_t tx = 0; tx < w; tx += tile) {
                for (int32_t i = 0; i < tile * tile; ++i) {
                    const int32_t x = tx + i % tile, y = ty + i / tile;
                    const Spot to = Destination(block().turn, x, y, w, h);
                    std::memcpy(
                        &expected[dst.Offset((besides + to.column) * bytes, above + to.row)],
                        &src.at(x * bytes, y), static_cast<size_t>(bytes));
                }
            }
        }
        ASSERT_EQ(0, block().kernel(src.data(), static_cast<int32_t>(src.stride()),
                                    dst.data() + origin, static_cast<int32_t>(dst.stride()), w, h));
        ASSERT_EQ(expected, dst.bytes()) << w << " x " << h;
    }
};

TEST_P(RotateBlocks, WholeTilesTouchNothingOutsideTheTwoPlanes) {
    for (int32_t across : {1, 2, 3, 5}) {
        for (int32_t down : {1, 2, 4}) {
            Check(across * block().tile, down * block().tile, 0, 0);
            Check(across * block().tile, down * block().tile, 3, 5);
        }
    }
}

TEST_P(RotateBlocks, PartOfATileIsTurnedAsAWholeOne) {
    for (int32_t w = 1; w <= 2 * block().tile + 1; ++w) {
        for (int32_t h = 1; h <= 2 * block().tile + 1; ++h)
            Check(w, h, 1, 2);
    }
}

TEST_P(RotateBlocks, Width12TakesTheColumnsOfWholeTiles) {
    const int32_t tile = block().tile, bytes = block().bytes, turned = RoundUp(12, tile);
    Plane src(turned * bytes, tile, 0, placement());
    src.Fill(200);
    Plane dst((quarter() ? tile : 2 * turned) * bytes, 2 * turned, 0, placement());
    dst.Fill(100);
    ASSERT_EQ(0, block().kernel(src.data(), static_cast<int32_t>(src.stride()),
                                dst.data() + dst.Offset(quarter() ? 0 : 8 * bytes, turned),
                                static_cast<int32_t>(dst.stride()), 12, tile));
    int32_t written = 0;
    for (uint8_t byte : dst.bytes())
        written += byte == 200;
    EXPECT_EQ(turned * tile * bytes, written);
}

TEST_P(RotateBlocks, WithoutPixelsNothingIsTouched) {
    Plane src(64, 8, 0, placement()), dst(64, 16, 0, placement());
    const Bytes before = dst.Fill(9).bytes();
    EXPECT_EQ(0, block().kernel(src.data(), 64, dst.data(), 64, 0, 8));
    EXPECT_EQ(0, block().kernel(src.data(), 64, dst.data(), 64, 8, 0));
    EXPECT_EQ(0, block().kernel(src.data(), 64, dst.data(), 64, -8, 8));
    EXPECT_EQ(before, dst.bytes());
}

INSTANTIATE_TEST_SUITE_P(Kernels, RotateBlocks,
                         testing::Combine(testing::ValuesIn(kBlocks),
                                          testing::ValuesIn(kPlacements)),
                         [](const auto& test) {
                             return std::string(std::get<0>(test.param).name) +
                                    PlacementName(std::get<1>(test.param));
                         });

TEST(RotateBlocksByHand, SixteenByEightClockwise_FirstRowIsTheFirstColumnFromTheBottom) {
    Plane src(16, 8), dst(8, 16);
    for (int32_t y = 0; y < 8; ++y) {
        for (int32_t x = 0; x < 16; ++x)
            src.at(x, y) = static_cast<uint8_t>(16 * y + x);
    }
    ASSERT_EQ(0, QZ_ImageRotate_90C_u8(src.data(), 16, dst.data(), 8, 16, 8));
    const uint8_t firstRow[] = {112, 96, 80, 64, 48, 32, 16, 0};
    EXPECT_EQ(0, std::memcmp(firstRow, dst.data(), sizeof firstRow));
    EXPECT_EQ(127, dst.at(0, 15));
}

TEST(RotateBlocksByHand, Width12WithBytesReadsSixteenColumns) {
    Plane src(16, 8), dst(8, 16);
    for (int32_t x = 0; x < 16; ++x)
        src.at(x, 7) = static_cast<uint8_t>(x);
    ASSERT_EQ(0, QZ_ImageRotate_90C_u8(src.data(), 16, dst.data(), 8, 12, 8));
    for (int32_t x = 0; x < 16; ++x)
        EXPECT_EQ(x, dst.at(0, x));
}

}  // namespace
