// Which locks are taken and destroyed, and in what order, by critical sections and counters.

#include <gtest/gtest.h>

#include <memory>
#include <vector>

#include "platform/posix_hooks.h"
#include "vidshow/platform/misc.h"
#include "vidshow/platform/sync.h"

namespace {

using posix_hooks::Replacement;

std::vector<const void*> g_seen;

int RecordLock(pthread_mutex_t* mutex) {
    g_seen.push_back(mutex);
    return posix_hooks::mutexLock.Real(mutex);
}

int RecordMutexDestroy(pthread_mutex_t* mutex) {
    g_seen.push_back(mutex);
    return posix_hooks::mutexDestroy.Real(mutex);
}

int RecordAttributeDestroy(pthread_mutexattr_t* attribute) {
    g_seen.push_back(attribute);
    return posix_hooks::mutexAttributeDestroy.Real(attribute);
}

TEST(HookedLocks, SectionDestroysMutexThenAttribute) {
    CRITICAL_SECTION cs;
    g_seen.clear();
    Replacement<int(pthread_mutex_t*)> mutex(posix_hooks::mutexDestroy, RecordMutexDestroy);
    Replacement<int(pthread_mutexattr_t*)> attribute(posix_hooks::mutexAttributeDestroy,
                                                     RecordAttributeDestroy);
    InitializeCriticalSection(&cs);
    EXPECT_TRUE(g_seen.empty()) << "the attribute lives as long as the mutex";
    DeleteCriticalSection(&cs);
    EXPECT_EQ(g_seen, (std::vector<const void*>{&cs.mutex, &cs.attribute}));
}

TEST(HookedLocks, DeletingAnOwnerDeletesItsSection) {
    auto owner = std::make_unique<CCRITCALSECTION>();
    const char* section = reinterpret_cast<const char*>(owner.get()) + sizeof(void*);
    g_seen.clear();
    Replacement<int(pthread_mutex_t*)> mutex(posix_hooks::mutexDestroy, RecordMutexDestroy);
    Replacement<int(pthread_mutexattr_t*)> attribute(posix_hooks::mutexAttributeDestroy,
                                                     RecordAttributeDestroy);
    owner.reset();
    EXPECT_EQ(g_seen,
              (std::vector<const void*>{section, section + offsetof(CRITICAL_SECTION, attribute)}));
}

TEST(HookedLocks, CountersShareOneLock) {
    LONG a = 0;
    LONG b = 0;
    {
        g_seen.clear();
        Replacement<int(pthread_mutex_t*)> lock(posix_hooks::mutexLock, RecordLock);
        InterlockedIncrement(&a);
        InterlockedDecrement(&b);
    }
    ASSERT_EQ(g_seen.size(), 2u);
    EXPECT_EQ(g_seen[0], g_seen[1]);
}

TEST(HookedLocks, ExchangesTakeNoLock) {
    LONG value = 1;
    {
        g_seen.clear();
        Replacement<int(pthread_mutex_t*)> lock(posix_hooks::mutexLock, RecordLock);
        InterlockedExchange(&value, 2);
        InterlockedExchangeAdd(&value, 3);
    }
    EXPECT_TRUE(g_seen.empty());
    EXPECT_EQ(value, 5);
}

}  // namespace
