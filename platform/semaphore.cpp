// Semaphores: a POSIX semaphore holds the units; the signalled flag says whether there are any.
//
// Units change only under the state lock, so the two agree whenever the lock is free. The maximum
// that a client names is not enforced: clients rely on releasing more.

#include <new>

#include "platform/handles.h"
#include "platform/mutex_lock.h"

using vidshow::HandleOf;
using vidshow::IsInvalid;
using vidshow::MutexLock;
using vidshow::ObjectOf;

// The base's second flag: true when the POSIX semaphore exists.

CLinuxSemaphore::CLinuxSemaphore() = default;

CLinuxSemaphore::~CLinuxSemaphore() {
    if (m_flag) sem_destroy(&m_semaphore);
}

int CLinuxSemaphore::Init(LONG initial, LONG) {
    const int error = sem_init(&m_semaphore, 0, static_cast<unsigned int>(initial));
    if (error != 0) return error;
    m_flag = true;
    return SetSignaled(initial > 0, true);
}

int CLinuxSemaphore::Release(LONG count, LONG* previous) {
    MutexLock lock(&m_lock);
    if (lock.error() != 0) return lock.error();
    if (previous != nullptr) {
        int units = 0;
        sem_getvalue(&m_semaphore, &units);
        *previous = units;
    }
    LONG posted = 0;
    int error = 0;
    while (posted < count && (error = sem_post(&m_semaphore)) == 0)
        ++posted;
    if (posted == 0) return error;
    SetSignaled(true, false);
    return lock.Unlock();
}

const char* CLinuxSemaphore::getType() const {
    return vidshow::kObjectType;
}

int CLinuxSemaphore::WaitAction() {
    if (sem_trywait(&m_semaphore) != 0) return -1;
    int left = 0;
    sem_getvalue(&m_semaphore, &left);
    if (left == 0) m_signaled = false;
    return 0;
}

int CLinuxSemaphore::Release() {
    return Release(1, nullptr);
}

extern "C" {

HANDLE CreateSemaphore(void*, LONG initial, LONG maximum, const char*) {
    auto* semaphore = new (std::nothrow) CLinuxSemaphore;
    if (semaphore != nullptr && semaphore->Init(initial, maximum) != 0) {
        delete semaphore;
        semaphore = nullptr;
    }
    return HandleOf(semaphore);
}

BOOL ReleaseSemaphore(HANDLE semaphore, LONG count, LONG* previous) {
    return !IsInvalid(semaphore) &&
           ObjectOf<CLinuxSemaphore>(semaphore)->Release(count, previous) == 0;
}

}  // extern "C"
