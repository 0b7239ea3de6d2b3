#pragma once

#include <string>

#include "common/sink.h"
#include "play/sdl_window.h"

namespace vidshow::tools {

/// A window on the desktop, with keys.
class SdlSink : public Sink {
  public:
    /// @param clip its file name goes into the title. @throws Error without a display
    explicit SdlSink(const std::string& clip);

    void show(const Picture& picture) override;
    bool watched() const override { return true; }
    Command wait(std::chrono::nanoseconds time) override;
    void setStatus(const std::string& status) override;

  private:
    Command answer(const SDL_Event& event);
    Command answerKey(const SDL_KeyboardEvent& key);

    const std::string m_clip;
    SdlWindow m_window;
    RgbConverter m_converter;
};

}  // namespace vidshow::tools
