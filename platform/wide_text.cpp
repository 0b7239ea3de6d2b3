// Wide strings: copied, searched, read as numbers and times, all by their bytes.

#include <time.h>
#include <wchar.h>

#include "platform/wide.h"
#include "vidshow/types.h"

namespace vidshow {
namespace wide {

// Where a text goes on after some bytes, which need not be whole wide characters.
static const wchar_t* After(const wchar_t* text, size_t bytes) {
    return static_cast<const wchar_t*>(static_cast<const void*>(Bytes(text) + bytes));
}

static wchar_t* AsWide(char* text) {
    return static_cast<wchar_t*>(static_cast<void*>(text));
}

VIDSHOW_API int IsInitial(const mbstate_t*) VIDSHOW_KNOWN_AS(mbsinit);
int IsInitial(const mbstate_t*) {
    return 1;
}

VIDSHOW_API size_t CharacterLength(const char*, size_t n, mbstate_t*) VIDSHOW_KNOWN_AS(mbrlen);
size_t CharacterLength(const char*, size_t n, mbstate_t*) {
    return n != 0;
}

VIDSHOW_API size_t CharacterFrom(wchar_t* c, const char* text, size_t n, mbstate_t*)
    VIDSHOW_KNOWN_AS(mbrtowc);
size_t CharacterFrom(wchar_t* c, const char* text, size_t n, mbstate_t*) {
    if (text == nullptr) return 0;
    const unsigned char byte = n != 0 ? static_cast<unsigned char>(*text) : 0;
    if (c != nullptr) *c = byte;
    return byte != 0;
}

// The byte 1, whatever the character: clients rely on it.
VIDSHOW_API size_t CharacterTo(char* text, wchar_t, mbstate_t*) VIDSHOW_KNOWN_AS(wcrtomb);
size_t CharacterTo(char* text, wchar_t, mbstate_t*) {
    if (text != nullptr) *text = 1;
    return 1;
}

VIDSHOW_API size_t TextFrom(wchar_t* dst, const char* src, size_t n) VIDSHOW_KNOWN_AS(mbstowcs);
size_t TextFrom(wchar_t* dst, const char* src, size_t n) {
    return Copy(Bytes(dst), src, n);
}

VIDSHOW_API size_t TextTo(char* dst, const wchar_t* src, size_t n) VIDSHOW_KNOWN_AS(wcstombs);
size_t TextTo(char* dst, const wchar_t* src, size_t n) {
    return Copy(dst, Bytes(src), n);
}

VIDSHOW_API size_t NextTextFrom(wchar_t* dst, const char** src, size_t n, mbstate_t*)
    VIDSHOW_KNOWN_AS(mbsrtowcs);
size_t NextTextFrom(wchar_t* dst, const char** src, size_t n, mbstate_t*) {
    const size_t bytes = TextFrom(dst, *src, n);
    *src += bytes;
    return bytes;
}

VIDSHOW_API size_t NextTextTo(char* dst, const wchar_t** src, size_t n, mbstate_t*)
    VIDSHOW_KNOWN_AS(wcsrtombs);
size_t NextTextTo(char* dst, const wchar_t** src, size_t n, mbstate_t*) {
    const size_t bytes = TextTo(dst, *src, n);
    *src = After(*src, bytes);
    return bytes;
}

VIDSHOW_API size_t Transform(wchar_t* dst, const wchar_t* src, size_t n) VIDSHOW_KNOWN_AS(wcsxfrm);
size_t Transform(wchar_t* dst, const wchar_t* src, size_t n) {
    if (n != 0) std::memcpy(dst, src, n);
    return n;
}

VIDSHOW_API wchar_t* Find(const wchar_t* text, const wchar_t* part) VIDSHOW_KNOWN_AS(wcswcs);
wchar_t* Find(const wchar_t* text, const wchar_t* part) {
    return AsWide(const_cast<char*>(std::strstr(Bytes(text), Bytes(part))));
}

// Each stores where the number's bytes end.

VIDSHOW_API double Double(const wchar_t* text, wchar_t** end) VIDSHOW_KNOWN_AS(wcstod);
double Double(const wchar_t* text, wchar_t** end) {
    return std::strtod(Bytes(text), reinterpret_cast<char**>(end));
}

VIDSHOW_API long Long(const wchar_t* text, wchar_t** end, int base) VIDSHOW_KNOWN_AS(wcstol);
long Long(const wchar_t* text, wchar_t** end, int base) {
    return ToLong(text, reinterpret_cast<char**>(end), base);
}

VIDSHOW_API unsigned long UnsignedLong(const wchar_t* text, wchar_t** end, int base)
    VIDSHOW_KNOWN_AS(wcstoul);
unsigned long UnsignedLong(const wchar_t* text, wchar_t** end, int base) {
    return std::strtoul(Bytes(text), reinterpret_cast<char**>(end), base);
}

VIDSHOW_API size_t FormatTime(wchar_t* dst, size_t n, const wchar_t* format, const tm* time)
    VIDSHOW_KNOWN_AS(wcsftime);
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"  // the caller's format
size_t FormatTime(wchar_t* dst, size_t n, const wchar_t* format, const tm* time) {
    return strftime(Bytes(dst), n, Bytes(format), time);
}
#pragma GCC diagnostic pop

}  // namespace wide
}  // namespace vidshow
