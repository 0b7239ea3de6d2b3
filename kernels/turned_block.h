#pragma once

// Some row pairs of a 4:2:0 picture, turned by a quarter: its columns come out as row pairs again.

#include "kernels/convert_rows.h"
#include "kernels/tile.h"

namespace vidshow {

class TurnedBlock {
  public:
    static constexpr int32_t kColumns = 64;  ///< of the source, at the most: a cache line
    static constexpr int32_t kRows = 1088;   ///< runs of the turned picture, in the second cache
    static constexpr int32_t kBand = 16;     ///< rows that are turned at a time

    /// Begins with a block. @param backwards whether its last row is to come first
    TurnedBlock(int32_t columns, int32_t rows, bool backwards)
        : m_columns(columns), m_rows(rows), m_down(backwards ? -1 : 1) {
        // Tiles are whole: what overhangs lies in front of the first sample, or behind the last.
        if (backwards) m_skipped = (rows + kBand - 1) / kBand * kBand - rows;
    }

    /// Takes up rows `r` and `r` + 1, even ones one after the other from 0 on.
    void Take(int32_t r, const RowPair& rows) {
        const int32_t at = r % kBand;
        CopyRow(m_luma[at], rows.upper, m_columns);
        CopyRow(m_luma[at + 1], rows.lower, m_columns);
        CopyRow(m_cb[at / 2], rows.cb, m_columns / 2);
        CopyRow(m_cr[at / 2], rows.cr, m_columns / 2);
        if (at == kBand - 2 || r == m_rows - 2) {
            TurnBand(r - at, m_luma[0], m_cb[0], m_cr[0], {kColumns, kColumns / 2});
        }
    }

    /// How far rows lie apart.
    struct Strides {
        intptr_t luma, chroma;
    };

    /// Whether a band from row `r` on can be taken where it lies, as whole tiles.
    bool TakesBand(int32_t r) const {
        return r % kBand == 0 && r + kBand <= m_rows && m_columns % (2 * kSide) == 0;
    }
    /// @param first the two rows `r`, from which on the others lie
    void TakeBand(int32_t r, const RowPair& first, Strides strides) {
        TurnBand(r, first.upper, first.cb, first.cr, strides);
    }

    /// Source columns `c` and `c` + 1, when all rows are there.
    RowPair Rows(int32_t c) const {
        return {m_turnedLuma[c] + m_skipped, m_turnedLuma[c + 1] + m_skipped,
                m_turnedCb[c / 2] + m_skipped / 2, m_turnedCr[c / 2] + m_skipped / 2};
    }

  private:
    static constexpr int kSide = 8;  // of a tile
    // No power of two, or all columns would compete for a few places in the cache.
    static constexpr int32_t kStride = kRows + 64;

    /// Nearly all rows fill a block, and copies of a fixed size are a few registers.
    template <size_t kFull>
    static void CopyRow(uint8_t (&to)[kFull], const uint8_t* from, int32_t samples) {
        if (samples == static_cast<int32_t>(kFull)) {
            std::memcpy(to, from, kFull);
        } else {
            std::memcpy(to, from, static_cast<size_t>(samples));
        }
    }

    void TurnBand(int32_t first, const uint8_t* luma, const uint8_t* cb, const uint8_t* cr,
                  Strides strides) {
        const int32_t at = m_down < 0 ? m_skipped + m_rows - 1 - first : first;
        TurnTiles<uint8_t, kBand, kSide>(m_turnedLuma[0] + at, kStride, m_down, luma, strides.luma,
                                         m_columns, kBand);
        TurnChroma(cb, strides.chroma, m_turnedCb[0] + at / 2);
        TurnChroma(cr, strides.chroma, m_turnedCr[0] + at / 2);
    }
    void TurnChroma(const uint8_t* from, intptr_t stride, uint8_t* to) const {
        TurnTiles<uint8_t, kBand / 2, kSide>(to, kStride / 2, m_down, from, stride, m_columns / 2,
                                             kBand / 2);
    }

    int32_t m_columns;
    int32_t m_rows;
    intptr_t m_down;
    int32_t m_skipped = 0;
    uint8_t m_luma[kBand][kColumns] = {};
    uint8_t m_cb[kBand / 2][kColumns / 2] = {};
    uint8_t m_cr[kBand / 2][kColumns / 2] = {};
    uint8_t m_turnedLuma[kColumns][kStride];
    uint8_t m_turnedCb[kColumns / 2][kStride / 2];
    uint8_t m_turnedCr[kColumns / 2][kStride / 2];
};

}  // namespace vidshow
