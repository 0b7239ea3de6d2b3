#include <gtest/gtest.h>

#include <memory>

#include "platform/sync_kit.h"

namespace {

using sync_kit::AutoResetEvent;
using sync_kit::Handle;
using sync_kit::ManualResetEvent;
using sync_kit::Milliseconds;
using sync_kit::Mutex;
using sync_kit::OnAnotherThread;
using sync_kit::ProcessorMilliseconds;
using sync_kit::Semaphore;
using sync_kit::Worker;

DWORD WaitAny(std::vector<HANDLE> handles, DWORD ms) {
    return WaitForMultipleObjects(static_cast<DWORD>(handles.size()), handles.data(), FALSE, ms);
}

DWORD WaitAll(std::vector<HANDLE> handles, DWORD ms) {
    return WaitForMultipleObjects(static_cast<DWORD>(handles.size()), handles.data(), TRUE, ms);
}

TEST(WaitAny, LowerIndexWinsAndOnlyOneIsTaken) {
    const Handle a = AutoResetEvent(true);
    const Handle b = AutoResetEvent(true);
    EXPECT_EQ(WaitAny({a, b}, 1000), 0u);
    EXPECT_EQ(WaitForSingleObject(b, 0), 0u) << "b was left";
    EXPECT_EQ(WaitForSingleObject(a, 0), 258u) << "a was taken";
}

TEST(WaitAny, ReturnsTheIndexOfTheSignalledObject) {
    const Handle a = AutoResetEvent();
    const Handle b = Semaphore(1);
    const Handle c = Mutex();
    EXPECT_EQ(WaitAny({a, b, c}, INFINITE), 1u);
    EXPECT_EQ(WaitAny({a, b, c}, INFINITE), 2u);
    EXPECT_EQ(ReleaseMutex(c), 1) << "the waiter owns it";
}

TEST(WaitAny, NullHandlesArePassedOver) {
    const Handle event = AutoResetEvent(true);
    EXPECT_EQ(WaitAny({nullptr, nullptr, event}, 1000), 2u);
}

TEST(WaitAny, RunningOutOfTimeIsAFailure) {
    const Handle a = AutoResetEvent();
    const Handle b = AutoResetEvent();
    const double taken = Milliseconds([&] { EXPECT_EQ(WaitAny({a, b}, 50), 0xFFFFFFFFu); });
    EXPECT_GE(taken, 49.0) << "a millisecond may be lost to the clock's truncation";
    EXPECT_LE(taken, 2000.0);
}

// At the end of the time nothing is looked at, and a time of 0 ends at once. Clients rely on it:
// kept.
TEST(WaitAny, TimeoutZeroTakesNothing) {
    const Handle event = AutoResetEvent(true);
    EXPECT_EQ(WaitAny({event}, 0), 0xFFFFFFFFu);
    EXPECT_EQ(WaitForSingleObject(event, 0), 0u);
}

TEST(WaitAny, CountZeroRunsOutOfTime) {
    EXPECT_EQ(WaitForMultipleObjects(0, nullptr, FALSE, 20), 0xFFFFFFFFu);
}

TEST(WaitAny, SeesAnObjectThatIsSignalledLater) {
    const Handle a = AutoResetEvent();
    const Handle b = ManualResetEvent();
    DWORD result = 77;
    Worker waiter([&] { result = WaitAny({a, b}, INFINITE); });
    waiter.WaitUntilAsleep();
    SetEvent(b);
    waiter.Join();
    EXPECT_EQ(result, 1u);
}

TEST(WaitAny, PollingCostsLittleProcessorTime) {
    const Handle event = AutoResetEvent();
    const double spent = ProcessorMilliseconds([&] { WaitAny({event}, 300); });
    EXPECT_LT(spent, 60.0);
}

// An object that is never there and tells whether somebody has looked.
class Probe : public CLinuxSyncObject {
  public:
    const char* getType() const override { return "probe"; }
    int WaitAction() override { return -1; }
    DWORD WaitForSignal(DWORD) override {
        looked = true;
        return WAIT_TIMEOUT;
    }
    std::atomic<bool> looked{false};
};

TEST(WaitAny, TwentyAtATimeAndThe21stFails) {
    constexpr int kWaiters = 20;
    for (int round = 0; round < 2; ++round) {  // the registry fills, drains, and fills again
        const Handle ready = Semaphore(0);
        std::vector<Probe> probes(kWaiters);
        std::vector<std::unique_ptr<Worker>> waiters;
        for (Probe& probe : probes) {
            waiters.push_back(std::make_unique<Worker>([&] {
                EXPECT_EQ(WaitAny({ready, &probe}, INFINITE), 0u);
            }));
        }
        for (Probe& probe : probes) {
            while (!probe.looked)
                std::this_thread::yield();
        }
        const double taken = Milliseconds([&] {
            EXPECT_EQ(WaitAny({ready}, INFINITE), 0xFFFFFFFFu) << "no place in the registry";
        });
        EXPECT_LT(taken, 2000.0);
        EXPECT_EQ(WaitAll({ready}, 0), WAIT_TIMEOUT) << "a wait for all needs no place";
        ReleaseSemaphore(ready, kWaiters, nullptr);
        for (auto& waiter : waiters)
            waiter->Join();
        EXPECT_EQ(WaitForSingleObject(ready, 0), WAIT_TIMEOUT) << "each took one unit";
    }
    const Handle set = ManualResetEvent(true);
    EXPECT_EQ(WaitAny({set}, INFINITE), 0u);
}

TEST(WaitAll, TakesAll) {
    const Handle event = AutoResetEvent(true);
    const Handle manual = ManualResetEvent(true);
    const Handle semaphore = Semaphore(2);
    const Handle mutex = Mutex();
    EXPECT_EQ(WaitAll({event, manual, semaphore, mutex}, INFINITE), 0u);
    EXPECT_EQ(WaitForSingleObject(event, 0), 258u);
    EXPECT_EQ(WaitForSingleObject(manual, 0), 0u);
    LONG units = -1;
    ReleaseSemaphore(semaphore, 0, &units);
    EXPECT_EQ(units, 1);
    EXPECT_EQ(ReleaseMutex(mutex), 1);
}

TEST(WaitAll, CountZeroFails) {
    EXPECT_EQ(WaitForMultipleObjects(0, nullptr, TRUE, 0), 0xFFFFFFFFu);
    EXPECT_EQ(WaitForMultipleObjects(0, nullptr, TRUE, INFINITE), 0xFFFFFFFFu);
}

TEST(WaitAll, ClearEventTimesOutAtOnceWithTimeoutZero) {
    const Handle event = AutoResetEvent();
    EXPECT_EQ(WaitAll({event}, 0), 258u);
}

TEST(WaitAll, WhatWasTakenIsGivenBackWhenOneIsMissing) {
    const Handle event = AutoResetEvent(true);
    const Handle semaphore = Semaphore(1);
    const Handle mutex = Mutex();
    const Handle manual = ManualResetEvent(true);
    const Handle missing = AutoResetEvent();
    for (DWORD ms : {0u, 20u}) {
        EXPECT_EQ(WaitAll({event, semaphore, mutex, manual, missing}, ms), 258u);
        EXPECT_EQ(WaitAll({missing, event, semaphore, mutex, manual}, ms), 258u);
        EXPECT_EQ(WaitAll({event, semaphore, missing, mutex, manual}, ms), 258u);
    }
    EXPECT_EQ(WaitForSingleObject(event, 0), 0u);
    EXPECT_EQ(WaitForSingleObject(semaphore, 0), 0u);
    EXPECT_EQ(WaitForSingleObject(manual, 0), 0u);
    OnAnotherThread([&] {
        EXPECT_EQ(WaitForSingleObject(mutex, 0), 0u);
        EXPECT_EQ(ReleaseMutex(mutex), 1);
    });
}

TEST(WaitAll, TimeoutCountsOverAllAttempts) {
    const Handle first = AutoResetEvent(true);
    const Handle missing = AutoResetEvent();
    const double taken = Milliseconds([&] {
        EXPECT_EQ(WaitAll({first, missing}, 60), WAIT_TIMEOUT);
    });
    EXPECT_GE(taken, 58.0) << "a millisecond may be lost to the clock's truncation";
    EXPECT_LT(taken, 2000.0);
}

TEST(WaitAll, BlocksOnTheMissingOneAndTakesAllWhenItComes) {
    const Handle first = Semaphore(1);
    const Handle missing = AutoResetEvent();
    DWORD result = 77;
    Worker waiter([&] { result = WaitAll({first, missing}, INFINITE); });
    waiter.WaitUntilAsleep();
    EXPECT_FALSE(waiter.done());
    EXPECT_EQ(WaitForSingleObject(first, INFINITE), 0u) << "nothing is held while it blocks";
    ReleaseSemaphore(first, 1, nullptr);
    SetEvent(missing);
    waiter.Join();
    EXPECT_EQ(result, 0u);
    EXPECT_EQ(WaitForSingleObject(first, 0), 258u);
    EXPECT_EQ(WaitForSingleObject(missing, 0), 258u);
}

TEST(WaitAll, BlockedWaiterCostsNoProcessorTime) {
    const Handle set = AutoResetEvent(true);
    const Handle missing = AutoResetEvent();
    const double spent = ProcessorMilliseconds([&] {
        EXPECT_EQ(WaitAll({set, missing}, 300), WAIT_TIMEOUT);
    });
    EXPECT_LT(spent, 30.0);
}

TEST(WaitAll, OwnedMutexIsTakenOnceMore) {
    const Handle mutex = Mutex();
    const Handle event = AutoResetEvent(true);
    ASSERT_EQ(WaitForSingleObject(mutex, 0), 0u);
    EXPECT_EQ(WaitAll({mutex, event}, 0), 0u);
    EXPECT_EQ(ReleaseMutex(mutex), 1);
    EXPECT_EQ(ReleaseMutex(mutex), 1);
    EXPECT_EQ(ReleaseMutex(mutex), 0);
}

TEST(WaitAll, SameSemaphoreTwiceTakesTwoUnits) {
    const Handle semaphore = Semaphore(2);
    EXPECT_EQ(WaitAll({semaphore, semaphore}, 0), 0u);
    EXPECT_EQ(WaitForSingleObject(semaphore, 0), 258u);
}

TEST(WaitAll, FailingObjectFailsTheWaitWhenItIsBlockedOn) {
    CLinuxMutex broken;  // never initialised
    EXPECT_EQ(WaitAll({&broken}, 0), WAIT_FAILED);
    const Handle event = AutoResetEvent(true);
    EXPECT_EQ(WaitAll({event, &broken}, INFINITE), WAIT_FAILED);
    EXPECT_EQ(WaitForSingleObject(event, 0), 0u) << "given back first";
}

// Waits in their own right.
TEST(MultiWaitClass, SignalFindsTheWaitsOfAnObject) {
    const Handle event = AutoResetEvent();
    const Handle other = AutoResetEvent();
    EXPECT_EQ(CLinuxMultiWait::Signal(event), 1) << "nobody is registered";
    const HANDLE handles[] = {nullptr, event};
    CLinuxMultiWait wait(2, handles);
    EXPECT_EQ(CLinuxMultiWait::Signal(event), 1) << "not registered yet";
    ASSERT_EQ(wait.Init(), 0);
    EXPECT_EQ(CLinuxMultiWait::Signal(other), 2);
    EXPECT_FALSE(wait.CLinuxSyncObject::isSignaled());
    EXPECT_EQ(CLinuxMultiWait::Signal(event), 0);
    EXPECT_TRUE(wait.CLinuxSyncObject::isSignaled()) << "the flag, which the wait does not look at";
    EXPECT_FALSE(wait.isSignaled());
    EXPECT_EQ(WaitForSingleObject(event, 0), 258u);
}

TEST(MultiWaitClass, IsSignaledTakesTheFirstAndTellsItsIndex) {
    const Handle a = AutoResetEvent();
    const Handle b = AutoResetEvent(true);
    const HANDLE handles[] = {a, b};
    CLinuxMultiWait wait(2, handles);
    EXPECT_EQ(wait.GetSignaledIndex(), 0u);
    EXPECT_TRUE(wait.isSignaled());
    EXPECT_EQ(wait.GetSignaledIndex(), 1u);
    EXPECT_FALSE(wait.isSignaled());
    EXPECT_EQ(wait.WaitForSignal(1), 0xFFFFFFFFu);
    SetEvent(a);
    EXPECT_EQ(wait.WaitForSignal(1000), 0u);
    EXPECT_EQ(wait.GetSignaledIndex(), 0u);
}

TEST(MultiWaitClass, WaitActionLeavesTheRegistryOnce) {
    const Handle event = AutoResetEvent();
    const HANDLE handle = event;
    CLinuxMultiWait wait(1, &handle);
    EXPECT_EQ(wait.WaitAction(), -1) << "not there yet";
    ASSERT_EQ(wait.Init(), 0);
    EXPECT_EQ(wait.WaitAction(), 0);
    EXPECT_EQ(CLinuxMultiWait::Signal(event), 1);
    EXPECT_EQ(wait.WaitAction(), -1);
}

}  // namespace
