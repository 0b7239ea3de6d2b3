#include "kernels/table_lines.h"

#include <algorithm>
#include <atomic>
#include <cstring>

namespace vidshow {
namespace {

constexpr int kEntries = 256;
constexpr int kUnitBits = 15;
constexpr int64_t kUnit = 1 << kUnitBits;
constexpr int64_t kMost = kUnit << 24;  // beyond all heights, and room for sums with it

/// What every entry says of the line's height there, in 1/32768: that it lies from `least` to
/// `most`. And how far the line runs uncut.
struct Bounds {
    int64_t least[kEntries];
    int64_t most[kEntries];
    int first = 0, last = kEntries - 1;

    // Entries of 0 and 65535 say only that the line reaches them.
    explicit Bounds(const uint16_t* entries) {
        for (int i = 0; i < kEntries; ++i) {
            const int64_t height = entries[i] * kUnit;
            least[i] = entries[i] == 0 ? -kMost : height;
            most[i] = entries[i] == UINT16_MAX ? kMost : height + kUnit - 1;
        }
        const auto is_cut = [=](int i) { return entries[i] == 0 || entries[i] == UINT16_MAX; };
        while (first < last && is_cut(first))
            ++first;
        while (first < last && is_cut(last))
            --last;
    }
    explicit Bounds(const int16_t* entries) {
        for (int i = 0; i < kEntries; ++i) {
            const int64_t height = entries[i] * kUnit;
            least[i] = entries[i] > 0 ? height : height - kUnit;
            most[i] = entries[i] < 0 ? height - 1 : height + kUnit - 1;
        }
    }

    /// That of the entries which the cut has left alone.
    int64_t Slope() const {
        return first == last ? 0 : (most[last] - most[first]) / (last - first);
    }
};

/// What is left for the height of sample 0 at a given slope, and which entries bound it so.
struct Gap {
    int64_t least, most;
    int leastAt, mostAt;
};
Gap HeightGap(const Bounds& bounds, int64_t slope) {
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
    const int64_t rise = bounds.most[gap.mostAt] - bounds.least[gap.leastAt];
    const int64_t run = gap.mostAt - gap.leastAt;  // not 0: an entry does not exclude itself
    const int64_t slope = rise / run;              // rounded towards zero
    if (rise >= 0 || rise % run == 0) return slope;
    return run > 0 ? slope - 1 : slope + 1;
}

/// The line of a slope in words, at a height within the gap. The smallest phase that comes to lie
/// there leaves the most room for the rise. @return whether there is one
bool PutInWords(int64_t slope, const Gap& gap, Line& line) {
    constexpr int64_t kMostPhase = kUnit - kEntries;
    const int64_t fraction = slope & (kUnit - 1);
    for (int64_t phase = 0; phase <= kMostPhase; ++phase) {
        const int64_t highest = gap.most - phase * fraction;
        if ((highest & (kUnit - 1)) > gap.most - gap.least) continue;
        line = {static_cast<int32_t>(slope >> kUnitBits), static_cast<int32_t>(fraction),
                static_cast<int32_t>(phase), static_cast<int32_t>(highest >> kUnitBits)};
        return true;
    }
    return false;
}

/// Goes on from a slope as long as that leaves more room for the height.
void Widen(const Bounds& bounds, int64_t step, int64_t& slope, Gap& gap) {
    for (;; step *= 2) {
        const Gap wider = HeightGap(bounds, slope + step);
        if (wider.most - wider.least <= gap.most - gap.least) return;
        slope += step;
        gap = wider;
    }
}

/// Searches for a line within the bounds. It may still leave its words.
bool FindWithin(const Bounds& bounds, Line& line) {
    constexpr int kTries = 12;
    int64_t slope = bounds.Slope();
    Gap gap = HeightGap(bounds, slope);
    for (int i = 0; i < kTries && gap.least > gap.most; ++i) {
        slope = SlopeBetween(bounds, gap);
        gap = HeightGap(bounds, slope);
    }
    if (gap.least > gap.most) return false;
    // That may be the first or the last of the slopes that there are, and leave next to none.
    Widen(bounds, 1, slope, gap);
    Widen(bounds, -1, slope, gap);
    return PutInWords(slope, gap, line);
}

bool Gives(const Line& line, int sample, uint16_t entry) {
    const int32_t rise = line.Rise(sample);
    return rise >= 0 && rise <= UINT16_MAX &&
           std::clamp(rise + line.offset, 0, int32_t{UINT16_MAX}) == entry;
}
bool Gives(const Line& line, int sample, int16_t entry) {
    const auto term = static_cast<int16_t>(line.Rise(sample) + line.offset);
    return term + (term < 0 ? 1 : 0) == entry;
}

/// Whatever the search says: a line is what gives every entry back.
template <class Entry>
bool FindLine(const Entry* entries, Line& line) {
    if (!FindWithin(Bounds(entries), line)) return false;
    for (int i = 0; i < kEntries; ++i) {
        if (!Gives(line, i, entries[i])) return false;
    }
    return true;
}

bool HalvesAreLines(const uint32_t* table, Line& high, Line& low) {
    int16_t entries[2][kEntries];
    for (int i = 0; i < kEntries; ++i) {
        entries[0][i] = static_cast<int16_t>(table[i] >> 16);
        entries[1][i] = static_cast<int16_t>(table[i]);
    }
    return FindChromaLine(entries[0], high) && FindChromaLine(entries[1], low);
}

/// Tables and what was found in them. They are compared entry by entry: whoever owns them may fill
/// them anew at any time.
class Memory {
  public:
    bool Find(const uint16_t* luma, const uint32_t* cb, const uint32_t* cr, TableLines& lines) {
        if (m_busy.test_and_set(std::memory_order_acquire)) {
            return FindTableLines(luma, cb, cr, lines);
        }
        if (!m_filled || !Holds(luma, cb, cr)) {
            std::memcpy(m_luma, luma, sizeof m_luma);
            std::memcpy(m_cb, cb, sizeof m_cb);
            std::memcpy(m_cr, cr, sizeof m_cr);
            m_straight = FindTableLines(m_luma, m_cb, m_cr, m_lines);
            m_filled = true;
        }
        lines = m_lines;
        const bool straight = m_straight;
        m_busy.clear(std::memory_order_release);
        return straight;
    }

  private:
    bool Holds(const uint16_t* luma, const uint32_t* cb, const uint32_t* cr) const {
        return std::memcmp(m_luma, luma, sizeof m_luma) == 0 &&
               std::memcmp(m_cb, cb, sizeof m_cb) == 0 && std::memcmp(m_cr, cr, sizeof m_cr) == 0;
    }

    std::atomic_flag m_busy = ATOMIC_FLAG_INIT;
    bool m_filled = false;
    bool m_straight = false;
    uint16_t m_luma[kEntries] = {};
    uint32_t m_cb[kEntries] = {};
    uint32_t m_cr[kEntries] = {};
    TableLines m_lines{};
};

constexpr size_t kMemories = 4;  // processors that are likely to be at work at a time
Memory memories[kMemories];

}  // namespace

bool FindLumaLine(const uint16_t* entries, Line& line) {
    return FindLine(entries, line);
}

bool FindChromaLine(const int16_t* entries, Line& line) {
    return FindLine(entries, line);
}

bool FindTableLines(const uint16_t* luma, const uint32_t* cb, const uint32_t* cr,
                    TableLines& lines) {
    return FindLumaLine(luma, lines.luma) && HalvesAreLines(cb, lines.blue, lines.cbToGreen) &&
           HalvesAreLines(cr, lines.red, lines.crToGreen);
}

bool RecallTableLines(const uint16_t* luma, const uint32_t* cb, const uint32_t* cr,
                      TableLines& lines) {
    // Any would do. Processors at work at once are kept apart by where their tables lie, which is
    // about a memory's size from each other or more.
    const size_t place = reinterpret_cast<uintptr_t>(luma) / sizeof(Memory);
    return memories[place % kMemories].Find(luma, cb, cr, lines);
}

}  // namespace vidshow
