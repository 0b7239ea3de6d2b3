// Whose wide-character functions a module gets. This program is linked with the layer's library
// ahead of the C library, so in it the layer's names are seen first.

#include <gtest/gtest.h>

#include <string>

#include "platform/wide_caller.h"
#include "vidshow/platform/file.h"

namespace {

WideAnswers AnswersIn(const char* path) {
    WideAnswers answers = {};
    void* module = LoadLibrary(path);
    auto* ask = reinterpret_cast<AskFunction*>(GetProcAddress(module, "AskWide"));
    EXPECT_NE(ask, nullptr);
    if (ask != nullptr) ask(&answers);
    return answers;
}

void ExpectEqual(const WideAnswers& answers, const WideAnswers& expected) {
    EXPECT_EQ(answers.bytesOfTwo, expected.bytesOfTwo);
    EXPECT_EQ(answers.wideOf128, expected.wideOf128);
    EXPECT_EQ(answers.formatted, expected.formatted);
    EXPECT_EQ(answers.number, expected.number);
    EXPECT_EQ(answers.widthOfBell, expected.widthOfBell);
    EXPECT_EQ(answers.written, expected.written);
    EXPECT_EQ(answers.libraryNumber, expected.libraryNumber);
    EXPECT_EQ(answers.libraryHolds, expected.libraryHolds);
}

TEST(WideLinkage, ModuleLinkedWithOursFirstGetsOurs) {
    ExpectEqual(AnswersIn(VIDSHOW_TEST_OURS_FIRST), kOfTheLayer);
}

TEST(WideLinkage, ModuleLinkedWithTheCLibraryFirstKeepsIts) {
    ExpectEqual(AnswersIn(VIDSHOW_TEST_C_FIRST), kOfTheCLibrary);
}

TEST(WideLinkage, ModuleLinkedWithoutOursKeepsTheCLibrarys) {
    ExpectEqual(AnswersIn(VIDSHOW_TEST_WITHOUT_OURS), kOfTheCLibrary);
}

}  // namespace
