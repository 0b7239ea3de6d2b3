#pragma once

#include <string>
#include <vector>

#include "playkit/reference.h"

namespace playkit {

/// A YUV4MPEG2 file.
struct Y4m {
    std::string header;  ///< first line, without its end
    std::vector<RawFrame> frames;
};

/// Reads a whole file; whatever is wrong with it fails the test.
Y4m readY4m(const std::string& path);

/// The value of a tag in the header, "" without it.
std::string y4mTag(const Y4m& file, char tag);

/// Fails the test at the first difference.
void expectSameFrames(const std::vector<RawFrame>& shown, const std::vector<RawFrame>& expected);

}  // namespace playkit
