// Mutexes: an inner recursive pthread mutex is the ownership, the signalled flag says "free".

#include <errno.h>

#include <new>

#include "platform/handles.h"
#include "platform/mutex_lock.h"
#include "platform/named_mutexes.h"

using vidshow::HandleOf;
using vidshow::IsInvalidOrPseudo;
using vidshow::MutexLock;
using vidshow::ObjectOf;

namespace {

// What m_owner holds while nobody owns the mutex.
constexpr pthread_t kNoOwner = static_cast<pthread_t>(0xDEADBEEF);

}  // namespace

// The base's second flag: true between Init and Delete.

CLinuxMutex::CLinuxMutex() : m_count(0), m_owner(kNoOwner) {}

CLinuxMutex::~CLinuxMutex() {
    vidshow::ForgetHandleOfNamedMutex(this);
    if (m_flag) Delete();
}

int CLinuxMutex::Init() {
    pthread_mutexattr_t recursive;
    pthread_mutexattr_init(&recursive);
    pthread_mutexattr_settype(&recursive, PTHREAD_MUTEX_RECURSIVE);
    const int error = pthread_mutex_init(&m_mutex, &recursive);
    pthread_mutexattr_destroy(&recursive);
    if (error != 0) return error;
    m_flag = true;
    return SetSignaled(true, true);
}

int CLinuxMutex::Delete() {
    m_flag = false;
    return pthread_mutex_destroy(&m_mutex);
}

const char* CLinuxMutex::getType() const {
    return vidshow::kObjectType;
}

int CLinuxMutex::WaitAction() {
    if (pthread_mutex_trylock(&m_mutex) != 0) return -1;
    ++m_count;
    m_signaled = false;
    m_owner = pthread_self();
    return 0;
}

DWORD CLinuxMutex::WaitForSignal(DWORD ms) {
    return m_flag ? CLinuxSyncObject::WaitForSignal(ms) : WAIT_FAILED;
}

bool CLinuxMutex::IsMine() const {
    return m_count > 0 && pthread_equal(m_owner, pthread_self()) != 0;
}

bool CLinuxMutex::isSignaled() {
    return m_signaled || IsMine();
}

int CLinuxMutex::Release() {
    if (!m_flag) return -1;
    MutexLock lock(&m_lock);
    if (lock.error() != 0) return lock.error();
    const int error = IsMine() ? pthread_mutex_unlock(&m_mutex) : EPERM;
    if (error != 0) return error;
    if (--m_count == 0) {
        m_owner = kNoOwner;
        SetSignaled(true, false);
    }
    return lock.Unlock();
}

extern "C" {

HANDLE CreateMutex(void*, BOOL, const char* name) {
    auto* mutex = new (std::nothrow) CLinuxMutex;
    if (mutex == nullptr) return nullptr;
    if (mutex->Init() != 0) {  // nobody could ever take it
        delete mutex;
        return nullptr;
    }
    if (name != nullptr) vidshow::RememberNamedMutex(mutex, name);
    return HandleOf(mutex);
}

HANDLE OpenMutex(DWORD, BOOL, const char* name) {
    return name != nullptr ? HandleOf(vidshow::FindNamedMutex(name)) : nullptr;
}

BOOL ReleaseMutex(HANDLE mutex) {
    if (IsInvalidOrPseudo(mutex)) return FALSE;
    vidshow::ForgetNamedMutex(ObjectOf<CLinuxMutex>(mutex));
    return ObjectOf(mutex)->Release() == 0;
}

}  // extern "C"
