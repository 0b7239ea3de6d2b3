// How late a thousand periodic timers are: ours, one timerfd for each, and a thread with a list and
// a condition variable written directly. Prints a table in Markdown, lateness in milliseconds.
// usage: platform_timer_bench [SECONDS]   (each of the three runs so long; 5)

#include <pthread.h>
#include <sys/epoll.h>
#include <sys/timerfd.h>
#include <time.h>
#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <map>
#include <queue>
#include <utility>
#include <vector>

#include "vidshow/platform.h"

namespace {

constexpr int kTimers = 1000;

unsigned int PeriodOf(int timer) {
    return 100 + static_cast<unsigned int>(timer) % 100;  // milliseconds
}

double Now() {  // milliseconds of the wall clock, which is the one that ours are by
    timespec now;
    clock_gettime(CLOCK_REALTIME, &now);
    return static_cast<double>(now.tv_sec) * 1e3 + static_cast<double>(now.tv_nsec) * 1e-6;
}

timespec AtMilliseconds(double ms) {
    timespec at;
    at.tv_sec = static_cast<time_t>(ms / 1e3);
    at.tv_nsec = static_cast<long>((ms - static_cast<double>(at.tv_sec) * 1e3) * 1e6);
    return at;
}

// What a run notes: how late each expiry was seen. Missed periods are skipped.
class Lateness {
  public:
    // `expiry` of a timer was seen now. @return the expiry that comes next
    double Note(double expiry, double period) {
        const double now = Now();
        m_late.push_back(now - expiry);
        do {
            expiry += period;
        } while (expiry <= now);
        return expiry;
    }

    void Print(const char* name, double processorSeconds) {
        std::sort(m_late.begin(), m_late.end());
        std::printf("| %s | %zu | %.3f | %.3f | %.3f | %.3f | %.3f | %.2f |\n", name, m_late.size(),
                    At(0.5), At(0.9), At(0.99), At(0.999), m_late.back(), processorSeconds);
        std::fflush(stdout);
    }

  private:
    double At(double part) const {
        return m_late[static_cast<size_t>(part * static_cast<double>(m_late.size() - 1))];
    }

    std::vector<double> m_late;
};

double ProcessorSeconds() {
    timespec now;
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) * 1e-9;
}

// Ours: seen where the owner reads the message.
void RunOurs(double end, Lateness* lateness) {
    struct Expected {
        double expiry;
        double period;
    };
    CLinuxTimerMgr timers;
    timers.LaunchTimerThread();
    std::map<LPARAM, Expected> expected;
    for (int i = 0; i < kTimers; ++i) {
        const double period = PeriodOf(i);
        const double expiry = Now() + period;
        const CLinuxTimer* timer = timers.SetTimer(PeriodOf(i), nullptr);
        expected[reinterpret_cast<LPARAM>(timer)] = {expiry, period};
    }
    MSG message;
    while (Now() < end && GetMessage(&message, nullptr, 0, 0) != 0) {
        Expected& timer = expected[message.lParam];
        timer.expiry = lateness->Note(timer.expiry, timer.period);
    }
}

// One descriptor for each timer, all waited for by one thread.
void RunTimerfd(double end, Lateness* lateness) {
    struct Timer {
        int descriptor;
        double expiry;
        double period;
    };
    std::vector<Timer> timers(kTimers);
    const int poll = epoll_create(kTimers);
    for (int i = 0; i < kTimers; ++i) {
        Timer& timer = timers[static_cast<size_t>(i)];
        timer.period = PeriodOf(i);
        timer.expiry = Now() + timer.period;
        timer.descriptor = timerfd_create(CLOCK_REALTIME, 0);
        itimerspec when = {};
        when.it_value = AtMilliseconds(timer.expiry);
        when.it_interval = AtMilliseconds(timer.period);
        timerfd_settime(timer.descriptor, TFD_TIMER_ABSTIME, &when, nullptr);
        epoll_event event = {};
        event.events = EPOLLIN;
        event.data.u32 = static_cast<uint32_t>(i);
        epoll_ctl(poll, EPOLL_CTL_ADD, timer.descriptor, &event);
    }
    epoll_event events[64];
    while (Now() < end) {
        const int count = epoll_wait(poll, events, 64, 100);
        for (int i = 0; i < count; ++i) {
            Timer& timer = timers[events[i].data.u32];
            uint64_t expirations = 0;
            if (read(timer.descriptor, &expirations, sizeof expirations) < 0) continue;
            timer.expiry = lateness->Note(timer.expiry, timer.period);
        }
    }
    for (const Timer& timer : timers)
        close(timer.descriptor);
    close(poll);
}

// One thread that sleeps on a condition until the earliest of a heap is due.
void RunCondition(double end, Lateness* lateness) {
    using Timer = std::pair<double, double>;  // expiry, period
    std::priority_queue<Timer, std::vector<Timer>, std::greater<Timer>> timers;
    for (int i = 0; i < kTimers; ++i)
        timers.push({Now() + PeriodOf(i), PeriodOf(i)});
    pthread_mutex_t mutex = PTHREAD_MUTEX_INITIALIZER;
    pthread_cond_t condition = PTHREAD_COND_INITIALIZER;
    pthread_mutex_lock(&mutex);
    while (Now() < end) {
        const Timer timer = timers.top();
        const timespec expiry = AtMilliseconds(timer.first);
        while (Now() < timer.first)
            pthread_cond_timedwait(&condition, &mutex, &expiry);
        timers.pop();
        timers.push({lateness->Note(timer.first, timer.second), timer.second});
    }
    pthread_mutex_unlock(&mutex);
}

void Run(const char* name, double seconds, void (*run)(double end, Lateness*)) {
    Lateness lateness;
    const double before = ProcessorSeconds();
    run(Now() + seconds * 1e3, &lateness);
    lateness.Print(name, ProcessorSeconds() - before);
}

}  // namespace

int main(int argc, char** argv) {
    const double seconds = argc > 1 ? std::atof(argv[1]) : 5;
    std::printf("| %d timers | expiries | median | 90 %% | 99 %% | 99.9 %% | most | CPU, s |\n",
                kTimers);
    std::printf("|---|--:|--:|--:|--:|--:|--:|--:|\n");
    Run("CLinuxTimerMgr, read as messages", seconds, RunOurs);
    Run("timerfd and epoll", seconds, RunTimerfd);
    Run("heap and pthread_cond_timedwait", seconds, RunCondition);
    return 0;
}
