#include "play/sdl_sink.h"

#include <algorithm>
#include <filesystem>

namespace vidshow::tools {

SdlSink::SdlSink(const std::string& clip)
    : m_clip(std::filesystem::path(clip).filename().string()),
      m_window(m_clip),
      m_converter(SdlWindow::kFormat, RgbConverter::Quality::fast) {}

void SdlSink::show(const Picture& picture) {
    m_window.show(m_converter.convert(picture, picture.planes.width, picture.planes.height),
                  displaySize(picture));
}

// Looks for events now and then: SDL's own wait wakes itself by a message from a second connection
// to the X server, which ends the program if the window is gone when the server gets to it.
Command SdlSink::wait(std::chrono::nanoseconds time) {
    using std::chrono::steady_clock;
    constexpr std::chrono::nanoseconds kNone(0);
    constexpr std::chrono::nanoseconds kBetweenLooks = std::chrono::milliseconds(5);
    const steady_clock::time_point end = steady_clock::now() + time;
    for (;;) {
        SDL_Event event;
        while (SDL_PollEvent(&event) != 0) {
            const Command command = answer(event);
            if (command != Command::none) return command;
        }
        const std::chrono::nanoseconds left = end - steady_clock::now();
        if (left <= kNone) return Command::none;
        Sink::wait(std::min(left, kBetweenLooks));
    }
}

Command SdlSink::answer(const SDL_Event& event) {
    switch (event.type) {
        case SDL_QUIT:
            return Command::quit;
        case SDL_KEYDOWN:
            return answerKey(event.key);
        case SDL_WINDOWEVENT:
            m_window.redraw();
            return Command::none;
        default:
            return Command::none;
    }
}

Command SdlSink::answerKey(const SDL_KeyboardEvent& key) {
    switch (key.keysym.sym) {
        case SDLK_LEFT:
            return Command::seekBack;
        case SDLK_RIGHT:
            return Command::seekForward;
        case SDLK_q:
        case SDLK_ESCAPE:
            return Command::quit;
        default:
            break;
    }
    if (key.repeat != 0) return Command::none;  // what is switched is not switched by holding a key
    switch (key.keysym.sym) {
        case SDLK_SPACE:
            return Command::togglePause;
        case SDLK_d:
            return Command::nextDeinterlaceMode;
        case SDLK_f:
            m_window.toggleFullScreen();
            return Command::none;
        default:
            return Command::none;
    }
}

void SdlSink::setStatus(const std::string& status) {
    m_window.setTitle(m_clip + " - " + status);
}

}  // namespace vidshow::tools
