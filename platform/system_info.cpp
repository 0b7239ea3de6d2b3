// What clients ask about the machine, answered without looking at it.

#include <cstring>

#include "vidshow/platform/misc.h"

namespace {
const char kSystemDirectory[] = "/usr";
}

extern "C" {

UINT GetSystemDirectory(char* buffer, DWORD size) {
    if (size < sizeof kSystemDirectory) return sizeof kSystemDirectory;
    std::memcpy(buffer, kSystemDirectory, sizeof kSystemDirectory);
    return sizeof kSystemDirectory - 1;
}

void GlobalMemoryStatus(MEMORYSTATUS* status) {
    *status = MEMORYSTATUS{32, 0, 128, 32, 128, 32, 0, 0};
}

}  // extern "C"
