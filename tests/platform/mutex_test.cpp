#include <errno.h>
#include <gtest/gtest.h>

#include "platform/sync_kit.h"

namespace {

using sync_kit::Handle;
using sync_kit::Mutex;
using sync_kit::OnAnotherThread;
using sync_kit::Worker;

bool FreeForOthers(HANDLE mutex) {
    bool isFree = false;
    OnAnotherThread([&] {
        isFree = WaitForSingleObject(mutex, 0) == WAIT_OBJECT_0;
        if (isFree) ReleaseMutex(mutex);
    });
    return isFree;
}

TEST(Mutex, NewMutexIsFreeEvenWithInitialOwner) {
    const Handle mutex(CreateMutex(nullptr, TRUE, nullptr));
    EXPECT_TRUE(FreeForOthers(mutex));
    EXPECT_EQ(ReleaseMutex(mutex), 0) << "nobody owns it";
}

TEST(Mutex, OwnerWaitsAgainAndReleasesAsOften) {
    const Handle mutex = Mutex();
    EXPECT_EQ(WaitForSingleObject(mutex, INFINITE), 0u);
    EXPECT_EQ(WaitForSingleObject(mutex, 0), 0u);
    EXPECT_EQ(WaitForSingleObject(mutex, 10), 0u);
    for (int i = 0; i < 3; ++i) {
        EXPECT_FALSE(FreeForOthers(mutex)) << i;
        EXPECT_EQ(ReleaseMutex(mutex), 1);
    }
    EXPECT_TRUE(FreeForOthers(mutex));
    EXPECT_EQ(ReleaseMutex(mutex), 0);
}

TEST(Mutex, ReleaseByAnotherThreadFails) {
    const Handle mutex = Mutex();
    ASSERT_EQ(WaitForSingleObject(mutex, 0), 0u);
    OnAnotherThread([&] { EXPECT_EQ(ReleaseMutex(mutex), 0); });
    EXPECT_FALSE(FreeForOthers(mutex));
    EXPECT_EQ(ReleaseMutex(mutex), 1);
}

TEST(Mutex, WaiterGetsItWhenTheOwnerLetsGo) {
    const Handle mutex = Mutex();
    int guarded = 0;  // guarded by mutex
    ASSERT_EQ(WaitForSingleObject(mutex, 0), 0u);
    Worker waiter([&] {
        EXPECT_EQ(WaitForSingleObject(mutex, INFINITE), 0u);
        EXPECT_EQ(guarded, 1);
        EXPECT_EQ(ReleaseMutex(mutex), 1);
    });
    waiter.WaitUntilAsleep();
    EXPECT_FALSE(waiter.done());
    guarded = 1;
    EXPECT_EQ(ReleaseMutex(mutex), 1);
    waiter.Join();
    EXPECT_TRUE(FreeForOthers(mutex));
}

TEST(Mutex, InvalidHandlesAreRefused) {
    for (uint32_t invalid : {0u, 0xFFFFFFFEu, 0xFFFFFFFFu}) {
        EXPECT_EQ(ReleaseMutex(sync_kit::HandleValue(invalid)), 0);
    }
}

TEST(MutexClass, IsUsableBetweenInitAndDelete) {
    CLinuxMutex mutex;
    EXPECT_EQ(mutex.WaitForSignal(INFINITE), WAIT_FAILED);
    EXPECT_EQ(mutex.Release(), -1);
    EXPECT_EQ(mutex.Init(), 0);
    EXPECT_EQ(mutex.WaitForSignal(INFINITE), WAIT_OBJECT_0);
    EXPECT_EQ(mutex.Release(), 0);
    EXPECT_EQ(mutex.Delete(), 0);
    EXPECT_EQ(mutex.WaitForSignal(INFINITE), WAIT_FAILED);
    EXPECT_EQ(mutex.Release(), -1);
}

TEST(MutexClass, IsSignaledForItsOwnerOnly) {
    CLinuxMutex mutex;
    mutex.Init();
    EXPECT_TRUE(mutex.isSignaled());
    ASSERT_EQ(mutex.WaitForSignal(0), WAIT_OBJECT_0);
    EXPECT_TRUE(mutex.isSignaled());
    OnAnotherThread([&] { EXPECT_FALSE(mutex.isSignaled()); });
    EXPECT_EQ(mutex.Release(), 0);
}

TEST(MutexClass, ReleaseByAnyoneElseReturnsTheError) {
    CLinuxMutex mutex;
    mutex.Init();
    EXPECT_EQ(mutex.Release(), EPERM) << "free";
    ASSERT_EQ(mutex.WaitForSignal(0), WAIT_OBJECT_0);
    OnAnotherThread([&] { EXPECT_EQ(mutex.Release(), EPERM); });
    EXPECT_EQ(mutex.Release(), 0);
    EXPECT_EQ(mutex.Release(), EPERM) << "free again";
}

// The flag alone does not make a mutex free: the inner mutex has the last word.
TEST(MutexClass, TakingWhatAnotherThreadHoldsFails) {
    CLinuxMutex mutex;
    mutex.Init();
    ASSERT_EQ(mutex.WaitForSignal(0), WAIT_OBJECT_0);
    EXPECT_EQ(mutex.SetSignaled(true, true), 0);
    OnAnotherThread([&] {
        EXPECT_EQ(mutex.WaitAction(), -1);
        EXPECT_EQ(mutex.WaitForSignal(INFINITE), WAIT_FAILED);
    });
    EXPECT_EQ(mutex.Release(), 0);
}

}  // namespace
