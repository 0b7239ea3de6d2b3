#pragma once

#include <pthread.h>
#include <semaphore.h>
#include <sys/time.h>
#include <time.h>
#include <unistd.h>

#include <atomic>

/// The C library's calls that the platform layer makes, with a place for a test to step in. A
/// program that links posix_hooks.cpp defines these functions itself, so that the library's calls
/// arrive there; without a replacement they go on to the C library.
namespace posix_hooks {

void* NextDefinition(const char* name);

template <typename Signature>
class Hook;

template <typename Result, typename... Args>
class Hook<Result(Args...)> {
  public:
    using Function = Result (*)(Args...);

    constexpr explicit Hook(const char* name) : m_name(name) {}

    void Replace(Function replacement) { m_replacement = replacement; }

    Result Real(Args... args) {
        Function real = m_real.load(std::memory_order_relaxed);
        if (real == nullptr) {
            real = reinterpret_cast<Function>(NextDefinition(m_name));
            m_real.store(real, std::memory_order_relaxed);
        }
        return real(args...);
    }

    Result Call(Args... args) {
        const Function replacement = m_replacement;
        return replacement != nullptr ? replacement(args...) : Real(args...);
    }

  private:
    const char* m_name;
    std::atomic<Function> m_replacement{nullptr};
    std::atomic<Function> m_real{nullptr};
};

/// Replaces a call for as long as it lives.
template <typename Signature>
class Replacement {
  public:
    Replacement(Hook<Signature>& hook, typename Hook<Signature>::Function function) : m_hook(hook) {
        hook.Replace(function);
    }
    ~Replacement() { m_hook.Replace(nullptr); }
    Replacement(const Replacement&) = delete;
    Replacement& operator=(const Replacement&) = delete;

  private:
    Hook<Signature>& m_hook;
};

extern Hook<int(timeval*, void*)> clockRead;  ///< gettimeofday
extern Hook<int(const timespec*, timespec*)> sleepNanoseconds;
extern Hook<int(useconds_t)> sleepMicroseconds;
extern Hook<int()> yield;
extern Hook<int(pthread_mutex_t*)> mutexLock;
extern Hook<int(pthread_mutex_t*)> mutexUnlock;
extern Hook<int(pthread_mutex_t*)> mutexDestroy;
extern Hook<int(pthread_mutexattr_t*)> mutexAttributeDestroy;
extern Hook<int(pthread_cond_t*)> conditionBroadcast;
extern Hook<int(pthread_cond_t*)> conditionDestroy;
extern Hook<int(pthread_cond_t*, pthread_mutex_t*)> conditionWait;
extern Hook<int(pthread_cond_t*, pthread_mutex_t*, const timespec*)> conditionTimedWait;

}  // namespace posix_hooks
