// 4:2:0 and NV12 to packed RGB: every entry against the arithmetic written out, picture edges, and
// the traits of the arithmetic that clients rely on.

#include <gtest/gtest.h>

#include "kernels/kernel_fixture.h"
#include "kernels/vec_backend_env.h"
#include "kernels/vec_model.h"

namespace {

using namespace kernel_test;
using vec_model::Layout;
using vec_model::Levels;

using Plain = int32_t(uint8_t* const[3], const uint32_t[3], void*, uint32_t, int32_t, int32_t);
using Tailed = int32_t(uint8_t* const[3], const uint32_t[3], void*, uint32_t, int32_t, int32_t,
                       uint32_t);

struct Family {
    const char* source;
    const char* format;
    const char* tag;

    bool full() const { return source == std::string("YUV420") || source == std::string("NV12FR"); }
    bool paired() const { return source[0] == 'N'; }
    Layout layout() const { return Layout(format); }
    bool tailed() const { return layout().keyed || layout().bytes == 4; }
    std::string name(int n) const {
        return std::string("_") + source + "To" + format + "_" + tag + "_" + std::to_string(n);
    }
    friend std::ostream& operator<<(std::ostream& out, const Family& f) {
        return out << f.source << "To" << f.format;
    }
};

constexpr Family kFamilies[] = {{"YCbCr420", "RGB565", "P3C2"},  {"YUV420", "RGB565", "P3C2"},
                                {"YCbCr420", "BGR565", "P3C2"},  {"YUV420", "BGR565", "P3C2"},
                                {"YCbCr420", "RGB888", "P3C3"},  {"YUV420", "RGB888", "P3C3"},
                                {"YCbCr420", "BGR888", "P3C3"},  {"YUV420", "BGR888", "P3C3"},
                                {"YCbCr420", "ARGB32", "P3C4"},  {"YUV420", "ARGB32", "P3C4"},
                                {"YCbCr420", "ABGR32", "P3C4"},  {"YUV420", "ABGR32", "P3C4"},
                                {"YCbCr420", "RGB5551", "P3C2"}, {"YUV420", "RGB5551", "P3C2"},
                                {"YCbCr420", "BGR5551", "P3C2"}, {"YUV420", "BGR5551", "P3C2"},
                                {"NV12", "RGB565", "P3C2"},      {"NV12FR", "RGB565", "P3C2"},
                                {"NV12", "BGR565", "P3C2"},      {"NV12FR", "BGR565", "P3C2"}};

int32_t Call(const Family& f, int n, uint8_t* const src[3], const uint32_t ss[3], void* dst,
             uint32_t d, int32_t w, int32_t h, uint32_t extra) {
    if (f.tailed()) return vec_model::Entry<Tailed>(f.name(n))(src, ss, dst, d, w, h, extra);
    return vec_model::Entry<Plain>(f.name(n))(src, ss, dst, d, w, h);
}

uint32_t PixelOf(const Family& f, int n, int y, int cb, int cr, uint32_t extra) {
    const Levels levels = vec_model::ToLevels(vec_model::kRgbFactors[f.full()][n], y, cb, cr);
    return vec_model::Pack(f.layout(), levels, extra);
}

/// A picture for a family: planes Y, Cb, Cr, or Y and pairs with nothing behind the third address.
class Source {
  public:
    Source(std::mt19937& random, bool paired, int32_t w, int32_t h, Padding pad, Placement place)
        : m_paired(paired),
          m_luma(random, w, h, static_cast<uint32_t>(w) + pad[0], place),
          m_cb(random, Columns(w), (h + 1) / 2, static_cast<uint32_t>(Columns(w)) + pad[1], place),
          m_cr(random, Columns(w), (h + 1) / 2, static_cast<uint32_t>(Columns(w)) + pad[2], place),
          planes{m_luma.data(), m_cb.data(), paired ? nullptr : m_cr.data()},
          strides{m_luma.stride(), m_cb.stride(), paired ? 0xFFFFFFFFu : m_cr.stride()} {}

    int luma(int32_t x, int32_t y) { return m_luma.at(x, y); }
    int cb(int32_t x, int32_t y) {
        return m_paired ? m_cb.at(x / 2 * 2, y / 2) : m_cb.at(x / 2, y / 2);
    }
    int cr(int32_t x, int32_t y) {
        return m_paired ? m_cb.at(x / 2 * 2 + 1, y / 2) : m_cr.at(x / 2, y / 2);
    }

  private:
    int32_t Columns(int32_t w) const { return (w + 1) / 2 * (m_paired ? 2 : 1); }
    bool m_paired;
    Plane m_luma, m_cb, m_cr;

  public:
    uint8_t* planes[3];
    uint32_t strides[3];
};

class VecRgb : public testing::TestWithParam<Family> {
  protected:
    void Run(int n, int32_t w, int32_t h, Padding pad, uint32_t outPad, Placement place,
             uint32_t lead = 0) {
        const Family& f = GetParam();
        const int bytes = f.layout().bytes;
        Source source(m_random, f.paired(), w, h, pad, place);
        Canvas out(m_random, w * bytes, h, static_cast<uint32_t>(w * bytes) + outPad, place, lead);
        // The key is one of the picture's own pixels, so that it meets some.
        const uint32_t extra =
            bytes == 4 ? 0x100u | (m_random() & 0xFF)
                       : 0xABCD0000u |
                             PixelOf(f, n, source.luma(0, 0), source.cb(0, 0), source.cr(0, 0), 0);
        for (int32_t y = 0; y < h; ++y) {
            for (int32_t x = 0; x < w; ++x) {
                out.Expect(x, y,
                           PixelOf(f, n, source.luma(x, y), source.cb(x, y), source.cr(x, y),
                                   bytes == 4 ? extra & 0xFF : extra),
                           bytes);
            }
        }
        EXPECT_EQ(Call(f, n, source.planes, source.strides, out.data(), out.stride(), w, h, extra),
                  0);
        EXPECT_TRUE(out.Check()) << f.name(n) << ' ' << w << " x " << h;
    }

    std::mt19937 m_random = testkit::Random(3600);
};

TEST_P(VecRgb, EveryWidthAndHeightBetweenGuardPages) {
    for (int32_t w = 1; w <= 70; ++w) {
        for (const int32_t h : {1, 2, 3})
            Run(0, w, h, {0, 0, 0}, 0, kPlacements[w % 2]);
    }
    for (int32_t h = 1; h <= 9; ++h)
        Run(0, 33, h, {0, 0, 0}, 0, kPlacements[h % 2]);
    for (const int32_t w : {319, 320, 321, 638, 639, 640, 641, 642}) {
        Run(0, w, 3, {0, 0, 0}, 0, Placement::end);
    }
}

TEST_P(VecRgb, EveryMatrix) {
    for (int n = 0; n < 4; ++n)
        Run(n, 203, 5, {0, 0, 0}, 0, Placement::end);
}

TEST_P(VecRgb, ADifferentStridePerPlaneAndWiderOutput) {
    for (const int32_t w : {1, 7, 32, 69})
        Run(1, w, 5, {3, 10, 29}, 13, Placement::end);
}

TEST_P(VecRgb, UnalignedStarts) {
    for (uint32_t lead = 1; lead < 8; ++lead) {
        Run(2, 47, 4, {lead, lead + 1, lead + 2}, lead, Placement::start, lead);
    }
}

TEST_P(VecRgb, Width1LeavesItsNeighbours) {
    Run(3, 1, 1, {15, 15, 15}, 15, Placement::start);
    Run(3, 1, 3, {15, 15, 15}, 62, Placement::end);
}

TEST_P(VecRgb, OneRowTailOfAnOddHeight) {
    Run(0, 40, 1, {0, 0, 0}, 0, Placement::end);
    Run(0, 40, 7, {0, 0, 0}, 0, Placement::end);
}

TEST_P(VecRgb, SizesBelow1DoNothing) {
    const Family& f = GetParam();
    uint8_t byte = 0x5A;
    uint8_t* const planes[3] = {&byte, &byte, &byte};
    const uint32_t strides[3] = {1, 1, 1};
    for (const int32_t bad : {0, -1, INT32_MIN}) {
        EXPECT_EQ(Call(f, 0, planes, strides, &byte, 1, bad, 2, 0), 0);
        EXPECT_EQ(Call(f, 0, planes, strides, &byte, 1, 2, bad, 0), 0);
    }
    EXPECT_EQ(byte, 0x5A);
}

/// Every sample value for one member of each body, some for the others.
bool WantsAllSamples(const Family& f) {
    if (!vec_test::TriesEverySample()) return false;
    static const char* const kWhole[] = {"_YCbCr420ToRGB565", "_YUV420ToRGB888",
                                         "_YCbCr420ToARGB32", "_YUV420ToRGB5551",
                                         "_NV12FRToBGR565"};
    for (const char* name : kWhole) {
        if (f.name(0).find(name) == 0) return true;
    }
    return false;
}

/// A picture holds one Cr, every Cb in a column of its own, every Y in each of them.
TEST_P(VecRgb, AllSamples) {
    const Family& f = GetParam();
    const int step = WantsAllSamples(f) ? vec_model::kCubeStep : 51;
    const int n = f.full() ? 1 : 0;
    const Layout layout = f.layout();
    constexpr size_t kWidth = 512, kHeight = 128;
    const size_t bytes = static_cast<size_t>(layout.bytes);
    std::vector<uint8_t> luma(kWidth * kHeight), cb(512), cr(512), out(kWidth * kHeight * bytes);
    for (size_t i = 0; i < kWidth * kHeight; ++i) {
        const size_t x = i % kWidth, y = i / kWidth;
        luma[i] = static_cast<uint8_t>(y / 2 * 4 + y % 2 * 2 + x % 2);
    }
    uint8_t* const planes[3] = {luma.data(), cb.data(), f.paired() ? nullptr : cr.data()};
    const uint32_t strides[3] = {kWidth, 0, 0};  // every chroma row is the same one
    for (int v = 0; v < 256; v += step) {
        for (size_t i = 0; i < 256; ++i) {
            cb[f.paired() ? 2 * i : i] = static_cast<uint8_t>(i);
            (f.paired() ? cb[2 * i + 1] : cr[i]) = static_cast<uint8_t>(v);
        }
        Call(f, n, planes, strides, out.data(), static_cast<uint32_t>(kWidth * bytes), kWidth,
             kHeight, 0);
        for (size_t i = 0; i < kWidth * kHeight; ++i) {
            const int u = static_cast<int>(i % kWidth / 2);
            const Levels levels =
                vec_model::ToLevels(vec_model::kRgbFactors[f.full()][n], luma[i], u, v);
            uint32_t stored = 0;
            std::memcpy(&stored, &out[i * bytes], bytes);
            if (stored != vec_model::Pack(layout, levels, 0)) {
                FAIL() << f.name(n) << " Y " << int{luma[i]} << " Cb " << u << " Cr " << v
                       << " gave " << std::hex << stored;
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Entries, VecRgb, testing::ValuesIn(kFamilies),
                         [](const auto& entry) { return testing::PrintToString(entry.param); });

/// One pixel of `_YCbCr420ToARGB32_P3C4_n` or its full-range sibling: 0xAARRGGBB.
uint32_t OnePixel(bool full, int n, uint8_t y, uint8_t cb, uint8_t cr, uint32_t alpha = 0) {
    const Family family = {full ? "YUV420" : "YCbCr420", "ARGB32", "P3C4"};
    uint8_t* const planes[3] = {&y, &cb, &cr};
    const uint32_t strides[3] = {1, 1, 1};
    uint32_t pixel = 0;
    Call(family, n, planes, strides, &pixel, 4, 1, 1, alpha);
    return pixel;
}

TEST(VecRgbTraits, LimitedBlackIsNearBlack) {
    // 16 * 74 = 1184; red 1184 - 14266 + 128 * 102 = -26, green 1184 + 8676 - 6656 - 3200 = 4,
    // blue 1184 - 17717 + 128 * 129 = -21: all within the first level.
    EXPECT_EQ(OnePixel(false, 0, 16, 128, 128), 0x00000000u);
}

TEST(VecRgbTraits, FullRangeHasNoBias) {
    EXPECT_EQ(OnePixel(true, 0, 255, 0, 0), 0x00FFFFFFu);
    // Chroma 128 is not neutral: it adds 128 * 89 / 64 = 178 to red and 128 * 113 / 64 = 226 to
    // blue, and takes 128 * (45 + 22) / 64 = 134 from green.
    EXPECT_EQ(OnePixel(true, 0, 0, 128, 128), 0x00B200E2u);
    EXPECT_EQ(OnePixel(true, 0, 20, 128, 0), 0x001400F6u);
}

TEST(VecRgbTraits, BlueProductAbove32767Wraps) {
    // 255 * 135 = 34425; with the offset 15928, a positive number again; 15928 / 64 = 248.
    EXPECT_EQ(OnePixel(false, 1, 0, 255, 0) & 0xFF, 248u);
}

TEST(VecRgbTraits, OuterSumsSaturate) {
    // 255 * 64 + 255 * 118 = 46410 would be negative in 16 bits.
    EXPECT_EQ(OnePixel(true, 1, 255, 255, 0) & 0xFF, 255u);
    // 255 * 74 + 15928 = 34798.
    EXPECT_EQ(OnePixel(false, 1, 255, 255, 0) & 0xFF, 255u);
}

TEST(VecRgbTraits, Bt709FullTakes11FromGreen) {
    // 200 - 255 * 11 / 64 = 156.2; with 12 it were 152.
    EXPECT_EQ(OnePixel(true, 1, 200, 255, 0) >> 8 & 0xFF, 156u);
}

TEST(VecRgbTraits, AlphaIsTheLowByteOfTheArgument) {
    EXPECT_EQ(OnePixel(true, 0, 255, 0, 0, 0x12345680u), 0x80FFFFFFu);
}

uint16_t OneKeyed(const char* format, uint8_t y, uint8_t cb, uint8_t cr, uint32_t key) {
    uint8_t* const planes[3] = {&y, &cb, &cr};
    const uint32_t strides[3] = {1, 1, 1};
    uint16_t pixel = 0x1234;
    Call({"YUV420", format, "P3C2"}, 0, planes, strides, &pixel, 2, 1, 1, key);
    return pixel;
}

TEST(VecRgbTraits, KeyIsComparedWithTheFinishedPixel) {
    // Y 0, Cr 128: red 178 = 22 << 3 | 2, green and blue 0.
    constexpr uint16_t kRed = 22 << 11 | 1, kRedInBgr = 22 << 1 | 1;
    EXPECT_EQ(OneKeyed("RGB5551", 0, 0, 128, 0), kRed);
    EXPECT_EQ(OneKeyed("RGB5551", 0, 0, 128, kRed), 0);
    EXPECT_EQ(OneKeyed("RGB5551", 0, 0, 128, kRed & ~1u), kRed) << "bit 0 takes part";
    EXPECT_EQ(OneKeyed("RGB5551", 0, 0, 128, 128), kRed) << "samples are not what is compared";
    EXPECT_EQ(OneKeyed("BGR5551", 0, 0, 128, kRedInBgr), 0) << "channels in the member's order";
    EXPECT_EQ(OneKeyed("BGR5551", 0, 0, 128, kRed), kRedInBgr);
    // Two samples that give the same pixel are both keyed.
    EXPECT_EQ(OneKeyed("RGB5551", 0, 0, 129, kRed), 0);
}

}  // namespace
