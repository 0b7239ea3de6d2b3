#include "platform/thread_hooks.h"

namespace posix_hooks {

Hook<int(pthread_once_t*, void (*)())> threadOnce("pthread_once");
Hook<int(pthread_key_t*, void (*)(void*))> keyCreate("pthread_key_create");
Hook<int(pthread_key_t, const void*)> keySet("pthread_setspecific");
Hook<int(pthread_t*, const pthread_attr_t*, void* (*)(void*), void*)> threadCreate(
    "pthread_create");
Hook<int(pthread_t, int, const sched_param*)> setScheduling("pthread_setschedparam");
Hook<int(pthread_t, int)> threadSignal("pthread_kill");
Hook<int(pthread_cond_t*)> conditionSignal("pthread_cond_signal");
Hook<int(int, const struct sigaction*, struct sigaction*)> signalAction("sigaction");
Hook<int(const sigset_t*)> signalSuspend("sigsuspend");
Hook<std::FILE*(const char*, const char*)> fileOpen("fopen");
Hook<ssize_t(const char*, char*, size_t)> linkRead("readlink");

}  // namespace posix_hooks

using namespace posix_hooks;

// The value is only passed on, which the compiler takes for a use of what it points to.
#if !defined(__clang__)
#pragma GCC diagnostic ignored "-Wmaybe-uninitialized"
#endif

// Seen from outside this program, unlike what the build does to other functions.
#pragma GCC visibility push(default)
extern "C" {

int pthread_once(pthread_once_t* control, void (*routine)()) {
    return threadOnce.Call(control, routine);
}

int pthread_key_create(pthread_key_t* key, void (*destructor)(void*)) noexcept {
    return keyCreate.Call(key, destructor);
}

int pthread_setspecific(pthread_key_t key, const void* value) noexcept {
    return keySet.Call(key, value);
}

int pthread_create(pthread_t* thread, const pthread_attr_t* attributes, void* (*start)(void*),
                   void* argument) noexcept {
    return threadCreate.Call(thread, attributes, start, argument);
}

int pthread_setschedparam(pthread_t thread, int policy, const sched_param* parameters) noexcept {
    return setScheduling.Call(thread, policy, parameters);
}

int pthread_kill(pthread_t thread, int signal) noexcept {
    return threadSignal.Call(thread, signal);
}

int pthread_cond_signal(pthread_cond_t* condition) noexcept {
    return conditionSignal.Call(condition);
}

int sigaction(int signal, const struct sigaction* action, struct sigaction* previous) noexcept {
    return signalAction.Call(signal, action, previous);
}

int sigsuspend(const sigset_t* mask) {
    return signalSuspend.Call(mask);
}

std::FILE* fopen(const char* name, const char* mode) {
    return fileOpen.Call(name, mode);
}

ssize_t readlink(const char* path, char* target, size_t bytes) noexcept {
    return linkRead.Call(path, target, bytes);
}

}  // extern "C"
#pragma GCC visibility pop
