// The step that drops the messages of timers that are gone. In the library every timer counts as
// valid; here the reading of messages is compiled together with a test of validity that can say
// otherwise.

#include <gtest/gtest.h>

#include <set>
#include <vector>

#include "vidshow/platform/thread.h"
#include "vidshow/platform/timer.h"

namespace {

std::set<unsigned int> g_gone;
std::vector<unsigned int> g_asked;

}  // namespace

extern "C" BOOL ZEB_IsValidTimer(unsigned int sequence) {
    g_asked.push_back(sequence);
    return g_gone.count(sequence) == 0;
}

namespace {

class TimerMessages : public testing::Test {
  protected:
    TimerMessages() {
        g_gone.clear();
        g_asked.clear();
        m_thread.Init(nullptr, nullptr, 2);
    }
    void Post(unsigned int message, unsigned int wParam) {
        EXPECT_EQ(m_thread.PostMessage(message, wParam, 0), 1);
    }
    std::pair<unsigned int, unsigned int> Read() {
        unsigned int message = 0;
        unsigned int wParam = 0;
        long lParam = 0;
        EXPECT_EQ(m_thread.GetMessage(&message, &wParam, &lParam), 1);
        return {message, wParam};
    }
    using Pair = std::pair<unsigned int, unsigned int>;

    CLinuxThread m_thread;
};

TEST_F(TimerMessages, OfTimersThatAreGoneAreDropped) {
    g_gone = {2, 3};
    Post(WM_TIMER, 2);
    Post(WM_TIMER, 3);
    Post(WM_TIMER, 4);
    Post(WM_TIMER, 2);
    Post(1, 2);
    EXPECT_EQ(Read(), Pair(WM_TIMER, 4));
    EXPECT_EQ(Read(), Pair(1, 2)) << "no timer's message, whatever its wParam";
    EXPECT_EQ(g_asked, (std::vector<unsigned int>{2, 3, 4, 2}));
}

TEST_F(TimerMessages, OfLivingTimersPass) {
    Post(WM_TIMER, 0);
    Post(WM_TIMER, 0xFFFFFFFF);
    EXPECT_EQ(Read(), Pair(WM_TIMER, 0));
    EXPECT_EQ(Read(), Pair(WM_TIMER, 0xFFFFFFFF));
}

TEST_F(TimerMessages, AreNotDroppedByALook) {
    g_gone = {2};
    Post(WM_TIMER, 2);
    unsigned int message = 0;
    unsigned int wParam = 0;
    long lParam = 0;
    EXPECT_EQ(m_thread.PeekMessage(&message, &wParam, &lParam, 0, 0, true), 1);
    EXPECT_EQ(message, WM_TIMER);
    EXPECT_TRUE(g_asked.empty());
}

}  // namespace
