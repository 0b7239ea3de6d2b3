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

}  // namespace playkit
