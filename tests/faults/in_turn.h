#pragma once

#include <gtest/gtest.h>

#include <filesystem>
#include <iterator>

#include "faults/watch.h"
#include "testkit/capture.h"

namespace faults {

inline ptrdiff_t Descriptors() {
    return std::distance(std::filesystem::directory_iterator("/proc/self/fd"), {});
}

/// Runs `scenario` with its first request refused, then with its second, until it makes no more.
/// It checks its results; that nothing stays behind is checked here.
/// @param mostLocks that may be kept all the same
/// @return how many requests were refused
template <typename Scenario>
int RefuseEachInTurn(Scenario scenario, int mostLocks = 0) {
    scenario();  // makes what a process has once
    for (int request = 0;; ++request) {
        const ptrdiff_t descriptors = Descriptors();
        const char* refused = nullptr;
        int locks = 0, blocks = 0, views = 0;
        {
            const testkit::StdoutCapture silence;
            const Watch watch(request);
            scenario();
            refused = watch.refused();
            locks = watch.heldLocks();
            blocks = watch.liveBlocks();
            views = watch.liveViews();
        }
        const char* const what = refused != nullptr ? refused : "nothing";
        EXPECT_LE(locks, mostLocks)
            << "held after request " << request << ", " << what << ", was refused";
        EXPECT_GE(locks, 0) << "given back once too often after request " << request << ", "
                            << what;
        EXPECT_EQ(blocks, 0) << "kept after request " << request << ", " << what << ", was refused";
        EXPECT_EQ(views, 0) << "kept after request " << request << ", " << what << ", was refused";
        EXPECT_EQ(Descriptors(), descriptors) << "after request " << request << ", " << what;
        if (refused == nullptr || testing::Test::HasFailure()) return request;
    }
}

}  // namespace faults
