// Same-size 4:2:0 to RGB, straight and turned, against the formula for each output pixel.

#include "kernels/rgb_model.h"

namespace {

using namespace kernel_test;

constexpr uint32_t kUnusedStride = 0xDEADBEEF;

struct StraightKernel {
    const char* name;
    Format format;
    int32_t (*run)(Processor&, Picture420&, int32_t w, int32_t h, Canvas&, uint32_t key);
};

const StraightKernel kStraight[] = {
    {"_QZYCbCr420ToRGB565", Format::rgb565,
     [](Processor& p, Picture420& s, int32_t w, int32_t h, Canvas& c, uint32_t) {
         return _QZYCbCr420ToRGB565(&p.set, s.planes, s.strides, w, h, c.data(), c.stride());
     }},
    {"_QZYCbCr420ToRGB555", Format::rgb5551,
     [](Processor& p, Picture420& s, int32_t w, int32_t h, Canvas& c, uint32_t key) {
         return _QZYCbCr420ToRGB555(&p.set, s.planes, s.strides, w, h, c.data(), c.stride(), key);
     }},
    {"_QZYCbCr420ToRGB888", Format::rgb888,
     [](Processor& p, Picture420& s, int32_t w, int32_t h, Canvas& c, uint32_t) {
         return _QZYCbCr420ToRGB888(&p.set, s.planes, s.strides, w, h, c.data(), c.stride());
     }},
    {"_QZYCbCr420ToARGB32", Format::argb32,
     [](Processor& p, Picture420& s, int32_t w, int32_t h, Canvas& c, uint32_t) {
         return _QZYCbCr420ToARGB32(&p.set, s.planes, s.strides, w, h, c.data(), c.stride(),
                                    kAlpha);
     }},
};

struct TurnedKernel {
    const char* name;
    Format format;
    int32_t (*run)(Processor&, Picture420&, int32_t w, int32_t h);
};

const TurnedKernel kTurned[] = {
    {"_QZYCbCr420ToRGB565Rot", Format::rgb565,
     [](Processor& p, Picture420& s, int32_t w, int32_t h) {
         return _QZYCbCr420ToRGB565Rot(&p.set, s.planes, s.strides, w, h);
     }},
    {"_QZYCbCr420ToRGB888Rot", Format::rgb888,
     [](Processor& p, Picture420& s, int32_t w, int32_t h) {
         return _QZYCbCr420ToRGB888Rot(&p.set, s.planes, s.strides, w, h);
     }},
    {"_QZYCbCr420ToARGB32Rot", Format::argb32,
     [](Processor& p, Picture420& s, int32_t w, int32_t h) {
         return _QZYCbCr420ToARGB32Rot(&p.set, s.planes, s.strides, w, h, kAlpha);
     }},
};

int32_t RoundUp2(int32_t n) {
    return (n + 1) / 2 * 2;
}

/// One random picture through one straight kernel. Planes and canvas hold whole blocks.
void CheckStraight(const StraightKernel& kernel, int32_t w, int32_t h, uint32_t pad, uint32_t lead,
                   Placement placement, bool realTables, std::mt19937& random) {
    SCOPED_TRACE(testing::Message() << kernel.name << ' ' << w << " x " << h << ", padding " << pad
                                    << ", lead " << lead);
    const int32_t w2 = RoundUp2(w), h2 = RoundUp2(h);
    const int bytes = BytesOf(kernel.format);
    Processor p;
    realTables ? p.UseRealTables() : p.UseRandomTables(random);
    Picture420 s(random, w2, h2, {3 * pad, pad, pad}, placement);
    Canvas canvas(random, w2 * bytes, h2, static_cast<uint32_t>(w2 * bytes) + 4 * pad, placement,
                  lead);
    s.strides[2] = kUnusedStride;
    const uint32_t key = s.y.at(0, 0) * 65536u + s.cb.at(0, 0) * 256u + s.cr.at(0, 0);
    for (int32_t y = 0; y < h2; ++y) {
        for (int32_t x = 0; x < w2; ++x) {
            canvas.Expect(x, y,
                          ModelPixel(p, kernel.format, s.y.at(x, y), s.cb.at(x / 2, y / 2),
                                     s.cr.at(x / 2, y / 2), key),
                          bytes);
        }
    }
    EXPECT_EQ(kernel.run(p, s, w, h, canvas, key), 0);
    EXPECT_TRUE(canvas.Check());
}

/// One random picture through one turned kernel.
void CheckTurned(const TurnedKernel& kernel, uint32_t type, int32_t w, int32_t h, uint32_t pad,
                 Placement placement, std::mt19937& random) {
    SCOPED_TRACE(testing::Message() << kernel.name << " type " << type << ' ' << w << " x " << h
                                    << ", padding " << pad);
    const int32_t w2 = RoundUp2(w), h2 = RoundUp2(h);
    const bool quarter = type == QZ_IMAGEPROC_ROTATE_90AC || type == QZ_IMAGEPROC_ROTATE_90C;
    const int32_t columns = quarter ? h2 : w2, rows = quarter ? w2 : h2;
    const int bytes = BytesOf(kernel.format);
    const uint32_t stride = static_cast<uint32_t>(columns * bytes) + 2 * pad;
    Processor p;
    p.UseRandomTables(random);
    Picture420 s(random, w2, h2, {pad, pad, pad}, placement);
    // A half turn fills the padded rows to their very end.
    const int32_t rowBytes =
        type == QZ_IMAGEPROC_ROTATE_180 ? static_cast<int32_t>(stride) : columns * bytes;
    Canvas canvas(random, rowBytes, rows, stride, placement, pad);
    s.strides[2] = kUnusedStride;
    p.UseWalker(PackedWalker(type, canvas.data(), w2, h2, stride, bytes));
    for (int32_t y = 0; y < h2; ++y) {
        for (int32_t x = 0; x < w2; ++x) {
            canvas.ExpectAt(TurnedOffset(type, x, y, w2, h2, stride, bytes),
                            ModelPixel(p, kernel.format, s.y.at(x, y), s.cb.at(x / 2, y / 2),
                                       s.cr.at(x / 2, y / 2)),
                            bytes);
        }
    }
    EXPECT_EQ(kernel.run(p, s, w, h), 0);
    EXPECT_TRUE(canvas.Check());
}

TEST(YCbCr420ToRgb, EveryFormatFollowsTheFormula) {
    auto random = testkit::Random(1);
    for (const StraightKernel& kernel : kStraight) {
        for (int32_t h : {1, 2, 3, 5, 8}) {
            for (int32_t w : {1, 2, 3, 4, 5, 7, 8, 16, 31}) {
                for (Placement placement : kPlacements) {
                    CheckStraight(kernel, w, h, 0, 0, placement, false, random);
                    CheckStraight(kernel, w, h, 5, 1, placement, true, random);
                }
            }
        }
    }
}

TEST(YCbCr420ToRgb, TakesUnalignedAddressesAndStrides) {
    auto random = testkit::Random(2);
    for (const StraightKernel& kernel : kStraight) {
        for (uint32_t lead = 0; lead < 8; ++lead) {
            for (uint32_t pad = 0; pad < 4; ++pad) {
                CheckStraight(kernel, 10, 4, pad, lead, Placement::start, false, random);
            }
        }
    }
}

TEST(YCbCr420ToRgb, Width3Height3ConvertsAFourByFourArea) {
    auto random = testkit::Random(3);
    for (const StraightKernel& kernel : kStraight) {
        for (Placement placement : kPlacements) {
            CheckStraight(kernel, 3, 3, 0, 0, placement, false, random);
        }
    }
}

TEST(YCbCr420ToRgb, EverySampleAgainstExtremeChroma) {
    auto random = testkit::Random(4);
    for (const StraightKernel& kernel : kStraight) {
        SCOPED_TRACE(kernel.name);
        for (int tables = 0; tables < 3; ++tables) {
            Processor p;
            tables == 0 ? p.UseRealTables() : p.UseRandomTables(random);
            Picture420 s(random, 512, 8, {}, Placement::end);
            Canvas canvas(random, 512 * BytesOf(kernel.format), 8,
                          static_cast<uint32_t>(512 * BytesOf(kernel.format)), Placement::end);
            for (int32_t y = 0; y < 8; ++y) {
                for (int32_t x = 0; x < 512; ++x) {
                    // Every luma level meets the four corners of the chroma plane.
                    s.y.at(x, y) = static_cast<uint8_t>(x / 2);
                    s.cb.at(x / 2, y / 2) = y & 2 ? 255 : 0;
                    s.cr.at(x / 2, y / 2) = y & 4 ? 255 : 0;
                    canvas.Expect(x, y,
                                  ModelPixel(p, kernel.format, s.y.at(x, y), s.cb.at(x / 2, y / 2),
                                             s.cr.at(x / 2, y / 2)),
                                  BytesOf(kernel.format));
                }
            }
            EXPECT_EQ(kernel.run(p, s, 512, 8, canvas, 0xFFFFFFFF), 0);
            EXPECT_TRUE(canvas.Check());
        }
    }
}

TEST(YCbCr420ToRgb, EveryChromaLevelInBothTables) {
    auto random = testkit::Random(5);
    for (const StraightKernel& kernel : kStraight) {
        SCOPED_TRACE(kernel.name);
        Processor p;
        p.UseRandomTables(random);
        Picture420 s(random, 512, 4, {}, Placement::end);
        Canvas canvas(random, 512 * BytesOf(kernel.format), 4,
                      static_cast<uint32_t>(512 * BytesOf(kernel.format)), Placement::end);
        for (int32_t x = 0; x < 256; ++x) {
            s.cb.at(x, 0) = s.cr.at(x, 1) = static_cast<uint8_t>(x);
        }
        for (int32_t y = 0; y < 4; ++y) {
            for (int32_t x = 0; x < 512; ++x) {
                canvas.Expect(x, y,
                              ModelPixel(p, kernel.format, s.y.at(x, y), s.cb.at(x / 2, y / 2),
                                         s.cr.at(x / 2, y / 2)),
                              BytesOf(kernel.format));
            }
        }
        EXPECT_EQ(kernel.run(p, s, 512, 4, canvas, 0xFFFFFFFF), 0);
        EXPECT_TRUE(canvas.Check());
    }
}

TEST(YCbCr420ToRgb, HeightBelowOneWritesNothing) {
    auto random = testkit::Random(6);
    for (const StraightKernel& kernel : kStraight) {
        for (int32_t h : {0, -1, -2}) {
            Processor p;
            Picture420 s(random, 4, 0, {}, Placement::end);
            Canvas canvas(random, 16, 1, 16, Placement::end);
            EXPECT_EQ(kernel.run(p, s, 4, h, canvas, 0), 0) << kernel.name;
            EXPECT_TRUE(canvas.Check()) << kernel.name;
        }
    }
}

TEST(YCbCr420ToRgb, SumBeyondTheRangeSaturates) {
    auto random = testkit::Random(7);
    const struct {
        uint16_t luma;
        uint32_t cb, cr;  // terms in the high halves, 1/64
        uint16_t pixel;
    } cases[] = {
        {32767, 0, 0, 0xFFFF},                       // just below 32 x 1024: all full
        {32768, 0, 0, 0xFFFF},                       // at it
        {65535, 0x7FFF0000, 0x7FFF0000, 0xFFFF},     // far above it
        {0, 0xFFFF0000, 0xFFFF0000, 0x0000},         // -2 in red and blue
        {100, 0x80000000, 0x80000000, 0x0000},       // far below 0
        {1024 * 4, 0x80000000, 0x7FFF0000, 0xF900},  // red full, green 8, blue 0
        {1024 * 4, 0x7FFF0000, 0x80000000, 0x0100 | 31},
        {65535, 0x00008000, 0x00000000, 0xF81F},  // green 65535 - 65536
    };
    for (const auto& c : cases) {
        Processor p;
        Picture420 s(random, 2, 2, {}, Placement::end);
        Canvas canvas(random, 4, 2, 4, Placement::end);
        p.luma(9) = c.luma;
        p.cb(7) = c.cb;
        p.cr(5) = c.cr;
        for (int32_t i = 0; i < 4; ++i) {
            s.y.at(i % 2, i / 2) = 9;
            canvas.Expect(i % 2, i / 2, c.pixel, 2);
        }
        s.cb.at(0, 0) = 7;
        s.cr.at(0, 0) = 5;
        EXPECT_EQ(_QZYCbCr420ToRGB565(&p.set, s.planes, s.strides, 2, 2, canvas.data(), 4), 0);
        EXPECT_TRUE(canvas.Check()) << "luma term " << c.luma;
    }
}

// The terms are a whole entry shifted, and the green halves wrap: clients rely on the exact bytes.
TEST(YCbCr420ToRgb, RedAndBlueTermsKeepTheTopBitOfTheLowHalf) {
    auto random = testkit::Random(8);
    Processor p;
    Picture420 s(random, 2, 2, {}, Placement::end);
    Canvas canvas(random, 6, 2, 6, Placement::end);
    p.luma(1) = 127;
    p.cb(2) = 0x00008000;  // blue term 1, which fills the level up
    p.cr(3) = 0x00000000;
    for (int32_t i = 0; i < 4; ++i) {
        s.y.at(i % 2, i / 2) = 1;
        canvas.Expect(i % 2, i / 2, 0x000001, 3);  // red 127 / 128, green below 0, blue 128 / 128
    }
    s.cb.at(0, 0) = 2;
    s.cr.at(0, 0) = 3;
    EXPECT_EQ(_QZYCbCr420ToRGB888(&p.set, s.planes, s.strides, 2, 2, canvas.data(), 6), 0);
    EXPECT_TRUE(canvas.Check());
}

TEST(YCbCr420ToRgb, GreenSumWrapsToSixteenBits) {
    auto random = testkit::Random(9);
    Processor p;
    Picture420 s(random, 2, 2, {}, Placement::end);
    Canvas canvas(random, 4, 2, 4, Placement::end);
    p.luma(1) = 65535;
    p.cb(2) = 0x00007FFF;
    p.cr(3) = 0x00000001;  // together 0x8000: -32768, twice that is below every luma term
    for (int32_t i = 0; i < 4; ++i) {
        s.y.at(i % 2, i / 2) = 1;
        canvas.Expect(i % 2, i / 2, 0xF81F, 2);
    }
    s.cb.at(0, 0) = 2;
    s.cr.at(0, 0) = 3;
    EXPECT_EQ(_QZYCbCr420ToRGB565(&p.set, s.planes, s.strides, 2, 2, canvas.data(), 4), 0);
    EXPECT_TRUE(canvas.Check());
}

TEST(YCbCr420ToRgb555, PixelThatEqualsTheKeyIsZeroAnyOtherHasBit0) {
    auto random = testkit::Random(10);
    Processor p;
    p.UseRealTables();
    Picture420 s(random, 4, 2, {}, Placement::end);
    s.cb.at(0, 0) = 0x40;
    s.cr.at(0, 0) = 0xC0;
    s.cb.at(1, 0) = 0x40;
    s.cr.at(1, 0) = 0xC1;
    for (int32_t x = 0; x < 4; ++x)
        s.y.at(x, 0) = s.y.at(x, 1) = 0x80;
    s.y.at(1, 1) = 0x81;
    GuardedBuffer out(16);
    ASSERT_EQ(_QZYCbCr420ToRGB555(&p.set, s.planes, s.strides, 4, 2, out.data(), 8, 0x8040C0), 0);
    uint16_t pixel[8];
    std::memcpy(pixel, out.data(), 16);
    EXPECT_EQ(pixel[0], 0);
    EXPECT_EQ(pixel[1], 0);
    EXPECT_EQ(pixel[4], 0);
    for (size_t i : {2u, 3u, 5u, 6u, 7u})
        EXPECT_EQ(pixel[i] & 1, 1) << i;
}

// The key is compared as the 32-bit word that the processor holds, in RGB5551 form or not.
TEST(YCbCr420ToRgb555, KeyAboveTwentyFourBitsMatchesNothing) {
    auto random = testkit::Random(11);
    Processor p;
    p.UseRealTables();
    Picture420 s(random, 2, 2, {}, Placement::end);
    for (int32_t i = 0; i < 4; ++i)
        s.y.at(i % 2, i / 2) = 0x80;
    s.cb.at(0, 0) = 0x40;
    s.cr.at(0, 0) = 0xC0;
    GuardedBuffer out(8);
    ASSERT_EQ(_QZYCbCr420ToRGB555(&p.set, s.planes, s.strides, 2, 2, out.data(), 4, 0x018040C0), 0);
    for (size_t i = 0; i < 8; i += 2)
        EXPECT_EQ(out[i] & 1, 1) << i;
}

TEST(YCbCr420ToRgbRot, EveryTypeAndFormat) {
    auto random = testkit::Random(12);
    for (const TurnedKernel& kernel : kTurned) {
        for (uint32_t type = 0; type <= 5; ++type) {
            for (int32_t h : {1, 2, 3, 6}) {
                for (int32_t w : {1, 2, 4, 5, 12}) {
                    for (Placement placement : kPlacements) {
                        CheckTurned(kernel, type, w, h, 0, placement, random);
                        CheckTurned(kernel, type, w, h, 3, placement, random);
                    }
                }
            }
        }
    }
}

TEST(YCbCr420ToRgbRot, WithoutWalkerGivesMinusOne) {
    auto random = testkit::Random(13);
    for (const TurnedKernel& kernel : kTurned) {
        Processor p;
        Picture420 s(random, 2, 2, {}, Placement::end);
        EXPECT_EQ(kernel.run(p, s, 2, 2), -1) << kernel.name;
        EXPECT_EQ(kernel.run(p, s, 2, 0), 0) << kernel.name << ": nothing to do comes first";
    }
}

}  // namespace
