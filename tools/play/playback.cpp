#include "play/playback.h"

#include <algorithm>
#include <cstdio>

#include "common/deinterlace.h"

namespace vidshow::tools {

namespace {

constexpr double kSeekSeconds = 5;
constexpr std::chrono::milliseconds kPauseStep(100);
constexpr std::chrono::milliseconds kRateStep(500);

uint64_t expectedFrames(const Options& options, const Decoder& decoder) {
    const uint64_t announced = decoder.announcedFrames();
    if (!options.frames) return announced;
    return announced != 0 ? std::min(announced, *options.frames) : *options.frames;
}

}  // namespace

Playback::Playback(const Options& options, Decoder* decoder, Player* player, Sink* sink)
    : m_options(options),
      m_decoder(decoder),
      m_player(player),
      m_sink(sink),
      m_pacer(options.pace && !sink->wantsEveryFrame(), decoder->frameSeconds()),
      m_progress(!sink->watched(), expectedFrames(options, *decoder)),
      m_onWindow(checkMemory(av_frame_alloc())),
      m_deinterlace(options.deinterlace),
      m_rateSince(Pacer::Clock::now()) {}

void Playback::run() {
    while (!m_quit && !enough()) {
        const AVFrame* const frame = m_decoder->next();
        if (frame == nullptr) {
            m_ended = true;
            return;
        }
        ++m_number;
        if (!awaitTurn()) continue;
        if (m_pacer.late(m_decoder->seconds())) {
            ++m_counts.dropped;
        } else {
            present(*frame);
        }
        m_progress.update(m_number);
        tellStatus();
    }
}

bool Playback::enough() const {
    return m_sink->satisfied() || (m_options.frames && m_number >= *m_options.frames);
}

// Waits until the current frame's time has come. Returns false when it is not to be shown: the
// watcher has moved elsewhere or had enough.
bool Playback::awaitTurn() {
    m_sought = false;
    for (;;) {
        const bool waiting = m_paused && !m_showWhilePaused;
        const std::chrono::nanoseconds left =
            waiting ? kPauseStep : m_pacer.untilDue(m_decoder->seconds());
        obey(m_sink->wait(left));
        if (m_quit || m_sought) return false;
        if (m_paused && !m_showWhilePaused) continue;
        if (m_pacer.untilDue(m_decoder->seconds()).count() == 0) break;
    }
    m_showWhilePaused = false;
    return true;
}

void Playback::present(const AVFrame& frame) {
    av_frame_unref(m_onWindow.get());
    av_frame_ref(m_onWindow.get(), &frame);
    m_position = m_decoder->stamp();
    if (m_player->present(frame, m_number)) {
        ++m_counts.shown;
        return;
    }
    // One frame's reason is mostly that of all.
    if (m_counts.failed++ == 0) {
        std::fprintf(stderr, "vidshow-play: frame %llu is not shown: %s\n",
                     static_cast<unsigned long long>(m_number), m_player->failure().c_str());
    }
}

void Playback::obey(Command command) {
    switch (command) {
        case Command::none:
            return;
        case Command::quit:
            m_quit = true;
            return;
        case Command::togglePause:
            m_paused = !m_paused;
            m_pacer.restart();
            return;
        case Command::seekBack:
            return seek(-kSeekSeconds);
        case Command::seekForward:
            return seek(kSeekSeconds);
        case Command::nextDeinterlaceMode:
            return nextDeinterlaceMode();
    }
}

void Playback::seek(double seconds) {
    const double target = std::max(m_position + seconds, 0.0);
    if (!m_decoder->seek(target)) return;
    m_position = target;
    m_sought = true;
    m_showWhilePaused = m_paused;
    m_pacer.restart();
}

void Playback::nextDeinterlaceMode() {
    if (m_options.path == Path::decoder) return;  // queued buffers are shown as they are
    m_deinterlace = (m_deinterlace + 1) % static_cast<uint32_t>(kDeinterlaceNames.size());
    m_player->setDeinterlace(m_deinterlace);
    // While the picture stands it is shown anew, so that modes can be compared.
    if (m_paused && m_onWindow->width > 0) m_player->present(*m_onWindow, m_number);
    m_rateSince = Pacer::Clock::time_point();  // the title tells at once
    tellStatus();
}

void Playback::tellStatus() {
    const Pacer::Clock::time_point now = Pacer::Clock::now();
    const std::chrono::duration<double> passed = now - m_rateSince;
    if (passed < kRateStep) return;
    if (m_rateSince != Pacer::Clock::time_point()) {
        m_rate = static_cast<double>(m_counts.shown - m_rateFrom) / passed.count();
    }
    m_rateSince = now;
    m_rateFrom = m_counts.shown;
    char text[60];
    std::snprintf(
        text, sizeof text, "%.1f fps - %s", m_rate,
        m_options.path == Path::decoder ? "decoder buffers" : kDeinterlaceNames[m_deinterlace]);
    m_sink->setStatus(text);
}

}  // namespace vidshow::tools
