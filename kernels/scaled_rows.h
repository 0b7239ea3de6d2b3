#pragma once

// The rows that the resize on the fly makes before it converts: luma bilinear, chroma nearest, two
// output rows at a time, some columns wide. Luma is blended down into whole columns first, then
// four output columns are picked out of eight neighbours at once, which holds for any step up to
// two.

#include "kernels/convert_rows.h"
#include "kernels/corner_step.h"
#include "kernels/fused_backend.h"
#include "kernels/resample.h"

namespace vidshow {

/// The chroma row or column of two output rows or columns.
inline int32_t NearestChroma(const Tap& first, const Tap& second) {
    return (first.index + second.index + 1) >> 2;
}

class ScaledRows {
  public:
    static constexpr bool kStay = false;

    /// The back end in use has to have the loops, and the step across to fit.
    ScaledRows(uint8_t* const src[3], const uint32_t ss[3], Size from, Size to);

    /// Source columns that are skipped have to be few: they are blended, too.
    static bool Fits(Size from, Size to) { return CornerStep(from.w, to.w) <= kLongestStep; }

    /// How many output columns may be chosen at a time, an even number.
    int32_t columns() const { return m_columnsAtATime; }

    /// Chooses output columns. @param x even @param count even, 2 to `columns()`
    void Select(int32_t x, int32_t count);

    /// Output rows `y` and `y` + 1 of the chosen columns, good until the next call.
    RowPair Rows(int32_t y);

  private:
    static constexpr int32_t kFarStep = 2 * 65536;
    static constexpr int32_t kLongestStep = 16 * 65536;
    static constexpr int32_t kSpan = 2 * kTapColumns + 2;  // source columns under the chosen ones
    static constexpr int32_t kReach = kSpan + kFusedStep;

    bool FarApart() const { return m_across >= kFarStep; }
    void MakeRow(const Tap& row, uint8_t* out);
    bool GroupChroma();
    void PickChroma(const uint8_t* row, uint8_t* out) const;

    const FusedBackend& m_backend;
    uint8_t* const* m_src;
    const uint32_t* m_ss;
    Size m_from;
    int32_t m_across;
    int32_t m_down;
    int32_t m_columnsAtATime;
    int32_t m_first = 0;  ///< source column of m_columns[0]
    int32_t m_span = 0;
    int32_t m_count = 0;
    WordTaps m_taps;
    uint16_t m_index[kTapColumns];  ///< where they are far apart: blended column of each one
    int32_t m_chroma[kTapColumns / 2];
    NearestPicks m_chromaPicks;       ///< the same
    bool m_chromaIsNear = false;      ///< within the spans of groups
    uint16_t m_columns[kReach] = {};  ///< blended
    uint16_t m_gathered[2 * kTapColumns];
    uint8_t m_luma[2][kTapColumns];
    uint8_t m_cb[kTapColumns / 2];
    uint8_t m_cr[kTapColumns / 2];
};

}  // namespace vidshow
