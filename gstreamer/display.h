#pragma once

#include <SDL.h>

#include <memory>

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
    struct Library {
        Library();
        ~Library() { SDL_QuitSubSystem(SDL_INIT_VIDEO); }
        Library(const Library&) = delete;
        Library& operator=(const Library&) = delete;
    };
    struct Destroy {
        void operator()(SDL_Window* window) const { SDL_DestroyWindow(window); }
        void operator()(SDL_Renderer* renderer) const { SDL_DestroyRenderer(renderer); }
        void operator()(SDL_Texture* texture) const { SDL_DestroyTexture(texture); }
    };
    void resize(const Picture& picture);
    void lookForEvents();

    Library m_library;
    std::unique_ptr<SDL_Window, Destroy> m_window;
    std::unique_ptr<SDL_Renderer, Destroy> m_renderer;
    std::unique_ptr<SDL_Texture, Destroy> m_texture;
    int m_width = 0;
    int m_height = 0;
    bool m_closed = false;
};

}  // namespace vidshow::gst
