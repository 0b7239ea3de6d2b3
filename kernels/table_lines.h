#pragma once

// The translation tables as straight lines. What the tables of the engine hold are lines, truncated
// and cut to a range, so that a few multiplications stand for a look-up; tables that clients build
// may hold anything. Types only, but for the search: every back end includes this.

#include <cstdint>

namespace vidshow {

/// (slope x sample + offset) / 2^shift, truncated towards zero. No sum leaves 32 bits, signed.
struct Line {
    int32_t slope;
    int32_t offset;
};

// As large as the steepest tables of the engine allow: the finer, the more tables have a line.
constexpr int kLumaShift = 14;
constexpr int kChromaShift = 15;

/// What a line is cut to: entries there say of it only that it reaches them. And its shift.
struct Cut {
    int32_t low;
    int32_t high;
    int shift;
};

/// Finds the line that gives all of 256 entries. @return whether there is one
bool FindLine(const int32_t* entries, Cut cut, Line& line);

/// The five lines of the three tables. Cut are luma, to 0..65535, and the entries' high halves, red
/// and blue, to a signed half; of the low halves, the parts of green, none is.
struct TableLines {
    Line luma;
    Line blue, cbToGreen;
    Line red, crToGreen;
};

/// @return whether all three tables are such lines
bool FindTableLines(const uint16_t* luma, const uint32_t* cb, const uint32_t* cr,
                    TableLines& lines);

}  // namespace vidshow
