// Thread objects: starting, ending, waiting, priorities.

#include "vidshow/platform/thread.h"

#include <errno.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <new>

#include "platform/handles.h"
#include "platform/mutex_lock.h"
#include "platform/thread_message.h"
#include "platform/thread_setup.h"
#include "platform/thread_signals.h"
#include "vidshow/platform/misc.h"
#include "vidshow/platform/queue.h"

using vidshow::MutexLock;
using vidshow::ThreadLife;

namespace {

constexpr unsigned long kFailed = static_cast<unsigned long>(-1);
constexpr useconds_t kStartPollMicroseconds = 10;
constexpr useconds_t kExitPollMicroseconds = 1000;

void* RunThread(void* argument) {
    auto* life = static_cast<ThreadLife*>(argument);
    const bool adopted = vidshow::AdoptLife(life);
    vidshow::StoreExitCode(life, STILL_ACTIVE);
    life->started = true;
    if (life->suspendOnCreate) vidshow::SuspendSelf();
    const unsigned int result = life->function(life->argument);
    vidshow::RefuseSuspends();
    vidshow::StoreExitCode(life, static_cast<int>(result));
    if (!adopted) vidshow::ReleaseLife(life);
    return nullptr;
}

// The new thread holds the life too, from before it exists.
int StartThread(ThreadLife* life, pthread_t* thread) {
    vidshow::HoldLife(life);
    const int error = pthread_create(thread, nullptr, RunThread, life);
    if (error != 0) vidshow::ReleaseLife(life);
    return error;
}

}  // namespace

// The base's second flag: true from the moment that somebody joins the thread, guarded by m_lock.

CLinuxThread::CLinuxThread()
    : m_thread(0), m_queue(nullptr), m_life(nullptr), m_exitCode(0), m_suspendOnCreate(false) {}

CLinuxThread::~CLinuxThread() {
    vidshow::EndLife(m_life);
    delete m_queue;
}

// Makes the queue, then lets others find the object.
bool CLinuxThread::Prepare() {
    vidshow::EndLife(m_life);
    delete m_queue;
    m_life = nullptr;
    m_queue = new (std::nothrow)
        CLNrwqueue(vidshow::kMessageSlots, static_cast<DWORD>(sizeof(vidshow::ThreadMessage)));
    if (m_queue != nullptr) m_life = vidshow::BeginLife(this, m_queue);
    return m_life != nullptr;
}

unsigned long CLinuxThread::Init(unsigned int (*function)(void*), void* argument, int) {
    if (!Prepare()) return kFailed;
    if (function == nullptr) {
        m_thread = pthread_self();
        return static_cast<unsigned long>(m_thread);
    }
    if (vidshow::SetUpThreads() != 0) {
        std::fputs("Unable to run thread-specific-data initialization.\n", stderr);
        return kFailed;
    }
    m_life->function = function;
    m_life->argument = argument;
    m_life->suspendOnCreate = m_suspendOnCreate;
    m_life->suspended = m_suspendOnCreate;
    // In the creating thread, so that its current thread is the new one: clients rely on it.
    if (!vidshow::RecordCurrentThread(*m_life)) {
        std::fputs("Unable to save thread handle.\n", stderr);
    }
    pthread_t thread{};
    if (StartThread(m_life, &thread) != 0) return kFailed;
    m_thread = thread;
    m_flag = false;
    while (!m_life->started)
        usleep(kStartPollMicroseconds);
    return static_cast<unsigned long>(thread);
}

void CLinuxThread::EnableSuspendOnCreate(bool enable) {
    m_suspendOnCreate = enable;
}

CLinuxThread* CLinuxThread::GetCurrentThread() {
    const uintptr_t recorded = vidshow::RecordedThread();
    return recorded != 0 ? vidshow::LivingThreads().Find(recorded) : nullptr;
}

int CLinuxThread::SetPriority(int priority) {
    const pthread_t thread = m_thread;
    if (thread == 0) return -1;
    sched_param parameters = {};
    parameters.sched_priority = std::clamp(priority, 0, 99);
    return pthread_setschedparam(thread, priority > 0 ? SCHED_FIFO : SCHED_OTHER, &parameters);
}

int CLinuxThread::GetPriority() {
    const pthread_t thread = m_thread;
    if (thread == 0) return -1;
    int policy = 0;
    sched_param parameters = {};
    return pthread_getschedparam(thread, &policy, &parameters) == 0 ? parameters.sched_priority
                                                                    : -1;
}

int CLinuxThread::Cancel() {
    return 0;
}

void CLinuxThread::Exit(unsigned int code) {
    vidshow::RefuseSuspends();
    pthread_exit(reinterpret_cast<void*>(static_cast<uintptr_t>(code)));
}

void CLinuxThread::SetExitCode(int code) {
    m_exitCode = code;
}

int CLinuxThread::GetExitCode() {
    return m_exitCode;
}

// A thread can be joined once; the system need not notice a second attempt, so it is noticed here.
int CLinuxThread::WaitForExit() {
    {
        MutexLock lock(&m_lock);
        if (m_flag || m_thread == 0) return ESRCH;
        m_flag = true;
    }
    const int error = pthread_join(m_thread, nullptr);
    MutexLock lock(&m_lock);
    if (error == 0) {
        m_thread = 0;
    } else {
        m_flag = false;
    }
    return error;
}

const char* CLinuxThread::getType() const {
    return vidshow::kObjectType;
}

int CLinuxThread::WaitAction() {
    return WaitForExit();
}

// The end wraps with the clock and is compared as a plain number: clients rely on a wait across the
// wrap ending early.
DWORD CLinuxThread::WaitForSignal(DWORD ms) {
    if (ms == INFINITE) return WaitAction() == 0 ? WAIT_OBJECT_0 : WAIT_FAILED;
    const DWORD end = timeGetTime() + ms;
    do {
        if (GetExitCode() != static_cast<int>(STILL_ACTIVE)) return WAIT_OBJECT_0;
        usleep(kExitPollMicroseconds);
    } while (timeGetTime() < end);
    return WAIT_TIMEOUT;
}
