#pragma once

#include <pthread.h>
#include <signal.h>

#include <cstdio>

#include "platform/posix_hooks.h"

/// More calls of the platform layer for a test to step in, in programs that link thread_hooks.cpp
/// beside posix_hooks.cpp.
namespace posix_hooks {

extern Hook<int(pthread_once_t*, void (*)())> threadOnce;
extern Hook<int(pthread_t*, const pthread_attr_t*, void* (*)(void*), void*)> threadCreate;
extern Hook<int(pthread_t, int, const sched_param*)> setScheduling;
extern Hook<int(pthread_t, int)> threadSignal;
extern Hook<int(pthread_cond_t*)> conditionSignal;
extern Hook<int(int, const struct sigaction*, struct sigaction*)> signalAction;
extern Hook<int(const sigset_t*)> signalSuspend;
extern Hook<std::FILE*(const char*, const char*)> fileOpen;
extern Hook<ssize_t(const char*, char*, size_t)> linkRead;

/// Which request of `new (std::nothrow)` is refused: the `request`-th of so many bytes, from 1; 0
/// refuses none. Has no effect under AddressSanitizer, which has allocations of its own.
void RefuseNew(size_t bytes, int request);

}  // namespace posix_hooks
