#pragma once

#include <atomic>
#include <cstdint>

#include "platform/mutex_lock.h"
#include "vidshow/platform/thread.h"

namespace vidshow {

/// What a thread and its object share. Either may end first: the object is closed while the thread
/// runs, or the thread ends while the handle stays open. Whoever lets go last frees it. The
/// pointers to the object, and `next`, are guarded by the lock of `LivingThreads`.
struct ThreadLife {
    CLinuxThread* thread;  ///< the object; null once it is gone
    CLNrwqueue* queue;     ///< the object's; null once it is gone
    unsigned int (*function)(void*);
    void* argument;
    bool suspendOnCreate;
    std::atomic<bool> started;    ///< set by the new thread
    std::atomic<bool> suspended;  ///< what was asked for last; read by the signal handler
    std::atomic<int> holders;
    uintptr_t serial;  ///< never used again in the process, unlike an address
    ThreadLife* next;  ///< in the list of LivingThreads
};

/// Makes the life of an object, held by that object, and counts the object among the living.
/// @return null without memory
ThreadLife* BeginLife(CLinuxThread* thread, CLNrwqueue* queue);

/// The object is gone: it counts as living no longer and lets go of its life. Null does nothing.
void EndLife(ThreadLife* life);

void HoldLife(ThreadLife* life);
void ReleaseLife(ThreadLife* life);

/// Stores the exit code of a thread in its object, if that is still there.
void StoreExitCode(ThreadLife* life, int code);

/// The thread objects that exist, for as long as this one does: none of them goes away meanwhile.
/// Handles are addresses, which clients may keep longer than the objects; here they are looked up
/// instead of followed.
class LivingThreads {
  public:
    LivingThreads();
    ThreadLife* Find(const CLinuxThread* thread) const;  ///< null when there is no such object
    CLinuxThread* Find(uintptr_t serial) const;          ///< null when that object is gone

  private:
    MutexLock m_lock;
};

}  // namespace vidshow
