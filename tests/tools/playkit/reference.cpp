#include "playkit/reference.h"

#include <gtest/gtest.h>

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
}

namespace playkit {

namespace {

RawFrame rawFrame(const AVFrame& frame) {
    RawFrame raw = {frame.width, frame.height, {}};
    for (int i = 0; i < 3; ++i) {
        const int width = i == 0 ? frame.width : (frame.width + 1) / 2;
        const int height = i == 0 ? frame.height : (frame.height + 1) / 2;
        for (int y = 0; y < height; ++y) {
            const uint8_t* const row = frame.data[i] + ptrdiff_t{y} * frame.linesize[i];
            raw.planes[i].insert(raw.planes[i].end(), row, row + width);
        }
    }
    return raw;
}

void drain(AVCodecContext* codec, AVFrame* frame, std::vector<RawFrame>* frames) {
    while (avcodec_receive_frame(codec, frame) == 0) {
        EXPECT_TRUE(frame->format == AV_PIX_FMT_YUV420P || frame->format == AV_PIX_FMT_YUVJ420P);
        frames->push_back(rawFrame(*frame));
    }
}

}  // namespace

std::vector<RawFrame> decodeAll(const std::string& path) {
    av_log_set_level(AV_LOG_QUIET);
    std::vector<RawFrame> frames;
    AVFormatContext* format = nullptr;
    if (avformat_open_input(&format, path.c_str(), nullptr, nullptr) < 0) {
        ADD_FAILURE() << "cannot open " << path;
        return frames;
    }
    avformat_find_stream_info(format, nullptr);
    const AVCodec* decoder = nullptr;
    const int stream = av_find_best_stream(format, AVMEDIA_TYPE_VIDEO, -1, -1, &decoder, 0);
    AVCodecContext* codec = avcodec_alloc_context3(decoder);
    avcodec_parameters_to_context(codec, format->streams[stream]->codecpar);
    EXPECT_GE(avcodec_open2(codec, decoder, nullptr), 0);

    AVPacket* packet = av_packet_alloc();
    AVFrame* frame = av_frame_alloc();
    while (av_read_frame(format, packet) >= 0) {
        if (packet->stream_index == stream) {
            avcodec_send_packet(codec, packet);
            drain(codec, frame, &frames);
        }
        av_packet_unref(packet);
    }
    avcodec_send_packet(codec, nullptr);
    drain(codec, frame, &frames);
    av_frame_free(&frame);
    av_packet_free(&packet);
    avcodec_free_context(&codec);
    avformat_close_input(&format);
    return frames;
}

}  // namespace playkit
