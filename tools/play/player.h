#pragma once

#include <chrono>
#include <exception>
#include <optional>
#include <string>

#include "common/colour.h"
#include "common/sink.h"
#include "play/decoder_buffers.h"
#include "play/options.h"
#include "play/planar420.h"
#include "play/presenter.h"
#include "vidshow-host/window.h"

namespace vidshow::tools {

/// Puts decoded frames through the presenter onto a window, and the window's buffers into a sink.
///
/// The engine draws whole blocks of four pixels by four. So that no edge of a picture is lost,
/// frames of other sizes go through a stream (and onto a window) of the next multiple of four, and
/// the window's buffers are cropped to the frame's size before they are shown.
class Player {
  public:
    Player(const Options& options, Sink* sink);
    ~Player();
    Player(const Player&) = delete;
    Player& operator=(const Player&) = delete;

    /// Shows a frame. @param number of the clip's frame, from 1
    /// @return false, with `failure`, when it did not arrive whole at the window
    bool present(const AVFrame& frame, uint64_t number);

    void setDeinterlace(uint32_t mode) { m_presenter.setDeinterlace(mode); }

    const std::string& failure() const { return m_failure; }
    std::chrono::nanoseconds presentTime() const { return m_presentTime; }  ///< without the sink's
    uint64_t presents() const { return m_presents; }

  private:
    Look lookOf(const AVFrame& frame) const;
    uint32_t formatCode(const Colour& colour) const;
    HRESULT handOver(const Planes& planes);
    bool judge(HRESULT result);
    void onWindowFrame(const host::Frame& frame);

    const Options& m_options;
    Sink* const m_sink;
    host::Window m_window;
    Presenter m_presenter;
    Planar420 m_planar;
    DecoderBuffers m_buffers;

    Picture m_expected = {};  // of the frame that is being presented; planes only have their size
    bool m_arrived = false;
    std::exception_ptr m_sinkError;
    std::string m_logged;  // the presenter's last complaint about this frame
    std::string m_failure;
    std::chrono::nanoseconds m_presentTime{0};
    std::chrono::nanoseconds m_sinkTime{0};
    uint64_t m_presents = 0;
};

}  // namespace vidshow::tools
