#include "gstreamer/display.h"

#include <cstdlib>
#include <string>

#include "common/error.h"

namespace vidshow::gst {

namespace {

[[noreturn]] void fail(const char* what) {
    throw tools::Error(std::string("cannot open ") + what + ": " + SDL_GetError());
}

bool isSet(const char* variable) {
    const char* const value = std::getenv(variable);
    return value != nullptr && *value != '\0';
}

}  // namespace

Display::Library::Library() {
    // SDL by itself would end up on a display that shows nothing.
    if (!isSet("DISPLAY") && !isSet("WAYLAND_DISPLAY") && !isSet("SDL_VIDEODRIVER")) {
        throw tools::Error("there is no display");
    }
    SDL_SetHint(SDL_HINT_NO_SIGNAL_HANDLERS, "1");  // an interrupt is the program's, not ours
    SDL_SetHint(SDL_HINT_RENDER_SCALE_QUALITY, "linear");
    if (SDL_InitSubSystem(SDL_INIT_VIDEO) != 0) fail("a display");
}

Display::Display() {
    constexpr int kFirstSize = 160;
    m_window.reset(SDL_CreateWindow("vidshowsink", SDL_WINDOWPOS_CENTERED, SDL_WINDOWPOS_CENTERED,
                                    kFirstSize, kFirstSize,
                                    SDL_WINDOW_HIDDEN | SDL_WINDOW_RESIZABLE));
    if (!m_window) fail("a window");
    constexpr int kFirstDriver = -1;
    m_renderer.reset(SDL_CreateRenderer(m_window.get(), kFirstDriver, 0));
    if (!m_renderer) fail("the window's renderer");
}

void Display::resize(const Picture& picture) {
    if (picture.width == m_width && picture.height == m_height) return;
    m_texture.reset(SDL_CreateTexture(m_renderer.get(), SDL_PIXELFORMAT_YV12,
                                      SDL_TEXTUREACCESS_STREAMING, picture.width, picture.height));
    if (!m_texture) fail("a texture for the picture");
    SDL_SetWindowSize(m_window.get(), picture.width, picture.height);
    SDL_RenderSetLogicalSize(m_renderer.get(), picture.width, picture.height);
    SDL_ShowWindow(m_window.get());
    m_width = picture.width;
    m_height = picture.height;
}

void Display::lookForEvents() {
    SDL_Event event;
    while (SDL_PollEvent(&event) != 0)
        m_closed = m_closed || event.type == SDL_QUIT;
}

void Display::show(const Picture& picture) {
    resize(picture);
    SDL_UpdateYUVTexture(m_texture.get(), nullptr, picture.planes[0], picture.strides[0],
                         picture.planes[1], picture.strides[1], picture.planes[2],
                         picture.strides[2]);
    SDL_RenderClear(m_renderer.get());
    SDL_RenderCopy(m_renderer.get(), m_texture.get(), nullptr, nullptr);
    SDL_RenderPresent(m_renderer.get());
    lookForEvents();
}

}  // namespace vidshow::gst
