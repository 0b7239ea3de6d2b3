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

extern "C" {

/// @name Rectangles
/// Right and bottom lie one past the last column and row. A null rectangle is allowed only where
/// that is said.
/// @{

/// Stores the four numbers as they are, also out of order. @return 1; 0 for null
VIDSHOW_API BOOL SetRect(RECT* rect, int left, int top, int right, int bottom);

/// Moves a rectangle; coordinates wrap at 32 bits. @return 1; 0 for null
VIDSHOW_API BOOL OffsetRect(RECT* rect, int dx, int dy);

/// @return 1 for null and for a rectangle without a column or a row, else 0
VIDSHOW_API BOOL IsRectEmpty(const RECT* rect);

/// @return 1 when left <= x < right and top <= y < bottom, else 0; 0 for null
VIDSHOW_API BOOL PtInRect(const RECT* rect, LONG x, LONG y);

/// @return 1 when all four numbers are equal, else 0
VIDSHOW_API BOOL EqualRect(const RECT* a, const RECT* b);

/// Stores what `a` and `b` have in common; `dst` may be one of them.
/// @return 1; 0, with `dst` all zero, when that is empty
VIDSHOW_API BOOL IntersectRect(RECT* dst, const RECT* a, const RECT* b);

/// Stores the smallest rectangle around all corners of `a` and `b`, be they empty or not; `dst` may
/// be one of them. @return 1; 0, with `dst` all zero, when that is empty
VIDSHOW_API BOOL UnionRect(RECT* dst, const RECT* a, const RECT* b);

/// @}

/// @return 1 when the identifiers are equal, else 0
VIDSHOW_API BOOL IsEqualGUID(const GUID& a, const GUID& b);

/// Sets `bytes` bytes to zero.
VIDSHOW_API void ZeroMemory(void* dst, size_t bytes);

}  // extern "C"

VIDSHOW_API bool operator==(const GUID& a, const GUID& b);  ///< `IsEqualGUID`
VIDSHOW_API bool operator!=(const GUID& a, const GUID& b);  ///< not `IsEqualGUID`

#endif
