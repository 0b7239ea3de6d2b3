#pragma once

#include <memory>
#include <string>

#include "convert/image.h"
#include "convert/options.h"

namespace vidshow::tools {

/// Where pictures go. Functions throw `Error` when the output fails.
class Output {
  public:
    virtual ~Output() = default;
    virtual void write(const Image& image, const Colour& colour) = 0;
    virtual void finish() = 0;
};

/// @throws Error
std::unique_ptr<Output> openOutput(const Options& options, AVRational frameRate);

}  // namespace vidshow::tools
