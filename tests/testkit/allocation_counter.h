#pragma once

#include <cstdint>

namespace testkit {

/// Blocks that the process has taken from the heap so far, by any of the C library's functions or
/// by `new`; a block that is resized counts again.
uint64_t Allocations();

}  // namespace testkit
