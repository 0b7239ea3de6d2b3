#pragma once

#include <cstdint>
#include <string>

#include "vidshow/imageproc.h"

namespace imageproc_test {

/// The planes of one frame. Strides are in bytes.
struct Planes {
    uint8_t* plane[3];
    uint32_t stride[3];
};

/// The resize case that creation arrives at.
uint32_t ExpectedCase(const QZ_IMAGEPROC_INIT_PARAMS& params);

/// What the processor should do with one frame, by calling the kernel that serves it. `p` is a
/// processor of its own for the same parameters and with the same adjustment; sizes in `params` are
/// multiples of 4.
void RunExpectedFrame(const QZ_IMAGEPROC_INIT_PARAMS& params, QZ_IMAGEPROC_PARAMSET* p,
                      const Planes& src, const Planes& dst);

/// A vector kernel by its exported name: the family's, with the matrix number in place of a '#', or
/// at its end.
void* VectorKernel(const std::string& family, uint32_t matrix);

}  // namespace imageproc_test
