#include "presenter/log.h"

#include <android/log.h>

#include <cstdarg>
#include <cstdio>

namespace vidshow {

void Log(int level, const char* format, ...) {
    if (level != kLogError) return;
    char text[256] = {};
    va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(text, sizeof text, format, arguments);
    va_end(arguments);
    __android_log_print(ANDROID_LOG_ERROR, "QzVidshow", "%s", text);
}

}  // namespace vidshow
