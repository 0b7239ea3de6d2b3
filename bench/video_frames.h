#pragma once

// Decoded frames of a video file, as planar 4:2:0.

#include <cstdint>
#include <cstdio>
#include <vector>

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
}

namespace bench {

/// One plane of 8-bit samples without padding.
struct Plane8 {
    int w = 0;
    int h = 0;
    std::vector<uint8_t> samples;
};

/// Planes Y, Cb, Cr; chroma half as wide and tall.
struct Frame420 {
    Plane8 plane[3];
};

inline Plane8 CopyPlane(const uint8_t* data, int stride, int w, int h) {
    Plane8 plane{w, h, {}};
    for (int y = 0; y < h; ++y) {
        const uint8_t* row = data + ptrdiff_t{stride} * y;
        plane.samples.insert(plane.samples.end(), row, row + w);
    }
    return plane;
}

/// Every `interval`th frame of a file's first video stream; empty if the file does not decode to
/// 4:2:0.
inline std::vector<Frame420> ReadFrames(const char* path, int interval) {
    std::vector<Frame420> frames;
    AVFormatContext* file = nullptr;
    if (avformat_open_input(&file, path, nullptr, nullptr) < 0) return frames;
    const AVCodec* codec = nullptr;
    avformat_find_stream_info(file, nullptr);
    const int stream = av_find_best_stream(file, AVMEDIA_TYPE_VIDEO, -1, -1, &codec, 0);
    AVCodecContext* decoder = stream < 0 ? nullptr : avcodec_alloc_context3(codec);
    AVPacket* packet = av_packet_alloc();
    AVFrame* frame = av_frame_alloc();
    if (decoder && avcodec_parameters_to_context(decoder, file->streams[stream]->codecpar) >= 0 &&
        avcodec_open2(decoder, codec, nullptr) >= 0) {
        int count = 0;
        bool more = true;
        while (more) {
            more = av_read_frame(file, packet) >= 0;
            if (more && packet->stream_index != stream) {
                av_packet_unref(packet);
                continue;
            }
            avcodec_send_packet(decoder, more ? packet : nullptr);
            av_packet_unref(packet);
            while (avcodec_receive_frame(decoder, frame) >= 0) {
                if (frame->format != AV_PIX_FMT_YUV420P || count++ % interval != 0) continue;
                Frame420 copy;
                for (int i = 0; i < 3; ++i) {
                    copy.plane[i] = CopyPlane(frame->data[i], frame->linesize[i],
                                              i ? frame->width / 2 : frame->width,
                                              i ? frame->height / 2 : frame->height);
                }
                frames.push_back(copy);
            }
        }
    }
    av_frame_free(&frame);
    av_packet_free(&packet);
    avcodec_free_context(&decoder);
    avformat_close_input(&file);
    return frames;
}

}  // namespace bench
