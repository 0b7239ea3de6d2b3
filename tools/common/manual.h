#pragma once

#include <CLI/CLI.hpp>
#include <string>

#include "common/command_line.h"

namespace vidshow::tools {

/// The manual page, in the macros of man(7).
std::string manualPage(const ProgramText& text, const CLI::App& app);

/// A completion for bash: option names, the words that an option takes, and files.
std::string bashCompletion(const CLI::App& app);

/// Paragraphs broken into lines of at most `width` characters.
std::string wrapped(const std::string& text, size_t width);

}  // namespace vidshow::tools
