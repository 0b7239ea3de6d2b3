#include "platform/thread_hooks.h"

#include <cstdlib>
#include <new>

namespace posix_hooks {

Hook<int(pthread_once_t*, void (*)())> threadOnce("pthread_once");
Hook<int(pthread_t*, const pthread_attr_t*, void* (*)(void*), void*)> threadCreate(
    "pthread_create");
Hook<int(pthread_t, int, const sched_param*)> setScheduling("pthread_setschedparam");
Hook<int(pthread_t, int)> threadSignal("pthread_kill");
Hook<int(pthread_cond_t*)> conditionSignal("pthread_cond_signal");
Hook<int(int, const struct sigaction*, struct sigaction*)> signalAction("sigaction");
Hook<int(const sigset_t*)> signalSuspend("sigsuspend");
Hook<std::FILE*(const char*, const char*)> fileOpen("fopen");
Hook<ssize_t(const char*, char*, size_t)> linkRead("readlink");

namespace {
std::atomic<size_t> g_refusedBytes{0};
std::atomic<int> g_requestsLeft{0};
}  // namespace

void RefuseNew(size_t bytes, int request) {
    g_requestsLeft = request;
    g_refusedBytes = bytes;
}

bool IsRefused(size_t bytes) {
    return g_requestsLeft > 0 && bytes == g_refusedBytes && --g_requestsLeft == 0;
}

}  // namespace posix_hooks

using namespace posix_hooks;

// Seen from outside this program, unlike what the build does to other functions.
#pragma GCC visibility push(default)
extern "C" {

int pthread_once(pthread_once_t* control, void (*routine)()) {
    return threadOnce.Call(control, routine);
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

#if !defined(__SANITIZE_ADDRESS__)
void* operator new(size_t bytes, const std::nothrow_t&) noexcept {
    return IsRefused(bytes) ? nullptr : std::malloc(bytes);
}
#endif
#pragma GCC visibility pop
