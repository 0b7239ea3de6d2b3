#pragma once

#include "common/sink.h"

namespace vidshow::tools {

/// Shows nothing: the pictures stay in the window's memory.
class MemorySink : public Sink {
  public:
    void show(const Picture&) override {}
};

}  // namespace vidshow::tools
