// A module as it comes from Win32: a worker thread that takes jobs under a critical section, an
// event for each direction, and files. What changed on the way is marked "port:".

#include <fcntl.h>

#include <cstdio>

#include "vidshow/platform.h"

namespace {

struct Worker {
    CRITICAL_SECTION lock;  // guards the two below
    int job = -1;           // block of the file to be summed up; -1: none, -2: stop
    unsigned sum = 0;
    HANDLE wanted, finished;
    HANDLE file;

    unsigned SumOfBlock(int block) const {
        unsigned char bytes[256];
        DWORD count = 0;
        SetFilePointer(file, block * LONG{sizeof bytes}, nullptr, 0);
        // port: ReadFile answers 1 even when reading failed; the count tells.
        if (ReadFile(file, bytes, sizeof bytes, &count, nullptr) == 0 || count > sizeof bytes)
            return 0;
        unsigned total = 0;
        for (DWORD i = 0; i < count; ++i)
            total += bytes[i];
        return total;
    }
};

unsigned int Work(void* argument) {  // port: no WINAPI, and the code is an unsigned int
    auto* const worker = static_cast<Worker*>(argument);
    for (unsigned int jobs = 0;; ++jobs) {
        WaitForSingleObject(worker->wanted, INFINITE);
        EnterCriticalSection(&worker->lock);
        const int job = worker->job;
        if (job >= 0) worker->sum = worker->SumOfBlock(job);
        LeaveCriticalSection(&worker->lock);
        if (job < 0) return jobs;
        SetEvent(worker->finished);
    }
}

void Ask(Worker* worker, int job) {
    EnterCriticalSection(&worker->lock);
    worker->job = job;
    LeaveCriticalSection(&worker->lock);
    SetEvent(worker->wanted);
}

}  // namespace

int main() {
    Worker worker;
    InitializeCriticalSection(&worker.lock);
    worker.wanted = CreateEvent(nullptr, FALSE, FALSE, nullptr);
    worker.finished = CreateEvent(nullptr, FALSE, FALSE, nullptr);
    // port: the flags are those of open(), in the places where Win32 has its own.
    worker.file = CreateFile("win32_port.tmp", O_RDWR | O_CREAT | O_TRUNC, 0, nullptr, 0, 0600);
    if (worker.file == INVALID_HANDLE_VALUE) return 1;
    for (int i = 0; i < 3 * 256; ++i) {
        const auto byte = static_cast<unsigned char>(i >> 8);
        DWORD written = 0;
        WriteFile(worker.file, &byte, 1, &written, nullptr);
    }

    const HANDLE thread = CreateThread(nullptr, 0, Work, &worker, 0, nullptr);
    for (int block = 0; block < 3; ++block) {
        Ask(&worker, block);
        if (WaitForSingleObject(worker.finished, 5000) != WAIT_OBJECT_0) return 1;
        std::printf("block %d: %u\n", block, worker.sum);
    }
    Ask(&worker, -2);
    WaitForSingleObject(thread, INFINITE);  // port: joins, so only once
    DWORD jobs = 0;
    GetExitCodeThread(thread, &jobs);
    std::printf("the thread did %u jobs\n", static_cast<unsigned>(jobs));

    const HANDLE handles[] = {thread, worker.file, worker.wanted, worker.finished};
    for (const HANDLE handle : handles)
        CloseHandle(handle);
    DeleteCriticalSection(&worker.lock);
    return DeleteFile("win32_port.tmp") != 0 ? 0 : 1;
}
