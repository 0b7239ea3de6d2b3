// Modules, and where the process's own program lies.

#include <dlfcn.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>

#include "platform/path.h"
#include "vidshow/platform/file.h"

extern "C" {

void* LoadLibrary(const char* name) {
    return vidshow::IsPath(name) ? dlopen(name, RTLD_LAZY) : nullptr;
}

BOOL FreeLibrary(void* module) {
    return module != nullptr && dlclose(module) == 0;
}

void* GetProcAddress(void* module, const char* name) {
    return dlsym(module, name);
}

DWORD GetModuleFileName(void*, char* buffer, DWORD size) {
    if (size == 0) return 0;
    char link[32];
    std::snprintf(link, sizeof link, "/proc/%u/exe", static_cast<unsigned>(getpid()));
    // No link is longer than a path, and the system refuses to be given 2 GiB of room.
    const size_t room = std::min<size_t>(size - 1, vidshow::kPathBytes);
    const ssize_t length = readlink(link, buffer, room);
    if (length <= 0) return 0;
    buffer[length] = '\0';
    return static_cast<DWORD>(length);
}

}  // extern "C"
