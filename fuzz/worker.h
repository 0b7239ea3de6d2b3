#pragma once

#include <condition_variable>
#include <functional>
#include <mutex>
#include <thread>

namespace fuzz {

/// The second thread: does one job at a time.
class Worker {
  public:
    Worker() : m_thread([this] { Work(); }) {}
    ~Worker() {
        Start(nullptr);
        m_thread.join();
    }
    Worker(const Worker&) = delete;
    Worker& operator=(const Worker&) = delete;

    void Start(std::function<void()> job) {
        std::lock_guard<std::mutex> lock(m_lock);
        m_job = std::move(job);
        m_busy = true;
        m_changed.notify_all();
    }
    void Finish() {
        std::unique_lock<std::mutex> lock(m_lock);
        m_changed.wait(lock, [this] { return !m_busy; });
    }

  private:
    void Work() {
        std::unique_lock<std::mutex> lock(m_lock);
        for (;;) {
            m_changed.wait(lock, [this] { return m_busy; });
            const std::function<void()> job = m_job;
            if (job == nullptr) return;
            lock.unlock();
            job();
            lock.lock();
            m_busy = false;
            m_changed.notify_all();
        }
    }

    std::mutex m_lock;
    std::condition_variable m_changed;
    std::function<void()> m_job;  // guarded by m_lock; none: the end
    bool m_busy = false;          // guarded by m_lock
    std::thread m_thread;
};

}  // namespace fuzz
