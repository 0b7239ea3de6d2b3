#pragma once

#include <SDL.h>

#include <memory>
#include <string>

namespace vidshow::tools {

/// The desktop's display, open as long as this lives.
class SdlDisplay {
  public:
    /// @param hint,value one of SDL's hints; these have to be given before
    /// @throws Error where there is no display
    SdlDisplay(const char* hint, const char* value);
    ~SdlDisplay() { SDL_QuitSubSystem(SDL_INIT_VIDEO); }
    SdlDisplay(const SdlDisplay&) = delete;
    SdlDisplay& operator=(const SdlDisplay&) = delete;
};

struct SdlDestroy {
    void operator()(SDL_Window* window) const { SDL_DestroyWindow(window); }
    void operator()(SDL_Renderer* renderer) const { SDL_DestroyRenderer(renderer); }
    void operator()(SDL_Texture* texture) const { SDL_DestroyTexture(texture); }
};
template <typename T>
using SdlPtr = std::unique_ptr<T, SdlDestroy>;

/// @name What cannot be had is an Error
/// @{
/// A window of one's own size, in pixels, until the first picture tells the right one; hidden.
/// @param flags further `SDL_WindowFlags`
SdlPtr<SDL_Window> openWindow(const std::string& title, int width, int height, Uint32 flags = 0);
SdlPtr<SDL_Renderer> openRenderer(SDL_Window* window);
/// Of a size in pixels, for pictures that change. @param format one of `SDL_PixelFormatEnum`
SdlPtr<SDL_Texture> openTexture(SDL_Renderer* renderer, Uint32 format, int width, int height);
/// @}

}  // namespace vidshow::tools
