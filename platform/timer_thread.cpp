// The timer thread: sleeps until the first timer is due, posts its message, puts it back in its new
// place. Nothing ticks in between.
//
// Whether a timer is due is decided in milliseconds modulo 2^32, compared as plain numbers: clients
// rely on timers and timeGetTime agreeing to the millisecond.

#include <errno.h>

#include "platform/mutex_lock.h"
#include "vidshow/platform/thread.h"
#include "vidshow/platform/timer.h"

using vidshow::MutexLock;

DWORD TR_max_expire_delay;

namespace {

// How the timer thread ends, besides by an error of a wait.
constexpr int kGoOn = -1;
constexpr int kNoLock = 1;
constexpr int kBadWait = 2;
constexpr int kNotListed = 3;

DWORD NowInMilliseconds() {
    CLinuxTimeVal now;
    now.Now();
    return now;
}

void NoteDelay(DWORD delay) {
    if (static_cast<int32_t>(delay) <= 0) return;
    if (delay <= __atomic_load_n(&TR_max_expire_delay, __ATOMIC_RELAXED)) return;
    __atomic_store_n(&TR_max_expire_delay, delay, __ATOMIC_RELAXED);
}

}  // namespace

unsigned int CLinuxTimerMgr::ThreadFn(void* manager) {
    if (manager == nullptr) return static_cast<unsigned int>(-1);
    return static_cast<unsigned int>(static_cast<CLinuxTimerMgr*>(manager)->Thread());
}

int CLinuxTimerMgr::Thread() {
    MutexLock lock(&m_mutex);
    if (lock.error() != 0) return kNoLock;
    int end = kGoOn;
    while (end == kGoOn) {
        end = WaitForTimers();
        if (end != kGoOn) break;
        CLinuxTimer* timer = m_head;
        bool due = true;
        end = WaitUntilDue(timer, &due);
        if (end == kGoOn && due) end = PostAndAdvance(timer);
    }
    pthread_cond_signal(&m_condition);
    return end;
}

// Whether `timer`, which may be gone, is still the one that the thread waits for.
bool CLinuxTimerMgr::IsNext(const CLinuxTimer* timer) const {
    return timer == m_head && DWORD{timer->m_expiry} == DWORD{m_current};
}

// Returns when there is a timer. m_mutex held, let go of while waiting.
// @return kGoOn; else how the thread ends
int CLinuxTimerMgr::WaitForTimers() {
    m_current = CLinuxTimeVal();
    int result = 0;
    while (m_head == nullptr && !m_quit && result == 0)
        result = pthread_cond_wait(&m_condition, &m_mutex);
    return m_quit || result != 0 ? result : kGoOn;
}

// Sleeps until the timer is due, or something else comes first. m_mutex as above.
// @param due receives whether it is
// @return kGoOn; else how the thread ends
int CLinuxTimerMgr::WaitUntilDue(const CLinuxTimer* timer, bool* due) {
    if (DWORD{timer->m_expiry} <= NowInMilliseconds()) return kGoOn;
    *due = false;
    m_current = timer->m_expiry;
    while (IsNext(timer)) {
        timespec expiry = {};
        expiry.tv_sec = timer->m_expiry.sec;  // each time: it may have been added anew
        expiry.tv_nsec = timer->m_expiry.nsec;
        const int result = m_quit ? 0 : pthread_cond_timedwait(&m_condition, &m_mutex, &expiry);
        if (m_quit) return result;
        if (result == ETIMEDOUT) {
            *due = IsNext(timer) && DWORD{timer->m_expiry} <= NowInMilliseconds();
            return kGoOn;
        }
        if (result != 0 && result != EINTR) return kBadWait;
    }
    return kGoOn;
}

// The post is made with m_mutex held. Periods that have passed meanwhile are left out.
int CLinuxTimerMgr::PostAndAdvance(CLinuxTimer* timer) {
    PostThreadMessage(timer->m_owner, WM_TIMER, timer->m_sequence, reinterpret_cast<LPARAM>(timer));
    const DWORD now = NowInMilliseconds();
    NoteDelay(now - DWORD{timer->m_expiry});
    do {
        timer->m_expiry.Add(timer->m_period);
    } while (DWORD{timer->m_expiry} <= now);
    return addToAlarmList(timer) == 0 ? kGoOn : kNotListed;
}
