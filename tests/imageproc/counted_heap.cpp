#include "imageproc/counted_heap.h"

#include <cstdint>
#include <cstdlib>
#include <cstring>

extern "C" {

void* __libc_malloc(size_t bytes);
void* __libc_calloc(size_t count, size_t bytes);
void __libc_free(void* block);

}  // extern "C"

namespace {

constexpr int kMost = 64;

// The state of the one watch. Plain data: it is used before constructors have run.
bool g_watching;
int g_failing;
int g_count;
size_t g_sizes[kMost];
void* g_blocks[kMost];

// Notes an allocation; past the last place (a failing test has much to say) it looks away.
// @return whether the allocation is to fail
bool Fails(size_t bytes) {
    if (!g_watching || g_count >= kMost) return false;
    g_sizes[g_count] = bytes;
    g_blocks[g_count] = nullptr;
    return g_count++ == g_failing;
}

void* Noted(void* block) {
    if (g_watching && g_count < kMost) g_blocks[g_count - 1] = block;
    return block;
}

}  // namespace

namespace imageproc_test {

CountedHeap::CountedHeap(int failing) {
    g_failing = failing;
    g_count = 0;
    g_watching = true;
}

CountedHeap::~CountedHeap() {
    g_watching = false;
}

int CountedHeap::allocations() const {
    return g_count;
}

int CountedHeap::live() const {
    int n = 0;
    for (int i = 0; i < g_count; ++i)
        n += g_blocks[i] != nullptr;
    return n;
}

size_t CountedHeap::size(int number) const {
    return g_sizes[number];
}

}  // namespace imageproc_test

extern "C" {

__attribute__((visibility("default"))) void* malloc(size_t bytes) {
    return Fails(bytes) ? nullptr : Noted(__libc_malloc(bytes));
}

__attribute__((visibility("default"))) void* calloc(size_t count, size_t each) {
    return Fails(count * each) ? nullptr : Noted(__libc_calloc(count, each));
}

__attribute__((visibility("default"))) void free(void* block) {
    if (g_watching && block) {
        for (int i = 0; i < g_count; ++i) {
            if (g_blocks[i] == block) g_blocks[i] = nullptr;
        }
    }
    __libc_free(block);
}

}  // extern "C"
