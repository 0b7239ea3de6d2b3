#include "convert/clip_output.h"

#include <optional>

#include "common/error.h"
#include "common/y4m_sink.h"
#include "convert/displayed.h"
#include "convert/encoder.h"

namespace vidshow::tools {

namespace {

AVColorSpace colorSpace(Matrix matrix) {
    return static_cast<AVColorSpace>(matrixCode(matrix));
}

class ClipOutput : public Output {
  public:
    ClipOutput(const Options& options, AVRational frameRate)
        : m_path(options.output), m_encoding(chooseEncoding(options, frameRate)) {
        if (m_path == "-" && m_encoding.singlePictures()) {
            throw Error("pictures are files: they do not go to standard output");
        }
    }

    void write(const Image& image, const Colour& colour) override {
        const AvPtr<AVFrame> frame(checkMemory(av_frame_alloc()));
        fill(image, colour, frame.get());
        if (!m_encoder || m_encoding.singlePictures() || changed(*frame)) begin(*frame);
        frame->pts = m_number++;
        m_encoder->write(frame.get());
    }

    void finish() override {
        if (m_encoder) m_encoder->finish();
        m_encoder.reset();
    }

  private:
    void fill(const Image& image, const Colour& colour, AVFrame* frame) const {
        frame->width = image.width;
        frame->height = image.height;
        frame->format = image.format->pixels;
        if (!image.format->packedRgb()) {
            frame->colorspace = colorSpace(colour.matrix);
            frame->color_range = colour.range == Range::full ? AVCOL_RANGE_JPEG : AVCOL_RANGE_MPEG;
        }
        const bool own = image.format->pixels != AV_PIX_FMT_NONE;
        const RgbImage shown = own ? RgbImage() : displayed(image);
        if (!own) frame->format = AV_PIX_FMT_RGBA;
        if (av_frame_get_buffer(frame, 0) < 0) throw std::bad_alloc();
        for (int i = 0; i < image.format->planes; ++i) {
            const int stride = own ? static_cast<int>(image.strides[i]) : shown.stride;
            av_image_copy_plane(frame->data[i], frame->linesize[i],
                                own ? image.data[i] : shown.row(0), stride, stride, image.rows(i));
        }
    }

    bool changed(const AVFrame& frame) const {
        return frame.width != m_first.width || frame.height != m_first.height ||
               frame.colorspace != m_first.colorspace || frame.color_range != m_first.color_range;
    }

    void begin(const AVFrame& frame) {
        if (m_files != 0 && m_path == "-") {
            throw Error("the clip changes on the way, which standard output cannot follow");
        }
        finish();
        m_encoder.emplace(m_encoding, numberedName(m_path, ++m_files), frame);
        m_first = {frame.width, frame.height, frame.colorspace, frame.color_range};
        m_number = 0;
    }

    struct First {
        int width;
        int height;
        AVColorSpace colorspace;
        AVColorRange color_range;
    };

    const std::string m_path;
    const Encoding m_encoding;
    std::optional<Encoder> m_encoder;
    First m_first = {};
    int m_files = 0;
    int64_t m_number = 0;  // of the next picture in its file
};

}  // namespace

std::unique_ptr<Output> openClipOutput(const Options& options, AVRational frameRate) {
    return std::make_unique<ClipOutput>(options, frameRate);
}

}  // namespace vidshow::tools
