// The Win32 names over thread objects.

#include <new>

#include "platform/handles.h"
#include "platform/thread_table.h"
#include "vidshow/platform/thread.h"

using vidshow::HandleOf;
using vidshow::IsThread;
using vidshow::ObjectOf;

namespace {

constexpr DWORD kNotSent = 0xFFFFFFFF;
constexpr int kUsualPriority = 2;

// @return null for what is not in the table
CLinuxThread* InTable(HANDLE handle) {
    return IsThread(handle) ? ObjectOf<CLinuxThread>(handle) : nullptr;
}

// Makes a thread that stands in no table. @param id receives the pthread id
CLinuxThread* Begin(unsigned int (*function)(void*), void* argument, int priority,
                    unsigned long* id) {
    auto* thread = new (std::nothrow) CLinuxThread;
    if (thread == nullptr) return nullptr;
    *id = thread->Init(function, argument, priority);
    if (*id != static_cast<unsigned long>(-1)) return thread;
    delete thread;
    return nullptr;
}

}  // namespace

extern "C" {

HANDLE _beginthread(unsigned int (*function)(void*), unsigned int, void* argument) {
    unsigned long id = 0;
    CLinuxThread* thread = Begin(function, argument, kUsualPriority, &id);
    return thread != nullptr ? HandleOf(thread) : INVALID_HANDLE_VALUE;
}

HANDLE _beginthreadex(void* security, unsigned int, unsigned int (*function)(void*), void* argument,
                      unsigned int, unsigned long* id) {
    const int priority = security != nullptr ? *static_cast<int*>(security) : kUsualPriority;
    unsigned long started = 0;
    CLinuxThread* thread = Begin(function, argument, priority, &started);
    if (thread != nullptr) *id = started;
    return HandleOf(thread);
}

void _endthread(void) {
    CLinuxThread::Exit(0);
}

void _endthreadex(unsigned int code) {
    CLinuxThread::Exit(code);
}

void ExitThread(DWORD code) {
    CLinuxThread::Exit(static_cast<unsigned int>(code));
}

BOOL TerminateThread(HANDLE handle, DWORD) {
    CLinuxThread* thread = InTable(handle);
    if (thread == nullptr) return FALSE;
    thread->Cancel();
    return TRUE;
}

BOOL GetExitCodeThread(HANDLE handle, DWORD* code) {
    CLinuxThread* thread = InTable(handle);
    if (thread == nullptr || code == nullptr) return FALSE;
    *code = static_cast<DWORD>(thread->GetExitCode());
    return TRUE;
}

int GetThreadPriority(HANDLE handle) {
    CLinuxThread* thread = InTable(handle);
    return thread != nullptr ? thread->GetPriority() : 0;
}

BOOL SetThreadPriority(HANDLE handle, int priority) {
    CLinuxThread* thread = InTable(handle);
    return thread != nullptr && thread->SetPriority(priority) == 0;
}

// Not a count of suspends: clients rely on 1.
DWORD SuspendThread(HANDLE handle) {
    CLinuxThread* thread = InTable(handle);
    return thread != nullptr && thread->Suspend() == 0 ? 1 : kNotSent;
}

DWORD ResumeThread(HANDLE handle) {
    CLinuxThread* thread = InTable(handle);
    return thread != nullptr && thread->Resume() == 0 ? 1 : kNotSent;
}

HANDLE GetCurrentThread(void) {
    return HandleOf(CLinuxThread::GetCurrentThread());
}

HANDLE GetCurrentThreadId(void) {
    return GetCurrentThread();
}

}  // extern "C"
