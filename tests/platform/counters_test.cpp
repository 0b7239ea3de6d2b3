#include <gtest/gtest.h>

#include <limits>
#include <thread>
#include <vector>

#include "vidshow/platform/misc.h"

namespace {

constexpr LONG kMin = std::numeric_limits<int32_t>::min();
constexpr LONG kMax = std::numeric_limits<int32_t>::max();

TEST(Interlocked, IncrementAndDecrementReturnTheNewValue) {
    LONG value = -1;
    EXPECT_EQ(InterlockedIncrement(&value), 0);
    EXPECT_EQ(InterlockedIncrement(&value), 1);
    EXPECT_EQ(InterlockedDecrement(&value), 0);
    EXPECT_EQ(InterlockedDecrement(&value), -1);
    EXPECT_EQ(value, -1);
}

TEST(Interlocked, CountersWrap) {
    LONG value = kMax;
    EXPECT_EQ(InterlockedIncrement(&value), kMin);
    EXPECT_EQ(InterlockedDecrement(&value), kMax);
}

TEST(Interlocked, ExchangeReturnsThePreviousValue) {
    LONG value = 5;
    EXPECT_EQ(InterlockedExchange(&value, -9), 5);
    EXPECT_EQ(value, -9);
}

TEST(Interlocked, ExchangeAddReturnsTheNewValue) {
    LONG value = 5;
    EXPECT_EQ(InterlockedExchangeAdd(&value, 3), 8);
    EXPECT_EQ(value, 8);
    EXPECT_EQ(InterlockedExchangeAdd(&value, -10), -2);
    value = kMax;
    EXPECT_EQ(InterlockedExchangeAdd(&value, 2), kMin + 1);
}

// Every thread sees its own numbers only once: the value returned is that of its own step.
TEST(Interlocked, ConcurrentIncrementsReturnEachNumberOnce) {
    constexpr int kThreads = 4;
    constexpr LONG kSteps = 5000;
    LONG value = 0;
    std::vector<std::vector<LONG>> returned(kThreads);
    std::vector<std::thread> threads;
    for (auto& mine : returned) {
        threads.emplace_back([&value, &mine] {
            for (LONG i = 0; i < kSteps; ++i)
                mine.push_back(InterlockedIncrement(&value));
        });
    }
    for (auto& thread : threads)
        thread.join();

    EXPECT_EQ(value, kThreads * kSteps);
    std::vector<int> times(kThreads * kSteps + 1);
    for (const auto& mine : returned) {
        for (LONG number : mine)
            ++times.at(static_cast<size_t>(number));
    }
    EXPECT_EQ(times[0], 0);
    for (size_t i = 1; i < times.size(); ++i)
        EXPECT_EQ(times[i], 1) << i;
}

TEST(Interlocked, ConcurrentIncrementsAndDecrementsCancel) {
    constexpr int kSteps = 10000;
    LONG value = 7;
    std::thread up([&] {
        for (int i = 0; i < kSteps; ++i)
            InterlockedIncrement(&value);
    });
    std::thread down([&] {
        for (int i = 0; i < kSteps; ++i)
            InterlockedDecrement(&value);
    });
    up.join();
    down.join();
    EXPECT_EQ(value, 7);
}

// A client that counts on the same word by atomic means of its own loses nothing.
TEST(Interlocked, StepsAreAtomicForOthersToo) {
    constexpr int kSteps = 20000;
    LONG value = 0;
    std::thread locked([&] {
        for (int i = 0; i < kSteps; ++i)
            InterlockedIncrement(&value);
    });
    for (int i = 0; i < kSteps; ++i)
        __atomic_fetch_add(&value, 1, __ATOMIC_RELAXED);
    locked.join();
    EXPECT_EQ(value, 2 * kSteps);
}

}  // namespace
