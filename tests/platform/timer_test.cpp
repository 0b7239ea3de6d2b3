// Timers by the real clock: whose they are, how they begin and end.

#include "vidshow/platform/timer.h"

#include <dirent.h>
#include <gtest/gtest.h>
#include <sys/time.h>

#include <algorithm>
#include <map>
#include <memory>
#include <set>

#include "platform/sync_kit.h"
#include "platform/thread_kit.h"

namespace {

using sync_kit::Load;
using sync_kit::OnAnotherThread;
using sync_kit::Worker;
using thread_kit::OwnQueue;
using thread_kit::Pause;

MSG Read() {
    MSG message{};
    EXPECT_EQ(GetMessage(&message, nullptr, 0, 0), 1);
    EXPECT_EQ(message.message, WM_TIMER);
    return message;
}

CLinuxTimer* TimerOf(const MSG& message) {
    return reinterpret_cast<CLinuxTimer*>(message.lParam);
}

bool IsEmpty() {
    MSG message{};
    return PeekMessage(&message, nullptr, 0, 0, PM_NOREMOVE) == 0;
}

void DropAll() {
    MSG message{};
    while (PeekMessage(&message, nullptr, 0, 0, PM_REMOVE) != 0) {
    }
}

size_t ThreadsOfTheProcess() {
    DIR* tasks = opendir("/proc/self/task");
    size_t count = 0;
    while (const dirent* entry = readdir(tasks))
        count += entry->d_name[0] != '.';
    closedir(tasks);
    return count;
}

// A manager whose thread is this thread's current one, so that its timers are read here.
class OwnTimers : public CLinuxTimerMgr {
  public:
    OwnTimers() { EXPECT_EQ(LaunchTimerThread(), 0); }
};

TEST(TimeVal, IsZeroAndThenNow) {
    CLinuxTimeVal value;
    EXPECT_EQ(value.sec, 0);
    EXPECT_EQ(value.nsec, 0);
    EXPECT_EQ(DWORD{value}, 0u);
    timeval before;
    timeval after;
    gettimeofday(&before, nullptr);
    value.Now();
    gettimeofday(&after, nullptr);
    EXPECT_GE(value.sec, before.tv_sec);
    EXPECT_LE(value.sec, after.tv_sec);
    EXPECT_EQ(value.nsec % 1000, 0);
    EXPECT_LT(value.nsec, 1000000000);
}

TEST(TimeVal, IsMillisecondsModulo2To32) {
    CLinuxTimeVal value;
    value.sec = 12;
    value.nsec = 345999999;
    EXPECT_EQ(DWORD{value}, 12345u);
    value.sec = 4294967;
    value.nsec = 295000000;
    EXPECT_EQ(DWORD{value}, 4294967295u);
    value.nsec = 296000000;
    EXPECT_EQ(DWORD{value}, 0u);
    value.sec = 1700000000;
    value.nsec = 0;
    EXPECT_EQ(DWORD{value}, static_cast<DWORD>(uint64_t{1700000000000} % (uint64_t{1} << 32)));
}

TEST(TimeVal, CarriesFullSeconds) {
    CLinuxTimeVal value;
    value.sec = 5;
    value.nsec = 999000000;
    value.Add(1);
    EXPECT_EQ(value.sec, 6);
    EXPECT_EQ(value.nsec, 0);
    value.Add(3999);
    EXPECT_EQ(value.sec, 9);
    EXPECT_EQ(value.nsec, 999000000);
    value.Add(999);
    EXPECT_EQ(value.sec, 10);
    EXPECT_EQ(value.nsec, 998000000);
}

// Without a manager there are no timers. Clients rely on it: kept.
TEST(PlainTimer, FunctionsSucceedAndDoNothing) {
    const OwnQueue queue;
    size_t threads = ThreadsOfTheProcess();
    EXPECT_EQ(SetTimer(nullptr, 1, 1, nullptr), 1u);
    EXPECT_EQ(SetTimer(&threads, 0, 0, [](void*, unsigned, unsigned, DWORD) { FAIL(); }), 1u);
    Pause(30);
    EXPECT_TRUE(IsEmpty());
    EXPECT_LE(ThreadsOfTheProcess(), threads);
    EXPECT_EQ(KillTimer(nullptr, 1), 1);
    EXPECT_EQ(KillTimer(nullptr, 99), 1);
    ZEB_KillTimerThread();
    for (unsigned int sequence : {0u, 1u, 77u, 0xFFFFFFFFu})
        EXPECT_EQ(ZEB_IsValidTimer(sequence), 1);
}

// Messages.

TEST(Timer, PostsItsSequenceNumberAndItsAddress) {
    OwnTimers timers;
    CLinuxTimer* timer = timers.SetTimer(1, nullptr);
    ASSERT_NE(timer, nullptr);
    const MSG first = Read();
    EXPECT_EQ(TimerOf(first), timer);
    EXPECT_TRUE(timers.IsValid(timer, first.wParam));
    EXPECT_FALSE(timers.IsValid(timer, first.wParam + 1));
    EXPECT_TRUE(timer->IsValid(first.wParam));
    const MSG second = Read();
    EXPECT_EQ(second.wParam, first.wParam) << "it is periodic";
    EXPECT_EQ(TimerOf(second), timer);
}

TEST(Timer, SequenceNumbersCountUp) {
    const CLinuxTimer first;
    DWORD number = 1;
    while (!first.IsValid(number))
        ++number;
    const CLinuxTimer second;
    EXPECT_TRUE(second.IsValid(number + 1));
    EXPECT_FALSE(second.IsValid(number));
}

TEST(Timer, CallbackIsNeverCalled) {
    OwnTimers timers;
    timers.SetTimer(1, [](void*, unsigned, unsigned, DWORD) { FAIL(); });
    Read();
    Read();
}

// Whose timer it is. Clients rely on it: kept.
TEST(Timer, OfAThreadWithoutACurrentThreadHasNoReader) {
    OnAnotherThread([] {
        CLinuxTimerMgr timers;
        CLinuxTimer* timer = timers.SetTimer(1, nullptr);
        ASSERT_NE(timer, nullptr);
        Pause(30);
        EXPECT_TRUE(IsEmpty()) << "the timer thread became current too late";
        EXPECT_EQ(timers.KillTimer(timer), 0);
    });
}

TEST(Timer, FirstOneBelongsToTheThreadThatWasCurrentBefore) {
    OnAnotherThread([] {
        const OwnQueue queue;
        CLinuxTimerMgr timers;
        timers.SetTimer(1, nullptr);
        unsigned int message = 0;
        unsigned int wParam = 0;
        long lParam = 0;
        EXPECT_EQ(static_cast<CLinuxThread*>(queue.id())->GetMessage(&message, &wParam, &lParam),
                  1);
        EXPECT_EQ(message, WM_TIMER);
        EXPECT_NE(GetCurrentThread(), queue.id()) << "now it is the timer thread";
        CLinuxTimer* later = timers.SetTimer(1, nullptr);
        EXPECT_EQ(TimerOf(Read()), later);
    });
}

TEST(Timer, OwnerMayCloseUnderItsTimer) {
    CLinuxTimerMgr timers;
    {
        const OwnQueue queue;
        timers.SetTimer(1, nullptr);
    }
    Pause(10);
    EXPECT_EQ(timers.KillTimerThread(), 0);
}

// The list.

TEST(TimerManager, RefusesNull) {
    CLinuxTimerMgr timers;
    EXPECT_EQ(timers.AddTimer(nullptr), 1);
    EXPECT_EQ(timers.RemoveTimer(nullptr), 1);
    EXPECT_EQ(timers.KillTimer(nullptr), -1);
    EXPECT_FALSE(timers.IsValid(nullptr, 0));
    EXPECT_EQ(CLinuxTimerMgr::ThreadFn(nullptr), 0xFFFFFFFFu);
    EXPECT_EQ(timers.KillTimerThread(), -1) << "none of these started the thread";
    timers.PrintAlarmList("all");
}

TEST(TimerManager, RemovedTimerIsSilentUntilItIsAddedAgain) {
    OwnTimers timers;
    CLinuxTimer* timer = timers.SetTimer(1, nullptr);
    const DWORD sequence = Read().wParam;
    EXPECT_EQ(timers.RemoveTimer(timer), 0);
    DropAll();
    Pause(20);
    EXPECT_TRUE(IsEmpty());
    EXPECT_FALSE(timers.IsValid(timer, sequence));
    EXPECT_TRUE(timer->IsValid(sequence)) << "it is still there";
    EXPECT_EQ(timers.RemoveTimer(timer), 0) << "one that is not listed is no error";
    EXPECT_EQ(timers.AddTimer(timer), 0);
    EXPECT_EQ(TimerOf(Read()), timer);
    EXPECT_TRUE(timers.IsValid(timer, sequence));
}

TEST(TimerManager, KillTimerThatIsNotListedDeletesIt) {
    OwnTimers timers;
    auto* timer = new CLinuxTimer;
    EXPECT_EQ(timers.KillTimer(timer), 0);
    CLinuxTimer* removed = timers.SetTimer(1000, nullptr);
    EXPECT_EQ(timers.RemoveTimer(removed), 0);
    EXPECT_EQ(timers.KillTimer(removed), 0);
}

class CountedTimer : public CLinuxTimer {
  public:
    explicit CountedTimer(int* alive) : m_alive(alive) { ++*m_alive; }
    ~CountedTimer() override { --*m_alive; }

  private:
    int* m_alive;
};

TEST(TimerManager, KillTimerThreadDeletesAllTimers) {
    int alive = 0;
    CLinuxTimerMgr timers;
    std::vector<CLinuxTimer*> all;
    for (int i = 0; i < 10; ++i) {
        all.push_back(new CountedTimer(&alive));
        all.back()->Init(i % 2 == 0 ? 1 : 1000000);
        EXPECT_EQ(timers.AddTimer(all.back()), 0);
    }
    EXPECT_EQ(timers.KillTimerThread(), 0);
    EXPECT_EQ(alive, 0);
    for (const CLinuxTimer* timer : all) {
        for (DWORD sequence = 0; sequence < 50; ++sequence)
            EXPECT_FALSE(timers.IsValid(timer, sequence));
    }
    EXPECT_EQ(timers.KillTimerThread(), -1);
}

TEST(TimerManager, DestructorDeletesAllTimersAndEndsTheThread) {
    sync_kit::OnAnotherThread([] {});  // a sanitizer starts a thread of its own with the first
    const size_t threads = ThreadsOfTheProcess();
    int alive = 0;
    {
        CLinuxTimerMgr timers;
        auto* timer = new CountedTimer(&alive);
        timer->Init(1);
        timers.AddTimer(timer);
    }
    EXPECT_EQ(alive, 0);
    while (ThreadsOfTheProcess() > threads)  // the kernel counts it a little longer than a join
        Pause(1);
}

TEST(TimerManager, TimerAfterKillTimerThreadStartsANewThread) {
    OwnTimers timers;
    for (int i = 0; i < 3; ++i) {
        CLinuxTimer* timer = timers.SetTimer(1, nullptr);
        EXPECT_EQ(TimerOf(Read()), timer);
        EXPECT_EQ(timers.KillTimerThread(), 0);
        EXPECT_EQ(GetCurrentThread(), nullptr);
        if (i == 1) {  // by itself, with a timer that nobody reads
            EXPECT_NE(timers.SetTimer(1, nullptr), nullptr);
            EXPECT_NE(GetCurrentThread(), nullptr);
            EXPECT_EQ(timers.KillTimerThread(), 0);
        }
        EXPECT_EQ(timers.LaunchTimerThread(), 0);
    }
}

TEST(TimerManager, HasOneThread) {
    CLinuxTimerMgr timers;
    EXPECT_EQ(timers.KillTimerThread(), -1);
    EXPECT_EQ(timers.LaunchTimerThread(), 0);
    EXPECT_EQ(timers.LaunchTimerThread(), -1);
    EXPECT_EQ(timers.KillTimerThread(), 0);
    EXPECT_EQ(timers.KillTimerThread(), -1);
}

TEST(TimerManager, FirstTimersOfManyThreadsStartOneThread) {
    const size_t rounds = Load(50);
    for (size_t i = 0; i < rounds; ++i) {
        CLinuxTimerMgr timers;
        std::atomic<int> launches{0};
        std::vector<std::unique_ptr<Worker>> clients;
        for (int c = 0; c < 4; ++c) {
            clients.push_back(std::make_unique<Worker>([&] {
                EXPECT_NE(timers.SetTimer(1000, nullptr), nullptr);
                launches += GetCurrentThread() != nullptr;
            }));
        }
        clients.clear();
        EXPECT_EQ(launches, 1);
    }
}

TEST(TimerManager, ThreadIsKilledRightAfterItsStart) {
    const size_t rounds = Load(300);
    CLinuxTimerMgr timers;
    for (size_t i = 0; i < rounds; ++i) {
        ASSERT_EQ(timers.LaunchTimerThread(), 0);
        if (i % 3 != 0) timers.SetTimer(i % 3 == 1 ? 1 : 1000000, nullptr);
        ASSERT_EQ(timers.KillTimerThread(), 0);
    }
}

TEST(TimerManager, TimersAreKilledFromTheirOwnersLoop) {
    OwnTimers timers;
    std::set<CLinuxTimer*> left;
    for (int i = 0; i < 20; ++i)
        left.insert(timers.SetTimer(1 + static_cast<unsigned>(i) % 3, nullptr));
    // A message may still be waiting when its timer is gone: IsValid tells.
    while (!left.empty()) {
        const MSG message = Read();
        if (!timers.IsValid(TimerOf(message), message.wParam)) continue;
        EXPECT_EQ(left.erase(TimerOf(message)), 1u);
        EXPECT_EQ(timers.KillTimer(TimerOf(message)), 0);
    }
    DropAll();
    Pause(10);
    EXPECT_TRUE(IsEmpty());
}

// By the real clock, on whatever machine: the upper bounds are strict, the lower ones generous.

TEST(TimerLoad, LongRunHasAsManyPeriodsAsTimeAllows) {
    constexpr DWORD kPeriod = 10;
    const DWORD span = static_cast<DWORD>(Load(10000));
    OwnTimers timers;
    size_t messages = 0;
    const double milliseconds = sync_kit::Milliseconds([&] {
        CLinuxTimer* timer = timers.SetTimer(kPeriod, nullptr);
        Pause(span);
        EXPECT_EQ(timers.RemoveTimer(timer), 0);
        MSG message{};
        while (PeekMessage(&message, nullptr, 0, 0, PM_REMOVE) != 0)
            ++messages;
        EXPECT_EQ(timers.KillTimer(timer), 0);
    });
    EXPECT_LE(static_cast<double>(messages), milliseconds / kPeriod + 1);
    EXPECT_GE(messages, span / kPeriod / 4);
}

TEST(TimerLoad, AThousandTimersAtOnce) {
    const size_t count = Load(1000);
    OwnTimers timers;
    std::map<CLinuxTimer*, int> seen;
    for (size_t i = 0; i < count; ++i)
        seen[timers.SetTimer(static_cast<unsigned>(50 + i % 50), nullptr)] = 0;
    EXPECT_EQ(seen.size(), count);
    size_t missing = count;
    while (missing > 0) {
        const MSG message = Read();
        ASSERT_EQ(seen.count(TimerOf(message)), 1u);
        missing -= ++seen[TimerOf(message)] == 3;
    }
    EXPECT_EQ(timers.KillTimerThread(), 0);
}

TEST(TimerLoad, TimersComeAndGoFromManyThreads) {
    const size_t rounds = Load(500);
    CLinuxTimerMgr timers;
    ASSERT_EQ(timers.LaunchTimerThread(), 0);
    std::vector<std::unique_ptr<Worker>> clients;
    for (unsigned c = 0; c < 6; ++c) {
        clients.push_back(std::make_unique<Worker>([&, c] {
            for (size_t i = 0; i < rounds; ++i) {
                CLinuxTimer* timer = timers.SetTimer(1 + c % 3, nullptr);
                if (i % 4 == 0) {
                    EXPECT_EQ(timers.RemoveTimer(timer), 0);
                    EXPECT_EQ(timers.AddTimer(timer), 0);
                }
                if (i % 8 == 0) Pause(1);
                EXPECT_EQ(timers.KillTimer(timer), 0);
            }
        }));
    }
    clients.clear();
    EXPECT_EQ(timers.KillTimerThread(), 0);
}

}  // namespace
