#include "common/sdl.h"

#include <cstdlib>
#include <utility>

#include "common/error.h"

namespace vidshow::tools {

namespace {

bool isSet(const char* variable) {
    const char* const value = std::getenv(variable);
    return value != nullptr && *value != '\0';
}

// The drivers of the displays that the environment names. SDL by itself would end up on one that
// shows nothing when the display cannot be reached. SDL_VIDEODRIVER in the environment wins.
std::string displayDrivers() {
    std::string drivers;
    const std::pair<const char*, const char*> known[] = {{"DISPLAY", "x11"},
                                                         {"WAYLAND_DISPLAY", "wayland"}};
    for (const auto& [variable, driver] : known) {
        if (isSet(variable)) drivers += (drivers.empty() ? "" : ",") + std::string(driver);
    }
    return drivers;
}

[[noreturn]] void fail(const char* what) {
    throw Error(std::string("cannot open ") + what + ": " + SDL_GetError());
}

template <typename T>
SdlPtr<T> checked(T* object, const char* what) {
    if (object == nullptr) fail(what);
    return SdlPtr<T>(object);
}

}  // namespace

SdlDisplay::SdlDisplay(const char* hint, const char* value) {
    const std::string drivers = displayDrivers();
    if (drivers.empty() && !isSet("SDL_VIDEODRIVER")) {
        throw Error("cannot open a display: neither DISPLAY nor WAYLAND_DISPLAY is set");
    }
    if (!drivers.empty()) {
        SDL_SetHintWithPriority(SDL_HINT_VIDEODRIVER, drivers.c_str(), SDL_HINT_DEFAULT);
    }
    SDL_SetHint(hint, value);
    SDL_SetHint(SDL_HINT_RENDER_SCALE_QUALITY, "linear");
    if (SDL_InitSubSystem(SDL_INIT_VIDEO) != 0) fail("a display");
}

SdlPtr<SDL_Window> openWindow(const std::string& title, int width, int height, Uint32 flags) {
    return checked(
        SDL_CreateWindow(title.c_str(), SDL_WINDOWPOS_CENTERED, SDL_WINDOWPOS_CENTERED, width,
                         height, SDL_WINDOW_HIDDEN | SDL_WINDOW_RESIZABLE | flags),
        "a window");
}

SdlPtr<SDL_Renderer> openRenderer(SDL_Window* window) {
    constexpr int kFirstDriver = -1;
    return checked(SDL_CreateRenderer(window, kFirstDriver, 0), "the window's renderer");
}

SdlPtr<SDL_Texture> openTexture(SDL_Renderer* renderer, Uint32 format, int width, int height) {
    return checked(SDL_CreateTexture(renderer, format, SDL_TEXTUREACCESS_STREAMING, width, height),
                   "a texture for the picture");
}

}  // namespace vidshow::tools
