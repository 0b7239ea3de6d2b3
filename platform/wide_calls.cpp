// Win32's own wide-character calls, by the layer's notion of a wide string.

#include <stdio.h>

#include "platform/path.h"
#include "platform/wide.h"
#include "vidshow/platform/misc.h"

namespace wide = vidshow::wide;

namespace {
constexpr size_t kModeCharacters = 9;
}

extern "C" {

int _wtoi(const wchar_t* text) {
    char* end;
    return static_cast<int>(wide::ToLong(text, &end, 10));
}

int _swprintf(wchar_t*, const wchar_t*, ...) {
    return wide::FailToFormat();
}

// A path that does not fit is cut to one that is still too long for the system, so that no other
// file is opened in its place. A mode that does not fit is cut and used.
FILE* _wfopen(const wchar_t* path, const wchar_t* mode) {
    char narrowPath[vidshow::kPathBytes + 1];
    char narrowMode[kModeCharacters + 1] = {};
    narrowPath[vidshow::kPathBytes] = '\0';
    wide::Copy(narrowPath, wide::Bytes(path), vidshow::kPathBytes);
    wide::Copy(narrowMode, wide::Bytes(mode), kModeCharacters);
    return fopen(narrowPath, narrowMode);
}

}  // extern "C"
