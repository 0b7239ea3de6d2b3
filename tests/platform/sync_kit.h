#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>
#include <functional>
#include <random>
#include <string>
#include <thread>
#include <vector>

#include "vidshow/platform/sync.h"

namespace sync_kit {

/// Owns a handle.
class Handle {
  public:
    explicit Handle(HANDLE handle) : m_handle(handle) {}
    Handle(Handle&& other) : m_handle(other.m_handle) { other.m_handle = nullptr; }
    Handle& operator=(Handle&&) = delete;
    ~Handle() { Close(); }

    operator HANDLE() const { return m_handle; }
    void Close();

  private:
    HANDLE m_handle;
};

Handle AutoResetEvent(bool set = false);
Handle ManualResetEvent(bool set = false);
Handle Semaphore(LONG units);
Handle Mutex(const char* name = nullptr);

/// The address that a 32-bit number names.
inline HANDLE HandleValue(uint32_t value) {
    return reinterpret_cast<HANDLE>(static_cast<uintptr_t>(value));
}

/// The numbers that most functions refuse.
inline std::vector<HANDLE> InvalidHandles() {
    return {nullptr, HandleValue(0xFFFFFFFF)};
}

/// The kernel's state letter of a thread of this process: R, S, D ...; 0 when it is gone.
char StateOf(int kernelId);

/// The kernel's number of the calling thread.
int KernelId();

/// A thread that can be observed.
class Worker {
  public:
    explicit Worker(std::function<void()> work);
    ~Worker();

    /// Returns when the thread sleeps in the kernel, or is done.
    void WaitUntilAsleep();
    bool done() const { return m_done; }
    void Join();

  private:
    std::atomic<int> m_kernelId{0};
    std::atomic<bool> m_done{false};
    std::thread m_thread;
};

/// Whether a wait of a few milliseconds has ended without its object. That is WAIT_TIMEOUT, save
/// for waits begun in one microsecond of each second, whose deadline the condition refuses: tests
/// that wait thousands of times meet it now and then.
inline bool HasExpired(DWORD result) {
    return result == WAIT_TIMEOUT || result == WAIT_FAILED;
}

/// Runs `work` on another thread and returns when that has ended.
void OnAnotherThread(const std::function<void()>& work);

/// Processor time that `work` costs the calling thread, in milliseconds.
double ProcessorMilliseconds(const std::function<void()>& work);

/// Time that `work` takes by a clock that nobody sets, in milliseconds.
double Milliseconds(const std::function<void()>& work);

/// `full` for a native build; a part of it under a sanitizer or on ARM, which here means under an
/// emulator. VIDSHOW_TEST_LOAD, in percent of `full`, overrides both.
size_t Load(size_t full);

/// A random number in 0..limit-1.
inline uint32_t Below(std::mt19937& random, size_t limit) {
    return static_cast<uint32_t>(random() % limit);
}

}  // namespace sync_kit
