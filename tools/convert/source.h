#pragma once

#include <memory>
#include <string>

#include "convert/image.h"
#include "convert/options.h"

namespace vidshow::tools {

/// Where pictures come from.
class Source {
  public:
    virtual ~Source() = default;

    /// @return the next picture, valid until the next call; null at the end
    /// @throws Error when what comes is no picture
    virtual const Image* next() = 0;

    /// Of the picture that came last.
    virtual Colour colour() const = 0;

    virtual AVRational frameRate() const = 0;
    virtual uint64_t announcedFrames() const = 0;  ///< 0 unknown

    /// @return at the end: what is wrong with the input; empty for nothing
    virtual std::string damage() const { return ""; }
};

/// A file that FFmpeg's libraries decode. Pixels that the engine does not know are repacked into
/// the nearest form that it does. @throws Error
std::unique_ptr<Source> openClip(const Options& options);

/// A file of planes, one after the other, rows without gaps. @throws Error
std::unique_ptr<Source> openRaw(const Options& options);

}  // namespace vidshow::tools
