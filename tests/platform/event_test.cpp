#include <gtest/gtest.h>

#include <memory>

#include "platform/sync_kit.h"

namespace {

using sync_kit::AutoResetEvent;
using sync_kit::Handle;
using sync_kit::ManualResetEvent;
using sync_kit::Worker;

TEST(Event, ClearEventTimesOutAtOnceWithTimeoutZero) {
    for (const Handle& event : {AutoResetEvent(), ManualResetEvent()}) {
        EXPECT_EQ(WaitForSingleObject(event, 0), 258u);
    }
}

TEST(Event, WaitTakesAnAutoResetEvent) {
    const Handle event = AutoResetEvent();
    EXPECT_EQ(SetEvent(event), 1);
    EXPECT_EQ(WaitForSingleObject(event, 0), 0u);
    EXPECT_EQ(WaitForSingleObject(event, 0), 258u);
}

TEST(Event, AutoResetRemembersOneSetOnly) {
    const Handle event = AutoResetEvent();
    EXPECT_EQ(SetEvent(event), 1);
    EXPECT_EQ(SetEvent(event), 1);
    EXPECT_EQ(WaitForSingleObject(event, INFINITE), 0u);
    EXPECT_EQ(WaitForSingleObject(event, 0), 258u);
}

TEST(Event, ManualResetSatisfiesAnyNumberOfWaitsUntilReset) {
    const Handle event = ManualResetEvent();
    EXPECT_EQ(SetEvent(event), 1);
    for (int i = 0; i < 5; ++i)
        EXPECT_EQ(WaitForSingleObject(event, i == 4 ? INFINITE : 0), 0u);
    EXPECT_EQ(ResetEvent(event), 1);
    EXPECT_EQ(WaitForSingleObject(event, 0), 258u);
}

TEST(Event, InitialStateIsAsAsked) {
    const Handle set = AutoResetEvent(true);
    const Handle manualSet = ManualResetEvent(true);
    EXPECT_EQ(WaitForSingleObject(set, 0), 0u);
    EXPECT_EQ(WaitForSingleObject(manualSet, 0), 0u);
    EXPECT_EQ(WaitForSingleObject(manualSet, 0), 0u);
}

TEST(Event, NamesAreNotShared) {
    const Handle a(CreateEvent(nullptr, TRUE, TRUE, "name"));
    const Handle b(CreateEvent(nullptr, TRUE, FALSE, "name"));
    EXPECT_NE(static_cast<HANDLE>(a), static_cast<HANDLE>(b));
    EXPECT_EQ(WaitForSingleObject(b, 0), 258u);
}

TEST(Event, InvalidHandlesAreRefused) {
    for (HANDLE invalid : sync_kit::InvalidHandles()) {
        EXPECT_EQ(SetEvent(invalid), 0);
        EXPECT_EQ(ResetEvent(invalid), 0);
    }
}

TEST(Event, ManualResetLetsAllWaitersThrough) {
    const Handle event = ManualResetEvent();
    std::vector<std::unique_ptr<Worker>> waiters;
    std::atomic<int> through{0};
    for (int i = 0; i < 6; ++i) {
        waiters.push_back(std::make_unique<Worker>([&] {
            if (WaitForSingleObject(event, INFINITE) == WAIT_OBJECT_0) ++through;
        }));
    }
    for (auto& waiter : waiters)
        waiter->WaitUntilAsleep();
    EXPECT_EQ(through, 0);
    SetEvent(event);
    for (auto& waiter : waiters)
        waiter->Join();
    EXPECT_EQ(through, 6);
}

TEST(Event, AutoResetWakesExactlyOne) {
    constexpr int kWaiters = 6;
    const Handle event = AutoResetEvent();
    const Handle woken = sync_kit::Semaphore(0);
    std::vector<std::unique_ptr<Worker>> waiters;
    std::atomic<int> through{0};
    for (int i = 0; i < kWaiters; ++i) {
        waiters.push_back(std::make_unique<Worker>([&] {
            EXPECT_EQ(WaitForSingleObject(event, INFINITE), WAIT_OBJECT_0);
            ++through;
            ReleaseSemaphore(woken, 1, nullptr);
        }));
    }
    for (int expected = 1; expected <= kWaiters; ++expected) {
        for (auto& waiter : waiters)
            waiter->WaitUntilAsleep();
        SetEvent(event);
        EXPECT_EQ(WaitForSingleObject(woken, INFINITE), WAIT_OBJECT_0);
        for (auto& waiter : waiters)
            waiter->WaitUntilAsleep();
        EXPECT_EQ(through, expected);
        EXPECT_EQ(WaitForSingleObject(event, 0), WAIT_TIMEOUT) << "the waiter has taken it";
    }
}

TEST(EventClass, InitSetAndResetReturnZero) {
    CLinuxEvent event;
    EXPECT_FALSE(event.isSignaled());
    EXPECT_EQ(event.Init(true, true), 0);
    EXPECT_TRUE(event.isSignaled());
    EXPECT_EQ(event.Reset(), 0);
    EXPECT_FALSE(event.isSignaled());
    EXPECT_EQ(event.Set(), 0);
    EXPECT_TRUE(event.isSignaled());
}

TEST(EventClass, ReleaseSetsAnAutoResetEventOnly) {
    CLinuxEvent automatic;
    CLinuxEvent manual;
    automatic.Init(false, false);
    manual.Init(true, false);
    EXPECT_EQ(automatic.Release(), 0);
    EXPECT_EQ(manual.Release(), 0);
    EXPECT_TRUE(automatic.isSignaled());
    EXPECT_FALSE(manual.isSignaled());
}

TEST(EventClass, TakingClearsAnAutoResetEventOnly) {
    CLinuxEvent automatic;
    CLinuxEvent manual;
    automatic.Init(false, true);
    manual.Init(true, true);
    EXPECT_EQ(automatic.WaitAction(), 0);
    EXPECT_EQ(manual.WaitAction(), 0);
    EXPECT_FALSE(automatic.isSignaled());
    EXPECT_TRUE(manual.isSignaled());
}

}  // namespace
