#pragma once

// The row walk of the line-buffer kernels once more: which rows are converted with which chroma
// row.

#include <map>

#include "kernels/spread_model.h"

namespace kernel_test {

/// A resize from `w` x `h` to `dw` x `dh`.
struct Resize {
    int32_t w, h, dw, dh;
};

inline std::ostream& operator<<(std::ostream& out, const Resize& r) {
    return out << r.w << " x " << r.h << " to " << r.dw << " x " << r.dh;
}

/// The converted and blended line of each output row, for corner-aligned rows.
inline std::vector<ModelLine> CornerRows(Processor& p, Picture420& s, const Resize& r) {
    std::vector<ModelLine> result;
    std::map<int32_t, int32_t> chromaRowOf;  // of the source rows held
    int32_t previous = -1;
    for (int32_t y = 0; y < r.dh; ++y) {
        const int64_t position = int64_t{y} * ModelStep(r.h, r.dh);
        const int32_t row = static_cast<int32_t>(position / 65536);
        const uint32_t weight = static_cast<uint32_t>(position % 65536 / 2048);
        if (row == previous + 1 && chromaRowOf.count(row) != 0) {
            chromaRowOf.erase(previous);
        } else if (row != previous) {
            chromaRowOf = {{row, row / 2}, {row + 1, row / 2}};
        }
        previous = row;
        ModelLine line = ModelRow(p, s, r.w, row, chromaRowOf.at(row));
        if (weight != 0) {
            if (chromaRowOf.count(row + 1) == 0) {
                chromaRowOf[row + 1] = chromaRowOf[row + 2] = (row + 1) / 2;
            }
            line = BlendLines(line, ModelRow(p, s, r.w, row + 1, chromaRowOf.at(row + 1)), weight);
        }
        result.push_back(line);
    }
    return result;
}

}  // namespace kernel_test
