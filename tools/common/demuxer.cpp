#include "common/demuxer.h"

#include <algorithm>
#include <cstdio>
#include <filesystem>

#include "common/error.h"

namespace vidshow::tools {

namespace {

constexpr double kUsualFrameRate = 25;

// How much earlier than announced a clip may end: containers round, and count odd bits of sound.
constexpr double kEndTolerance = 0.25;

// A clip is a file: a play list in it must not make us open connections.
AvPtr<AVFormatContext> open(const std::string& path) {
    std::error_code error;
    if (std::filesystem::is_regular_file(path, error) && std::filesystem::is_empty(path, error)) {
        throw Error(path + " is empty");
    }
    AvDictionary options;
    av_dict_set(&options.entries, "protocol_whitelist", "file,crypto,data", 0);
    AVFormatContext* context = nullptr;
    const int result =
        avformat_open_input(&context, ("file:" + path).c_str(), nullptr, &options.entries);
    if (result < 0) throw Error("cannot read " + path + ": " + avErrorText(result));
    return AvPtr<AVFormatContext>(context);
}

// FFmpeg also plays text files, as the screen of a terminal would show them.
bool isText(AVCodecID codec) {
    return codec == AV_CODEC_ID_ANSI || codec == AV_CODEC_ID_BINTEXT || codec == AV_CODEC_ID_XBIN ||
           codec == AV_CODEC_ID_IDF;
}

}  // namespace

Demuxer::Demuxer(const std::string& path) : m_context(open(path)) {
    avformat_find_stream_info(m_context.get(), nullptr);  // what is missing the decoder finds out
    const int index = av_find_best_stream(m_context.get(), AVMEDIA_TYPE_VIDEO, -1, -1, nullptr, 0);
    if (index >= 0) m_video = m_context->streams[index];
    checkVideo(path);
}

void Demuxer::checkVideo(const std::string& path) const {
    const bool cover =
        m_video != nullptr && (m_video->disposition & AV_DISPOSITION_ATTACHED_PIC) != 0;
    if (m_video == nullptr || cover || isText(m_video->codecpar->codec_id)) {
        throw Error("there is no video in " + path);
    }
}

AVRational Demuxer::pixelAspect(AVFrame* frame) const {
    return av_guess_sample_aspect_ratio(m_context.get(), m_video, frame);
}

double Demuxer::frameRate() const {
    const AVRational rate = av_guess_frame_rate(m_context.get(), m_video, nullptr);
    return rate.num > 0 && rate.den > 0 ? av_q2d(rate) : kUsualFrameRate;
}

bool Demuxer::stampsMayJump() const {
    return (m_context->iformat->flags & AVFMT_TS_DISCONT) != 0;
}

double Demuxer::announcedSeconds() const {
    const int64_t duration = m_context->duration;
    return duration > 0 ? static_cast<double>(duration) / AV_TIME_BASE : 0;
}

bool Demuxer::read(AVPacket* packet) {
    for (;;) {
        av_packet_unref(packet);
        const int result = av_read_frame(m_context.get(), packet);
        if (result < 0) {
            m_readError = result == AVERROR_EOF ? 0 : result;
            return false;
        }
        noteEnd(*packet);
        if (packet->stream_index == m_video->index) return true;
    }
}

void Demuxer::noteEnd(const AVPacket& packet) {
    m_lastPacketCut = (packet.flags & AV_PKT_FLAG_CORRUPT) != 0;
    const int64_t stamp = packet.pts != AV_NOPTS_VALUE ? packet.pts : packet.dts;
    if (stamp == AV_NOPTS_VALUE) return;
    const AVRational unit = m_context->streams[packet.stream_index]->time_base;
    m_end = std::max(m_end, static_cast<double>(stamp + packet.duration) * av_q2d(unit));
}

bool Demuxer::seek(double seconds) {
    const double start = m_video->start_time != AV_NOPTS_VALUE
                             ? static_cast<double>(m_video->start_time) * av_q2d(m_video->time_base)
                             : 0;
    const double stamp = std::max(seconds, start) / av_q2d(m_video->time_base);
    return av_seek_frame(m_context.get(), m_video->index, static_cast<int64_t>(stamp),
                         AVSEEK_FLAG_BACKWARD) >= 0;
}

std::string Demuxer::damage() const {
    if (m_readError != 0) return "reading ended with: " + avErrorText(m_readError);
    if (m_lastPacketCut) return "it ends in the middle of a frame";
    // A duration that FFmpeg worked out itself tells nothing about what was there once.
    if (m_context->duration_estimation_method != AVFMT_DURATION_FROM_STREAM) return "";
    const double start = m_context->start_time != AV_NOPTS_VALUE
                             ? static_cast<double>(m_context->start_time) / AV_TIME_BASE
                             : 0;
    const double announced = announcedSeconds();
    if (m_end >= start + announced - kEndTolerance) return "";
    char text[80];
    std::snprintf(text, sizeof text, "it ends after %.1f s of %.1f s", std::max(m_end - start, 0.0),
                  announced);
    return text;
}

uint64_t countFrames(const std::string& path) {
    Demuxer demuxer(path);
    const AvPtr<AVPacket> packet(checkMemory(av_packet_alloc()));
    uint64_t count = 0;
    while (demuxer.read(packet.get()))
        ++count;
    return count;
}

}  // namespace vidshow::tools
