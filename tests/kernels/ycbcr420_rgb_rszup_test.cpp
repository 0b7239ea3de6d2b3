// Line-buffer enlargements, straight and turned, against the formula for each output pixel.

#include "kernels/line_buffer_model.h"

namespace {

using namespace kernel_test;

struct Kernel {
    const char* name;
    Format format;
    int32_t (*run)(Processor&, uint32_t* const lines[4], Picture420&, const Resize&, Canvas&);
};

const Kernel kKernels[] = {
    {"_QZYCbCr420ToRGB565RszUp", Format::rgb565,
     [](Processor& p, uint32_t* const lines[4], Picture420& s, const Resize& r, Canvas& c) {
         return _QZYCbCr420ToRGB565RszUp(&p.set, lines, s.planes, s.strides, r.w, r.h, c.data(),
                                         c.stride(), r.dw, r.dh);
     }},
    {"_QZYCbCr420ToRGB888RszUp", Format::rgb888,
     [](Processor& p, uint32_t* const lines[4], Picture420& s, const Resize& r, Canvas& c) {
         return _QZYCbCr420ToRGB888RszUp(&p.set, lines, s.planes, s.strides, r.w, r.h, c.data(),
                                         c.stride(), r.dw, r.dh);
     }},
    {"_QZYCbCr420ToARGB32RszUp", Format::argb32,
     [](Processor& p, uint32_t* const lines[4], Picture420& s, const Resize& r, Canvas& c) {
         return _QZYCbCr420ToARGB32RszUp(&p.set, lines, s.planes, s.strides, r.w, r.h, c.data(),
                                         c.stride(), r.dw, r.dh, kAlpha);
     }},
};

const Resize kResizes[] = {
    {2, 1, 2, 2},   {2, 2, 2, 2},    {2, 2, 4, 4},    {4, 2, 6, 3},     {4, 3, 8, 5},
    {6, 4, 10, 7},  {4, 4, 4, 4},    {8, 5, 20, 13},  {16, 12, 36, 30}, {10, 7, 64, 41},
    {32, 8, 40, 9}, {4, 30, 8, 100}, {12, 20, 16, 7}, {4, 4, 8, 2},     {6, 13, 6, 5},
};

void CheckStraight(const Kernel& kernel, const Resize& r, Padding pad, uint32_t strideExtra,
                   uint32_t lead, Placement placement, std::mt19937& random) {
    SCOPED_TRACE(testing::Message() << kernel.name << ' ' << r);
    const int bytes = BytesOf(kernel.format);
    const uint32_t stride = static_cast<uint32_t>(r.dw * bytes + 3) / 4 * 4;
    Processor p;
    p.UseRandomTables(random);
    p.UseLines(std::max(r.w, r.dw));
    Picture420 s(random, r.w, r.h, pad, placement);
    Canvas canvas(random, r.dw * bytes, r.dh, stride, placement, lead);
    const std::vector<ModelLine> rows = CornerRows(p, s, r);
    for (int32_t y = 0; y < r.dh; ++y) {
        for (int32_t x = 0; x < r.dw; ++x) {
            canvas.Expect(
                x, y,
                BilinearAt(kernel.format, rows[static_cast<size_t>(y)], ModelStep(r.w, r.dw), x),
                bytes);
        }
    }
    canvas.PassStride(stride + strideExtra);
    EXPECT_EQ(kernel.run(p, p.set.pLines, s, r, canvas), 0);
    EXPECT_TRUE(canvas.Check());
}

TEST(RszUp, EveryFormatFollowsTheFormula) {
    auto random = testkit::Random(60);
    for (const Kernel& kernel : kKernels) {
        for (const Resize& r : kResizes) {
            for (Placement placement : kPlacements) {
                CheckStraight(kernel, r, {0, 0, 0}, 0, 0, placement, random);
                CheckStraight(kernel, r, {5, 3, 9}, 0, 1, placement, random);
            }
        }
    }
}

// Clients that pass an odd stride get rows at whole words.
TEST(RszUp, OutputStrideIsRoundedDownToFour) {
    auto random = testkit::Random(61);
    for (const Kernel& kernel : kKernels) {
        for (uint32_t extra = 1; extra < 4; ++extra) {
            CheckStraight(kernel, {4, 4, 8, 6}, {}, extra, 0, Placement::end, random);
        }
    }
}

TEST(RszUp, WithoutLineBuffersGivesMinusOne) {
    auto random = testkit::Random(62);
    for (const Kernel& kernel : kKernels) {
        Processor p;
        Picture420 s(random, 2, 2, {}, Placement::end);
        Canvas canvas(random, 16, 4, 16, Placement::end);
        EXPECT_EQ(kernel.run(p, nullptr, s, {2, 2, 4, 4}, canvas), -1) << kernel.name;
        EXPECT_EQ(kernel.run(p, p.set.pLines, s, {2, 2, 4, 4}, canvas), -1) << kernel.name;
        EXPECT_TRUE(canvas.Check()) << kernel.name;
    }
}

TEST(RszUp, HeightBelowOneWritesNothing) {
    auto random = testkit::Random(63);
    for (const Kernel& kernel : kKernels) {
        Processor p;
        p.UseLines(4);
        Picture420 s(random, 2, 0, {}, Placement::end);
        Canvas canvas(random, 16, 4, 16, Placement::end);
        EXPECT_EQ(kernel.run(p, p.set.pLines, s, {2, 0, 4, 4}, canvas), 0) << kernel.name;
        EXPECT_EQ(kernel.run(p, p.set.pLines, s, {2, 2, 4, 0}, canvas), 0) << kernel.name;
        EXPECT_EQ(kernel.run(p, nullptr, s, {2, -1, 4, -3}, canvas), 0) << kernel.name;
        EXPECT_TRUE(canvas.Check()) << kernel.name;
    }
}

TEST(RszUpRot, EveryTypeWritesWhereTheStepsLead) {
    auto random = testkit::Random(64);
    for (uint32_t type = 0; type <= 5; ++type) {
        for (const Resize& r : kResizes) {
            for (uint32_t pad : {0u, 6u}) {
                SCOPED_TRACE(testing::Message() << "type " << type << ' ' << r);
                const bool quarter =
                    type == QZ_IMAGEPROC_ROTATE_90AC || type == QZ_IMAGEPROC_ROTATE_90C;
                const int32_t columns = quarter ? r.dh : r.dw;
                const uint32_t stride = static_cast<uint32_t>(columns * 2) + pad;
                Processor p;
                p.UseRandomTables(random);
                p.UseLines(std::max(r.w, r.dw));
                Picture420 s(random, r.w, r.h, {pad, 0, 2 * pad}, Placement::end);
                const bool flush = type == QZ_IMAGEPROC_ROTATE_180;
                Canvas canvas(random, flush ? static_cast<int32_t>(stride) : columns * 2,
                              quarter ? r.dw : r.dh, stride, Placement::end);
                const auto offset = [&](int32_t x, int32_t y) {
                    return TurnedOffset(type, x, y, r.dw, r.dh, stride, 2);
                };
                const std::vector<ModelLine> rows = CornerRows(p, s, r);
                for (int32_t y = 0; y < r.dh; ++y) {
                    for (int32_t x = 0; x < r.dw; ++x) {
                        canvas.ExpectAt(offset(x, y),
                                        BilinearAt(Format::rgb565, rows[static_cast<size_t>(y)],
                                                   ModelStep(r.w, r.dw), x),
                                        2);
                    }
                }
                EXPECT_EQ(_QZYCbCr420ToRGB565RszUpRot(
                              &p.set, p.set.pLines, s.planes, s.strides, r.w, r.h,
                              canvas.data() + offset(0, 0),
                              static_cast<int32_t>(offset(0, 1) - offset(0, 0)),
                              static_cast<int32_t>(offset(1, 0) - offset(0, 0)), r.dw, r.dh),
                          0);
                EXPECT_TRUE(canvas.Check());
            }
        }
    }
}

TEST(RszUpRot, WithoutLineBuffersOrStartGivesMinusOne) {
    auto random = testkit::Random(65);
    Processor p;
    Picture420 s(random, 2, 2, {}, Placement::end);
    uint16_t out[4];
    const auto run = [&](uint32_t* const lines[4], void* start, int32_t h) {
        return _QZYCbCr420ToRGB565RszUpRot(&p.set, lines, s.planes, s.strides, 2, h, start, 4, 2, 2,
                                           2);
    };
    EXPECT_EQ(run(nullptr, out, 2), -1);
    EXPECT_EQ(run(p.set.pLines, out, 2), -1);
    p.UseLines(2);
    EXPECT_EQ(run(p.set.pLines, nullptr, 2), -1);
    EXPECT_EQ(run(nullptr, nullptr, 0), 0);
}

}  // namespace
