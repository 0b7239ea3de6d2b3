// Calls wide-character functions by their standard names. It is built into modules and a program
// that differ in what they are linked with alone.

#include "platform/wide_caller.h"

#include <wchar.h>
#include <wctype.h>

#include <cstdlib>
#include <locale>
#include <sstream>
#include <string>

namespace {

// A facet made now asks for the class and the byte of every character, inside the C++ library.
bool FreshFacetHolds() {
    const std::locale fresh(std::locale::classic(), new std::ctype<wchar_t>);
    const auto& classes = std::use_facet<std::ctype<wchar_t>>(fresh);
    return classes.narrow(L'\x80', '?') == '?' && classes.narrow(L'A', '?') == 'A' &&
           classes.widen('A') == L'A' && classes.is(std::ctype_base::digit, L'7') &&
           !classes.is(std::ctype_base::digit, L'x');
}

bool StreamsHold() {
    std::wostringstream out;
    out << L"n = " << 42 << L' ' << 2.5;
    std::wistringstream in(L"17 rest");
    int number = 0;
    std::wstring rest;
    in >> number >> rest;
    return out.str() == L"n = 42 2.5" && number == 17 && rest == L"rest";
}

}  // namespace

extern "C" __attribute__((visibility("default"))) void AskWide(WideAnswers* answers) {
    // Not constants, so that the compiler has to call.
    const std::string text("ab");
    const std::wstring number(L"42");
    wchar_t buffer[16] = {};
    char byte[16] = {};
    answers->bytesOfTwo = static_cast<int>(std::mbstowcs(buffer, text.c_str(), 16));
    volatile int c = 128;
    answers->wideOf128 = static_cast<int>(btowc(c));
    answers->formatted = swprintf(buffer, 16, L"%ls", number.c_str());
    answers->number = wcstol(number.c_str(), nullptr, 10);
    c = 7;
    answers->widthOfBell = wcwidth(static_cast<wchar_t>(c));
    mbstate_t state = {};
    wcrtomb(byte, L'A', &state);
    answers->written = byte[0];
    answers->libraryNumber = std::stol(number);
    answers->libraryHolds = FreshFacetHolds() && StreamsHold();
}
