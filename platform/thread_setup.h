#pragma once

#include "platform/thread_life.h"

namespace vidshow {

/// Once a process: makes the keys of the per-thread data, the main thread's object, and installs
/// the signal handlers. What fails is reported on standard error and done without.
/// @return 0; why it could not be run at all
int SetUpThreads();

/// Records an object as the calling thread's current thread. @return whether that worked
bool RecordCurrentThread(const ThreadLife& life);

/// @return the serial number recorded for the calling thread; 0 without one
uintptr_t RecordedThread();

/// Gives the calling thread its life, to be let go of when the thread ends in whatever way.
/// @return whether that worked; if not, the caller lets go of it
bool AdoptLife(ThreadLife* life);

/// @return the calling thread's life; null for threads that this layer has not started. May be
///         called by a signal handler
ThreadLife* OwnLife();

}  // namespace vidshow
