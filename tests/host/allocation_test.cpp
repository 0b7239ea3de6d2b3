#include "testkit/allocation_counter.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <new>

#include "android/native_window.h"
#include "vidshow-host/window.h"

namespace {

using vidshow::host::kFormatYv12;
using vidshow::host::Window;

void PostFrame(ANativeWindow* window) {
    ANativeWindow_Buffer buffer;
    ASSERT_EQ(ANativeWindow_lock(window, &buffer, nullptr), 0);
    ASSERT_EQ(ANativeWindow_unlockAndPost(window), 0);
}

TEST(Allocation, CounterSeesEveryWayToTheHeap) {
    void* volatile block = nullptr;  // or the compiler drops what nobody uses
    const auto allocationsOf = [&block](auto allocate) {
        const uint64_t before = testkit::Allocations();
        block = allocate();
        return testkit::Allocations() - before;
    };
    EXPECT_EQ(allocationsOf([] { return ::operator new(8); }), 1u);
    ::operator delete(block);
    EXPECT_EQ(allocationsOf([] { return std::malloc(8); }), 1u);
    EXPECT_EQ(allocationsOf([&block] { return std::realloc(block, 4096); }), 1u);
    std::free(block);
    EXPECT_EQ(allocationsOf([] { return std::calloc(2, 4); }), 1u);
    std::free(block);
    EXPECT_EQ(allocationsOf([] { return aligned_alloc(64, 64); }), 1u);
    std::free(block);
    EXPECT_EQ(allocationsOf([] {
                  void* aligned = nullptr;
                  return posix_memalign(&aligned, 64, 64) == 0 ? aligned : nullptr;
              }),
              1u);
    std::free(block);
}

TEST(Allocation, FrameAllocatesNothingOnceThePoolIsMade) {
    Window window;
    uint64_t shown = 0;
    window.onFrame([&shown](const vidshow::host::Frame&) { ++shown; });
    ASSERT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 320, 240, kFormatYv12), 0);
    PostFrame(window.get());
    const uint64_t before = testkit::Allocations();
    for (int i = 0; i < 20; ++i) {
        PostFrame(window.get());
    }
    EXPECT_EQ(testkit::Allocations(), before);
    EXPECT_EQ(shown, 21u);
}

}  // namespace
