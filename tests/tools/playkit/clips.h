#pragma once

#include <string>
#include <vector>

namespace playkit {

struct Size {
    int width;   ///< pixels
    int height;  ///< pixels
};

/// Makes a clip of FFmpeg's moving test picture. A failure fails the test.
/// @param options how it is encoded, for ffmpeg's command line; the frame rate is 25
void makeClip(const std::string& path, const Size& size, int frames,
              const std::vector<std::string>& options);

/// A lossless clip of this pixel form.
void makeLossless(const std::string& path, const Size& size, int frames,
                  const std::string& pixelForm = "yuv420p");

/// A still picture of four fields: red, green over blue, yellow.
/// @param options how it is encoded, for ffmpeg's command line
void makeFourFields(const std::string& path, const Size& size, int frames, int framesASecond,
                    const std::vector<std::string>& options = {"-c:v", "ffv1", "-pix_fmt",
                                                               "yuv420p"});

/// A still picture whose even lines are white and whose odd lines are black.
void makeCombed(const std::string& path, const Size& size, int frames, int framesASecond);

/// A clip of plain grey frames: luma of frame n, from 0, is 16 + 2n. At most 100 frames.
void makeCounting(const std::string& path, const Size& size, int frames, int framesASecond);

/// Fails the test unless ffmpeg takes these arguments.
void ffmpeg(const std::vector<std::string>& arguments);

}  // namespace playkit
