#include <gtest/gtest.h>
#include <stdlib.h>
#include <time.h>
#include <wchar.h>

#include <cmath>
#include <cstring>
#include <ostream>
#include <string>

#include "platform/wide_kit.h"
#include "testkit/guarded_buffer.h"
#include "vidshow/platform/misc.h"

namespace {

using wide_kit::Wide;

constexpr size_t kAll = static_cast<size_t>(-1);

// Bytes that a copy of `text` with a limit of `n` stores: the end counts, if there is room for it.
std::string Copied(const std::string& text, size_t n) {
    return (text + '\0').substr(0, n);
}

// The four copying calls in one form: copy, and tell how far the source went on.
struct Copy {
    const char* name;
    size_t (*run)(char* dst, const char* src, size_t n, size_t* advanced);
};

const Copy kCopies[] = {
    {"mbstowcs",
     [](char* dst, const char* src, size_t n, size_t* advanced) {
         const size_t count = OURS(mbstowcs)(Wide(dst), src, n);
         *advanced = count;  // there is no pointer to go on
         return count;
     }},
    {"wcstombs",
     [](char* dst, const char* src, size_t n, size_t* advanced) {
         const size_t count = OURS(wcstombs)(dst, Wide(src), n);
         *advanced = count;
         return count;
     }},
    {"mbsrtowcs",
     [](char* dst, const char* src, size_t n, size_t* advanced) {
         const char* next = src;
         const size_t count = OURS(mbsrtowcs)(Wide(dst), &next, n, nullptr);
         *advanced = static_cast<size_t>(next - src);
         return count;
     }},
    {"wcsrtombs",
     [](char* dst, const char* src, size_t n, size_t* advanced) {
         const wchar_t* next = Wide(src);
         const size_t count = OURS(wcsrtombs)(dst, &next, n, nullptr);
         *advanced = static_cast<size_t>(reinterpret_cast<const char*>(next) - src);
         return count;
     }},
};

void PrintTo(const Copy& copy, std::ostream* out) {
    *out << copy.name;
}

class WideCopy : public testing::TestWithParam<Copy> {};

TEST_P(WideCopy, StoresBytesUpToTheEndOrTheLimit) {
    for (const std::string text : {"", "a", "ab", "a longer text of bytes \xE9\xFF"}) {
        testkit::GuardedBuffer source(text.size() + 1);
        std::memcpy(source.data(), text.c_str(), text.size() + 1);
        for (size_t n = 0; n < text.size() + 4; ++n) {
            const std::string expected = Copied(text, n);
            testkit::GuardedBuffer target(n);
            size_t advanced = 0;
            EXPECT_EQ(GetParam().run(reinterpret_cast<char*>(target.data()),
                                     reinterpret_cast<const char*>(source.data()), n, &advanced),
                      expected.size());
            EXPECT_EQ(advanced, expected.size());
            EXPECT_EQ(std::memcmp(target.data(), expected.data(), expected.size()), 0);
            for (size_t i = expected.size(); i < n; ++i)
                EXPECT_EQ(target[i], 0xA5) << "past the end nothing is stored";
        }
    }
}

TEST_P(WideCopy, CountsAndGoesOnWithoutATarget) {
    size_t advanced = 0;
    EXPECT_EQ(GetParam().run(nullptr, "abc", kAll, &advanced), 4u);
    EXPECT_EQ(advanced, 4u);
    EXPECT_EQ(GetParam().run(nullptr, "abc", 2, &advanced), 2u);
    EXPECT_EQ(advanced, 2u);
}

INSTANTIATE_TEST_SUITE_P(By, WideCopy, testing::ValuesIn(kCopies),
                         [](const auto& which) { return std::string(which.param.name); });

TEST(WideCopies, TwoCharactersWithRoomForTenAreThree) {
    char dst[10] = {'?', '?', '?', '?'};
    EXPECT_EQ(OURS(wcstombs)(dst, Wide("ab"), 10), 3u);
    EXPECT_EQ(std::string(dst, 4), std::string("ab\0?", 4));
}

TEST(WideCharacter, StateIsAlwaysInitial) {
    mbstate_t state = {};
    EXPECT_EQ(OURS(mbsinit)(&state), 1);
    std::memset(&state, 0x55, sizeof state);
    EXPECT_EQ(OURS(mbsinit)(&state), 1);
    EXPECT_EQ(OURS(mbsinit)(nullptr), 1);
}

TEST(WideCharacter, LengthIsOneWhereThereIsRoom) {
    const auto length = OURS(mbrlen);
    EXPECT_EQ(length("a", 0, nullptr), 0u);
    for (size_t n : {size_t{1}, size_t{2}, kAll}) {
        EXPECT_EQ(length("a", n, nullptr), 1u);
        EXPECT_EQ(length("", n, nullptr), 1u) << "of the end too";
        EXPECT_EQ(length(nullptr, n, nullptr), 1u);
    }
}

TEST(WideCharacter, IsItsByte) {
    const auto convert = OURS(mbrtowc);
    for (int byte = 0; byte < 256; ++byte) {
        const char text[2] = {static_cast<char>(byte), 'x'};
        wchar_t c = L'?';
        EXPECT_EQ(convert(&c, text, 1, nullptr), byte != 0 ? 1u : 0u);
        EXPECT_EQ(c, static_cast<wchar_t>(byte));
        EXPECT_EQ(convert(nullptr, text, kAll, nullptr), byte != 0 ? 1u : 0u);
    }
}

TEST(WideCharacter, OfNothingIsZero) {
    const auto convert = OURS(mbrtowc);
    wchar_t c = L'?';
    EXPECT_EQ(convert(&c, nullptr, 5, nullptr), 0u);
    EXPECT_EQ(c, L'?') << "without a text nothing is stored";
    EXPECT_EQ(convert(&c, "a", 0, nullptr), 0u);
    EXPECT_EQ(c, L'\0');
    EXPECT_EQ(convert(nullptr, "a", 0, nullptr), 0u);
}

TEST(WideCharacter, IsWrittenAsTheByteOne) {
    const auto convert = OURS(wcrtomb);
    for (wchar_t c : {L'A', L'\0', L'\xFF', L'\x1234'}) {
        char text[2] = {'?', '?'};
        EXPECT_EQ(convert(text, c, nullptr), 1u);
        EXPECT_EQ(text[0], 1);
        EXPECT_EQ(text[1], '?');
    }
    EXPECT_EQ(convert(nullptr, L'A', nullptr), 1u);
}

TEST(WideText, TransformsByCopyingAllBytes) {
    char dst[8];
    std::memset(dst, '?', sizeof dst);
    EXPECT_EQ(OURS(wcsxfrm)(Wide(dst), Wide("a\0bcd"), 5), 5u);
    EXPECT_EQ(std::string(dst, 6), std::string("a\0bcd?", 6)) << "past the end too";
    EXPECT_EQ(OURS(wcsxfrm)(Wide(dst), Wide("zz"), 0), 0u);
    EXPECT_EQ(dst[0], 'a');
    EXPECT_EQ(OURS(wcsxfrm)(Wide(dst), Wide("zz"), 1), 1u);
    EXPECT_EQ(std::string(dst, 3), std::string("z\0b", 3));
}

TEST(WideText, IsFoundByBytes) {
    const auto find = reinterpret_cast<wchar_t* (*)(const wchar_t*, const wchar_t*)>(
        wide_kit::Find("wcswcs"));  // which the C library's header overloads
    const char text[] = "needle in hay";
    EXPECT_EQ(find(Wide(text), Wide("in")), Wide(text + 7));
    EXPECT_EQ(find(Wide(text), Wide("")), Wide(text));
    EXPECT_EQ(find(Wide(text), Wide("straw")), nullptr);
}

TEST(WideNumbers, AreReadFromBytes) {
    const char text[] = " -42xyz";
    wchar_t* end = nullptr;
    EXPECT_EQ(OURS(wcstol)(Wide(text), &end, 10), -42);
    EXPECT_EQ(end, Wide(text + 4));
    EXPECT_EQ(OURS(wcstol)(Wide("0x1F"), nullptr, 0), 31);
    EXPECT_EQ(OURS(wcstoul)(Wide("ff;"), &end, 16), 255u);
    EXPECT_EQ(OURS(wcstoul)(Wide("-1"), nullptr, 10), ~0ul);
    const char number[] = "2.5e3!";
    EXPECT_EQ(OURS(wcstod)(Wide(number), &end), 2500.0);
    EXPECT_EQ(end, Wide(number + 5));
    EXPECT_TRUE(std::isinf(OURS(wcstod)(Wide("inf"), nullptr)));
}

TEST(WideNumbers, OfRealWideTextEndWithItsFirstCharacter) {
    wchar_t* end = nullptr;
    EXPECT_EQ(OURS(wcstol)(L"42", &end, 10), 4) << "the next byte is 0";
}

TEST(WideTime, IsFormattedAsBytes) {
    tm time = {};
    time.tm_year = 112;
    time.tm_mon = 4;
    time.tm_mday = 7;
    char text[32];
    EXPECT_EQ(OURS(wcsftime)(Wide(text), sizeof text, Wide("%Y-%m-%d"), &time), 10u);
    EXPECT_STREQ(text, "2012-05-07");
    EXPECT_EQ(OURS(wcsftime)(Wide(text), 10, Wide("%Y-%m-%d"), &time), 0u) << "no room for the end";
}

TEST(Wtoi, ReadsDecimalBytes) {
    EXPECT_EQ(_wtoi(Wide("123")), 123);
    EXPECT_EQ(_wtoi(Wide("  -77 apples")), -77);
    EXPECT_EQ(_wtoi(Wide("0x10")), 0) << "decimal only";
    EXPECT_EQ(_wtoi(Wide("none")), 0);
    EXPECT_EQ(_wtoi(L"987"), 9) << "of real wide text, its first character";
}

}  // namespace
