#pragma once

#include <chrono>
#include <string>

#include "common/picture.h"

namespace vidshow::tools {

/// What the person in front of a window wants.
enum class Command { none, quit, togglePause, seekBack, seekForward, nextDeinterlaceMode };

/// Where the window's pictures go. Functions throw `Error` when the output fails.
class Sink {
  public:
    virtual ~Sink() = default;

    virtual void show(const Picture& picture) = 0;

    /// Everything has been shown. @return what the user should know of the result, a line or none
    virtual std::string finish() { return ""; }

    /// No more pictures are wanted.
    virtual bool satisfied() const { return false; }

    /// Every picture counts, however long it takes: no frame is held back or dropped.
    virtual bool wantsEveryFrame() const { return false; }

    /// Somebody watches: progress need not be told.
    virtual bool watched() const { return false; }

    /// Standard output belongs to the pictures.
    virtual bool takesStandardOutput() const { return false; }

    /// Waits so long, or until somebody wants something. @param time may be 0
    virtual Command wait(std::chrono::nanoseconds time);

    /// Tells the watcher how it goes.
    virtual void setStatus(const std::string&) {}
};

}  // namespace vidshow::tools
