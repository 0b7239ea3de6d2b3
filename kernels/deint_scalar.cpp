// The plain form of deinterlacing's line operations.

#include <cstring>

#include "kernels/deint_backend.h"

namespace vidshow {
namespace {

constexpr int32_t kColumns = 8;

/// Truncating averages of eight bytes at once: what both have in common, and half of the rest,
/// shifted without letting a byte's low bit fall into its neighbour.
uint64_t AverageWord(uint64_t a, uint64_t b) {
    constexpr uint64_t kAllButLowBits = 0xFEFEFEFEFEFEFEFE;
    return (a & b) + (((a ^ b) & kAllButLowBits) >> 1);
}

void AverageLine(uint8_t* dst, const uint8_t* a, const uint8_t* b, int32_t count) {
    int32_t i = 0;
    for (; i + 8 <= count; i += 8) {
        uint64_t x, y;
        std::memcpy(&x, a + i, sizeof x);
        std::memcpy(&y, b + i, sizeof y);
        x = AverageWord(x, y);
        std::memcpy(dst + i, &x, sizeof x);
    }
    for (; i < count; ++i)
        dst[i] = static_cast<uint8_t>((a[i] + b[i]) >> 1);
}

/// The lines of the filter at one column.
struct Taps {
    int a, b, c, d, e;
};

int Filtered(const Taps& t) {
    const int x = (4 * (t.b + t.d) + 2 * t.c - (t.a + t.e) + 4) >> 3;
    return x < 0 ? 0 : x > 255 ? 255 : x;
}

int Rebuilt(const Taps& t) {
    const int f = Filtered(t);
    const bool between = t.b < t.d ? t.b <= t.c && t.c <= t.d : t.d <= t.c && t.c <= t.b;
    return between ? (5 * f + 3 * t.c + 4) >> 3 : f;
}

int HalfRebuilt(const Taps& t) {
    return (Rebuilt(t) + t.c) >> 1;
}

/// `kept`, if there is one, receives the middle line. A group reads all that it needs before it
/// writes: narrow planes have groups that reach into the lines below.
template <int (*kMake)(const Taps& t)>
void MakeLine(uint8_t* dst, const uint8_t* a, const uint8_t* b, const uint8_t* c, const uint8_t* d,
              const uint8_t* e, int32_t count, uint8_t* kept) {
    for (int32_t i = 0; i < count; i += kColumns) {
        const int32_t columns = count - i < kColumns ? count - i : kColumns;
        uint8_t out[kColumns];
        for (int32_t k = i; k < i + columns; ++k)
            out[k - i] = static_cast<uint8_t>(kMake({a[k], b[k], c[k], d[k], e[k]}));
        const size_t bytes = static_cast<size_t>(columns);
        if (kept != nullptr) std::memcpy(kept + i, c + i, bytes);
        std::memcpy(dst + i, out, bytes);
    }
}

template <int (*kMake)(const Taps& t)>
void FilterLine(uint8_t* dst, const uint8_t* a, const uint8_t* b, const uint8_t* c,
                const uint8_t* d, const uint8_t* e, int32_t count) {
    MakeLine<kMake>(dst, a, b, c, d, e, count, nullptr);
}

void FilterInPlace(uint8_t* kept, const uint8_t* b, uint8_t* c, const uint8_t* d, const uint8_t* e,
                   int32_t count) {
    MakeLine<Filtered>(c, kept, b, c, d, e, count, kept);
}

/// Sum of absolute differences over the width of a block.
int Difference(const uint8_t* a, const uint8_t* b) {
    int sum = 0;
    for (int32_t i = 0; i < kColumns; ++i)
        sum += a[i] < b[i] ? b[i] - a[i] : a[i] - b[i];
    return sum;
}

void Scores(const uint8_t* src, size_t pitch, int32_t blocks, int32_t lines, uint16_t* scores) {
    for (int32_t block = 0; block < blocks; ++block, src += kColumns) {
        int between = 0, within = 0;
        for (int32_t line = 0; line < lines; ++line) {
            const uint8_t* const row = src + pitch * static_cast<size_t>(line);
            between += Difference(row, row + pitch);
            within += Difference(row, row + 2 * pitch);
        }
        const int score = between - within - (3 * within >> 4);
        scores[block] = static_cast<uint16_t>(score < 0 ? 0 : score);
    }
}

}  // namespace

constexpr DeintBackend kScalarDeint = {AverageLine,         FilterLine<Filtered>,    FilterInPlace,
                                       FilterLine<Rebuilt>, FilterLine<HalfRebuilt>, Scores};

}  // namespace vidshow
