#pragma once

// The resize, once more, sample by sample in plain division: where an output sample lies between
// the source samples, and the weighted mean of its neighbours.

#include "kernels/planar_fixture.h"

namespace kernel_test {

/// A position along one axis: 16.16, between two source samples.
struct Position {
    int64_t index;
    int64_t next;
    int64_t weight;  ///< of `next`, in 1/32
};

inline Position PositionAt(int64_t at, int64_t count) {
    at = std::min(std::max<int64_t>(at, 0), (count - 1) * 65536);
    const int64_t index = at / 65536;
    return {index, std::min(index + 1, count - 1), at % 65536 / 2048};
}

/// The distance of output pixels when corners coincide.
inline int64_t ModelStep(int64_t from, int64_t to) {
    return to == 1 ? 0 : (from - 1) * 65536 / (to - 1);
}

/// Output pixel `i` of a line resized from `from` to `to` pixels.
inline Position PixelPosition(int32_t i, int32_t from, int32_t to) {
    return PositionAt(i * ModelStep(from, to), from);
}

/// Output chroma sample `i`, sizes in pixels, two pixels a sample: its centre in the output, half a
/// pixel right of pixel 2i, taken to the source and counted there in chroma samples.
inline Position ChromaPosition(int32_t i, int32_t from, int32_t to) {
    const int64_t step = ModelStep(from, to);
    if (from == to) return {i, i, 0};
    return PositionAt(i * step + (step - 65536) / 4, (from + 1) / 2);
}

/// The mean of four neighbours: down first, rounded to 1/8 of a level, then across, rounded.
/// `sample(x, y)` reads the source.
template <class Sample>
uint8_t RoundedMean(const Position& x, const Position& y, const Sample& sample) {
    const auto down = [&](int64_t at) {
        return ((32 - y.weight) * sample(at, y.index) + y.weight * sample(at, y.next) + 2) / 4;
    };
    return static_cast<uint8_t>(((32 - x.weight) * down(x.index) + x.weight * down(x.next) + 128) /
                                256);
}

/// Reads samples of a plane.
inline auto SampleOf(Plane& plane) {
    return [&plane](int64_t x, int64_t y) {
        return int64_t{plane.at(static_cast<int32_t>(x), static_cast<int32_t>(y))};
    };
}

/// Pairs of sizes: both directions, equal, one pixel, longer than a strip of output columns, more
/// source columns than a strip holds, so much smaller that a strip is one column, and the widest.
struct Resize {
    int32_t w, h, dw, dh;
};
constexpr Resize kResizes[] = {
    {1, 1, 1, 1},       {1, 1, 5, 4},     {2, 2, 2, 2},     {2, 2, 1, 1},     {2, 3, 7, 5},
    {3, 2, 2, 3},       {4, 4, 8, 8},     {8, 8, 4, 4},     {7, 5, 7, 9},     {7, 5, 12, 5},
    {16, 12, 20, 17},   {33, 9, 16, 17},  {24, 16, 24, 16}, {9, 8, 9, 8},     {64, 4, 65, 5},
    {200, 3, 300, 4},   {900, 2, 301, 3}, {600, 3, 7, 2},   {700, 1, 2, 1},   {5, 90, 4, 31},
    {16384, 1, 3, 1},   {18, 50, 18, 50}, {35, 83, 35, 83}, {70, 64, 70, 64}, {43, 9, 64, 16},
    {150, 12, 224, 19},
};

inline testing::Message Describe(const Resize& r) {
    return testing::Message() << r.w << " x " << r.h << " to " << r.dw << " x " << r.dh;
}

}  // namespace kernel_test
