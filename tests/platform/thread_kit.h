#pragma once

#include <atomic>
#include <functional>

#include "platform/sync_kit.h"
#include "vidshow/platform/thread.h"

namespace thread_kit {

/// A thread of `CreateThread` that runs a function object; waited for and closed at the end.
class Thread {
  public:
    explicit Thread(std::function<unsigned int()> work, DWORD flags = 0);
    ~Thread();
    Thread(const Thread&) = delete;
    Thread& operator=(const Thread&) = delete;

    operator HANDLE() const { return m_handle; }
    HANDLE id() const { return m_id; }
    CLinuxThread& object() const { return *static_cast<CLinuxThread*>(m_handle); }

    bool Join();             ///< an INFINITE wait, once. @return whether it succeeded
    void Close();            ///< `Join`, and closes the handle
    void WaitUntilAsleep();  ///< until the thread sleeps in the kernel, or is done

  private:
    static unsigned int Run(void* self);

    std::function<unsigned int()> m_work;
    std::atomic<int> m_kernelId{0};
    bool m_joined = false;
    HANDLE m_id = nullptr;
    HANDLE m_handle;
};

/// A thread that waits until it is told to go on.
class Gate {
  public:
    void Open() { SetEvent(m_event); }
    void Pass() { WaitForSingleObject(m_event, INFINITE); }

  private:
    sync_kit::Handle m_event = sync_kit::ManualResetEvent();
};

/// Makes a thread object that has a queue and no thread, and makes it the calling thread's current
/// thread for as long as this lives: what a started thread has to do to read messages.
class OwnQueue {
  public:
    OwnQueue() : m_thread([] { return 0u; }) { m_thread.Join(); }
    HANDLE id() const { return m_thread; }

  private:
    Thread m_thread;
};

/// Sleeps for so many milliseconds by a clock that nobody sets, whatever signals come.
void Pause(unsigned ms);

/// Whether a handle stands in the table.
bool IsInTable(HANDLE handle);

/// The exit code by `GetExitCodeThread`; 0xEEEEEEEE when that fails.
DWORD ExitCodeOf(HANDLE handle);

}  // namespace thread_kit
