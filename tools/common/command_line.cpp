#include "common/command_line.h"

#include <algorithm>
#include <cstdio>
#include <iterator>

#include "common/deinterlace.h"
#include "common/error.h"
#include "common/manual.h"
#include "vidshow/presenter.h"

namespace vidshow::tools {

namespace {

constexpr size_t kHelpWidth = 95;

const std::map<std::string, Matrix> kMatrices = {{"bt601", Matrix::bt601},
                                                 {"bt709", Matrix::bt709},
                                                 {"smpte240m", Matrix::smpte240m},
                                                 {"fcc", Matrix::fcc}};
const std::map<std::string, Range> kRanges = {{"limited", Range::limited}, {"full", Range::full}};

template <typename T>
std::optional<T> given(const std::map<std::string, T>& names, const std::string& name) {
    return name.empty() ? std::nullopt : std::optional<T>(names.at(name));
}

std::string footer(const ProgramText& text) {
    std::string lines;
    for (const ProgramText::Section& section : text.sections) {
        lines += (lines.empty() ? "" : "\n") +
                 wrapped(std::string(section.title) + ": " + section.text, kHelpWidth);
    }
    return lines;
}

}  // namespace

CommandLine::CommandLine(const ProgramText& text)
    : m_text(text), m_app(std::string(text.summary) + ".", text.name) {
    m_app.footer(footer(text));
    const std::string name = text.name;
    m_app.failure_message([name](const CLI::App*, const CLI::Error& error) {
        return name + ": " + error.what() + " (--help tells more)\n";
    });
    m_app.set_help_flag("-h,--help", "tell this, and end");
    m_app.set_version_flag("--version", name + " " + text.version + ", " + getVersion(),
                           "tell the versions of program and library, and end");
}

std::optional<int> CommandLine::read(int argc, char** argv, const std::function<void()>& check) {
    const std::string only = argc == 2 ? argv[1] : "";
    if (only == "--print-manual" || only == "--print-completion") {
        const bool manual = only == "--print-manual";
        std::fputs((manual ? manualPage(m_text, m_app) : bashCompletion(m_app)).c_str(), stdout);
        return kExitDone;
    }
    try {
        m_app.parse(argc, argv);
        if (check) check();
    } catch (const CLI::ParseError& end) {
        return m_app.exit(end) == 0 ? kExitDone : kExitUsage;
    }
    return std::nullopt;
}

CLI::IsMember oneOf(const std::vector<std::string>& names) {
    return CLI::IsMember(names);
}

std::string checkCount(const std::string& text) {
    const bool digits = !text.empty() && text.size() <= 18 &&
                        text.find_first_not_of("0123456789") == std::string::npos;
    const bool some = digits && text.find_first_not_of('0') != std::string::npos;
    return some ? "" : "'" + text + "' is not a number from 1 on";
}

uint32_t ClipTexts::deinterlaceMode() const {
    const auto mode = std::find(kDeinterlaceNames.begin(), kDeinterlaceNames.end(), deinterlace);
    return static_cast<uint32_t>(std::distance(kDeinterlaceNames.begin(), mode));
}

std::optional<Matrix> ClipTexts::matrixGiven() const {
    return given(kMatrices, matrix);
}

std::optional<Range> ClipTexts::rangeGiven() const {
    return given(kRanges, range);
}

void declareDeinterlace(CLI::App* app, ClipTexts* texts, const std::string& limits) {
    app->add_option("--deinterlace", texts->deinterlace, "how the two fields become one; " + limits)
        ->check(oneOf({kDeinterlaceNames.begin(), kDeinterlaceNames.end()}))
        ->type_name("MODE");
}

void declareMatrixAndRange(CLI::App* app, ClipTexts* texts) {
    app->add_option("--matrix", texts->matrix, "of the samples; without it the clip's")
        ->check(oneOf(kMatrices))
        ->type_name("MATRIX");
    app->add_option("--range", texts->range, "of the samples; without it the clip's")
        ->check(oneOf(kRanges))
        ->type_name("RANGE");
}

void declareFrames(CLI::App* app, std::optional<uint64_t>* frames) {
    app->add_option("--frames", *frames, "stop after so many frames")
        ->check(checkCount)
        ->type_name("N");
}

}  // namespace vidshow::tools
