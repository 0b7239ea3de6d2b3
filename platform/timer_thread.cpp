// The timer thread: sleeps until the first timer is due, posts its message, puts it back in its new
// place. Nothing ticks in between.
//
// Whether a timer is due is decided in whole milliseconds, as timeGetTime counts them, but not
// modulo 2^32: where that clock wraps, timers go on.

#include <errno.h>

#include <algorithm>

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

int64_t Milliseconds(const CLinuxTimeVal& moment) {
    return int64_t{moment.sec} * 1000 + moment.nsec / 1000000;
}

int64_t NowInMilliseconds() {
    CLinuxTimeVal now;
    now.Now();
    return Milliseconds(now);
}

void NoteDelay(int64_t delay) {
    if (delay <= int64_t{__atomic_load_n(&TR_max_expire_delay, __ATOMIC_RELAXED)}) return;
    __atomic_store_n(&TR_max_expire_delay, static_cast<DWORD>(delay), __ATOMIC_RELAXED);
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
    return timer == m_head && Milliseconds(timer->m_expiry) == Milliseconds(m_current);
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
    if (Milliseconds(timer->m_expiry) <= NowInMilliseconds()) return kGoOn;
    *due = false;
    m_current = timer->m_expiry;
    while (IsNext(timer)) {
        timespec expiry = {};
        expiry.tv_sec = timer->m_expiry.sec;  // each time: it may have been added anew
        expiry.tv_nsec = timer->m_expiry.nsec;
        const int result = m_quit ? 0 : pthread_cond_timedwait(&m_condition, &m_mutex, &expiry);
        if (m_quit) return result;
        if (result == ETIMEDOUT) {
            *due = IsNext(timer) && Milliseconds(timer->m_expiry) <= NowInMilliseconds();
            return kGoOn;
        }
        if (result != 0 && result != EINTR) return kBadWait;
    }
    return kGoOn;
}

// The post is made with m_mutex held. Periods that have passed meanwhile are left out.
int CLinuxTimerMgr::PostAndAdvance(CLinuxTimer* timer) {
    PostThreadMessage(timer->m_owner, WM_TIMER, timer->m_sequence, reinterpret_cast<LPARAM>(timer));
    const int64_t delay = NowInMilliseconds() - Milliseconds(timer->m_expiry);
    NoteDelay(delay);
    const int64_t period = std::max<int64_t>(timer->m_period, 1);  // 0: never initialised
    const int64_t passed = std::max<int64_t>(delay, 0) / period;
    timer->m_expiry.Add(static_cast<uint64_t>((passed + 1) * period));
    return addToAlarmList(timer) == 0 ? kGoOn : kNotListed;
}
