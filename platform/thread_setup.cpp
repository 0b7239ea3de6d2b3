// What is made once, when the first thread is created, and the data that each thread keeps.
//
// A thread's record of its current thread is a serial number, not an address: addresses are used
// again, and a thread must not find itself reading a stranger's messages.

#include "platform/thread_setup.h"

#include <cstdio>
#include <new>

#include "platform/thread_signals.h"

CLinuxThread* mainthread;

namespace vidshow {

namespace {

/// A key of per-thread data that can be asked before it is made.
class Key {
  public:
    bool Make(void (*atThreadEnd)(void*)) {
        m_made = pthread_key_create(&m_key, atThreadEnd) == 0;
        return m_made;
    }
    bool Set(const void* value) { return m_made && pthread_setspecific(m_key, value) == 0; }
    void* Get() const { return m_made ? pthread_getspecific(m_key) : nullptr; }

  private:
    pthread_key_t m_key{};
    std::atomic<bool> m_made{false};
};

pthread_once_t g_once = PTHREAD_ONCE_INIT;
Key g_currentThread;
Key g_ownLife;

void LetGo(void* life) {
    ReleaseLife(static_cast<ThreadLife*>(life));
}

void MakeMainThread() {
    if (mainthread != nullptr) return;
    mainthread = new (std::nothrow) CLinuxThread;
    const auto failed = static_cast<unsigned long>(-1);
    if (mainthread == nullptr || mainthread->Init(nullptr, nullptr, 2) == failed) {
        std::puts("Unable to create handle for main thread.");
    }
}

void SetUp() {
    if (!g_currentThread.Make(nullptr)) {
        std::fputs("Unable to create thread-specific-data key.\n", stderr);
    }
    g_ownLife.Make(LetGo);
    MakeMainThread();
    InstallSignalHandlers();
}

}  // namespace

int SetUpThreads() {
    return pthread_once(&g_once, SetUp);
}

bool RecordCurrentThread(const ThreadLife& life) {
    return g_currentThread.Set(reinterpret_cast<const void*>(life.serial));
}

uintptr_t RecordedThread() {
    return reinterpret_cast<uintptr_t>(g_currentThread.Get());
}

bool AdoptLife(ThreadLife* life) {
    return g_ownLife.Set(life);
}

ThreadLife* OwnLife() {
    return static_cast<ThreadLife*>(g_ownLife.Get());
}

}  // namespace vidshow
