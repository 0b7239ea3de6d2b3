#pragma once

// The common part of the kernels that scale through line buffers: source rows, the converted rows
// at hand, and the walk down the output.

#include <algorithm>

#include "kernels/corner_step.h"
#include "kernels/planar_lines.h"
#include "vidshow/kernels.h"

namespace vidshow {

/// A 4:2:0 picture, read in row pairs.
class SourceRows {
  public:
    SourceRows(uint8_t* const src[3], const uint32_t ss[3], int32_t h)
        : m_y(src[0]), m_cb(src[1]), m_cr(src[2]), m_strides{ss[0], ss[1], ss[2]}, m_h(h) {}

    /// Rows `row` and `row + 1` with the chroma row of the first, also where `row` is odd. A row
    /// below the last one is never shown: the last one is read in its place.
    RowPair At(int32_t row) const {
        const size_t chromaRow = static_cast<size_t>(row >> 1);
        return {Luma(row), Luma(std::min(row + 1, m_h - 1)), m_cb + m_strides[1] * chromaRow,
                m_cr + m_strides[2] * chromaRow};
    }

  private:
    const uint8_t* Luma(int32_t row) const { return m_y + m_strides[0] * static_cast<size_t>(row); }

    const uint8_t* m_y;
    const uint8_t* m_cb;
    const uint8_t* m_cr;
    size_t m_strides[3];
    int32_t m_h;
};

/// Up to three source rows in a run, converted to lines. The caller walks downwards: a step of one
/// row keeps what is there, any other starts anew.
/// @tparam Line        where a line begins
/// @tparam ConvertPair (row, upper, lower): makes lines of source row `row` and the one below
template <class Line, class ConvertPair>
class HeldRows {
  public:
    HeldRows(ConvertPair convert, Line line0, Line line1, Line line2)
        : m_convert(convert), m_lines{line0, line1, line2} {}

    /// Source row `row`, which becomes the current one.
    Line Row(int32_t row) {
        if (row == m_row + 1 && m_held > 1) {
            std::rotate(m_lines, m_lines + 1, m_lines + 3);
            --m_held;
        } else if (row != m_row) {
            m_convert(row, m_lines[0], m_lines[1]);
            m_held = 2;
        }
        m_row = row;
        return m_lines[0];
    }

    /// The row below the current one.
    Line RowBelow() {
        if (m_held < 2) {
            m_convert(m_row + 1, m_lines[1], m_lines[2]);
            m_held = 3;
        }
        return m_lines[1];
    }

  private:
    ConvertPair m_convert;
    Line m_lines[3];
    int32_t m_row = -1;
    int32_t m_held = 0;  ///< rows from m_row on that the lines hold
};

/// Entries of an axis whose corners coincide.
struct CornerTaps {
    int32_t step;  ///< 16.16

    AxisTap operator()(int32_t i) const { return {i * step >> 16, i * step >> 11 & 31}; }
};

/// Makes `count` output rows: `tapOf(y)` says where row `y` lies, `blend(upper, lower, out,
/// weight)` mixes two lines, `emit(line, y)` resamples a line into the output.
template <class Rows, class Line, class TapOf, class Blend, class Emit>
void MakeRows(Rows rows, Line scratch, int32_t count, TapOf tapOf, Blend blend, Emit emit) {
    for (int32_t y = 0; y < count; ++y) {
        const AxisTap tap = tapOf(y);
        Line line = rows.Row(tap.index);
        if (tap.weight != 0) {
            blend(line, rows.RowBelow(), scratch, tap.weight);
            line = scratch;
        }
        emit(line, y);
    }
}

/// @name Blends of two lines of `width` pixels
/// RGB565 is made with the vector blends. They work in fours: counted up, they run into the spare
/// entries of the lines.
/// @{
struct PortableBlend {
    int32_t width;

    void operator()(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t w) const {
        VLerp(upper, lower, out, w, width);
    }
};

struct VectorBlend {
    int32_t width;

    void operator()(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t w) const {
        _vlerp_neon(upper, lower, out, w, width + 3);
    }
};

/// Every weight counts as one half.
struct PortableAverage {
    int32_t width;

    void operator()(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t) const {
        VLerp_12(upper, lower, out, width);
    }
};

struct VectorAverage {
    int32_t width;

    void operator()(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t) const {
        _vlerp12_neon(upper, lower, out, width + 3);
    }
};
/// @}

/// Whether the first `n` line buffers are there.
inline bool HasLines(uint32_t* const lines[4], int n) {
    return lines && std::all_of(lines, lines + n, [](const uint32_t* line) { return line; });
}

/// A picture and the rows that a line-buffer kernel makes of it.
struct Enlargement {
    uint8_t* const* planes;
    const uint32_t* strides;
    int32_t w, h;  ///< source
    int32_t dh;    ///< output rows

    CornerTaps Rows() const { return {CornerStep(h, dh)}; }
};

/// Row `y` of rows that lie `step` bytes apart.
template <class Pixel>
Pixel* RowAt(void* dst, ptrdiff_t step, int32_t y) {
    return static_cast<Pixel*>(static_cast<void*>(static_cast<uint8_t*>(dst) + step * y));
}

/// The distance of rows whose stride counts rounded down to whole words, as clients know it.
inline ptrdiff_t WordStep(uint32_t stride) {
    return static_cast<ptrdiff_t>(stride & ~3u);
}

/// Makes the rows through spread pixels, with three line buffers for source rows and the fourth as
/// scratch.
/// @return 0; -1 without line buffers
template <class TapOf, class Blend, class Emit>
int32_t EnlargeSpread(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4], const Enlargement& e,
                      TapOf tapOf, Blend blend, Emit emit) {
    if (e.h < 1 || e.dh < 1) return 0;
    if (!HasLines(lines, 4)) return -1;
    StripRows strips(TransTables(p), SpreadRgb{});
    strips.StraightenTables();
    const SourceRows source(e.planes, e.strides, e.h);
    const auto convert = [&](int32_t row, uint32_t* upper, uint32_t* lower) {
        const RowPair rows = source.At(row);
        if (strips.ready()) {
            strips.Convert(rows, e.w / 2 * 2, AsBytes(upper), AsBytes(lower));
        } else {
            Convert(p, rows.upper, rows.lower, rows.cb, rows.cr, upper, lower, e.w);
        }
    };
    MakeRows(HeldRows<uint32_t*, decltype(convert)>(convert, lines[0], lines[1], lines[2]),
             lines[3], e.dh, tapOf, blend, emit);
    return 0;
}

/// Output rows of a format that back ends have loops for, `step` bytes apart.
template <class Packer>
struct OutputRows {
    void* dst;
    ptrdiff_t step;
    Packer packer;
};

/// The same rows through lines of planes.
template <class TapOf, class Columns, class Packer>
void EnlargePlanar(QZ_IMAGEPROC_PARAMSET* p, const Enlargement& e, TapOf tapOf,
                   const Columns& columns, const OutputRows<Packer>& out) {
    StripRows strips(TransTables(p), PlanarRgb{});
    strips.StraightenTables();
    const SourceRows source(e.planes, e.strides, e.h);
    const auto convert = [&](int32_t row, uint8_t* upper, uint8_t* lower) {
        strips.Convert(source.At(row), e.w, upper, lower);
    };
    PlanarLines lines(e.w, columns, out.packer);
    MakeRows(
        HeldRows<uint8_t*, decltype(convert)>(convert, lines.line(0), lines.line(1), lines.line(2)),
        lines.line(3), e.dh, tapOf,
        [&](const uint8_t* upper, const uint8_t* lower, uint8_t* blended, int32_t weight) {
            lines.Blend(upper, lower, blended, weight);
        },
        [&](const uint8_t* line, int32_t y) {
            lines.Enlarge(line, RowAt<uint8_t>(out.dst, out.step, y));
        });
}

/// Makes the rows as fast as the back end in use can.
/// @param columns `pixels` of an output row; `At(x)`, the tap of column x; `Enlarges()`, whether no
///                step between columns is longer than one; `Make(line, out, packer)`, the portable
///                form
/// @return 0; -1 without line buffers
template <class TapOf, class Blend, class Columns, class Packer>
int32_t Enlarge(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4], const Enlargement& e,
                TapOf tapOf, Blend blend, const Columns& columns, const OutputRows<Packer>& out) {
    if (e.h > 0 && e.dh > 0 && HasLines(lines, 4) && columns.Enlarges() &&
        PlanarLines::Fit(e.w, columns.pixels)) {
        EnlargePlanar(p, e, tapOf, columns, out);
        return 0;
    }
    return EnlargeSpread(p, lines, e, tapOf, blend, [&](const uint32_t* line, int32_t y) {
        columns.Make(line, RowAt<void>(out.dst, out.step, y), out.packer);
    });
}

}  // namespace vidshow
