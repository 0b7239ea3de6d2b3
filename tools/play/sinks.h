#pragma once

#include <memory>

#include "play/decoder.h"
#include "play/options.h"
#include "play/sink.h"

namespace vidshow::play {

/// Opens what the options name. Without a name: a window where there is a display, else pictures
/// in a fresh folder.
std::unique_ptr<Sink> openSink(const Options& options, const Decoder& decoder);

}  // namespace vidshow::play
