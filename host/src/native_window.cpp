// The NDK's window calls. Each goes through the window's own hooks, so they work on any window.

#include "android/native_window.h"

#include "presenter/android/system_window.h"
#include "vidshow-host/export.h"

namespace {

int32_t queryWindow(ANativeWindow* window, int what) {
    int value = 0;
    const int error = window->query(window, what, &value);
    return error < 0 ? error : value;
}

}  // namespace

extern "C" {

VIDSHOW_HOST_API void ANativeWindow_acquire(ANativeWindow* window) {
    window->incStrong(nullptr);
}

VIDSHOW_HOST_API void ANativeWindow_release(ANativeWindow* window) {
    window->decStrong(nullptr);
}

VIDSHOW_HOST_API int32_t ANativeWindow_getWidth(ANativeWindow* window) {
    return queryWindow(window, NATIVE_WINDOW_WIDTH);
}

VIDSHOW_HOST_API int32_t ANativeWindow_getHeight(ANativeWindow* window) {
    return queryWindow(window, NATIVE_WINDOW_HEIGHT);
}

VIDSHOW_HOST_API int32_t ANativeWindow_getFormat(ANativeWindow* window) {
    return queryWindow(window, NATIVE_WINDOW_FORMAT);
}

VIDSHOW_HOST_API int32_t ANativeWindow_setBuffersGeometry(ANativeWindow* window, int32_t width,
                                                          int32_t height, int32_t format) {
    return window->perform(window, NATIVE_WINDOW_SET_BUFFERS_GEOMETRY, width, height, format);
}

VIDSHOW_HOST_API int32_t ANativeWindow_lock(ANativeWindow* window, ANativeWindow_Buffer* outBuffer,
                                            ARect* inOutDirtyBounds) {
    return window->perform(window, NATIVE_WINDOW_LOCK, outBuffer, inOutDirtyBounds);
}

VIDSHOW_HOST_API int32_t ANativeWindow_unlockAndPost(ANativeWindow* window) {
    return window->perform(window, NATIVE_WINDOW_UNLOCK_AND_POST);
}

}  // extern "C"
