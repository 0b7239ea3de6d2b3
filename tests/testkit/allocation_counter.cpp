// Takes the place of the C library's allocation functions and passes on to what lies behind them.
// `new` ends at malloc.

#include "testkit/allocation_counter.h"

#include <atomic>
#include <cerrno>
#include <cstddef>

extern "C" {

void* __libc_malloc(size_t bytes);
void* __libc_calloc(size_t count, size_t bytes);
void* __libc_realloc(void* block, size_t bytes);
void* __libc_memalign(size_t alignment, size_t bytes);

}  // extern "C"

namespace {

std::atomic<uint64_t> g_allocations{0};

void Count() {
    g_allocations.fetch_add(1, std::memory_order_relaxed);
}

}  // namespace

namespace testkit {

uint64_t Allocations() {
    return g_allocations.load(std::memory_order_relaxed);
}

}  // namespace testkit

#define REPLACES_C_LIBRARY extern "C" __attribute__((visibility("default")))

REPLACES_C_LIBRARY void* malloc(size_t bytes) {
    Count();
    return __libc_malloc(bytes);
}

REPLACES_C_LIBRARY void* calloc(size_t count, size_t bytes) {
    Count();
    return __libc_calloc(count, bytes);
}

REPLACES_C_LIBRARY void* realloc(void* block, size_t bytes) {
    Count();
    return __libc_realloc(block, bytes);
}

REPLACES_C_LIBRARY void* memalign(size_t alignment, size_t bytes) {
    Count();
    return __libc_memalign(alignment, bytes);
}

REPLACES_C_LIBRARY void* aligned_alloc(size_t alignment, size_t bytes) {
    Count();
    return __libc_memalign(alignment, bytes);
}

REPLACES_C_LIBRARY int posix_memalign(void** block, size_t alignment, size_t bytes) {
    Count();
    *block = __libc_memalign(alignment, bytes);
    return *block != nullptr ? 0 : ENOMEM;
}
