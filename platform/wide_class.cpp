// Classes and cases of wide characters, and their conversion to and from bytes.

#include <wchar.h>
#include <wctype.h>

#include <cctype>
#include <cstring>

#include "platform/wide.h"
#include "vidshow/types.h"

namespace vidshow {
namespace wide {

// The C library's own tables decide, by the low byte.
#define VIDSHOW_CLASS(name, narrow)                                        \
    VIDSHOW_API int Is_##narrow(wint_t c) VIDSHOW_KNOWN_AS(name);          \
    int Is_##narrow(wint_t c) {                                            \
        return c != WEOF ? std::is##narrow(static_cast<int>(c & 255)) : 0; \
    }

VIDSHOW_CLASS(iswalnum, alnum)
VIDSHOW_CLASS(iswalpha, alpha)
VIDSHOW_CLASS(iswcntrl, cntrl)
VIDSHOW_CLASS(iswgraph, graph)
VIDSHOW_CLASS(iswlower, lower)
VIDSHOW_CLASS(iswprint, print)
VIDSHOW_CLASS(iswpunct, punct)
VIDSHOW_CLASS(iswspace, space)
VIDSHOW_CLASS(iswupper, upper)
VIDSHOW_CLASS(iswxdigit, xdigit)

// Not by the low byte: clients rely on 0x130 being no digit.
VIDSHOW_API int Is_digit(wint_t c) VIDSHOW_KNOWN_AS(iswdigit);
int Is_digit(wint_t c) {
    return c - '0' < 10;
}

static int Is_blank(wint_t c) {
    return c == ' ' || c == '\t';
}

struct Class {
    const char* name;
    int (*contains)(wint_t);
};

// A class's number is its place.
static const Class kClasses[] = {
    {"<invalid>", nullptr}, {"alnum", Is_alnum}, {"alpha", Is_alpha}, {"blank", Is_blank},
    {"cntrl", Is_cntrl},    {"digit", Is_digit}, {"graph", Is_graph}, {"lower", Is_lower},
    {"print", Is_print},    {"punct", Is_punct}, {"space", Is_space}, {"upper", Is_upper},
    {"xdigit", Is_xdigit},
};
constexpr wctype_t kClassCount = sizeof kClasses / sizeof kClasses[0];

VIDSHOW_API wctype_t ClassOfName(const char* name) VIDSHOW_KNOWN_AS(wctype);
wctype_t ClassOfName(const char* name) {
    for (wctype_t number = 1; number < kClassCount; ++number) {
        if (std::strcmp(kClasses[number].name, name) == 0) return number;
    }
    return 0;
}

VIDSHOW_API int IsOfClass(wint_t c, wctype_t number) VIDSHOW_KNOWN_AS(iswctype);
int IsOfClass(wint_t c, wctype_t number) {
    if (c == WEOF || number == 0 || number >= kClassCount) return 0;
    return kClasses[number].contains(c);
}

VIDSHOW_API wint_t ToLower(wint_t c) VIDSHOW_KNOWN_AS(towlower);
wint_t ToLower(wint_t c) {
    return c <= 255 ? static_cast<wint_t>(std::tolower(static_cast<int>(c))) : c;
}

VIDSHOW_API wint_t ToUpper(wint_t c) VIDSHOW_KNOWN_AS(towupper);
wint_t ToUpper(wint_t c) {
    return c <= 255 ? static_cast<wint_t>(std::toupper(static_cast<int>(c))) : c;
}

VIDSHOW_API wint_t FromByte(int c) VIDSHOW_KNOWN_AS(btowc);
wint_t FromByte(int c) {
    return static_cast<wint_t>(c);
}

VIDSHOW_API int ToByte(wint_t c) VIDSHOW_KNOWN_AS(wctob);
int ToByte(wint_t c) {
    return static_cast<int>(c);
}

VIDSHOW_API int Width(wchar_t c) VIDSHOW_KNOWN_AS(wcwidth);
int Width(wchar_t c) {
    return c != 0;
}

}  // namespace wide
}  // namespace vidshow
