// Waits for several objects by a clock that moves only when somebody sleeps.

#include <errno.h>
#include <gtest/gtest.h>

#include <vector>

#include "platform/posix_hooks.h"
#include "platform/test_clock.h"
#include "vidshow/platform/sync.h"

namespace {

using posix_hooks::Replacement;

// An object that is there or not, costs time to look at, and keeps count.
class Fake : public CLinuxSyncObject {
  public:
    explicit Fake(bool present) : there(present) {}
    const char* getType() const override { return ""; }
    int WaitAction() override { return 0; }
    DWORD WaitForSignal(DWORD ms) override {
        timeouts.push_back(ms);
        TestClock::milliseconds += cost;
        if (there) ++taken;
        return there ? WAIT_OBJECT_0 : absent;
    }
    int Release() override {
        --taken;
        return 0;
    }
    bool there;
    DWORD absent = WAIT_TIMEOUT;
    unsigned cost = 0;
    int taken = 0;
    std::vector<DWORD> timeouts;
};

class HookedMultiWait : public testing::Test {
  protected:
    static DWORD Wait(std::vector<HANDLE> handles, BOOL all, DWORD ms) {
        return WaitForMultipleObjects(static_cast<DWORD>(handles.size()), handles.data(), all, ms);
    }

    const std::vector<DWORD> kZero{0};

  private:
    TestClock m_clock;
};

TEST_F(HookedMultiWait, AnyLooksEveryTenMilliseconds) {
    Fake object(false);
    EXPECT_EQ(Wait({&object}, FALSE, 50), WAIT_FAILED);
    EXPECT_EQ(TestClock::sleeps, std::vector<useconds_t>(5, 10000));
    EXPECT_EQ(object.timeouts, std::vector<DWORD>(5, 0));
    EXPECT_EQ(TestClock::milliseconds, 5050u);
}

TEST_F(HookedMultiWait, AnyOverrunsItsTimeByLessThanTenMilliseconds) {
    Fake object(false);
    EXPECT_EQ(Wait({&object}, FALSE, 51), WAIT_FAILED);
    EXPECT_EQ(TestClock::milliseconds, 5060u);
}

TEST_F(HookedMultiWait, AnyStopsAtTheFirstThatIsThere) {
    Fake first(false);
    Fake second(true);
    Fake third(true);
    EXPECT_EQ(Wait({&first, &second, &third}, FALSE, 50), 1u);
    EXPECT_EQ(second.taken, 1);
    EXPECT_TRUE(third.timeouts.empty());
    EXPECT_TRUE(TestClock::sleeps.empty());
}

TEST_F(HookedMultiWait, AnyOfTimeZeroLooksAtNothing) {
    Fake object(true);
    EXPECT_EQ(Wait({&object}, FALSE, 0), WAIT_FAILED);
    EXPECT_TRUE(object.timeouts.empty());
}

// The deadline wraps with the clock, and then lies in the past. Clients rely on it: kept.
TEST_F(HookedMultiWait, AnyAcrossTheClocksWrapEndsAtOnce) {
    Fake object(true);
    TestClock::milliseconds = 0xFFFFFFFF;
    EXPECT_EQ(Wait({&object}, FALSE, 1), WAIT_FAILED);
    TestClock::milliseconds = 5000;
    EXPECT_EQ(Wait({&object}, FALSE, 0xFFFFFFFE), WAIT_FAILED);
    EXPECT_EQ(object.taken, 0);
    EXPECT_EQ(Wait({&object}, FALSE, 0xFFFFFFFF - 5000), WAIT_OBJECT_0) << "the last one before it";
    EXPECT_EQ(Wait({&object}, FALSE, INFINITE), WAIT_OBJECT_0) << "no end, no wrap";
}

TEST_F(HookedMultiWait, AnyTakesAFailingObjectForAnAbsentOne) {
    Fake broken(false);
    broken.absent = WAIT_FAILED;
    Fake there(true);
    EXPECT_EQ(Wait({&broken, &there}, FALSE, 50), 1u);
}

TEST_F(HookedMultiWait, AllBlocksOnTheFirstAndLooksAtTheOthers) {
    Fake first(true);
    Fake second(true);
    Fake third(true);
    EXPECT_EQ(Wait({&first, &second, &third}, TRUE, 700), WAIT_OBJECT_0);
    EXPECT_EQ(first.timeouts, (std::vector<DWORD>{700}));
    EXPECT_EQ(second.timeouts, kZero);
    EXPECT_EQ(third.timeouts, kZero);
}

TEST_F(HookedMultiWait, AllBlocksNextOnTheOneThatWasMissing) {
    Fake first(true);
    Fake second(true);
    Fake third(false);
    EXPECT_EQ(Wait({&first, &second, &third}, TRUE, INFINITE), WAIT_TIMEOUT)
        << "whatever the wait for the missing one returns";
    EXPECT_EQ(first.timeouts, (std::vector<DWORD>{INFINITE}));
    EXPECT_EQ(second.timeouts, kZero);
    EXPECT_EQ(third.timeouts, (std::vector<DWORD>{0, INFINITE}));
    EXPECT_EQ(first.taken, 0) << "given back before blocking";
    EXPECT_EQ(second.taken, 0);
}

TEST_F(HookedMultiWait, AllSucceedsInTheSecondAttempt) {
    Fake first(true);
    Fake second(true);
    struct Comes : Fake {
        Comes() : Fake(false) {}
        DWORD WaitForSignal(DWORD ms) override {
            there = !timeouts.empty();
            return Fake::WaitForSignal(ms);
        }
    } comes;
    EXPECT_EQ(Wait({&first, &comes, &second}, TRUE, INFINITE), WAIT_OBJECT_0);
    EXPECT_EQ(first.timeouts, (std::vector<DWORD>{INFINITE, 0}));
    EXPECT_EQ(comes.timeouts, (std::vector<DWORD>{0, INFINITE}));
    EXPECT_EQ(second.timeouts, kZero);
    for (const Fake* object : {&first, &second, static_cast<Fake*>(&comes)}) {
        EXPECT_EQ(object->taken, 1);
    }
}

TEST_F(HookedMultiWait, AllTakesTheTimeOfEveryAttemptOffTheRest) {
    Fake first(true);
    first.cost = 30;
    struct ComesOnce : Fake {
        ComesOnce() : Fake(false) {}
        DWORD WaitForSignal(DWORD ms) override {
            there = ms != 0;
            return Fake::WaitForSignal(ms);
        }
    } onlyWhenBlockedOn;
    onlyWhenBlockedOn.cost = 20;
    // Attempt 1 blocks on `first` (30) and misses the other (20); attempt 2 blocks on that (20) and
    // takes both.
    EXPECT_EQ(Wait({&first, &onlyWhenBlockedOn}, TRUE, 51), WAIT_OBJECT_0);
    EXPECT_EQ(first.timeouts, (std::vector<DWORD>{51, 0}));
    EXPECT_EQ(onlyWhenBlockedOn.timeouts, (std::vector<DWORD>{0, 1}));
}

TEST_F(HookedMultiWait, AllTimesOutWhenAnAttemptHasUsedTheRest) {
    Fake first(true);
    Fake second(false);
    first.cost = 50;
    EXPECT_EQ(Wait({&first, &second}, TRUE, 50), WAIT_TIMEOUT);
    EXPECT_EQ(second.timeouts, kZero) << "not blocked on any more";
    EXPECT_EQ(first.taken, 0);
}

TEST_F(HookedMultiWait, AllReturnsTheFailureOfTheBlockingWait) {
    Fake broken(false);
    broken.absent = WAIT_FAILED;
    EXPECT_EQ(Wait({&broken}, TRUE, 50), WAIT_FAILED);
}

TEST_F(HookedMultiWait, AllDoesNotSleepByItself) {
    Fake first(true);
    Fake second(false);
    EXPECT_EQ(Wait({&first, &second}, TRUE, 50), WAIT_TIMEOUT);
    EXPECT_TRUE(TestClock::sleeps.empty());
}

pthread_mutex_t* g_registryLock;

TEST_F(HookedMultiWait, RegistryLockThatFailsFailsTheWait) {
    Fake there(true);
    // The only lock that a wait for any takes of its own, as the objects here take none.
    Replacement<int(pthread_mutex_t*)> spy(posix_hooks::mutexLock, [](pthread_mutex_t* mutex) {
        g_registryLock = mutex;
        return posix_hooks::mutexLock.Real(mutex);
    });
    ASSERT_EQ(Wait({&there}, FALSE, 50), 0u);
    ASSERT_EQ(there.taken, 1);
    Replacement<int(pthread_mutex_t*)> broken(posix_hooks::mutexLock, [](pthread_mutex_t* mutex) {
        return mutex == g_registryLock ? EAGAIN : posix_hooks::mutexLock.Real(mutex);
    });
    EXPECT_EQ(Wait({&there}, FALSE, 50), WAIT_FAILED);
    EXPECT_EQ(there.taken, 1);
}

}  // namespace
