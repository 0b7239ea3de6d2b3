#pragma once

#include <cstddef>

namespace imageproc_test {

/// Watches malloc, calloc and free of this program while it exists; one at a time. The definitions
/// in counted_heap.cpp take the place of the C library's for the library under test, too.
class CountedHeap {
  public:
    /// @param failing  number of the allocation, from 0, that finds no memory; negative: none does
    explicit CountedHeap(int failing = -1);
    ~CountedHeap();
    CountedHeap(const CountedHeap&) = delete;
    CountedHeap& operator=(const CountedHeap&) = delete;

    int allocations() const;        ///< asked for so far, the failing one included
    int live() const;               ///< of those, not freed yet
    size_t size(int number) const;  ///< bytes asked for
};

}  // namespace imageproc_test
