// The kernels that convert, scale and turn in one pass: every back end makes the bytes of the
// portable form, whatever the size, the stride, the tables, and reads and writes nothing else.

#include <algorithm>
#include <functional>
#include <string>
#include <vector>

#include "kernels/fused_backend.h"
#include "kernels/kernel_fixture.h"
#include "kernels/vec_backend.h"

namespace {

using namespace kernel_test;

struct Size {
    int32_t w, h;
};

enum class Tables { random, real, bent, adjusted };

/// What one call works on. Planes and output end, or begin, at unmapped pages.
struct Scene {
    Processor processor;
    Picture420 source;
    GuardedBuffer out;
    uint32_t stride;
    Size from, to;

    Scene(std::mt19937& random, Size from_, Size to_, uint32_t turn, int bytes, uint32_t pad,
          Tables tables, Placement placement)
        : source(random, Even(from_.w), Even(from_.h) + 2, {3 * pad, pad, pad}, placement),
          out(RowBytes(to_, bytes, pad) *
                  static_cast<size_t>(turn == 0 ? Even(to_.h) : Longer(to_)),
              placement),
          stride(RowBytes(to_, bytes, pad)),
          from(from_),
          to(to_) {
        UseTables(random, tables);
        processor.UseLines(std::max(Even(from.w), to.w));
    }

    /// Real tables bent in one entry are no lines any more.
    void UseTables(std::mt19937& random, Tables tables) {
        tables == Tables::random ? processor.UseRandomTables(random) : processor.UseRealTables();
        if (tables == Tables::bent) {
            const size_t entry = 60 + random() % 120;
            if (random() % 2 == 0) processor.luma(entry) += 3;
            if (random() % 2 == 0) processor.cb(entry) += 0x30000;
            if (random() % 2 == 0) processor.cr(entry) += 3;
        } else if (tables == Tables::adjusted) {
            const auto build = random() % 2 == 0 ? set_transtable : set_transtable_fullrange;
            const auto setting = [&] { return static_cast<int32_t>(random() % 256); };
            const int32_t brightness = setting(), contrast = setting();
            build(csc_coef[random() % 2], &processor.luma(0), &processor.cb(0), &processor.cr(0),
                  brightness, contrast, setting());
        }
    }

    /// Of the last pixel, sometimes with a bit that no sample has.
    uint32_t Key() const {
        const size_t x = static_cast<size_t>(from.w - 1), y = static_cast<size_t>(from.h - 1);
        const auto at = [&](int plane, size_t column, size_t row) {
            return uint32_t{source.planes[plane][row * source.strides[plane] + column]};
        };
        const uint32_t key = at(0, x, y) << 16 | at(1, x / 2, y / 2) << 8 | at(2, x / 2, y / 2);
        return from.w % 5 == 0 ? key | 1u << 24 : key;
    }

    static int32_t Even(int32_t n) { return (n + 1) / 2 * 2; }
    static int32_t Longer(Size s) { return std::max(Even(s.w), Even(s.h)); }
    static uint32_t RowBytes(Size s, int bytes, uint32_t pad) {
        return (static_cast<uint32_t>(Longer(s) * bytes) + 3) / 4 * 4 + 4 * pad;
    }

    void UseWalker(uint32_t type, int bytes) {
        processor.set.u32RotationType = type;
        processor.set.u32CscType = bytes == 2   ? QZ_IMAGEPROC_FMT_RGB565
                                   : bytes == 3 ? QZ_IMAGEPROC_FMT_RGB888
                                                : QZ_IMAGEPROC_FMT_ARGB32;
        processor.UseWalker({});
        uint8_t* const planes[3] = {out.data(), nullptr, nullptr};
        const int32_t strides[3] = {static_cast<int32_t>(stride), 0, 0};
        // Whole blocks, so that odd sizes stay within the picture.
        ASSERT_EQ(_QZ_RotationInit(&processor.set, planes, Even(to.w), Even(to.h), strides), 0);
    }
};

#define SOURCE(s) &s.processor.set, s.source.planes, s.source.strides
#define LINES(s) &s.processor.set, s.processor.set.pLines, s.source.planes, s.source.strides

struct Kernel {
    const char* name;
    int bytes;
    std::function<int32_t(Scene&)> run;
};

constexpr uint32_t kAlpha = 0xA5;

/// Output of the back end `name` from a scene made of `seed`.
std::vector<uint8_t> Bytes(const char* backend, const Kernel& kernel, uint32_t seed, Size from,
                           Size to, uint32_t turn, Tables tables) {
    std::mt19937 random(seed);
    const uint32_t pad = seed % 3;
    Scene scene(random, from, to, turn, kernel.bytes, pad, tables,
                seed % 2 == 0 ? Placement::end : Placement::start);
    scene.UseWalker(turn, kernel.bytes);
    std::fill(scene.out.data(), scene.out.data() + scene.out.size(), uint8_t{0x5A});
    vidshow::UseVectorBackend(vidshow::FindVectorBackend(backend));
    EXPECT_EQ(kernel.run(scene), 0);
    vidshow::UseVectorBackend(nullptr);
    return {scene.out.data(), scene.out.data() + scene.out.size()};
}

std::vector<const char*> Others() {
    std::vector<const char*> names;
    for (const char* name : {"neon", "sse41", "avx2", "avx512"}) {
        if (vidshow::FindVectorBackend(name) != nullptr) names.push_back(name);
    }
    return names;
}

/// Every other back end against the portable form, on all kinds of tables.
void Compare(const Kernel& kernel, Size from, Size to, uint32_t turn = 0) {
    static const std::vector<const char*> others = Others();
    static uint32_t seed = 0;
    ++seed;
    constexpr Tables kKinds[] = {Tables::random, Tables::real, Tables::bent, Tables::adjusted};
    const Tables tables = kKinds[seed / 2 % 4];
    const std::vector<uint8_t> expected = Bytes("scalar", kernel, seed, from, to, turn, tables);
    for (const char* const name : others) {
        ASSERT_EQ(Bytes(name, kernel, seed, from, to, turn, tables), expected)
            << kernel.name << " on " << name << ": " << from.w << " x " << from.h << " to " << to.w
            << " x " << to.h << ", turned " << turn;
    }
}

std::vector<int32_t> Widths() {
    std::vector<int32_t> widths;
    for (int32_t w = 1; w <= 70; ++w)
        widths.push_back(w);
    widths.insert(widths.end(), {126, 127, 128, 129, 130, 145, 190, 256, 258});
    return widths;
}

const Kernel kPlain[] = {
    {"RGB565", 2,
     [](Scene& s) {
         return _QZYCbCr420ToRGB565(SOURCE(s), s.from.w, s.from.h, s.out.data(), s.stride);
     }},
    {"RGB5551", 2,
     [](Scene& s) {
         return _QZYCbCr420ToRGB555(SOURCE(s), s.from.w, s.from.h, s.out.data(), s.stride, s.Key());
     }},
    {"RGB888", 3,
     [](Scene& s) {
         return _QZYCbCr420ToRGB888(SOURCE(s), s.from.w, s.from.h, s.out.data(), s.stride);
     }},
    {"ARGB32", 4,
     [](Scene& s) {
         return _QZYCbCr420ToARGB32(SOURCE(s), s.from.w, s.from.h, s.out.data(), s.stride, kAlpha);
     }},
};

TEST(Fused, PlainConversionIsThatOfThePortableForm) {
    for (const Kernel& kernel : kPlain) {
        for (int32_t w : Widths()) {
            Compare(kernel, {w, 2}, {w, 2});
            Compare(kernel, {w, 1 + w % 7}, {w, 1 + w % 7});
        }
    }
}

// Rows that begin before the ones above them end show the order of the blocks.
TEST(Fused, OverlappingRowsAreThoseOfThePortableForm) {
    for (Kernel kernel : kPlain) {
        const auto run = kernel.run;
        kernel.run = [&](Scene& s) {
            s.stride = static_cast<uint32_t>(s.from.w * kernel.bytes);
            return run(s);
        };
        for (int32_t w : {1, 3, 17, 31, 33, 65})
            Compare(kernel, {w, 5}, {w, 5});
    }
}

const Kernel kTurned[] = {
    {"RGB565Rot", 2,
     [](Scene& s) { return _QZYCbCr420ToRGB565Rot(SOURCE(s), s.from.w, s.from.h); }},
    {"RGB888Rot", 3,
     [](Scene& s) { return _QZYCbCr420ToRGB888Rot(SOURCE(s), s.from.w, s.from.h); }},
    {"ARGB32Rot", 4,
     [](Scene& s) { return _QZYCbCr420ToARGB32Rot(SOURCE(s), s.from.w, s.from.h, kAlpha); }},
};

TEST(Fused, TurnsAndMirrorsAreThoseOfThePortableForm) {
    for (const Kernel& kernel : kTurned) {
        for (uint32_t turn = 0; turn <= QZ_IMAGEPROC_ROTATE_MIRROR_V; ++turn) {
            for (int32_t n : {1, 2, 3, 8, 9, 17, 32, 40, 63, 64, 65, 130}) {
                const Size size{n, 1 + n * 7 % 151};
                Compare(kernel, size, size, turn);
            }
            Compare(kernel, {10, 1131}, {10, 1131}, turn);
            Compare(kernel, {1131, 10}, {1131, 10}, turn);
        }
    }
}

// The engine's own walkers of odd sizes and tight strides put the blocks' spare pixels onto others.
TEST(Fused, WalkersOfAnotherShapeAreFollowedAsThePortableFormDoes) {
    for (Kernel kernel : kTurned) {
        const auto run = kernel.run;
        kernel.run = [&](Scene& s) {
            auto& walker = *static_cast<QZ_ROTATION_WALKER*>(s.processor.set.pWalker);
            const intptr_t start = reinterpret_cast<intptr_t>(s.out.data());
            const intptr_t pixel = kernel.bytes, row = pixel * s.from.w;
            walker = {{2 * pixel, 2 * row, start, start + pixel, start + row, start + row + pixel}};
            if (s.from.w % 3 == 0) std::swap(walker.word[3], walker.word[4]);
            return run(s);
        };
        for (int32_t w : {1, 3, 16, 17, 18, 33, 36, 65})
            Compare(kernel, {w, 6}, {w, 6});
    }
}

const Kernel kResized[] = {
    {"RGB565Rsz", 2,
     [](Scene& s) {
         return _QZYCbCr420ToRGB565Rsz(SOURCE(s), s.from.w, s.from.h, s.out.data(), s.stride,
                                       s.to.w, s.to.h);
     }},
    {"RGB888Rsz", 3,
     [](Scene& s) {
         return _QZYCbCr420ToRGB888Rsz(SOURCE(s), s.from.w, s.from.h, s.out.data(), s.stride,
                                       s.to.w, s.to.h);
     }},
    {"ARGB32Rsz", 4,
     [](Scene& s) {
         return _QZYCbCr420ToARGB32Rsz(SOURCE(s), s.from.w, s.from.h, s.out.data(), s.stride,
                                       s.to.w, s.to.h, kAlpha);
     }},
};
const Kernel kResizedTurned[] = {
    {"RGB565RszRot", 2,
     [](Scene& s) {
         return _QZYCbCr420ToRGB565RszRot(SOURCE(s), s.from.w, s.from.h, s.to.w, s.to.h);
     }},
    {"RGB888RszRot", 3,
     [](Scene& s) {
         return _QZYCbCr420ToRGB888RszRot(SOURCE(s), s.from.w, s.from.h, s.to.w, s.to.h);
     }},
    {"ARGB32RszRot", 4,
     [](Scene& s) {
         return _QZYCbCr420ToARGB32RszRot(SOURCE(s), s.from.w, s.from.h, s.to.w, s.to.h, kAlpha);
     }},
};

// Ratios of all kinds: just below and above the one from which neighbours are brought together, and
// the one from which the portable form does it all.
constexpr Size kResizes[][2] = {
    {{16, 12}, {40, 24}},   {{40, 24}, {16, 12}},    {{33, 21}, {64, 8}},  {{64, 10}, {33, 7}},
    {{65, 10}, {33, 7}},    {{66, 10}, {33, 7}},     {{130, 6}, {65, 3}},  {{131, 6}, {64, 4}},
    {{320, 9}, {214, 6}},   {{640, 4}, {320, 2}},    {{641, 4}, {320, 2}}, {{700, 4}, {300, 2}},
    {{700, 6}, {70, 3}},    {{640, 4}, {42, 2}},     {{640, 4}, {40, 2}},  {{640, 4}, {38, 2}},
    {{20, 6}, {530, 13}},   {{1, 1}, {20, 20}},      {{2, 2}, {19, 19}},   {{300, 5}, {300, 5}},
    {{24, 140}, {17, 150}}, {{100, 260}, {66, 130}}, {{40, 4}, {2060, 3}}, {{3150, 4}, {2100, 2}},
    {{12, 90}, {18, 1130}}};

TEST(Fused, ResizeIsThatOfThePortableForm) {
    for (const Size(&sizes)[2] : kResizes) {
        for (int round = 0; round < 2; ++round) {
            for (const Kernel& kernel : kResized)
                Compare(kernel, sizes[0], sizes[1]);
        }
    }
    for (int32_t w = 2; w <= 70; ++w) {
        for (const Kernel& kernel : kResized)
            Compare(kernel, {1 + w * 5 % 90, 5}, {w, 4});
    }
}

// Chroma rows around the 16 samples that are picked from at once.
TEST(Fused, NarrowChromaIsThatOfThePortableForm) {
    for (int32_t w : {28, 30, 31, 32, 33, 34, 36, 62, 64, 66}) {
        for (int32_t to : {2, 14, 16, 18, 31, 32, 34, 50, 66, 130}) {
            for (const Kernel& kernel : kResized)
                Compare(kernel, {w, 3}, {to, 4});
        }
    }
}

TEST(Fused, TurnedResizeIsThatOfThePortableForm) {
    for (const Size(&sizes)[2] : kResizes) {
        for (uint32_t turn : {1u, 2u, 3u, 5u}) {
            for (const Kernel& kernel : kResizedTurned)
                Compare(kernel, sizes[0], sizes[1], turn);
        }
    }
}

const Kernel kEnlarged[] = {
    {"RGB565RszUp", 2,
     [](Scene& s) {
         return _QZYCbCr420ToRGB565RszUp(LINES(s), s.from.w, s.from.h, s.out.data(), s.stride,
                                         s.to.w, s.to.h);
     }},
    {"RGB888RszUp", 3,
     [](Scene& s) {
         return _QZYCbCr420ToRGB888RszUp(LINES(s), s.from.w, s.from.h, s.out.data(), s.stride,
                                         s.to.w, s.to.h);
     }},
    {"ARGB32RszUp", 4,
     [](Scene& s) {
         return _QZYCbCr420ToARGB32RszUp(LINES(s), s.from.w, s.from.h, s.out.data(), s.stride,
                                         s.to.w, s.to.h, kAlpha);
     }},
};

TEST(Fused, EnlargementIsThatOfThePortableForm) {
    for (const Kernel& kernel : kEnlarged) {
        for (int32_t w = 2; w <= 70; w += 4) {
            for (int32_t more : {0, 1, 7, 70})
                Compare(kernel, {w, 4}, {w + more + (w + more) % 2, 7});
        }
        Compare(kernel, {128, 4}, {192, 6});
        Compare(kernel, {130, 6}, {260, 12});
        Compare(kernel, {64, 4}, {40, 8});  // not an enlargement: pixel by pixel
    }
}

// Lines narrower than a step, and rows that end anywhere within one.
TEST(Fused, EnlargementEndsWhereThePortableFormDoes) {
    for (const Kernel& kernel : kEnlarged) {
        for (int32_t w = 2; w <= 70; w += 2)
            Compare(kernel, {w, 2}, {w + w % 5, 3});
        for (int32_t to = 1; to <= 70; ++to)
            Compare(kernel, {2 + to / 4 * 2, 4}, {to, 5});
        for (int32_t to = 2; to <= 70; ++to)
            Compare(kernel, {2, 2}, {to, 2});
    }
}

// An odd source pixel is left out of the conversion, whatever the back end.
TEST(Fused, OddLinesAreEnlargedAsThePortableFormDoes) {
    for (const Kernel& kernel : kEnlarged) {
        for (int32_t w : {1, 3, 15, 17, 31, 33, 65})
            Compare(kernel, {w, 4}, {w * 3 / 2 + 1, 6});
    }
}

TEST(Fused, TheWidestLinesAreEnlargedAsThePortableFormDoes) {
    for (const Kernel& kernel : kEnlarged) {
        for (int32_t to :
             {vidshow::kPlanarPixels - 2, vidshow::kPlanarPixels, vidshow::kPlanarPixels + 2}) {
            Compare(kernel, {30, 2}, {to, 3});
            Compare(kernel, {to, 2}, {to, 3});
        }
        Compare(kernel, {2730, 2}, {vidshow::kPlanarPixels, 3});
    }
}

const Kernel kCase1[] = {
    {"RGB565Case1", 2,
     [](Scene& s) {
         return _QZYCbCr420ToRGB565Case1(LINES(s), s.from.w, s.out.data(), s.stride, s.to.h);
     }},
    {"ARGB32Case1", 4,
     [](Scene& s) {
         return _QZYCbCr420ToARGB32Case1(LINES(s), s.from.w, s.out.data(), s.stride, s.to.h,
                                         kAlpha);
     }},
};
const Kernel kCase2[] = {
    {"RGB565Case2", 2,
     [](Scene& s) {
         return _QZYCbCr420ToRGB565Case2(LINES(s), s.from.w, s.from.h, s.out.data(), s.stride,
                                         s.to.h);
     }},
    {"ARGB32Case2", 4,
     [](Scene& s) {
         return _QZYCbCr420ToARGB32Case2(LINES(s), s.from.w, s.from.h, s.out.data(), s.stride,
                                         s.to.h, kAlpha);
     }},
};

TEST(Fused, FixedRatiosAreThoseOfThePortableForm) {
    for (int32_t w = 2; w <= 140; w += w < 70 ? 2 : 12) {
        for (const Kernel& kernel : kCase1)
            Compare(kernel, {w, 4}, {w / 2 * 5, 8});
        for (const Kernel& kernel : kCase2)
            Compare(kernel, {w, 4}, {w / 2 * 3, 9});
    }
    const Kernel case3 = {"RGB565Case3", 2, [](Scene& s) {
                              return _QZYCbCr420ToRGB565Case3(
                                  &s.processor.set, s.processor.set.pLines[0],
                                  s.processor.set.pLines[1], s.source.planes, s.source.strides,
                                  s.out.data(), s.stride);
                          }};
    for (int i = 0; i < 3; ++i)
        Compare(case3, {320, 240}, {480, 272});
}

// The line operations alone, between unmapped pages: the entry behind the last one is the only
// spare one that may be read.
TEST(Fused, LineOperationsReadNoFurther) {
    auto random = testkit::Random(7);
    for (const char* const name : Others()) {
        vidshow::UseVectorBackend(vidshow::FindVectorBackend(name));
        for (int32_t w = 2; w <= 80; w += 2) {
            GuardedBuffer line(static_cast<size_t>(w) * 4, Placement::end);
            testkit::FillSamples(random, line.data(), line.size());
            const auto* const words =
                static_cast<const uint32_t*>(static_cast<const void*>(line.data()));
            GuardedBuffer out(static_cast<size_t>(w) / 2 * 5 * 4, Placement::end);
            auto* const out32 = static_cast<uint32_t*>(static_cast<void*>(out.data()));
            const int32_t steps[] = {0, 32768, ((w - 2) * 65536 + w - 2) / (w - 1)};
            for (int32_t step : steps) {
                EXPECT_EQ(HLerp32(words, out32, step, w, kAlpha), 0);
            }
            EXPECT_EQ(HLerp32_23(words, out32, w, kAlpha), 0);
            EXPECT_EQ(HLerp32_25(words, out32, w, kAlpha), 0);
        }
    }
    vidshow::UseVectorBackend(nullptr);
}

TEST(Fused, EveryVectorBackEndHasItsLoops) {
    for (const char* const name : Others()) {
        vidshow::UseVectorBackend(vidshow::FindVectorBackend(name));
        EXPECT_NE(vidshow::ActiveFusedBackend(), nullptr) << name;
    }
    vidshow::UseVectorBackend(vidshow::FindVectorBackend("scalar"));
    EXPECT_EQ(vidshow::ActiveFusedBackend(), nullptr);
    vidshow::UseVectorBackend(nullptr);
}

}  // namespace
