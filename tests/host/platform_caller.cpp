// Stands for a library that was linked with the platform's libraries.

#include "platform_caller.h"

#include "android/log.h"

int CallLock(ANativeWindow* window, ANativeWindow_Buffer* buffer) {
    return ANativeWindow_lock(window, buffer, nullptr);
}

int CallPost(ANativeWindow* window) {
    return ANativeWindow_unlockAndPost(window);
}

void CallLog(const char* text) {
    __android_log_print(ANDROID_LOG_ERROR, "Caller", "%s", text);
}

bool CallSetInt32(android::MetaData* data, uint32_t key, int32_t value) {
    return data->setInt32(key, value);
}
