#pragma once

// Taps of a resampled row, a table made once for all rows: each output column blends two
// neighbouring source columns. Columns come in groups that pick from 16 bytes, so that a shuffle
// within a register gathers a group's pairs and one multiplication weighs them.
//
// Back ends only read these tables: what is inline here is called by portable code alone.

#include <cstddef>
#include <cstdint>

namespace vidshow {

/// @tparam Item of the source: a byte or a word
template <class Item, size_t kMost>
struct TapGroups {
    static constexpr int32_t kGroup = 8 / static_cast<int32_t>(sizeof(Item));  ///< columns
    static constexpr size_t kItems = 16 / sizeof(Item);  ///< of a group's pairs, and in its reach
    static constexpr size_t kGroups = kMost / (kItems / 2);
    static_assert(kMost % (kItems / 2) == 0, "whole groups");

    /// Pairs stand next to each other for multiplications that add neighbours, or both halves
    /// apart for those that add registers.
    static constexpr int32_t PlaceOf(int32_t column, int32_t second) {
#ifdef VIDSHOW_VECTOR_NEON
        return kGroup * second + column;
#else
        return 2 * column + second;
#endif
    }

    /// Column `i` lies between source columns `source` and the one behind it, `weight` / 32 on the
    /// way. The first column of a group is set first; the others lie behind it, within 16 bytes.
    void Set(int32_t i, int32_t source, int32_t weight) {
        const auto group = static_cast<size_t>(i / kGroup);
        if (i % kGroup == 0) {
            const bool follows = joined && group % 2 != 0;
            first[group] = follows ? first[group - 1] : static_cast<uint16_t>(source);
        }
        SetHalf(group, PlaceOf(i % kGroup, 0), source - first[group], 32 - weight);
        SetHalf(group, PlaceOf(i % kGroup, 1), source + 1 - first[group], weight);
    }

    bool joined = false;            ///< groups pick from the same bytes two by two; before `Set`
    uint16_t first[kGroups];        ///< source column that the group picks from
    uint8_t order[kGroups][16];     ///< bytes of the pairs, counted from there
    Item weights[kGroups][kItems];  ///< of the pairs, in 1/32

  private:
    void SetHalf(size_t group, int32_t place, int32_t from, int32_t weight) {
        const auto at = static_cast<size_t>(place);
        for (size_t b = 0; b < sizeof(Item); ++b) {
            order[group][at * sizeof(Item) + b] =
                static_cast<uint8_t>(static_cast<size_t>(from) * sizeof(Item) + b);
        }
        weights[group][at] = static_cast<Item>(weight);
    }
};

}  // namespace vidshow
