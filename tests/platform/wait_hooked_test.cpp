// Waits whose clock, locks and conditions answer as the test says.

#include <errno.h>
#include <gtest/gtest.h>

#include <vector>

#include "platform/posix_hooks.h"
#include "vidshow/platform/sync.h"

namespace {

using posix_hooks::Replacement;

using ClockSignature = int(timeval*, void*);
using MutexSignature = int(pthread_mutex_t*);
using ConditionSignature = int(pthread_cond_t*);
using WaitSignature = int(pthread_cond_t*, pthread_mutex_t*);
using TimedWaitSignature = int(pthread_cond_t*, pthread_mutex_t*, const timespec*);

struct Wake {
    int result;
    int error;      // errno as the wait leaves it
    bool takeable;  // whether the object can be taken after it
};

timeval g_now;
int g_clockReads;
std::vector<Wake> g_wakes;          // one for each wait to come; after them: timed out
std::vector<timespec> g_deadlines;  // of the timed waits
std::vector<int> g_errnoBefore;     // as each wait finds it
size_t g_waits;
int g_yields;
int g_yieldsWithLockHeld;
int g_locksHeld;  // locks of g_lock less unlocks
pthread_mutex_t* g_lock;

// The test's object: takeable as the script says.
class Scripted : public CLinuxSyncObject {
  public:
    const char* getType() const override { return ""; }
    int WaitAction() override {
        ++takes;
        return 0;
    }
    void SetFlag(bool set) { m_signaled = set; }
    bool flag() const { return m_signaled; }
    pthread_mutex_t* lock() { return &m_lock; }
    pthread_cond_t* condition() { return &m_condition; }
    int takes = 0;
};

Scripted* g_object;

int ReadTestClock(timeval* now, void*) {
    ++g_clockReads;
    *now = g_now;
    return 0;
}

int FailToReadClock(timeval*, void*) {
    return -1;
}

int WakeAsScripted(pthread_cond_t*, pthread_mutex_t*) {
    g_errnoBefore.push_back(errno);
    const Wake wake =
        g_waits < g_wakes.size() ? g_wakes[g_waits] : Wake{ETIMEDOUT, 0, g_object->flag()};
    ++g_waits;
    g_object->SetFlag(wake.takeable);
    errno = wake.error;
    return wake.result;
}

int TimedWakeAsScripted(pthread_cond_t* condition, pthread_mutex_t* mutex,
                        const timespec* deadline) {
    g_deadlines.push_back(*deadline);
    return WakeAsScripted(condition, mutex);
}

int CountLock(pthread_mutex_t* mutex) {
    if (mutex == g_lock) ++g_locksHeld;
    return posix_hooks::mutexLock.Real(mutex);
}

int CountUnlock(pthread_mutex_t* mutex) {
    if (mutex == g_lock) --g_locksHeld;
    return posix_hooks::mutexUnlock.Real(mutex);
}

int FailLock(pthread_mutex_t* mutex) {
    return mutex == g_lock ? EAGAIN : posix_hooks::mutexLock.Real(mutex);
}

int FailUnlock(pthread_mutex_t* mutex) {
    const int result = posix_hooks::mutexUnlock.Real(mutex);
    return mutex == g_lock ? EPERM : result;
}

int CountYield() {
    ++g_yields;
    if (g_locksHeld != 0) ++g_yieldsWithLockHeld;
    return 0;
}

class HookedWait : public testing::Test {
  protected:
    HookedWait() {
        g_now = timeval{1000, 0};
        g_clockReads = g_yields = g_yieldsWithLockHeld = g_locksHeld = 0;
        g_waits = 0;
        g_wakes.clear();
        g_deadlines.clear();
        g_errnoBefore.clear();
        g_object = &object;
        g_lock = object.lock();
    }
    ~HookedWait() override {
        EXPECT_EQ(g_locksHeld, 0) << "every lock is let go";
        g_lock = nullptr;
    }

    timespec DeadlineOf(long microseconds, DWORD ms) {
        g_now.tv_usec = microseconds;
        EXPECT_EQ(object.WaitForSignal(ms), WAIT_TIMEOUT);
        return g_deadlines.empty() ? timespec{} : g_deadlines.back();
    }

    Scripted object;

  private:
    Replacement<ClockSignature> m_clock{posix_hooks::clockRead, ReadTestClock};
    Replacement<WaitSignature> m_wait{posix_hooks::conditionWait, WakeAsScripted};
    Replacement<TimedWaitSignature> m_timedWait{posix_hooks::conditionTimedWait,
                                                TimedWakeAsScripted};
    Replacement<MutexSignature> m_lock{posix_hooks::mutexLock, CountLock};
    Replacement<MutexSignature> m_unlock{posix_hooks::mutexUnlock, CountUnlock};
    Replacement<int()> m_yield{posix_hooks::yield, CountYield};
};

TEST_F(HookedWait, DeadlineIsTheWallClockPlusTheTime) {
    const timespec deadline = DeadlineOf(250000, 4321);
    EXPECT_EQ(deadline.tv_sec, 1004);
    EXPECT_EQ(deadline.tv_nsec, 571000000);
}

TEST_F(HookedWait, DeadlineCarriesMoreThanASecondOfNanoseconds) {
    const timespec deadline = DeadlineOf(999999, 999);
    EXPECT_EQ(deadline.tv_sec, 1001);
    EXPECT_EQ(deadline.tv_nsec, 998999000);
}

TEST_F(HookedWait, DeadlineOfTheLongestFiniteTime) {
    const timespec deadline = DeadlineOf(0, 0xFFFFFFFE);
    EXPECT_EQ(deadline.tv_sec, 1000 + 4294967);
    EXPECT_EQ(deadline.tv_nsec, 294000000);
}

// A full second of nanoseconds goes to the wait as it is. Clients rely on it: kept.
TEST_F(HookedWait, DeadlineOfAFullSecondOfNanosecondsIsNotCarried) {
    const timespec deadline = DeadlineOf(500000, 500);
    EXPECT_EQ(deadline.tv_sec, 1000);
    EXPECT_EQ(deadline.tv_nsec, 1000000000);
}

TEST_F(HookedWait, FullSecondOfNanosecondsFailsTheRealWait) {
    g_now.tv_usec = 500000;
    Replacement<TimedWaitSignature> real(
        posix_hooks::conditionTimedWait,
        [](pthread_cond_t* condition, pthread_mutex_t* mutex, const timespec* deadline) {
            return posix_hooks::conditionTimedWait.Real(condition, mutex, deadline);
        });
    EXPECT_EQ(object.WaitForSignal(500), WAIT_FAILED);
}

TEST_F(HookedWait, UnreadableClockFailsEveryFiniteWait) {
    Replacement<ClockSignature> broken(posix_hooks::clockRead, FailToReadClock);
    object.SetFlag(true);
    EXPECT_EQ(object.WaitForSignal(0), WAIT_FAILED);
    EXPECT_EQ(object.WaitForSignal(100), WAIT_FAILED);
    EXPECT_EQ(object.takes, 0);
    EXPECT_EQ(object.WaitForSignal(INFINITE), WAIT_OBJECT_0);
}

TEST_F(HookedWait, InfiniteWaitReadsNoClock) {
    g_wakes = {{0, 0, true}};
    EXPECT_EQ(object.WaitForSignal(INFINITE), WAIT_OBJECT_0);
    EXPECT_EQ(g_clockReads, 0);
    EXPECT_EQ(g_waits, 1u);
    EXPECT_TRUE(g_deadlines.empty());
}

TEST_F(HookedWait, TimeoutZeroDoesNotWait) {
    EXPECT_EQ(object.WaitForSignal(0), WAIT_TIMEOUT);
    EXPECT_EQ(g_waits, 0u);
}

TEST_F(HookedWait, TakeableObjectIsTakenWithoutWaiting) {
    object.SetFlag(true);
    EXPECT_EQ(object.WaitForSignal(100), WAIT_OBJECT_0);
    EXPECT_EQ(object.takes, 1);
    EXPECT_EQ(g_waits, 0u);
}

TEST_F(HookedWait, LockThatFailsFailsTheWait) {
    object.SetFlag(true);
    Replacement<MutexSignature> broken(posix_hooks::mutexLock, FailLock);
    EXPECT_EQ(object.WaitForSignal(INFINITE), WAIT_FAILED);
    EXPECT_EQ(object.takes, 0);
}

TEST_F(HookedWait, UnlockThatFailsFailsTheWaitAfterTheTake) {
    object.SetFlag(true);
    {
        Replacement<MutexSignature> broken(posix_hooks::mutexUnlock, FailUnlock);
        EXPECT_EQ(object.WaitForSignal(INFINITE), WAIT_FAILED);
    }
    EXPECT_EQ(object.takes, 1);
    g_locksHeld = 0;  // this unlock was not counted
}

TEST_F(HookedWait, WakeUpsWithoutCauseKeepTheDeadline) {
    g_wakes = {{0, 0, false}, {0, 0, false}, {0, 0, true}};
    EXPECT_EQ(object.WaitForSignal(1500), WAIT_OBJECT_0);
    EXPECT_EQ(object.takes, 1);
    ASSERT_EQ(g_deadlines.size(), 3u);
    for (const timespec& deadline : g_deadlines) {
        EXPECT_EQ(deadline.tv_sec, 1001);
        EXPECT_EQ(deadline.tv_nsec, 500000000);
    }
    EXPECT_EQ(g_clockReads, 1);
}

TEST_F(HookedWait, ErrnoIsClearedBeforeEveryWait) {
    errno = EBADF;
    g_wakes = {{0, EBADF, false}, {0, 0, true}};
    EXPECT_EQ(object.WaitForSignal(INFINITE), WAIT_OBJECT_0);
    EXPECT_EQ(g_errnoBefore, (std::vector<int>{0, 0}));
}

TEST_F(HookedWait, SignalThatComesWithTheTimeoutWins) {
    g_wakes = {{ETIMEDOUT, 0, true}};
    EXPECT_EQ(object.WaitForSignal(10), WAIT_OBJECT_0);
    EXPECT_EQ(object.takes, 1);
}

TEST_F(HookedWait, OtherErrorOfTheWaitFailsIt) {
    g_wakes = {{EINVAL, 0, false}};
    EXPECT_EQ(object.WaitForSignal(10), WAIT_FAILED);
    g_waits = 0;
    EXPECT_EQ(object.WaitForSignal(INFINITE), WAIT_FAILED);
}

TEST_F(HookedWait, SignalThatComesWithAnErrorWins) {
    g_wakes = {{EINVAL, 0, true}};
    EXPECT_EQ(object.WaitForSignal(10), WAIT_OBJECT_0);
}

TEST_F(HookedWait, InterruptionByResultOrByErrnoWaitsAgain) {
    g_wakes = {{EINTR, 0, false}, {0, EINTR, false}, {ETIMEDOUT, EINTR, false}};
    EXPECT_EQ(object.WaitForSignal(10), WAIT_TIMEOUT);
    EXPECT_EQ(g_waits, 3u) << "errno counts only when the result is 0";
    EXPECT_EQ(g_yields, 0);
}

TEST_F(HookedWait, InterruptedWaitStillTakes) {
    g_wakes = {{EINTR, 0, true}};
    EXPECT_EQ(object.WaitForSignal(INFINITE), WAIT_OBJECT_0);
    EXPECT_EQ(g_waits, 1u);
}

TEST_F(HookedWait, Every25thInterruptionYieldsWithTheLockReleased) {
    g_wakes.assign(24, Wake{EINTR, 0, false});
    EXPECT_EQ(object.WaitForSignal(10), WAIT_TIMEOUT);
    EXPECT_EQ(g_yields, 0);

    g_waits = 0;
    g_wakes.assign(74, Wake{0, EINTR, false});
    EXPECT_EQ(object.WaitForSignal(10), WAIT_TIMEOUT);
    EXPECT_EQ(g_yields, 2);
    EXPECT_EQ(g_yieldsWithLockHeld, 0);
}

// Setting and clearing.

std::vector<pthread_cond_t*> g_broadcasts;

int RecordBroadcast(pthread_cond_t* condition) {
    g_broadcasts.push_back(condition);
    return posix_hooks::conditionBroadcast.Real(condition);
}

int FailBroadcast(pthread_cond_t*) {
    return EINVAL;
}

TEST_F(HookedWait, OnlyTheChangeFromClearToSetWakes) {
    g_broadcasts.clear();
    Replacement<ConditionSignature> broadcast(posix_hooks::conditionBroadcast, RecordBroadcast);
    const std::vector<pthread_cond_t*> once{object.condition()};
    const std::vector<pthread_cond_t*> twice{object.condition(), object.condition()};
    EXPECT_EQ(object.SetSignaled(false, true), 0);
    EXPECT_TRUE(g_broadcasts.empty());
    EXPECT_EQ(object.SetSignaled(true, true), 0);
    EXPECT_EQ(object.SetSignaled(true, false), 0);
    EXPECT_EQ(g_broadcasts, once);
    EXPECT_EQ(object.SetSignaled(false, false), 0);
    EXPECT_EQ(g_broadcasts, once);
    EXPECT_EQ(object.SetSignaled(true, false), 0);
    EXPECT_EQ(g_broadcasts, twice);
}

TEST_F(HookedWait, SettingTakesTheLockOnlyWhenAsked) {
    static int locks;
    locks = 0;
    Replacement<MutexSignature> count(posix_hooks::mutexLock, [](pthread_mutex_t* mutex) {
        if (mutex == g_lock) ++locks;
        return CountLock(mutex);
    });
    object.SetSignaled(true, false);
    EXPECT_EQ(locks, 0);
    object.SetSignaled(true, true);
    EXPECT_EQ(locks, 1);
}

TEST_F(HookedWait, BroadcastThatFailsIsReportedAndFreesTheLock) {
    Replacement<ConditionSignature> broken(posix_hooks::conditionBroadcast, FailBroadcast);
    EXPECT_EQ(object.SetSignaled(true, true), EINVAL);
    EXPECT_TRUE(object.flag());
}

TEST_F(HookedWait, LockThatFailsLeavesTheFlag) {
    Replacement<MutexSignature> broken(posix_hooks::mutexLock, FailLock);
    EXPECT_EQ(object.SetSignaled(true, true), EAGAIN);
    EXPECT_FALSE(object.flag());
}

TEST_F(HookedWait, UnlockThatFailsIsReported) {
    {
        Replacement<MutexSignature> broken(posix_hooks::mutexUnlock, FailUnlock);
        EXPECT_EQ(object.SetSignaled(true, true), EPERM);
    }
    g_locksHeld = 0;  // this unlock was not counted
}

// The functions around the objects. The state lock is the first member behind the virtual table's
// address, in every class.

pthread_mutex_t* StateLockOf(HANDLE handle) {
    void* lock = static_cast<char*>(handle) + sizeof(void*);
    return static_cast<pthread_mutex_t*>(lock);
}

TEST(HookedHandles, ErrorsInsideBecomeFalse) {
    const HANDLE event = CreateEvent(nullptr, FALSE, FALSE, nullptr);
    const HANDLE semaphore = CreateSemaphore(nullptr, 0, 1, nullptr);
    const HANDLE mutex = CreateMutex(nullptr, FALSE, nullptr);
    ASSERT_EQ(WaitForSingleObject(mutex, 0), WAIT_OBJECT_0);
    {
        Replacement<MutexSignature> broken(posix_hooks::mutexLock, FailLock);
        g_lock = StateLockOf(event);
        EXPECT_EQ(SetEvent(event), 0);
        EXPECT_EQ(ResetEvent(event), 0);
        EXPECT_EQ(WaitForSingleObject(event, 0), WAIT_FAILED);
        g_lock = StateLockOf(semaphore);
        EXPECT_EQ(ReleaseSemaphore(semaphore, 1, nullptr), 0);
        g_lock = StateLockOf(mutex);
        EXPECT_EQ(ReleaseMutex(mutex), 0);
        g_lock = nullptr;
    }
    EXPECT_EQ(WaitForSingleObject(semaphore, 0), WAIT_TIMEOUT) << "no unit was added";
    EXPECT_EQ(ReleaseMutex(mutex), 1);
    for (HANDLE handle : {event, semaphore, mutex})
        CloseHandle(handle);
}

std::vector<const void*> g_destroyed;

TEST(HookedHandles, ClosingDestroysConditionThenLock) {
    const HANDLE event = CreateEvent(nullptr, FALSE, FALSE, nullptr);
    g_destroyed.clear();
    {
        Replacement<MutexSignature> mutex(posix_hooks::mutexDestroy, [](pthread_mutex_t* it) {
            g_destroyed.push_back(it);
            return posix_hooks::mutexDestroy.Real(it);
        });
        Replacement<ConditionSignature> condition(posix_hooks::conditionDestroy,
                                                  [](pthread_cond_t* it) {
                                                      g_destroyed.push_back(it);
                                                      return posix_hooks::conditionDestroy.Real(it);
                                                  });
        CloseHandle(event);
    }
    ASSERT_EQ(g_destroyed.size(), 2u);
    EXPECT_EQ(g_destroyed[1], static_cast<const void*>(StateLockOf(event)));
    EXPECT_GT(g_destroyed[0], g_destroyed[1]) << "the condition stands behind the lock";
}

TEST(HookedHandles, LockAttributeIsGoneOnceTheObjectStands) {
    static int attributes;
    attributes = 0;
    Replacement<int(pthread_mutexattr_t*)> count(
        posix_hooks::mutexAttributeDestroy, [](pthread_mutexattr_t* it) {
            ++attributes;
            return posix_hooks::mutexAttributeDestroy.Real(it);
        });
    CLinuxEvent event;
    EXPECT_EQ(attributes, 1);
}

}  // namespace
