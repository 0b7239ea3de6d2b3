#include <gtest/gtest.h>
#include <sys/time.h>

#include <chrono>

#include "vidshow/platform/misc.h"

namespace {

using Clock = std::chrono::steady_clock;

double MillisecondsSince(Clock::time_point start) {
    return std::chrono::duration<double, std::milli>(Clock::now() - start).count();
}

TEST(Time, TicksAreTheWallClock) {
    timeval now;
    ASSERT_EQ(gettimeofday(&now, nullptr), 0);
    const uint64_t before =
        static_cast<uint64_t>(now.tv_sec) * 1000 + static_cast<uint64_t>(now.tv_usec) / 1000;
    const DWORD ticks = GetTickCount();
    const DWORD later = timeGetTime();
    EXPECT_LT(static_cast<uint32_t>(ticks - before), 5000u);
    EXPECT_LT(static_cast<uint32_t>(later - ticks), 5000u);
}

TEST(Time, SleepLastsItsTime) {
    const auto start = Clock::now();
    Sleep(30);
    EXPECT_GE(MillisecondsSince(start), 28.0) << "a millisecond may be lost to each truncation";
    EXPECT_LT(MillisecondsSince(start), 5000.0);
}

TEST(Time, SleepOfZeroOrInfiniteReturnsAtOnce) {
    const auto start = Clock::now();
    Sleep(0);
    Sleep(0xFFFFFFFF);
    EXPECT_LT(MillisecondsSince(start), 1000.0);
}

}  // namespace
