#pragma once

#include <sys/time.h>
#include <unistd.h>

#include <cstdint>
#include <functional>
#include <vector>

#include "platform/posix_hooks.h"

/// A clock that moves only when somebody sleeps, in place of the system's for as long as it lives.
/// One at a time.
class TestClock {
  public:
    TestClock() {
        milliseconds = 5000;
        sleeps.clear();
        onSleep = nullptr;
    }

    static inline uint64_t milliseconds;
    static inline std::vector<useconds_t> sleeps;  ///< what was asked for, in microseconds
    static inline std::function<void()> onSleep;   ///< called after each sleep, if set

  private:
    static int Read(timeval* now, void*) {
        now->tv_sec = static_cast<time_t>(milliseconds / 1000);
        now->tv_usec = static_cast<suseconds_t>(milliseconds % 1000 * 1000);
        return 0;
    }

    static int Sleep(useconds_t span) {
        sleeps.push_back(span);
        milliseconds += span / 1000;
        if (onSleep) onSleep();
        return 0;
    }

    posix_hooks::Replacement<int(timeval*, void*)> m_read{posix_hooks::clockRead, Read};
    posix_hooks::Replacement<int(useconds_t)> m_sleep{posix_hooks::sleepMicroseconds, Sleep};
};
