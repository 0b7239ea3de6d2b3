// The x mode: its blocks, what they are chosen by, and that nothing else is touched.

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <vector>

#include "kernels/deinterlace_model.h"
#include "kernels/vec_backend_env.h"

namespace {

using namespace deinterlace_test;

/// A plane as rows of samples.
struct Samples {
    Samples(int width, int height) : w(width), h(height), bytes(static_cast<size_t>(w * h)) {}

    int at(int x, int y) const { return bytes[static_cast<size_t>(y * w + x)]; }
    void set(int x, int y, int v) {
        bytes[static_cast<size_t>(y * w + x)] = static_cast<uint8_t>(v);
    }
    template <typename F>
    void fill(F f) {
        for (int y = 0; y < h; ++y) {
            for (int x = 0; x < w; ++x)
                set(x, y, std::clamp(f(x, y), 0, 255));
        }
    }

    int w, h;
    std::vector<uint8_t> bytes;
};

/// Through the mode with every other plane left out.
Samples Deinterlaced(const Samples& in) {
    Samples out(in.w, in.h);
    QZ_PICTURE src = {}, dst = {};
    Samples copy = in;
    src.plane[0] = copy.bytes.data();
    dst.plane[0] = out.bytes.data();
    src.pitch[0] = dst.pitch[0] = static_cast<uint32_t>(in.w);
    EXPECT_EQ(picture_deinterlace_x(&dst, &src, 0, in.w, in.h), 0);
    return out;
}

/// The five-tap filter, then what it leaves of the sample.
int Rebuilt(int a, int b, int c, int d, int e) {
    const int eighths = 4 * (b + d) + 2 * c - (a + e) + 4;
    const int f = eighths < 0 ? 0 : std::min(eighths / 8, 255);
    return c >= std::min(b, d) && c <= std::max(b, d) ? (5 * f + 3 * c + 4) / 8 : f;
}

/// What the mode promises, sample by sample.
class XModel {
  public:
    explicit XModel(const Samples& in)
        : m_in(in), m_columns((in.w + 7) / 8), m_rows((in.h + 7) / 8) {
        for (int row = 0; row < m_rows; ++row) {
            for (int column = 0; column < m_columns; ++column)
                m_scores.push_back(score(column, row));
        }
    }

    Samples made() const {
        Samples out = m_in;
        for (int y = 1; y < m_in.h; y += 2) {
            for (int x = 0; x < m_in.w; ++x) {
                const int next = highest(x / 8, y / 8, 1), far = highest(x / 8, y / 8, 2);
                const int made = rebuilt(x, y);
                if (next >= 128) {
                    out.set(x, y, made);
                } else if (next >= 96 || far >= 128) {
                    out.set(x, y, (made + m_in.at(x, y)) / 2);
                }
            }
        }
        return out;
    }

    /// 19/16 of the differences within fields off those between lines.
    int score(int column, int row) const {
        const int lines = m_in.h - 2;
        const int first = std::max({0, 8 * row - 8, std::min(8 * row, lines - 8)});
        const int left = std::min(8 * column, m_in.w - 8);
        if (left < 0) return 0;
        int between = 0, within = 0;
        for (int y = first; y < std::min(first + 8, lines); ++y) {
            for (int x = left; x < left + 8; ++x) {
                between += std::abs(m_in.at(x, y) - m_in.at(x, y + 1));
                within += std::abs(m_in.at(x, y) - m_in.at(x, y + 2));
            }
        }
        return std::max(0, between - within - 3 * within / 16);
    }

  private:
    int highest(int column, int row, int reach) const {
        int result = 0;
        for (int y = std::max(0, row - reach); y <= std::min(m_rows - 1, row + reach); ++y) {
            for (int x = std::max(0, column - reach); x <= std::min(m_columns - 1, column + reach);
                 ++x)
                result = std::max(result, m_scores[static_cast<size_t>(y * m_columns + x)]);
        }
        return result;
    }

    int rebuilt(int x, int y) const {
        const bool hasAbove = y >= 2, hasBelow = y + 2 < m_in.h;
        const int b = m_in.at(x, y - 1), c = m_in.at(x, y);
        const int d = y + 1 < m_in.h ? m_in.at(x, y + 1) : b;
        const int a = hasAbove ? m_in.at(x, y - 2) : hasBelow ? m_in.at(x, y + 2) : c;
        const int e = hasBelow ? m_in.at(x, y + 2) : a;
        return Rebuilt(a, b, c, d, e);
    }

    const Samples& m_in;
    int m_columns, m_rows;
    std::vector<int> m_scores;
};

/// Smooth areas, combed ones and noise, at random: every choice and every border between them.
Samples Mixed(std::mt19937& random, int w, int h) {
    Samples s(w, h);
    const int comb = static_cast<int>(random() % 40), from = static_cast<int>(random() % 60),
              noise = 1 + static_cast<int>(random() % 12);
    s.fill([&](int x, int y) {
        const bool combed = x > from && x < from + 40 && y % 2;
        return 60 + 2 * x + y + (combed ? comb : 0) + static_cast<int>(random() % 1024) % noise;
    });
    return s;
}

TEST(DeinterlaceX, EverySizeLikeTheModel) {
    std::mt19937 random = testkit::Random(3470);
    for (int w = 1; w <= 90; w += w < 34 ? 1 : 7) {
        for (int h = 1; h <= 34; ++h) {
            const Samples in = Mixed(random, w, h);
            ASSERT_EQ(Deinterlaced(in).bytes, XModel(in).made().bytes) << w << "x" << h;
        }
    }
}

TEST(DeinterlaceX, WidePicturesGoInStripsOf4096) {
    std::mt19937 random = testkit::Random(3471);
    Samples in(4096 + 40, 20);
    in.fill([&](int x, int y) {
        return 50 + x % 97 + (y % 2 ? static_cast<int>(random() % 2) * (x / 64 % 30) : 0);
    });
    Samples left(4096, 20), right(40, 20);
    left.fill([&](int x, int y) { return in.at(x, y); });
    right.fill([&](int x, int y) { return in.at(x + 4096, y); });
    const Samples madeLeft = XModel(left).made(), madeRight = XModel(right).made();
    Samples expected(in.w, in.h);
    expected.fill(
        [&](int x, int y) { return x < 4096 ? madeLeft.at(x, y) : madeRight.at(x - 4096, y); });
    EXPECT_EQ(Deinterlaced(in).bytes, expected.bytes);
}

TEST(DeinterlaceX, InPlaceIsTheSame) {
    std::mt19937 random = testkit::Random(3472);
    for (const int w : {8, 13, 40, 64, 100}) {
        for (int h = 1; h <= 40; ++h) {
            Samples in = Mixed(random, w, h);
            const Samples expected = Deinterlaced(in);
            QZ_PICTURE picture = {};
            picture.plane[0] = in.bytes.data();
            picture.pitch[0] = static_cast<uint32_t>(w);
            picture_deinterlace_x(&picture, &picture, 0, w, h);
            ASSERT_EQ(in.bytes, expected.bytes) << w << "x" << h;
        }
    }
}

TEST(DeinterlaceX, TouchesExactlyThePlanesOfEveryFormat) {
    std::mt19937 random = testkit::Random(3473);
    for (int chroma = -1; chroma <= 3; ++chroma) {
        const int w = 40, h = 24;
        const uint32_t srcPitch[3] = {47, 50, 41}, dstPitch[3] = {64, 48, 43};
        std::unique_ptr<GuardedBuffer> from[3], to[3];
        QZ_PICTURE src = {}, dst = {};
        int widths[3], heights[3];
        for (int i = 0; i < 3; ++i) {
            widths[i] = i && chroma < 2 ? w / 2 : w;
            heights[i] = i && chroma == 0 ? h / 2 : h;
            const auto bytes = [&](uint32_t pitch) {
                return pitch * static_cast<size_t>(heights[i] - 1) + static_cast<size_t>(widths[i]);
            };
            from[i] = std::make_unique<GuardedBuffer>(bytes(srcPitch[i]));
            to[i] = std::make_unique<GuardedBuffer>(bytes(dstPitch[i]),
                                                    GuardedBuffer::Placement::end, uint8_t{0xEE});
            testkit::FillSamples(random, from[i]->data(), from[i]->size());
            src.plane[i] = from[i]->data();
            src.pitch[i] = srcPitch[i];
            dst.plane[i] = to[i]->data();
            dst.pitch[i] = dstPitch[i];
        }
        EXPECT_EQ(picture_deinterlace_x(&dst, &src, chroma, w, h), 0);
        for (int i = 0; i < 3; ++i) {
            Samples in(widths[i], heights[i]);
            in.fill([&](int x, int y) {
                return int{
                    (*from[i])[static_cast<size_t>(y) * srcPitch[i] + static_cast<size_t>(x)]};
            });
            const Samples expected = XModel(in).made();
            for (size_t k = 0; k < to[i]->size(); ++k) {
                const int x = static_cast<int>(k % dstPitch[i]),
                          y = static_cast<int>(k / dstPitch[i]);
                const bool inside = x < widths[i] && chroma >= 0 && chroma <= 2;
                ASSERT_EQ(int{(*to[i])[k]}, inside ? expected.at(x, y) : 0xEE)
                    << "format " << chroma << " plane " << i << " at " << x << ", " << y;
            }
        }
    }
}

// ---- what it is for
// ------------------------------------------------------------------------------

/// Diagonal stripes and fine detail, standing still.
int Detail(int x, int y) {
    return 128 + (x * 3 + y * 2) % 64 - 32 + ((x / 3 + y / 4) % 2) * 25;
}

TEST(DeinterlaceX, AStillPictureIsKept) {
    Samples in(160, 120);
    in.fill(Detail);
    EXPECT_EQ(Deinterlaced(in).bytes, in.bytes);
}

TEST(DeinterlaceX, ThinLinesOfAStillPictureAreKept) {
    Samples in(64, 64);
    in.fill([](int, int y) { return y == 21 || y == 40 ? 240 : 30; });
    EXPECT_EQ(Deinterlaced(in).bytes, in.bytes);
}

TEST(DeinterlaceX, AFlatAreaIsKept) {
    Samples in(64, 64);
    in.fill([](int, int) { return 77; });
    EXPECT_EQ(Deinterlaced(in).bytes, in.bytes);
}

TEST(DeinterlaceX, CombsAreGoneWhereSomethingMoved) {
    // A bright bar at column 20 in the top field, at column 32 in the bottom field.
    Samples in(96, 64);
    in.fill([](int x, int y) {
        const int left = y % 2 ? 32 : 20;
        return x >= left && x < left + 24 ? 200 : 50;
    });
    const Samples out = Deinterlaced(in);
    for (int y = 2; y < 62; ++y) {
        for (int x = 0; x < 96; ++x) {
            const int top = x >= 20 && x < 44 ? 200 : 50;
            ASSERT_EQ(out.at(x, y), top) << x << ", " << y;
        }
    }
}

TEST(DeinterlaceX, OnlyBlocksNextToMotionAreMadeAnew) {
    Samples in(160, 96);
    in.fill([](int x, int y) {
        const bool moved = x >= 64 && x < 72 && y >= 32 && y < 40;
        return moved && y % 2 ? 255 : Detail(x, y);
    });
    const Samples out = Deinterlaced(in);
    for (int y = 0; y < 96; ++y) {
        for (int x = 0; x < 160; ++x) {
            const bool near = x >= 48 && x < 88 && y >= 16 && y < 56;
            if (!near) {
                ASSERT_EQ(out.at(x, y), in.at(x, y)) << x << ", " << y;
            }
        }
    }
    EXPECT_NE(out.bytes, in.bytes);
}

TEST(DeinterlaceX, TopLinesAreAlwaysKept) {
    std::mt19937 random = testkit::Random(3474);
    Samples in(80, 48);
    in.fill([&](int, int) { return static_cast<int>(random() % 256); });
    const Samples out = Deinterlaced(in);
    for (int y = 0; y < 48; y += 2) {
        for (int x = 0; x < 80; ++x)
            ASSERT_EQ(out.at(x, y), in.at(x, y));
    }
}

TEST(DeinterlaceX, NoFlickerOnAStillSceneWithSensorNoise) {
    std::mt19937 random = testkit::Random(3475);
    std::normal_distribution<double> noise(0, 2);
    int changed = 0;
    for (int picture = 0; picture < 50; ++picture) {
        Samples in(128, 96);
        in.fill([&](int x, int y) {
            return 60 + x / 2 + (y / 6 % 2) * 30 + static_cast<int>(std::lround(noise(random)));
        });
        changed += Deinterlaced(in).bytes != in.bytes;
    }
    EXPECT_EQ(changed, 0);
}

// ---- blocks
// --------------------------------------------------------------------------------------

constexpr int kPitch = 40;

/// A plane around a block at (8, 8), with the lines that its kernels read and nothing behind them.
struct BlockTest : testing::Test {
    BlockTest() : in(kPitch, 26), m_out(kPitch, 26) {
        std::mt19937 random = testkit::Random(3476);
        in.fill([&](int, int) { return static_cast<int>(random() % 256); });
    }
    const uint8_t* block() const { return &in.bytes[8 * kPitch + 8]; }
    uint8_t* target() { return &m_out.bytes[8 * kPitch + 8]; }

    /// Only samples of `w` x `h` are made, top lines as they were, bottom lines by `f`.
    template <typename F>
    void expectMade(int w, int h, F f) {
        for (int y = 0; y < 26; ++y) {
            for (int x = 0; x < kPitch; ++x) {
                const bool inside = x >= 8 && x < 8 + w && y >= 8 && y < 8 + h;
                const int expected = !inside ? 0 : y % 2 ? f(x, y) : in.at(x, y);
                ASSERT_EQ(m_out.at(x, y), expected) << x << ", " << y;
            }
        }
    }
    int filtered(int x, int y, int above, int below) const {
        const auto line = [&](int to, int instead) {
            return in.at(x, to >= 8 - above && to < 16 + below ? to : instead);
        };
        const int b = in.at(x, y - 1), d = line(y + 1, y - 1);
        const int a = line(y - 2, y + 2), e = line(y + 2, y - 2);
        return Rebuilt(a, b, in.at(x, y), d, e);
    }

    Samples in;
    Samples m_out;
};

TEST_F(BlockTest, DetectIsTheScoreOfTheBlock) {
    const XModel model(in);
    EXPECT_EQ(XDeint8x8Detect(block(), kPitch), model.score(1, 1));
    Samples comb(16, 20);
    comb.fill([](int, int y) { return y % 2 ? 255 : 0; });
    EXPECT_EQ(XDeint8x8Detect(comb.bytes.data(), 16), 64 * 255);
    comb.fill([](int, int y) { return 10 * y; });
    EXPECT_EQ(XDeint8x8Detect(comb.bytes.data(), 16), 0);
    comb.fill([](int x, int y) { return x >= 8 && y % 2 ? 9 : 0; });
    EXPECT_EQ(XDeintNxNDetect(comb.bytes.data(), 16, 8, 16), 0);
    EXPECT_EQ(XDeintNxNDetect(comb.bytes.data(), 16, 16, 16), 64 * 9) << "the highest of them";
}

TEST_F(BlockTest, FrameCopies) {
    EXPECT_EQ(XDeintNxNFrame(target(), kPitch, block(), kPitch, 16, 16), 0);
    expectMade(16, 16, [&](int x, int y) { return in.at(x, y); });
}

TEST_F(BlockTest, FieldMakesBottomLinesAnew) {
    EXPECT_EQ(XDeint8x8Field(target(), kPitch, block(), kPitch), 0);
    expectMade(8, 8, [&](int x, int y) { return filtered(x, y, 2, 2); });
}

TEST_F(BlockTest, LargerFieldsAreTheSame) {
    EXPECT_EQ(XDeintNxNField(target(), kPitch, block(), kPitch, 24, 16), 0);
    expectMade(24, 16, [&](int x, int y) { return filtered(x, y, 2, 10); });
}

TEST_F(BlockTest, FieldAtTheEdgesMirrors) {
    for (int above = 0; above <= 2; ++above) {
        for (int below = 0; below <= 2; ++below) {
            m_out.fill([](int, int) { return 0; });
            EXPECT_EQ(XDeint8x8FieldE(target(), kPitch, block(), kPitch, above, below), 0);
            expectMade(8, 8, [&](int x, int y) { return filtered(x, y, above, below); });
        }
    }
}

TEST_F(BlockTest, MergeAveragesOldAndNew) {
    EXPECT_EQ(XDeint8x8Merge(target(), kPitch, block(), kPitch), 0);
    expectMade(8, 8, [&](int x, int y) { return (filtered(x, y, 2, 2) + in.at(x, y)) / 2; });
}

}  // namespace
