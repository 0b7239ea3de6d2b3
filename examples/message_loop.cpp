// A thread that serves messages, a periodic timer's among them. What a thread reads is the queue of
// the thread that it created last; launching the timer thread first makes that the one which the
// timers post to, and others find it by its id.

#include <cstdio>

#include "vidshow/platform/thread.h"
#include "vidshow/platform/timer.h"

enum { kPrint = 1000, kStop };

struct Server {
    HANDLE ready;   // set when `id` may be posted to
    HANDLE ticked;  // set when the timer has done its work
    HANDLE id;
};

static unsigned int Serve(void* argument) {
    auto* server = static_cast<Server*>(argument);
    CLinuxTimerMgr timers;
    timers.LaunchTimerThread();
    server->id = GetCurrentThreadId();
    SetEvent(server->ready);

    CLinuxTimer* timer = nullptr;
    int ticks = 0;
    MSG message;
    while (GetMessage(&message, nullptr, 0, 0) != 0 && message.message != kStop) {
        if (message.message == kPrint) {
            std::printf("server: message %u\n", message.wParam);
            if (message.wParam == 3) timer = timers.SetTimer(10, nullptr);
        } else if (message.message == WM_TIMER && timers.IsValid(timer, message.wParam)) {
            if (++ticks == 3) {
                std::printf("server: three ticks, the timer goes\n");
                timers.KillTimer(timer);
                SetEvent(server->ticked);
            }
        }
    }
    std::printf("server: stop\n");
    return static_cast<unsigned int>(ticks);  // ~CLinuxTimerMgr ends the timer thread
}

int main() {
    Server server = {CreateEvent(nullptr, FALSE, FALSE, nullptr),
                     CreateEvent(nullptr, FALSE, FALSE, nullptr), nullptr};
    // Suspended, so that it may be set up before it runs.
    const HANDLE thread = CreateThread(nullptr, 0, Serve, &server, CREATE_SUSPENDED, nullptr);
    SetThreadPriority(thread, 0);
    ResumeThread(thread);
    WaitForSingleObject(server.ready, INFINITE);

    for (unsigned int i = 1; i <= 3; ++i)
        PostThreadMessage(server.id, kPrint, i, 0);
    WaitForSingleObject(server.ticked, INFINITE);
    PostThreadMessage(server.id, kStop, 0, 0);

    WaitForSingleObject(thread, INFINITE);
    DWORD ticks = 0;
    GetExitCodeThread(thread, &ticks);
    std::printf("main: the thread saw %u ticks\n", static_cast<unsigned>(ticks));
    CloseHandle(thread);
    CloseHandle(server.ready);
    CloseHandle(server.ticked);
    return 0;
}
