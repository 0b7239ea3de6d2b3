// Packed RGB to 4:2:0: every entry against the arithmetic written out, picture edges, and the
// traits of the arithmetic that clients rely on.

#include <gtest/gtest.h>

#include "kernels/kernel_fixture.h"
#include "kernels/vec_backend_env.h"
#include "kernels/vec_model.h"

namespace {

using namespace kernel_test;
using vec_model::Bytes3;
using vec_model::Layout;

using ToPlanes = int32_t(const void*, uint32_t, uint8_t* const[3], const uint32_t[3], int32_t,
                         int32_t);

struct Family {
    const char* format;
    bool full;

    Layout layout() const { return Layout(format); }
    int bytes() const { return layout().bytes; }
    std::string name(int n) const {
        return std::string("_QZ") + format + "To" + (full ? "YUV420" : "YCbCr420") +
               (bytes() == 2 ? "_C2P3_" : "_C4P3_") + std::to_string(n);
    }
    ToPlanes* entry(int n) const { return vec_model::Entry<ToPlanes>(name(n)); }
    friend std::ostream& operator<<(std::ostream& out, const Family& f) {
        return out << f.format << (f.full ? "Full" : "Limited");
    }
};

constexpr Family kFamilies[] = {{"RGB565", false}, {"RGB565", true},  {"ARGB32", false},
                                {"ARGB32", true},  {"ABGR32", false}, {"ABGR32", true}};

class VecYuv : public testing::TestWithParam<Family> {
  protected:
    void Run(int n, int32_t w, int32_t h, uint32_t inPad, Padding pad, Placement place) {
        const Family& f = GetParam();
        const vec_model::YuvFactors& factors = vec_model::kYuvFactors[f.full][n];
        const int32_t halfW = (w + 1) / 2, halfH = (h + 1) / 2;
        const int32_t rowBytes = w * f.bytes();
        Plane in(m_random, rowBytes, h, static_cast<uint32_t>(rowBytes) + inPad, place);
        Canvas luma(m_random, w, h, static_cast<uint32_t>(w) + pad[0], place);
        Canvas cb(m_random, halfW, halfH, static_cast<uint32_t>(halfW) + pad[1], place);
        Canvas cr(m_random, halfW, halfH, static_cast<uint32_t>(halfW) + pad[2], place);
        for (int32_t y = 0; y < h; ++y) {
            for (int32_t x = 0; x < w; ++x) {
                const Bytes3 p = vec_model::Channels(f.layout(), &in.at(x * f.bytes(), y));
                luma.Expect(x, y, vec_model::LumaOf(factors, p), 1);
                if (x % 2 != 0 || y % 2 != 0) continue;
                cb.Expect(x / 2, y / 2, vec_model::CbOf(factors, p), 1);
                cr.Expect(x / 2, y / 2, vec_model::CrOf(factors, p), 1);
            }
        }
        uint8_t* const planes[3] = {luma.data(), cb.data(), cr.data()};
        const uint32_t strides[3] = {luma.stride(), cb.stride(), cr.stride()};
        EXPECT_EQ(f.entry(n)(in.data(), in.stride(), planes, strides, w, h), 0);
        EXPECT_TRUE(luma.Check()) << "Y of " << f.name(n) << ' ' << w << " x " << h;
        EXPECT_TRUE(cb.Check()) << "Cb of " << f.name(n) << ' ' << w << " x " << h;
        EXPECT_TRUE(cr.Check()) << "Cr of " << f.name(n) << ' ' << w << " x " << h;
    }

    std::mt19937 m_random = testkit::Random(3610);
};

TEST_P(VecYuv, EveryWidthAndHeightBetweenGuardPages) {
    for (int32_t w = 1; w <= 70; ++w) {
        for (const int32_t h : {1, 2, 3})
            Run(0, w, h, 0, {0, 0, 0}, kPlacements[w % 2]);
    }
    for (int32_t h = 1; h <= 9; ++h)
        Run(0, 33, h, 0, {0, 0, 0}, kPlacements[h % 2]);
    for (const int32_t w : {319, 320, 321, 638, 639, 640, 641, 642}) {
        Run(0, w, 3, 0, {0, 0, 0}, Placement::end);
    }
}

TEST_P(VecYuv, EveryMatrix) {
    for (int n = 0; n < 4; ++n)
        Run(n, 203, 5, 0, {0, 0, 0}, Placement::end);
}

TEST_P(VecYuv, ADifferentStridePerPlaneAndUnalignedRows) {
    for (const int32_t w : {1, 7, 32, 69}) {
        for (uint32_t pad = 1; pad < 8; ++pad)
            Run(1, w, 5, pad, {pad, 9, 30}, Placement::end);
    }
}

TEST_P(VecYuv, OneRowTailOfAnOddHeight) {
    Run(2, 40, 1, 0, {0, 0, 0}, Placement::end);
    Run(2, 40, 7, 0, {0, 0, 0}, Placement::end);
}

TEST_P(VecYuv, SizesBelow1DoNothing) {
    uint8_t byte = 0x5A;
    uint8_t* const planes[3] = {&byte, &byte, &byte};
    const uint32_t strides[3] = {1, 1, 1};
    for (const int32_t bad : {0, -1, INT32_MIN}) {
        EXPECT_EQ(GetParam().entry(0)(&byte, 1, planes, strides, bad, 2), 0);
        EXPECT_EQ(GetParam().entry(0)(&byte, 1, planes, strides, 2, bad), 0);
    }
    EXPECT_EQ(byte, 0x5A);
}

/// All pixels: 65536 words, or all triples of bytes. Every pixel fills a 2 x 2 block of its own.
TEST_P(VecYuv, AllPixels) {
    const Family& f = GetParam();
    const vec_model::YuvFactors& factors = vec_model::kYuvFactors[f.full][0];
    const Layout layout = f.layout();
    const bool whole = vec_test::TriesEverySample() && (f.name(0) == "_QZARGB32ToYCbCr420_C4P3_0" ||
                                                        f.name(0) == "_QZABGR32ToYUV420_C4P3_0");
    const uint32_t step = layout.bytes == 2 ? 256 : whole ? vec_model::kCubeStep : 51;
    constexpr size_t kWidth = 512, kHeight = 512;
    const size_t bytes = static_cast<size_t>(layout.bytes);
    std::vector<uint8_t> in(kWidth * kHeight * bytes);
    std::vector<uint8_t> luma(kWidth * kHeight), cb(kWidth * kHeight / 4), cr(cb.size());
    uint8_t* const planes[3] = {luma.data(), cb.data(), cr.data()};
    const uint32_t strides[3] = {kWidth, kWidth / 2, kWidth / 2};
    for (uint32_t third = 0; third < 256; third += step) {
        for (size_t i = 0; i < kWidth * kHeight; ++i) {
            const uint32_t first = static_cast<uint32_t>(i % kWidth / 2);
            const uint32_t second = static_cast<uint32_t>(i / kWidth / 2);
            const uint32_t pixel = first | second << 8 | third << 16;
            std::memcpy(&in[i * bytes], &pixel, bytes);
        }
        f.entry(0)(in.data(), static_cast<uint32_t>(kWidth * bytes), planes, strides, kWidth,
                   kHeight);
        for (size_t c = 0; c < cb.size(); ++c) {
            const size_t i = c / (kWidth / 2) * 2 * kWidth + c % (kWidth / 2) * 2;
            const Bytes3 p = vec_model::Channels(layout, &in[i * bytes]);
            const uint8_t y = vec_model::LumaOf(factors, p);
            if (luma[i] != y || luma[i + 1] != y || luma[i + kWidth] != y ||
                luma[i + kWidth + 1] != y || cb[c] != vec_model::CbOf(factors, p) ||
                cr[c] != vec_model::CrOf(factors, p)) {
                FAIL() << f.name(0) << " R " << p.r << " G " << p.g << " B " << p.b << " gave "
                       << int{luma[i]} << ' ' << int{cb[c]} << ' ' << int{cr[c]};
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Entries, VecYuv, testing::ValuesIn(kFamilies),
                         [](const auto& entry) { return testing::PrintToString(entry.param); });

struct Sample {
    uint8_t y, cb, cr;
};
Sample OnePixel(const Family& f, int n, uint32_t pixel) {
    Sample s = {};
    uint8_t* const planes[3] = {&s.y, &s.cb, &s.cr};
    const uint32_t strides[3] = {1, 1, 1};
    f.entry(n)(&pixel, 4, planes, strides, 1, 1);
    return s;
}

TEST(VecYuvTraits, WordChannelsAreTakenUnmasked) {
    // Pure green 0x07E0: the byte of red is 7, green's top bits; green itself is 0xFC.
    // Y = (7 * 65 + 252 * 129 + 128) >> 8, plus 16 = 129 + 16; masked it were 127 + 16.
    const Sample s = OnePixel({"RGB565", false}, 0, 0x07E0);
    EXPECT_EQ(s.y, ((7 * 65 + 252 * 129 + 128) >> 8) + 16);
    EXPECT_NE(s.y, ((252 * 129 + 128) >> 8) + 16);
    // Pure blue 0x001F: green's byte is 3, blue's top bits; blue has its low bits empty.
    const Sample blue = OnePixel({"RGB565", true}, 0, 0x001F);
    EXPECT_EQ(blue.cb, ((248 * 128 - 3 * 84 + 128) >> 8) + 128);
    EXPECT_EQ(blue.cr, ((-3 * 107 - 248 * 20 + 128) >> 8) + 128);
}

TEST(VecYuvTraits, SumsFrom32640To32767Give143) {
    // BT.601 limited: 65 R + 129 G + 25 B. R 252, G 126, B 0 is 32634; B 1: 32659; B 5: 32759;
    // B 6: 32784.
    const Family f = {"ARGB32", false};
    EXPECT_EQ(OnePixel(f, 0, 0xFFFC7E00).y, 143) << "(32634 + 128) >> 8 is 127";
    EXPECT_EQ(OnePixel(f, 0, 0xFFFC7E01).y, 143) << "not 144";
    EXPECT_EQ(OnePixel(f, 0, 0xFFFC7E05).y, 143) << "not 144";
    EXPECT_EQ(OnePixel(f, 0, 0xFFFC7E06).y, 144) << "read as negative, right again modulo 256";
}

TEST(VecYuvTraits, FullRangeMeetsTheSameStepAt127) {
    // BT.601 full: 76 R + 150 G + 29 B. R 255, G 88, B 3 is 32667: (32667 + 128) >> 8 is 128.
    const Family f = {"ARGB32", true};
    EXPECT_EQ(OnePixel(f, 0, 0xFFFF5803).y, 127);
    EXPECT_EQ(OnePixel(f, 0, 0xFFFFFFFF).y, 254) << "65025, no offset";
    EXPECT_EQ(OnePixel(f, 0, 0xFF000000).y, 0);
}

TEST(VecYuvTraits, ChromaOf128Times255Saturates) {
    // 32640 + 128 passes 32767: 127 + 128.
    EXPECT_EQ(OnePixel({"ARGB32", true}, 0, 0x000000FF).cb, 255);
    EXPECT_EQ(OnePixel({"ARGB32", true}, 0, 0x00FF0000).cr, 255);
}

TEST(VecYuvTraits, FullRangeFactorsAreCutTowardsZero) {
    // BT.709: Y = 54 R + 183 G + 18 B; Cb = 128 B - 29 R - 98 G; Cr = 128 R - 116 G - 11 B.
    const Sample s = OnePixel({"ABGR32", true}, 1, 0x0020C864);  // R 100, G 200, B 32
    EXPECT_EQ(s.y, (100 * 54 + 200 * 183 + 32 * 18 + 128) >> 8);
    EXPECT_EQ(s.cb, ((32 * 128 - 100 * 29 - 200 * 98 + 128) >> 8) + 128);
    EXPECT_EQ(s.cr, ((100 * 128 - 200 * 116 - 32 * 11 + 128) >> 8) + 128);
}

TEST(VecYuvTraits, ChromaComesFromEvenPixelsOfTheUpperRow) {
    // One blue pixel among grey ones, at each place of the block in turn.
    for (size_t place = 0; place < 4; ++place) {
        uint32_t pixels[4] = {0x808080, 0x808080, 0x808080, 0x808080};
        pixels[place] = 0x0000FF;
        uint8_t luma[4], cb = 0, cr = 0;
        uint8_t* const planes[3] = {luma, &cb, &cr};
        const uint32_t strides[3] = {2, 1, 1};
        Family{"ARGB32", false}.entry(0)(pixels, 8, planes, strides, 2, 2);
        EXPECT_EQ(cb, place == 0 ? ((255 * 112 + 128) >> 8) + 128 : 128) << place;
        EXPECT_EQ(cr, place == 0 ? ((255 * -18 + 128) >> 8) + 128 : 128) << place;
    }
}

}  // namespace
