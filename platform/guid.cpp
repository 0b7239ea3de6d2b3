// Identifiers, compared as four 32-bit words.

#include <cstring>

#include "vidshow/platform/misc.h"

extern "C" BOOL IsEqualGUID(const GUID& a, const GUID& b) {
    return std::memcmp(&a, &b, sizeof(GUID)) == 0;
}

bool operator==(const GUID& a, const GUID& b) {
    return IsEqualGUID(a, b) != 0;
}

bool operator!=(const GUID& a, const GUID& b) {
    return !(a == b);
}
