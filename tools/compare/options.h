#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace vidshow::tools {

/// The command line.
struct Options {
    std::string clips[2];
    std::string difference;  ///< the file of the difference picture; empty: none
    int gain = 8;            ///< of the difference picture
    int64_t offset = 0;      ///< the first frame of A goes with frame 1 + offset of B
    std::optional<uint64_t> frames;
    bool json = false;
};

/// Reads the command line. Prints help, the version, or what is wrong.
/// @return the exit status when there is nothing to compare
std::optional<int> readOptions(int argc, char** argv, Options* options);

}  // namespace vidshow::tools
