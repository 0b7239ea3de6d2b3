// The registry of named mutexes: up to 127 names, oldest first.
//
// Every release of a mutex asks here, so that the usual case, a process that names no mutex, is
// answered from the count alone. Otherwise a lock of the registry's own keeps threads that release
// and close different mutexes apart; nothing is called under it.

#include "platform/named_mutexes.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "platform/mutex_lock.h"

namespace vidshow {

namespace {

struct NamedMutex {
    CLinuxMutex* mutex;  // null once closed
    char* name;          // from malloc
};

constexpr size_t kMaxNames = 127;

pthread_mutex_t g_lock = PTHREAD_MUTEX_INITIALIZER;
NamedMutex g_names[kMaxNames];   // guarded by g_lock
std::atomic<size_t> g_count{0};  // filled places; changed under g_lock, also read without

size_t Count() {
    return g_count.load(std::memory_order_relaxed);
}

void SetCount(size_t count) {
    g_count.store(count, std::memory_order_relaxed);
}

char* Copy(const char* text) {
    const size_t bytes = std::strlen(text) + 1;
    char* copy = static_cast<char*>(std::malloc(bytes));
    if (copy != nullptr) std::memcpy(copy, text, bytes);
    return copy;
}

// g_lock held. @return whether there was room
bool Append(CLinuxMutex* mutex, char* name) {
    const size_t count = Count();
    if (count < kMaxNames) {
        g_names[count] = NamedMutex{mutex, name};
        SetCount(count + 1);
        return true;
    }
    for (NamedMutex& entry : g_names)
        std::free(entry.name);
    SetCount(0);
    return false;
}

// g_lock held. @return the entry; the end of the filled places without one
NamedMutex* EntryOf(const CLinuxMutex* mutex) {
    return std::find_if(g_names, g_names + Count(),
                        [=](const NamedMutex& entry) { return entry.mutex == mutex; });
}

}  // namespace

void RememberNamedMutex(CLinuxMutex* mutex, const char* name) {
    char* copy = Copy(name);
    if (copy == nullptr) return;
    MutexLock lock(&g_lock);
    const bool remembered = Append(mutex, copy);
    lock.Unlock();
    if (remembered) return;
    std::free(copy);
    std::puts("CreateMutex exceed the limit");
}

CLinuxMutex* FindNamedMutex(const char* name) {
    MutexLock lock(&g_lock);
    const NamedMutex* end = g_names + Count();
    const NamedMutex* entry = std::find_if(g_names, g_names + Count(), [=](const NamedMutex& it) {
        return it.mutex != nullptr && std::strcmp(it.name, name) == 0;
    });
    return entry != end ? entry->mutex : nullptr;
}

void ForgetNamedMutex(const CLinuxMutex* mutex) {
    if (Count() == 0) return;
    MutexLock lock(&g_lock);
    NamedMutex* end = g_names + Count();
    NamedMutex* entry = EntryOf(mutex);
    if (entry == end) return;
    std::free(entry->name);
    std::copy(entry + 1, end, entry);
    SetCount(Count() - 1);
}

void ForgetHandleOfNamedMutex(const CLinuxMutex* mutex) {
    if (Count() == 0) return;
    MutexLock lock(&g_lock);
    NamedMutex* entry = EntryOf(mutex);
    if (entry != g_names + Count()) entry->mutex = nullptr;
}

}  // namespace vidshow
