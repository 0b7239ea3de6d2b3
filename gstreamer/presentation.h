#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>

#include "gstreamer/padded_frame.h"
#include "play/presenter.h"
#include "vidshow-host/window.h"

namespace vidshow::gst {

/// A presenter on a window of the host, and what arrives there. The presenter's software renderer
/// is one for the whole process, and so is this.
class Presentation {
  public:
    /// What arrived, valid until the call returns; nothing may be thrown out of it.
    using Watcher = std::function<void(const host::Frame& frame)>;

    /// @throws tools::Error while there is another one in the process
    explicit Presentation(Watcher watcher);
    ~Presentation();
    Presentation(const Presentation&) = delete;
    Presentation& operator=(const Presentation&) = delete;

    void setDeinterlace(uint32_t mode) { m_presenter->setDeinterlace(mode); }

    /// @param colours bits 0 to 15 of a stream's format code: matrix and range
    /// @throws tools::Error when the frame does not reach the window
    void show(const Picture& picture, uint32_t colours);

  private:
    Watcher m_watcher;
    host::Window m_window;
    std::optional<tools::Presenter> m_presenter;
    PaddedFrame m_padded;
    std::string m_logged;
    bool m_arrived = false;
};

}  // namespace vidshow::gst
