// Manual pages and completions: made by the build, and about every option that --help names.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <regex>
#include <set>

#include "playkit/process.h"

namespace {

using namespace playkit;
using testing::HasSubstr;

// A program as it is built, and what the build made it print.
struct Program {
    const char* name;
    const char* path;
};

class Pages : public testing::TestWithParam<Program> {
  protected:
    std::string manual() const {
        return readFile(VIDSHOW_PAGES "/" + std::string(GetParam().name) + ".1");
    }
    std::string completion() const { return completionFile(GetParam().name); }
    static std::string completionFile(const std::string& name) {
        return readFile(VIDSHOW_PAGES "/completions/" + name);
    }

    std::set<std::string> options() const {
        const std::string help = run({GetParam().path, "--help"}).out;
        std::set<std::string> all;
        const std::regex name("\n  (?:-[a-z],)?(--[a-z0-9-]+)");
        for (std::sregex_iterator at(help.begin(), help.end(), name), end; at != end; ++at)
            all.insert((*at)[1]);
        return all;
    }
};

TEST_P(Pages, ManualHasAnEntryForEveryOption) {
    const std::string page = manual();
    EXPECT_GT(options().size(), 6u);
    for (const std::string& option : options()) {
        const std::string written = std::regex_replace(option, std::regex("-"), "\\-");
        EXPECT_THAT(page, HasSubstr("\\fB" + written + "\\fR"));
    }
}

TEST_P(Pages, ManualHasTheUsualSectionsInOrder) {
    const std::string page = manual();
    size_t last = 0;
    for (const char* section : {".TH ", ".SH NAME\n", ".SH SYNOPSIS\n", ".SH DESCRIPTION\n",
                                ".SH OPTIONS\n", ".SH EXIT STATUS\n"}) {
        const size_t at = page.find(section);
        ASSERT_NE(at, std::string::npos) << section;
        EXPECT_GE(at, last) << section;
        last = at;
    }
}

TEST_P(Pages, ManualIsWhatTheProgramPrints) {
    EXPECT_EQ(run({GetParam().path, "--print-manual"}).out, manual());
    EXPECT_EQ(run({GetParam().path, "--print-completion"}).out, completion());
}

TEST_P(Pages, CompletionOffersEveryOption) {
    for (const std::string& option : options())
        EXPECT_THAT(completion(), testing::ContainsRegex(" " + option + "[ ']"));
}

INSTANTIATE_TEST_SUITE_P(Tools, Pages,
                         testing::Values(Program{"vidshow-play", VIDSHOW_PLAY},
                                         Program{"vidshow-convert", VIDSHOW_CONVERT},
                                         Program{"vidshow-compare", VIDSHOW_COMPARE}),
                         [](const auto& program) {
                             return std::string(program.param.name).substr(sizeof "vidshow-" - 1);
                         });

// What bash offers after these words.
std::string offered(const std::string& words) {
    const std::string script =
        "source " VIDSHOW_PAGES "/completions/vidshow-convert\nCOMP_WORDS=(" + words +
        ")\nCOMP_CWORD=$((${#COMP_WORDS[@]} - 1))\n_vidshow_convert\n"
        "echo \"${COMPREPLY[*]}\"";
    const Outcome outcome = run({"bash", "-c", script});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.err, "");
    return outcome.out;
}

TEST(Completion, OffersWhatAnOptionTakes) {
    EXPECT_EQ(offered("vidshow-convert in.mp4 --to rgb"), "rgb565 rgb888 rgb5551\n");
    EXPECT_EQ(offered("vidshow-convert in.mp4 --matrix bt"), "bt601 bt709\n");
    EXPECT_EQ(offered("vidshow-convert --range = ''"), "full limited\n");
    EXPECT_EQ(offered("vidshow-convert --range ="), "full limited\n");
}

TEST(Completion, OffersOptionsThatBeginSo) {
    EXPECT_EQ(offered("vidshow-convert --con"), "--contrast\n");
    EXPECT_EQ(offered("vidshow-convert --r"), "--resize --rotate --range\n");
}

TEST(Completion, OffersNoWordWhereNoneCanBeKnown) {
    EXPECT_EQ(offered("vidshow-convert --brightness ''"), "\n");
    EXPECT_EQ(offered("vidshow-convert ''"), "\n");
}

}  // namespace
