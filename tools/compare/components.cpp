#include "compare/components.h"

#include "common/colour.h"
#include "common/error.h"

namespace vidshow::tools {

namespace {

std::vector<std::string> namesOf(const AVPixFmtDescriptor& format, bool rgb) {
    const bool alpha = (format.flags & AV_PIX_FMT_FLAG_ALPHA) != 0;
    const size_t count = size_t{format.nb_components} - (alpha ? 1 : 0);
    std::vector<std::string> names =
        rgb ? std::vector<std::string>{"R", "G", "B"} : std::vector<std::string>{"Y", "Cb", "Cr"};
    names.resize(count);
    if (alpha) names.push_back("A");
    return names;
}

}  // namespace

Components::Components(const AVFrame& frame)
    : m_format(av_pix_fmt_desc_get(static_cast<AVPixelFormat>(frame.format))),
      m_width(frame.width),
      m_height(frame.height) {
    constexpr uint64_t kNotSamples = AV_PIX_FMT_FLAG_PAL | AV_PIX_FMT_FLAG_HWACCEL |
                                     AV_PIX_FMT_FLAG_BITSTREAM | AV_PIX_FMT_FLAG_FLOAT |
                                     AV_PIX_FMT_FLAG_BAYER;
    if (m_format == nullptr || (m_format->flags & kNotSamples) != 0) {
        throw Error("pixels of the form " + std::string(m_format ? m_format->name : "?") +
                    " cannot be taken apart; convert them first");
    }
    m_peak = (1 << m_format->comp[0].depth) - 1;
    m_rgb = isRgb(frame.format);
    m_names = namesOf(*m_format, m_rgb);
}

std::string Components::text() const {
    return std::to_string(m_width) + "x" + std::to_string(m_height) + " " + m_format->name;
}

std::string Components::differenceTo(const Components& other) const {
    bool same = m_width == other.m_width && m_height == other.m_height && m_rgb == other.m_rgb &&
                m_names == other.m_names && m_peak == other.m_peak &&
                m_format->log2_chroma_w == other.m_format->log2_chroma_w &&
                m_format->log2_chroma_h == other.m_format->log2_chroma_h;
    for (int i = 0; same && i < m_format->nb_components; ++i)
        same = m_format->comp[i].depth == other.m_format->comp[i].depth;
    return same ? "" : text() + " and " + other.text() + " do not compare";
}

Samples Components::samples(const AVFrame& frame, size_t component) const {
    const bool chroma = !m_rgb && (component == 1 || component == 2) && m_names[1] == "Cb";
    Samples samples;
    samples.width = chroma ? AV_CEIL_RSHIFT(m_width, m_format->log2_chroma_w) : m_width;
    samples.height = chroma ? AV_CEIL_RSHIFT(m_height, m_format->log2_chroma_h) : m_height;
    const size_t width = static_cast<size_t>(samples.width);
    samples.values.resize(width * static_cast<size_t>(samples.height));
    const uint8_t* planes[4];
    for (int i = 0; i < 4; ++i)
        planes[i] = frame.data[i];
    for (int y = 0; y < samples.height; ++y) {
        av_read_image_line2(samples.values.data() + static_cast<size_t>(y) * width, planes,
                            frame.linesize, m_format, 0, y, static_cast<int>(component),
                            samples.width, 0, sizeof(uint16_t));
    }
    return samples;
}

}  // namespace vidshow::tools
