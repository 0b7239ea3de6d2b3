// What happens once in a process, and what ends a process. Every test runs in a child, so that each
// finds the layer unused; this program itself never starts a thread.

#include <errno.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdlib>
#include <functional>
#include <string>

#include "platform/thread_hooks.h"
#include "platform/thread_kit.h"
#include "testkit/capture.h"
#include "vidshow/platform/queue.h"
#include "vidshow/platform/timer.h"

namespace {

using testing::ExitedWithCode;
using thread_kit::OwnQueue;
using thread_kit::Thread;

constexpr unsigned long kFailed = static_cast<unsigned long>(-1);

unsigned int Return5(void*) {
    return 5;
}

// Ends the child well when `holds`, with what was written to standard error before it.
[[noreturn]] void EndWith(bool holds) {
    std::fflush(nullptr);
    _exit(holds ? 0 : 1);
}

bool RunsToItsEnd(HANDLE thread) {
    DWORD code = 0;
    return thread != nullptr && WaitForSingleObject(thread, INFINITE) == WAIT_OBJECT_0 &&
           GetExitCodeThread(thread, &code) == 1 && code == 5 && CloseHandle(thread) == 1;
}

HANDLE CreateReturning5() {
    return CreateThread(nullptr, 0, Return5, nullptr, 0, nullptr);
}

#define EXPECT_IN_CHILD(statement, message) EXPECT_EXIT(statement, ExitedWithCode(0), message)

int RefuseOnce(pthread_once_t*, void (*)()) {
    return EINVAL;
}

TEST(ThreadFirstUse, FailedOnceIsReportedAndEndsInNoThread) {
    EXPECT_IN_CHILD(
        {
            posix_hooks::threadOnce.Replace(RefuseOnce);
            EndWith(CreateReturning5() == nullptr);
        },
        "^Unable to run thread-specific-data initialization\\.\n$");
}

TEST(ThreadFirstUse, WithoutAKeyTheThreadRunsWithoutARecord) {
    EXPECT_IN_CHILD(
        {
            pthread_key_t key;
            while (pthread_key_create(&key, nullptr) == 0) {
            }
            const HANDLE thread = CreateReturning5();
            EndWith(GetCurrentThread() == nullptr && RunsToItsEnd(thread));
        },
        "^Unable to create thread-specific-data key\\.\nUnable to save thread handle\\.\n$");
}

int RefuseSuspendHandler(int signal, const struct sigaction* action, struct sigaction* previous) {
    return signal == 10 ? -1 : posix_hooks::signalAction.Real(signal, action, previous);
}

int RefuseResumeHandler(int signal, const struct sigaction* action, struct sigaction* previous) {
    return signal == 12 ? -1 : posix_hooks::signalAction.Real(signal, action, previous);
}

TEST(ThreadFirstUse, FailedSuspendHandlerIsReportedAndTheThreadRuns) {
    EXPECT_IN_CHILD(
        {
            posix_hooks::signalAction.Replace(RefuseSuspendHandler);
            EndWith(RunsToItsEnd(CreateReturning5()));
        },
        "^Unable to set suspend signal handler\\.\n$");
}

TEST(ThreadFirstUse, FailedResumeHandlerIsReportedAndTheThreadRuns) {
    EXPECT_IN_CHILD(
        {
            posix_hooks::signalAction.Replace(RefuseResumeHandler);
            EndWith(RunsToItsEnd(CreateReturning5()));
        },
        "^Unable to set resume signal handler\\.\n$");
}

TEST(ThreadFirstUse, MainThreadsRecordIsMadeByTheFirstCreator) {
    EXPECT_IN_CHILD(
        {
            bool holds = mainthread == nullptr && gCSInited == 0 && GetCurrentThread() == nullptr;
            sync_kit::OnAnotherThread([&] {
                holds = holds && RunsToItsEnd(CreateReturning5()) && mainthread != nullptr;
            });
            CLinuxThread* const first = mainthread;
            holds = holds && RunsToItsEnd(CreateReturning5()) && mainthread == first;
            EndWith(holds && gCSInited == 1 && mainthread->WaitForSignal(0) == WAIT_OBJECT_0);
        },
        "^$");
}

// A client's own object in `mainthread` stays.
TEST(ThreadFirstUse, MainThreadThatIsSetStays) {
    EXPECT_IN_CHILD(
        {
            CLinuxThread own;
            mainthread = &own;
            const bool ran = RunsToItsEnd(CreateReturning5());
            EndWith(ran && mainthread == &own);
        },
        "^$");
}

TEST(ThreadFirstUse, CloseOfOtherObjectsWorksBeforeAnyThread) {
    EXPECT_IN_CHILD(EndWith(CloseHandle(CreateEvent(nullptr, FALSE, FALSE, nullptr)) == 1 &&
                            GetThreadPriority(nullptr) == 0 && CloseHandle(nullptr) == 0),
                    "^$");
}

struct sigaction g_suspend;
struct sigaction g_resume;

int RecordHandlers(int signal, const struct sigaction* action, struct sigaction* previous) {
    if (action != nullptr && signal == 10) g_suspend = *action;
    if (action != nullptr && signal == 12) g_resume = *action;
    return posix_hooks::signalAction.Real(signal, action, previous);
}

// Signal 12 waits for the sigsuspend, so that no resume is lost on the way there.
TEST(ThreadFirstUse, HandlersHaveNoFlagsAndOnlyTheResumeWaits) {
    EXPECT_IN_CHILD(
        {
            posix_hooks::signalAction.Replace(RecordHandlers);
            bool holds = RunsToItsEnd(CreateReturning5());
            for (int signal = 1; signal < 32; ++signal) {
                holds = holds && sigismember(&g_suspend.sa_mask, signal) == (signal == 12);
                holds = holds && sigismember(&g_resume.sa_mask, signal) == 0;
            }
            EndWith(holds && g_suspend.sa_flags == 0 && g_resume.sa_flags == 0);
        },
        "^$");
}

sigset_t g_waitMask;

int RecordMask(const sigset_t* mask) {
    g_waitMask = *mask;
    return posix_hooks::signalSuspend.Real(mask);
}

TEST(ThreadFirstUse, SuspendedThreadWaitsForSignal12Alone) {
    EXPECT_IN_CHILD(
        {
            sigemptyset(&g_waitMask);
            posix_hooks::signalSuspend.Replace(RecordMask);
            const HANDLE thread = CreateThread(nullptr, 0, Return5, nullptr, 4, nullptr);
            while (sigismember(&g_waitMask, 10) == 0)
                thread_kit::Pause(1);
            bool holds = ResumeThread(thread) == 1 && RunsToItsEnd(thread);
            for (int signal = 1; signal < 32; ++signal)
                holds = holds && sigismember(&g_waitMask, signal) == (signal != 12);
            EndWith(holds);
        },
        "^$");
}

// A thread of the client's own gets the signals too: one 12 ends one 10.
TEST(ThreadFirstUse, ForeignThreadWaitsForOneResume) {
    EXPECT_IN_CHILD(
        {
            bool holds = RunsToItsEnd(CreateReturning5());
            std::atomic<bool> through{false};
            std::atomic<pthread_t> id{0};
            sync_kit::Worker worker([&] {
                id = pthread_self();
                pthread_kill(pthread_self(), 10);
                through = true;
            });
            worker.WaitUntilAsleep();
            thread_kit::Pause(20);
            holds = holds && !through;
            pthread_kill(id, 12);
            worker.Join();
            EndWith(holds && through);
        },
        "^$");
}

// Memory.

#if !defined(__SANITIZE_ADDRESS__)

size_t g_refused;

// Only what is made once goes without.
int OnceWithoutMemory(pthread_once_t* control, void (*routine)()) {
    posix_hooks::RefuseNew(g_refused, 1);
    return posix_hooks::threadOnce.Real(control, routine);
}

TEST(ThreadFirstUse, WithoutMemoryForTheMainThreadsRecordTheThreadRuns) {
    EXPECT_IN_CHILD(
        {
            testkit::StdoutCapture capture;
            g_refused = sizeof(CLinuxThread);
            posix_hooks::threadOnce.Replace(OnceWithoutMemory);
            const bool ran = RunsToItsEnd(CreateReturning5());
            EndWith(ran && mainthread == nullptr &&
                    capture.text() == "Unable to create handle for main thread.\n");
        },
        "^$");
}

TEST(ThreadFirstUse, WithoutMemoryForTheMainThreadsQueueTheThreadRuns) {
    EXPECT_IN_CHILD(
        {
            testkit::StdoutCapture capture;
            g_refused = sizeof(CLNrwqueue);
            posix_hooks::threadOnce.Replace(OnceWithoutMemory);
            const bool ran = RunsToItsEnd(CreateReturning5());
            EndWith(ran && mainthread != nullptr &&
                    capture.text() == "Unable to create handle for main thread.\n");
        },
        "^$");
}

TEST(ThreadFirstUse, WithoutMemoryThereIsNoThread) {
    EXPECT_IN_CHILD(
        {
            bool holds = true;
            for (const size_t bytes : {sizeof(CLinuxThread), sizeof(CLNrwqueue)}) {
                posix_hooks::RefuseNew(bytes, 1);
                holds = holds && CreateReturning5() == nullptr && gAllThreads[0] == nullptr;
                posix_hooks::RefuseNew(bytes, 1);
                holds = holds && _beginthread(Return5, 0, nullptr) == INVALID_HANDLE_VALUE;
                unsigned long id = 7;
                posix_hooks::RefuseNew(bytes, 1);
                holds = holds && _beginthreadex(nullptr, 0, Return5, nullptr, 0, &id) == nullptr;
                holds = holds && id == 7;
            }
            EndWith(holds && RunsToItsEnd(CreateReturning5()));
        },
        "^$");
}

TEST(TimerFirstUse, WithoutMemoryThereIsNoTimer) {
    EXPECT_IN_CHILD(
        {
            CLinuxTimerMgr timers;
            posix_hooks::RefuseNew(sizeof(CLinuxTimer), 1);
            EndWith(timers.SetTimer(1, nullptr) == nullptr && timers.KillTimerThread() == -1);
        },
        "^$");
}

TEST(TimerFirstUse, WithoutATimerThreadTheTimerIsListedAndTheNextTriesAgain) {
    EXPECT_IN_CHILD(
        {
            CLinuxTimerMgr timers;
            posix_hooks::RefuseNew(sizeof(CLinuxThread), 1);
            CLinuxTimer* timer = timers.SetTimer(1000, nullptr);
            bool holds = timer != nullptr && timers.IsValid(timer, 1);
            holds = holds && timers.KillTimerThread() == -1;
            holds = holds && timers.SetTimer(1000, nullptr) != nullptr;
            EndWith(holds && timers.KillTimerThread() == 0 && !timers.IsValid(timer, 1));
        },
        "^$");
}

#endif

TEST(TimerFirstUse, FirstTimerHasSequenceNumber1) {
    EXPECT_IN_CHILD(
        {
            const CLinuxTimer first;
            const CLinuxTimer second;
            EndWith(first.IsValid(1) && second.IsValid(2));
        },
        "^$");
}

// The ends of a process.

TEST(Quit, ReadingWmQuitEndsTheProcessWithStatus2) {
    EXPECT_EXIT(
        {
            Thread thread([] { return 0u; });
            thread.Join();
            PostThreadMessage(thread, 18, 0, 0);
            MSG message{};
            GetMessage(&message, nullptr, 0, 0);
        },
        ExitedWithCode(2), "^$");
}

TEST(Quit, EndsTheProcessFromAnyThreadAndRunsWhatWasRegistered) {
    EXPECT_EXIT(
        {
            std::atexit([] {
                const char text[] = "at exit";
                if (write(2, text, sizeof text - 1) < 0) _exit(1);
            });
            Thread reader([] {
                const OwnQueue queue;
                PostThreadMessage(queue.id(), WM_QUIT, 5, 6);
                MSG message{};
                GetMessage(&message, nullptr, 0, 0);
                return 0u;
            });
            reader.Join();
        },
        ExitedWithCode(2), "^at exit$");
}

int RefuseThread(pthread_t*, const pthread_attr_t*, void* (*)(void*), void*) {
    return EAGAIN;
}

TEST(ThreadFirstUse, NoThreadMeansNoHandleAndNoRecord) {
    EXPECT_IN_CHILD(
        {
            posix_hooks::threadCreate.Replace(RefuseThread);
            HANDLE id = &id;
            bool holds = CreateThread(nullptr, 0, Return5, nullptr, 0, &id) == nullptr;
            holds = holds && id == &id && gAllThreads[0] == nullptr;
            holds = holds && GetCurrentThread() == nullptr;
            unsigned long number = 12;
            holds = holds && _beginthread(Return5, 0, nullptr) == INVALID_HANDLE_VALUE;
            holds = holds && _beginthreadex(nullptr, 0, Return5, nullptr, 0, &number) == nullptr;
            holds = holds && number == 12;
            CLinuxThread thread;
            holds = holds && thread.Init(Return5, nullptr, 2) == kFailed;
            posix_hooks::threadCreate.Replace(nullptr);
            EndWith(holds && RunsToItsEnd(CreateReturning5()));
        },
        "^$");
}

}  // namespace
