#include <errno.h>
#include <gtest/gtest.h>
#include <limits.h>

#include "platform/sync_kit.h"

namespace {

using sync_kit::Handle;
using sync_kit::Semaphore;
using sync_kit::Worker;

LONG UnitsOf(HANDLE semaphore) {
    LONG units = -1;
    EXPECT_EQ(ReleaseSemaphore(semaphore, 0, &units), 1);
    return units;
}

TEST(Semaphore, MaximumIsNotEnforced) {
    const Handle semaphore(CreateSemaphore(nullptr, 2, 1, nullptr));
    EXPECT_EQ(WaitForSingleObject(semaphore, 0), 0u);
    EXPECT_EQ(WaitForSingleObject(semaphore, INFINITE), 0u);
    EXPECT_EQ(WaitForSingleObject(semaphore, 0), 258u);
    EXPECT_EQ(ReleaseSemaphore(semaphore, 5, nullptr), 1);
    EXPECT_EQ(UnitsOf(semaphore), 5);
}

TEST(Semaphore, ReleasingNoneTellsTheUnitsAndAddsNothing) {
    const Handle semaphore = Semaphore(3);
    for (LONG count : {0, -1, -1000}) {
        LONG previous = -1;
        EXPECT_EQ(ReleaseSemaphore(semaphore, count, &previous), 1);
        EXPECT_EQ(previous, 3);
    }
    const Handle empty = Semaphore(0);
    EXPECT_EQ(ReleaseSemaphore(empty, 0, nullptr), 1);
    EXPECT_EQ(WaitForSingleObject(empty, 0), 258u);
}

TEST(Semaphore, PreviousIsTheNumberBefore) {
    const Handle semaphore = Semaphore(0);
    LONG previous = -1;
    EXPECT_EQ(ReleaseSemaphore(semaphore, 4, &previous), 1);
    EXPECT_EQ(previous, 0);
    EXPECT_EQ(ReleaseSemaphore(semaphore, 1, &previous), 1);
    EXPECT_EQ(previous, 4);
    EXPECT_EQ(UnitsOf(semaphore), 5);
}

TEST(Semaphore, EachWaitTakesOneUnit) {
    const Handle semaphore = Semaphore(3);
    for (LONG left = 2; left >= 0; --left) {
        EXPECT_EQ(WaitForSingleObject(semaphore, 0), 0u);
        EXPECT_EQ(UnitsOf(semaphore), left);
    }
    EXPECT_EQ(WaitForSingleObject(semaphore, 0), 258u);
}

TEST(Semaphore, NegativeInitialGivesNull) {
    EXPECT_EQ(CreateSemaphore(nullptr, -1, 1, nullptr), nullptr);
}

TEST(Semaphore, LargestNumberOfUnitsIsTheSystems) {
    const Handle semaphore(CreateSemaphore(nullptr, SEM_VALUE_MAX - 2, 1, nullptr));
    ASSERT_NE(static_cast<HANDLE>(semaphore), nullptr);
    EXPECT_EQ(ReleaseSemaphore(semaphore, 5, nullptr), 1) << "two fit, so it counts as done";
    EXPECT_EQ(UnitsOf(semaphore), SEM_VALUE_MAX);
    LONG previous = 0;
    EXPECT_EQ(ReleaseSemaphore(semaphore, 1, &previous), 0) << "not one fits";
    EXPECT_EQ(previous, SEM_VALUE_MAX);
}

TEST(Semaphore, NamesAreNotShared) {
    const Handle a(CreateSemaphore(nullptr, 1, 1, "name"));
    const Handle b(CreateSemaphore(nullptr, 0, 1, "name"));
    EXPECT_EQ(WaitForSingleObject(b, 0), 258u);
    EXPECT_EQ(WaitForSingleObject(a, 0), 0u);
}

TEST(Semaphore, InvalidHandlesAreRefused) {
    for (HANDLE invalid : sync_kit::InvalidHandles()) {
        LONG previous = 77;
        EXPECT_EQ(ReleaseSemaphore(invalid, 1, &previous), 0);
        EXPECT_EQ(previous, 77);
    }
}

TEST(Semaphore, ReleaseOfSeveralWakesAsManyWaiters) {
    const Handle semaphore = Semaphore(0);
    const Handle woken = Semaphore(0);
    std::vector<std::unique_ptr<Worker>> waiters;
    for (int i = 0; i < 5; ++i) {
        waiters.push_back(std::make_unique<Worker>([&] {
            EXPECT_EQ(WaitForSingleObject(semaphore, INFINITE), WAIT_OBJECT_0);
            ReleaseSemaphore(woken, 1, nullptr);
        }));
    }
    for (auto& waiter : waiters)
        waiter->WaitUntilAsleep();
    ReleaseSemaphore(semaphore, 3, nullptr);
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(WaitForSingleObject(woken, INFINITE), WAIT_OBJECT_0);
    for (auto& waiter : waiters)
        waiter->WaitUntilAsleep();
    EXPECT_EQ(UnitsOf(woken), 0);
    EXPECT_EQ(UnitsOf(semaphore), 0);
    ReleaseSemaphore(semaphore, 2, nullptr);
}

TEST(SemaphoreClass, InitSignalsWhenThereAreUnits) {
    CLinuxSemaphore empty;
    EXPECT_EQ(empty.Init(0, 1), 0);
    EXPECT_FALSE(empty.isSignaled());
    CLinuxSemaphore filled;
    EXPECT_EQ(filled.Init(2, 1), 0);
    EXPECT_TRUE(filled.isSignaled());
    CLinuxSemaphore refused;
    EXPECT_NE(refused.Init(-1, 1), 0);
    EXPECT_FALSE(refused.isSignaled());
}

TEST(SemaphoreClass, TakingTheLastUnitClears) {
    CLinuxSemaphore semaphore;
    semaphore.Init(2, 2);
    EXPECT_EQ(semaphore.WaitAction(), 0);
    EXPECT_TRUE(semaphore.isSignaled());
    EXPECT_EQ(semaphore.WaitAction(), 0);
    EXPECT_FALSE(semaphore.isSignaled());
    EXPECT_EQ(semaphore.WaitAction(), -1);
}

TEST(SemaphoreClass, ReleaseGivesOneUnitBack) {
    CLinuxSemaphore semaphore;
    semaphore.Init(0, 1);
    EXPECT_EQ(semaphore.Release(), 0);
    EXPECT_TRUE(semaphore.isSignaled());
    LONG units = 0;
    EXPECT_EQ(semaphore.Release(0, &units), 0);
    EXPECT_EQ(units, 1);
}

}  // namespace
