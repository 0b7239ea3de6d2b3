// Reading a thread's messages.

#include <cstdlib>

#include "platform/thread_message.h"
#include "vidshow/platform/queue.h"
#include "vidshow/platform/timer.h"

using vidshow::ThreadMessage;

namespace {

constexpr int kQuitStatus = 2;

// Messages of a timer that has gone meanwhile are of no use to anybody.
bool IsStale(const ThreadMessage& item) {
    return item.message == WM_TIMER && ZEB_IsValidTimer(item.wParam) == 0;
}

void CopyOut(const ThreadMessage& item, unsigned int* message, unsigned int* wParam, long* lParam) {
    *message = item.message;
    *wParam = item.wParam;
    *lParam = item.lParam;
}

}  // namespace

// WM_QUIT ends the process instead of giving 0: clients rely on their loops never seeing it.
int CLinuxThread::GetMessage(unsigned int* message, unsigned int* wParam, long* lParam) {
    ThreadMessage item;
    do {
        if (m_queue == nullptr || m_queue->ReadItem(&item) == 0) return 0;
        CopyOut(item, message, wParam, lParam);
    } while (IsStale(item));
    if (item.message == WM_QUIT) std::exit(kQuitStatus);
    return 1;
}

int CLinuxThread::PeekMessage(unsigned int* message, unsigned int* wParam, long* lParam,
                              unsigned int, unsigned int, bool remove) {
    ThreadMessage item;
    if (m_queue == nullptr || m_queue->SearchItem(&item, nullptr, remove) == 0) return 0;
    CopyOut(item, message, wParam, lParam);
    return 1;
}
