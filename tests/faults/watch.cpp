// The program's definitions of the system's calls, which the library's calls arrive at. A call from
// anywhere else, told by its return address, goes on unnoticed.

#include "faults/watch.h"

#include <android/native_window.h>
#include <dlfcn.h>
#include <errno.h>
#include <fcntl.h>
#include <link.h>
#include <pthread.h>
#include <semaphore.h>
#include <sys/mman.h>
#include <unistd.h>

#include <atomic>
#include <cstdarg>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <new>

#include "vidshow/presenter.h"

namespace {

// Plain data: it is used before constructors have run, and from inside malloc.
std::atomic<bool> g_watching;
std::atomic<int> g_left;  // requests until the one that is refused
std::atomic<const char*> g_refused;
std::atomic<int> g_heldLocks;
std::atomic<int> g_liveViews;
uintptr_t g_from, g_to;  // the library's code

constexpr int kMostBlocks = 4096;
std::atomic<void*> g_blocks[kMostBlocks];

int FindLibrary(dl_phdr_info* info, size_t, void* inside) {
    for (int i = 0; i < info->dlpi_phnum; ++i) {
        const auto& part = info->dlpi_phdr[i];
        const uintptr_t from = info->dlpi_addr + part.p_vaddr;
        const uintptr_t address = reinterpret_cast<uintptr_t>(inside);
        if (part.p_type != PT_LOAD || address < from || address >= from + part.p_memsz) continue;
        g_from = from;
        g_to = from + part.p_memsz;
        return 1;
    }
    return 0;
}

bool IsWatched(const void* caller) {
    const uintptr_t address = reinterpret_cast<uintptr_t>(caller);
    return g_watching && address >= g_from && address < g_to;
}

bool IsDue(const char* name) {
    if (g_left-- != 0) return false;
    g_refused = name;
    return true;
}

bool Refuses(const void* caller, const char* name) {
    return IsWatched(caller) && IsDue(name);
}

template <typename Function>
Function* Next(Function*, const char* name) {
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

[[maybe_unused]] void Note(const void* caller, void* block) {
    if (block == nullptr || !IsWatched(caller)) return;
    for (std::atomic<void*>& place : g_blocks) {
        void* none = nullptr;
        if (place.compare_exchange_strong(none, block)) return;
    }
    std::abort();  // a scenario so large is not meant
}

[[maybe_unused]] void Forget(void* block) {
    if (block == nullptr) return;
    for (std::atomic<void*>& place : g_blocks) {
        void* held = block;
        if (place.compare_exchange_strong(held, nullptr)) return;
    }
}

}  // namespace

namespace faults {

Watch::Watch(int failing) {
    if (g_to == 0) dl_iterate_phdr(FindLibrary, dlsym(RTLD_DEFAULT, "getVersion"));
    if (g_to == 0) std::abort();
    for (std::atomic<void*>& place : g_blocks)
        place = nullptr;
    g_left = failing;
    g_refused = nullptr;
    g_heldLocks = g_liveViews = 0;
    g_watching = true;
}

Watch::~Watch() {
    g_watching = false;
}

const char* Watch::refused() const {
    return g_refused;
}

int Watch::heldLocks() const {
    return g_heldLocks;
}

int Watch::liveBlocks() const {
    int live = 0;
    for (const std::atomic<void*>& place : g_blocks)
        live += place != nullptr;
    return live;
}

int Watch::liveViews() const {
    return g_liveViews;
}

bool IsRefused(const char* name) {
    return g_watching && IsDue(name);
}

}  // namespace faults

#define CALLER __builtin_return_address(0)
// The call as the system makes it, or what refusing it looks like.
#define NEXT(name) (*Next(&::name, #name))

#pragma GCC visibility push(default)

#if !defined(VIDSHOW_TEST_SANITIZED)
extern "C" {

void* __libc_malloc(size_t bytes);
void* __libc_calloc(size_t count, size_t bytes);
void __libc_free(void* block);

void* malloc(size_t bytes) {
    if (Refuses(CALLER, "malloc")) return nullptr;
    void* const block = __libc_malloc(bytes);
    Note(CALLER, block);
    return block;
}

void* calloc(size_t count, size_t bytes) {
    if (Refuses(CALLER, "calloc")) return nullptr;
    void* const block = __libc_calloc(count, bytes);
    Note(CALLER, block);
    return block;
}

void free(void* block) {
    if (g_watching) Forget(block);
    __libc_free(block);
}

}  // extern "C"
#endif

void* operator new(size_t bytes, const std::nothrow_t&) noexcept {
    if (Refuses(CALLER, "new")) return nullptr;
    void* const block = ::operator new(bytes);
#if !defined(VIDSHOW_TEST_SANITIZED)
    Note(CALLER, block);
#endif
    return block;
}

void* operator new[](size_t bytes, const std::nothrow_t&) noexcept {
    if (Refuses(CALLER, "new[]")) return nullptr;
    void* const block = ::operator new[](bytes);
#if !defined(VIDSHOW_TEST_SANITIZED)
    Note(CALLER, block);
#endif
    return block;
}

extern "C" {

int pthread_create(pthread_t* thread, const pthread_attr_t* attributes, void* (*start)(void*),
                   void* argument) noexcept {
    if (Refuses(CALLER, "pthread_create")) return EAGAIN;
    return NEXT(pthread_create)(thread, attributes, start, argument);
}

int pthread_join(pthread_t thread, void** result) {
    if (Refuses(CALLER, "pthread_join")) return EINVAL;
    return NEXT(pthread_join)(thread, result);
}

int pthread_mutex_lock(pthread_mutex_t* mutex) noexcept {
    static const auto real = Next(&::pthread_mutex_lock, "pthread_mutex_lock");
    if (Refuses(CALLER, "pthread_mutex_lock")) return EINVAL;
    const int error = real(mutex);
    if (error == 0 && IsWatched(CALLER)) ++g_heldLocks;
    return error;
}

int pthread_mutex_unlock(pthread_mutex_t* mutex) noexcept {
    static const auto real = Next(&::pthread_mutex_unlock, "pthread_mutex_unlock");
    const int error = real(mutex);
    if (error == 0 && IsWatched(CALLER)) --g_heldLocks;
    return error;
}

int pthread_mutex_trylock(pthread_mutex_t* mutex) noexcept {
    if (Refuses(CALLER, "pthread_mutex_trylock")) return EBUSY;
    const int error = NEXT(pthread_mutex_trylock)(mutex);
    if (error == 0 && IsWatched(CALLER)) ++g_heldLocks;
    return error;
}

int sem_init(sem_t* semaphore, int shared, unsigned int value) noexcept {
    if (!Refuses(CALLER, "sem_init")) return NEXT(sem_init)(semaphore, shared, value);
    errno = ENOSPC;
    return -1;
}

int sem_post(sem_t* semaphore) noexcept {
    if (!Refuses(CALLER, "sem_post")) return NEXT(sem_post)(semaphore);
    errno = EOVERFLOW;
    return -1;
}

int open(const char* path, int flags, ...) {
    va_list arguments;
    va_start(arguments, flags);
    const unsigned mode = va_arg(arguments, unsigned);
    va_end(arguments);
    if (!Refuses(CALLER, "open")) return NEXT(open)(path, flags, mode);
    errno = EMFILE;
    return -1;
}

int dup(int descriptor) noexcept {
    if (!Refuses(CALLER, "dup")) return NEXT(dup)(descriptor);
    errno = EMFILE;
    return -1;
}

int pipe(int ends[2]) noexcept {
    if (!Refuses(CALLER, "pipe")) return NEXT(pipe)(ends);
    errno = EMFILE;
    return -1;
}

void* mmap(void* wanted, size_t bytes, int protection, int flags, int file, off_t offset) noexcept {
    static const auto real = Next(&::mmap, "mmap");
    if (Refuses(CALLER, "mmap")) {
        errno = ENOMEM;
        return MAP_FAILED;
    }
    void* const view = real(wanted, bytes, protection, flags, file, offset);
    if (view != MAP_FAILED && IsWatched(CALLER)) ++g_liveViews;
    return view;
}

int munmap(void* view, size_t bytes) noexcept {
    static const auto real = Next(&::munmap, "munmap");
    if (IsWatched(CALLER)) --g_liveViews;
    return real(view, bytes);
}

int32_t ANativeWindow_setBuffersGeometry(ANativeWindow* window, int32_t width, int32_t height,
                                         int32_t format) {
    if (Refuses(CALLER, "ANativeWindow_setBuffersGeometry")) return -ENOMEM;
    return NEXT(ANativeWindow_setBuffersGeometry)(window, width, height, format);
}

int32_t ANativeWindow_lock(ANativeWindow* window, ANativeWindow_Buffer* buffer, ARect* dirty) {
    if (Refuses(CALLER, "ANativeWindow_lock")) return -ENOMEM;
    return NEXT(ANativeWindow_lock)(window, buffer, dirty);
}

int32_t ANativeWindow_unlockAndPost(ANativeWindow* window) {
    const bool refuses = Refuses(CALLER, "ANativeWindow_unlockAndPost");
    const int32_t result = NEXT(ANativeWindow_unlockAndPost)(window);
    return refuses ? -EINVAL : result;
}

}  // extern "C"
#pragma GCC visibility pop
