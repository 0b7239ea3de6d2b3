#include "playkit/clips.h"

#include <gtest/gtest.h>

#include "playkit/process.h"

namespace playkit {

namespace {

std::string text(const Size& size) {
    return std::to_string(size.width) + "x" + std::to_string(size.height);
}

// Encodes what a source of libavfilter makes.
void encode(const std::string& source, int frames, const std::vector<std::string>& options,
            const std::string& path) {
    const std::string ended = source + ",trim=end_frame=" + std::to_string(frames);
    std::vector<std::string> arguments = {"-f", "lavfi", "-i", ended};
    arguments.insert(arguments.end(), options.begin(), options.end());
    arguments.push_back(path);
    ffmpeg(arguments);
}

}  // namespace

void ffmpeg(const std::vector<std::string>& arguments) {
    std::vector<std::string> command = {"ffmpeg", "-v", "error", "-y"};
    command.insert(command.end(), arguments.begin(), arguments.end());
    const Outcome outcome = run(command);
    ASSERT_EQ(outcome.status, 0) << outcome.err;
}

void makeClip(const std::string& path, const Size& size, int frames,
              const std::vector<std::string>& options) {
    // The source rounds sizes to what its colours allow; a larger picture is cut exactly.
    const Size larger = {size.width + 64, size.height + 64};
    encode("testsrc2=size=" + text(larger) + ":rate=25,format=yuv444p,crop=" +
               std::to_string(size.width) + ":" + std::to_string(size.height) + ":16:0",
           frames, options, path);
}

void makeLossless(const std::string& path, const Size& size, int frames,
                  const std::string& pixelForm) {
    makeClip(path, size, frames, {"-c:v", "ffv1", "-pix_fmt", pixelForm});
}

void makeFourFields(const std::string& path, const Size& size, int frames, int framesASecond,
                    const std::vector<std::string>& options) {
    encode("color=red:size=" + text(size) + ":rate=" + std::to_string(framesASecond) +
               ",format=rgb24,drawbox=x=iw/2:y=0:w=iw/2:h=ih/2:color=green:t=fill"
               ",drawbox=x=0:y=ih/2:w=iw/2:h=ih/2:color=blue:t=fill"
               ",drawbox=x=iw/2:y=ih/2:w=iw/2:h=ih/2:color=yellow:t=fill",
           frames, options, path);
}

void makeCounting(const std::string& path, const Size& size, int frames, int framesASecond) {
    encode("color=black:size=" + text(size) + ":rate=" + std::to_string(framesASecond) +
               ",format=yuv420p,geq=lum='16+2*N':cb=128:cr=128",
           frames, {"-c:v", "ffv1", "-g", "10", "-pix_fmt", "yuv420p"}, path);
}

void makeCombed(const std::string& path, const Size& size, int frames, int framesASecond) {
    encode("color=black:size=" + text(size) + ":rate=" + std::to_string(framesASecond) +
               ",format=yuv420p,geq=lum='if(mod(Y,2),16,235)':cb=128:cr=128",
           frames, {"-c:v", "ffv1", "-pix_fmt", "yuv420p"}, path);
}

}  // namespace playkit
