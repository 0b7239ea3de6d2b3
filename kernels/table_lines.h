#pragma once

// The translation tables as straight lines. What the tables of the engine hold are lines, truncated
// and cut to a range, so that two multiplications stand for a look-up; tables that clients build
// may hold anything. Types only, but for the search: every back end includes this.

#include <cstdint>

namespace vidshow {

/// A line that words of 16 bits can follow: sample c lies at
///
///     whole c + ((c + phase) fraction >> 15) + offset
///
/// The slope is whole + fraction / 32768. The phase shifts the line by parts of an entry, as finely
/// as the slope is given: the phase times the fraction leaves any remainder of 32768 that matters.
/// Both factors of that product are below 32768, for NEON multiplies so only with signs.
struct Line {
    int32_t whole;
    int32_t fraction;  ///< 0..32767
    int32_t phase;     ///< 0..32512
    int32_t offset;

    int32_t Rise(int32_t sample) const {
        return whole * sample + ((sample + phase) * fraction >> 15);
    }
};

/// Finds the line of 256 luma entries: the rise stays within a word, and the offset is added with
/// saturation. @return whether there is one
bool FindLumaLine(const uint16_t* entries, Line& line);

/// Finds that of 256 chroma terms: everything wraps to a signed word, and what is negative is one
/// higher, which makes of rounding down the truncation that the tables are built with.
/// @return whether there is one
bool FindChromaLine(const int16_t* entries, Line& line);

/// The five lines of the three tables. Blue and red are the entries' high halves; the low halves
/// are the parts of green.
struct TableLines {
    Line luma;
    Line blue, cbToGreen;
    Line red, crToGreen;
};

/// @return whether all three tables are such lines
bool FindTableLines(const uint16_t* luma, const uint32_t* cb, const uint32_t* cr,
                    TableLines& lines);

/// The same with a memory: the search costs as much as a small picture does, and the pictures of a
/// video all have the same tables. Threads do not wait for each other.
bool RecallTableLines(const uint16_t* luma, const uint32_t* cb, const uint32_t* cr,
                      TableLines& lines);

}  // namespace vidshow
