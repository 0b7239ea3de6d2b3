#pragma once

// FFmpeg's headers, and owners for what its libraries hand out.

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
#include <libavutil/frame.h>
#include <libavutil/imgutils.h>
#include <libavutil/opt.h>
#include <libavutil/pixdesc.h>
#include <libswscale/swscale.h>
}

#include <memory>
#include <string>

namespace vidshow::tools {

struct AvDeleter {
    void operator()(AVFormatContext* context) const { avformat_close_input(&context); }
    void operator()(AVCodecContext* context) const { avcodec_free_context(&context); }
    void operator()(AVFrame* frame) const { av_frame_free(&frame); }
    void operator()(AVPacket* packet) const { av_packet_free(&packet); }
    void operator()(SwsContext* context) const { sws_freeContext(context); }
};

template <typename T>
using AvPtr = std::unique_ptr<T, AvDeleter>;

/// Settings for what opens files and codecs; what it did not know is left in it.
struct AvDictionary {
    AvDictionary() = default;
    ~AvDictionary() { av_dict_free(&entries); }
    AvDictionary(const AvDictionary&) = delete;
    AvDictionary& operator=(const AvDictionary&) = delete;

    AVDictionary* entries = nullptr;
};

/// What one of FFmpeg's error numbers says.
std::string avErrorText(int error);

/// Passes `pointer` through. @throws Error without memory
template <typename T>
T* checkMemory(T* pointer) {
    if (pointer == nullptr) throw std::bad_alloc();
    return pointer;
}

}  // namespace vidshow::tools
