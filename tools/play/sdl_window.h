#pragma once

#include <string>

#include "common/sdl.h"
#include "play/fit.h"
#include "play/rgb_converter.h"

namespace vidshow::tools {

/// A window that shows one image, as large as fits and in its shape, on black.
class SdlWindow {
  public:
    /// The form of the images, in FFmpeg's words: 32 bits, blue in the lowest byte's place.
    static constexpr AVPixelFormat kFormat = AV_PIX_FMT_RGB32;

    /// @throws Error without a display
    explicit SdlWindow(const std::string& title);

    /// Shows an image. @param shape its size on square pixels
    void show(const RgbImage& image, const Size& shape);

    void redraw();  ///< what was shown last, after the window changed
    void setTitle(const std::string& title);
    void toggleFullScreen();

  private:
    void openAt(const Size& shape);
    void resizeTexture(const RgbImage& image);

    SdlDisplay m_display;
    SdlPtr<SDL_Window> m_window;
    SdlPtr<SDL_Renderer> m_renderer;
    SdlPtr<SDL_Texture> m_texture;
    Size m_textureSize = {0, 0};
    Size m_shape = {0, 0};
    bool m_shown = false;
};

}  // namespace vidshow::tools
