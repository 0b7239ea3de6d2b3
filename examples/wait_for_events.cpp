// A worker that serves whichever of several events comes, and a controller that waits until two
// things are done.

#include <cstdio>
#include <thread>

#include "vidshow/platform/sync.h"

struct Worker {
    // The order is the priority: when several are signalled, the lowest index is served.
    enum { kStop, kResize, kFrame, kEvents };

    HANDLE events[kEvents];
    HANDLE served;  // one unit for each event served
    HANDLE done;
    int width = 0;  // handed over by the resize event
    int height = 0;

    void Run() {
        for (;;) {
            const DWORD which = WaitForMultipleObjects(kEvents, events, FALSE, INFINITE);
            if (which == WAIT_OBJECT_0 + kFrame) {
                std::printf("worker: frame\n");
            } else if (which == WAIT_OBJECT_0 + kResize) {
                std::printf("worker: resize to %d x %d\n", width, height);
            } else {
                break;  // stop, or a failed wait
            }
            ReleaseSemaphore(served, 1, nullptr);
        }
        std::printf("worker: stop\n");
        SetEvent(done);
    }
};

int main() {
    Worker worker;
    for (HANDLE& event : worker.events)
        event = CreateEvent(nullptr, FALSE, FALSE, nullptr);
    worker.served = CreateSemaphore(nullptr, 0, 1, nullptr);
    worker.done = CreateEvent(nullptr, TRUE, FALSE, nullptr);
    std::thread thread([&worker] { worker.Run(); });

    // An event remembers one signal: waiting until it was served keeps the second from being lost.
    for (int i = 0; i < 2; ++i) {
        SetEvent(worker.events[Worker::kFrame]);
        WaitForSingleObject(worker.served, INFINITE);
    }
    worker.width = 640;
    worker.height = 480;
    SetEvent(worker.events[Worker::kResize]);
    WaitForSingleObject(worker.served, INFINITE);
    SetEvent(worker.events[Worker::kStop]);

    ReleaseSemaphore(worker.served, 1, nullptr);
    const HANDLE both[] = {worker.done, worker.served};
    DWORD result = WaitForMultipleObjects(2, both, TRUE, INFINITE);
    std::printf("both done: %u\n", static_cast<unsigned>(result));
    result = WaitForSingleObject(worker.served, 20);
    std::printf("nothing more within 20 ms: %u\n", static_cast<unsigned>(result));

    thread.join();
    for (HANDLE event : worker.events)
        CloseHandle(event);
    CloseHandle(worker.served);
    CloseHandle(worker.done);
    return 0;
}
