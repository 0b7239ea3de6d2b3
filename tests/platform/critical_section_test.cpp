#include <gtest/gtest.h>

#include <thread>

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

}  // namespace
