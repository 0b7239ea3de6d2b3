// Averages of two lines, and the five-tap filter across lines.

#include "kernels/deinterlace_lines.h"

#include <cstddef>
#include <cstring>

#include "vidshow/kernels.h"

namespace vidshow {
namespace {

/// Truncating averages of eight bytes at once: what both have in common, and half of the rest,
/// shifted without letting a byte's low bit fall into its neighbour.
uint64_t AverageWord(uint64_t a, uint64_t b) {
    constexpr uint64_t kAllButLowBits = 0xFEFEFEFEFEFEFEFE;
    return (a & b) + (((a ^ b) & kAllButLowBits) >> 1);
}

/// A step reads all that it needs before it writes: lines that overlap depend on its length.
template <size_t kWords>
void AverageStep(uint8_t* dst, const uint8_t* a, const uint8_t* b) {
    uint64_t x[kWords], y[kWords];
    std::memcpy(x, a, sizeof x);
    std::memcpy(y, b, sizeof y);
    for (size_t i = 0; i < kWords; ++i)
        x[i] = AverageWord(x[i], y[i]);
    std::memcpy(dst, x, sizeof x);
}

uint8_t Filter(int a, int b, int c, int d, int e) {
    const int x = (4 * (b + d) + 2 * c - (a + e) + 4) >> 3;
    return static_cast<uint8_t>(x < 0 ? 0 : x > 255 ? 255 : x);
}

/// Calls `step(first byte, bytes)` for whole groups and then for what is left.
template <typename Step>
void InGroups(int32_t count, Step step) {
    int32_t i = 0;
    for (; i + kFilterGroup <= count; i += kFilterGroup)
        step(i, kFilterGroup);
    if (i < count) step(i, count - i);
}

/// Sum of absolute differences over the width of a block.
int Difference(const uint8_t* a, const uint8_t* b) {
    int sum = 0;
    for (int32_t i = 0; i < kBlock; ++i)
        sum += a[i] < b[i] ? b[i] - a[i] : a[i] - b[i];
    return sum;
}

/// Bytes of whole groups, at least one.
int32_t WholeGroups(int32_t size) {
    return size < kFilterGroup ? kFilterGroup : size / kFilterGroup * kFilterGroup;
}

}  // namespace

void FilterLine(uint8_t* dst, const uint8_t* a, const uint8_t* b, const uint8_t* c,
                const uint8_t* d, const uint8_t* e, int32_t count) {
    InGroups(count, [&](int32_t i, int32_t bytes) {
        uint8_t out[kFilterGroup];
        for (int32_t k = 0; k < bytes; ++k)
            out[k] = Filter(a[i + k], b[i + k], c[i + k], d[i + k], e[i + k]);
        std::memcpy(dst + i, out, static_cast<size_t>(bytes));
    });
}

void FilterLineInPlace(uint8_t* kept, const uint8_t* b, uint8_t* c, const uint8_t* d,
                       const uint8_t* e, int32_t count) {
    InGroups(count, [&](int32_t i, int32_t bytes) {
        uint8_t out[kFilterGroup];
        for (int32_t k = 0; k < bytes; ++k)
            out[k] = Filter(kept[i + k], b[i + k], c[i + k], d[i + k], e[i + k]);
        std::memcpy(kept + i, c + i, static_cast<size_t>(bytes));
        std::memcpy(c + i, out, static_cast<size_t>(bytes));
    });
}

void FilterHalfLine(uint8_t* dst, const uint8_t* a, const uint8_t* b, const uint8_t* c,
                    const uint8_t* d, const uint8_t* e, int32_t count) {
    for (int32_t i = 0; i < count; ++i)
        dst[i] = static_cast<uint8_t>((Filter(a[i], b[i], c[i], d[i], e[i]) + c[i]) >> 1);
}

void CombScores(const uint8_t* src, size_t pitch, int32_t blocks, int32_t lines, uint16_t* scores) {
    for (int32_t block = 0; block < blocks; ++block, src += kBlock) {
        int between = 0, within = 0;
        for (int32_t line = 0; line < lines; ++line) {
            const uint8_t* const row = src + pitch * static_cast<size_t>(line);
            between += Difference(row, row + pitch);
            within += Difference(row, row + 2 * pitch);
        }
        const int score = between - within - within / 4;
        scores[block] = static_cast<uint16_t>(score < 0 ? 0 : score);
    }
}

}  // namespace vidshow

extern "C" int32_t MergeGeneric(uint8_t* dst, const uint8_t* a, const uint8_t* b, int32_t count) {
    int32_t i = 0;
    for (; i + 8 <= count; i += 8)
        vidshow::AverageStep<1>(dst + i, a + i, b + i);
    for (; i < count; ++i)
        dst[i] = static_cast<uint8_t>((a[i] + b[i]) >> 1);
    return 0;
}

// Sixteen bytes a step while the count falls by eight: clients rely on the spill.
extern "C" int32_t MergeNeon(uint8_t* dst, const uint8_t* a, const uint8_t* b, int32_t count) {
    for (; count > 0; count -= 8, dst += 16, a += 16, b += 16)
        vidshow::AverageStep<2>(dst, a, b);
    return 0;
}

extern "C" int32_t deinterlace_line(uint8_t* dst, const uint8_t* a, const uint8_t* b,
                                    const uint8_t* c, const uint8_t* d, const uint8_t* e,
                                    int32_t size) {
    vidshow::FilterLine(dst, a, b, c, d, e, vidshow::WholeGroups(size));
    return 0;
}

extern "C" int32_t deinterlace_line_inplace(uint8_t* buf, const uint8_t* b, uint8_t* c,
                                            const uint8_t* d, const uint8_t* e, int32_t size) {
    vidshow::FilterLineInPlace(buf, b, c, d, e, vidshow::WholeGroups(size));
    return 0;
}
