#pragma once

// A whole picture through strips of row pairs, to rows or, turned, along a walk. Where the pairs
// come from is a parameter:
//
//   columns()          how many columns may be chosen at a time, an even number
//   Select(x, count)   chooses columns, x and count being even
//   Rows(y)            the chosen columns of rows y and y + 1, y being even
//   kStay              whether rows stay where they are, evenly apart, and then
//   ChromaStride()     how far those of chroma lie apart

#include <cstdlib>

#include "kernels/pixel_walk.h"
#include "kernels/strip_rows.h"
#include "kernels/turned_block.h"

namespace vidshow {

template <class Format>
class StripPicture {
  public:
    /// @param size of the output; blocks are whole, so that odd sizes count as one more
    StripPicture(const TransTables& tables, const Format& format, Size size)
        : m_strips(tables, format), m_size{(size.w + 1) / 2 * 2, (size.h + 1) / 2 * 2} {}

    /// Whether rows `stride` apart can be made strip by strip. Those that overlap show the order of
    /// the blocks.
    bool FitsRows(uint32_t stride) const {
        return Ready() && stride >= static_cast<uint32_t>(m_size.w * Format::kBytes);
    }

    /// Whether the walker steps over whole pixels and over rows that do not overlap, as all do that
    /// the engine sets up for such a picture.
    bool FitsWalker(const QZ_ROTATION_WALKER& walker) const {
        const intptr_t* const word = walker.word;
        const Walk walk = PackedWalk(walker);
        if (!Ready() || word[0] != 2 * walk.across || word[1] != 2 * walk.down) return false;
        if (word[3] != word[2] + walk.across || word[4] != word[2] + walk.down ||
            word[5] != word[3] + walk.down) {
            return false;
        }
        const intptr_t across = std::abs(walk.across), down = std::abs(walk.down);
        return (across == kBytes && down >= kBytes * m_size.w) ||
               (down == kBytes && across >= kBytes * m_size.h);
    }

    template <class Pairs>
    void ToRows(Pairs pairs, void* dst, uint32_t stride) const {
        StripRows strips = m_strips;
        strips.StraightenTables();
        int32_t count = 0;
        for (int32_t x = 0; x < m_size.w; x += count) {
            count = std::min(m_size.w - x, pairs.columns());
            pairs.Select(x, count);
            uint8_t* out = static_cast<uint8_t*>(dst) + x * kBytes;
            for (int32_t y = 0; y < m_size.h; y += 2, out += 2 * size_t{stride})
                strips.Convert(pairs.Rows(y), count, out, out + stride);
        }
    }

    template <class Pairs>
    void ToWalk(Pairs pairs, const Walk& walk) const {
        const bool quarter = walk.across != kBytes && walk.across != -kBytes;
        StripRows strips = m_strips;
        strips.StraightenTables();
        if (quarter) {
            Turn(strips, pairs, walk);
        } else {
            Mirror(strips, pairs, walk);
        }
    }

  private:
    static constexpr intptr_t kBytes = Format::kBytes;

    /// Source columns become rows: samples are turned, they are fewer bytes than pixels are, and
    /// rows of the output are written in runs. Blocks follow each other across the source, whose
    /// rows are more pages than the processor keeps the places of where pictures are large.
    template <class Pairs>
    void Turn(StripRows& strips, Pairs& pairs, const Walk& walk) const {
        const int32_t most = std::min(TurnedBlock::kColumns, pairs.columns());
        for (int32_t y = 0; y < m_size.h; y += TurnedBlock::kRows) {
            const int32_t rows = std::min(m_size.h - y, TurnedBlock::kRows);
            for (int32_t x = 0; x < m_size.w; x += most) {
                const int32_t columns = std::min(m_size.w - x, most);
                pairs.Select(x, columns);
                TurnBlock(strips, pairs, walk, {x, y, columns, rows});
            }
        }
    }

    struct Block {
        int32_t x, y, columns, rows;
    };

    template <class Pairs>
    void TurnBlock(StripRows& strips, Pairs& pairs, const Walk& walk, const Block& b) const {
        const bool backwards = walk.down < 0;
        TurnedBlock block(b.columns, b.rows, backwards);
        for (int32_t r = 0; r < b.rows;)
            r += TakeRows(block, pairs, b.y, r);
        uint8_t* out = walk.At(b.x, backwards ? b.y + b.rows - 1 : b.y);
        for (int32_t c = 0; c < b.columns; c += 2, out += 2 * walk.across)
            strips.Convert(block.Rows(c), b.rows, out, out + walk.across);
    }

    /// @return how many rows that were
    template <class Pairs>
    static int32_t TakeRows(TurnedBlock& block, Pairs& pairs, int32_t y, int32_t r) {
        if constexpr (Pairs::kStay) {
            if (block.TakesBand(r)) {
                const RowPair first = pairs.Rows(y + r);
                for (int32_t i = 0; i < TurnedBlock::kBand; i += 2)
                    pairs.FetchNext(y + r + i);
                block.TakeBand(r, first, {first.lower - first.upper, pairs.ChromaStride()});
                return TurnedBlock::kBand;
            }
        }
        block.Take(r, pairs.Rows(y + r));
        return 2;
    }

    template <class Pairs>
    void Mirror(StripRows& strips, Pairs& pairs, const Walk& walk) const {
        constexpr int32_t kColumns = 512;
        constexpr intptr_t kStride = kColumns * kBytes;
        uint8_t band[2 * size_t{kStride}];
        const int32_t most = std::min(kColumns, pairs.columns());
        for (int32_t x = 0; x < m_size.w; x += most) {
            const int32_t columns = std::min(m_size.w - x, most);
            pairs.Select(x, columns);
            for (int32_t y = 0; y < m_size.h; y += 2) {
                strips.Convert(pairs.Rows(y), columns, band, band + kStride);
                StoreBand<Format::kBytes>(walk, x, y, {band, kStride, 2, columns});
            }
        }
    }

    bool Ready() const { return m_strips.ready() && m_size.w > 0; }

    StripRows m_strips;
    Size m_size;
};

}  // namespace vidshow
