// The clock and Sleep with a clock of the test's own, so that nothing here really sleeps.

#include <errno.h>
#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

#include "platform/posix_hooks.h"
#include "vidshow/platform/misc.h"

namespace {

using posix_hooks::Replacement;

uint64_t g_microseconds;
int g_clockReads;
int g_yields;
std::vector<timespec> g_sleeps;
std::vector<int> g_sleepErrors;  // one for each sleep to come; 0 and the end of the list: none
uint64_t g_sleptMicroseconds;    // how far a sleep moves the clock

int ReadTestClock(timeval* now, void*) {
    ++g_clockReads;
    now->tv_sec = static_cast<time_t>(g_microseconds / 1000000);
    now->tv_usec = static_cast<suseconds_t>(g_microseconds % 1000000);
    return 0;
}

int FailToReadClock(timeval*, void*) {
    return -1;
}

int RecordSleep(const timespec* span, timespec*) {
    g_sleeps.push_back(*span);
    g_microseconds += g_sleptMicroseconds;
    const size_t turn = g_sleeps.size() - 1;
    const int error = turn < g_sleepErrors.size() ? g_sleepErrors[turn] : 0;
    if (error == 0) return 0;
    errno = error;
    return -1;
}

int CountYield() {
    ++g_yields;
    return 0;
}

class HookedTime : public testing::Test {
  protected:
    HookedTime() {
        g_microseconds = 5000000;
        g_clockReads = g_yields = 0;
        g_sleeps.clear();
        g_sleepErrors.clear();
        g_sleptMicroseconds = 0;
    }

    void ExpectSleep(size_t turn, time_t seconds, long nanoseconds) {
        ASSERT_LT(turn, g_sleeps.size());
        EXPECT_EQ(g_sleeps[turn].tv_sec, seconds);
        EXPECT_EQ(g_sleeps[turn].tv_nsec, nanoseconds);
    }

  private:
    Replacement<int(timeval*, void*)> m_clock{posix_hooks::clockRead, ReadTestClock};
    Replacement<int(const timespec*, timespec*)> m_sleep{posix_hooks::sleepNanoseconds,
                                                         RecordSleep};
    Replacement<int()> m_yield{posix_hooks::yield, CountYield};
};

TEST_F(HookedTime, MillisecondsAreTruncated) {
    g_microseconds = 12345999;
    EXPECT_EQ(timeGetTime(), 12345u);
    EXPECT_EQ(GetTickCount(), 12345u);
}

TEST_F(HookedTime, MillisecondsWrapAt32Bits) {
    const uint64_t wrap = uint64_t{1} << 32;
    g_microseconds = (wrap - 1) * 1000;
    EXPECT_EQ(timeGetTime(), 0xFFFFFFFFu);
    g_microseconds = wrap * 1000;
    EXPECT_EQ(timeGetTime(), 0u);
    g_microseconds = (3 * wrap / 8 + 7) * 1000;
    EXPECT_EQ(GetTickCount(), 0x60000007u);
}

TEST_F(HookedTime, UnreadableClockReadsZero) {
    Replacement<int(timeval*, void*)> broken(posix_hooks::clockRead, FailToReadClock);
    EXPECT_EQ(timeGetTime(), 0u);
    EXPECT_EQ(GetTickCount(), 0u);
}

TEST_F(HookedTime, SleepZeroReturnsWithoutYielding) {
    Sleep(0);
    EXPECT_TRUE(g_sleeps.empty());
    EXPECT_EQ(g_yields, 0);
}

TEST_F(HookedTime, SleepInfiniteReturnsAtOnce) {
    Sleep(INFINITE);
    EXPECT_TRUE(g_sleeps.empty());
}

TEST_F(HookedTime, SleepAcrossTheWrapReturnsAtOnce) {
    g_microseconds = 0xFFFFFF00u * uint64_t{1000};
    Sleep(0x100);
    EXPECT_TRUE(g_sleeps.empty());
    Sleep(0xFF);
    EXPECT_EQ(g_sleeps.size(), 1u) << "the last millisecond before the wrap can be slept to";
}

TEST_F(HookedTime, SleepSplitsSecondsAndReadsTheClockTwice) {
    Sleep(2345);
    ASSERT_EQ(g_sleeps.size(), 1u);
    ExpectSleep(0, 2, 345000000);
    EXPECT_EQ(g_clockReads, 2) << "once for the target, once for the rest; not after the sleep";
}

TEST_F(HookedTime, InterruptedSleepGoesOnForWhatIsLeft) {
    g_sleepErrors = {EINTR, EINTR};
    g_sleptMicroseconds = 1200000;
    Sleep(2999);
    ASSERT_EQ(g_sleeps.size(), 3u);
    ExpectSleep(0, 2, 999000000);
    ExpectSleep(1, 1, 799000000);
    ExpectSleep(2, 0, 599000000);
}

TEST_F(HookedTime, SleepInterruptedAtItsEndReturns) {
    g_sleepErrors = {EINTR};
    g_sleptMicroseconds = 50000;
    Sleep(50);
    EXPECT_EQ(g_sleeps.size(), 1u);
}

TEST_F(HookedTime, SleepThatFailsOtherwiseReturns) {
    g_sleepErrors = {EINVAL};
    Sleep(50);
    EXPECT_EQ(g_sleeps.size(), 1u);
}

}  // namespace
