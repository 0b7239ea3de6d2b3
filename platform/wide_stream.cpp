// Wide characters and lines of streams, which are the streams' bytes, and formatted text, which
// there is none of.

#include <stdarg.h>
#include <stdio.h>
#include <wchar.h>

#include "platform/wide.h"
#include "vidshow/types.h"

namespace vidshow {
namespace wide {

VIDSHOW_API wint_t GetFrom(FILE* stream) VIDSHOW_KNOWN_AS(fgetwc);
wint_t GetFrom(FILE* stream) {
    return static_cast<wint_t>(fgetc(stream));
}

VIDSHOW_API wint_t GetAlsoFrom(FILE* stream) VIDSHOW_KNOWN_AS(getwc);
wint_t GetAlsoFrom(FILE* stream) {
    return GetFrom(stream);
}

VIDSHOW_API wint_t Get() VIDSHOW_KNOWN_AS(getwchar);
wint_t Get() {
    return GetFrom(stdin);
}

VIDSHOW_API wchar_t* GetLine(wchar_t* text, int n, FILE* stream) VIDSHOW_KNOWN_AS(fgetws);
wchar_t* GetLine(wchar_t* text, int n, FILE* stream) {
    return fgets(Bytes(text), n, stream) != nullptr ? text : nullptr;
}

// The byte 255 too, which is what WEOF is cut to: clients rely on nothing being special.
static int ByteOf(wint_t c) {
    return static_cast<int>(c & 255);
}

VIDSHOW_API wint_t PutTo(wchar_t c, FILE* stream) VIDSHOW_KNOWN_AS(fputwc);
wint_t PutTo(wchar_t c, FILE* stream) {
    return static_cast<wint_t>(fputc(ByteOf(static_cast<wint_t>(c)), stream));
}

VIDSHOW_API wint_t PutAlsoTo(wchar_t c, FILE* stream) VIDSHOW_KNOWN_AS(putwc);
wint_t PutAlsoTo(wchar_t c, FILE* stream) {
    return PutTo(c, stream);
}

VIDSHOW_API wint_t Put(wchar_t c) VIDSHOW_KNOWN_AS(putwchar);
wint_t Put(wchar_t c) {
    return PutTo(c, stdout);
}

VIDSHOW_API wint_t PutBack(wint_t c, FILE* stream) VIDSHOW_KNOWN_AS(ungetwc);
wint_t PutBack(wint_t c, FILE* stream) {
    return static_cast<wint_t>(ungetc(ByteOf(c), stream));
}

VIDSHOW_API int PutLine(const wchar_t* text, FILE* stream) VIDSHOW_KNOWN_AS(fputws);
int PutLine(const wchar_t* text, FILE* stream) {
    return fputs(Bytes(text), stream);
}

VIDSHOW_API int Orient(FILE*, int mode) VIDSHOW_KNOWN_AS(fwide);
int Orient(FILE*, int mode) {
    return mode;
}

VIDSHOW_API int FormatTo(FILE*, const wchar_t*, ...) VIDSHOW_KNOWN_AS(fwprintf);
int FormatTo(FILE*, const wchar_t*, ...) {
    return FailToFormat();
}

VIDSHOW_API int Format(const wchar_t*, ...) VIDSHOW_KNOWN_AS(wprintf);
int Format(const wchar_t*, ...) {
    return FailToFormat();
}

VIDSHOW_API int FormatText(wchar_t*, size_t, const wchar_t*, ...) VIDSHOW_KNOWN_AS(swprintf);
int FormatText(wchar_t*, size_t, const wchar_t*, ...) {
    return FailToFormat();
}

VIDSHOW_API int FormatListTo(FILE*, const wchar_t*, va_list) VIDSHOW_KNOWN_AS(vfwprintf);
int FormatListTo(FILE*, const wchar_t*, va_list) {
    return FailToFormat();
}

VIDSHOW_API int FormatList(const wchar_t*, va_list) VIDSHOW_KNOWN_AS(vwprintf);
int FormatList(const wchar_t*, va_list) {
    return FailToFormat();
}

VIDSHOW_API int FormatTextList(wchar_t*, size_t, const wchar_t*, va_list)
    VIDSHOW_KNOWN_AS(vswprintf);
int FormatTextList(wchar_t*, size_t, const wchar_t*, va_list) {
    return FailToFormat();
}

VIDSHOW_API int ScanFrom(FILE*, const wchar_t*, ...) VIDSHOW_KNOWN_AS(fwscanf);
int ScanFrom(FILE*, const wchar_t*, ...) {
    return FailToFormat();
}

VIDSHOW_API int Scan(const wchar_t*, ...) VIDSHOW_KNOWN_AS(wscanf);
int Scan(const wchar_t*, ...) {
    return FailToFormat();
}

VIDSHOW_API int ScanText(const wchar_t*, const wchar_t*, ...) VIDSHOW_KNOWN_AS(swscanf);
int ScanText(const wchar_t*, const wchar_t*, ...) {
    return FailToFormat();
}

}  // namespace wide
}  // namespace vidshow
