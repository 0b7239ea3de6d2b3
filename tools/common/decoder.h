#pragma once

#include <string>

#include "common/demuxer.h"
#include "common/ffmpeg.h"
#include "common/timeline.h"

namespace vidshow::tools {

/// A clip's frames, one after the other.
class Decoder {
  public:
    /// @throws Error when the file cannot be read, holds no video or nothing decodes it
    explicit Decoder(const std::string& path);

    /// @return the next frame, valid until the next call; null at the end
    const AVFrame* next();

    /// Goes to the first frame with this stamp or a later one. @return false if the clip cannot
    bool seek(double stamp);

    double stamp() const { return m_stamp; }  ///< the frame's own time in the clip, seconds
    double seconds() const { return m_due; }  ///< when the frame is due, from the first frame
    double frameSeconds() const { return m_frameSeconds; }
    AVRational frameRate() const;
    uint64_t announcedFrames() const;  ///< what the container says or its length makes; 0 unknown

    /// @return at the end: what is wrong with the clip; empty for nothing
    std::string damage() const;

  private:
    void openCodec(const std::string& path);
    void feed();
    bool accept();

    Demuxer m_demuxer;
    double m_frameSeconds;
    Timeline m_timeline;
    AvPtr<AVCodecContext> m_codec;
    AvPtr<AVPacket> m_packet;
    AvPtr<AVFrame> m_frame;
    bool m_drained = false;
    double m_stamp = 0;
    double m_skipUntil =
        0;  // frames before this stamp are not wanted: the seek was for a later one
    bool m_skipping = false;
    bool m_sought = false;  // after a seek frames may lack what they refer to
    double m_due = 0;
    uint64_t m_bad = 0;  // packets and frames that did not decode, or not cleanly
};

}  // namespace vidshow::tools
