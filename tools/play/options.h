#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "common/colour.h"

namespace vidshow::tools {

enum class WindowKind { automatic, sdl, png, y4m, memory };
enum class Path { software, decoder };

/// The command line.
struct Options {
    std::string clip;
    WindowKind window = WindowKind::automatic;
    std::string target;           ///< the folder of `png`, the file of `y4m`
    std::vector<uint64_t> picks;  ///< frames to write as pictures, from 1, rising; empty: spread
    Path path = Path::software;
    uint32_t deinterlace = 0;
    std::optional<Matrix> matrix;  ///< as the clip says, unless set
    std::optional<Range> range;    ///< as the clip says, unless set
    std::optional<uint64_t> frames;
    bool pace = true;
};

/// Reads the command line. Prints help, the version, or what is wrong.
/// @return the exit status when there is nothing to play
std::optional<int> readOptions(int argc, char** argv, Options* options);

}  // namespace vidshow::tools
