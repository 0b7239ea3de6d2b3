#pragma once

#include <cstdint>

namespace vidshow {

/// A turn of a whole plane by one of the block kernels.
struct PlaneTurn {
    int32_t (*blocks)(const uint8_t* src, int32_t srcStride, uint8_t* dst, int32_t dstStride,
                      int32_t w, int32_t h);
    int32_t pixelBytes;  ///< 1 or 2
    bool quarter;        ///< a source row becomes a column
    bool acrossIsBack;   ///< the next source column lies at a lower address
    bool downIsBack;     ///< the next source row lies at a lower address
};

extern const PlaneTurn kTurn90C;
extern const PlaneTurn kTurn90AC;
extern const PlaneTurn kTurn180;
extern const PlaneTurn kTurn90C_u16;
extern const PlaneTurn kTurn90AC_u16;

/// Turns a plane of `w` x `h` pixels, any size, and touches nothing outside source and destination.
/// Strides are in bytes.
void TurnPlane(const PlaneTurn& turn, const uint8_t* src, uint32_t srcStride, uint8_t* dst,
               uint32_t dstStride, int32_t w, int32_t h);

}  // namespace vidshow
