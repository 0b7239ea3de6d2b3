#pragma once

#include <cstdint>

namespace vidshow {

/// Two luma rows with the chroma row that they share: the unit of every 4:2:0 to RGB conversion.
struct RowPair {
    const uint8_t* upper;
    const uint8_t* lower;
    const uint8_t* cb;
    const uint8_t* cr;
};

}  // namespace vidshow
