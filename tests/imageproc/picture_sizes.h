#pragma once

// Which bytes of which planes a frame is about, written independently of the library.

#include <cstdint>
#include <vector>

namespace imageproc_test {

constexpr uint32_t kCodes[] = {0,   3,   4,   5,   6,    7,    8,    10,   259,  515, 516,
                               517, 768, 771, 773, 1027, 1028, 1280, 2048, 2051, 2304};

struct Size {
    uint32_t w, h;
};

/// Bytes a row and rows of the planes of a format.
inline std::vector<Size> PlanesOf(uint32_t format, const Size& s) {
    switch (format) {
        case 0:
            return {s, {s.w / 2, s.h / 2}, {s.w / 2, s.h / 2}};
        case 1:
            return {s, {s.w / 2, s.h}, {s.w / 2, s.h}};
        case 2:
            return {s, s, s};
        case 4:
            return {{s.w * 3, s.h}};
        case 5:
        case 9:
            return {{s.w * 4, s.h}};
        case 8:
            return {s, {s.w, s.h / 2}};
        default:
            return {{s.w * 2, s.h}};
    }
}

inline bool GoesThroughWalker(uint32_t code) {
    return code == 3 || code == 5 || (code >= 515 && code <= 517) || code == 771 || code == 1027 ||
           code == 1028;
}

/// The size of what is written.
inline Size Extent(uint32_t code, uint32_t rotation, const Size& in, const Size& out) {
    const bool quarter = rotation == 1 || rotation == 2;
    if (code == 0 || GoesThroughWalker(code)) return quarter ? Size{out.h, out.w} : out;
    if (code == 259) return out;
    const bool fromRgb = code == 768 || code == 1280 || code == 2304;
    const Size cut = {in.w / 8 * 8, in.h / 8 * 8};
    if (fromRgb && quarter) return {cut.h, cut.w};
    if (fromRgb && rotation == 3 && code != 768) return cut;
    return in;
}

}  // namespace imageproc_test
