// Every lane operation of every back end alone, over its whole domain or over all pairs of edge
// values: comparing whole kernels does not reach what their coefficients never produce.

#include "kernels/vec_ops.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <iterator>
#include <random>
#include <string>
#include <vector>

#include "testkit/random.h"

namespace {

using vec_ops::Ops;

struct Named {
    const char* name;
    const Ops* ops;
    bool runs;
    friend std::ostream& operator<<(std::ostream& out, const Named& n) { return out << n.name; }
};

std::vector<Named> BuiltIn() {
    std::vector<Named> all = {{"scalar", &vec_ops::kScalar, true}};
#ifdef VIDSHOW_VECTOR_NEON
    all.push_back({"neon", &vec_ops::kNeon, true});
#endif
#ifdef VIDSHOW_VECTOR_SSE41
    all.push_back({"sse41", &vec_ops::kSse41, bool(__builtin_cpu_supports("sse4.1"))});
#endif
#ifdef VIDSHOW_VECTOR_AVX2
    all.push_back({"avx2", &vec_ops::kAvx2, bool(__builtin_cpu_supports("avx2"))});
#endif
#ifdef VIDSHOW_VECTOR_AVX512
    all.push_back({"avx512", &vec_ops::kAvx512, bool(__builtin_cpu_supports("avx512bw"))});
#endif
#ifdef VIDSHOW_PORTABLE_AVX512
    all.push_back({"avx512Portable", &vec_ops::kAvx512Portable, true});
#endif
    return all;
}

class VecOps : public testing::TestWithParam<Named> {
  protected:
    void SetUp() override {
        if (!GetParam().runs) GTEST_SKIP() << "this processor cannot run it";
    }
    const Ops& ops() const { return *GetParam().ops; }
    size_t step() const { return static_cast<size_t>(ops().step); }
    std::mt19937 m_random = testkit::Random(3640);
};

int LevelOf(int y, int term) {
    return std::clamp(std::clamp(y + term, -32768, 32767) >> 6, 0, 255);
}
uint8_t Narrowed(int sum, int offset) {
    const int s = static_cast<int16_t>(sum);
    return static_cast<uint8_t>(std::clamp((s + 128) >> 8, -128, 127) + offset);
}

constexpr int kEdgeLuma[][2] = {{0, 0},    {1, 1},     {255, 1},  {1, 63},    {1, 64},   {16, 74},
                                {255, 64}, {128, 128}, {255, 74}, {254, 127}, {255, 128}};

/// Runs `levels` and holds pixel `i` of both its results against the level that is due.
class Levels {
  public:
    explicit Levels(const Ops& ops)
        : luma(static_cast<size_t>(ops.step)),
          chroma(luma.size() / 2),
          m_ops(ops),
          m_bytes(4 * luma.size()),
          m_words(luma.size()) {}

    void Run(const vec_ops::Terms& terms) {
        m_ops.levels(terms, luma.data(), chroma.data(), m_bytes.data(),
                     reinterpret_cast<uint8_t*>(m_words.data()));
    }
    testing::AssertionResult Has(size_t i, int level) const {
        const uint8_t* const bytes = &m_bytes[4 * i];
        if (bytes[0] != level || bytes[1] != level || bytes[2] != level || bytes[3] != 0) {
            return testing::AssertionFailure() << int{bytes[0]} << ", not " << level;
        }
        const int word = level >> 3 << 11 | level >> 2 << 5 | level >> 3;
        if (m_words[i] != word) {
            return testing::AssertionFailure() << "word " << m_words[i] << ", not " << word;
        }
        return testing::AssertionSuccess();
    }

    std::vector<uint8_t> luma, chroma;

  private:
    const Ops& m_ops;
    std::vector<uint8_t> m_bytes;
    std::vector<uint16_t> m_words;
};

TEST_P(VecOps, ChannelOverEveryTermAndEdgesOfLuma) {
    Levels levels(ops());
    for (const auto& [y, gain] : kEdgeLuma) {
        std::fill(levels.luma.begin(), levels.luma.end(), static_cast<uint8_t>(y));
        for (int term = -32768; term <= 16383; ++term) {
            levels.Run({gain, term, 0, 0});
            for (size_t i = 0; i < step(); i += step() - 1) {
                ASSERT_TRUE(levels.Has(i, LevelOf(y * gain, term)))
                    << y << " * " << gain << " + " << term;
            }
        }
    }
}

TEST_P(VecOps, LumaOfEveryByteAndGain) {
    Levels levels(ops());
    for (int gain = 0; gain <= 128; ++gain) {
        for (size_t first = 0; first < 256; first += step()) {
            for (size_t i = 0; i < step(); ++i)
                levels.luma[i] = static_cast<uint8_t>(first + i);
            levels.Run({gain, -5, 0, 0});
            for (size_t i = 0; i < step(); ++i) {
                ASSERT_TRUE(levels.Has(i, LevelOf(levels.luma[i] * gain, -5))) << gain << ' ' << i;
            }
        }
    }
}

TEST_P(VecOps, TermsOfEveryProduct) {
    Levels levels(ops());
    std::fill(levels.luma.begin(), levels.luma.end(), uint8_t{100});
    for (const int offset : {-32768, -18497, -14266, -1, 0, 1, 8676, 16383}) {
        for (int factor = 0; factor < 256; ++factor) {
            for (size_t first = 0; first < 256; first += levels.chroma.size()) {
                for (size_t i = 0; i < levels.chroma.size(); ++i) {
                    levels.chroma[i] = static_cast<uint8_t>(first + i);
                }
                for (const bool add : {true, false}) {
                    levels.Run({74, offset, add ? factor : 0, add ? 0 : factor});
                    for (size_t i = 0; i < step(); ++i) {
                        const int product = levels.chroma[i / 2] * factor;
                        const int term = add ? offset + product : offset - product;
                        if (term < -32768 || term > 32767) continue;  // outside the domain
                        ASSERT_TRUE(levels.Has(i, LevelOf(7400, term)))
                            << offset << (add ? " + " : " - ") << int{levels.chroma[i / 2]} << " * "
                            << factor;
                    }
                }
            }
        }
    }
}

TEST_P(VecOps, PairsAreSplitAndDoubled) {
    std::vector<uint8_t> pairs(step()), out(4 * step());
    testkit::FillSamples(m_random, pairs.data(), pairs.size());
    for (const size_t second : {size_t{0}, size_t{1}}) {
        ops().pairs(pairs.data(), second != 0, out.data());
        for (size_t i = 0; i < step(); ++i) {
            ASSERT_EQ(int{out[4 * i]}, int{pairs[i / 2 * 2 + second]}) << i;
        }
    }
}

uint32_t Packed(vec_ops::Layout layout, uint32_t a, uint32_t b, uint32_t c, uint32_t extra) {
    switch (layout) {
        case vec_ops::k565:
            return a >> 3 << 11 | b >> 2 << 5 | c >> 3;
        case vec_ops::k5551: {
            const uint32_t pixel = a >> 3 << 11 | b >> 3 << 6 | c >> 3 << 1 | 1;
            return pixel == (extra & 0xFFFF) ? 0 : pixel;
        }
        case vec_ops::k888:
            return a | b << 8 | c << 16;
        case vec_ops::k8888:
            return a | b << 8 | c << 16 | extra << 24;
        case vec_ops::kSpread:
            break;
    }
    return a >> 2 << 21 | b >> 2 << 10 | c >> 3;
}

TEST_P(VecOps, StoresOfEveryLevelAtEveryPlace) {
    constexpr size_t kBytes[] = {2, 2, 3, 4, 4};
    std::vector<uint8_t> a(step()), b(step()), c(step()), out(4 * step());
    for (int layout = vec_ops::k565; layout <= vec_ops::kSpread; ++layout) {
        for (int turn = 0; turn < 600; ++turn) {
            for (size_t i = 0; i < step(); ++i) {  // every level in turn, then any
                a[i] =
                    static_cast<uint8_t>(turn < 256 ? static_cast<size_t>(turn) + i : m_random());
                b[i] = static_cast<uint8_t>(turn < 256 ? 255 - a[i] : m_random());
                c[i] = static_cast<uint8_t>(turn < 256 ? a[i] ^ 0x55 : m_random());
            }
            const auto kind = static_cast<vec_ops::Layout>(layout);
            const size_t keyed = static_cast<size_t>(turn) % step();
            const uint32_t extra = Packed(vec_ops::k5551, a[keyed], b[keyed], c[keyed], 0);
            std::fill(out.begin(), out.end(), static_cast<uint8_t>(turn));
            ops().store(kind, a.data(), b.data(), c.data(), static_cast<int>(extra), out.data());
            const size_t bytes = kBytes[layout];
            for (size_t i = 0; i < step(); ++i) {
                uint32_t got = 0;
                std::memcpy(&got, &out[i * bytes], bytes);
                ASSERT_EQ(got, Packed(kind, a[i], b[i], c[i], extra))
                    << "layout " << layout << " pixel " << i;
            }
            for (size_t i = step() * bytes; i < out.size(); ++i) {
                ASSERT_EQ(out[i], static_cast<uint8_t>(turn)) << "stored past the step";
            }
        }
    }
}

constexpr int kLuma[][3] = {{0, 0, 0},     {127, 0, 0},   {0, 254, 0},   {0, 0, 127},
                            {65, 129, 25}, {46, 157, 15}, {54, 183, 18}, {76, 150, 29},
                            {25, 129, 65}, {18, 183, 54}, {29, 150, 76}, {1, 253, 1},
                            {127, 128, 0}, {0, 128, 127}, {60, 128, 67}, {64, 1, 63}};
constexpr int kChroma[][3] = {{0, 0, 0},       {128, 0, 0},     {0, 128, 0},     {0, 0, 128},
                              {112, -74, -38}, {128, -84, -43}, {-18, -94, 112}, {-11, -116, 128},
                              {-127, 128, -1}, {-1, -127, 128}, {128, -1, -127}, {64, 64, -127}};

/// Channels of a word, from the top down: not masked.
struct Channels {
    int a, b, c;
    int Sum(const int (&w)[3]) const { return a * w[0] + b * w[1] + c * w[2]; }
};
Channels ChannelsOf(int word) {
    return {word >> 8, word >> 3 & 0xFF, word << 3 & 0xFF};
}
Channels ChannelsOf(const uint8_t* quad) {
    return {quad[0], quad[1], quad[2]};
}

/// Memory for what a step makes.
struct Made {
    explicit Made(size_t pixels)
        : upper(pixels, 0xA5), lower(pixels, 0xA5), cb(pixels / 2, 0xA5), cr(pixels / 2, 0xA5) {}
    vec_ops::Planes planes() { return {upper.data(), lower.data(), cb.data(), cr.data()}; }
    std::vector<uint8_t> upper, lower, cb, cr;
};

vec_ops::Factors FactorsOf(size_t luma, size_t chroma) {
    vec_ops::Factors f;
    std::copy_n(kLuma[luma % std::size(kLuma)], 3, f.y);
    std::copy_n(kChroma[chroma % std::size(kChroma)], 3, f.cb);
    std::copy_n(kChroma[(chroma + 5) % std::size(kChroma)], 3, f.cr);
    return f;
}

TEST_P(VecOps, LumaOfEveryWord) {
    Made out(step());
    std::vector<uint16_t> words(step());
    const auto* const bytes = reinterpret_cast<const uint8_t*>(words.data());
    for (size_t k = 0; k < std::size(kLuma); ++k) {
        const vec_ops::Factors f = FactorsOf(k, k);
        for (size_t first = 0; first < 65536; first += step()) {
            for (size_t i = 0; i < step(); ++i)
                words[i] = static_cast<uint16_t>(first + i);
            ops().planesOfWords(bytes, f, 16, out.planes());
            for (size_t i = 0; i < step(); ++i) {
                ASSERT_EQ(out.upper[i], Narrowed(ChannelsOf(words[i]).Sum(f.y), 16)) << words[i];
                ASSERT_EQ(out.lower[i], out.upper[i]) << words[i];
            }
        }
    }
}

TEST_P(VecOps, ChromaOfEveryWordLeavesOddOnesOut) {
    Made out(step());
    std::vector<uint16_t> words(step());
    const auto* const bytes = reinterpret_cast<const uint8_t*>(words.data());
    for (size_t k = 0; k < std::size(kChroma); ++k) {
        const vec_ops::Factors f = FactorsOf(k, k);
        for (size_t first = 0; first < 65536; first += step() / 2) {
            for (size_t i = 0; i < step(); ++i) {
                words[i] = static_cast<uint16_t>(i % 2 == 0 ? first + i / 2 : m_random());
            }
            ops().planesOfWords(bytes, f, 128, out.planes());
            for (size_t i = 0; i < step() / 2; ++i) {
                const Channels even = ChannelsOf(words[2 * i]);
                ASSERT_EQ(out.cb[i], Narrowed(even.Sum(f.cb), 128)) << words[2 * i];
                ASSERT_EQ(out.cr[i], Narrowed(even.Sum(f.cr), 128)) << words[2 * i];
            }
        }
    }
}

TEST_P(VecOps, SumsOfQuadsAtTheEdgesAndAnywhere) {
    const size_t pixels = static_cast<size_t>(ops().quadStep);
    Made out(pixels);
    std::vector<uint8_t> quads(4 * pixels);
    for (int turn = 0; turn < 400; ++turn) {
        const int offset = turn % 256;
        for (size_t i = 0; i < quads.size(); ++i) {
            // All corners of the cube with both alphas first, then any bytes.
            quads[i] = turn < 16 ? ((i / 4 + static_cast<size_t>(turn)) >> i % 4 & 1 ? 255 : 0)
                                 : static_cast<uint8_t>(m_random());
        }
        for (size_t k = 0; k < std::max(std::size(kLuma), std::size(kChroma)); ++k) {
            const vec_ops::Factors f = FactorsOf(k, k);
            ops().planesOfQuads(quads.data(), f, offset, out.planes());
            for (size_t i = 0; i < pixels; ++i) {
                ASSERT_EQ(out.upper[i], Narrowed(ChannelsOf(&quads[4 * i]).Sum(f.y), offset)) << i;
                ASSERT_EQ(out.lower[i], out.upper[i]) << i;
            }
            for (size_t i = 0; i < pixels / 2; ++i) {
                const Channels even = ChannelsOf(&quads[8 * i]);
                ASSERT_EQ(out.cb[i], Narrowed(even.Sum(f.cb), offset)) << i;
                ASSERT_EQ(out.cr[i], Narrowed(even.Sum(f.cr), offset)) << i;
            }
        }
    }
}

/// Sums of every size, near every step of the rounding, the one at 32640 included.
TEST_P(VecOps, RoundingAtEveryStep) {
    const size_t pixels = static_cast<size_t>(ops().quadStep);
    Made out(pixels);
    std::vector<uint8_t> quads(4 * pixels);
    constexpr vec_ops::Factors kFactors = {{1, 253, 1}, {0, 0, 0}, {0, 0, 0}};
    for (int sum = 0; sum <= 65025; ++sum) {
        // sum = 253 b + a + c, as near as bytes come
        const int b = std::min(255, sum / 253), a = std::min(255, sum - 253 * b);
        for (size_t i = 0; i < pixels; ++i) {
            quads[4 * i] = static_cast<uint8_t>(a);
            quads[4 * i + 1] = static_cast<uint8_t>(b);
            quads[4 * i + 2] = static_cast<uint8_t>(i);
        }
        ops().planesOfQuads(quads.data(), kFactors, 0, out.planes());
        for (size_t i = 0; i < pixels; i += pixels - 1) {
            ASSERT_EQ(out.upper[i], Narrowed(253 * b + a + static_cast<int>(i), 0)) << sum;
        }
    }
}

TEST_P(VecOps, QuadsOfSpreadPixelsWrapLikeWords) {
    constexpr uint32_t kEdges[] = {0,          1,          0x1F,       0x07E0FC1F,
                                   0xF81F03E0, 0x7FFFFFFF, 0x80000000, 0xFFFFFFFF};
    for (const uint32_t a : kEdges) {
        for (const uint32_t b : kEdges) {
            const uint32_t upper[4] = {a, b, a ^ 0x1234, b + 1}, lower[4] = {b, a, b, a + 5};
            uint32_t out[4];
            ops().average(upper, lower, out);
            for (int i = 0; i < 4; ++i)
                EXPECT_EQ(out[i], (upper[i] + lower[i]) >> 1 & 0x07E0FC1F);
            for (uint32_t w = 0; w <= 32; ++w) {
                ops().blend(upper, lower, out, static_cast<int>(w));
                for (int i = 0; i < 4; ++i) {
                    ASSERT_EQ(out[i], (upper[i] * (32 - w) + lower[i] * w) >> 5 & 0x07E0FC1F) << w;
                }
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Named, VecOps, testing::ValuesIn(BuiltIn()),
                         [](const auto& entry) { return std::string(entry.param.name); });

}  // namespace
