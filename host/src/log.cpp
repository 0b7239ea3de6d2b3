// The device's log, on standard error or in a callback.

#include <cstdarg>
#include <cstdio>
#include <functional>
#include <mutex>
#include <utility>

#include "android/log.h"
#include "vidshow-host/window.h"

namespace {

std::mutex g_sinkLock;
std::function<void(int, const char*, const char*)> g_sink;  // guarded by g_sinkLock

}  // namespace

namespace vidshow::host {

void setLogSink(std::function<void(int, const char*, const char*)> sink) {
    const std::lock_guard<std::mutex> lock(g_sinkLock);
    g_sink = std::move(sink);
}

}  // namespace vidshow::host

extern "C" VIDSHOW_HOST_API int __android_log_print(int priority, const char* tag,
                                                    const char* format, ...) {
    char text[1024];
    va_list arguments;
    va_start(arguments, format);
    const int length = std::vsnprintf(text, sizeof text, format, arguments);
    va_end(arguments);

    const std::lock_guard<std::mutex> lock(g_sinkLock);
    if (g_sink) {
        g_sink(priority, tag, text);
    } else {
        std::fprintf(stderr, "%c/%s: %s\n", "??VDIWEFS"[priority & 7], tag, text);
    }
    return length;
}
