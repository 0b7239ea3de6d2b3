#pragma once

#include <string>

#include "common/ffmpeg.h"

namespace vidshow::tools {

/// A clip's container: hands out the packets of its video.
class Demuxer {
  public:
    /// @throws Error when the file cannot be read or holds no video
    explicit Demuxer(const std::string& path);

    const AVStream& video() const { return *m_video; }
    AVRational pixelAspect(AVFrame* frame) const;  ///< container's word goes before the frame's
    double frameRate() const;         ///< frames a second, guessed if the container is silent
    bool stampsMayJump() const;       ///< the container knows breaks in its time stamps
    double announcedSeconds() const;  ///< how long the clip should be; 0 unknown
    bool read(AVPacket* packet);      ///< the next packet; false at the end
    bool seek(double seconds);        ///< to the last key frame before; false if that cannot be
    std::string damage() const;       ///< at the end: what the clip lacks; empty for nothing

  private:
    void checkVideo(const std::string& path) const;
    void noteEnd(const AVPacket& packet);

    AvPtr<AVFormatContext> m_context;
    AVStream* m_video = nullptr;
    double m_end = 0;  // where the packets read so far end, of all streams, seconds
    int m_readError = 0;
    bool m_lastPacketCut = false;
};

/// Counts the pictures of a clip without decoding them.
uint64_t countFrames(const std::string& path);

}  // namespace vidshow::tools
