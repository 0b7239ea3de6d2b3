#include "common/decoder.h"

#include <cerrno>
#include <cmath>
#include <optional>

#include "common/error.h"

namespace vidshow::tools {

namespace {

constexpr int kOneThreadAProcessor = 0;

}  // namespace

Decoder::Decoder(const std::string& path)
    : m_demuxer(path),
      m_frameSeconds(1 / m_demuxer.frameRate()),
      m_timeline(m_frameSeconds, m_demuxer.stampsMayJump()),
      m_packet(checkMemory(av_packet_alloc())),
      m_frame(checkMemory(av_frame_alloc())) {
    openCodec(path);
}

void Decoder::openCodec(const std::string& path) {
    const AVCodecParameters* const parameters = m_demuxer.video().codecpar;
    const AVCodec* const codec = avcodec_find_decoder(parameters->codec_id);
    if (codec == nullptr) {
        throw Error("nothing here decodes the video of " + path + " (" +
                    avcodec_get_name(parameters->codec_id) + ")");
    }
    m_codec.reset(checkMemory(avcodec_alloc_context3(codec)));
    int result = avcodec_parameters_to_context(m_codec.get(), parameters);
    m_codec->thread_count = kOneThreadAProcessor;
    m_codec->pkt_timebase = m_demuxer.video().time_base;
    if (result >= 0) result = avcodec_open2(m_codec.get(), codec, nullptr);
    if (result < 0) throw Error("cannot decode " + path + ": " + avErrorText(result));
}

const AVFrame* Decoder::next() {
    for (;;) {
        const int result = avcodec_receive_frame(m_codec.get(), m_frame.get());
        if (result == 0) {
            if (accept()) return m_frame.get();
            continue;
        }
        if (m_drained) return nullptr;
        if (result != AVERROR(EAGAIN)) ++m_bad;
        feed();
    }
}

void Decoder::feed() {
    m_drained = !m_demuxer.read(m_packet.get());
    const int result = avcodec_send_packet(m_codec.get(), m_drained ? nullptr : m_packet.get());
    if (result < 0 && !m_drained) ++m_bad;
}

// Takes note of a decoded frame. Returns false for one on the way to where a seek is going.
bool Decoder::accept() {
    std::optional<double> stamp;
    if (m_frame->best_effort_timestamp != AV_NOPTS_VALUE) {
        stamp = static_cast<double>(m_frame->best_effort_timestamp) *
                av_q2d(m_demuxer.video().time_base);
    }
    m_stamp = stamp.value_or(m_stamp + m_frameSeconds);
    if (m_skipping && m_stamp < m_skipUntil) return false;
    m_skipping = false;

    const bool clean =
        m_frame->decode_error_flags == 0 && (m_frame->flags & AV_FRAME_FLAG_CORRUPT) == 0;
    if (!clean && !m_sought) ++m_bad;
    m_frame->sample_aspect_ratio = m_demuxer.pixelAspect(m_frame.get());
    m_due = m_timeline.advance(stamp);
    return true;
}

bool Decoder::seek(double stamp) {
    if (!m_demuxer.seek(stamp)) return false;
    avcodec_flush_buffers(m_codec.get());
    m_timeline.restart();
    m_skipUntil = stamp - m_frameSeconds / 2;
    m_skipping = true;
    m_sought = true;
    m_drained = false;
    return true;
}

AVRational Decoder::frameRate() const {
    constexpr int kLargestTerm = 1'000'000;
    return av_d2q(1 / m_frameSeconds, kLargestTerm);
}

uint64_t Decoder::announcedFrames() const {
    const AVStream& video = m_demuxer.video();
    if (video.nb_frames > 0) return static_cast<uint64_t>(video.nb_frames);
    const double seconds = m_demuxer.announcedSeconds();
    return static_cast<uint64_t>(std::llround(seconds / m_frameSeconds));
}

std::string Decoder::damage() const {
    const std::string container = m_demuxer.damage();
    if (!container.empty()) return container;
    return m_bad > 0 ? std::to_string(m_bad) + " of its frames did not decode cleanly" : "";
}

}  // namespace vidshow::tools
