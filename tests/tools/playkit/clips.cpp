#include "playkit/clips.h"

#include <gtest/gtest.h>

#include "playkit/process.h"

namespace playkit {

void makeClip(const std::string& path, const Size& size, int frames,
              const std::vector<std::string>& options) {
    // The source rounds sizes to what its colours allow; a larger picture is cut exactly.
    const std::string source = "testsrc2=size=" + std::to_string(size.width + 64) + "x" +
                               std::to_string(size.height + 64) +
                               ":rate=25,format=yuv444p,crop=" + std::to_string(size.width) + ":" +
                               std::to_string(size.height) + ":16:0";
    std::vector<std::string> command = {
        "ffmpeg", "-v", "error", "-y",        "-f",
        "lavfi",  "-i", source,  "-frames:v", std::to_string(frames)};
    command.insert(command.end(), options.begin(), options.end());
    command.push_back(path);
    const Outcome outcome = run(command);
    ASSERT_EQ(outcome.status, 0) << outcome.err;
}

void makeLossless(const std::string& path, const Size& size, int frames,
                  const std::string& pixelForm) {
    makeClip(path, size, frames, {"-c:v", "ffv1", "-pix_fmt", pixelForm});
}

}  // namespace playkit
