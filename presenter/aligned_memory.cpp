// Aligned memory for clients. The block is taken larger by one alignment, and the result lies 1 to
// `align` bytes into it; the byte before the result says how far.
//
//     raw ... | distance | result, a multiple of align ... size bytes ...

#include <cstdlib>

#include "vidshow/presenter.h"

namespace {

constexpr DWORD kDefaultAlignment = 4;

}  // namespace

extern "C" {

void* vr_malloc(DWORD size, DWORD align) {
    const size_t step = align != 0 ? align : kDefaultAlignment;
    const size_t bytes = size + step;
    if (bytes < step) return nullptr;  // more than a 32-bit process can address

    uint8_t* const raw = static_cast<uint8_t*>(std::calloc(bytes, 1));
    if (raw == nullptr) return nullptr;
    const size_t distance = step - reinterpret_cast<uintptr_t>(raw) % step;
    raw[distance - 1] = static_cast<uint8_t>(distance);
    return raw + distance;
}

void vr_free(void* p) {
    uint8_t* const result = static_cast<uint8_t*>(p);
    std::free(result - result[-1]);
}

}  // extern "C"
