#include "common/decoder.h"
#include "common/error.h"
#include "convert/source.h"

namespace vidshow::tools {

namespace {

// The form in which the engine gets a clip's pixels: their own where it can, else without loss for
// 8-bit RGB, else 4:2:0.
const Format& inputFormat(AVPixelFormat pixels, const Options& options) {
    if (options.given != nullptr) return *options.given;
    const Format* const own = formatOf(pixels);
    if (!isRgb(pixels)) return own != nullptr ? *own : *findFormat("yuv420p");
    const Format* const wanted = options.request.to;
    if (own != nullptr && (wanted == nullptr || findAbility(*own, *wanted) != nullptr)) return *own;
    for (const char* name : {"rgb888", "argb32"}) {
        const Format* const format = findFormat(name);
        if (wanted != nullptr && findAbility(*format, *wanted) != nullptr) return *format;
    }
    const bool clip = options.kind == FileKind::y4m || options.kind == FileKind::clip;
    return *findFormat(clip ? "argb32" : "rgb888");
}

class ClipSource : public Source {
  public:
    explicit ClipSource(const Options& options) : m_options(options), m_decoder(options.input) {}

    const Image* next() override {
        const AVFrame* const frame = m_decoder.next();
        if (frame == nullptr) return nullptr;
        m_colour = colourOf(*frame);
        const AVPixelFormat pixels = static_cast<AVPixelFormat>(frame->format);
        const Format& format = inputFormat(pixels, m_options);
        if (m_image.format != &format || m_image.width != frame->width ||
            m_image.height != frame->height) {
            m_image = Image(format, frame->width, frame->height);
        }
        if (formatOf(pixels) == &format) {
            copy(*frame);
        } else {
            repack(*frame);
        }
        return &m_image;
    }

    Colour colour() const override { return m_colour; }
    AVRational frameRate() const override { return m_decoder.frameRate(); }
    uint64_t announcedFrames() const override { return m_decoder.announcedFrames(); }
    std::string damage() const override { return m_decoder.damage(); }

  private:
    void copy(const AVFrame& frame) {
        for (int i = 0; i < m_image.format->planes; ++i) {
            const int stride = static_cast<int>(m_image.strides[i]);
            av_image_copy_plane(m_image.data[i], stride, frame.data[i], frame.linesize[i], stride,
                                m_image.rows(i));
        }
    }

    void repack(const AVFrame& frame) {
        const AVPixelFormat pixels = static_cast<AVPixelFormat>(frame.format);
        m_converter.reset(sws_getCachedContext(
            m_converter.release(), frame.width, frame.height, pixels, frame.width, frame.height,
            m_image.format->pixels, SWS_BICUBIC | SWS_ACCURATE_RND | SWS_FULL_CHR_H_INP, nullptr,
            nullptr, nullptr));
        if (!m_converter) {
            const char* const name = av_get_pix_fmt_name(pixels);
            throw Error("cannot bring pixels of the form " + std::string(name ? name : "?") +
                        " to " + m_image.format->name);
        }
        const Colour full = {m_colour.matrix, Range::full};
        setConverterColours(m_converter.get(), isRgb(frame.format) ? full : m_colour, m_colour);
        // The converter's vector loops may write beyond a row: into a frame of its own.
        AvPtr<AVFrame> own(checkMemory(av_frame_alloc()));
        own->format = m_image.format->pixels;
        own->width = frame.width;
        own->height = frame.height;
        if (av_frame_get_buffer(own.get(), 0) < 0) throw std::bad_alloc();
        sws_scale(m_converter.get(), frame.data, frame.linesize, 0, frame.height, own->data,
                  own->linesize);
        copy(*own);
    }

    const Options& m_options;
    Decoder m_decoder;
    AvPtr<SwsContext> m_converter;
    Image m_image;
    Colour m_colour;
};

}  // namespace

std::unique_ptr<Source> openClip(const Options& options) {
    if (options.given != nullptr && options.given->pixels == AV_PIX_FMT_NONE) {
        throw Error(std::string(options.given->name) + " is a format for output only");
    }
    return std::make_unique<ClipSource>(options);
}

}  // namespace vidshow::tools
