#pragma once

#include <CLI/CLI.hpp>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "common/colour.h"

namespace vidshow::tools {

/// What a program tells of itself beside its options.
struct ProgramText {
    const char* name;
    const char* version;
    const char* summary;  ///< a sentence, without its point
    struct Section {
        const char* title;
        const char* text;  ///< paragraphs, an empty line between two
    };
    std::vector<Section> sections;
};

/// A command line whose help, manual page and completion are made from one declaration. Beside the
/// declared options, `--print-manual` and `--print-completion` alone print the latter two: the
/// build calls them.
class CommandLine {
  public:
    explicit CommandLine(const ProgramText& text);

    CLI::App& options() { return m_app; }

    /// Prints help, the version, or what is wrong.
    /// @param check may throw a `CLI::ParseError` of what no single option shows
    /// @return the exit status when there is nothing to do
    std::optional<int> read(int argc, char** argv, const std::function<void()>& check = {});

  private:
    const ProgramText m_text;
    CLI::App m_app;
};

/// The value is one of these.
CLI::IsMember oneOf(const std::vector<std::string>& names);

template <typename T>
CLI::IsMember oneOf(const std::map<std::string, T>& names) {
    std::vector<std::string> keys;
    for (const auto& entry : names)
        keys.push_back(entry.first);
    return oneOf(keys);
}

/// @return what is wrong with a number from 1 on that is written in digits alone; "" for nothing
std::string checkCount(const std::string& text);

/// What the programs' options on a clip's colours and fields are read into.
struct ClipTexts {
    std::string deinterlace = "off";
    std::string matrix;
    std::string range;

    uint32_t deinterlaceMode() const;
    std::optional<Matrix> matrixGiven() const;
    std::optional<Range> rangeGiven() const;
};

/// @param limits to what the option is limited
void declareDeinterlace(CLI::App* app, ClipTexts* texts, const std::string& limits);
void declareMatrixAndRange(CLI::App* app, ClipTexts* texts);
void declareFrames(CLI::App* app, std::optional<uint64_t>* frames);

}  // namespace vidshow::tools
