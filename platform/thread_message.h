#pragma once

#include "vidshow/platform/thread.h"

namespace vidshow {

/// An item of a thread's message queue.
struct ThreadMessage {
    unsigned int message;
    unsigned int wParam;
    long lParam;
};
static_assert(sizeof(ThreadMessage) == 8 + sizeof(long),
              "three words, the last as wide as a pointer");

constexpr DWORD kMessageSlots = 1024;

/// A post is refused while more than this many messages wait.
constexpr DWORD kMostWaiting = 1004;

}  // namespace vidshow
