#pragma once

#include <pthread.h>

namespace vidshow {

/// Holds a pthread mutex from construction to destruction, unless it is let go earlier.
class MutexLock {
  public:
    explicit MutexLock(pthread_mutex_t* mutex)
        : m_mutex(mutex), m_error(pthread_mutex_lock(mutex)), m_held(m_error == 0) {}
    ~MutexLock() {
        if (m_held) pthread_mutex_unlock(m_mutex);
    }
    MutexLock(const MutexLock&) = delete;
    MutexLock& operator=(const MutexLock&) = delete;

    /// @return 0, or why the last attempt to lock failed; the mutex is not held then
    int error() const { return m_error; }

    /// Lets the mutex go, if it is held. @return the result of unlocking; else `error()`
    int Unlock() {
        if (!m_held) return m_error;
        m_held = false;
        return pthread_mutex_unlock(m_mutex);
    }

    /// Takes the mutex again after `Unlock`. @return `error()`
    int Relock() {
        m_error = pthread_mutex_lock(m_mutex);
        m_held = m_error == 0;
        return m_error;
    }

  private:
    pthread_mutex_t* m_mutex;
    int m_error;
    bool m_held;
};

}  // namespace vidshow
