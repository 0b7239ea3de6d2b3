#include "kernels/luma_line.h"

#include <algorithm>

namespace vidshow {
namespace {

constexpr int kEntries = 256;
constexpr int kTop = 65535;
constexpr int64_t kUnit = int64_t{1} << kLineShift;

/// The entries that the clamp has left alone, as far as that shows.
struct Range {
    int first, last;
};
Range Unclamped(const uint16_t* table) {
    Range range{0, kEntries - 1};
    while (range.first < kEntries && table[range.first] == 0)
        ++range.first;
    while (range.last > range.first && table[range.last] == kTop)
        --range.last;
    return range;
}

/// With a given slope entry i bounds the offset: from below so that the sum reaches the entry, from
/// above so that it does not pass it. These are the entries that do so most.
struct Bounds {
    int64_t below, above;
    int belowAt, aboveAt;
};
Bounds OffsetBounds(const uint16_t* table, Range range, int64_t slope) {
    Bounds bounds{INT64_MIN, INT64_MAX, 0, 0};
    for (int i = range.first; i <= range.last; ++i) {
        const int64_t reach = table[i] * kUnit - slope * i;
        if (reach > bounds.below) {
            bounds.below = reach;
            bounds.belowAt = i;
        }
        if (reach < bounds.above) {
            bounds.above = reach;
            bounds.aboveAt = i;
        }
    }
    bounds.above += kUnit - 1;
    return bounds;
}

bool GivesAll(const uint16_t* table, int64_t slope, int64_t offset) {
    for (int i = 0; i < kEntries; ++i) {
        const int64_t sum = slope * i + offset;
        if (sum > INT32_MAX || sum < INT32_MIN) return false;
        if (std::clamp<int64_t>(sum >> kLineShift, 0, kTop) != table[i]) return false;
    }
    return true;
}

}  // namespace

bool FindLumaLine(const uint16_t* table, LumaLine& line) {
    constexpr int kTries = 8;  // the engine's tables take up to six, most of them two
    const Range range = Unclamped(table);
    if (range.first >= range.last) return false;
    int64_t slope = (table[range.last] - table[range.first]) * kUnit / (range.last - range.first);
    for (int i = 0; i < kTries; ++i) {
        const Bounds bounds = OffsetBounds(table, range, slope);
        if (bounds.below <= bounds.above) {
            const int64_t offset = (bounds.below + bounds.above) >> 1;
            if (!GivesAll(table, slope, offset)) return false;
            line = {static_cast<int32_t>(slope), static_cast<int32_t>(offset)};
            return true;
        }
        // The two entries that exclude each other do so up to the slope between them.
        const int64_t rise = table[bounds.aboveAt] * kUnit + kUnit - 1 -  //
                             table[bounds.belowAt] * kUnit;
        const int64_t run = bounds.aboveAt - bounds.belowAt;
        if (run == 0) return false;
        slope = rise / run;  // rounded towards zero, where the bound may call for one step more
        if (rise < 0 && rise % run != 0) slope += run > 0 ? -1 : 1;
    }
    return false;
}

}  // namespace vidshow
