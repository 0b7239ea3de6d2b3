#pragma once

#include <string>
#include <vector>

#include "convert/image.h"
#include "convert/options.h"

namespace vidshow::tools {

/// How a file is to be encoded, whatever comes.
struct Encoding {
    const AVOutputFormat* container = nullptr;
    const AVCodec* codec = nullptr;
    std::vector<std::string> options;  ///< "key=value"
    AVRational frameRate = {};

    bool singlePictures() const;
};

/// @throws Error when nothing here encodes what the container holds
Encoding chooseEncoding(const Options& options, AVRational frameRate);

/// One file: pictures of one size, format and colour.
class Encoder {
  public:
    /// @throws Error when the file cannot be begun
    Encoder(const Encoding& encoding, const std::string& path, const AVFrame& first);

    void write(AVFrame* frame);  ///< takes the frame's stamp as the number of the picture
    void finish();

  private:
    struct Close {
        void operator()(AVFormatContext* context) const;
    };
    void openCodec(const Encoding& encoding, const AVFrame& first);
    void openFile(const Encoding& encoding);
    void send(const AVFrame* frame);
    AVFrame* repacked(AVFrame* frame);
    void check(int result) const;

    const std::string m_path;
    std::unique_ptr<AVFormatContext, Close> m_muxer;
    AvPtr<AVCodecContext> m_codec;
    AvPtr<AVPacket> m_packet;
    AvPtr<SwsContext> m_converter;
    AvPtr<AVFrame> m_repacked;
    AVStream* m_stream = nullptr;
};

}  // namespace vidshow::tools
