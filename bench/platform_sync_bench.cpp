// Events, semaphores, mutexes, waits and the queue, beside the same written directly on pthread
// primitives, and the queue beside GLib's. Names are Operation/form; the table at the end divides
// each form by "direct".

#include <benchmark/benchmark.h>
#include <glib.h>
#include <pthread.h>
#include <semaphore.h>

#include <cstdint>
#include <cstring>
#include <thread>
#include <vector>

#include "ratio_reporter.h"
#include "vidshow/platform.h"

namespace {

// What one would write instead of each object: a mutex, a condition, and the state.

class DirectLock {
  public:
    void Lock() { pthread_mutex_lock(&m_mutex); }
    void Unlock() { pthread_mutex_unlock(&m_mutex); }
    void Wait() { pthread_cond_wait(&m_condition, &m_mutex); }
    void Wake() { pthread_cond_broadcast(&m_condition); }

  private:
    pthread_mutex_t m_mutex = PTHREAD_MUTEX_INITIALIZER;
    pthread_cond_t m_condition = PTHREAD_COND_INITIALIZER;
};

// An auto-reset event holds at most one unit, a semaphore any number.
template <bool atMostOne>
class DirectUnits : public DirectLock {
  public:
    explicit DirectUnits(int units) : m_units(units) {}

    void Post() {
        Lock();
        m_units = atMostOne ? 1 : m_units + 1;
        Wake();
        Unlock();
    }
    void Take() {
        Lock();
        while (m_units == 0)
            Wait();
        --m_units;
        Unlock();
    }
    bool TryTake() {
        Lock();
        const bool there = m_units != 0;
        if (there) --m_units;
        Unlock();
        return there;
    }

  private:
    int m_units;
};

using DirectEvent = DirectUnits<true>;
using DirectSemaphore = DirectUnits<false>;

// A mutex that can be waited for with a time-out, on a system whose mutexes cannot.
class DirectMutex : public DirectLock {
  public:
    void Take() {
        const pthread_t self = pthread_self();
        Lock();
        while (m_count != 0 && !pthread_equal(m_owner, self))
            Wait();
        m_owner = self;
        ++m_count;
        Unlock();
    }
    void Give() {
        Lock();
        if (--m_count == 0) Wake();
        Unlock();
    }

  private:
    pthread_t m_owner = 0;
    int m_count = 0;
};

// The layer's objects under the same few names.

class LayerObject {
  public:
    explicit LayerObject(HANDLE handle) : m_handle(handle) {}
    ~LayerObject() { CloseHandle(m_handle); }
    void Take() { WaitForSingleObject(m_handle, INFINITE); }
    HANDLE handle() const { return m_handle; }

  private:
    HANDLE m_handle;
};

class LayerEvent : public LayerObject {
  public:
    explicit LayerEvent(int units) : LayerObject(CreateEvent(nullptr, FALSE, units, nullptr)) {}
    void Post() { SetEvent(handle()); }
};

class LayerSemaphore : public LayerObject {
  public:
    explicit LayerSemaphore(int units)
        : LayerObject(CreateSemaphore(nullptr, units, units, nullptr)) {}
    void Post() { ReleaseSemaphore(handle(), 1, nullptr); }
};

class LayerMutex : public LayerObject {
  public:
    LayerMutex() : LayerObject(CreateMutex(nullptr, FALSE, nullptr)) {}
    void Give() { ReleaseMutex(handle()); }
};

class LayerSection {
  public:
    LayerSection() { InitializeCriticalSection(&m_section); }
    ~LayerSection() { DeleteCriticalSection(&m_section); }
    void Take() { EnterCriticalSection(&m_section); }
    void Give() { LeaveCriticalSection(&m_section); }

  private:
    CRITICAL_SECTION m_section;
};

class PosixSemaphore {
  public:
    explicit PosixSemaphore(unsigned units) { sem_init(&m_semaphore, 0, units); }
    ~PosixSemaphore() { sem_destroy(&m_semaphore); }
    void Post() { sem_post(&m_semaphore); }
    void Take() { sem_wait(&m_semaphore); }

  private:
    sem_t m_semaphore;
};

class PosixMutex {
  public:
    void Take() { pthread_mutex_lock(&m_mutex); }
    void Give() { pthread_mutex_unlock(&m_mutex); }

  private:
    pthread_mutex_t m_mutex = PTHREAD_MUTEX_INITIALIZER;
};

template <typename Object>
void PostAndTake(benchmark::State& state) {
    Object object(0);
    for (auto _ : state) {
        object.Post();
        object.Take();
    }
}

template <typename Object>
void LockAndUnlock(benchmark::State& state) {
    static Object object;
    for (auto _ : state) {
        object.Take();
        object.Give();
    }
}

// One turn there and one back between two threads.
template <typename Object>
void ThereAndBack(benchmark::State& state) {
    Object there(0);
    Object back(0);
    bool stop = false;
    std::thread other([&] {
        for (;;) {
            there.Take();
            if (stop) return;
            back.Post();
        }
    });
    for (auto _ : state) {
        there.Post();
        back.Take();
    }
    stop = true;
    there.Post();
    other.join();
}

void WaitForBothLayer(benchmark::State& state) {
    LayerEvent a(0);
    LayerEvent b(0);
    const HANDLE both[] = {a.handle(), b.handle()};
    for (auto _ : state) {
        a.Post();
        b.Post();
        WaitForMultipleObjects(2, both, TRUE, INFINITE);
    }
}

// Takes one, tries the other, gives back when that is missing.
void WaitForBothDirect(benchmark::State& state) {
    DirectEvent a(0);
    DirectEvent b(0);
    for (auto _ : state) {
        a.Post();
        b.Post();
        for (a.Take(); !b.TryTake(); a.Take()) {
            a.Post();
            b.Take();
            b.Post();
        }
    }
}

// Queues of addresses, bounded to the same number of slots where they are bounded at all.

constexpr uint32_t kSlots = 1024;

class LayerQueue {
  public:
    void Put(void* item) { m_queue.WriteItem(&item); }
    void* Get() {
        void* item = nullptr;
        m_queue.ReadItem(&item);
        return item;
    }

  private:
    CLNrwqueue m_queue{kSlots, sizeof(void*)};
};

class DirectQueue {
  public:
    void Put(void* item) {
        pthread_mutex_lock(&m_mutex);
        while (m_count == kSlots)
            pthread_cond_wait(&m_notFull, &m_mutex);
        m_items[(m_read + m_count++) % kSlots] = item;
        pthread_cond_signal(&m_notEmpty);
        pthread_mutex_unlock(&m_mutex);
    }
    void* Get() {
        pthread_mutex_lock(&m_mutex);
        while (m_count == 0)
            pthread_cond_wait(&m_notEmpty, &m_mutex);
        void* item = m_items[m_read];
        m_read = (m_read + 1) % kSlots;
        --m_count;
        pthread_cond_signal(&m_notFull);
        pthread_mutex_unlock(&m_mutex);
        return item;
    }

  private:
    pthread_mutex_t m_mutex = PTHREAD_MUTEX_INITIALIZER;
    pthread_cond_t m_notEmpty = PTHREAD_COND_INITIALIZER;
    pthread_cond_t m_notFull = PTHREAD_COND_INITIALIZER;
    uint32_t m_read = 0;
    uint32_t m_count = 0;
    void* m_items[kSlots];
};

class GlibQueue {
  public:
    GlibQueue() : m_queue(g_async_queue_new()) {}
    ~GlibQueue() { g_async_queue_unref(m_queue); }
    void Put(void* item) { g_async_queue_push(m_queue, item); }
    void* Get() { return g_async_queue_pop(m_queue); }

  private:
    GAsyncQueue* m_queue;
};

template <typename Queue>
void PutAndGet(benchmark::State& state) {
    Queue queue;
    int item = 0;
    for (auto _ : state) {
        queue.Put(&item);
        benchmark::DoNotOptimize(queue.Get());
    }
    state.SetItemsProcessed(state.iterations());
}

// `pairs` writers and as many readers pass a fixed number of items.
template <typename Queue>
void Pass(benchmark::State& state) {
    constexpr int64_t kItems = 200000;
    const int64_t pairs = state.range(0);
    int item = 0;
    for (auto _ : state) {
        Queue queue;
        std::vector<std::thread> threads;
        for (int64_t i = 0; i < pairs; ++i) {
            threads.emplace_back([&] {
                for (int64_t n = 0; n < kItems / pairs; ++n)
                    queue.Put(&item);
            });
            threads.emplace_back([&] {
                for (int64_t n = 0; n < kItems / pairs; ++n)
                    queue.Get();
            });
        }
        for (std::thread& thread : threads)
            thread.join();
    }
    state.SetItemsProcessed(state.iterations() * kItems);
}

void Register(const char* name, void (*function)(benchmark::State&)) {
    benchmark::RegisterBenchmark(name, function);
}

void RegisterOnTwoThreads(const char* name, void (*function)(benchmark::State&)) {
    benchmark::RegisterBenchmark(name, function)->Threads(2)->UseRealTime();
}

void RegisterThereAndBack(const char* name, void (*function)(benchmark::State&)) {
    benchmark::RegisterBenchmark(name, function)->UseRealTime();
}

template <typename Queue>
void RegisterPass(const char* oneByOne, const char* fourByFour) {
    benchmark::RegisterBenchmark(oneByOne, Pass<Queue>)->Arg(1)->UseRealTime();
    benchmark::RegisterBenchmark(fourByFour, Pass<Queue>)->Arg(4)->UseRealTime();
}

void RegisterAll() {
    Register("event: set + wait/direct", PostAndTake<DirectEvent>);
    Register("event: set + wait/vidshow", PostAndTake<LayerEvent>);
    RegisterThereAndBack("event: to another thread and back/direct", ThereAndBack<DirectEvent>);
    RegisterThereAndBack("event: to another thread and back/vidshow", ThereAndBack<LayerEvent>);
    Register("semaphore: post + wait/direct", PostAndTake<DirectSemaphore>);
    Register("semaphore: post + wait/vidshow", PostAndTake<LayerSemaphore>);
    Register("semaphore: post + wait/sem_t", PostAndTake<PosixSemaphore>);
    Register("mutex: lock + unlock/direct", LockAndUnlock<DirectMutex>);
    Register("mutex: lock + unlock/vidshow", LockAndUnlock<LayerMutex>);
    Register("mutex: lock + unlock/pthread_mutex_t", LockAndUnlock<PosixMutex>);
    Register("mutex: lock + unlock/critical section", LockAndUnlock<LayerSection>);
    RegisterOnTwoThreads("mutex: lock + unlock, two threads/direct", LockAndUnlock<DirectMutex>);
    RegisterOnTwoThreads("mutex: lock + unlock, two threads/vidshow", LockAndUnlock<LayerMutex>);
    RegisterOnTwoThreads("mutex: lock + unlock, two threads/pthread_mutex_t",
                         LockAndUnlock<PosixMutex>);
    Register("two events: set both + wait for all/direct", WaitForBothDirect);
    Register("two events: set both + wait for all/vidshow", WaitForBothLayer);
    Register("queue: put + get in one thread/direct", PutAndGet<DirectQueue>);
    Register("queue: put + get in one thread/vidshow", PutAndGet<LayerQueue>);
    Register("queue: put + get in one thread/GAsyncQueue", PutAndGet<GlibQueue>);
    RegisterPass<DirectQueue>("queue: 200000 items, 1 x 1 threads/direct",
                              "queue: 200000 items, 4 x 4 threads/direct");
    RegisterPass<LayerQueue>("queue: 200000 items, 1 x 1 threads/vidshow",
                             "queue: 200000 items, 4 x 4 threads/vidshow");
    RegisterPass<GlibQueue>("queue: 200000 items, 1 x 1 threads/GAsyncQueue",
                            "queue: 200000 items, 4 x 4 threads/GAsyncQueue");
}

// A process with one thread is spared its atomic operations by the C library. Nobody has locks for
// that, so a second thread stands by.
class Bystander {
  public:
    ~Bystander() {
        m_end.Post();
        m_thread.join();
    }

  private:
    PosixSemaphore m_end{0};
    std::thread m_thread{[this] { m_end.Take(); }};
};

}  // namespace

int main(int argc, char** argv) {
    const Bystander bystander;
    RegisterAll();
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    bench::RatioReporter reporter("direct");
    benchmark::RunSpecifiedBenchmarks(&reporter);
    reporter.PrintRatios();
    return 0;
}
