// Environment variables, among them the one that names the directory of a client's modules.

#include <cstdlib>
#include <cstring>

#include "platform/path.h"
#include "vidshow/platform/file.h"

namespace {
const char kDllDirectory[] = "QZ_DLL_PATH";
}

extern "C" {

DWORD GetDllDirectory(DWORD size, char* buffer) {
    const char* directory = std::getenv(kDllDirectory);
    const size_t length = directory != nullptr ? std::strlen(directory) : 0;
    if (directory == nullptr || length >= size) return 0;
    std::memcpy(buffer, directory, length + 1);
    return static_cast<DWORD>(length);
}

// The system's result as it is, 0 for success: clients rely on it.
int SetDllDirectory(const char* path) {
    return vidshow::IsPath(path) ? setenv(kDllDirectory, path, 1) : -1;
}

// Taking a variable away answers 0 even though it is done: clients rely on it.
BOOL SetEnvironmentVariable(const char* name, const char* value) {
    if (value != nullptr) return setenv(name, value, 1) == 0;
    unsetenv(name);
    return FALSE;
}

}  // extern "C"
