// Many threads on the same objects. Every thread does a fixed number of rounds, each of which ends
// only when its objects were there for it, so that a lost wake-up or a deadlock shows as a test
// that does not end in its time. What was there at the start is counted at the end.

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <memory>
#include <random>

#include "platform/sync_kit.h"
#include "testkit/random.h"

namespace {

using sync_kit::AutoResetEvent;
using sync_kit::Below;
using sync_kit::Handle;
using sync_kit::HasExpired;
using sync_kit::Load;
using sync_kit::ManualResetEvent;
using sync_kit::Mutex;
using sync_kit::Semaphore;

constexpr size_t kThreads = 16;

template <typename Work>
void OnThreads(size_t count, const Work& work) {
    std::vector<std::thread> threads;
    for (size_t i = 0; i < count; ++i)
        threads.emplace_back(work, i);
    for (std::thread& thread : threads)
        thread.join();
}

// Something that threads take and give back: one thing for a mutex and for an auto-reset event,
// which here stands for a token, and some for a semaphore.
class Resource {
  public:
    enum class Kind { mutex, token, units };

    Resource(Kind kind, LONG units)
        : m_kind(kind),
          m_units(units),
          m_handle(kind == Kind::mutex   ? Mutex()
                   : kind == Kind::token ? AutoResetEvent(true)
                                         : Semaphore(units)) {}

    HANDLE handle() const { return m_handle; }

    // Called by whoever has taken it. Now and then it lets others run meanwhile.
    void Use(std::mt19937& random) {
        const LONG users = ++m_users;
        if (Below(random, 4) == 0) std::this_thread::yield();
        if (users > m_units) ++m_overdrawn;
        if (m_units == 1) ++m_exclusive;  // not atomic: the object keeps others away
        ++m_uses;
        --m_users;
    }

    void GiveBack() {
        BOOL done = FALSE;
        if (m_kind == Kind::mutex) done = ReleaseMutex(m_handle);
        if (m_kind == Kind::token) done = SetEvent(m_handle);
        if (m_kind == Kind::units) done = ReleaseSemaphore(m_handle, 1, nullptr);
        if (done == 0) ++m_refused;
    }

    // With all threads gone.
    void ExpectWhole() {
        EXPECT_EQ(m_users, 0);
        EXPECT_EQ(m_overdrawn, 0) << "more users than units";
        EXPECT_EQ(m_refused, 0);
        EXPECT_TRUE(m_units > 1 || m_exclusive == m_uses) << "two users at a time";
        for (LONG i = 0; i < m_units; ++i) {
            EXPECT_EQ(WaitForSingleObject(m_handle, 0), WAIT_OBJECT_0) << "lost";
        }
        sync_kit::OnAnotherThread(
            [&] { EXPECT_EQ(WaitForSingleObject(m_handle, 0), WAIT_TIMEOUT) << "created"; });
        for (LONG i = 0; i < m_units; ++i)
            GiveBack();
    }

  private:
    Kind m_kind;
    LONG m_units;
    Handle m_handle;
    std::atomic<LONG> m_users{0};
    std::atomic<long> m_overdrawn{0};
    std::atomic<long> m_refused{0};
    std::atomic<long> m_uses{0};
    long m_exclusive = 0;
};

using Resources = std::vector<std::unique_ptr<Resource>>;

Resources MixedResources() {
    Resources all;
    for (int i = 0; i < 3; ++i) {
        all.push_back(std::make_unique<Resource>(Resource::Kind::mutex, 1));
        all.push_back(std::make_unique<Resource>(Resource::Kind::token, 1));
        all.push_back(std::make_unique<Resource>(Resource::Kind::units, 3));
    }
    return all;
}

// Takes a few resources together, in an order of its own, and gives them back.
bool TakeAllAndGiveBack(const Resources& resources, std::mt19937& random, DWORD ms) {
    std::array<size_t, 9> order = {0, 1, 2, 3, 4, 5, 6, 7, 8};
    std::shuffle(order.begin(), order.end(), random);
    const DWORD count = 2 + Below(random, 3);
    HANDLE handles[4];
    for (DWORD i = 0; i < count; ++i)
        handles[i] = resources[order[i]]->handle();
    const DWORD result = WaitForMultipleObjects(count, handles, TRUE, ms);
    if (result != WAIT_OBJECT_0) {
        EXPECT_TRUE(HasExpired(result)) << result;
        return false;
    }
    for (DWORD i = 0; i < count; ++i)
        resources[order[i]]->Use(random);
    for (DWORD i = 0; i < count; ++i)
        resources[order[i]]->GiveBack();
    return true;
}

bool TakeOneAndGiveBack(const Resources& resources, std::mt19937& random, DWORD ms) {
    Resource& resource = *resources[Below(random, resources.size())];
    const DWORD result = WaitForSingleObject(resource.handle(), ms);
    if (result != WAIT_OBJECT_0) {
        EXPECT_TRUE(HasExpired(result)) << result;
        return false;
    }
    resource.Use(random);
    resource.GiveBack();
    return true;
}

void TakeAnyAndGiveBack(const Resources& resources, std::mt19937& random) {
    const size_t first = Below(random, resources.size() - 2);
    HANDLE handles[3];
    for (size_t i = 0; i < 3; ++i)
        handles[i] = resources[first + i]->handle();
    const DWORD taken = WaitForMultipleObjects(3, handles, FALSE, INFINITE);
    ASSERT_LT(taken, 3u);
    resources[first + taken]->Use(random);
    resources[first + taken]->GiveBack();
}

TEST(SyncLoad, WaitsForAllOverOverlappingSetsInDifferentOrders) {
    const size_t rounds = Load(1500);
    const Resources resources = MixedResources();
    OnThreads(kThreads, [&](size_t thread) {
        std::mt19937 random = testkit::Random(static_cast<uint32_t>(100 + thread));
        for (size_t i = 0; i < rounds; ++i)
            TakeAllAndGiveBack(resources, random, INFINITE);
    });
    for (const auto& resource : resources)
        resource->ExpectWhole();
}

TEST(SyncLoad, WaitsOfAllKindsMixed) {
    const size_t rounds = Load(1500);
    const Resources resources = MixedResources();
    std::atomic<size_t> done{0};
    OnThreads(kThreads, [&](size_t thread) {
        std::mt19937 random = testkit::Random(static_cast<uint32_t>(200 + thread));
        for (size_t i = 0; i < rounds; ++i) {
            const uint32_t kind = Below(random, 100);
            if (kind == 0) {
                TakeAnyAndGiveBack(resources, random);
                ++done;
            } else if (kind < 40) {
                done += TakeOneAndGiveBack(resources, random, INFINITE);
            } else if (kind < 60) {
                done += TakeOneAndGiveBack(resources, random, Below(random, 3));
            } else if (kind < 80) {
                done += TakeAllAndGiveBack(resources, random, INFINITE);
            } else {
                done += TakeAllAndGiveBack(resources, random, Below(random, 3));
            }
        }
    });
    EXPECT_GT(done, rounds * kThreads / 2) << "waits without end are more than half";
    for (const auto& resource : resources)
        resource->ExpectWhole();
}

// Every set lets one waiter through, no more and no less.
TEST(SyncLoad, EverySetOfAnAutoResetEventWakesExactlyOne) {
    const size_t sets = Load(8000);
    const Handle event = AutoResetEvent();
    const Handle taken = Semaphore(0);
    std::atomic<size_t> through{0};
    std::atomic<bool> stop{false};
    std::vector<std::thread> waiters;
    for (size_t i = 0; i < kThreads; ++i) {
        waiters.emplace_back([&] {
            for (;;) {
                WaitForSingleObject(event, INFINITE);
                if (stop) break;
                ++through;
                ReleaseSemaphore(taken, 1, nullptr);
            }
            SetEvent(event);  // on to the next waiter
        });
    }
    for (size_t i = 1; i <= sets; ++i) {
        SetEvent(event);
        ASSERT_EQ(WaitForSingleObject(taken, INFINITE), WAIT_OBJECT_0);
        ASSERT_EQ(through, i);
    }
    EXPECT_EQ(WaitForSingleObject(taken, 0), WAIT_TIMEOUT);
    stop = true;
    SetEvent(event);
    for (std::thread& waiter : waiters)
        waiter.join();
}

TEST(SyncLoad, SemaphoreUnitsAreNeitherLostNorCreated) {
    const size_t rounds = Load(40000);
    const Handle semaphore = Semaphore(0);
    std::atomic<size_t> taken{0};
    OnThreads(kThreads, [&](size_t thread) {
        std::mt19937 random = testkit::Random(static_cast<uint32_t>(300 + thread));
        if (thread % 2 == 0) {
            for (size_t left = rounds; left > 0;) {
                const size_t count = std::min<size_t>(left, 1 + Below(random, 4));
                EXPECT_EQ(ReleaseSemaphore(semaphore, static_cast<LONG>(count), nullptr), 1);
                left -= count;
            }
        } else {
            for (size_t i = 0; i < rounds;) {
                const DWORD ms = Below(random, 8) == 0 ? 0 : INFINITE;
                i += WaitForSingleObject(semaphore, ms) == WAIT_OBJECT_0;
            }
            taken += rounds;
        }
    });
    EXPECT_EQ(taken, rounds * kThreads / 2);
    LONG left = -1;
    EXPECT_EQ(ReleaseSemaphore(semaphore, 0, &left), 1);
    EXPECT_EQ(left, 0);
}

TEST(SyncLoad, MutexKeepsItsOwnersApartAtEveryDepth) {
    const size_t rounds = Load(20000);
    const Handle mutex = Mutex();
    size_t guarded = 0;  // guarded by mutex
    OnThreads(kThreads, [&](size_t thread) {
        std::mt19937 random = testkit::Random(static_cast<uint32_t>(400 + thread));
        for (size_t i = 0; i < rounds; ++i) {
            const uint32_t depth = 1 + Below(random, 3);
            for (uint32_t d = 0; d < depth; ++d)
                WaitForSingleObject(mutex, INFINITE);
            ++guarded;
            for (uint32_t d = 0; d < depth; ++d)
                EXPECT_EQ(ReleaseMutex(mutex), 1);
        }
    });
    EXPECT_EQ(guarded, rounds * kThreads);
}

// Two threads hand a turn to and fro: one lost wake-up and both sleep for ever.
TEST(SyncLoad, TurnsHandedToAndFroAreNeverLost) {
    const size_t turns = Load(50000);
    const Handle ping = AutoResetEvent();
    const Handle pong = AutoResetEvent();
    OnThreads(2, [&](size_t thread) {
        const HANDLE mine = thread == 0 ? ping : pong;
        const HANDLE other = thread == 0 ? pong : ping;
        if (thread == 0) SetEvent(mine);
        for (size_t i = 0; i < turns; ++i) {
            ASSERT_EQ(WaitForSingleObject(mine, INFINITE), WAIT_OBJECT_0);
            ASSERT_EQ(SetEvent(other), 1);
        }
    });
}

TEST(SyncLoad, AbandonedWaitsUnderLoadEndAndTakeNothing) {
    const size_t rounds = Load(200);
    const Handle mutex = Mutex();
    ASSERT_EQ(WaitForSingleObject(mutex, 0), WAIT_OBJECT_0);
    const Handle event = AutoResetEvent();
    const Handle semaphore = Semaphore(1);
    std::atomic<int> late{0};
    std::atomic<int> failed{0};
    OnThreads(kThreads, [&](size_t thread) {
        const HANDLE handles[] = {semaphore, thread % 2 == 0 ? HANDLE(event) : HANDLE(mutex)};
        for (size_t i = 0; i < rounds; ++i) {
            DWORD result = WAIT_OBJECT_0;
            const double taken = sync_kit::Milliseconds(
                [&] { result = WaitForMultipleObjects(2, handles, TRUE, 3); });
            if (taken > 10000.0) ++late;
            EXPECT_NE(result, WAIT_OBJECT_0);
            if (result == WAIT_FAILED) ++failed;
        }
    });
    EXPECT_EQ(late, 0);
    EXPECT_LE(failed, 16) << "a deadline on the full second fails; one in a million is";
    EXPECT_EQ(WaitForSingleObject(semaphore, 0), WAIT_OBJECT_0) << "its unit came back";
    EXPECT_EQ(WaitForSingleObject(semaphore, 0), WAIT_TIMEOUT);
    EXPECT_EQ(ReleaseMutex(mutex), 1);
}

// The registry of waits for any takes twenty; more threads than that come and go.
TEST(SyncLoad, RegistryOfWaitsFillsAndDrains) {
    const size_t rounds = Load(200);
    const Handle event = ManualResetEvent(true);
    std::atomic<size_t> succeeded{0};
    std::atomic<size_t> refused{0};
    OnThreads(30, [&](size_t) {
        const HANDLE handle = event;
        for (size_t i = 0; i < rounds; ++i) {
            const DWORD result = WaitForMultipleObjects(1, &handle, FALSE, INFINITE);
            ++(result == WAIT_OBJECT_0 ? succeeded : refused);
        }
    });
    EXPECT_EQ(succeeded + refused, 30 * rounds);
    EXPECT_GT(succeeded, 0u);
    const HANDLE handle = event;
    EXPECT_EQ(WaitForMultipleObjects(1, &handle, FALSE, INFINITE), 0u);
    EXPECT_EQ(CLinuxMultiWait::Signal(handle), 1) << "nobody is registered any more";
}

}  // namespace
