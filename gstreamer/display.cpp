#include "gstreamer/display.h"

namespace vidshow::gst {

namespace {

constexpr int kFirstSize = 160;  // pixels, until the first picture

}  // namespace

Display::Display()
    : m_display(SDL_HINT_NO_SIGNAL_HANDLERS, "1"),  // an interrupt is the program's, not ours
      m_window(tools::openWindow("vidshowsink", kFirstSize, kFirstSize)),
      m_renderer(tools::openRenderer(m_window.get())) {}

void Display::resize(const Picture& picture) {
    if (picture.width == m_width && picture.height == m_height) return;
    m_texture =
        tools::openTexture(m_renderer.get(), SDL_PIXELFORMAT_YV12, picture.width, picture.height);
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
