#include "vidshow/platform/thread.h"

#include <gtest/gtest.h>
#include <sched.h>

#include <memory>
#include <set>

#include "platform/sync_kit.h"
#include "platform/thread_kit.h"
#include "testkit/capture.h"

namespace {

using sync_kit::HandleValue;
using sync_kit::InvalidHandles;
using sync_kit::OnAnotherThread;
using thread_kit::ExitCodeOf;
using thread_kit::Gate;
using thread_kit::IsInTable;
using thread_kit::Thread;

static_assert(sizeof gAllThreads == 128 * sizeof(HANDLE), "the table has 128 places");
static_assert(sizeof(MSG) == 4 * sizeof(void*) || sizeof(void*) == 8, "four words");

unsigned int ReturnArgument(void* argument) {
    return static_cast<unsigned int>(reinterpret_cast<uintptr_t>(argument));
}

HANDLE CreateReturning(uintptr_t value, HANDLE* id = nullptr) {
    return CreateThread(nullptr, 0, ReturnArgument, reinterpret_cast<void*>(value), 0, id);
}

bool JoinAndClose(HANDLE thread) {
    const bool joined = WaitForSingleObject(thread, INFINITE) == WAIT_OBJECT_0;
    return CloseHandle(thread) == 1 && joined;
}

// Starting and ending.

TEST(Thread, RunsItsFunctionWithItsArgument) {
    const HANDLE thread = CreateReturning(4711);
    ASSERT_NE(thread, nullptr);
    EXPECT_EQ(WaitForSingleObject(thread, INFINITE), WAIT_OBJECT_0);
    EXPECT_EQ(ExitCodeOf(thread), 4711u);
    EXPECT_EQ(CloseHandle(thread), 1);
}

TEST(Thread, IdIsTheHandle) {
    HANDLE id = nullptr;
    const HANDLE thread = CreateReturning(0, &id);
    EXPECT_EQ(id, thread);
    EXPECT_TRUE(JoinAndClose(thread));
}

TEST(Thread, AttributesAndStackSizeAreNotLookedAt) {
    int attributes = 0;
    const HANDLE thread = CreateThread(&attributes, 1, ReturnArgument, nullptr, 0, nullptr);
    ASSERT_NE(thread, nullptr);
    EXPECT_TRUE(JoinAndClose(thread));
}

TEST(Thread, ExitCodeIs259WhileTheFunctionRuns) {
    Gate gate;
    Thread thread([&] {
        gate.Pass();
        return 17u;
    });
    EXPECT_EQ(ExitCodeOf(thread), 259u);
    gate.Open();
    thread.Join();
    EXPECT_EQ(ExitCodeOf(thread), 17u);
}

TEST(Thread, ExitCodeKeepsAll32Bits) {
    Thread thread([] { return 0xFFFFFFFEu; });
    thread.Join();
    EXPECT_EQ(ExitCodeOf(thread), 0xFFFFFFFEu);
    EXPECT_EQ(thread.object().GetExitCode(), -2);
}

// The three ways out leave the exit code as it is. Clients rely on it: kept.
TEST(Thread, EndedFromInsideKeeps259AndOnlyAnInfiniteWaitReturns) {
    void (*const exits[])() = {[] { ExitThread(5); }, [] { _endthread(); }, [] { _endthreadex(6); },
                               [] { CLinuxThread::Exit(7); }};
    for (auto* exit : exits) {
        Thread thread([=]() -> unsigned {
            exit();
            return 1;
        });
        EXPECT_EQ(WaitForSingleObject(thread, 40), WAIT_TIMEOUT);
        EXPECT_EQ(ExitCodeOf(thread), 259u);
        EXPECT_TRUE(thread.Join());
        EXPECT_EQ(ExitCodeOf(thread), 259u);
        EXPECT_EQ(WaitForSingleObject(thread, 2), WAIT_TIMEOUT);
    }
}

TEST(Thread, TerminateAnswers1AndTheThreadContinues) {
    Gate gate;
    Thread thread([&] {
        gate.Pass();
        return 9u;
    });
    EXPECT_EQ(TerminateThread(thread, 1), 1);
    EXPECT_EQ(thread.object().Cancel(), 0);
    EXPECT_EQ(ExitCodeOf(thread), 259u);
    gate.Open();
    thread.Join();
    EXPECT_EQ(ExitCodeOf(thread), 9u);
}

// Waiting.

TEST(ThreadWait, TimedWaitSeesTheEnd) {
    Thread thread([] {
        thread_kit::Pause(20);
        return 0u;
    });
    EXPECT_EQ(WaitForSingleObject(thread, 60000), WAIT_OBJECT_0);
}

TEST(ThreadWait, TimedWaitForARunningThreadTimesOut) {
    Gate gate;
    Thread thread([&] {
        gate.Pass();
        return 0u;
    });
    EXPECT_EQ(WaitForSingleObject(thread, 20), WAIT_TIMEOUT);
    EXPECT_EQ(WaitForSingleObject(thread, 0), WAIT_TIMEOUT);
    gate.Open();
}

TEST(ThreadWait, TimedWaitJoinsNothingAndMayBeRepeated) {
    Thread thread([] { return 0u; });
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(WaitForSingleObject(thread, 60000), WAIT_OBJECT_0);
    EXPECT_TRUE(thread.Join());
    EXPECT_EQ(WaitForSingleObject(thread, 0), WAIT_OBJECT_0) << "the exit code still tells";
}

TEST(ThreadWait, SecondInfiniteWaitFails) {
    Thread thread([] { return 0u; });
    EXPECT_TRUE(thread.Join());
    EXPECT_EQ(WaitForSingleObject(thread, INFINITE), WAIT_FAILED);
    EXPECT_NE(thread.object().WaitForExit(), 0);
    EXPECT_NE(thread.object().WaitAction(), 0);
}

TEST(ThreadWait, InfiniteWaitForItselfFails) {
    std::atomic<HANDLE> self{nullptr};
    Gate gate;
    Thread thread([&] {
        gate.Pass();
        return WaitForSingleObject(self, INFINITE);
    });
    self = thread;
    gate.Open();
    EXPECT_TRUE(thread.Join()) << "the failed attempt does not count";
    EXPECT_EQ(ExitCodeOf(thread), WAIT_FAILED);
}

TEST(ThreadWait, WaitsForSeveralTakeThreads) {
    Gate gate;
    Thread done([] { return 0u; });
    Thread running([&] {
        gate.Pass();
        return 0u;
    });
    const HANDLE both[] = {running, done};
    EXPECT_EQ(WaitForMultipleObjects(2, both, FALSE, 60000), 1u);
    EXPECT_EQ(WaitForMultipleObjects(2, both, TRUE, 20), WAIT_TIMEOUT);
    gate.Open();
    EXPECT_EQ(WaitForMultipleObjects(2, both, TRUE, 60000), WAIT_OBJECT_0);
}

TEST(ThreadWait, BaseOperationsAreTheBases) {
    Thread thread([] { return 0u; });
    thread.Join();
    EXPECT_FALSE(thread.object().isSignaled());
    EXPECT_EQ(thread.object().Release(), 0);
    EXPECT_STREQ(thread.object().getType(), "");
}

// The table.

TEST(ThreadTable, ThreadStandsInTheFirstFreePlaceUntilItIsClosed) {
    Thread first([] { return 0u; });
    Thread second([] { return 0u; });
    EXPECT_EQ(gAllThreads[0], HANDLE(first));
    EXPECT_EQ(gAllThreads[1], HANDLE(second));
    EXPECT_EQ(gCSInited, 1);
    first.Close();
    EXPECT_EQ(gAllThreads[0], nullptr);
    Thread third([] { return 0u; });
    EXPECT_EQ(gAllThreads[0], HANDLE(third));
    EXPECT_EQ(gAllThreads[1], HANDLE(second));
}

TEST(ThreadTable, Takes128HandlesAndRefusesThe129th) {
    std::vector<HANDLE> threads;
    for (uintptr_t i = 0; i < 128; ++i) {
        threads.push_back(CreateReturning(i));
        ASSERT_NE(threads.back(), nullptr);
        ASSERT_NE(threads.back(), INVALID_HANDLE_VALUE);
    }
    EXPECT_EQ(std::set<HANDLE>(threads.begin(), threads.end()).size(), 128u);
    {
        testkit::StdoutCapture capture;
        HANDLE id = HandleValue(77);
        EXPECT_EQ(CreateReturning(0, &id), INVALID_HANDLE_VALUE);
        EXPECT_EQ(capture.text(), "thread full \n");
        EXPECT_EQ(id, HandleValue(77));
    }
    EXPECT_TRUE(JoinAndClose(threads[60]));
    threads[60] = CreateReturning(60);
    ASSERT_NE(threads[60], INVALID_HANDLE_VALUE) << "a place is free again";
    EXPECT_EQ(gAllThreads[60], threads[60]);
    for (uintptr_t i = 0; i < 128; ++i) {
        EXPECT_EQ(WaitForSingleObject(threads[i], INFINITE), WAIT_OBJECT_0);
        EXPECT_EQ(ExitCodeOf(threads[i]), i);
        EXPECT_EQ(CloseHandle(threads[i]), 1);
        EXPECT_FALSE(IsInTable(threads[i]));
    }
}

void ExpectRefusedByTheTable(HANDLE handle) {
    DWORD code = 12;
    EXPECT_EQ(GetExitCodeThread(handle, &code), 0);
    EXPECT_EQ(code, 12u);
    EXPECT_EQ(TerminateThread(handle, 0), 0);
    EXPECT_EQ(GetThreadPriority(handle), 0);
    EXPECT_EQ(SetThreadPriority(handle, -1), 0);
    EXPECT_EQ(SuspendThread(handle), 0xFFFFFFFFu);
    EXPECT_EQ(ResumeThread(handle), 0xFFFFFFFFu);
}

TEST(ThreadTable, WhatIsNotInItIsRefused) {
    for (HANDLE invalid : InvalidHandles())
        ExpectRefusedByTheTable(invalid);
    const sync_kit::Handle event = sync_kit::AutoResetEvent();
    ExpectRefusedByTheTable(event);
    const HANDLE closed = CreateReturning(0);
    EXPECT_TRUE(JoinAndClose(closed));
    ExpectRefusedByTheTable(closed);
}

TEST(ThreadTable, ExitCodeIntoNullIsRefused) {
    Thread thread([] { return 0u; });
    EXPECT_EQ(GetExitCodeThread(thread, nullptr), 0);
}

// Threads beside the table.

TEST(BeginThread, RunsAndStandsInNoTable) {
    const HANDLE thread = _beginthread(ReturnArgument, 1, reinterpret_cast<void*>(uintptr_t{3}));
    ASSERT_NE(thread, INVALID_HANDLE_VALUE);
    EXPECT_FALSE(IsInTable(thread));
    ExpectRefusedByTheTable(thread);
    EXPECT_EQ(WaitForSingleObject(thread, INFINITE), WAIT_OBJECT_0);
    EXPECT_EQ(static_cast<CLinuxThread*>(thread)->GetExitCode(), 3);
    EXPECT_EQ(CloseHandle(thread), 1);
}

TEST(BeginThreadEx, StoresThePthreadIdAndStandsInNoTable) {
    int priority = 50;
    unsigned long id = 0;
    pthread_t self = 0;
    const auto storeSelf = [](void* where) {
        *static_cast<pthread_t*>(where) = pthread_self();
        return 0u;
    };
    const HANDLE thread = _beginthreadex(&priority, 0, storeSelf, &self, 0, &id);
    ASSERT_NE(thread, nullptr);
    ExpectRefusedByTheTable(thread);
    EXPECT_EQ(WaitForSingleObject(thread, INFINITE), WAIT_OBJECT_0);
    EXPECT_EQ(id, static_cast<unsigned long>(self));
    EXPECT_EQ(CloseHandle(thread), 1);
}

TEST(BeginThreadEx, NeverStartsSuspended) {
    unsigned long id = 0;
    const HANDLE thread =
        _beginthreadex(nullptr, 0, ReturnArgument, nullptr, CREATE_SUSPENDED, &id);
    EXPECT_EQ(WaitForSingleObject(thread, 60000), WAIT_OBJECT_0);
    EXPECT_TRUE(JoinAndClose(thread));
}

// The object ends before its thread, which goes on.
TEST(BeginThreadEx, RunningThreadOutlivesItsHandle) {
    Gate gate;
    unsigned long id = 0;
    const auto pass = [](void* it) {
        static_cast<Gate*>(it)->Pass();
        return 0u;
    };
    const HANDLE thread = _beginthreadex(nullptr, 0, pass, &gate, 0, &id);
    EXPECT_EQ(CloseHandle(thread), 1);
    gate.Open();
    EXPECT_EQ(pthread_join(static_cast<pthread_t>(id), nullptr), 0);
}

// Which thread is the current one. A creator's is the thread it made last; a started thread has
// none. Clients rely on it: kept.

TEST(CurrentThread, IsNullInAThreadThatCreatedNone) {
    OnAnotherThread([] {
        EXPECT_EQ(GetCurrentThread(), nullptr);
        EXPECT_EQ(GetCurrentThreadId(), nullptr);
        EXPECT_EQ(CLinuxThread::GetCurrentThread(), nullptr);
    });
    Thread thread([] { return GetCurrentThread() == nullptr ? 1u : 0u; });
    thread.Join();
    EXPECT_EQ(ExitCodeOf(thread), 1u);
}

TEST(CurrentThread, OfACreatorIsTheThreadItMadeLast) {
    OnAnotherThread([] {
        Thread first([] { return 0u; });
        EXPECT_EQ(GetCurrentThread(), HANDLE(first));
        Thread second([] { return 0u; });
        EXPECT_EQ(GetCurrentThread(), HANDLE(second));
        EXPECT_EQ(GetCurrentThreadId(), HANDLE(second));
        EXPECT_EQ(CLinuxThread::GetCurrentThread(), &second.object());
        unsigned long id = 0;
        const HANDLE third = _beginthreadex(nullptr, 0, ReturnArgument, nullptr, 0, &id);
        EXPECT_EQ(GetCurrentThread(), third);
        first.Close();
        EXPECT_EQ(GetCurrentThread(), third);
        EXPECT_TRUE(JoinAndClose(third));
        EXPECT_EQ(GetCurrentThread(), nullptr) << "not the one before it";
    });
}

TEST(CurrentThread, OfAStartedThreadThatCreatesOneIsThat) {
    Thread outer([] {
        Thread inner([] { return 0u; });
        return GetCurrentThread() == HANDLE(inner) ? 1u : 0u;
    });
    outer.Join();
    EXPECT_EQ(ExitCodeOf(outer), 1u);
    EXPECT_EQ(GetCurrentThread(), HANDLE(outer));
}

// Objects whose addresses are used again: the record names the object and not its place.
TEST(CurrentThread, IsNotAnotherObjectInTheClosedOnesPlace) {
    alignas(CLinuxThread) unsigned char place[sizeof(CLinuxThread)];
    auto* first = new (place) CLinuxThread;
    ASSERT_NE(first->Init(ReturnArgument, nullptr, 2), static_cast<unsigned long>(-1));
    EXPECT_EQ(GetCurrentThread(), first);
    EXPECT_EQ(first->WaitForExit(), 0);
    first->~CLinuxThread();
    CLinuxThread* second = nullptr;
    OnAnotherThread([&] {
        second = new (place) CLinuxThread;
        second->Init(ReturnArgument, nullptr, 2);
        EXPECT_EQ(GetCurrentThread(), second);
    });
    EXPECT_EQ(GetCurrentThread(), nullptr);
    EXPECT_EQ(second->WaitForExit(), 0);
    second->~CLinuxThread();
}

TEST(MainThread, IsTheFirstCreatorAndNobodysCurrentThread) {
    Thread thread([] { return 0u; });
    ASSERT_NE(mainthread, nullptr);
    EXPECT_FALSE(IsInTable(mainthread));
    EXPECT_NE(GetCurrentThread(), HANDLE(mainthread));
    EXPECT_EQ(mainthread->GetExitCode(), 0);
    EXPECT_EQ(mainthread->GetPriority(), 0);
    EXPECT_EQ(PostThreadMessage(mainthread, 1, 2, 3), 1) << "it has a queue";
    unsigned int message = 0;
    unsigned int wParam = 0;
    long lParam = 0;
    EXPECT_EQ(mainthread->PeekMessage(&message, &wParam, &lParam, 0, 0, true), 1);
    EXPECT_EQ(message, 1u);
    EXPECT_EQ(wParam, 2u);
    EXPECT_EQ(lParam, 3);
}

// Thread objects by themselves.

TEST(ThreadObject, IsNoThreadBeforeInit) {
    CLinuxThread thread;
    EXPECT_EQ(thread.GetExitCode(), 0);
    EXPECT_EQ(thread.Suspend(), -1);
    EXPECT_EQ(thread.Resume(), -1);
    EXPECT_EQ(thread.SetPriority(0), -1);
    EXPECT_EQ(thread.GetPriority(), -1);
    EXPECT_EQ(thread.PostMessage(1, 2, 3), 0);
    EXPECT_EQ(PostThreadMessage(&thread, 1, 2, 3), 0);
    EXPECT_EQ(thread.WaitForSignal(1000), WAIT_OBJECT_0) << "an exit code that is not 259";
    EXPECT_EQ(thread.WaitForSignal(INFINITE), WAIT_FAILED);
}

TEST(ThreadObject, InitWithoutFunctionStandsForTheCallingThread) {
    OnAnotherThread([] {
        CLinuxThread thread;
        EXPECT_EQ(thread.Init(nullptr, nullptr, 2), static_cast<unsigned long>(pthread_self()));
        EXPECT_EQ(GetCurrentThread(), nullptr) << "and is not recorded";
        EXPECT_EQ(thread.GetExitCode(), 0);
        EXPECT_EQ(PostThreadMessage(&thread, 1, 2, 3), 1);
    });
}

TEST(ThreadObject, InitAnswersThePthreadId) {
    CLinuxThread thread;
    pthread_t self = 0;
    const auto storeSelf = [](void* where) {
        *static_cast<pthread_t*>(where) = pthread_self();
        return 0u;
    };
    const unsigned long id = thread.Init(storeSelf, &self, 2);
    EXPECT_EQ(thread.WaitForExit(), 0);
    EXPECT_EQ(id, static_cast<unsigned long>(self));
}

TEST(ThreadObject, InitMayBeRepeatedForAnotherThread) {
    CLinuxThread thread;
    for (unsigned int i = 1; i < 4; ++i) {
        ASSERT_NE(thread.Init(ReturnArgument, reinterpret_cast<void*>(uintptr_t{i}), 2),
                  static_cast<unsigned long>(-1));
        EXPECT_EQ(thread.PostMessage(1, 2, 3), 1);
        EXPECT_EQ(thread.WaitForSignal(INFINITE), WAIT_OBJECT_0);
        EXPECT_EQ(thread.GetExitCode(), static_cast<int>(i));
    }
}

TEST(ThreadObject, ExitCodeIsSetAsGiven) {
    CLinuxThread thread;
    thread.SetExitCode(-7);
    EXPECT_EQ(thread.GetExitCode(), -7);
    thread.SetExitCode(259);
    EXPECT_EQ(thread.WaitForSignal(2), WAIT_TIMEOUT);
}

TEST(ThreadObject, IsNoThreadAfterItWasJoined) {
    Thread thread([] { return 0u; });
    thread.Join();
    EXPECT_EQ(SuspendThread(thread), 0xFFFFFFFFu);
    EXPECT_EQ(ResumeThread(thread), 0xFFFFFFFFu);
    EXPECT_EQ(SetThreadPriority(thread, 0), 0);
}

// Priorities, as far as this system grants them; what is asked for is in thread_hooked_test.cpp.

TEST(ThreadPriority, OrdinarySchedulingIsPriority0) {
    Gate gate;
    Thread thread([&] {
        gate.Pass();
        return 0u;
    });
    EXPECT_EQ(GetThreadPriority(thread), 0);
    EXPECT_EQ(SetThreadPriority(thread, -2), 1);
    EXPECT_EQ(SetThreadPriority(thread, 0), 1);
    EXPECT_EQ(GetThreadPriority(thread), 0);
    gate.Open();
}

TEST(ThreadPriority, RealTimeIsGrantedOrRefused) {
    Gate gate;
    Thread thread([&] {
        gate.Pass();
        return 0u;
    });
    if (SetThreadPriority(thread, 150) != 0) {
        EXPECT_EQ(GetThreadPriority(thread), 99);
    } else {
        EXPECT_EQ(GetThreadPriority(thread), 0) << "refused, and as it was";
    }
    EXPECT_EQ(SetThreadPriority(thread, -1), 1);
    EXPECT_EQ(GetThreadPriority(thread), 0);
    gate.Open();
}

}  // namespace
