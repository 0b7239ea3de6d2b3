#pragma once

/// What a module gets when it calls wide-character functions by the names that the C library and
/// the layer both have.
struct WideAnswers {
    int bytesOfTwo;      ///< mbstowcs of "ab": 2 characters, or 3 bytes
    int wideOf128;       ///< btowc(128): none in the "C" locale, or 128
    int formatted;       ///< swprintf of "42": 2, or -1
    long number;         ///< wcstol of L"42": 42, or 4
    int widthOfBell;     ///< wcwidth(7): -1, or 1
    char written;        ///< wcrtomb of L'A': 'A', or 1
    long libraryNumber;  ///< std::stol of L"42", which is compiled into the module
    bool libraryHolds;   ///< the C++ library's own wide facilities work
};

using AskFunction = void(WideAnswers*);

constexpr WideAnswers kOfTheCLibrary = {2, -1, 2, 42, -1, 'A', 42, true};
constexpr WideAnswers kOfTheLayer = {3, 128, -1, 4, 1, 1, 4, true};

inline bool operator==(const WideAnswers& a, const WideAnswers& b) {
    return a.bytesOfTwo == b.bytesOfTwo && a.wideOf128 == b.wideOf128 &&
           a.formatted == b.formatted && a.number == b.number && a.widthOfBell == b.widthOfBell &&
           a.written == b.written && a.libraryNumber == b.libraryNumber &&
           a.libraryHolds == b.libraryHolds;
}
