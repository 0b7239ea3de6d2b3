#pragma once

#include <memory>

#include "convert/output.h"

namespace vidshow::tools {

/// Pictures encoded and put into a container by FFmpeg's libraries. Containers of single pictures
/// get a file a picture, numbered as PNG files are.
/// @throws Error when nothing encodes for the container; it names what is missing
std::unique_ptr<Output> openClipOutput(const Options& options, AVRational frameRate);

}  // namespace vidshow::tools
