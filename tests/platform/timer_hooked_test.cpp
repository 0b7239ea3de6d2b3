// Timers by a clock that the test moves. The timer thread is where it stands when the clock does.

#include <errno.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <condition_variable>
#include <mutex>
#include <utility>
#include <vector>

#include "platform/thread_hooks.h"
#include "platform/thread_kit.h"
#include "testkit/random.h"
#include "vidshow/platform/misc.h"
#include "vidshow/platform/timer.h"

namespace {

using posix_hooks::Replacement;

constexpr int64_t kStart = 1000000;  // milliseconds

std::atomic<int64_t> g_now;  // milliseconds
std::mutex g_lock;
std::condition_variable g_settled;  // with g_lock; notified when g_settledAt changes
int64_t g_settledAt;                // up to when the timer thread has done everything; by g_lock
std::atomic<bool> g_held;           // nothing falls due, whatever the clock
std::atomic<int> g_failure;         // what the next timed wait fails with; 0: it does not

int ReadTestClock(timeval* now, void*) {
    const int64_t ms = g_now;
    now->tv_sec = static_cast<time_t>(ms / 1000);
    now->tv_usec = static_cast<suseconds_t>(ms % 1000 * 1000);
    return 0;
}

// A real wait of a moment, shorter when somebody signals.
void WaitAMoment(pthread_cond_t* condition, pthread_mutex_t* mutex) {
    timespec soon;
    clock_gettime(CLOCK_REALTIME, &soon);
    soon.tv_nsec += 1000000;
    if (soon.tv_nsec >= 1000000000) {
        ++soon.tv_sec;
        soon.tv_nsec -= 1000000000;
    }
    posix_hooks::conditionTimedWait.Real(condition, mutex, &soon);
}

// Time-outs of the test's own look like wake-ups without cause.
int TimedWaitByTestClock(pthread_cond_t* condition, pthread_mutex_t* mutex,
                         const timespec* deadline) {
    if (g_failure != 0) return g_failure.exchange(0);
    const int64_t due = int64_t{deadline->tv_sec} * 1000 + deadline->tv_nsec / 1000000;
    const int64_t now = g_now;
    if (now >= due && !g_held) return ETIMEDOUT;
    {
        const std::lock_guard<std::mutex> lock(g_lock);
        g_settledAt = now;
    }
    g_settled.notify_all();
    WaitAMoment(condition, mutex);
    return 0;
}

struct Fired {
    int64_t at;  // milliseconds after the start
    DWORD sequence;
    bool operator==(const Fired& other) const {
        return at == other.at && sequence == other.sequence;
    }
};

std::ostream& operator<<(std::ostream& out, const Fired& fired) {
    return out << fired.sequence << " at " << fired.at;
}

class HookedTimer : public testing::Test {
  protected:
    HookedTimer() {
        g_now = kStart;
        g_settledAt = -1;
        g_held = false;
        g_failure = 0;
        EXPECT_EQ(m_timers.LaunchTimerThread(), 0);
    }

    static CLinuxThread& TimerThread() { return *static_cast<CLinuxThread*>(GetCurrentThread()); }

    CLinuxTimer* Set(unsigned int ms) { return m_timers.SetTimer(ms, nullptr); }

    DWORD SequenceOf(const CLinuxTimer* timer) {
        DWORD sequence = 1;
        while (!timer->IsValid(sequence))
            ++sequence;
        return sequence;
    }

    // Returns when the timer thread sleeps, with all done up to the present. There is a timer.
    void Settle() {
        const auto settled = [] { return g_settledAt == g_now; };
        std::unique_lock<std::mutex> lock(g_lock);
        if (settled()) return;
        lock.unlock();
        m_timers.IsValid(nullptr, 0);  // wakes it
        lock.lock();
        g_settled.wait(lock, settled);
    }

    void MoveTo(int64_t ms) {
        Settle();
        g_now = kStart + ms;
        Settle();
    }

    // The messages of the present moment.
    std::vector<DWORD> Messages() {
        std::vector<DWORD> sequences;
        MSG message{};
        while (PeekMessage(&message, nullptr, 0, 0, PM_REMOVE) != 0)
            sequences.push_back(message.wParam);
        return sequences;
    }

    // Moves on, one millisecond after the other, and notes what comes when.
    std::vector<Fired> Run(int64_t from, int64_t to) {
        std::vector<Fired> fired;
        for (int64_t ms = from; ms <= to; ++ms) {
            MoveTo(ms);
            for (DWORD sequence : Messages())
                fired.push_back({ms, sequence});
        }
        return fired;
    }

    CLinuxTimerMgr m_timers;

  private:
    Replacement<int(timeval*, void*)> m_clock{posix_hooks::clockRead, ReadTestClock};
    Replacement<int(pthread_cond_t*, pthread_mutex_t*, const timespec*)> m_wait{
        posix_hooks::conditionTimedWait, TimedWaitByTestClock};
};

int RefuseClock(timeval*, void*) {
    return -1;
}

TEST(HookedTimeVal, IsZeroWhenTheClockCannotBeRead) {
    CLinuxTimeVal value;
    value.Now();
    EXPECT_NE(value.sec, 0);
    const Replacement<int(timeval*, void*)> clock(posix_hooks::clockRead, RefuseClock);
    value.Now();
    EXPECT_EQ(value.sec, 0);
    EXPECT_EQ(value.nsec, 0);
}

TEST_F(HookedTimer, PeriodOf0Is15Milliseconds) {
    const DWORD sequence = SequenceOf(Set(0));
    EXPECT_EQ(Run(1, 50), (std::vector<Fired>{{15, sequence}, {30, sequence}, {45, sequence}}));
}

TEST_F(HookedTimer, PeriodsDoNotDrift) {
    const DWORD sequence = SequenceOf(Set(7));
    const int64_t periods = static_cast<int64_t>(sync_kit::Load(500));
    for (int64_t period = 1; period <= periods; ++period) {
        MoveTo(period * 7 - 1);
        ASSERT_TRUE(Messages().empty()) << period;
        MoveTo(period * 7);
        ASSERT_EQ(Messages(), std::vector<DWORD>{sequence}) << period;
    }
}

TEST_F(HookedTimer, PeriodsCarryIntoSeconds) {
    Set(2999);
    MoveTo(2998);
    EXPECT_TRUE(Messages().empty());
    MoveTo(2999);
    EXPECT_EQ(Messages().size(), 1u);
    MoveTo(5997);
    EXPECT_TRUE(Messages().empty());
    MoveTo(5998);
    EXPECT_EQ(Messages().size(), 1u);
}

// The timer thread held up for three periods: one message, and the next on the old grid.
TEST_F(HookedTimer, MissedPeriodsAreSkippedAndTheDelayIsKept) {
    Set(10);
    MoveTo(10);
    EXPECT_EQ(Messages().size(), 1u);
    __atomic_store_n(&TR_max_expire_delay, 0u, __ATOMIC_RELAXED);
    MoveTo(45);
    EXPECT_EQ(Messages().size(), 1u);
    EXPECT_EQ(__atomic_load_n(&TR_max_expire_delay, __ATOMIC_RELAXED), 25u) << "due at 20";
    MoveTo(49);
    EXPECT_TRUE(Messages().empty());
    MoveTo(50);
    EXPECT_EQ(Messages().size(), 1u);
    MoveTo(65);
    EXPECT_EQ(Messages().size(), 1u);
    EXPECT_EQ(__atomic_load_n(&TR_max_expire_delay, __ATOMIC_RELAXED), 25u) << "the most so far";
}

// An owner that does not read finds one message a period.
TEST_F(HookedTimer, StalledOwnerFindsOneMessageAPeriod) {
    Set(10);
    for (int64_t ms : {10, 20, 30})
        MoveTo(ms);
    EXPECT_EQ(Messages().size(), 3u);
}

TEST_F(HookedTimer, EqualExpiriesFireInReverseOrderOfAddition) {
    const DWORD a = SequenceOf(Set(10));
    const DWORD b = SequenceOf(Set(10));
    const DWORD c = SequenceOf(Set(10));
    MoveTo(10);
    EXPECT_EQ(Messages(), (std::vector<DWORD>{c, b, a}));
    MoveTo(20);
    EXPECT_EQ(Messages(), (std::vector<DWORD>{a, b, c})) << "a was put back last";
    MoveTo(30);
    EXPECT_EQ(Messages(), (std::vector<DWORD>{c, b, a}));
}

TEST_F(HookedTimer, AddingAListedTimerMovesItBeforeItsEquals) {
    CLinuxTimer* a = Set(10);
    CLinuxTimer* b = Set(10);
    EXPECT_EQ(m_timers.AddTimer(a), 0);
    MoveTo(10);
    EXPECT_EQ(Messages(), (std::vector<DWORD>{SequenceOf(a), SequenceOf(b)}));
}

TEST_F(HookedTimer, InitAgainAndAddAgainChangesThePeriod) {
    CLinuxTimer* timer = Set(1000);
    MoveTo(5);
    EXPECT_EQ(m_timers.RemoveTimer(timer), 0);
    EXPECT_EQ(timer->Init(10), 0);
    EXPECT_EQ(m_timers.AddTimer(timer), 0);
    const DWORD sequence = SequenceOf(timer);
    EXPECT_EQ(Run(6, 26), (std::vector<Fired>{{15, sequence}, {25, sequence}}));
}

TEST_F(HookedTimer, EarlierTimerOvertakesTheOneThatIsWaitedFor) {
    const DWORD late = SequenceOf(Set(100));
    MoveTo(10);
    const DWORD early = SequenceOf(Set(20));
    EXPECT_EQ(Run(11, 100), (std::vector<Fired>{
                                {30, early}, {50, early}, {70, early}, {90, early}, {100, late}}));
}

TEST_F(HookedTimer, RemovedWhileDueDoesNotFire) {
    CLinuxTimer* due = Set(10);
    const DWORD other = SequenceOf(Set(30));
    Settle();
    g_held = true;
    g_now = kStart + 20;  // it is late already, and the timer thread has not seen it
    EXPECT_EQ(m_timers.RemoveTimer(due), 0);
    g_held = false;
    MoveTo(30);
    EXPECT_EQ(Messages(), std::vector<DWORD>{other});
    EXPECT_EQ(m_timers.KillTimer(due), 0);
}

TEST_F(HookedTimer, KilledWhileDueDoesNotFire) {
    CLinuxTimer* due = Set(10);
    const DWORD other = SequenceOf(Set(30));
    Settle();
    g_held = true;
    g_now = kStart + 20;
    EXPECT_EQ(m_timers.KillTimer(due), 0);
    g_held = false;
    MoveTo(30);
    EXPECT_EQ(Messages(), std::vector<DWORD>{other});
}

TEST_F(HookedTimer, FullQueueLosesMessagesAndNothingElse) {
    const DWORD sequence = SequenceOf(Set(10));
    Settle();
    for (int i = 0; i < 1004; ++i)
        ASSERT_EQ(PostThreadMessage(GetCurrentThread(), 1, 0, 0), 1);
    MoveTo(10);
    MoveTo(20);
    MoveTo(30);
    std::vector<DWORD> messages = Messages();
    EXPECT_EQ(messages.size(), 1005u);
    EXPECT_EQ(messages.back(), sequence);
    MoveTo(40);
    EXPECT_EQ(Messages().size(), 1u);
}

// The clock is the wall clock: timers wait out a step back, and skip a step ahead.
TEST_F(HookedTimer, ClockSetBackDelaysUntilItIsTheSameTimeAgain) {
    Set(10);
    MoveTo(10);
    EXPECT_EQ(Messages().size(), 1u);
    MoveTo(-600000);
    MoveTo(19);
    EXPECT_TRUE(Messages().empty());
    MoveTo(20);
    EXPECT_EQ(Messages().size(), 1u);
}

TEST_F(HookedTimer, ClockSetAheadGivesOneMessageAndKeepsTheGrid) {
    Set(10);
    MoveTo(3600004);
    EXPECT_EQ(Messages().size(), 1u);
    MoveTo(3600009);
    EXPECT_TRUE(Messages().empty());
    MoveTo(3600010);
    EXPECT_EQ(Messages().size(), 1u);
}

TEST_F(HookedTimer, WrapOfTheMillisecondClockDoesNotShow) {
    const int64_t kWrap = (int64_t{1} << 32) - kStart;
    const DWORD sequence = SequenceOf(Set(10));
    MoveTo(kWrap - 26);
    EXPECT_EQ(Messages().size(), 1u);
    const int64_t next = (kWrap - 26) / 10 * 10 + 10;
    std::vector<Fired> expected;
    for (int64_t at = next; at <= kWrap + 30; at += 10)
        expected.push_back({at, sequence});
    EXPECT_EQ(Run(kWrap - 25, kWrap + 30), expected);
}

TEST_F(HookedTimer, TimerThatWasNeverInitialisedHoldsNothingUp) {
    auto* timer = new CLinuxTimer;
    EXPECT_EQ(m_timers.AddTimer(timer), 0);
    Settle();
    EXPECT_EQ(Messages().size(), 1u) << "due since 1970";
}

TEST_F(HookedTimer, LongestPeriodIsHeld) {
    const DWORD sequence = SequenceOf(Set(0xFFFFFFFF));
    MoveTo(0xFFFFFFFE);
    EXPECT_TRUE(Messages().empty());
    MoveTo(0xFFFFFFFF);
    EXPECT_EQ(Messages(), std::vector<DWORD>{sequence});
}

TEST_F(HookedTimer, ClockSetAheadByManyYearsDoesNotHoldTheThreadUp) {
    Set(1);
    MoveTo(int64_t{50} * 365 * 24 * 3600 * 1000);
    EXPECT_EQ(Messages().size(), 1u);
}

// Many timers, beside a list that is searched for the earliest, the last added first.
TEST_F(HookedTimer, ManyTimersFireInTheStatedOrder) {
    struct Entry {
        int64_t expiry;
        int64_t period;
        DWORD sequence;
    };
    std::vector<Entry> model;  // in the order of addition
    std::mt19937 random = testkit::Random(900);
    const int64_t count = static_cast<int64_t>(sync_kit::Load(1000));
    for (int64_t i = 0; i < count; ++i) {
        const unsigned int period = 20 + sync_kit::Below(random, 60);
        CLinuxTimer* timer = Set(period);
        ASSERT_NE(timer, nullptr);
        const DWORD sequence =
            model.empty() ? SequenceOf(timer) : model.front().sequence + static_cast<DWORD>(i);
        ASSERT_TRUE(timer->IsValid(sequence));
        model.push_back({period, period, sequence});
    }
    for (int64_t ms = 20; ms <= 200; ++ms) {
        MoveTo(ms);
        std::vector<DWORD> expected;
        for (;;) {
            auto next = model.end();
            for (auto it = model.begin(); it != model.end(); ++it) {
                if (next == model.end() || it->expiry <= next->expiry) next = it;
            }
            if (next->expiry > ms) break;
            expected.push_back(next->sequence);
            Entry entry = *next;
            entry.expiry += entry.period;
            model.erase(next);
            model.push_back(entry);
        }
        ASSERT_EQ(Messages(), expected) << ms;
    }
}

// How the timer thread ends.

TEST_F(HookedTimer, InterruptedWaitGoesOn) {
    Set(10);
    Settle();
    g_failure = EINTR;
    MoveTo(10);
    EXPECT_EQ(Messages().size(), 1u);
}

TEST_F(HookedTimer, FailedTimedWaitEndsTheThreadWithCode2) {
    Set(10);
    Settle();
    g_failure = EPERM;
    EXPECT_EQ(TimerThread().WaitForSignal(INFINITE), WAIT_OBJECT_0);
    EXPECT_EQ(TimerThread().GetExitCode(), 2);
    EXPECT_EQ(m_timers.LaunchTimerThread(), -1) << "it counts until it is killed";
    EXPECT_EQ(m_timers.KillTimerThread(), 0);
}

// Errors of the manager's own lock and condition.

const void* g_begin;
const void* g_end;

bool IsTheManagers(const void* object) {
    return object >= g_begin && object < g_end;
}

int RefuseLock(pthread_mutex_t* mutex) {
    return IsTheManagers(mutex) ? EINVAL : posix_hooks::mutexLock.Real(mutex);
}

int RefuseSignal(pthread_cond_t* condition) {
    return IsTheManagers(condition) ? EINVAL : posix_hooks::conditionSignal.Real(condition);
}

int RefuseWait(pthread_cond_t* condition, pthread_mutex_t* mutex) {
    return IsTheManagers(condition) ? EINVAL : posix_hooks::conditionWait.Real(condition, mutex);
}

class TimerErrors : public testing::Test {
  protected:
    TimerErrors() {
        g_begin = &m_timers;
        g_end = &m_timers + 1;
    }
    CLinuxTimerMgr m_timers;
};

TEST_F(TimerErrors, WithoutItsLockNothingIsListed) {
    ASSERT_EQ(m_timers.LaunchTimerThread(), 0);
    CLinuxTimer timer;
    timer.Init(1000000);
    auto* heap = new CLinuxTimer;
    {
        const Replacement<int(pthread_mutex_t*)> lock(posix_hooks::mutexLock, RefuseLock);
        EXPECT_EQ(m_timers.SetTimer(1, nullptr), nullptr);
        EXPECT_EQ(m_timers.AddTimer(&timer), 1);
        EXPECT_EQ(m_timers.RemoveTimer(&timer), 1);
        EXPECT_EQ(m_timers.KillTimer(heap), -2) << "and it is still there";
        EXPECT_FALSE(m_timers.IsValid(&timer, 1));
    }
    EXPECT_EQ(m_timers.KillTimer(heap), 0);
}

TEST_F(TimerErrors, SignalThatFailsShowsForTheFirstOfTheList) {
    const Replacement<int(pthread_cond_t*)> signal(posix_hooks::conditionSignal, RefuseSignal);
    ASSERT_EQ(m_timers.LaunchTimerThread(), 0);
    CLinuxTimer first;
    CLinuxTimer second;
    first.Init(1000000);
    second.Init(2000000);
    EXPECT_EQ(m_timers.AddTimer(&first), 1);
    EXPECT_EQ(m_timers.AddTimer(&second), 0);
    EXPECT_EQ(m_timers.SetTimer(1, nullptr), nullptr) << "and leaves nothing in the list";
    EXPECT_EQ(m_timers.RemoveTimer(&second), 0);
    EXPECT_EQ(m_timers.RemoveTimer(&first), 1);
    // The thread was told nothing and sleeps: with signals again, it can be ended.
    posix_hooks::conditionSignal.Replace(nullptr);
    EXPECT_EQ(m_timers.KillTimerThread(), 0);
}

TEST_F(TimerErrors, FailedWaitForTimersEndsTheThreadWithItsError) {
    const Replacement<int(pthread_cond_t*, pthread_mutex_t*)> wait(posix_hooks::conditionWait,
                                                                   RefuseWait);
    ASSERT_EQ(m_timers.LaunchTimerThread(), 0);
    auto* thread = static_cast<CLinuxThread*>(GetCurrentThread());
    EXPECT_EQ(thread->WaitForSignal(INFINITE), WAIT_OBJECT_0);
    EXPECT_EQ(thread->GetExitCode(), EINVAL);
}

TEST_F(TimerErrors, ThreadWithoutItsLockEndsWithCode1) {
    const Replacement<int(pthread_mutex_t*)> lock(posix_hooks::mutexLock, RefuseLock);
    EXPECT_EQ(CLinuxTimerMgr::ThreadFn(&m_timers), 1u);
}

}  // namespace
