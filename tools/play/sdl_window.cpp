#include "play/sdl_window.h"

namespace vidshow::tools {

namespace {

constexpr Size kSmallest = {160, 120};  // pixels: a title bar has its buttons still

// The picture's own size, unless that is more than most of the screen.
Size firstSize(SDL_Window* window, const Size& shape) {
    SDL_Rect screen = {};
    if (SDL_GetDisplayUsableBounds(SDL_GetWindowDisplayIndex(window), &screen) != 0) return shape;
    const Size room = {screen.w * 9 / 10, screen.h * 9 / 10};
    if (shape.width <= room.width && shape.height <= room.height) return shape;
    return fitInto(shape, room).size;
}

}  // namespace

SdlWindow::SdlWindow(const std::string& title)
    : m_display(SDL_HINT_VIDEO_ALLOW_SCREENSAVER, "0"),
      m_window(openWindow(title, kSmallest.width, kSmallest.height, SDL_WINDOW_ALLOW_HIGHDPI)),
      m_renderer(openRenderer(m_window.get())) {
    SDL_SetWindowMinimumSize(m_window.get(), kSmallest.width, kSmallest.height);
}

void SdlWindow::openAt(const Size& shape) {
    const Size size = firstSize(m_window.get(), shape);
    SDL_SetWindowSize(m_window.get(), size.width, size.height);
    SDL_SetWindowPosition(m_window.get(), SDL_WINDOWPOS_CENTERED, SDL_WINDOWPOS_CENTERED);
    SDL_ShowWindow(m_window.get());
    m_shown = true;
}

void SdlWindow::resizeTexture(const RgbImage& image) {
    if (image.width == m_textureSize.width && image.height == m_textureSize.height) return;
    m_textureSize = {image.width, image.height};
    m_texture = openTexture(m_renderer.get(), SDL_PIXELFORMAT_ARGB8888, image.width, image.height);
    SDL_SetTextureBlendMode(m_texture.get(), SDL_BLENDMODE_NONE);
}

void SdlWindow::show(const RgbImage& image, const Size& shape) {
    resizeTexture(image);
    m_shape = shape;
    if (!m_shown) openAt(shape);
    SDL_UpdateTexture(m_texture.get(), nullptr, image.pixels.data(), image.stride);
    redraw();
}

void SdlWindow::redraw() {
    if (!m_texture) return;
    Size window = {};
    SDL_GetRendererOutputSize(m_renderer.get(), &window.width, &window.height);
    const Place place = fitInto(m_shape, window);
    const SDL_Rect rectangle = {place.left, place.top, place.size.width, place.size.height};
    SDL_SetRenderDrawColor(m_renderer.get(), 0, 0, 0, SDL_ALPHA_OPAQUE);
    SDL_RenderClear(m_renderer.get());
    SDL_RenderCopy(m_renderer.get(), m_texture.get(), nullptr, &rectangle);
    SDL_RenderPresent(m_renderer.get());
}

void SdlWindow::setTitle(const std::string& title) {
    SDL_SetWindowTitle(m_window.get(), title.c_str());
}

void SdlWindow::toggleFullScreen() {
    const bool full = (SDL_GetWindowFlags(m_window.get()) & SDL_WINDOW_FULLSCREEN_DESKTOP) != 0;
    SDL_SetWindowFullscreen(m_window.get(), full ? 0 : SDL_WINDOW_FULLSCREEN_DESKTOP);
    redraw();
}

}  // namespace vidshow::tools
