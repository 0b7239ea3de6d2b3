#pragma once

#include "common/sdl.h"
#include "gstreamer/picture.h"

namespace vidshow::gst {

/// A window of the desktop that shows pictures; used by one thread at a time.
class Display {
  public:
    /// @throws tools::Error without a display
    Display();

    void show(const Picture& picture);

    bool closed() const { return m_closed; }  ///< by whoever watches

  private:
    void resize(const Picture& picture);
    void lookForEvents();

    tools::SdlDisplay m_display;
    tools::SdlPtr<SDL_Window> m_window;
    tools::SdlPtr<SDL_Renderer> m_renderer;
    tools::SdlPtr<SDL_Texture> m_texture;
    int m_width = 0;
    int m_height = 0;
    bool m_closed = false;
};

}  // namespace vidshow::gst
