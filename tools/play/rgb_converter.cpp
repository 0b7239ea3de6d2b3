#include "play/rgb_converter.h"

#include "common/error.h"

namespace vidshow::tools {

namespace {

constexpr int kStrideUnit = 64;  // the converter's vector loops write whole registers
constexpr int kFast = SWS_BILINEAR;
constexpr int kBest = SWS_BICUBIC | SWS_ACCURATE_RND | SWS_FULL_CHR_H_INT | SWS_FULL_CHR_H_INP;

}  // namespace

RgbConverter::RgbConverter(AVPixelFormat format, Quality quality)
    : m_format(format), m_flags(quality == Quality::fast ? kFast : kBest) {}

const RgbImage& RgbConverter::convert(const Picture& picture, int width, int height) {
    prepare(picture, width, height);
    uint8_t* const out[1] = {m_image.pixels.data()};
    sws_scale(m_converter.get(), picture.planes.data, picture.planes.stride, 0,
              picture.planes.height, out, &m_image.stride);
    return m_image;
}

void RgbConverter::prepare(const Picture& picture, int width, int height) {
    m_converter.reset(sws_getCachedContext(m_converter.release(), picture.planes.width,
                                           picture.planes.height, AV_PIX_FMT_YUV420P, width, height,
                                           m_format, m_flags, nullptr, nullptr, nullptr));
    if (!m_converter) throw Error("no memory to convert a picture for display");
    setConverterColours(m_converter.get(), picture.look.colour, {Matrix::bt601, Range::full});
    if (width == m_image.width && height == m_image.height) return;

    const AVPixFmtDescriptor* const descriptor = av_pix_fmt_desc_get(m_format);
    const int rowBytes = width * (av_get_padded_bits_per_pixel(descriptor) / 8);
    m_image.width = width;
    m_image.height = height;
    m_image.stride = (rowBytes + kStrideUnit - 1) / kStrideUnit * kStrideUnit;
    m_image.pixels.assign(
        static_cast<size_t>(m_image.stride) * static_cast<size_t>(height) + kStrideUnit, 0);
}

}  // namespace vidshow::tools
