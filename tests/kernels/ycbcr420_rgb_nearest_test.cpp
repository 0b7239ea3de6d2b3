// Nearest enlargement, plain and from doubled lines, against the source position of each pixel.

#include "kernels/line_buffer_model.h"

namespace {

using namespace kernel_test;

using Run = int32_t (*)(QZ_IMAGEPROC_PARAMSET*, uint32_t* const[4], uint8_t* const[3],
                        const uint32_t[3], int32_t, int32_t, void*, uint32_t, int32_t, int32_t);

uint32_t NearestPixel(Processor& p, Picture420& s, const Resize& r, int32_t x, int32_t y) {
    const int32_t column = x * r.w / r.dw, row = y * r.h / r.dh;
    return ModelPixel(p, Format::rgb565, s.y.at(column, row), s.cb.at(column / 2, row / 2),
                      s.cr.at(column / 2, row / 2));
}

uint32_t NearLinearPixel(Processor& p, Picture420& s, const Resize& r, int32_t x, int32_t y) {
    const int32_t half = x * 2 * r.w / r.dw, row = y * r.h / r.dh;
    const ModelLine line = ModelRow(p, s, r.w, row, row / 2);
    const size_t i = static_cast<size_t>(half) / 2;
    if (half % 2 == 1) return PackSum(Format::rgb565, line[i], 1);
    return PackSum(Format::rgb565, Weigh(line[i == 0 ? 0 : i - 1], 1, line[i], 1), 2);
}

struct Kernel {
    const char* name;
    Run run;
    uint32_t (*model)(Processor&, Picture420&, const Resize&, int32_t x, int32_t y);
};

const Kernel kKernels[] = {
    {"_QZYCbCr420ToRGB565RszUp_Nearest", _QZYCbCr420ToRGB565RszUp_Nearest, NearestPixel},
    {"_QZYCbCr420ToRGB565RszUp_NearLinear", _QZYCbCr420ToRGB565RszUp_NearLinear, NearLinearPixel},
};

const Resize kResizes[] = {
    {2, 1, 2, 1},   {2, 2, 2, 2},    {2, 2, 4, 4},   {4, 4, 6, 5},    {4, 3, 8, 7},
    {6, 5, 10, 5},  {8, 6, 20, 13},  {16, 5, 18, 6}, {10, 7, 34, 40}, {32, 2, 40, 9},
    {4, 30, 8, 71}, {4, 16, 4, 100}, {12, 9, 8, 4},  {8, 20, 20, 3},
};

void Check(const Kernel& kernel, const Resize& r, Padding pad, uint32_t strideExtra, uint32_t lead,
           Placement placement, std::mt19937& random) {
    SCOPED_TRACE(testing::Message() << kernel.name << ' ' << r);
    const uint32_t stride = static_cast<uint32_t>(r.dw * 2 + 3) / 4 * 4 + 8;
    Processor p;
    p.UseRandomTables(random);
    p.UseLines(std::max(r.w, r.dw));
    Picture420 s(random, r.w, r.h, pad, placement);
    Canvas canvas(random, r.dw * 2, r.dh, stride, placement, lead);
    for (int32_t y = 0; y < r.dh; ++y) {
        for (int32_t x = 0; x < r.dw; ++x)
            canvas.Expect(x, y, kernel.model(p, s, r, x, y), 2);
    }
    EXPECT_EQ(kernel.run(&p.set, p.set.pLines, s.planes, s.strides, r.w, r.h, canvas.data(),
                         stride + strideExtra, r.dw, r.dh),
              0);
    EXPECT_TRUE(canvas.Check());
}

TEST(RszUpNearest, EveryPixelFromItsTruncatedPosition) {
    auto random = testkit::Random(70);
    for (const Kernel& kernel : kKernels) {
        for (const Resize& r : kResizes) {
            for (Placement placement : kPlacements) {
                Check(kernel, r, {0, 0, 0}, 0, 0, placement, random);
                Check(kernel, r, {3, 5, 8}, 0, 1, placement, random);
            }
        }
    }
}

TEST(RszUpNearest, OutputStrideIsRoundedDownToFour) {
    auto random = testkit::Random(71);
    for (const Kernel& kernel : kKernels) {
        for (uint32_t extra = 1; extra < 4; ++extra) {
            Check(kernel, {4, 4, 8, 6}, {}, extra, 0, Placement::end, random);
        }
    }
}

TEST(RszUpNearest, SingleRepeatedSourceRowGivesEqualRowsByteForByte) {
    auto random = testkit::Random(72);
    for (const Kernel& kernel : kKernels) {
        Processor p;
        p.UseRandomTables(random);
        p.UseLines(12);
        Picture420 s(random, 6, 1, {}, Placement::end);
        GuardedBuffer out(24 * 5);
        ASSERT_EQ(
            kernel.run(&p.set, p.set.pLines, s.planes, s.strides, 6, 1, out.data(), 24, 12, 5), 0);
        for (size_t y = 1; y < 5; ++y) {
            EXPECT_EQ(std::memcmp(out.data(), out.data() + y * 24, 24), 0) << kernel.name;
        }
    }
}

// The pick leaves an odd last pixel out; the copy takes the whole width, that pixel included.
TEST(RszUpNearest, RepeatedRowIsCopiedNotPickedAgain) {
    auto random = testkit::Random(73);
    for (const Kernel& kernel : kKernels) {
        Processor p;
        p.UseRandomTables(random);
        p.UseLines(4);
        Picture420 s(random, 2, 1, {}, Placement::end);
        uint16_t out[2][4] = {{1, 2, 0xABCD, 4}, {5, 6, 7, 8}};
        ASSERT_EQ(kernel.run(&p.set, p.set.pLines, s.planes, s.strides, 2, 1, out, 8, 3, 2), 0);
        EXPECT_EQ(out[0][2], 0xABCD) << kernel.name;
        EXPECT_EQ(out[1][2], 0xABCD) << kernel.name;
        EXPECT_EQ(out[1][3], 8) << kernel.name;
    }
}

TEST(RszUpNearest, WithoutLineBuffersGivesMinusOne) {
    auto random = testkit::Random(74);
    for (const Kernel& kernel : kKernels) {
        Processor p;
        Picture420 s(random, 2, 2, {}, Placement::end);
        Canvas canvas(random, 8, 4, 8, Placement::end);
        const auto run = [&](uint32_t* const lines[4], int32_t h, int32_t dh) {
            return kernel.run(&p.set, lines, s.planes, s.strides, 2, h, canvas.data(), 8, 4, dh);
        };
        EXPECT_EQ(run(nullptr, 2, 4), -1) << kernel.name;
        EXPECT_EQ(run(p.set.pLines, 2, 4), -1) << kernel.name;
        EXPECT_EQ(run(nullptr, 0, 4), 0) << kernel.name;
        EXPECT_EQ(run(nullptr, 2, 0), 0) << kernel.name;
        EXPECT_TRUE(canvas.Check()) << kernel.name;
    }
}

// The plain pick wants no more than the first two line buffers.
TEST(RszUpNearest, UsesTheFirstTwoLineBuffers) {
    auto random = testkit::Random(75);
    Processor p;
    p.UseRandomTables(random);
    p.UseLines(4);
    uint32_t* const lines[4] = {p.set.pLines[0], p.set.pLines[1], nullptr, nullptr};
    const Resize r{4, 4, 4, 8};
    Picture420 s(random, r.w, r.h, {}, Placement::end);
    Canvas canvas(random, 8, 8, 8, Placement::end);
    for (int32_t y = 0; y < r.dh; ++y) {
        for (int32_t x = 0; x < r.dw; ++x)
            canvas.Expect(x, y, NearestPixel(p, s, r, x, y), 2);
    }
    EXPECT_EQ(_QZYCbCr420ToRGB565RszUp_Nearest(&p.set, lines, s.planes, s.strides, r.w, r.h,
                                               canvas.data(), 8, r.dw, r.dh),
              0);
    EXPECT_TRUE(canvas.Check());
}

}  // namespace
