#ifndef VIDSHOW_PLATFORM_MISC_H
#define VIDSHOW_PLATFORM_MISC_H

/// @file
/// Rectangles, identifiers, counters, time, small helpers, and functions that only let code link.
///
/// Thread rule: any thread may call; a rectangle or buffer is one thread's at a time, and so is a
/// word of the counters that are not atomic. Addresses must not be null where it is not said.

#include <stdio.h>

#include "vidshow/types.h"

/// @name Windows that do not exist
/// Types for the functions below that only let code link. Handles are opaque.
/// @{
typedef HANDLE HWND;       ///< a window; there are none
typedef HANDLE HINSTANCE;  ///< a program; there are no such objects
typedef HANDLE HMODULE;    ///< a module, where code passes one along
typedef HANDLE HMENU;      ///< a menu; there are none
typedef HANDLE HICON;      ///< an icon; there are none
typedef HANDLE HCURSOR;    ///< a cursor; there are none
typedef HANDLE HBRUSH;     ///< a brush; there are none
typedef HANDLE HGDIOBJ;    ///< a drawing object; there are none
typedef uint16_t ATOM;     ///< a registered class; always 0
typedef long LRESULT;      ///< what a message handler answers
/// A window's message handler. It is never called.
typedef LRESULT (*WNDPROC)(HWND, UINT, WPARAM, LPARAM);

struct MSG;  // platform/thread.h

/// A window class, to be filled in as usual and ignored by `RegisterClass`.
struct WNDCLASS {
    UINT style;                 ///< not looked at
    WNDPROC lpfnWndProc;        ///< not looked at
    int cbClsExtra;             ///< not looked at
    int cbWndExtra;             ///< not looked at
    HINSTANCE hInstance;        ///< not looked at
    HICON hIcon;                ///< not looked at
    HCURSOR hCursor;            ///< not looked at
    HBRUSH hbrBackground;       ///< not looked at
    const char* lpszMenuName;   ///< not looked at
    const char* lpszClassName;  ///< not looked at
};

/// A time in units of 100 ns, in two words.
struct FILETIME {
    DWORD dwLowDateTime;   ///< lower 32 bits
    DWORD dwHighDateTime;  ///< upper 32 bits
};
/// @}

/// A machine's memory, as `GlobalMemoryStatus` makes it up.
struct MEMORYSTATUS {
    DWORD dwLength;         ///< 32: bytes of this record
    DWORD dwMemoryLoad;     ///< 0
    DWORD dwTotalPhys;      ///< 128, no matter what the machine has
    DWORD dwAvailPhys;      ///< 32
    DWORD dwTotalPageFile;  ///< 128
    DWORD dwAvailPageFile;  ///< 32
    DWORD dwTotalVirtual;   ///< 0
    DWORD dwAvailVirtual;   ///< 0
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

/// @return 1 when the identifiers' four words are equal, else 0
VIDSHOW_API BOOL IsEqualGUID(const GUID& a, const GUID& b);

/// @name Counters
/// @{

/// Adds 1. All increments and decrements of the process happen one after another, whatever word
/// they act on. @return the new value
VIDSHOW_API LONG InterlockedIncrement(LONG* value);

/// Subtracts 1, as `InterlockedIncrement` adds. @return the new value
VIDSHOW_API LONG InterlockedDecrement(LONG* value);

/// Stores `replacement`. Not atomic, in spite of the name: callers keep other threads away.
/// @return the previous value
VIDSHOW_API LONG InterlockedExchange(LONG* value, LONG replacement);

/// Adds `addend`; the sum wraps at 32 bits. Not atomic, in spite of the name: callers keep other
/// threads away. @return the NEW value, unlike the Win32 function
VIDSHOW_API LONG InterlockedExchangeAdd(LONG* value, LONG addend);

/// @}

/// @name Time
/// @{

/// @return milliseconds of the wall clock, modulo 2^32; 0 if the clock cannot be read
VIDSHOW_API DWORD timeGetTime(void);

/// @return `timeGetTime()`
VIDSHOW_API DWORD GetTickCount(void);

/// Sleeps until `timeGetTime()` has reached its present value plus `ms`, modulo 2^32. Returns at
/// once, without yielding, when that sum is not above the present value: for 0, for INFINITE, and
/// whenever the clock wraps in between. A signal does not end the sleep.
VIDSHOW_API void Sleep(DWORD ms);

/// @}

/// @name Memory, errors, text
/// @{

/// Sets `bytes` bytes to zero.
VIDSHOW_API void ZeroMemory(void* dst, size_t bytes);

/// Takes memory.
/// @param flags not looked at: the memory is never cleared
/// @param bytes how many
/// @return `malloc(bytes)`; null without memory. Give it back by `LocalFree`.
VIDSHOW_API void* LocalAlloc(UINT flags, size_t bytes);

/// Frees what `LocalAlloc` gave; null does nothing. @return null
VIDSHOW_API void* LocalFree(void* memory);

/// @return the calling thread's `errno`, a POSIX number
VIDSHOW_API DWORD GetLastError(void);

/// Writes a number as text: signed for radix 10, unsigned lower-case hexadecimal for radix 16. Any
/// other radix writes nothing.
/// @param value the number
/// @param dst   room for 12 characters
/// @param radix 10 or 16
/// @return `dst`
VIDSHOW_API char* itoa(int value, char* dst, int radix);

/// @}

/// @name Wide text
/// A wide string is seen as the bytes that it is made of, up to the first that is 0.
///
/// The library also exports the C library's own wide-character names, as functions that see text
/// so. They are for modules that are linked with this library ahead of the C library; programs that
/// are not keep the C library's.
/// @{

/// @return the decimal number that the bytes begin with; 0 without one
VIDSHOW_API int _wtoi(const wchar_t* text);

/// Formats nothing. @return -1, with EOPNOTSUPP
VIDSHOW_API int _swprintf(wchar_t* buffer, const wchar_t* format, ...);

/// `fopen`.
/// @param path of at most 4095 bytes; longer ones fail with ENAMETOOLONG
/// @param mode only its first 9 bytes count
VIDSHOW_API FILE* _wfopen(const wchar_t* path, const wchar_t* mode);

/// @}

/// @name Fixed answers
/// @{

/// Writes "/usr".
/// @param buffer receives the path and its end
/// @param size   bytes of `buffer`
/// @return its length, 4; 5, with nothing written, when `size` has no room for it and its end
VIDSHOW_API UINT GetSystemDirectory(char* buffer, DWORD size);

/// Writes the same eight numbers on every machine: 32, 0, 128, 32, 128, 32, 0, 0.
VIDSHOW_API void GlobalMemoryStatus(MEMORYSTATUS* status);

/// @}

/// @name Functions that only let code link
/// Each ignores its arguments, writes nothing and has one answer.
/// @{
VIDSHOW_API void OutputDebugString(const char* text);                   ///< prints nothing
VIDSHOW_API LRESULT SendMessage(HWND, UINT message, WPARAM, LPARAM);    ///< @return 0
VIDSHOW_API BOOL PostMessage(HWND, UINT message, WPARAM, LPARAM);       ///< @return 1
VIDSHOW_API void PostQuitMessage(int exitCode);                         ///< does nothing
VIDSHOW_API LRESULT DefWindowProc(HWND, UINT message, WPARAM, LPARAM);  ///< @return 0
VIDSHOW_API LONG GetWindowLong(HWND, int index);                        ///< @return 0
VIDSHOW_API LONG SetWindowLong(HWND, int index, LONG value);            ///< @return 0
VIDSHOW_API HCURSOR LoadCursor(HINSTANCE, const char* name);            ///< @return null
VIDSHOW_API ATOM RegisterClass(const WNDCLASS* windowClass);            ///< @return 0
/// @return 0x12345678, which is no object: neither `CloseHandle` nor a wait may get it
VIDSHOW_API HWND CreateWindow(const char* className, const char* title, DWORD style, int x, int y,
                              int width, int height, HWND parent, HMENU menu, HINSTANCE instance,
                              void* param);
VIDSHOW_API BOOL ShowWindow(HWND, int show);              ///< @return 1
VIDSHOW_API BOOL TranslateMessage(const MSG* message);    ///< @return 1
VIDSHOW_API LRESULT DispatchMessage(const MSG* message);  ///< @return 1
VIDSHOW_API BOOL GetWindowRect(HWND, RECT* rect);         ///< @return 0
VIDSHOW_API int GetSystemMetrics(int index);              ///< @return 0
VIDSHOW_API BOOL SetWindowPos(HWND, HWND insertAfter, int x, int y, int width, int height,
                              UINT flags);                        ///< @return 1
VIDSHOW_API HMODULE GetModuleHandle(const char* name);            ///< @return null
VIDSHOW_API HGDIOBJ GetStockObject(int object);                   ///< @return null
VIDSHOW_API HRESULT CoInitialize(void* reserved);                 ///< @return `S_OK`
VIDSHOW_API HRESULT CoInitializeEx(void* reserved, DWORD model);  ///< @return `S_OK`
VIDSHOW_API HRESULT CoUninitialize(void);                         ///< @return `S_OK`
VIDSHOW_API BOOL GetVolumeInformation(const char* root, char* name, DWORD nameSize, DWORD* serial,
                                      DWORD* maxComponent, DWORD* flags, char* fileSystem,
                                      DWORD fileSystemSize);  ///< @return 1
VIDSHOW_API int WideCharToMultiByte(UINT codePage, DWORD flags, const wchar_t* src, int srcLength,
                                    char* dst, int dstSize, const char* defaultChar,
                                    BOOL* usedDefault);  ///< @return 0
VIDSHOW_API int MultiByteToWideChar(UINT codePage, DWORD flags, const char* src, int srcLength,
                                    wchar_t* dst, int dstSize);  ///< @return 0
VIDSHOW_API BOOL GetProcessTimes(HANDLE, FILETIME* creation, FILETIME* exit, FILETIME* kernel,
                                 FILETIME* user);  ///< @return 0
VIDSHOW_API BOOL GetThreadTimes(HANDLE, FILETIME* creation, FILETIME* exit, FILETIME* kernel,
                                FILETIME* user);  ///< @return 0
/// @}

}  // extern "C"

VIDSHOW_API bool operator==(const GUID& a, const GUID& b);  ///< `IsEqualGUID`
VIDSHOW_API bool operator!=(const GUID& a, const GUID& b);  ///< not `IsEqualGUID`

#endif
