#include "kernels/table_lines.h"

namespace vidshow {
namespace {

constexpr int kEntries = 256;
constexpr int32_t kMost = INT32_MAX;

/// What every entry says of the sum slope x sample + offset: that it lies from `least` to `most`.
struct Bounds {
    int32_t least[kEntries];
    int32_t most[kEntries];

    Bounds(const int32_t* entries, Cut cut) {
        const int32_t unit = 1 << cut.shift;
        for (int i = 0; i < kEntries; ++i) {
            const int32_t entry = entries[i], whole = entry * unit;
            least[i] = entry <= cut.low ? -kMost : entry > 0 ? whole : whole - (unit - 1);
            most[i] = entry >= cut.high ? kMost : entry < 0 ? whole : whole + (unit - 1);
        }
    }
};

/// What is left for the offset at a given slope, and which entries bound it so.
struct Gap {
    int64_t least, most;
    int leastAt, mostAt;
};
Gap OffsetGap(const Bounds& bounds, int64_t slope) {
    Gap gap{INT64_MIN, INT64_MAX, 0, 0};
    for (int i = 0; i < kEntries; ++i) {
        const int64_t least = bounds.least[i] - slope * i, most = bounds.most[i] - slope * i;
        if (least > gap.least) {
            gap.least = least;
            gap.leastAt = i;
        }
        if (most < gap.most) {
            gap.most = most;
            gap.mostAt = i;
        }
    }
    return gap;
}

/// The slope nearest to the one that left such a gap at which its two entries no longer exclude
/// each other.
int64_t SlopeBetween(const Bounds& bounds, const Gap& gap) {
    const int64_t rise = int64_t{bounds.most[gap.mostAt]} - bounds.least[gap.leastAt];
    const int64_t run = gap.mostAt - gap.leastAt;  // not 0: an entry does not exclude itself
    const int64_t slope = rise / run;              // rounded towards zero
    if (rise >= 0 || rise % run == 0) return slope;
    return run > 0 ? slope - 1 : slope + 1;
}

/// That of the entries which the cut has left alone.
int64_t FirstSlope(const int32_t* entries, Cut cut) {
    const auto is_cut = [=](int i) { return entries[i] <= cut.low || entries[i] >= cut.high; };
    int first = 0, last = kEntries - 1;
    while (first < last && is_cut(first))
        ++first;
    while (first < last && is_cut(last))
        --last;
    if (first == last) return 0;
    return int64_t{entries[last] - entries[first]} * (1 << cut.shift) / (last - first);
}

bool HighHalvesAreLine(const uint32_t* table, Line& line) {
    int32_t entries[kEntries];
    for (int i = 0; i < kEntries; ++i)
        entries[i] = static_cast<int16_t>(table[i] >> 16);
    return FindLine(entries, {INT16_MIN, INT16_MAX, kChromaShift}, line);
}

bool LowHalvesAreLine(const uint32_t* table, Line& line) {
    int32_t entries[kEntries];
    for (int i = 0; i < kEntries; ++i)
        entries[i] = static_cast<int16_t>(table[i]);
    return FindLine(entries, {INT32_MIN, INT32_MAX, kChromaShift}, line);
}

}  // namespace

bool FindLine(const int32_t* entries, Cut cut, Line& line) {
    constexpr int kTries = 8;
    const Bounds bounds(entries, cut);
    int64_t slope = FirstSlope(entries, cut);
    for (int i = 0; i < kTries; ++i) {
        const Gap gap = OffsetGap(bounds, slope);
        if (gap.least <= gap.most) {
            const int64_t offset = gap.least + (gap.most - gap.least) / 2;
            line = {static_cast<int32_t>(slope), static_cast<int32_t>(offset)};
            return line.slope == slope;  // the first entry bounds the offset likewise
        }
        slope = SlopeBetween(bounds, gap);
    }
    return false;
}

bool FindTableLines(const uint16_t* luma, const uint32_t* cb, const uint32_t* cr,
                    TableLines& lines) {
    int32_t levels[kEntries];
    for (int i = 0; i < kEntries; ++i)
        levels[i] = luma[i];
    return FindLine(levels, {0, UINT16_MAX, kLumaShift}, lines.luma) &&
           HighHalvesAreLine(cb, lines.blue) && LowHalvesAreLine(cb, lines.cbToGreen) &&
           HighHalvesAreLine(cr, lines.red) && LowHalvesAreLine(cr, lines.crToGreen);
}

}  // namespace vidshow
