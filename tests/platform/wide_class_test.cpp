// Every class, for every byte, WEOF and numbers beyond, beside what ASCII says.

#include <gtest/gtest.h>
#include <wchar.h>
#include <wctype.h>

#include <ostream>
#include <string>
#include <vector>

#include "platform/wide_kit.h"

namespace {

using Predicate = int (*)(wint_t);

bool Between(unsigned c, char first, char last) {
    return c >= static_cast<unsigned char>(first) && c <= static_cast<unsigned char>(last);
}

// ASCII, by ranges; bytes from 128 on are of no class.
bool IsLower(unsigned c) {
    return Between(c, 'a', 'z');
}
bool IsUpper(unsigned c) {
    return Between(c, 'A', 'Z');
}
bool IsDigit(unsigned c) {
    return Between(c, '0', '9');
}
bool IsAlpha(unsigned c) {
    return IsLower(c) || IsUpper(c);
}
bool IsAlnum(unsigned c) {
    return IsAlpha(c) || IsDigit(c);
}
bool IsBlank(unsigned c) {
    return c == 32 || c == 9;
}
bool IsCntrl(unsigned c) {
    return c < 32 || c == 127;
}
bool IsGraph(unsigned c) {
    return c > 32 && c < 127;
}
bool IsPrint(unsigned c) {
    return c >= 32 && c < 127;
}
bool IsPunct(unsigned c) {
    return IsGraph(c) && !IsAlnum(c);
}
bool IsSpace(unsigned c) {
    return c == 32 || (c >= 9 && c <= 13);
}
bool IsXdigit(unsigned c) {
    return IsDigit(c) || Between(c, 'a', 'f') || Between(c, 'A', 'F');
}

// Numbers whose low bytes run through everything, with every kind of upper bytes. The last group
// ends with WEOF.
std::vector<wint_t> Numbers() {
    std::vector<wint_t> numbers;
    for (wint_t upper :
         {0u, 1u, 2u, 0x80u, 0xFFu, 0x100u, 0x10FFu, 0x7FFFFFu, 0x800000u, 0xFFFFFEu, 0xFFFFFFu}) {
        for (wint_t low = 0; low < 256; ++low)
            numbers.push_back(upper << 8 | low);
    }
    return numbers;
}

struct NamedClass {
    const char* name;
    wctype_t number;
    bool (*contains)(unsigned);
    const char* function;  // null: only by number
    bool byLowByte;
};

const NamedClass kClasses[] = {
    {"alnum", 1, IsAlnum, "iswalnum", true},  {"alpha", 2, IsAlpha, "iswalpha", true},
    {"blank", 3, IsBlank, nullptr, false},    {"cntrl", 4, IsCntrl, "iswcntrl", true},
    {"digit", 5, IsDigit, "iswdigit", false}, {"graph", 6, IsGraph, "iswgraph", true},
    {"lower", 7, IsLower, "iswlower", true},  {"print", 8, IsPrint, "iswprint", true},
    {"punct", 9, IsPunct, "iswpunct", true},  {"space", 10, IsSpace, "iswspace", true},
    {"upper", 11, IsUpper, "iswupper", true}, {"xdigit", 12, IsXdigit, "iswxdigit", true},
};

void PrintTo(const NamedClass& named, std::ostream* out) {
    *out << named.name;
}

class WideClass : public testing::TestWithParam<NamedClass> {
  protected:
    static bool Contains(wint_t c) {
        if (c == WEOF) return false;
        return GetParam().contains(GetParam().byLowByte ? c & 255 : c);
    }
};

class WideClassFunction : public WideClass {};

TEST_P(WideClassFunction, AgreesForEveryNumber) {
    const auto is = reinterpret_cast<Predicate>(wide_kit::Find(GetParam().function));
    for (wint_t c : Numbers()) {
        EXPECT_EQ(is(c) != 0, Contains(c)) << c;
    }
}

TEST_P(WideClass, NumberAgreesForEveryNumber) {
    const auto isOf = OURS(iswctype);
    for (wint_t c : Numbers()) {
        EXPECT_EQ(isOf(c, GetParam().number) != 0, Contains(c)) << c;
    }
}

TEST_P(WideClass, NameHasItsNumber) {
    EXPECT_EQ(OURS(wctype)(GetParam().name), GetParam().number);
}

std::string NameOf(const testing::TestParamInfo<NamedClass>& which) {
    return which.param.name;
}

std::vector<NamedClass> WithFunctions() {
    std::vector<NamedClass> classes;
    for (const NamedClass& named : kClasses) {
        if (named.function != nullptr) classes.push_back(named);
    }
    return classes;
}

INSTANTIATE_TEST_SUITE_P(Of, WideClass, testing::ValuesIn(kClasses), NameOf);
INSTANTIATE_TEST_SUITE_P(Of, WideClassFunction, testing::ValuesIn(WithFunctions()), NameOf);

TEST(WideClasses, OtherNamesHaveNone) {
    const auto number = OURS(wctype);
    for (const char* name : {"word", "", "<invalid>", "Space", "spac", "spaces", "alnumalpha"}) {
        EXPECT_EQ(number(name), 0u) << name;
    }
    EXPECT_EQ(number("space"), 10u);
}

TEST(WideClasses, OtherNumbersContainNothing) {
    const auto isOf = OURS(iswctype);
    for (wctype_t number : {wctype_t{0}, wctype_t{13}, wctype_t{1000}, ~wctype_t{0}}) {
        for (wint_t c : Numbers())
            EXPECT_EQ(isOf(c, number), 0);
    }
}

TEST(WideClasses, DigitIsOneOrZeroAndNotByTheLowByte) {
    const auto isDigit = OURS(iswdigit);
    for (wint_t c = '0'; c <= '9'; ++c) {
        EXPECT_EQ(isDigit(c), 1);
        EXPECT_EQ(isDigit(0x100 + c), 0);
    }
}

TEST(WideCase, FollowsAsciiAndLeavesWhatIsAbove255) {
    const auto lower = OURS(towlower);
    const auto upper = OURS(towupper);
    for (wint_t c : Numbers()) {
        EXPECT_EQ(lower(c), IsUpper(c) ? c + 32 : c) << c;
        EXPECT_EQ(upper(c), IsLower(c) ? c - 32 : c) << c;
    }
}

TEST(WideBytes, AreTheirNumbers) {
    const auto toWide = OURS(btowc);
    const auto toByte = OURS(wctob);
    for (wint_t c : Numbers()) {
        EXPECT_EQ(toWide(static_cast<int>(c)), c);
        EXPECT_EQ(toByte(c), static_cast<int>(c));
    }
    EXPECT_EQ(toWide(-1), WEOF);
}

TEST(WideWidth, IsOneForAllButZero) {
    const auto width = OURS(wcwidth);
    for (wint_t c : Numbers())
        EXPECT_EQ(width(static_cast<wchar_t>(c)), c != 0 ? 1 : 0) << c;
}

}  // namespace
