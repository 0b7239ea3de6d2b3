#include "platform/sync_kit.h"

#include <sys/syscall.h>
#include <time.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace sync_kit {

void Handle::Close() {
    if (m_handle != nullptr) CloseHandle(m_handle);
    m_handle = nullptr;
}

Handle AutoResetEvent(bool set) {
    return Handle(CreateEvent(nullptr, FALSE, set, nullptr));
}

Handle ManualResetEvent(bool set) {
    return Handle(CreateEvent(nullptr, TRUE, set, nullptr));
}

Handle Semaphore(LONG units) {
    return Handle(CreateSemaphore(nullptr, units, units, nullptr));
}

Handle Mutex(const char* name) {
    return Handle(CreateMutex(nullptr, FALSE, name));
}

char StateOf(int kernelId) {
    char path[64];
    std::snprintf(path, sizeof path, "/proc/self/task/%d/stat", kernelId);
    std::FILE* file = std::fopen(path, "r");
    if (file == nullptr) return 0;
    char line[512] = {};
    const size_t bytes = std::fread(line, 1, sizeof line - 1, file);
    std::fclose(file);
    const char* name_end = bytes > 0 ? std::strrchr(line, ')') : nullptr;
    return name_end != nullptr ? name_end[2] : '\0';
}

int KernelId() {
    return static_cast<int>(syscall(SYS_gettid));
}

Worker::Worker(std::function<void()> work)
    : m_thread([this, work = std::move(work)] {
          m_kernelId = KernelId();
          work();
          m_done = true;
      }) {}

Worker::~Worker() {
    Join();
}

void Worker::WaitUntilAsleep() {
    while (m_kernelId == 0)
        std::this_thread::yield();
    while (!m_done && StateOf(m_kernelId) != 'S')
        std::this_thread::yield();
}

void Worker::Join() {
    if (m_thread.joinable()) m_thread.join();
}

void OnAnotherThread(const std::function<void()>& work) {
    std::thread(work).join();
}

double ProcessorMilliseconds(const std::function<void()>& work) {
    const auto now = [] {
        timespec time;
        clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
        return static_cast<double>(time.tv_sec) * 1e3 + static_cast<double>(time.tv_nsec) * 1e-6;
    };
    const double start = now();
    work();
    return now() - start;
}

double Milliseconds(const std::function<void()>& work) {
    using Clock = std::chrono::steady_clock;
    const auto start = Clock::now();
    work();
    return std::chrono::duration<double, std::milli>(Clock::now() - start).count();
}

size_t Load(size_t full) {
#if defined(__SANITIZE_THREAD__) || defined(__SANITIZE_ADDRESS__) || defined(__arm__)
    const size_t percent = 10;
#else
    const size_t percent = 100;
#endif
    const char* text = std::getenv("VIDSHOW_TEST_LOAD");
    const size_t chosen = text != nullptr ? std::strtoul(text, nullptr, 10) : percent;
    return std::max<size_t>(1, full * chosen / 100);
}

}  // namespace sync_kit
