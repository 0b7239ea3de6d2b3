// Posting messages, and the Win32 names of reading them.
//
// Posts are made under the lock of the living threads: the receiver cannot be closed under a post,
// and between the look at the count and the write nobody else posts, so that the limit is exact and
// a post never blocks.

#include "platform/thread_message.h"

#include "platform/thread_life.h"
#include "vidshow/platform/queue.h"

using vidshow::LivingThreads;
using vidshow::ThreadLife;
using vidshow::ThreadMessage;

namespace {

// The lock of the living threads held.
int Post(const ThreadLife& receiver, ThreadMessage item) {
    if (receiver.queue->GetCount() > vidshow::kMostWaiting) return 0;
    return receiver.queue->WriteItem(&item);
}

}  // namespace

int CLinuxThread::PostMessage(unsigned int message, unsigned int wParam, long lParam) {
    if (m_life == nullptr) return 0;
    const LivingThreads living;
    return Post(*m_life, ThreadMessage{message, wParam, lParam});
}

extern "C" {

BOOL PostThreadMessage(HANDLE thread, unsigned int message, WPARAM wParam, LPARAM lParam) {
    if (thread == nullptr) return FALSE;
    const LivingThreads living;
    const ThreadLife* receiver = living.Find(static_cast<CLinuxThread*>(thread));
    return receiver != nullptr && Post(*receiver, ThreadMessage{message, wParam, lParam}) == 1;
}

BOOL GetMessage(MSG* message, HANDLE, unsigned int, unsigned int) {
    CLinuxThread* reader = CLinuxThread::GetCurrentThread();
    return reader != nullptr &&
           reader->GetMessage(&message->message, &message->wParam, &message->lParam) != 0;
}

BOOL PeekMessage(MSG* message, HANDLE, unsigned int min, unsigned int max, unsigned int remove) {
    CLinuxThread* reader = CLinuxThread::GetCurrentThread();
    return reader != nullptr &&
           reader->PeekMessage(&message->message, &message->wParam, &message->lParam, min, max,
                               remove == PM_REMOVE) != 0;
}

}  // extern "C"
