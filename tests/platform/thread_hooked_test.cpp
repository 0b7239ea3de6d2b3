// What threads ask of the system, and waits for them by a clock that moves only when somebody
// sleeps.

#include <errno.h>
#include <gtest/gtest.h>
#include <sched.h>

#include <utility>
#include <vector>

#include "platform/test_clock.h"
#include "platform/thread_hooks.h"
#include "platform/thread_kit.h"

namespace {

using posix_hooks::Replacement;
using thread_kit::Gate;
using thread_kit::Thread;

int g_policy;
int g_priority;
int g_answer;

int RecordScheduling(pthread_t, int policy, const sched_param* parameters) {
    g_policy = policy;
    g_priority = parameters->sched_priority;
    return g_answer;
}

TEST(HookedThread, PriorityIsRequestedAsNamed) {
    Gate gate;
    Thread thread([&] {
        gate.Pass();
        return 0u;
    });
    const Replacement<int(pthread_t, int, const sched_param*)> scheduling(
        posix_hooks::setScheduling, RecordScheduling);
    g_answer = 0;
    const struct {
        int asked, policy, priority;
    } kRequests[] = {{-2, SCHED_OTHER, 0},       {-1, SCHED_OTHER, 0},  {0, SCHED_OTHER, 0},
                     {1, SCHED_FIFO, 1},         {50, SCHED_FIFO, 50},  {99, SCHED_FIFO, 99},
                     {100, SCHED_FIFO, 99},      {150, SCHED_FIFO, 99}, {INT32_MAX, SCHED_FIFO, 99},
                     {INT32_MIN, SCHED_OTHER, 0}};
    for (const auto& request : kRequests) {
        g_policy = g_priority = -77;
        EXPECT_EQ(SetThreadPriority(thread, request.asked), 1);
        EXPECT_EQ(g_policy, request.policy) << request.asked;
        EXPECT_EQ(g_priority, request.priority) << request.asked;
    }
    gate.Open();
}

TEST(HookedThread, RefusedPriorityIsSaid) {
    Gate gate;
    Thread thread([&] {
        gate.Pass();
        return 0u;
    });
    const Replacement<int(pthread_t, int, const sched_param*)> scheduling(
        posix_hooks::setScheduling, RecordScheduling);
    g_answer = EPERM;
    EXPECT_EQ(SetThreadPriority(thread, 5), 0);
    EXPECT_EQ(thread.object().SetPriority(5), EPERM);
    gate.Open();
}

std::vector<int> g_signals;

int RecordSignal(pthread_t, int signal) {
    g_signals.push_back(signal);
    return g_answer;
}

TEST(HookedThread, SuspendSends10AndResume12) {
    Gate gate;
    Thread thread([&] {
        gate.Pass();
        return 0u;
    });
    {
        const Replacement<int(pthread_t, int)> kill(posix_hooks::threadSignal, RecordSignal);
        g_signals.clear();
        g_answer = 0;
        EXPECT_EQ(SuspendThread(thread), 1u);
        EXPECT_EQ(SuspendThread(thread), 1u);
        EXPECT_EQ(ResumeThread(thread), 1u);
        EXPECT_EQ(g_signals, (std::vector<int>{10, 10, 12}));
        g_answer = ESRCH;
        EXPECT_EQ(SuspendThread(thread), 0xFFFFFFFFu);
        EXPECT_EQ(ResumeThread(thread), 0xFFFFFFFFu);
        EXPECT_EQ(thread.object().Suspend(), ESRCH);
        EXPECT_EQ(thread.object().Resume(), ESRCH);
    }
    gate.Open();
}

class HookedThreadWait : public testing::Test {
  protected:
    HookedThreadWait() { m_thread.SetExitCode(259); }

    CLinuxThread m_thread;

  private:
    TestClock m_clock;
};

TEST_F(HookedThreadWait, LooksEveryMillisecond) {
    EXPECT_EQ(m_thread.WaitForSignal(100), WAIT_TIMEOUT);
    EXPECT_EQ(TestClock::sleeps, std::vector<useconds_t>(100, 1000));
}

TEST_F(HookedThreadWait, SeesTheEndAtTheNextLook) {
    TestClock::onSleep = [this] {
        if (TestClock::sleeps.size() == 3) m_thread.SetExitCode(0);
    };
    EXPECT_EQ(m_thread.WaitForSignal(100), WAIT_OBJECT_0);
    EXPECT_EQ(TestClock::sleeps.size(), 3u);
}

TEST_F(HookedThreadWait, OfTimeZeroLooksOnce) {
    EXPECT_EQ(m_thread.WaitForSignal(0), WAIT_TIMEOUT);
    EXPECT_EQ(TestClock::sleeps, std::vector<useconds_t>(1, 1000));
    m_thread.SetExitCode(1);
    EXPECT_EQ(m_thread.WaitForSignal(0), WAIT_OBJECT_0);
    EXPECT_EQ(TestClock::sleeps.size(), 1u);
}

// The end of the wait wraps with the clock. Clients rely on it: kept.
TEST_F(HookedThreadWait, AcrossTheClocksWrapEndsAfterOneLook) {
    TestClock::milliseconds = 0xFFFFFFFE;
    EXPECT_EQ(m_thread.WaitForSignal(10), WAIT_TIMEOUT);
    EXPECT_EQ(TestClock::sleeps.size(), 1u);
}

}  // namespace
