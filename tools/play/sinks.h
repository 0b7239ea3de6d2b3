#pragma once

#include <memory>

#include "common/decoder.h"
#include "common/sink.h"
#include "play/options.h"

namespace vidshow::tools {

/// Opens what the options name. Without a name: a window where there is a display, else pictures
/// in a fresh folder.
std::unique_ptr<Sink> openSink(const Options& options, const Decoder& decoder);

}  // namespace vidshow::tools
