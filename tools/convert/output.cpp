#include "convert/output.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

#include "common/deinterlace.h"
#include "common/error.h"
#include "common/png_file.h"
#include "common/y4m_sink.h"
#include "convert/clip_output.h"
#include "convert/displayed.h"

namespace vidshow::tools {

namespace {

class RawOutput : public Output {
  public:
    explicit RawOutput(const std::string& path)
        : m_path(path), m_file(path == "-" ? stdout : std::fopen(path.c_str(), "wb")) {
        if (m_file == nullptr) fail();
    }
    ~RawOutput() override {
        if (m_file != nullptr && m_file != stdout) std::fclose(m_file);
    }

    void write(const Image& image, const Colour&) override {
        for (int i = 0; i < image.format->planes; ++i) {
            if (std::fwrite(image.data[i], 1, image.bytes(i), m_file) != image.bytes(i)) fail();
        }
    }

    void finish() override {
        std::FILE* const file = m_file;
        m_file = nullptr;
        if ((file == stdout ? std::fflush(file) : std::fclose(file)) != 0) fail();
    }

  private:
    [[noreturn]] void fail() const {
        throw Error("cannot write " + m_path + ": " + std::strerror(errno));
    }

    const std::string m_path;
    std::FILE* m_file;
};

class Y4mOutput : public Output {
  public:
    Y4mOutput(const std::string& path, AVRational frameRate, bool deinterlaced)
        : m_sink(path, frameRate, deinterlaced) {}

    void write(const Image& image, const Colour& colour) override {
        if (image.format->number != QZ_IMAGEPROC_FMT_YCBCR420) {
            throw Error("y4m takes yuv420p, not " + std::string(image.format->name));
        }
        Picture picture = {};
        picture.planes.width = image.width;
        picture.planes.height = image.height;
        for (int i = 0; i < 3; ++i) {
            picture.planes.data[i] = image.data[i];
            picture.planes.stride[i] = static_cast<int>(image.strides[i]);
        }
        picture.look.colour = colour;
        picture.look.pixelAspect = {1, 1};
        m_sink.show(picture);
    }

    void finish() override { m_sink.finish(); }

  private:
    Y4mSink m_sink;
};

// OUT, then OUT with "-2" before its extension, and so on.
class PngOutput : public Output {
  public:
    explicit PngOutput(const std::string& path) : m_path(path) {
        if (path == "-") throw Error("pictures are files: png does not go to standard output");
    }

    void write(const Image& image, const Colour&) override {
        if (!image.format->packedRgb()) {
            throw Error("png takes RGB, not " + std::string(image.format->name));
        }
        writePng(numberedName(m_path, ++m_count), displayed(image));
    }

    void finish() override {}

  private:
    const std::string m_path;
    int m_count = 0;
};

}  // namespace

std::unique_ptr<Output> openOutput(const Options& options, AVRational frameRate) {
    switch (options.kind) {
        case FileKind::png:
            return std::make_unique<PngOutput>(options.output);
        case FileKind::y4m:
            return std::make_unique<Y4mOutput>(options.output, frameRate,
                                               options.request.deinterlace != kDeinterlaceOff);
        case FileKind::clip:
            return openClipOutput(options, frameRate);
        case FileKind::raw:
            break;
    }
    return std::make_unique<RawOutput>(options.output);
}

}  // namespace vidshow::tools
