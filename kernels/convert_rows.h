#pragma once

// The portable form of every 4:2:0 to RGB conversion: a row pair, block by block.

#include "kernels/block_target.h"
#include "kernels/row_pair.h"

namespace vidshow {

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
