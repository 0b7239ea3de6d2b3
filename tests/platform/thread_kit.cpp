#include "platform/thread_kit.h"

#include <errno.h>
#include <time.h>

#include <algorithm>
#include <iterator>

namespace thread_kit {

Thread::Thread(std::function<unsigned int()> work, DWORD flags)
    : m_work(std::move(work)), m_handle(CreateThread(nullptr, 0, Run, this, flags, &m_id)) {}

Thread::~Thread() {
    Close();
}

unsigned int Thread::Run(void* self) {
    auto* thread = static_cast<Thread*>(self);
    thread->m_kernelId = sync_kit::KernelId();
    return thread->m_work();
}

bool Thread::Join() {
    if (m_joined || m_handle == nullptr) return true;
    m_joined = true;
    return WaitForSingleObject(m_handle, INFINITE) == WAIT_OBJECT_0;
}

void Thread::Close() {
    Join();
    if (m_handle != nullptr) CloseHandle(m_handle);
    m_handle = nullptr;
}

void Thread::WaitUntilAsleep() {
    while (m_kernelId == 0)
        std::this_thread::yield();
    for (;;) {
        const char state = sync_kit::StateOf(m_kernelId);
        if (state == 'S' || state == '\0') return;
        std::this_thread::yield();
    }
}

void Pause(unsigned ms) {
    timespec left = {};
    left.tv_sec = static_cast<time_t>(ms / 1000);
    left.tv_nsec = static_cast<long>(ms % 1000) * 1000000;
    while (nanosleep(&left, &left) != 0 && errno == EINTR) {
    }
}

bool IsInTable(HANDLE handle) {
    return std::find(std::begin(gAllThreads), std::end(gAllThreads), handle) !=
           std::end(gAllThreads);
}

DWORD ExitCodeOf(HANDLE handle) {
    DWORD code = 0xEEEEEEEE;
    return GetExitCodeThread(handle, &code) != 0 ? code : 0xEEEEEEEE;
}

}  // namespace thread_kit
