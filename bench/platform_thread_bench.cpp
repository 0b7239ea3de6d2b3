// Threads and their messages, beside the same written directly on pthreads. Goal: the way of a
// message to another thread and back costs at most twice the direct form's, being mostly the
// kernel's.

#include <benchmark/benchmark.h>
#include <pthread.h>

#include <atomic>
#include <string>
#include <thread>
#include <vector>

#include "bench/compare_calls.h"
#include "vidshow/platform.h"

namespace {

constexpr unsigned int kSlots = 1024;

struct Message {
    unsigned int message;
    unsigned int wParam;
    long lParam;
};

// What one would write instead of a thread's queue: a ring, a mutex and a condition.
class DirectQueue {
  public:
    bool Post(const Message& message) {
        pthread_mutex_lock(&m_mutex);
        const bool room = m_count <= 1004;
        if (room) m_ring[(m_read + m_count++) % kSlots] = message;
        pthread_mutex_unlock(&m_mutex);
        if (room) pthread_cond_signal(&m_notEmpty);
        return room;
    }
    Message Get() {
        pthread_mutex_lock(&m_mutex);
        while (m_count == 0)
            pthread_cond_wait(&m_notEmpty, &m_mutex);
        const Message message = m_ring[m_read];
        m_read = (m_read + 1) % kSlots;
        --m_count;
        pthread_mutex_unlock(&m_mutex);
        return message;
    }

  private:
    pthread_mutex_t m_mutex = PTHREAD_MUTEX_INITIALIZER;
    pthread_cond_t m_notEmpty = PTHREAD_COND_INITIALIZER;
    unsigned int m_read = 0;
    unsigned int m_count = 0;
    Message m_ring[kSlots];
};

// The queue of a thread object, read by whoever makes it: it is that thread's current one.
class LayerQueue {
  public:
    LayerQueue() : m_thread(CreateThread(nullptr, 0, Nothing, nullptr, 0, nullptr)) {
        WaitForSingleObject(m_thread, INFINITE);
    }
    ~LayerQueue() { CloseHandle(m_thread); }
    bool Post(const Message& message) {
        return PostThreadMessage(m_thread, message.message, message.wParam, message.lParam) != 0;
    }
    Message Get() {
        MSG message;
        GetMessage(&message, nullptr, 0, 0);
        return Message{message.message, message.wParam, message.lParam};
    }

  private:
    static unsigned int Nothing(void*) { return 0; }

    HANDLE m_thread;
};

void StartAndJoinLayer(int times) {
    for (int i = 0; i < times; ++i) {
        const HANDLE thread = CreateThread(
            nullptr, 0, [](void*) { return 0u; }, nullptr, 0, nullptr);
        WaitForSingleObject(thread, INFINITE);
        CloseHandle(thread);
    }
}

void StartAndJoinDirect(int times) {
    for (int i = 0; i < times; ++i) {
        pthread_t thread;
        pthread_create(
            &thread, nullptr, [](void*) -> void* { return nullptr; }, nullptr);
        pthread_join(thread, nullptr);
    }
}

template <typename Queue>
void PostAndGet(int times) {
    Queue queue;
    for (int i = 0; i < times; ++i) {
        queue.Post(Message{1, 2, 3});
        benchmark::DoNotOptimize(queue.Get());
    }
}

// The reader makes the queue; `there` is the address at which posters find it.
template <typename Queue>
void WaitFor(std::atomic<Queue*>& there) {
    while (there == nullptr)
        std::this_thread::yield();
}

template <typename Queue>
void ThereAndBack(int times) {
    std::atomic<Queue*> there{nullptr};
    std::atomic<Queue*> back{nullptr};
    std::thread other([&] {
        Queue queue;
        there = &queue;
        WaitFor(back);
        for (int i = 0; i < times; ++i) {
            queue.Get();
            back.load()->Post(Message{1, 2, 3});
        }
    });
    Queue queue;
    back = &queue;
    WaitFor(there);
    for (int i = 0; i < times; ++i) {
        there.load()->Post(Message{1, 2, 3});
        queue.Get();
    }
    other.join();
}

template <typename Queue, int kPosters>
void Stream(int times) {
    Queue queue;
    std::vector<std::thread> posters;
    for (int p = 0; p < kPosters; ++p) {
        posters.emplace_back([&] {
            for (int i = 0; i < times / kPosters;) {
                if (queue.Post(Message{1, 2, 3})) {
                    ++i;
                } else {
                    std::this_thread::yield();
                }
            }
        });
    }
    for (int i = 0; i < times / kPosters * kPosters; ++i)
        benchmark::DoNotOptimize(queue.Get());
    for (std::thread& poster : posters)
        poster.join();
}

}  // namespace

int main(int argc, char** argv) {
    Add("thread: create + join + close", StartAndJoinLayer, StartAndJoinDirect, 200);
    Add("message: post + get in one thread", PostAndGet<LayerQueue>, PostAndGet<DirectQueue>, 5000);
    Add("message: to another thread and back", ThereAndBack<LayerQueue>, ThereAndBack<DirectQueue>,
        500);
    Add("message: 1 poster, 1 reader", Stream<LayerQueue, 1>, Stream<DirectQueue, 1>, 20000);
    Add("message: 4 posters, 1 reader", Stream<LayerQueue, 4>, Stream<DirectQueue, 4>, 20000);
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}
