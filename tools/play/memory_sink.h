#pragma once

#include "play/sink.h"

namespace vidshow::play {

/// Shows nothing: the pictures stay in the window's memory.
class MemorySink : public Sink {
  public:
    void show(const Picture&) override {}
};

}  // namespace vidshow::play
