#pragma once

// Spread pixels and the line resamplers once more, channel by channel in plain division.

#include <vector>

#include "kernels/rgb_model.h"

namespace kernel_test {

/// The channels of a pixel at 6, 6 and 5 bits, or of a weighted sum of such pixels.
struct Channels {
    uint32_t red, green, blue;
};

inline Channels Split(uint32_t spread) {
    return {spread / 2097152 % 64, spread / 1024 % 64, spread % 32};
}

inline uint32_t Join(const Channels& c) {
    return c.red * 2097152 + c.green * 1024 + c.blue;
}

inline Channels Weigh(const Channels& a, uint32_t weightA, const Channels& b, uint32_t weightB) {
    return {a.red * weightA + b.red * weightB, a.green * weightA + b.green * weightB,
            a.blue * weightA + b.blue * weightB};
}

inline Channels Divide(const Channels& sum, uint32_t total) {
    return {sum.red / total, sum.green / total, sum.blue / total};
}

inline Channels ModelSpread(Processor& p, uint8_t y, uint8_t cb, uint8_t cr) {
    const Levels l = ModelLevels(p, y, cb, cr);
    return {ModelChannel(l.red, 6), ModelChannel(l.green, 6), ModelChannel(l.blue, 5)};
}

/// The pixel of a sum whose weights add to `total`. RGB565 drops the lowest bit of red; at 8 bits
/// the 6-bit channels gain two bits and blue three, out of the sum's fraction.
inline uint32_t PackSum(Format format, const Channels& sum, uint32_t total) {
    if (format == Format::rgb565) {
        return sum.red / total / 2 * 2048 + sum.green / total * 32 + sum.blue / total;
    }
    const uint32_t rgb =
        sum.red * 4 / total * 65536 + sum.green * 4 / total * 256 + sum.blue * 8 / total;
    return format == Format::argb32 ? kAlpha * 16777216 + rgb : rgb;
}

using ModelLine = std::vector<Channels>;

inline int32_t ModelStep(int32_t from, int32_t to) {
    return (from - 1) * 65536 / (to - 1);
}

/// Bilinear output `x`. What lies behind the line has no weight.
inline uint32_t BilinearAt(Format format, const ModelLine& line, int32_t step, int32_t x) {
    const int64_t p = int64_t{x} * step;
    const size_t i = static_cast<size_t>(p / 65536);
    const uint32_t weight = static_cast<uint32_t>(p % 65536 / 2048);
    const Channels right = i + 1 < line.size() ? line[i + 1] : Channels{};
    return PackSum(format, Weigh(line.at(i), 32 - weight, right, weight), 32);
}

/// One output pixel of a fixed ratio: weights on the pixels of a pair and the one behind it.
struct FixedTap {
    uint32_t a, b, c;
};

constexpr FixedTap kTwoToThree[] = {{1, 0, 0}, {11, 21, 0}, {0, 21, 11}};
constexpr FixedTap kTwoToFive[] = {{1, 0, 0}, {5, 3, 0}, {7, 25, 0}, {0, 13, 3}, {0, 19, 13}};

/// Output `x` of a fixed ratio. Taps that would reach behind the line repeat its last pixel.
template <size_t kTaps>
uint32_t FixedAt(Format format, const ModelLine& line, const FixedTap (&taps)[kTaps], int32_t x) {
    const FixedTap& tap = taps[static_cast<size_t>(x) % kTaps];
    const size_t first = static_cast<size_t>(x) / kTaps * 2;
    if (tap.c != 0 && first + 2 >= line.size()) return PackSum(format, line.back(), 1);
    Channels sum = Weigh(line.at(first), tap.a, line.at(first + 1), tap.b);
    if (tap.c != 0) sum = Weigh(sum, 1, line.at(first + 2), tap.c);
    return PackSum(format, sum, tap.a + tap.b + tap.c);
}

/// A source row, converted with the given chroma row.
inline ModelLine ModelRow(Processor& p, Picture420& s, int32_t w, int32_t row, int32_t chromaRow) {
    ModelLine line;
    for (int32_t x = 0; x < w; ++x) {
        line.push_back(
            ModelSpread(p, s.y.at(x, row), s.cb.at(x / 2, chromaRow), s.cr.at(x / 2, chromaRow)));
    }
    return line;
}

inline ModelLine BlendLines(const ModelLine& upper, const ModelLine& lower, uint32_t weight) {
    ModelLine line;
    for (size_t i = 0; i < upper.size(); ++i) {
        line.push_back(Divide(Weigh(upper[i], 32 - weight, lower[i], weight), 32));
    }
    return line;
}

}  // namespace kernel_test
