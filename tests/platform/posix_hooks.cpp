#include "platform/posix_hooks.h"

#include <dlfcn.h>
#include <sched.h>

#include <cstdio>
#include <cstdlib>

namespace posix_hooks {

void* NextDefinition(const char* name) {
    void* found = dlsym(RTLD_NEXT, name);
    if (found == nullptr) {
        std::fprintf(stderr, "posix_hooks: the C library has no %s\n", name);
        std::abort();
    }
    return found;
}

// Constant-initialised: locks are taken long before this program's constructors run.
Hook<int(timeval*, void*)> clockRead("gettimeofday");
Hook<int(const timespec*, timespec*)> sleepNanoseconds("nanosleep");
Hook<int(useconds_t)> sleepMicroseconds("usleep");
Hook<int()> yield("sched_yield");
Hook<int(pthread_mutex_t*)> mutexLock("pthread_mutex_lock");
Hook<int(pthread_mutex_t*)> mutexUnlock("pthread_mutex_unlock");
Hook<int(pthread_mutex_t*)> mutexDestroy("pthread_mutex_destroy");
Hook<int(pthread_mutexattr_t*)> mutexAttributeDestroy("pthread_mutexattr_destroy");
Hook<int(pthread_cond_t*)> conditionBroadcast("pthread_cond_broadcast");
Hook<int(pthread_cond_t*)> conditionDestroy("pthread_cond_destroy");
Hook<int(pthread_cond_t*, pthread_mutex_t*)> conditionWait("pthread_cond_wait");
Hook<int(pthread_cond_t*, pthread_mutex_t*, const timespec*)> conditionTimedWait(
    "pthread_cond_timedwait");

}  // namespace posix_hooks

using namespace posix_hooks;

// Seen from outside this program, unlike what the build does to other functions.
#pragma GCC visibility push(default)
extern "C" {

int gettimeofday(timeval* now, void* zone) noexcept {
    return clockRead.Call(now, zone);
}

int nanosleep(const timespec* span, timespec* left) {
    return sleepNanoseconds.Call(span, left);
}

int usleep(useconds_t span) {
    return sleepMicroseconds.Call(span);
}

int sched_yield() noexcept {
    return yield.Call();
}

int pthread_mutex_lock(pthread_mutex_t* mutex) noexcept {
    return mutexLock.Call(mutex);
}

int pthread_mutex_unlock(pthread_mutex_t* mutex) noexcept {
    return mutexUnlock.Call(mutex);
}

int pthread_mutex_destroy(pthread_mutex_t* mutex) noexcept {
    return mutexDestroy.Call(mutex);
}

int pthread_mutexattr_destroy(pthread_mutexattr_t* attribute) noexcept {
    return mutexAttributeDestroy.Call(attribute);
}

int pthread_cond_broadcast(pthread_cond_t* condition) noexcept {
    return conditionBroadcast.Call(condition);
}

int pthread_cond_destroy(pthread_cond_t* condition) noexcept {
    return conditionDestroy.Call(condition);
}

int pthread_cond_wait(pthread_cond_t* condition, pthread_mutex_t* mutex) {
    return conditionWait.Call(condition, mutex);
}

int pthread_cond_timedwait(pthread_cond_t* condition, pthread_mutex_t* mutex,
                           const timespec* deadline) {
    return conditionTimedWait.Call(condition, mutex, deadline);
}

}  // extern "C"
#pragma GCC visibility pop
