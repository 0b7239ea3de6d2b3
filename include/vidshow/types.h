#ifndef VIDSHOW_TYPES_H
#define VIDSHOW_TYPES_H

/// @file
/// Integer widths, result codes and the two small records that every interface shares.
///
/// The library's home is 32-bit ARM, where Win32's `DWORD` is an `unsigned long`. The same source
/// also runs on 64-bit hosts, where `unsigned long` is twice as wide, so the widths are fixed here
/// once: a `DWORD` is 32 bits everywhere, a handle is as wide as a pointer.

#include <stddef.h>
#include <stdint.h>

/// Marks what the library exports; everything else stays inside it.
#if defined(__GNUC__)
#define VIDSHOW_API __attribute__((visibility("default")))
#else
#define VIDSHOW_API
#endif

#if defined(__LP64__) || defined(_LP64)
typedef uint32_t DWORD;  ///< 32-bit unsigned word
typedef int32_t LONG;    ///< 32-bit signed number
#else
typedef unsigned long DWORD;  ///< 32-bit unsigned word
typedef long LONG;            ///< 32-bit signed number
#endif
typedef DWORD ULONG;          ///< 32-bit unsigned number
typedef int32_t BOOL;         ///< 0 is false, 1 is true
typedef int32_t HRESULT;      ///< negative values are failures
typedef void* HANDLE;         ///< a waitable object, a thread id or a module; see the owning call
typedef unsigned int UINT;    ///< 32-bit message number or flag set
typedef unsigned int WPARAM;  ///< first message argument, 32 bits
typedef long LPARAM;          ///< second message argument, wide enough for an address

static_assert(sizeof(DWORD) == 4 && sizeof(LONG) == 4, "Win32 words are 32 bits wide");
static_assert(sizeof(LPARAM) == sizeof(void*), "a message carries an address in its LPARAM");

#ifndef TRUE
#define TRUE 1  ///< a `BOOL` that holds
#endif
#ifndef FALSE
#define FALSE 0  ///< a `BOOL` that does not hold
#endif

/// @name Result codes
/// @{
constexpr HRESULT S_OK = 0;     ///< done
constexpr HRESULT S_FALSE = 1;  ///< done, with nothing to show
/// There is no such operation or property.
constexpr HRESULT E_NOTIMPL = static_cast<HRESULT>(0x80004001u);
/// An address that is needed is null.
constexpr HRESULT E_POINTER = static_cast<HRESULT>(0x80004003u);
/// Failed, for a reason that the call names.
constexpr HRESULT E_FAIL = static_cast<HRESULT>(0x80004005u);
/// Not possible in the present state.
constexpr HRESULT E_UNEXPECTED = static_cast<HRESULT>(0x8000FFFFu);
/// There is no window to act on.
constexpr HRESULT E_HANDLE = static_cast<HRESULT>(0x80070006u);
/// No memory.
constexpr HRESULT E_OUTOFMEMORY = static_cast<HRESULT>(0x8007000Eu);
/// An argument is null or out of range.
constexpr HRESULT E_INVALIDARG = static_cast<HRESULT>(0x80070057u);
/// @}

/// @name Wait results and time-outs
/// @{
constexpr DWORD WAIT_OBJECT_0 = 0;         ///< the (first) object was signalled
constexpr DWORD WAIT_TIMEOUT = 258;        ///< the time ran out
constexpr DWORD WAIT_FAILED = 0xFFFFFFFF;  ///< a handle or an argument was not valid
constexpr DWORD INFINITE = 0xFFFFFFFF;     ///< a time-out that never ends
/// @}

/// A 16-byte identifier, compared with `IsEqualGUID` or `==` (platform/misc.h).
struct GUID {
    uint32_t Data1;    ///< first group of the usual notation, a number
    uint16_t Data2;    ///< second group, a number
    uint16_t Data3;    ///< third group, a number
    uint8_t Data4[8];  ///< fourth and fifth group, bytes in the order written
};
static_assert(sizeof(GUID) == 16, "an identifier is compared as four 32-bit words");

/// A rectangle, in pixels.
struct RECT {
    int32_t left;    ///< first column
    int32_t top;     ///< first row
    int32_t right;   ///< one past the last column
    int32_t bottom;  ///< one past the last row
};
static_assert(sizeof(RECT) == 16, "a rectangle is four 32-bit words");

#endif
