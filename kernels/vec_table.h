#pragma once

namespace vidshow {

/// Entry points of the vector kernels: 30 groups of four, group by group as vec_list.h lists them,
/// inside a group by colour matrix. Constant data, written by nobody but the dynamic linker.
extern void* const kVectorKernels[120];

}  // namespace vidshow
