#pragma once

#include <functional>
#include <memory>
#include <string>

#include "playkit/clips.h"
#include "playkit/image.h"
#include "playkit/process.h"

namespace playkit {

/// Asks until the answer is yes. @return false when that takes longer than any machine needs
bool waitUntil(const std::function<bool()>& condition);

/// An X server of its own, without a window manager, and what a user does and sees there.
class Screen {
  public:
    using WindowId = unsigned long;

    Screen();
    ~Screen();
    Screen(const Screen&) = delete;
    Screen& operator=(const Screen&) = delete;

    Environment environment() const;  ///< for programs that are to be shown there

    /// Waits for a visible window whose title begins so. @return 0 when none comes
    WindowId waitForWindow(const std::string& title);

    std::string title(WindowId window) const;
    Size size(WindowId window) const;
    Image grab(WindowId window) const;
    void resize(WindowId window, const Size& size);
    void press(WindowId window, const std::string& key);  ///< a key in X's words: "space", "Left"
    void close(WindowId window);                          ///< as the cross of a title bar does

    /// A window manager's ear: whether some window has asked for its full screen.
    bool fullScreenAsked();

  private:
    struct Connection;
    Process m_server;
    std::unique_ptr<Connection> m_connection;
};

}  // namespace playkit
