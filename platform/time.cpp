// The millisecond clock, which is the wall clock modulo 2^32, and sleeping by it.

#include <errno.h>
#include <sys/time.h>
#include <time.h>

#include "vidshow/platform/misc.h"

extern "C" {

DWORD timeGetTime(void) {
    timeval now;
    if (gettimeofday(&now, nullptr) != 0) return 0;
    return static_cast<DWORD>(now.tv_sec) * 1000 + static_cast<DWORD>(now.tv_usec) / 1000;
}

DWORD GetTickCount(void) {
    return timeGetTime();
}

// The target wraps and is compared as a plain number: clients rely on Sleep(INFINITE) not sleeping.
void Sleep(DWORD ms) {
    const DWORD target = timeGetTime() + ms;
    for (DWORD now; (now = timeGetTime()) < target;) {
        const DWORD left = target - now;
        timespec span;
        span.tv_sec = static_cast<time_t>(left / 1000);
        span.tv_nsec = static_cast<long>(left % 1000) * 1000000;
        if (nanosleep(&span, nullptr) == 0 || errno != EINTR) return;
    }
}

}  // extern "C"
