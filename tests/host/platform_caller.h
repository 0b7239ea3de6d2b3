#pragma once

#include "presenter/android/media_framework.h"

int CallLock(ANativeWindow* window, ANativeWindow_Buffer* buffer);
int CallPost(ANativeWindow* window);
void CallLog(const char* text);
bool CallSetInt32(android::MetaData* data, uint32_t key, int32_t value);
