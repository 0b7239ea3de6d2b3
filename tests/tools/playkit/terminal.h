#pragma once

#include <string>
#include <vector>

namespace playkit {

/// Runs a program on a terminal of its own. @return everything that it prints there
std::string runOnTerminal(const std::vector<std::string>& command);

}  // namespace playkit
