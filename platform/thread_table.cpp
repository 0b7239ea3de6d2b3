// The table of threads, and CreateThread, which enters them.
//
// Its places are loaded and stored whole, so that a look at it needs no lock: only changes do.
//
// The table's lock is made by whoever needs it first, and nothing guards that. Clients that compile
// the flag in rely on the order: flag first, then the lock. So the process's first CreateThread
// must not run beside another; CloseHandle needs the lock only for what CreateThread has entered.

#include "platform/thread_table.h"

#include <algorithm>
#include <cstdio>
#include <new>

#include "platform/handles.h"
#include "vidshow/platform/thread.h"

HANDLE gAllThreads[128];
CRITICAL_SECTION gCSAllThread;
uint8_t gCSInited;

namespace vidshow {

namespace {

HANDLE* EndOfTable() {
    return gAllThreads + sizeof gAllThreads / sizeof *gAllThreads;
}

// @return the first place that holds `handle`, null for a free one; the end without one
HANDLE* PlaceOf(HANDLE handle) {
    return std::find_if(gAllThreads, EndOfTable(), [=](const HANDLE& place) {
        return __atomic_load_n(&place, __ATOMIC_RELAXED) == handle;
    });
}

void Store(HANDLE* place, HANDLE handle) {
    __atomic_store_n(place, handle, __ATOMIC_RELAXED);
}

class TableLock {
  public:
    TableLock() {
        if (__atomic_load_n(&gCSInited, __ATOMIC_ACQUIRE) == 0) {
            __atomic_store_n(&gCSInited, 1, __ATOMIC_RELEASE);
            InitializeCriticalSection(&gCSAllThread);
        }
        EnterCriticalSection(&gCSAllThread);
    }
    ~TableLock() { LeaveCriticalSection(&gCSAllThread); }
    TableLock(const TableLock&) = delete;
    TableLock& operator=(const TableLock&) = delete;
};

CLinuxThread* StartThread(unsigned int (*function)(void*), void* argument, bool suspended) {
    auto* thread = new (std::nothrow) CLinuxThread;
    if (thread == nullptr) return nullptr;
    thread->EnableSuspendOnCreate(suspended);
    if (thread->Init(function, argument, 2) != static_cast<unsigned long>(-1)) return thread;
    delete thread;
    return nullptr;
}

}  // namespace

bool IsThread(HANDLE handle) {
    return !IsInvalid(handle) && PlaceOf(handle) != EndOfTable();
}

void ForgetThread(HANDLE handle) {
    if (!IsThread(handle)) return;
    const TableLock lock;
    HANDLE* place = PlaceOf(handle);
    if (place != EndOfTable()) Store(place, nullptr);
}

}  // namespace vidshow

extern "C" HANDLE CreateThread(void*, DWORD, unsigned int (*function)(void*), void* argument,
                               DWORD flags, HANDLE* id) {
    const vidshow::TableLock lock;
    HANDLE* place = vidshow::PlaceOf(nullptr);
    if (place == vidshow::EndOfTable()) {
        std::puts("thread full ");
        return INVALID_HANDLE_VALUE;
    }
    // The value and not the bit: clients rely on other flags beside it starting the thread at once.
    CLinuxThread* thread = vidshow::StartThread(function, argument, flags == CREATE_SUSPENDED);
    if (thread == nullptr) return nullptr;
    const HANDLE handle = vidshow::HandleOf(thread);
    if (id != nullptr) *id = handle;
    vidshow::Store(place, handle);
    return handle;
}
