// Critical sections over recursive pthread mutexes. No call reports an error: the Win32 functions
// have no way to, and a section that was initialised and is used by its rules meets none.

#include "vidshow/platform/sync.h"

extern "C" {

void InitializeCriticalSection(CRITICAL_SECTION* cs) {
    pthread_mutexattr_init(&cs->attribute);
    pthread_mutexattr_settype(&cs->attribute, PTHREAD_MUTEX_RECURSIVE);
    pthread_mutex_init(&cs->mutex, &cs->attribute);
}

void DeleteCriticalSection(CRITICAL_SECTION* cs) {
    pthread_mutex_destroy(&cs->mutex);
    pthread_mutexattr_destroy(&cs->attribute);
}

void EnterCriticalSection(CRITICAL_SECTION* cs) {
    pthread_mutex_lock(&cs->mutex);
}

BOOL TryEnterCriticalSection(CRITICAL_SECTION* cs) {
    return pthread_mutex_trylock(&cs->mutex) == 0 ? 1 : 0;
}

void LeaveCriticalSection(CRITICAL_SECTION* cs) {
    pthread_mutex_unlock(&cs->mutex);
}

}  // extern "C"

CCRITCALSECTION::CCRITCALSECTION() {
    InitializeCriticalSection(&m_cs);
}

CCRITCALSECTION::~CCRITCALSECTION() {
    DeleteCriticalSection(&m_cs);
}

void CCRITCALSECTION::Enter() {
    EnterCriticalSection(&m_cs);
}

void CCRITCALSECTION::Leave() {
    LeaveCriticalSection(&m_cs);
}
