#include <gtest/gtest.h>

#include <thread>
#include <type_traits>

#include "vidshow/platform/sync.h"

namespace {

bool AnotherThreadCanEnter(CRITICAL_SECTION* cs) {
    bool entered = false;
    std::thread([&] {
        entered = TryEnterCriticalSection(cs) == 1;
        if (entered) LeaveCriticalSection(cs);
    }).join();
    return entered;
}

TEST(CriticalSection, OwnerEntersAgainAndLeavesAsOften) {
    CRITICAL_SECTION cs;
    InitializeCriticalSection(&cs);
    EnterCriticalSection(&cs);
    EXPECT_EQ(TryEnterCriticalSection(&cs), 1);
    EXPECT_FALSE(AnotherThreadCanEnter(&cs));
    LeaveCriticalSection(&cs);
    EXPECT_FALSE(AnotherThreadCanEnter(&cs)) << "entered twice, left once";
    LeaveCriticalSection(&cs);
    EXPECT_TRUE(AnotherThreadCanEnter(&cs));
    DeleteCriticalSection(&cs);
}

TEST(CriticalSection, KeepsMutexThenAttribute) {
    EXPECT_EQ(offsetof(CRITICAL_SECTION, mutex), 0u);
    EXPECT_GE(offsetof(CRITICAL_SECTION, attribute), sizeof(pthread_mutex_t));
    CRITICAL_SECTION cs;
    InitializeCriticalSection(&cs);
    int type = -1;
    EXPECT_EQ(pthread_mutexattr_gettype(&cs.attribute, &type), 0);
    EXPECT_EQ(type, PTHREAD_MUTEX_RECURSIVE);
    DeleteCriticalSection(&cs);
}

TEST(CriticalSection, TryEnterByTheOwnerNeedsOneMoreLeave) {
    CRITICAL_SECTION cs;
    InitializeCriticalSection(&cs);
    EXPECT_EQ(TryEnterCriticalSection(&cs), 1);
    EXPECT_EQ(TryEnterCriticalSection(&cs), 1);
    LeaveCriticalSection(&cs);
    EXPECT_FALSE(AnotherThreadCanEnter(&cs));
    LeaveCriticalSection(&cs);
    EXPECT_TRUE(AnotherThreadCanEnter(&cs));
    DeleteCriticalSection(&cs);
}

TEST(CriticalSection, EnterWaitsUntilTheOwnerLeaves) {
    CRITICAL_SECTION cs;
    InitializeCriticalSection(&cs);
    EnterCriticalSection(&cs);
    bool left = false;  // guarded by cs
    std::thread other([&] {
        EnterCriticalSection(&cs);
        EXPECT_TRUE(left);
        LeaveCriticalSection(&cs);
    });
    left = true;
    LeaveCriticalSection(&cs);
    other.join();
    DeleteCriticalSection(&cs);
}

TEST(CriticalSection, OwningClassIsAVirtualDestructorAndASection) {
    EXPECT_TRUE(std::has_virtual_destructor<CCRITCALSECTION>::value);
    EXPECT_EQ(sizeof(CCRITCALSECTION), sizeof(void*) + sizeof(CRITICAL_SECTION));
    CCRITCALSECTION section;
    section.Enter();
    section.Enter();
    void* behindTable = reinterpret_cast<char*>(&section) + sizeof(void*);
    auto* cs = static_cast<CRITICAL_SECTION*>(behindTable);
    EXPECT_FALSE(AnotherThreadCanEnter(cs));
    section.Leave();
    section.Leave();
    EXPECT_TRUE(AnotherThreadCanEnter(cs));
}

}  // namespace
