#pragma once

// The line operations of deinterlacing, in a form for every instruction set. Types only: code here
// would be compiled once for each of them, and the linker might keep the copy that an older
// processor cannot run.
//
// Lines may be one and the same, but do not overlap otherwise. Exactly the stated bytes are read
// and written, and every form makes the same ones.

#include <cstddef>
#include <cstdint>

namespace vidshow {

struct DeintBackend {
    using Average = void(uint8_t* dst, const uint8_t* a, const uint8_t* b, int32_t count);
    using Filter = void(uint8_t* dst, const uint8_t* a, const uint8_t* b, const uint8_t* c,
                        const uint8_t* d, const uint8_t* e, int32_t count);
    using FilterInPlace = void(uint8_t* kept, const uint8_t* b, uint8_t* c, const uint8_t* d,
                               const uint8_t* e, int32_t count);
    using Scores = void(const uint8_t* src, size_t pitch, int32_t blocks, int32_t lines,
                        uint16_t* scores);

    /// (a + b) >> 1
    Average* average;
    /// (4 (b + d) + 2 c - (a + e) + 4) >> 3, clamped to 0..255
    Filter* filter;
    /// The same with `kept` as a, written over c; what c held goes to `kept`.
    FilterInPlace* filterInPlace;
    /// What `filter` makes, f; but where c lies between b and d, (5 f + 3 c + 4) >> 3.
    Filter* rebuild;
    /// (what `rebuild` makes + c) >> 1
    Filter* rebuildHalf;
    /// How much blocks of 8 columns look like two fields that do not belong together. Over `lines`
    /// lines, 1 to 8, the differences of neighbouring lines count for it, and 19/16 of those of
    /// lines two apart, which are of one field, against it: max(0, between - within - (3 within >>
    /// 4)). Two more lines are read. @param scores  0 to 16320 each
    Scores* scores;
};

// Which of these are built in is for kernels/vector.cmake to say.
extern const DeintBackend kScalarDeint;
extern const DeintBackend kNeonDeint;
extern const DeintBackend kSse41Deint;
extern const DeintBackend kAvx2Deint;

/// The one that goes with the vector back end in use.
const DeintBackend& ActiveDeintBackend();

}  // namespace vidshow
