// Waits for several objects.
//
// For any, a wait looks at its objects every 10 ms; a record of it stands in a registry of 20
// places meanwhile. For all, it takes the objects one by one and gives them back when one is
// missing, so that it never sleeps with something in its hands: two such waits over the same
// objects in different orders cannot block each other.

#include <unistd.h>

#include <algorithm>

#include "platform/handles.h"
#include "platform/mutex_lock.h"
#include "vidshow/platform/misc.h"

using vidshow::MutexLock;
using vidshow::ObjectOf;

namespace {

constexpr useconds_t kPollMicroseconds = 10000;

bool TakeNow(HANDLE handle) {
    return ObjectOf(handle)->WaitForSignal(0) == WAIT_OBJECT_0;
}

// With `held` taken, takes the others. @return `count` with all taken; else the index of an object
// that is missing, with all given back
DWORD TakeOthers(DWORD count, const HANDLE* handles, DWORD held) {
    for (DWORD i = 0; i < count; ++i) {
        if (i == held || TakeNow(handles[i])) continue;
        for (DWORD taken = 0; taken < i; ++taken) {
            if (taken != held) ObjectOf(handles[taken])->Release();
        }
        ObjectOf(handles[held])->Release();
        return i;
    }
    return count;
}

DWORD WaitForAll(DWORD count, const HANDLE* handles, DWORD ms) {
    if (count == 0) return WAIT_FAILED;
    for (DWORD blockOn = 0;;) {
        const DWORD start = ms != INFINITE ? timeGetTime() : 0;
        const DWORD result = ObjectOf(handles[blockOn])->WaitForSignal(ms);
        if (result != WAIT_OBJECT_0) return result;
        blockOn = TakeOthers(count, handles, blockOn);
        if (blockOn == count) return WAIT_OBJECT_0;
        if (ms == INFINITE) continue;
        const DWORD elapsed = timeGetTime() - start;
        if (ms <= elapsed) return WAIT_TIMEOUT;
        ms -= elapsed;
    }
}

// Running out of time is a failure here: clients rely on telling it so from the index 258.
DWORD WaitForAny(DWORD count, const HANDLE* handles, DWORD ms) {
    CLinuxMultiWait wait(count, handles);
    if (wait.Init() != 0 || wait.WaitForSignal(ms) != WAIT_OBJECT_0) return WAIT_FAILED;
    return WAIT_OBJECT_0 + wait.GetSignaledIndex();
}

}  // namespace

pthread_mutex_t CLinuxMultiWait::m_mutex = PTHREAD_MUTEX_INITIALIZER;
std::atomic<uint32_t> CLinuxMultiWait::m_waitcount{0};
CLinuxMultiWait* CLinuxMultiWait::m_waiters[kMaxWaiters];

CLinuxMultiWait::CLinuxMultiWait(DWORD count, const HANDLE* handles)
    : m_count(count), m_handles(handles), m_index(0) {}

CLinuxMultiWait::~CLinuxMultiWait() {
    MutexLock lock(&m_mutex);
    CLinuxMultiWait::WaitAction();
}

int CLinuxMultiWait::Init() {
    MutexLock lock(&m_mutex);
    if (lock.error() != 0) return lock.error();
    CLinuxMultiWait** end = m_waiters + kMaxWaiters;
    CLinuxMultiWait** place = std::find(m_waiters, end, nullptr);
    if (place == end) return -1;
    *place = this;
    ++m_waitcount;
    return 0;
}

DWORD CLinuxMultiWait::GetSignaledIndex() const {
    return m_index;
}

int CLinuxMultiWait::Signal(HANDLE object) {
    if (m_waitcount == 0) return 1;
    MutexLock lock(&m_mutex);
    if (lock.error() != 0) return lock.error();
    int result = 2;
    for (CLinuxMultiWait* waiter : m_waiters) {
        if (waiter == nullptr) continue;
        const HANDLE* end = waiter->m_handles + waiter->m_count;
        if (std::find(waiter->m_handles, end, object) == end) continue;
        waiter->SetSignaled(true, true);
        result = 0;
    }
    return result;
}

const char* CLinuxMultiWait::getType() const {
    return vidshow::kObjectType;
}

int CLinuxMultiWait::WaitAction() {
    CLinuxMultiWait** end = m_waiters + kMaxWaiters;
    CLinuxMultiWait** place = std::find(m_waiters, end, this);
    if (place == end) return -1;
    *place = nullptr;
    --m_waitcount;
    return 0;
}

// The deadline wraps and is compared as a plain number, and nothing is looked at once it is
// reached: clients rely on a wait of 0 ms taking nothing.
DWORD CLinuxMultiWait::WaitForSignal(DWORD ms) {
    const DWORD deadline = timeGetTime() + ms;
    while (ms == INFINITE || timeGetTime() < deadline) {
        if (CLinuxMultiWait::isSignaled()) return WAIT_OBJECT_0;
        usleep(kPollMicroseconds);
    }
    return WAIT_FAILED;
}

bool CLinuxMultiWait::isSignaled() {
    for (DWORD i = 0; i < m_count; ++i) {
        if (m_handles[i] == nullptr || !TakeNow(m_handles[i])) continue;
        m_index = i;
        return true;
    }
    return false;
}

DWORD CLinuxSyncObject::WaitForMultipleObjects(DWORD count, const HANDLE* handles, BOOL all,
                                               DWORD ms) {
    return all != 0 ? WaitForAll(count, handles, ms) : WaitForAny(count, handles, ms);
}

extern "C" DWORD WaitForMultipleObjects(DWORD count, const HANDLE* handles, BOOL all, DWORD ms) {
    return CLinuxSyncObject::WaitForMultipleObjects(count, handles, all, ms);
}
