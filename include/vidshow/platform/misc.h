#ifndef VIDSHOW_PLATFORM_MISC_H
#define VIDSHOW_PLATFORM_MISC_H

/// @file
/// Rectangles, identifiers, counters, time, small helpers, and functions that only let code link.

#include "vidshow/types.h"

/// A machine's memory, as `GlobalMemoryStatus` makes it up.
struct MEMORYSTATUS {
    DWORD dwLength;
    DWORD dwMemoryLoad;
    DWORD dwTotalPhys;
    DWORD dwAvailPhys;
    DWORD dwTotalPageFile;
    DWORD dwAvailPageFile;
    DWORD dwTotalVirtual;
    DWORD dwAvailVirtual;
};
static_assert(sizeof(MEMORYSTATUS) == 32, "eight words");

#endif
