#pragma once

#include <chrono>
#include <cstdint>

#include "common/decoder.h"
#include "common/progress.h"
#include "common/sink.h"
#include "play/options.h"
#include "play/pacer.h"
#include "play/player.h"

namespace vidshow::tools {

/// What became of the frames.
struct Counts {
    uint64_t shown = 0;
    uint64_t dropped = 0;  ///< decoded too late to be shown
    uint64_t failed = 0;   ///< presented, but not on the window
};

/// Plays a clip from its start to its end, and does what the watcher asks for.
class Playback {
  public:
    Playback(const Options& options, Decoder* decoder, Player* player, Sink* sink);

    void run();

    const Counts& counts() const { return m_counts; }
    uint64_t decoded() const { return m_number; }  ///< frames that the clip gave
    bool ended() const { return m_ended; }         ///< the clip ended by itself

  private:
    bool awaitTurn();
    void present(const AVFrame& frame);
    void obey(Command command);
    void seek(double seconds);
    void nextDeinterlaceMode();
    void tellStatus();
    bool enough() const;

    const Options& m_options;
    Decoder* const m_decoder;
    Player* const m_player;
    Sink* const m_sink;
    Pacer m_pacer;
    Progress m_progress;
    Counts m_counts;

    uint64_t m_number = 0;      // frames decoded
    AvPtr<AVFrame> m_onWindow;  // the frame presented last
    double m_position = 0;      // its stamp, or where a seek goes
    uint32_t m_deinterlace;
    bool m_ended = false;
    bool m_quit = false;
    bool m_paused = false;
    bool m_sought = false;  // the current frame is no longer the one to show
    bool m_showWhilePaused = false;

    Pacer::Clock::time_point m_rateSince;
    uint64_t m_rateFrom = 0;  // frames shown at that time
    double m_rate = 0;        // frames a second
};

}  // namespace vidshow::tools
