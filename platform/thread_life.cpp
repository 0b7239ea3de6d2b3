// Which thread objects exist, and what they share with their threads.

#include "platform/thread_life.h"

#include <new>

namespace vidshow {

namespace {

pthread_mutex_t g_lock = PTHREAD_MUTEX_INITIALIZER;
ThreadLife* g_living;    // guarded by g_lock
uintptr_t g_lastSerial;  // guarded by g_lock

}  // namespace

ThreadLife* BeginLife(CLinuxThread* thread, CLNrwqueue* queue) {
    auto* life = new (std::nothrow) ThreadLife{};
    if (life == nullptr) return nullptr;
    life->thread = thread;
    life->queue = queue;
    life->holders = 1;
    MutexLock lock(&g_lock);
    life->serial = ++g_lastSerial;
    life->next = g_living;
    g_living = life;
    return life;
}

void EndLife(ThreadLife* life) {
    if (life == nullptr) return;
    {
        MutexLock lock(&g_lock);
        ThreadLife** link = &g_living;
        while (*link != life)
            link = &(*link)->next;
        *link = life->next;
        life->thread = nullptr;
        life->queue = nullptr;
    }
    ReleaseLife(life);
}

void HoldLife(ThreadLife* life) {
    ++life->holders;
}

void ReleaseLife(ThreadLife* life) {
    if (--life->holders == 0) delete life;
}

void StoreExitCode(ThreadLife* life, int code) {
    MutexLock lock(&g_lock);
    if (life->thread != nullptr) life->thread->SetExitCode(code);
}

LivingThreads::LivingThreads() : m_lock(&g_lock) {}

ThreadLife* LivingThreads::Find(const CLinuxThread* thread) const {
    ThreadLife* life = g_living;
    while (life != nullptr && life->thread != thread)
        life = life->next;
    return life;
}

CLinuxThread* LivingThreads::Find(uintptr_t serial) const {
    const ThreadLife* life = g_living;
    while (life != nullptr && life->serial != serial)
        life = life->next;
    return life != nullptr ? life->thread : nullptr;
}

}  // namespace vidshow
