// The base of everything that can be waited for, and the wait for one object.
//
// Locks, and in which order a thread may take them:
//   1. the inner mutex of a CLinuxMutex, which is what its owner holds for as long as it likes;
//   2. the state lock (m_lock) of any object. It guards the object's state and is held for a few
//      instructions; no second state lock is taken under it. Under it a CLinuxMutex only tries its
//      inner mutex, so that this does not turn the order round.
// The registries' locks (multi_wait.cpp, named_mutexes.cpp) are leaves, save that
// CLinuxMultiWait::Signal takes state locks of waits under the first. Threads and timers have locks
// of their own (thread_table.cpp, thread_life.cpp, timer_manager.cpp), all taken before these.
//
// Waiters of an object sleep on its condition, which is broadcast when the signalled flag goes from
// clear to set. The flag is tested and the object taken under one hold of the state lock, so that a
// wake-up cannot be lost and a take has one winner.

#include <errno.h>
#include <sched.h>
#include <sys/time.h>

#include "platform/handles.h"
#include "platform/mutex_lock.h"
#include "platform/thread_table.h"

using vidshow::IsInvalid;
using vidshow::MutexLock;
using vidshow::ObjectOf;

const char vidshow::kObjectType[1] = "";

namespace {

constexpr long kNanosecondsPerSecond = 1000000000;
constexpr unsigned kInterruptionsPerYield = 25;

// A moment `ms` from now, of the wall clock because that is the one conditions count by. A full
// second of nanoseconds is not carried: clients rely on that wait failing as it always has.
bool DeadlineAfter(DWORD ms, timespec* deadline) {
    timeval now;
    if (gettimeofday(&now, nullptr) != 0) return false;
    deadline->tv_sec = now.tv_sec + static_cast<time_t>(ms / 1000);
    deadline->tv_nsec = static_cast<long>(ms % 1000) * 1000000 + now.tv_usec * 1000L;
    if (deadline->tv_nsec > kNanosecondsPerSecond) {
        deadline->tv_sec += deadline->tv_nsec / kNanosecondsPerSecond;
        deadline->tv_nsec %= kNanosecondsPerSecond;
    }
    return true;
}

int WaitOnce(pthread_cond_t* condition, pthread_mutex_t* lock, DWORD ms, const timespec& deadline) {
    errno = 0;
    if (ms == 0) return ETIMEDOUT;
    if (ms == INFINITE) return pthread_cond_wait(condition, lock);
    return pthread_cond_timedwait(condition, lock, &deadline);
}

}  // namespace

CLinuxSyncObject::CLinuxSyncObject() : m_signaled(false), m_flag(false) {
    pthread_mutexattr_t recursive;
    pthread_mutexattr_init(&recursive);
    pthread_mutexattr_settype(&recursive, PTHREAD_MUTEX_RECURSIVE);
    pthread_mutex_init(&m_lock, &recursive);
    pthread_mutexattr_destroy(&recursive);
    pthread_cond_init(&m_condition, nullptr);
}

CLinuxSyncObject::~CLinuxSyncObject() {
    pthread_cond_destroy(&m_condition);
    pthread_mutex_destroy(&m_lock);
}

bool CLinuxSyncObject::isSignaled() {
    return m_signaled;
}

int CLinuxSyncObject::Release() {
    return 0;
}

int CLinuxSyncObject::SetSignaled(bool signaled, bool lock) {
    if (lock) {
        const int error = pthread_mutex_lock(&m_lock);
        if (error != 0) return error;
    }
    const bool rises = signaled && !m_signaled;
    m_signaled = signaled;
    const int woken = rises ? pthread_cond_broadcast(&m_condition) : 0;
    const int unlocked = lock ? pthread_mutex_unlock(&m_lock) : 0;
    return woken != 0 ? woken : unlocked;
}

DWORD CLinuxSyncObject::WaitForSignal(DWORD ms) {
    timespec deadline = {};
    if (ms != INFINITE && !DeadlineAfter(ms, &deadline)) return WAIT_FAILED;
    MutexLock lock(&m_lock);
    if (lock.error() != 0) return WAIT_FAILED;

    unsigned interruptions = 0;
    while (!isSignaled()) {
        const int result = WaitOnce(&m_condition, &m_lock, ms, deadline);
        if ((result != 0 ? result : errno) == EINTR) {
            if (++interruptions % kInterruptionsPerYield == 0) {
                lock.Unlock();
                sched_yield();
                if (lock.Relock() != 0) return WAIT_FAILED;
            }
        } else if (result != 0 && !isSignaled()) {
            return result == ETIMEDOUT ? WAIT_TIMEOUT : WAIT_FAILED;
        }
    }
    if (WaitAction() != 0) return WAIT_FAILED;
    return lock.Unlock() == 0 ? WAIT_OBJECT_0 : WAIT_FAILED;
}

extern "C" {

DWORD WaitForSingleObject(HANDLE handle, DWORD ms) {
    return IsInvalid(handle) ? WAIT_FAILED : ObjectOf(handle)->WaitForSignal(ms);
}

BOOL CloseHandle(HANDLE handle) {
    if (IsInvalid(handle)) return FALSE;
    vidshow::ForgetThread(handle);
    delete ObjectOf(handle);
    return TRUE;
}

}  // extern "C"
