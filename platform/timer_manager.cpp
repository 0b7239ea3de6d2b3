// The list of timers and what clients do with it. The timer thread is in timer_thread.cpp.

#include <new>

#include "platform/mutex_lock.h"
#include "vidshow/platform/sync.h"
#include "vidshow/platform/thread.h"
#include "vidshow/platform/timer.h"

using vidshow::MutexLock;

namespace {

bool IsEarlier(const CLinuxTimeVal& a, const CLinuxTimeVal& b) {
    return a.sec != b.sec ? a.sec < b.sec : a.nsec < b.nsec;
}

}  // namespace

CLinuxTimerMgr::CLinuxTimerMgr() : m_thread(nullptr), m_head(nullptr), m_quit(false) {
    pthread_mutex_init(&m_mutex, nullptr);
    pthread_cond_init(&m_condition, nullptr);
}

CLinuxTimerMgr::~CLinuxTimerMgr() {
    KillTimerThread();
    DeleteTimers();
    pthread_cond_destroy(&m_condition);
    pthread_mutex_destroy(&m_mutex);
}

CLinuxTimer* CLinuxTimerMgr::SetTimer(unsigned int ms, TIMERPROC) {
    auto* timer = new (std::nothrow) CLinuxTimer;
    if (timer == nullptr) return nullptr;
    if (timer->Init(ms) == 0 && AddTimer(timer) == 0) return timer;
    RemoveTimer(timer);
    delete timer;
    return nullptr;
}

int CLinuxTimerMgr::AddTimer(CLinuxTimer* timer) {
    if (timer == nullptr) return 1;
    LaunchTimerThread();
    MutexLock lock(&m_mutex);
    if (lock.error() != 0) return 1;
    const int result = addToAlarmList(timer);
    pthread_cond_signal(&m_condition);
    return result;
}

int CLinuxTimerMgr::RemoveTimer(CLinuxTimer* timer) {
    if (timer == nullptr) return 1;
    MutexLock lock(&m_mutex);
    if (lock.error() != 0) return 1;
    const int result = removeFromAlarmList(timer);
    pthread_cond_signal(&m_condition);
    return result;
}

int CLinuxTimerMgr::KillTimer(CLinuxTimer* timer) {
    if (timer == nullptr) return -1;
    if (RemoveTimer(timer) != 0) return -2;
    delete timer;
    return 0;
}

bool CLinuxTimerMgr::IsValid(const CLinuxTimer* timer, DWORD sequence) {
    MutexLock lock(&m_mutex);
    if (lock.error() != 0) return false;
    const CLinuxTimer* listed = m_head;
    while (listed != nullptr && listed != timer)
        listed = listed->m_next;
    pthread_cond_signal(&m_condition);
    return listed != nullptr && listed->IsValid(sequence);
}

// m_mutex held. @return 0; 1 when the timer thread cannot be told
int CLinuxTimerMgr::addToAlarmList(CLinuxTimer* timer) {
    if (timer == nullptr) return -1;
    removeFromAlarmList(timer);
    CLinuxTimer** link = &m_head;
    while (*link != nullptr && IsEarlier((*link)->m_expiry, timer->m_expiry))
        link = &(*link)->m_next;
    timer->m_next = *link;
    *link = timer;
    if (timer != m_head) return 0;
    m_current = timer->m_expiry;
    return pthread_cond_signal(&m_condition) != 0;
}

// m_mutex held. @return as addToAlarmList
int CLinuxTimerMgr::removeFromAlarmList(CLinuxTimer* timer) {
    if (timer == nullptr) return -1;
    const bool wasHead = timer == m_head;
    CLinuxTimer** link = &m_head;
    while (*link != nullptr && *link != timer)
        link = &(*link)->m_next;
    if (*link != nullptr) *link = timer->m_next;
    return wasHead && pthread_cond_signal(&m_condition) != 0;
}

// m_mutex held, or nobody else left.
void CLinuxTimerMgr::DeleteTimers() {
    while (m_head != nullptr) {
        CLinuxTimer* timer = m_head;
        m_head = timer->m_next;
        delete timer;
    }
}

// Under the mutex, so that two threads that set their first timers start one thread.
int CLinuxTimerMgr::LaunchTimerThread() {
    MutexLock lock(&m_mutex);
    if (m_thread != nullptr) return -1;
    m_quit = false;
    unsigned long id = 0;
    m_thread = _beginthreadex(nullptr, 0, ThreadFn, this, 0, &id);
    return 0;
}

int CLinuxTimerMgr::KillTimerThread() {
    MutexLock lock(&m_mutex);
    if (m_thread == nullptr) return -1;
    m_quit = true;
    pthread_cond_signal(&m_condition);
    lock.Unlock();
    // The thread uses this object: a join that was refused is asked for once more.
    if (WaitForSingleObject(m_thread, INFINITE) != WAIT_OBJECT_0) {
        WaitForSingleObject(m_thread, INFINITE);
    }
    CloseHandle(m_thread);
    lock.Relock();
    DeleteTimers();
    m_thread = nullptr;
    pthread_cond_signal(&m_condition);
    return 0;
}

void CLinuxTimerMgr::PrintAlarmList(const char*) const {}
