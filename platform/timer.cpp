// Moments, timers, and the plain functions, which do nothing.

#include "vidshow/platform/timer.h"

#include <sys/time.h>

#include "vidshow/platform/thread.h"

namespace {

constexpr int32_t kNanosecondsPerSecond = 1000000000;
constexpr DWORD kDefaultPeriod = 15;

int32_t WrappingAdd(int32_t a, uint64_t b) {
    return static_cast<int32_t>(static_cast<uint32_t>(a) + static_cast<uint32_t>(b));
}

}  // namespace

CLinuxTimeVal::CLinuxTimeVal() : sec(0), nsec(0) {}

void CLinuxTimeVal::Now() {
    timeval now = {};
    if (gettimeofday(&now, nullptr) != 0) now = timeval{};
    sec = static_cast<int32_t>(now.tv_sec);
    nsec = static_cast<int32_t>(now.tv_usec) * 1000;
}

void CLinuxTimeVal::Add(uint64_t ms) {
    sec = WrappingAdd(sec, ms / 1000);
    nsec += static_cast<int32_t>(ms % 1000) * 1000000;
    if (nsec >= kNanosecondsPerSecond) {
        sec = WrappingAdd(sec, 1);
        nsec -= kNanosecondsPerSecond;
    }
}

CLinuxTimeVal::operator DWORD() const {
    return static_cast<DWORD>(sec) * 1000 + static_cast<DWORD>(nsec / 1000000);
}

std::atomic<DWORD> CLinuxTimer::_sequence_count{0};

CLinuxTimer::CLinuxTimer()
    : m_owner(GetCurrentThreadId()), m_sequence(++_sequence_count), m_period(0), m_next(nullptr) {}

CLinuxTimer::~CLinuxTimer() = default;

int CLinuxTimer::Init(DWORD ms) {
    m_period = ms != 0 ? ms : kDefaultPeriod;
    m_expiry.Now();
    m_expiry.Add(m_period);
    return 0;
}

bool CLinuxTimer::IsValid(DWORD sequence) const {
    return sequence == m_sequence;
}

// Without a manager there are no timers: clients rely on these succeeding and doing nothing.
extern "C" {

UINT SetTimer(void*, unsigned int, unsigned int, TIMERPROC) {
    return 1;
}

BOOL KillTimer(void*, unsigned int) {
    return TRUE;
}

void ZEB_KillTimerThread(void) {}

BOOL ZEB_IsValidTimer(unsigned int) {
    return TRUE;
}

}  // extern "C"
