#ifndef VIDSHOW_PLATFORM_SYNC_H
#define VIDSHOW_PLATFORM_SYNC_H

/// @file
/// Critical sections: recursive mutexes under their Win32 names.

#include <pthread.h>

#include "vidshow/types.h"

/// A recursive mutex with the attribute object that it was made with, which lives as long.
struct CRITICAL_SECTION {
    pthread_mutex_t mutex;
    pthread_mutexattr_t attribute;
};

extern "C" {

/// Makes a recursive mutex. Every section is initialised before use and deleted once.
VIDSHOW_API void InitializeCriticalSection(CRITICAL_SECTION* cs);

/// Destroys the mutex, then its attributes. No thread may hold the section.
VIDSHOW_API void DeleteCriticalSection(CRITICAL_SECTION* cs);

/// Enters, waiting while another thread is inside. The owner may enter again, and leaves as often.
VIDSHOW_API void EnterCriticalSection(CRITICAL_SECTION* cs);

/// @return 1 when entered (also by the owner, once more); 0 when another thread is inside
VIDSHOW_API BOOL TryEnterCriticalSection(CRITICAL_SECTION* cs);

/// Leaves a section that the calling thread entered.
VIDSHOW_API void LeaveCriticalSection(CRITICAL_SECTION* cs);

}  // extern "C"

/// Owns one critical section.
class VIDSHOW_API CCRITCALSECTION {
  public:
    CCRITCALSECTION();
    CCRITCALSECTION(const CCRITCALSECTION&) = delete;
    CCRITCALSECTION& operator=(const CCRITCALSECTION&) = delete;
    virtual ~CCRITCALSECTION();

    void Enter();  ///< `EnterCriticalSection`
    void Leave();  ///< `LeaveCriticalSection`

  private:
    CRITICAL_SECTION m_cs;
};

#endif
