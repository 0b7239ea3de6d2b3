#pragma once

// Operations on single lines that the deinterlacing modes are made of. Lines may be one and the
// same, but where they overlap otherwise, only `MergeGeneric` and `MergeNeon` say what comes out.

#include <cstddef>
#include <cstdint>

namespace vidshow {

/// Bytes of a group of the line filters: the exported ones work in whole groups.
constexpr int32_t kFilterGroup = 8;

/// out = (4 (b + d) + 2 c - (a + e) + 4) >> 3, clamped to 0..255, for exactly `count` bytes.
void FilterLine(uint8_t* dst, const uint8_t* a, const uint8_t* b, const uint8_t* c,
                const uint8_t* d, const uint8_t* e, int32_t count);

/// The same with `kept` as a, written over c; what c held goes to `kept`.
void FilterLineInPlace(uint8_t* kept, const uint8_t* b, uint8_t* c, const uint8_t* d,
                       const uint8_t* e, int32_t count);

/// The average of the filter's result and c, both kept half: (filtered + c) >> 1.
void FilterHalfLine(uint8_t* dst, const uint8_t* a, const uint8_t* b, const uint8_t* c,
                    const uint8_t* d, const uint8_t* e, int32_t count);

/// Side of the blocks of the x mode.
constexpr int32_t kBlock = 8;

/// How much `blocks` blocks side by side look like two fields that do not belong together. Over
/// `lines` lines, at most eight, the differences of neighbouring lines count for it, those of lines
/// two apart, which are of one field, against it, and these a quarter more. Two more lines are
/// read.
/// @param scores  0 to 16320 each
void CombScores(const uint8_t* src, size_t pitch, int32_t blocks, int32_t lines, uint16_t* scores);

}  // namespace vidshow
