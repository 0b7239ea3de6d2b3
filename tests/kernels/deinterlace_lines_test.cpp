// The exported line operations: merges and the five-tap filter.

#include <gtest/gtest.h>

#include <memory>

#include "kernels/deinterlace_model.h"
#include "kernels/vec_backend_env.h"

namespace {

using namespace deinterlace_test;

constexpr int kPairs = 256 * 256;

/// Every pair of samples, as two lines.
void FillPairs(std::vector<uint8_t>& a, std::vector<uint8_t>& b) {
    for (int i = 0; i < kPairs; ++i) {
        a.push_back(static_cast<uint8_t>(i >> 8));
        b.push_back(static_cast<uint8_t>(i));
    }
}

TEST(DeinterlaceMerge, AveragesAreTruncatedForEveryPair) {
    std::vector<uint8_t> a, b, out(2 * kPairs), twice(2 * kPairs);
    FillPairs(a, b);
    EXPECT_EQ(MergeGeneric(out.data(), a.data(), b.data(), kPairs), 0);
    EXPECT_EQ(MergeNeon(twice.data(), a.data(), b.data(), kPairs / 2), 0);
    for (size_t i = 0; i < kPairs; ++i) {
        ASSERT_EQ(out[i], (a[i] + b[i]) / 2) << i;
        ASSERT_EQ(twice[i], out[i]) << i;
    }
}

TEST(DeinterlaceMerge, GenericWritesExactlyItsCount) {
    std::mt19937 random = testkit::Random(3410);
    for (int count = 0; count <= 300; count += count < 140 ? 1 : 13) {
        const size_t n = static_cast<size_t>(count);
        GuardedBuffer a(n), b(n), out(n + 64);
        testkit::FillSamples(random, a.data(), n);
        testkit::FillSamples(random, b.data(), n);
        std::memset(out.data(), 0xEE, n + 64);
        GuardedBuffer exact(n);
        MergeGeneric(out.data(), a.data(), b.data(), count);
        MergeGeneric(exact.data(), a.data(), b.data(), count);
        for (size_t i = 0; i < n + 64; ++i) {
            ASSERT_EQ(out[i], i < n ? (a[i] + b[i]) / 2 : 0xEE) << count << " at " << i;
            if (i < n) {
                ASSERT_EQ(exact[i], out[i]);
            }
        }
    }
    uint8_t byte = 7;
    MergeGeneric(&byte, &byte, &byte, -1);
    EXPECT_EQ(byte, 7);
}

TEST(DeinterlaceMerge, NeonGoesAboutTwiceAsFar) {
    std::mt19937 random = testkit::Random(3411);
    for (int count = -3; count <= 150; ++count) {
        const size_t bytes = count <= 0 ? 0 : static_cast<size_t>((count + 7) / 8 * 16);
        GuardedBuffer a(bytes), b(bytes), out(bytes);
        testkit::FillSamples(random, a.data(), bytes);
        testkit::FillSamples(random, b.data(), bytes);
        MergeNeon(out.data(), a.data(), b.data(), count);
        for (size_t i = 0; i < bytes; ++i)
            ASSERT_EQ(out[i], (a[i] + b[i]) / 2) << count << " at " << i;
    }
}

// Steps of eight and sixteen bytes: lines that overlap by less see what was written before.
TEST(DeinterlaceMerge, OverlappingLinesGoUpwardsStepByStep) {
    std::mt19937 random = testkit::Random(3412);
    for (const int step : {8, 16}) {
        for (int distance = -70; distance <= 140; ++distance) {
            std::vector<uint8_t> memory(600), expected;
            testkit::FillSamples(random, memory.data(), memory.size());
            expected = memory;
            const size_t a = 100, b = 180, to = static_cast<size_t>(100 + distance);
            const int count = 128;
            for (int i = 0; i < count; i += step) {
                uint8_t out[16];
                for (int k = 0; k < step; ++k) {
                    const size_t at = static_cast<size_t>(i + k);
                    out[k] = static_cast<uint8_t>((expected[a + at] + expected[b + at]) / 2);
                }
                std::copy(out, out + step, expected.begin() + static_cast<ptrdiff_t>(to) + i);
            }
            if (step == 8) {
                MergeGeneric(&memory[to], &memory[a], &memory[b], count);
            } else {
                MergeNeon(&memory[to], &memory[a], &memory[b], count / 2);
            }
            ASSERT_EQ(memory, expected) << "steps of " << step << ", distance " << distance;
        }
    }
}

uint8_t Filtered(int a, int b, int c, int d, int e) {
    const int eighths = 4 * (b + d) + 2 * c - (a + e) + 4;
    return static_cast<uint8_t>(eighths < 0 ? 0 : std::min(eighths / 8, 255));
}

TEST(DeinterlaceLine, EveryCombinationOfExtremesAndMiddles) {
    constexpr int kLevels[] = {0, 1, 2, 127, 128, 254, 255};
    std::vector<uint8_t> line[5];
    for (int i = 0; i < 7 * 7 * 7 * 7 * 7; ++i) {
        for (int tap = 0, rest = i; tap < 5; ++tap, rest /= 7)
            line[tap].push_back(static_cast<uint8_t>(kLevels[rest % 7]));
    }
    const int size = static_cast<int>(line[0].size());
    std::vector<uint8_t> out(line[0].size());
    EXPECT_EQ(deinterlace_line(out.data(), line[0].data(), line[1].data(), line[2].data(),
                               line[3].data(), line[4].data(), size),
              0);
    for (size_t i = 0; i < line[0].size() / 8 * 8; ++i) {
        ASSERT_EQ(out[i], Filtered(line[0][i], line[1][i], line[2][i], line[3][i], line[4][i]))
            << i;
    }
}

/// Five lines that end at an unmapped page.
struct Lines {
    Lines(std::mt19937& random, size_t bytes) {
        for (auto& l : line) {
            l = std::make_unique<GuardedBuffer>(bytes);
            testkit::FillSamples(random, l->data(), bytes);
        }
    }
    uint8_t* operator[](int i) { return line[i]->data(); }
    std::unique_ptr<GuardedBuffer> line[5];
};

size_t Groups(int size) {
    return static_cast<size_t>(std::max(size / 8, 1)) * 8;
}

TEST(DeinterlaceLine, WholeGroupsButAtLeastOne) {
    std::mt19937 random = testkit::Random(3413);
    for (int size = -9; size <= 150; ++size) {
        const size_t bytes = Groups(size);
        Lines in(random, bytes);
        GuardedBuffer out(bytes);
        deinterlace_line(out.data(), in[0], in[1], in[2], in[3], in[4], size);
        for (size_t i = 0; i < bytes; ++i) {
            ASSERT_EQ(out[i], Filtered(in[0][i], in[1][i], in[2][i], in[3][i], in[4][i]))
                << size << " at " << i;
        }
    }
}

TEST(DeinterlaceLine, InPlaceKeepsTheUnfilteredLine) {
    std::mt19937 random = testkit::Random(3414);
    for (int size = -9; size <= 150; ++size) {
        const size_t bytes = Groups(size);
        Lines in(random, bytes);
        const std::vector<uint8_t> a(in[0], in[0] + bytes), c(in[2], in[2] + bytes);
        EXPECT_EQ(deinterlace_line_inplace(in[0], in[1], in[2], in[3], in[4], size), 0);
        for (size_t i = 0; i < bytes; ++i) {
            ASSERT_EQ(in[2][i], Filtered(a[i], in[1][i], c[i], in[3][i], in[4][i]))
                << size << " at " << i;
            ASSERT_EQ(in[0][i], c[i]);
        }
    }
}

TEST(DeinterlaceLine, InPlaceTheLinesBelowMayBeTheLineItself) {
    std::mt19937 random = testkit::Random(3415);
    for (const int size : {8, 16, 40, 72, 136}) {
        const size_t bytes = Groups(size);
        Lines in(random, bytes);
        const std::vector<uint8_t> a(in[0], in[0] + bytes), c(in[2], in[2] + bytes);
        deinterlace_line_inplace(in[0], in[1], in[2], in[2], in[2], size);
        for (size_t i = 0; i < bytes; ++i)
            ASSERT_EQ(in[2][i], Filtered(a[i], in[1][i], c[i], c[i], c[i])) << size << " at " << i;
    }
}

}  // namespace
