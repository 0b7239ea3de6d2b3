// Suspend and resume by two signals.
//
// Signal 10 makes a thread wait, inside the handler, for signal 12. Signals of one kind do not
// queue, so that after a quick series of suspends and resumes fewer of either arrive than were
// sent. What counts is therefore what was asked for last, which stands in the thread's life; the
// signals only make the thread look. Signal 12 is blocked from the moment the handler starts until
// it waits, so that a resume cannot slip in between the look and the wait.
//
// A thread that this layer has not started has no life. It waits for one signal 12.

#include "platform/thread_signals.h"

#include <errno.h>
#include <signal.h>

#include <cstdio>

#include "platform/thread_setup.h"

namespace vidshow {

namespace {

constexpr int kSuspendSignal = SIGUSR1;
constexpr int kResumeSignal = SIGUSR2;
static_assert(kSuspendSignal == 10 && kResumeSignal == 12, "clients know them by their numbers");

// Only what may be called by a signal handler, and errno as the interrupted code had it.
void OnSuspend(int) {
    const int interrupted = errno;
    sigset_t allButResume;
    sigfillset(&allButResume);
    sigdelset(&allButResume, kResumeSignal);
    const ThreadLife* life = OwnLife();
    if (life == nullptr) {
        sigsuspend(&allButResume);
    } else {
        while (life->suspended)
            sigsuspend(&allButResume);
    }
    errno = interrupted;
}

void OnResume(int) {}

bool Install(int signal, void (*handler)(int), int alsoBlocked) {
    struct sigaction action = {};
    action.sa_handler = handler;
    sigemptyset(&action.sa_mask);
    if (alsoBlocked != 0) sigaddset(&action.sa_mask, alsoBlocked);
    return sigaction(signal, &action, nullptr) == 0;
}

}  // namespace

void InstallSignalHandlers() {
    if (!Install(kSuspendSignal, OnSuspend, kResumeSignal)) {
        std::fputs("Unable to set suspend signal handler.\n", stderr);
    }
    if (!Install(kResumeSignal, OnResume, 0)) {
        std::fputs("Unable to set resume signal handler.\n", stderr);
    }
}

void SuspendSelf() {
    pthread_kill(pthread_self(), kSuspendSignal);
}

void RefuseSuspends() {
    sigset_t suspend;
    sigemptyset(&suspend);
    sigaddset(&suspend, kSuspendSignal);
    pthread_sigmask(SIG_BLOCK, &suspend, nullptr);
}

}  // namespace vidshow

int CLinuxThread::Suspend() {
    const pthread_t thread = m_thread;
    if (thread == 0) return -1;
    m_life->suspended = true;
    return pthread_kill(thread, vidshow::kSuspendSignal);
}

int CLinuxThread::Resume() {
    const pthread_t thread = m_thread;
    if (thread == 0) return -1;
    m_life->suspended = false;
    return pthread_kill(thread, vidshow::kResumeSignal);
}
