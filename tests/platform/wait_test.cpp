// Waits for one object, and what all objects have in common.

#include <gtest/gtest.h>

#include <cstring>

#include "platform/sync_kit.h"

namespace {

using sync_kit::AutoResetEvent;
using sync_kit::Handle;
using sync_kit::Milliseconds;
using sync_kit::Mutex;
using sync_kit::ProcessorMilliseconds;
using sync_kit::Semaphore;
using sync_kit::Worker;

TEST(Wait, InvalidHandlesFail) {
    for (HANDLE invalid : sync_kit::InvalidHandles()) {
        EXPECT_EQ(WaitForSingleObject(invalid, 0), 0xFFFFFFFFu);
        EXPECT_EQ(WaitForSingleObject(invalid, INFINITE), 0xFFFFFFFFu);
        EXPECT_EQ(CloseHandle(invalid), 0);
    }
}

TEST(Wait, CloseHandleReturnsOne) {
    EXPECT_EQ(CloseHandle(CreateEvent(nullptr, FALSE, FALSE, nullptr)), 1);
    EXPECT_EQ(CloseHandle(CreateSemaphore(nullptr, 0, 1, nullptr)), 1);
    EXPECT_EQ(CloseHandle(CreateMutex(nullptr, FALSE, nullptr)), 1);
}

// The bounds are wide above because the machine may be busy; nothing may be early.
TEST(Wait, AbandonedWaitsTimeOutWithinTheirBounds) {
    const Handle event = AutoResetEvent();
    const Handle semaphore = Semaphore(0);
    const Handle mutex = Mutex();
    ASSERT_EQ(WaitForSingleObject(mutex, 0), 0u);
    Worker other([&] {
        for (HANDLE object : {HANDLE(event), HANDLE(semaphore), HANDLE(mutex)}) {
            for (DWORD ms : {1u, 20u, 60u}) {
                const double taken =
                    Milliseconds([&] { EXPECT_EQ(WaitForSingleObject(object, ms), WAIT_TIMEOUT); });
                EXPECT_GE(taken, ms - 0.5);
                EXPECT_LE(taken, ms + 2000.0);
            }
        }
    });
    other.Join();
    EXPECT_EQ(ReleaseMutex(mutex), 1);
}

TEST(Wait, BlockedWaiterCostsNoProcessorTime) {
    const Handle event = AutoResetEvent();
    const Handle semaphore = Semaphore(0);
    for (HANDLE object : {HANDLE(event), HANDLE(semaphore)}) {
        const double spent = ProcessorMilliseconds(
            [&] { EXPECT_EQ(WaitForSingleObject(object, 300), WAIT_TIMEOUT); });
        EXPECT_LT(spent, 30.0);
    }
    double spent = 1e9;
    Worker waiter([&] {
        spent = ProcessorMilliseconds(
            [&] { EXPECT_EQ(WaitForSingleObject(event, INFINITE), WAIT_OBJECT_0); });
    });
    waiter.WaitUntilAsleep();
    const Handle never = AutoResetEvent();
    EXPECT_EQ(WaitForSingleObject(never, 300), WAIT_TIMEOUT);
    SetEvent(event);
    waiter.Join();
    EXPECT_LT(spent, 30.0);
}

TEST(Wait, LongestFiniteTimeoutIsNoError) {
    const Handle event = AutoResetEvent();
    Worker waiter([&] { EXPECT_EQ(WaitForSingleObject(event, 0xFFFFFFFE), WAIT_OBJECT_0); });
    waiter.WaitUntilAsleep();
    EXPECT_FALSE(waiter.done());
    SetEvent(event);
}

// The number of a virtual function's slot, read out of a pointer to the member: an offset into the
// table of virtual functions, with bit 0 set or not as the processor likes it.
template <typename Member>
size_t SlotOf(Member member) {
    uintptr_t words[2];
    static_assert(sizeof member == sizeof words, "a pointer to a member is two words");
    std::memcpy(words, &member, sizeof words);
    return (words[0] & ~uintptr_t{1}) / sizeof(void*);
}

TEST(SyncObject, VirtualSlotsFollowTheTwoDestructors) {
    EXPECT_EQ(SlotOf(&CLinuxSyncObject::getType), 2u);
    EXPECT_EQ(SlotOf(&CLinuxSyncObject::WaitAction), 3u);
    EXPECT_EQ(SlotOf(&CLinuxSyncObject::WaitForSignal), 4u);
    EXPECT_EQ(SlotOf(&CLinuxSyncObject::isSignaled), 5u);
    EXPECT_EQ(SlotOf(&CLinuxSyncObject::Release), 6u);
}

TEST(SyncObject, TypeIsOneEmptyTextForAllClasses) {
    const HANDLE none = nullptr;
    const CLinuxEvent event;
    const CLinuxSemaphore semaphore;
    const CLinuxMutex mutex;
    const CLinuxMultiWait wait(1, &none);
    EXPECT_STREQ(event.getType(), "");
    for (const CLinuxSyncObject* object : {static_cast<const CLinuxSyncObject*>(&semaphore),
                                           static_cast<const CLinuxSyncObject*>(&mutex),
                                           static_cast<const CLinuxSyncObject*>(&wait)}) {
        EXPECT_EQ(object->getType(), event.getType());
    }
}

// A class of a client's own on the common base.
class Counted : public CLinuxSyncObject {
  public:
    explicit Counted(int takeResult = 0) : m_takeResult(takeResult) {}
    const char* getType() const override { return "counted"; }
    int WaitAction() override {
        ++takes;
        return m_takeResult;
    }
    bool secondFlag() const { return m_flag; }
    int takes = 0;

  private:
    int m_takeResult;
};

TEST(SyncObject, StartsClearAndReleaseDoesNothing) {
    Counted object;
    EXPECT_FALSE(object.isSignaled());
    EXPECT_FALSE(object.secondFlag());
    EXPECT_EQ(object.Release(), 0);
    EXPECT_FALSE(object.isSignaled());
    EXPECT_EQ(object.WaitForSignal(0), WAIT_TIMEOUT);
    EXPECT_EQ(object.takes, 0);
}

TEST(SyncObject, WaitTakesThroughTheVirtualOperation) {
    Counted object;
    EXPECT_EQ(object.SetSignaled(true, true), 0);
    EXPECT_TRUE(object.isSignaled());
    EXPECT_EQ(WaitForSingleObject(&object, INFINITE), WAIT_OBJECT_0);
    EXPECT_EQ(WaitForSingleObject(&object, 0), WAIT_OBJECT_0);
    EXPECT_EQ(object.takes, 2);
    EXPECT_EQ(object.SetSignaled(false, true), 0);
    EXPECT_FALSE(object.isSignaled());
}

TEST(SyncObject, FailingTakeFailsTheWaitAndFreesTheLock) {
    Counted object(-1);
    object.SetSignaled(true, true);
    EXPECT_EQ(object.WaitForSignal(INFINITE), WAIT_FAILED);
    EXPECT_EQ(object.takes, 1);
    sync_kit::OnAnotherThread([&] { EXPECT_EQ(object.SetSignaled(false, true), 0); });
}

}  // namespace
