// Suspend and resume of threads that compute, sleep and wait.

#include <errno.h>
#include <gtest/gtest.h>

#include <mutex>

#include "platform/sync_kit.h"
#include "platform/thread_kit.h"
#include "vidshow/platform/misc.h"

namespace {

using sync_kit::AutoResetEvent;
using sync_kit::Handle;
using sync_kit::Load;
using thread_kit::Gate;
using thread_kit::Pause;
using thread_kit::Thread;

// Adds up, and now and then takes a lock, because ThreadSanitizer holds a signal back until such a
// call, and lets others run, who may have to share its processor.
class Computing {
  public:
    unsigned int Run() {
        while (!m_stop) {
            ++m_steps;
            if (m_steps % 64 != 0) continue;
            std::lock_guard<std::mutex>{m_mutex};
            std::this_thread::yield();
        }
        return 0;
    }
    void Stop() { m_stop = true; }

    // Returns when some step was made after the call.
    void WaitForProgress() const {
        const uint64_t before = m_steps;
        while (m_steps == before)
            Pause(1);
    }

    // Returns when no more steps are made; true when none is made for a while after that.
    bool StandsStill() const {
        uint64_t before;
        do {
            before = m_steps;
            Pause(20);
        } while (m_steps != before);
        Pause(20);
        return m_steps == before;
    }

  private:
    std::atomic<bool> m_stop{false};
    std::atomic<uint64_t> m_steps{0};
    std::mutex m_mutex;
};

TEST(Suspend, StartsSuspendedWithFlags4UntilResumed) {
    std::atomic<bool> ran{false};
    Thread thread(
        [&] {
            ran = true;
            return 5u;
        },
        CREATE_SUSPENDED);
    Pause(30);
    EXPECT_FALSE(ran);
    EXPECT_EQ(thread_kit::ExitCodeOf(thread), 259u);
    EXPECT_EQ(ResumeThread(thread), 1u);
    EXPECT_TRUE(thread.Join());
    EXPECT_TRUE(ran);
}

TEST(Suspend, OtherFlagsThan4StartAtOnce) {
    for (DWORD flags : {0u, 1u, 5u, 6u, 0x10004u, 0xFFFFFFFFu}) {
        Thread thread([] { return 0u; }, flags);
        EXPECT_EQ(WaitForSingleObject(thread, 60000), WAIT_OBJECT_0) << flags;
    }
}

TEST(Suspend, ResumeRightAfterASuspendedStartIsNotLost) {
    const size_t rounds = Load(500);
    for (size_t i = 0; i < rounds; ++i) {
        Thread thread([] { return 0u; }, CREATE_SUSPENDED);
        ASSERT_EQ(ResumeThread(thread), 1u);
        ASSERT_TRUE(thread.Join());
    }
}

TEST(Suspend, StopsAThreadThatComputes) {
    Computing computing;
    Thread thread([&] { return computing.Run(); });
    computing.WaitForProgress();
    EXPECT_EQ(SuspendThread(thread), 1u);
    EXPECT_TRUE(computing.StandsStill());
    EXPECT_EQ(ResumeThread(thread), 1u);
    computing.WaitForProgress();
    computing.Stop();
}

TEST(Suspend, StopsAThreadThatSleeps) {
    std::atomic<bool> woke{false};
    Thread thread([&] {
        Sleep(20);
        woke = true;
        return 0u;
    });
    thread.WaitUntilAsleep();
    EXPECT_EQ(SuspendThread(thread), 1u);
    if (!woke) {  // unless the machine was busy for 20 ms
        Pause(60);
        EXPECT_FALSE(woke) << "its time is up, and it still stands";
    }
    EXPECT_EQ(ResumeThread(thread), 1u);
    EXPECT_TRUE(thread.Join());
    EXPECT_TRUE(woke);
}

TEST(Suspend, StopsAThreadThatWaitsForAnEvent) {
    const Handle event = AutoResetEvent();
    std::atomic<bool> woke{false};
    Thread thread([&] {
        const DWORD result = WaitForSingleObject(event, INFINITE);
        woke = true;
        return result;
    });
    thread.WaitUntilAsleep();
    EXPECT_EQ(SuspendThread(thread), 1u);
    SetEvent(event);
    Pause(30);
    EXPECT_FALSE(woke);
    EXPECT_EQ(ResumeThread(thread), 1u);
    EXPECT_TRUE(thread.Join());
    EXPECT_EQ(thread_kit::ExitCodeOf(thread), WAIT_OBJECT_0) << "the event was not lost meanwhile";
}

TEST(Suspend, DoesNotNest) {
    Computing computing;
    Thread thread([&] { return computing.Run(); });
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(SuspendThread(thread), 1u);
        EXPECT_TRUE(computing.StandsStill());
    }
    EXPECT_EQ(ResumeThread(thread), 1u);
    computing.WaitForProgress();
    computing.Stop();
}

TEST(Suspend, ResumeOfARunningThreadIsNotRemembered) {
    Computing computing;
    Thread thread([&] { return computing.Run(); });
    EXPECT_EQ(ResumeThread(thread), 1u);
    EXPECT_EQ(ResumeThread(thread), 1u);
    computing.WaitForProgress();
    EXPECT_EQ(SuspendThread(thread), 1u);
    EXPECT_TRUE(computing.StandsStill());
    EXPECT_EQ(ResumeThread(thread), 1u);
    computing.Stop();
}

TEST(Suspend, ThreadMaySuspendItself) {
    std::atomic<HANDLE> self{nullptr};
    std::atomic<bool> through{false};
    Gate gate;
    Thread thread([&] {
        gate.Pass();
        const DWORD result = SuspendThread(self);
        through = true;
        return result;
    });
    self = thread;
    gate.Open();
    Pause(30);
    EXPECT_FALSE(through);
    // It may not have come so far yet: resumed as often as it takes.
    while (!through) {
        ResumeThread(thread);
        Pause(1);
    }
    thread.Join();
    EXPECT_EQ(thread_kit::ExitCodeOf(thread), 1u);
}

TEST(Suspend, KeepsErrno) {
    std::mutex mutex;
    std::atomic<bool> ready{false};
    std::atomic<bool> stop{false};
    std::atomic<int> seen{0};
    Thread thread([&] {
        errno = 77;
        ready = true;
        while (!stop)
            std::lock_guard<std::mutex>{mutex};
        seen = errno;
        return 0u;
    });
    while (!ready)
        Pause(1);
    EXPECT_EQ(SuspendThread(thread), 1u);
    thread.WaitUntilAsleep();
    EXPECT_EQ(ResumeThread(thread), 1u);
    stop = true;
    thread.Join();
    EXPECT_EQ(seen, 77);
}

// Fewer signals arrive than are sent in a quick series; none of these may leave the thread
// standing.

void SuspendAndResume(HANDLE thread, size_t round) {
    ASSERT_EQ(SuspendThread(thread), 1u);
    if (round % 16 == 1) std::this_thread::yield();
    if (round % 8 == 2) SuspendThread(thread);
    ASSERT_EQ(ResumeThread(thread), 1u);
    if (round % 16 == 3) std::this_thread::yield();
}

TEST(SuspendLoad, ThreadThatComputes) {
    const size_t rounds = Load(10000);
    Computing computing;
    Thread thread([&] { return computing.Run(); });
    for (size_t i = 0; i < rounds; ++i) {
        SuspendAndResume(thread, i);
        if (i % 256 == 0) computing.WaitForProgress();
    }
    computing.WaitForProgress();
    computing.Stop();
}

TEST(SuspendLoad, ThreadThatSleeps) {
    const size_t rounds = Load(10000);
    std::atomic<bool> stop{false};
    std::atomic<size_t> sleeps{0};
    Thread thread([&] {
        while (!stop) {
            Sleep(1);
            ++sleeps;
        }
        return 0u;
    });
    for (size_t i = 0; i < rounds; ++i) {
        SuspendAndResume(thread, i);
        if (i % 256 != 0) continue;
        const size_t before = sleeps;
        while (sleeps == before)
            Pause(1);
    }
    stop = true;
    EXPECT_TRUE(thread.Join());
}

// Each event must be answered: one lost wake-up and both sides wait for ever.
TEST(SuspendLoad, ThreadThatWaitsForAnEvent) {
    constexpr size_t kSuspendsPerRound = 5;
    const size_t rounds = Load(10000) / kSuspendsPerRound;
    const Handle ask = AutoResetEvent();
    const Handle answer = AutoResetEvent();
    Thread thread([&] {
        for (size_t i = 0; i < rounds; ++i) {
            WaitForSingleObject(ask, INFINITE);
            SetEvent(answer);
        }
        return 0u;
    });
    for (size_t i = 0; i < rounds; ++i) {
        if (i % 2 == 0) SetEvent(ask);
        // The last round may end the thread, and a thread that is gone refuses.
        for (size_t k = 0; k < kSuspendsPerRound && i + 1 < rounds; ++k)
            SuspendAndResume(thread, i * kSuspendsPerRound + k);
        if (i % 2 != 0) SetEvent(ask);
        ASSERT_EQ(WaitForSingleObject(answer, INFINITE), WAIT_OBJECT_0);
    }
    EXPECT_TRUE(thread.Join());
}

TEST(SuspendLoad, TwoThreadsDisagreeAndTheLastWordIsResume) {
    const size_t rounds = Load(3000);
    Computing computing;
    Thread thread([&] { return computing.Run(); });
    const auto disagree = [&] {
        for (size_t i = 0; i < rounds; ++i)
            SuspendAndResume(thread, i);
    };
    sync_kit::Worker first(disagree);
    sync_kit::Worker second(disagree);
    first.Join();
    second.Join();
    ResumeThread(thread);
    computing.WaitForProgress();
    computing.Stop();
}

TEST(SuspendLoad, ThreadsAreSuspendedWhileTheyEnd) {
    const size_t rounds = Load(300);
    for (size_t i = 0; i < rounds; ++i) {
        Thread thread([=]() -> unsigned {
            if (i % 2 != 0) ExitThread(0);
            return 0;
        });
        for (int k = 0; k < 5; ++k) {
            SuspendThread(thread);
            ResumeThread(thread);
        }
        ASSERT_TRUE(thread.Join());
    }
}

}  // namespace
