#include "kernels/planar_fixture.h"

namespace {

using namespace kernel_test;

/// A processor, as far as the walker's set-up looks at one.
struct Turning {
    Turning(uint32_t outputFormat, uint32_t rotation) {
        processor.u32CscType = 0x500 | outputFormat;
        processor.u32RotationType = rotation;
        processor.pWalker = &walker;
        for (intptr_t& word : walker.word)
            word = kUntouched;
    }
    static constexpr intptr_t kUntouched = 0x5A5A5A5A;
    QZ_ROTATION_WALKER walker;
    QZ_IMAGEPROC_PARAMSET processor = {};
};

struct Size {
    int32_t w, h;
};
constexpr Size kSizes[] = {{1, 1}, {2, 2}, {4, 2}, {3, 5}, {100, 50}, {48, 64}, {1920, 1080}};

struct Packed {
    uint32_t format;
    int32_t pixel;  // bytes
};
constexpr Packed kPacked[] = {{QZ_IMAGEPROC_FMT_RGB565, 2}, {QZ_IMAGEPROC_FMT_RGB888, 3},
                              {QZ_IMAGEPROC_FMT_ARGB32, 4}, {QZ_IMAGEPROC_FMT_YUY2, 2},
                              {QZ_IMAGEPROC_FMT_UYVY, 2},   {QZ_IMAGEPROC_FMT_NV12, 2},
                              {QZ_IMAGEPROC_FMT_RGB5551, 2}};

class RotationTypes : public testing::TestWithParam<uint32_t> {
  protected:
    void CheckPacked(const Packed& packed, Size size, int32_t stride);
    void CheckPlane(const QZ_ROTATION_WALKER& walker, int steps, int start, const uint8_t* plane,
                    int32_t stride, int32_t w, int32_t h);
    static uint8_t s_memory[16];  // only its address is used
};
uint8_t RotationTypes::s_memory[16];

void RotationTypes::CheckPacked(const Packed& packed, Size size, int32_t stride) {
    Turning turning(packed.format, GetParam());
    uint8_t* const dst[3] = {s_memory, nullptr, nullptr};
    const int32_t strides[3] = {stride, 0, 0};
    ASSERT_EQ(0, _QZ_RotationInit(&turning.processor, dst, size.w, size.h, strides));
    const auto address = [&](int32_t x, int32_t y) {
        const Spot to = Turned(GetParam(), {x, y}, size.w, size.h);
        intptr_t at = reinterpret_cast<intptr_t>(s_memory) + to.y * stride + to.x * packed.pixel;
        // A half turn ends flush with the padded rows, not with the visible ones.
        if (GetParam() == QZ_IMAGEPROC_ROTATE_180) at += stride - size.w * packed.pixel;
        return at;
    };
    const intptr_t* word = turning.walker.word;
    EXPECT_EQ(address(2, 0) - address(0, 0), word[0]);
    EXPECT_EQ(address(0, 2) - address(0, 0), word[1]);
    EXPECT_EQ(address(0, 0), word[2]);
    EXPECT_EQ(address(1, 0), word[3]);
    EXPECT_EQ(address(0, 1), word[4]);
    EXPECT_EQ(address(1, 1), word[5]);
}

TEST_P(RotationTypes, PackedWalkerGoesWhereTheTurnPutsThePixels) {
    for (const Packed& packed : kPacked) {
        for (const Size& size : kSizes) {
            for (int32_t pad : {0, 2, 156}) {
                SCOPED_TRACE(testing::Message() << "format " << packed.format << ", " << size.w
                                                << " x " << size.h << ", pad " << pad);
                const bool quarter = IsQuarterTurn(GetParam());
                CheckPacked(packed, size, (quarter ? size.h : size.w) * packed.pixel + pad);
            }
        }
    }
}

void RotationTypes::CheckPlane(const QZ_ROTATION_WALKER& walker, int steps, int start,
                               const uint8_t* plane, int32_t stride, int32_t w, int32_t h) {
    const auto address = [&](int32_t x, int32_t y) {
        const Spot to = Turned(GetParam(), {x, y}, w, h);
        return reinterpret_cast<intptr_t>(plane) + to.y * stride + to.x;
    };
    EXPECT_EQ(address(1, 0) - address(0, 0), walker.word[steps]);
    EXPECT_EQ(address(0, 1) - address(0, 0), walker.word[steps + 1]);
    EXPECT_EQ(address(0, 0), walker.word[start]);
}

TEST_P(RotationTypes, PlanarWalkerTurnsEachPlaneAlone) {
    for (const Size& size : kSizes) {
        SCOPED_TRACE(testing::Message() << size.w << " x " << size.h);
        Turning turning(QZ_IMAGEPROC_FMT_YCBCR420, GetParam());
        uint8_t* const dst[3] = {s_memory, s_memory + 5, s_memory + 9};
        const int32_t strides[3] = {2000, 1003, 1100};
        ASSERT_EQ(0, _QZ_RotationInit(&turning.processor, dst, size.w, size.h, strides));
        CheckPlane(turning.walker, 0, 10, dst[0], strides[0], size.w, size.h);
        CheckPlane(turning.walker, 6, 11, dst[1], strides[1], size.w / 2, size.h / 2);
        CheckPlane(turning.walker, 8, 12, dst[2], strides[2], size.w / 2, size.h / 2);
    }
}

TEST_P(RotationTypes, PlanarWalkerKeepsWordsTwoToFive) {
    Turning turning(QZ_IMAGEPROC_FMT_YCBCR420, GetParam());
    uint8_t* const dst[3] = {s_memory, s_memory, s_memory};
    const int32_t strides[3] = {64, 32, 32};
    ASSERT_EQ(0, _QZ_RotationInit(&turning.processor, dst, 64, 32, strides));
    for (int i = 2; i <= 5; ++i)
        EXPECT_EQ(Turning::kUntouched, turning.walker.word[i]);
}

INSTANTIATE_TEST_SUITE_P(All, RotationTypes, testing::Range(0u, 6u));

TEST(RotationWalker, PackedHalfTurn100x50Stride256StartsTwoBytesBeforeRow50) {
    Turning turning(QZ_IMAGEPROC_FMT_RGB565, QZ_IMAGEPROC_ROTATE_180);
    uint8_t memory[1];
    uint8_t* const dst[3] = {memory, nullptr, nullptr};
    const int32_t strides[3] = {256, 0, 0};
    ASSERT_EQ(0, _QZ_RotationInit(&turning.processor, dst, 100, 50, strides));
    EXPECT_EQ(256 * 50 - 2, turning.walker.word[2] - reinterpret_cast<intptr_t>(memory));
}

TEST(RotationWalker, OutputFormats422444AndAbgr32AreRefused) {
    uint8_t memory[1];
    uint8_t* const dst[3] = {memory, memory, memory};
    const int32_t strides[3] = {64, 64, 64};
    for (uint32_t format : {1u, 2u, 9u, 11u, 255u}) {
        Turning turning(format, QZ_IMAGEPROC_ROTATE_NONE);
        EXPECT_EQ(-3, _QZ_RotationInit(&turning.processor, dst, 8, 8, strides)) << format;
        for (intptr_t word : turning.walker.word)
            EXPECT_EQ(Turning::kUntouched, word);
    }
}

TEST(RotationWalker, TypesAboveFiveAreRefused) {
    uint8_t memory[1];
    uint8_t* const dst[3] = {memory, memory, memory};
    const int32_t strides[3] = {64, 64, 64};
    for (uint32_t format : {0u, 3u}) {
        for (uint32_t type : {6u, 7u, 0xFFFFFFFFu}) {
            Turning turning(format, type);
            EXPECT_EQ(-3, _QZ_RotationInit(&turning.processor, dst, 8, 8, strides));
        }
    }
}

TEST(RotationWalker, AMissingProcessorOrWalkerComesFirst) {
    uint8_t* const dst[3] = {};
    const int32_t strides[3] = {};
    EXPECT_EQ(-1, _QZ_RotationInit(nullptr, dst, 8, 8, strides));
    Turning turning(QZ_IMAGEPROC_FMT_YCBCR444, 9);
    turning.processor.pWalker = nullptr;
    EXPECT_EQ(-1, _QZ_RotationInit(&turning.processor, dst, 8, 8, strides));
}

}  // namespace
