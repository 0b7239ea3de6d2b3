// On-the-fly resize, straight and turned, against the formula for each output pixel.

#include "kernels/rgb_model.h"

namespace {

using namespace kernel_test;

struct Size {
    int32_t w, h;
};

struct StraightKernel {
    const char* name;
    Format format;
    int32_t (*run)(Processor&, Picture420&, Size from, Canvas&, Size to);
};

const StraightKernel kStraight[] = {
    {"_QZYCbCr420ToRGB565Rsz", Format::rgb565,
     [](Processor& p, Picture420& s, Size from, Canvas& c, Size to) {
         return _QZYCbCr420ToRGB565Rsz(&p.set, s.planes, s.strides, from.w, from.h, c.data(),
                                       c.stride(), to.w, to.h);
     }},
    {"_QZYCbCr420ToRGB888Rsz", Format::rgb888,
     [](Processor& p, Picture420& s, Size from, Canvas& c, Size to) {
         return _QZYCbCr420ToRGB888Rsz(&p.set, s.planes, s.strides, from.w, from.h, c.data(),
                                       c.stride(), to.w, to.h);
     }},
    {"_QZYCbCr420ToARGB32Rsz", Format::argb32,
     [](Processor& p, Picture420& s, Size from, Canvas& c, Size to) {
         return _QZYCbCr420ToARGB32Rsz(&p.set, s.planes, s.strides, from.w, from.h, c.data(),
                                       c.stride(), to.w, to.h, kAlpha);
     }},
};

struct TurnedKernel {
    const char* name;
    Format format;
    int32_t (*run)(Processor&, Picture420&, Size from, Size to);
};

const TurnedKernel kTurned[] = {
    {"_QZYCbCr420ToRGB565RszRot", Format::rgb565,
     [](Processor& p, Picture420& s, Size from, Size to) {
         return _QZYCbCr420ToRGB565RszRot(&p.set, s.planes, s.strides, from.w, from.h, to.w, to.h);
     }},
    {"_QZYCbCr420ToRGB888RszRot", Format::rgb888,
     [](Processor& p, Picture420& s, Size from, Size to) {
         return _QZYCbCr420ToRGB888RszRot(&p.set, s.planes, s.strides, from.w, from.h, to.w, to.h);
     }},
    {"_QZYCbCr420ToARGB32RszRot", Format::argb32,
     [](Processor& p, Picture420& s, Size from, Size to) {
         return _QZYCbCr420ToARGB32RszRot(&p.set, s.planes, s.strides, from.w, from.h, to.w, to.h,
                                          kAlpha);
     }},
};

/// Where output `i` of `to` lies between `from` source pixels.
struct Position {
    int64_t index, below, weight;
};

Position ModelPosition(int64_t i, int64_t from, int64_t to) {
    const int64_t step = (from - 1) * 65536 / (to - 1);
    const int64_t p = i * step;
    const int64_t index = std::min(p / 65536, from - 1);
    return {index, std::min(index + 1, from - 1), p % 65536 / 2048};
}

int64_t ModelBlend(int64_t a, int64_t b, int64_t weight, int64_t unit) {
    return FloorDivide(a * 32 + weight * (b - a), unit);
}

uint32_t ModelResized(Processor& p, Format format, Picture420& s, Size from, Size to, int32_t x,
                      int32_t y) {
    const auto sample = [&](int64_t column, int64_t row) {
        return s.y.at(static_cast<int32_t>(column), static_cast<int32_t>(row));
    };
    const Position px = ModelPosition(x, from.w, to.w), py = ModelPosition(y, from.h, to.h);
    const auto column = [&](int64_t at) {
        return ModelBlend(sample(at, py.index), sample(at, py.below), py.weight, 16);
    };
    const int64_t luma = ModelBlend(column(px.index), column(px.below), px.weight, 64) % 256;
    const auto chroma = [](int32_t at, int32_t n, int32_t m) {
        const int64_t first = ModelPosition(at / 2 * 2, n, m).index;
        const int64_t second = ModelPosition(at / 2 * 2 + 1, n, m).index;
        return static_cast<int32_t>((first + second + 1) / 4);
    };
    const int32_t cx = chroma(x, from.w, to.w), cy = chroma(y, from.h, to.h);
    return ModelPixel(p, format, static_cast<uint8_t>(luma), s.cb.at(cx, cy), s.cr.at(cx, cy));
}

Size WholeBlocks(Size size) {
    return {(size.w + 1) / 2 * 2, (size.h + 1) / 2 * 2};
}

void CheckStraight(const StraightKernel& kernel, Size from, Size to, Padding pad, uint32_t lead,
                   Placement placement, std::mt19937& random) {
    SCOPED_TRACE(testing::Message() << kernel.name << ' ' << from.w << " x " << from.h << " to "
                                    << to.w << " x " << to.h << ", padding " << pad[0]);
    const int bytes = BytesOf(kernel.format);
    const Size whole = WholeBlocks(to);
    Processor p;
    p.UseRandomTables(random);
    Picture420 s(random, from.w, from.h, pad, placement);
    Canvas canvas(random, whole.w * bytes, whole.h, static_cast<uint32_t>(whole.w * bytes) + pad[0],
                  placement, lead);
    for (int32_t y = 0; y < whole.h; ++y) {
        for (int32_t x = 0; x < whole.w; ++x) {
            canvas.Expect(x, y, ModelResized(p, kernel.format, s, from, to, x, y), bytes);
        }
    }
    EXPECT_EQ(kernel.run(p, s, from, canvas, to), 0);
    EXPECT_TRUE(canvas.Check());
}

void CheckTurned(const TurnedKernel& kernel, uint32_t type, Size from, Size to, uint32_t pad,
                 std::mt19937& random) {
    SCOPED_TRACE(testing::Message() << kernel.name << " type " << type << ' ' << from.w << " x "
                                    << from.h << " to " << to.w << " x " << to.h);
    const bool quarter = type == QZ_IMAGEPROC_ROTATE_90AC || type == QZ_IMAGEPROC_ROTATE_90C;
    const int bytes = BytesOf(kernel.format);
    const int32_t columns = quarter ? to.h : to.w;
    const uint32_t stride = static_cast<uint32_t>(columns * bytes) + pad;
    Processor p;
    p.UseRandomTables(random);
    Picture420 s(random, from.w, from.h, {pad, 2 * pad, 3 * pad}, Placement::end);
    const int32_t rowBytes =
        type == QZ_IMAGEPROC_ROTATE_180 ? static_cast<int32_t>(stride) : columns * bytes;
    Canvas canvas(random, rowBytes, quarter ? to.w : to.h, stride, Placement::end);
    p.UseWalker(PackedWalker(type, canvas.data(), to.w, to.h, stride, bytes));
    for (int32_t y = 0; y < to.h; ++y) {
        for (int32_t x = 0; x < to.w; ++x) {
            canvas.ExpectAt(TurnedOffset(type, x, y, to.w, to.h, stride, bytes),
                            ModelResized(p, kernel.format, s, from, to, x, y), bytes);
        }
    }
    EXPECT_EQ(kernel.run(p, s, from, to), 0);
    EXPECT_TRUE(canvas.Check());
}

TEST(YCbCr420ToRgbRsz, EveryPairOfSmallSizes) {
    auto random = testkit::Random(20);
    for (const StraightKernel& kernel : kStraight) {
        for (int32_t from = 1; from <= 7; ++from) {
            for (int32_t to = 2; to <= 12; ++to) {
                const int32_t other = 2 + (from * 5 + to) % 9;
                for (Placement placement : kPlacements) {
                    CheckStraight(kernel, {from, other}, {to, 4}, {0, 0, 0}, 0, placement, random);
                    CheckStraight(kernel, {other, from}, {6, to}, {0, 0, 0}, 0, placement, random);
                }
            }
        }
    }
}

TEST(YCbCr420ToRgbRsz, LargerAndSmallerWithThreeStrides) {
    auto random = testkit::Random(21);
    const Size sizes[][2] = {{{16, 12}, {40, 24}}, {{40, 24}, {16, 12}}, {{33, 21}, {64, 8}},
                             {{8, 30}, {50, 10}},  {{100, 6}, {20, 30}}, {{31, 17}, {15, 9}}};
    for (const StraightKernel& kernel : kStraight) {
        for (const auto& size : sizes) {
            for (uint32_t lead = 0; lead < 4; ++lead) {
                CheckStraight(kernel, size[0], size[1], {1 + lead, 3, 7}, lead, Placement::start,
                              random);
            }
        }
    }
}

TEST(YCbCr420ToRgbRsz, ExtremeSamplesAndWeights) {
    auto random = testkit::Random(22);
    for (const StraightKernel& kernel : kStraight) {
        // Small steps run through all the weights; rows and columns jump between 0 and 255.
        for (Size from : {Size{3, 3}, Size{5, 5}}) {
            const Size to{66, 66};
            Processor p;
            p.UseRealTables();
            Picture420 s(random, from.w, from.h, {}, Placement::end);
            for (int32_t y = 0; y < from.h; ++y) {
                for (int32_t x = 0; x < from.w; ++x)
                    s.y.at(x, y) = (x + y) % 2 ? 255 : 0;
            }
            Canvas canvas(random, 66 * BytesOf(kernel.format), 66,
                          static_cast<uint32_t>(66 * BytesOf(kernel.format)), Placement::end);
            for (int32_t i = 0; i < 66 * 66; ++i) {
                canvas.Expect(i % 66, i / 66,
                              ModelResized(p, kernel.format, s, from, to, i % 66, i / 66),
                              BytesOf(kernel.format));
            }
            EXPECT_EQ(kernel.run(p, s, from, canvas, to), 0);
            EXPECT_TRUE(canvas.Check()) << kernel.name;
        }
    }
}

TEST(YCbCr420ToRgbRsz, EqualSizesKeepLumaAndShiftChroma) {
    auto random = testkit::Random(23);
    for (const StraightKernel& kernel : kStraight) {
        Processor p;
        p.UseRandomTables(random);
        const Size size{12, 8};
        Picture420 s(random, size.w, size.h, {}, Placement::end);
        const int bytes = BytesOf(kernel.format);
        Canvas canvas(random, size.w * bytes, size.h, static_cast<uint32_t>(size.w * bytes),
                      Placement::end);
        for (int32_t y = 0; y < size.h; ++y) {
            for (int32_t x = 0; x < size.w; ++x) {
                // x0 = 2k and x1 = 2k + 1 give chroma column (4k + 2) >> 2 = k.
                const int32_t cx = (x / 2 * 4 + 2) >> 2, cy = (y / 2 * 4 + 2) >> 2;
                canvas.Expect(
                    x, y,
                    ModelPixel(p, kernel.format, s.y.at(x, y), s.cb.at(cx, cy), s.cr.at(cx, cy)),
                    bytes);
            }
        }
        EXPECT_EQ(kernel.run(p, s, size, canvas, size), 0);
        EXPECT_TRUE(canvas.Check()) << kernel.name;
    }
}

TEST(YCbCr420ToRgbRsz, HeightBelowOneWritesNothing) {
    auto random = testkit::Random(24);
    for (const StraightKernel& kernel : kStraight) {
        for (const auto& heights : {Size{0, 4}, Size{4, 0}, Size{-4, 4}, Size{4, -4}}) {
            Processor p;
            Picture420 s(random, 4, 0, {}, Placement::end);
            Canvas canvas(random, 16, 1, 16, Placement::end);
            EXPECT_EQ(kernel.run(p, s, {4, heights.w}, canvas, {4, heights.h}), 0) << kernel.name;
            EXPECT_TRUE(canvas.Check()) << kernel.name;
        }
    }
}

TEST(YCbCr420ToRgbRszRot, EveryTypeAndFormat) {
    auto random = testkit::Random(25);
    const Size sizes[][2] = {{{1, 1}, {2, 2}},   {{4, 4}, {8, 6}},   {{8, 6}, {4, 4}},
                             {{9, 13}, {20, 4}}, {{16, 8}, {16, 8}}, {{7, 5}, {6, 30}}};
    for (const TurnedKernel& kernel : kTurned) {
        for (uint32_t type = 0; type <= 5; ++type) {
            for (const auto& size : sizes) {
                CheckTurned(kernel, type, size[0], size[1], 0, random);
                CheckTurned(kernel, type, size[0], size[1], 5, random);
            }
        }
    }
}

TEST(YCbCr420ToRgbRszRot, WithoutWalkerGivesMinusOne) {
    auto random = testkit::Random(26);
    for (const TurnedKernel& kernel : kTurned) {
        Processor p;
        Picture420 s(random, 2, 2, {}, Placement::end);
        EXPECT_EQ(kernel.run(p, s, {2, 2}, {4, 4}), -1) << kernel.name;
        EXPECT_EQ(kernel.run(p, s, {2, 0}, {4, 4}), 0) << kernel.name;
        EXPECT_EQ(kernel.run(p, s, {2, 2}, {4, 0}), 0) << kernel.name;
    }
}

}  // namespace
