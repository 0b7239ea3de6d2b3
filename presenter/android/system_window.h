#pragma once

// The native window as Android 4.2 to 4.4 lay it out in memory. The NDK keeps it opaque; queueing a
// decoder's buffer and scaling it to the window go through the hooks below, which only this layout
// reaches. Order and width of every member are the platform's: nothing here may be rearranged.

#include <android/native_window.h>
#include <stdint.h>

#include <cstddef>

/// Operations of `ANativeWindow::perform`, with the arguments that follow the operation.
enum {
    NATIVE_WINDOW_SET_USAGE = 0,                     // int
    NATIVE_WINDOW_CONNECT = 1,                       // none; from before there were several APIs
    NATIVE_WINDOW_DISCONNECT = 2,                    // none; likewise
    NATIVE_WINDOW_SET_CROP = 3,                      // const ARect*
    NATIVE_WINDOW_SET_BUFFER_COUNT = 4,              // size_t
    NATIVE_WINDOW_SET_BUFFERS_GEOMETRY = 5,          // int width, int height, int format
    NATIVE_WINDOW_SET_BUFFERS_TRANSFORM = 6,         // int
    NATIVE_WINDOW_SET_BUFFERS_TIMESTAMP = 7,         // int64_t, nanoseconds
    NATIVE_WINDOW_SET_BUFFERS_DIMENSIONS = 8,        // int width, int height
    NATIVE_WINDOW_SET_BUFFERS_FORMAT = 9,            // int
    NATIVE_WINDOW_SET_SCALING_MODE = 10,             // int
    NATIVE_WINDOW_LOCK = 11,                         // ANativeWindow_Buffer*, ARect*
    NATIVE_WINDOW_UNLOCK_AND_POST = 12,              // none
    NATIVE_WINDOW_API_CONNECT = 13,                  // int
    NATIVE_WINDOW_API_DISCONNECT = 14,               // int
    NATIVE_WINDOW_SET_BUFFERS_USER_DIMENSIONS = 15,  // int width, int height
    NATIVE_WINDOW_SET_POST_TRANSFORM_CROP = 16,      // const ARect*
};

/// Argument of `NATIVE_WINDOW_SET_SCALING_MODE`.
enum {
    NATIVE_WINDOW_SCALING_MODE_FREEZE = 0,           // show nothing until sizes match
    NATIVE_WINDOW_SCALING_MODE_SCALE_TO_WINDOW = 1,  // stretch both dimensions
    NATIVE_WINDOW_SCALING_MODE_SCALE_CROP = 2,       // fill the window, cut what stands out
    NATIVE_WINDOW_SCALING_MODE_NO_SCALE_CROP = 3,    // keep the size, cut what stands out
};

/// Argument of `NATIVE_WINDOW_API_CONNECT`: who fills the buffers.
enum {
    NATIVE_WINDOW_API_EGL = 1,
    NATIVE_WINDOW_API_CPU = 2,
    NATIVE_WINDOW_API_MEDIA = 3,
    NATIVE_WINDOW_API_CAMERA = 4,
};

/// Values that `ANativeWindow::query` knows.
enum {
    NATIVE_WINDOW_WIDTH = 0,
    NATIVE_WINDOW_HEIGHT = 1,
    NATIVE_WINDOW_FORMAT = 2,
    NATIVE_WINDOW_MIN_UNDEQUEUED_BUFFERS = 3,
    NATIVE_WINDOW_QUEUES_TO_WINDOW_COMPOSER = 4,
    NATIVE_WINDOW_CONCRETE_TYPE = 5,
    NATIVE_WINDOW_DEFAULT_WIDTH = 6,
    NATIVE_WINDOW_DEFAULT_HEIGHT = 7,
    NATIVE_WINDOW_TRANSFORM_HINT = 8,
    NATIVE_WINDOW_CONSUMER_RUNNING_BEHIND = 9,
};

/// Answers to `NATIVE_WINDOW_CONCRETE_TYPE`.
enum {
    NATIVE_WINDOW_FRAMEBUFFER = 0,
    NATIVE_WINDOW_SURFACE = 1,
};

constexpr int kNativeWindowMagic = '_' << 24 | 'w' << 16 | 'n' << 8 | 'd';
constexpr int kNativeBufferMagic = '_' << 24 | 'b' << 16 | 'f' << 8 | 'r';

/// Head of windows and of their buffers: what it is, how large, and who counts its references.
struct android_native_base_t {
    int magic;
    int version;  // size of the whole record in bytes
    void* reserved[4];
    void (*incRef)(android_native_base_t* base);
    void (*decRef)(android_native_base_t* base);
};

/// A buffer of graphics memory. One that nobody counts may leave the hooks empty.
struct ANativeWindowBuffer {
    android_native_base_t common = {
        kNativeBufferMagic, sizeof(ANativeWindowBuffer), {}, nullptr, nullptr};
    int width = 0;   // pixels
    int height = 0;  // pixels
    int stride = 0;  // pixels from one row to the next
    int format = 0;
    int usage = 0;
    void* reserved[2] = {};
    const void* handle = nullptr;  // the graphics allocator's
    void* reserved_proc[8] = {};

    void incStrong(const void* /*id*/) const {
        if (common.incRef != nullptr) common.incRef(const_cast<android_native_base_t*>(&common));
    }
    void decStrong(const void* /*id*/) const {
        if (common.decRef != nullptr) common.decRef(const_cast<android_native_base_t*>(&common));
    }
};

/// A window: state that never changes, then hooks. Hooks return 0 or a negative errno.
struct ANativeWindow {
    android_native_base_t common = {
        kNativeWindowMagic, sizeof(ANativeWindow), {}, nullptr, nullptr};
    uint32_t flags = 0;
    int minSwapInterval = 0;
    int maxSwapInterval = 0;
    float xdpi = 0;
    float ydpi = 0;
    intptr_t oem[4] = {};

    int (*setSwapInterval)(ANativeWindow* window, int interval) = nullptr;
    int (*dequeueBuffer_DEPRECATED)(ANativeWindow* window, ANativeWindowBuffer** buffer) = nullptr;
    int (*lockBuffer_DEPRECATED)(ANativeWindow* window, ANativeWindowBuffer* buffer) = nullptr;
    int (*queueBuffer_DEPRECATED)(ANativeWindow* window, ANativeWindowBuffer* buffer) = nullptr;
    int (*query)(const ANativeWindow* window, int what, int* value) = nullptr;
    int (*perform)(ANativeWindow* window, int operation, ...) = nullptr;
    int (*cancelBuffer_DEPRECATED)(ANativeWindow* window, ANativeWindowBuffer* buffer) = nullptr;
    // A fence is a file descriptor that says when the buffer may be touched; -1 is "now".
    int (*dequeueBuffer)(ANativeWindow* window, ANativeWindowBuffer** buffer, int* fence) = nullptr;
    int (*queueBuffer)(ANativeWindow* window, ANativeWindowBuffer* buffer, int fence) = nullptr;
    int (*cancelBuffer)(ANativeWindow* window, ANativeWindowBuffer* buffer, int fence) = nullptr;

    void incStrong(const void* /*id*/) const {
        common.incRef(const_cast<android_native_base_t*>(&common));
    }
    void decStrong(const void* /*id*/) const {
        common.decRef(const_cast<android_native_base_t*>(&common));
    }
};

// The device's numbers; wider addresses only keep the order.
static_assert(sizeof(void*) != 4 || sizeof(android_native_base_t) == 32, "head");
static_assert(sizeof(void*) != 4 || offsetof(android_native_base_t, incRef) == 24, "incRef");
static_assert(sizeof(void*) != 4 || offsetof(android_native_base_t, decRef) == 28, "decRef");
static_assert(sizeof(void*) != 4 || offsetof(ANativeWindowBuffer, width) == 32, "width");
static_assert(sizeof(void*) != 4 || offsetof(ANativeWindowBuffer, handle) == 60, "handle");
static_assert(sizeof(void*) != 4 || sizeof(ANativeWindowBuffer) == 96, "buffer");
static_assert(sizeof(void*) != 4 || offsetof(ANativeWindow, flags) == 32, "flags");
static_assert(sizeof(void*) != 4 || offsetof(ANativeWindow, oem) == 52, "oem");
static_assert(sizeof(void*) != 4 || offsetof(ANativeWindow, setSwapInterval) == 68, "interval");
static_assert(sizeof(void*) != 4 || offsetof(ANativeWindow, query) == 84, "query");
static_assert(sizeof(void*) != 4 || offsetof(ANativeWindow, perform) == 88, "perform");
static_assert(sizeof(void*) != 4 || offsetof(ANativeWindow, dequeueBuffer) == 96, "dequeue");
static_assert(sizeof(void*) != 4 || offsetof(ANativeWindow, queueBuffer) == 100, "queue");
static_assert(sizeof(void*) != 4 || offsetof(ANativeWindow, cancelBuffer) == 104, "cancel");
static_assert(sizeof(void*) != 4 || sizeof(ANativeWindow) == 108, "window");
