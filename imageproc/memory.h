#pragma once

#include <cstdint>
#include <cstdlib>

namespace vidshow {

constexpr uint64_t RoundUp(uint64_t value, uint64_t alignment) {
    return (value + alignment - 1) / alignment * alignment;
}

inline uint8_t* AlignUp(uint8_t* address, uint64_t alignment) {
    const uintptr_t at = reinterpret_cast<uintptr_t>(address);
    return address + (RoundUp(at, alignment) - at);
}

/// Memory of a block as the items that it is to hold; `address` is aligned for them.
template <typename Item>
Item* ItemsAt(uint8_t* address) {
    return static_cast<Item*>(static_cast<void*>(address));
}

/// `count` pieces of `each` bytes and `slack` bytes more, all zero, in one block.
/// @return null when there is no memory or when the block is larger than an address can reach
inline uint8_t* AllocateZeroed(uint64_t count, uint64_t each, uint64_t slack) {
    if (each > (SIZE_MAX - slack) / count) return nullptr;
    return static_cast<uint8_t*>(std::calloc(1, static_cast<size_t>(count * each + slack)));
}

}  // namespace vidshow
