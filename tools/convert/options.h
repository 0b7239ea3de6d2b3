#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "common/colour.h"
#include "convert/format.h"

namespace vidshow::tools {

struct Size {
    int width;   ///< pixels
    int height;  ///< pixels
};

/// `clip` is what FFmpeg's libraries write.
enum class FileKind { png, y4m, raw, clip };

/// What the engine is asked for, beside what the input says.
struct Request {
    const Format* to = nullptr;  ///< null: what suits the output file
    std::optional<Size> resize;  ///< before the turn
    uint32_t algorithm = QZ_IMAGEPROC_RESIZE_LINEAR;
    uint32_t rotation = QZ_IMAGEPROC_ROTATE_NONE;
    std::optional<Matrix> matrix;
    std::optional<Range> range;
    uint32_t adjustment[3] = {128, 128, 128};  ///< brightness, contrast, saturation
    uint32_t colorKey = 0;                     ///< 0x00YYUUVV
    uint32_t alpha = 255;
    uint32_t deinterlace = 0;

    bool adjusts() const {
        return adjustment[0] != 128 || adjustment[1] != 128 || adjustment[2] != 128;
    }
};

/// The command line.
struct Options {
    std::string input;
    std::string output;             ///< "-" is standard output; empty with `info` alone
    const Format* given = nullptr;  ///< pixels of raw planes, or those that the engine is to get
    std::optional<Size> size;       ///< the input is raw planes of this size
    FileKind kind = FileKind::raw;
    std::string extension;  ///< of `kind`, without its point: what FFmpeg knows a container by
    std::string encoder;    ///< FFmpeg's name of one; empty: what suits the container
    std::vector<std::string> encoderOptions;  ///< "key=value"
    Request request;
    std::optional<uint64_t> frames;
    bool info = false;
    bool json = false;
};

/// Reads the command line. Prints help, the version, or what is wrong.
/// @return the exit status when there is nothing to convert
std::optional<int> readOptions(int argc, char** argv, Options* options);

}  // namespace vidshow::tools
