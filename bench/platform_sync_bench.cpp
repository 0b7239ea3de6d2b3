// Events, semaphores, mutexes, waits and the queue, beside the same written directly on pthread
// primitives, and the queue beside GLib's. Goals: an operation on one object that nobody else uses
// takes at most 1.5 times the direct form's time; the queue is as fast as GLib's, as far as its two
// semaphores and one mutex allow.

#include <benchmark/benchmark.h>
#include <glib.h>
#include <pthread.h>
#include <semaphore.h>

#include <cstdint>
#include <string>
#include <thread>
#include <vector>

#include "bench/compare_calls.h"
#include "vidshow/platform.h"

namespace {

// What one would write instead of each object: a mutex, a condition, and the state. The mutex is
// plain, as one would choose it, or recursive, as the layer's objects must have it.

enum class Lock { plain, recursive };

template <Lock kind>
class Guarded {
  public:
    Guarded() {
        pthread_mutexattr_t attribute;
        pthread_mutexattr_init(&attribute);
        pthread_mutexattr_settype(
            &attribute, kind == Lock::recursive ? PTHREAD_MUTEX_RECURSIVE : PTHREAD_MUTEX_DEFAULT);
        pthread_mutex_init(&m_mutex, &attribute);
        pthread_mutexattr_destroy(&attribute);
    }
    ~Guarded() { pthread_mutex_destroy(&m_mutex); }
    void Enter() { pthread_mutex_lock(&m_mutex); }
    bool TryEnter() { return pthread_mutex_trylock(&m_mutex) == 0; }
    void Leave() { pthread_mutex_unlock(&m_mutex); }
    void Wait() { pthread_cond_wait(&m_condition, &m_mutex); }
    void Wake() { pthread_cond_broadcast(&m_condition); }

  private:
    pthread_mutex_t m_mutex;
    pthread_cond_t m_condition = PTHREAD_COND_INITIALIZER;
};

// An auto-reset event holds at most one unit, a semaphore any number.
template <Lock kind, bool atMostOne>
class DirectUnits : public Guarded<kind> {
  public:
    explicit DirectUnits(int units) : m_units(units) {}

    void Post() {
        this->Enter();
        m_units = atMostOne ? 1 : m_units + 1;
        this->Wake();
        this->Leave();
    }
    void Take() {
        this->Enter();
        while (m_units == 0)
            this->Wait();
        --m_units;
        this->Leave();
    }
    bool TryTake() {
        this->Enter();
        const bool there = m_units != 0;
        if (there) --m_units;
        this->Leave();
        return there;
    }

  private:
    int m_units;
};

template <Lock kind>
using DirectEvent = DirectUnits<kind, true>;
template <Lock kind>
using DirectSemaphore = DirectUnits<kind, false>;

// A mutex that can be waited for with a time-out, on a system whose mutexes cannot.
template <Lock kind>
class DirectMutex : public Guarded<kind> {
  public:
    void Take() {
        const pthread_t self = pthread_self();
        this->Enter();
        while (m_count != 0 && !pthread_equal(m_owner, self))
            this->Wait();
        m_owner = self;
        ++m_count;
        this->Leave();
    }
    void Give() {
        this->Enter();
        if (--m_count == 0) this->Wake();
        this->Leave();
    }

  private:
    pthread_t m_owner = 0;
    int m_count = 0;
};

// The bare calls that an operation of the layer is made of by contract, and nothing around them:
// what no other writing of the layer can be faster than.

class BareSemaphore : public Guarded<Lock::recursive> {
  public:
    explicit BareSemaphore(unsigned units) : m_signaled(units != 0) {
        sem_init(&m_units, 0, units);
    }
    ~BareSemaphore() { sem_destroy(&m_units); }

    void Post() {
        Enter();
        sem_post(&m_units);
        if (!m_signaled) Wake();
        m_signaled = true;
        Leave();
    }
    void Take() {
        Enter();
        while (!m_signaled)
            Wait();
        sem_trywait(&m_units);
        int left = 0;
        sem_getvalue(&m_units, &left);
        m_signaled = left != 0;
        Leave();
    }

  private:
    sem_t m_units;
    bool m_signaled;
};

class BareMutex : public Guarded<Lock::recursive> {
  public:
    void Take() {
        Enter();
        while (!m_signaled && !pthread_equal(m_owner, pthread_self()))
            Wait();
        m_inner.TryEnter();
        m_owner = pthread_self();
        ++m_count;
        m_signaled = false;
        Leave();
    }
    void Give() {
        Enter();
        m_inner.Leave();
        if (--m_count == 0) {
            m_owner = 0;
            m_signaled = true;
            Wake();
        }
        Leave();
    }

  private:
    Guarded<Lock::recursive> m_inner;
    pthread_t m_owner = 0;
    int m_count = 0;
    bool m_signaled = true;
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

// The work: `times` operations on an object of the kind named.

template <typename Object>
void PostAndTake(int times) {
    Object object(0);
    for (int i = 0; i < times; ++i) {
        object.Post();
        object.Take();
    }
}

template <typename Object>
void LockAndUnlock(Object* object, int times) {
    for (int i = 0; i < times; ++i) {
        object->Take();
        object->Give();
    }
}

template <typename Object>
void LockAndUnlock(int times) {
    Object object;
    LockAndUnlock(&object, times);
}

template <typename Object>
void LockAndUnlockOnTwoThreads(int times) {
    Object object;
    std::thread other([&] { LockAndUnlock(&object, times / 2); });
    LockAndUnlock(&object, times / 2);
    other.join();
}

// One turn there and one back between two threads.
template <typename Object>
void ThereAndBack(int times) {
    Object there(0);
    Object back(0);
    std::thread other([&] {
        for (int i = 0; i < times; ++i) {
            there.Take();
            back.Post();
        }
    });
    for (int i = 0; i < times; ++i) {
        there.Post();
        back.Take();
    }
    other.join();
}

void WaitForBothLayer(int times) {
    LayerEvent a(0);
    LayerEvent b(0);
    const HANDLE both[] = {a.handle(), b.handle()};
    for (int i = 0; i < times; ++i) {
        a.Post();
        b.Post();
        WaitForMultipleObjects(2, both, TRUE, INFINITE);
    }
}

// Takes one, tries the other, gives back when that is missing.
template <Lock kind>
void WaitForBothDirect(int times) {
    DirectEvent<kind> a(0);
    DirectEvent<kind> b(0);
    for (int i = 0; i < times; ++i) {
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

// The four steps of a put and of a get, in bare calls.
class BareQueue {
  public:
    void Put(void* item) {
        m_free.Take();
        m_lock.Take();
        m_items[m_write++ % kSlots] = item;
        m_filled.Post();
        m_lock.Give();
    }
    void* Get() {
        m_filled.Take();
        m_lock.Take();
        void* item = m_items[m_read++ % kSlots];
        m_free.Post();
        m_lock.Give();
        return item;
    }

  private:
    BareMutex m_lock;
    BareSemaphore m_free{kSlots};
    BareSemaphore m_filled{0};
    uint32_t m_read = 0;
    uint32_t m_write = 0;
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
void PutAndGet(int times) {
    Queue queue;
    for (int i = 0; i < times; ++i) {
        queue.Put(&queue);
        benchmark::DoNotOptimize(queue.Get());
    }
}

// So many writers and as many readers pass `times` items among them.
template <typename Queue, int kPairs>
void Pass(int times) {
    Queue queue;
    std::vector<std::thread> threads;
    for (int i = 0; i < kPairs; ++i) {
        threads.emplace_back([&] {
            for (int n = 0; n < times / kPairs; ++n)
                queue.Put(&queue);
        });
        threads.emplace_back([&] {
            for (int n = 0; n < times / kPairs; ++n)
                benchmark::DoNotOptimize(queue.Get());
        });
    }
    for (std::thread& thread : threads)
        thread.join();
}

// Few enough that a run mostly ends before somebody else gets the processor.
constexpr int kAlone = 500;     // operations of one thread
constexpr int kShared = 20000;  // of several

// Beside the direct form with one kind of lock.
template <Lock kind>
void AddBesideDirect(const std::string& suffix) {
    Add("event: set + wait" + suffix, PostAndTake<LayerEvent>, PostAndTake<DirectEvent<kind>>,
        kAlone);
    Add("semaphore: post + wait" + suffix, PostAndTake<LayerSemaphore>,
        PostAndTake<DirectSemaphore<kind>>, kAlone);
    Add("mutex: lock + unlock" + suffix, LockAndUnlock<LayerMutex>,
        LockAndUnlock<DirectMutex<kind>>, kAlone);
    Add("mutex: lock + unlock on two threads" + suffix, LockAndUnlockOnTwoThreads<LayerMutex>,
        LockAndUnlockOnTwoThreads<DirectMutex<kind>>, kShared);
    Add("event: to another thread and back" + suffix, ThereAndBack<LayerEvent>,
        ThereAndBack<DirectEvent<kind>>, 500);
    Add("two events: set both + wait for all" + suffix, WaitForBothLayer, WaitForBothDirect<kind>,
        kAlone);
}

template <typename OtherQueue>
void AddQueueBeside(const std::string& suffix) {
    constexpr int kItems = 20000;
    Add("queue: put + get in one thread" + suffix, PutAndGet<LayerQueue>, PutAndGet<OtherQueue>,
        kAlone);
    Add("queue: item, 1 x 1 threads" + suffix, Pass<LayerQueue, 1>, Pass<OtherQueue, 1>, kItems);
    Add("queue: item, 4 x 4 threads" + suffix, Pass<LayerQueue, 4>, Pass<OtherQueue, 4>, kItems);
}

void AddBesideBareCalls() {
    Add("event: set + wait, beside its bare calls", PostAndTake<LayerEvent>,
        PostAndTake<DirectEvent<Lock::recursive>>, kAlone);
    Add("semaphore: post + wait, beside its bare calls", PostAndTake<LayerSemaphore>,
        PostAndTake<BareSemaphore>, kAlone);
    Add("mutex: lock + unlock, beside its bare calls", LockAndUnlock<LayerMutex>,
        LockAndUnlock<BareMutex>, kAlone);
    AddQueueBeside<BareQueue>(", beside its bare calls");
}

void AddAll() {
    AddBesideDirect<Lock::plain>("");
    AddBesideDirect<Lock::recursive>(", recursive lock");
    Add("critical section: enter + leave, beside pthread_mutex_t", LockAndUnlock<LayerSection>,
        LockAndUnlock<PosixMutex>, kAlone);
    Add("mutex: lock + unlock, beside pthread_mutex_t", LockAndUnlock<LayerMutex>,
        LockAndUnlock<PosixMutex>, kAlone);
    Add("semaphore: post + wait, beside sem_t", PostAndTake<LayerSemaphore>,
        PostAndTake<PosixSemaphore>, kAlone);
    AddBesideBareCalls();
    AddQueueBeside<DirectQueue>("");
    AddQueueBeside<GlibQueue>(", beside GAsyncQueue");
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
    AddAll();
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}
