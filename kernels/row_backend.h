#pragma once

// Moves of a whole row of samples, in a form for every instruction set. Types only: code here would
// be compiled once for each of them, and the linker might keep the copy that an older processor
// cannot run.
//
// Source and destination do not overlap. Exactly the stated bytes are read and written.

#include <cstddef>
#include <cstdint>

namespace vidshow {

struct RowBackend {
    using Reverse = void(uint8_t* dst, const uint8_t* src, size_t pixels);
    using Join = void(uint8_t* pairs, const uint8_t* first, const uint8_t* second, size_t count);
    using Split = void(uint8_t* first, uint8_t* second, const uint8_t* pairs, size_t count);

    /// The last pixel first; pixels of 1, 2 and 4 bytes.
    Reverse* reverse8;
    Reverse* reverse16;
    Reverse* reverse32;
    /// `count` bytes of each, by turns.
    Join* join;
    /// The bytes of `count` pairs apart.
    Split* split;

    /// The one for pixels of so many bytes.
    template <int kBytes>
    Reverse* ReverseOf() const {
        static_assert(kBytes == 1 || kBytes == 2 || kBytes == 4, "the pixels that there are");
        return kBytes == 1 ? reverse8 : kBytes == 2 ? reverse16 : reverse32;
    }
};

// Which of these are built in is for kernels/vector.cmake to say.
extern const RowBackend kScalarRows;
extern const RowBackend kNeonRows;
extern const RowBackend kSse41Rows;
extern const RowBackend kAvx2Rows;

/// The one that goes with the vector back end in use.
const RowBackend& ActiveRowBackend();

}  // namespace vidshow
