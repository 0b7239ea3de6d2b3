#include <gtest/gtest.h>

#include <cstring>
#include <thread>
#include <type_traits>
#include <vector>

#include "presenter/android/media_framework.h"

namespace {

using android::RefBase;
using android::sp;

struct Events {
    int first = 0;
    int lastStrong = 0;
    const void* lastStrongId = nullptr;
    uint32_t attemptFlags = 0;
    int lastWeak = 0;
    int destroyed = 0;
};

class Probe : public RefBase {
  public:
    explicit Probe(Events* events) : m_events(events) {}
    ~Probe() override { ++m_events->destroyed; }

  protected:
    void onFirstRef() override { ++m_events->first; }
    void onLastStrongRef(const void* id) override {
        ++m_events->lastStrong;
        m_events->lastStrongId = id;
    }
    bool onIncStrongAttempted(uint32_t flags, const void*) override {
        m_events->attemptFlags = flags;
        return true;
    }
    void onLastWeakRef(const void*) override { ++m_events->lastWeak; }

  private:
    Events* m_events;
};

const int kMe = 0;  // its address stands for a holder

TEST(RefBase, GoesWithTheLastStrongReference) {
    Events events;
    Probe* const probe = new Probe(&events);
    EXPECT_EQ(events.first, 0);
    probe->incStrong(&kMe);
    probe->incStrong(&kMe);
    EXPECT_EQ(events.first, 1);
    EXPECT_EQ(probe->getStrongCount(), 2);
    probe->decStrong(&kMe);
    EXPECT_EQ(events.destroyed, 0);
    EXPECT_EQ(probe->getStrongCount(), 1);
    probe->decStrong(&kMe);
    EXPECT_EQ(events.destroyed, 1);
    EXPECT_EQ(events.lastStrong, 1);
    EXPECT_EQ(events.lastStrongId, &kMe);
}

TEST(RefBase, UncountedObjectCanLiveOnTheStack) {
    Events events;
    { Probe probe(&events); }
    EXPECT_EQ(events.destroyed, 1);
    EXPECT_EQ(events.first, 0);
    EXPECT_EQ(events.lastStrong, 0);
}

TEST(RefBase, StrongCountBeforeTheFirstReferenceIsLarge) {
    Events events;
    Probe probe(&events);
    EXPECT_EQ(probe.getStrongCount(), 1 << 28);
    EXPECT_EQ(probe.getWeakRefs()->getWeakCount(), 0);
}

TEST(RefBase, WeakReferenceKeepsTheCountersNotTheObject) {
    Events events;
    Probe* const probe = new Probe(&events);
    probe->incStrong(&kMe);
    RefBase::weakref_type* const weak = probe->createWeak(&kMe);
    EXPECT_EQ(weak->refBase(), probe);
    EXPECT_EQ(weak, probe->getWeakRefs());
    EXPECT_EQ(weak->getWeakCount(), 2);
    probe->decStrong(&kMe);
    EXPECT_EQ(events.destroyed, 1);
    EXPECT_EQ(weak->getWeakCount(), 1);
    EXPECT_FALSE(weak->attemptIncStrong(&kMe));
    EXPECT_EQ(weak->getWeakCount(), 1) << "a failed attempt leaves no reference";
    weak->decWeak(&kMe);
}

TEST(RefBase, WeakReferenceBecomesStrongWhileTheObjectLives) {
    Events events;
    Probe* const probe = new Probe(&events);
    probe->incStrong(&kMe);
    RefBase::weakref_type* const weak = probe->createWeak(&kMe);
    ASSERT_TRUE(weak->attemptIncStrong(&kMe));
    EXPECT_EQ(probe->getStrongCount(), 2);
    EXPECT_EQ(events.first, 1);
    probe->decStrong(&kMe);
    probe->decStrong(&kMe);
    EXPECT_EQ(events.destroyed, 1);
    weak->decWeak(&kMe);
}

TEST(RefBase, FirstStrongReferenceThroughAWeakOneIsAnnounced) {
    Events events;
    Probe* const probe = new Probe(&events);
    RefBase::weakref_type* const weak = probe->createWeak(&kMe);
    ASSERT_TRUE(weak->attemptIncStrong(&kMe));
    EXPECT_EQ(events.first, 1);
    EXPECT_EQ(probe->getStrongCount(), 1);
    weak->decWeak(&kMe);
    probe->decStrong(&kMe);
    EXPECT_EQ(events.destroyed, 1);
}

TEST(RefBase, ObjectThatWasNeverStrongGoesWithTheLastWeakReference) {
    Events events;
    Probe* const probe = new Probe(&events);
    RefBase::weakref_type* const weak = probe->createWeak(&kMe);
    weak->incWeak(&kMe);
    weak->decWeak(&kMe);
    EXPECT_EQ(events.destroyed, 0);
    weak->decWeak(&kMe);
    EXPECT_EQ(events.destroyed, 1);
}

TEST(RefBase, VtableHasTwoDestructorsThenTheFourHooks) {
    Events events;
    Probe probe(&events);
    void* const* slots = nullptr;
    std::memcpy(&slots, static_cast<const void*>(&probe), sizeof slots);
    const auto at = [slots](int i, auto** function) {
        *function = reinterpret_cast<std::decay_t<decltype(*function)>>(slots[i]);
    };
    void (*onFirst)(RefBase*);
    at(2, &onFirst);
    onFirst(&probe);
    EXPECT_EQ(events.first, 1);
    void (*onLast)(RefBase*, const void*);
    at(3, &onLast);
    onLast(&probe, &kMe);
    EXPECT_EQ(events.lastStrong, 1);
    EXPECT_EQ(events.lastStrongId, &kMe);
    bool (*onAttempt)(RefBase*, uint32_t, const void*);
    at(4, &onAttempt);
    EXPECT_TRUE(onAttempt(&probe, 7, &kMe));
    EXPECT_EQ(events.attemptFlags, 7u);
    at(5, &onLast);
    onLast(&probe, &kMe);
    EXPECT_EQ(events.lastWeak, 1);
}

TEST(RefBase, HooksOfTheBaseAllowTheFirstStrongReferenceOnly) {
    struct Plain : RefBase {
        using RefBase::onFirstRef;
        using RefBase::onIncStrongAttempted;
        using RefBase::onLastStrongRef;
        using RefBase::onLastWeakRef;
    };
    Plain plain;
    plain.onFirstRef();
    plain.onLastStrongRef(&kMe);
    plain.onLastWeakRef(&kMe);
    EXPECT_TRUE(plain.onIncStrongAttempted(1, &kMe));
    EXPECT_FALSE(plain.onIncStrongAttempted(0, &kMe));
    EXPECT_EQ(plain.getStrongCount(), 1 << 28);
}

TEST(RefBase, ThreadsCountTogether) {
    Events events;
    sp<Probe> probe = new Probe(&events);
    RefBase::weakref_type* const weak = probe->createWeak(&kMe);
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([&probe, weak] {
            for (int n = 0; n < 2000; ++n) {
                const sp<Probe> mine = probe;
                if (weak->attemptIncStrong(&kMe)) mine->decStrong(&kMe);
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(probe->getStrongCount(), 1);
    EXPECT_EQ(weak->getWeakCount(), 2);
    probe = nullptr;
    EXPECT_EQ(events.destroyed, 1);
    weak->decWeak(&kMe);
}

TEST(RefBase, AttemptsRaceWithTheEnd) {
    for (int round = 0; round < 200; ++round) {
        Events events;
        Probe* const probe = new Probe(&events);
        probe->incStrong(&kMe);
        RefBase::weakref_type* const weak = probe->createWeak(&kMe);
        std::thread other([weak] {
            if (weak->attemptIncStrong(&kMe)) weak->refBase()->decStrong(&kMe);
        });
        probe->decStrong(&kMe);
        other.join();
        EXPECT_EQ(events.destroyed, 1);
        weak->decWeak(&kMe);
    }
}

TEST(StrongPointer, CopiesCountAndAssignmentsMove) {
    Events one;
    Events two;
    {
        sp<Probe> a = new Probe(&one);
        sp<Probe> b = a;
        EXPECT_EQ(a->getStrongCount(), 2);
        const sp<Probe>& same = a;
        a = same;
        EXPECT_EQ(a->getStrongCount(), 2);
        a = new Probe(&two);
        EXPECT_EQ(b->getStrongCount(), 1);
        EXPECT_EQ((*a).getStrongCount(), 1);
        b = a;
        EXPECT_EQ(one.destroyed, 1);
        EXPECT_EQ(a.get(), b.get());
    }
    EXPECT_EQ(two.destroyed, 1);
    EXPECT_EQ(two.first, 1);
}

TEST(StrongPointer, NullIsHeldLikeAnyOther) {
    sp<Probe> null;
    EXPECT_EQ(null.get(), nullptr);
    sp<Probe> copy = null;
    copy = nullptr;
    null = copy;
    EXPECT_EQ(null.get(), nullptr);
    EXPECT_EQ(sizeof null, sizeof(void*));
}

}  // namespace
