#pragma once

// Two luma rows with the chroma row that they share: the unit of every 4:2:0 to RGB conversion.

#include "kernels/block_target.h"

namespace vidshow {

struct RowPair {
    const uint8_t* upper;
    const uint8_t* lower;
    const uint8_t* cb;
    const uint8_t* cr;
};

/// Hands the blocks of a row pair to `target`, one for two columns or part of two. Everything comes
/// by value: what is local stays in registers, although a stored pixel might alias anything else.
template <class Format, class Target>
void ConvertRows(TransTables tables, RowPair rows, int32_t w, Format format, Target target) {
    for (int32_t x = 0; x < w; x += 2) {
        const ChromaTerms c = tables.Chroma(rows.cb[x / 2], rows.cr[x / 2]);
        target.Put(
            {format.Make(tables, rows.upper[x], c), format.Make(tables, rows.upper[x + 1], c),
             format.Make(tables, rows.lower[x], c), format.Make(tables, rows.lower[x + 1], c)});
    }
}

}  // namespace vidshow
