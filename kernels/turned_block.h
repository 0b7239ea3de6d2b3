#pragma once

// Some row pairs of a 4:2:0 picture, turned by a quarter: its columns come out as row pairs again.

#include "kernels/convert_rows.h"
#include "kernels/tile.h"

namespace vidshow {

class TurnedBlock {
  public:
    static constexpr int32_t kColumns = 128;  ///< of the source, at the most
    static constexpr int32_t kRows = 512;  ///< long runs of the turned picture, still near at hand
    static constexpr int32_t kBand = 16;   ///< rows that are turned at a time

    /// Begins with a block. @param backwards whether its last row is to come first
    TurnedBlock(int32_t columns, int32_t rows, bool backwards)
        : m_columns(columns), m_rows(rows), m_down(backwards ? -1 : 1) {
        // Tiles are whole: what overhangs lies in front of the first sample, or behind the last.
        if (backwards) m_skipped = (rows + kBand - 1) / kBand * kBand - rows;
    }

    /// Takes up rows `r` and `r` + 1, even ones one after the other from 0 on.
    void Take(int32_t r, const RowPair& rows) {
        const int32_t at = r % kBand;
        const size_t bytes = static_cast<size_t>(m_columns);
        std::memcpy(m_luma[at], rows.upper, bytes);
        std::memcpy(m_luma[at + 1], rows.lower, bytes);
        std::memcpy(m_cb[at / 2], rows.cb, bytes / 2);
        std::memcpy(m_cr[at / 2], rows.cr, bytes / 2);
        if (at == kBand - 2 || r == m_rows - 2) TurnBand(r - at);
    }

    /// Source columns `c` and `c` + 1, when all rows are there.
    RowPair Rows(int32_t c) const {
        return {m_turnedLuma[c] + m_skipped, m_turnedLuma[c + 1] + m_skipped,
                m_turnedCb[c / 2] + m_skipped / 2, m_turnedCr[c / 2] + m_skipped / 2};
    }

  private:
    static constexpr int kSide = 8;  // of a tile

    void TurnBand(int32_t first) {
        const int32_t at = m_down < 0 ? m_skipped + m_rows - 1 - first : first;
        TurnTiles<uint8_t, kBand, kSide>(m_turnedLuma[0] + at, kRows, m_down, m_luma[0], kColumns,
                                         m_columns, kBand);
        TurnChroma(m_cb, m_turnedCb[0] + at / 2);
        TurnChroma(m_cr, m_turnedCr[0] + at / 2);
    }
    void TurnChroma(const uint8_t (*from)[kColumns / 2], uint8_t* to) const {
        TurnTiles<uint8_t, kBand / 2, kSide>(to, kRows / 2, m_down, from[0], kColumns / 2,
                                             m_columns / 2, kBand / 2);
    }

    int32_t m_columns;
    int32_t m_rows;
    intptr_t m_down;
    int32_t m_skipped = 0;
    uint8_t m_luma[kBand][kColumns] = {};
    uint8_t m_cb[kBand / 2][kColumns / 2] = {};
    uint8_t m_cr[kBand / 2][kColumns / 2] = {};
    uint8_t m_turnedLuma[kColumns][kRows];
    uint8_t m_turnedCb[kColumns / 2][kRows / 2];
    uint8_t m_turnedCr[kColumns / 2][kRows / 2];
};

}  // namespace vidshow
