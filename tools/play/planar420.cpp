#include "play/planar420.h"

#include <algorithm>
#include <cstring>

#include "common/error.h"

namespace vidshow::tools {

namespace {

constexpr int kStrideUnit = 64;  // the converter's vector loops write whole registers

int roundUp(int value, int unit) {
    return (value + unit - 1) / unit * unit;
}

bool isPlanar420(int format) {
    return format == AV_PIX_FMT_YUV420P || format == AV_PIX_FMT_YUVJ420P;
}

}  // namespace

Planes Planar420::from(const AVFrame& frame, const Colour& colour) {
    if (fits(frame)) {
        return {{frame.data[0], frame.data[1], frame.data[2]},
                {frame.linesize[0], frame.linesize[1], frame.linesize[2]},
                frame.width,
                frame.height};
    }
    allocate(roundUp(frame.width, m_multiple), roundUp(frame.height, m_multiple));
    if (isPlanar420(frame.format)) {
        copy(frame);
    } else {
        convert(frame, colour);
    }
    extend(frame.width, frame.height);
    return m_padded;
}

// A picture that stands on its head has negative strides, which a stream cannot take.
bool Planar420::fits(const AVFrame& frame) const {
    return isPlanar420(frame.format) && frame.width % m_multiple == 0 &&
           frame.height % m_multiple == 0 &&
           std::all_of(frame.linesize, frame.linesize + 3, [](int stride) { return stride > 0; });
}

void Planar420::allocate(int width, int height) {
    if (width == m_padded.width && height == m_padded.height) return;
    m_padded.width = width;
    m_padded.height = height;
    size_t offsets[4] = {};
    for (int i = 0; i < 3; ++i) {
        m_strides[i] = roundUp(m_padded.planeWidth(i), kStrideUnit);
        offsets[i + 1] = offsets[i] + static_cast<size_t>(m_strides[i]) *
                                          static_cast<size_t>(m_padded.planeHeight(i));
    }
    m_block.assign(offsets[3] + 2 * kStrideUnit, 0);
    const size_t misaligned = reinterpret_cast<uintptr_t>(m_block.data()) % kStrideUnit;
    uint8_t* const start = m_block.data() + (kStrideUnit - misaligned);
    for (int i = 0; i < 3; ++i) {
        m_planes[i] = start + offsets[i];
        m_padded.data[i] = m_planes[i];
        m_padded.stride[i] = m_strides[i];
    }
}

void Planar420::copy(const AVFrame& frame) {
    const Planes size = {{}, {}, frame.width, frame.height};
    for (int i = 0; i < 3; ++i) {
        av_image_copy_plane(m_planes[i], m_strides[i], frame.data[i], frame.linesize[i],
                            size.planeWidth(i), size.planeHeight(i));
    }
}

void Planar420::convert(const AVFrame& frame, const Colour& colour) {
    const AVPixelFormat format = static_cast<AVPixelFormat>(frame.format);
    SwsContext* const converter = sws_getCachedContext(
        m_converter.release(), frame.width, frame.height, format, frame.width, frame.height,
        AV_PIX_FMT_YUV420P, SWS_BICUBIC | SWS_ACCURATE_RND | SWS_FULL_CHR_H_INP, nullptr, nullptr,
        nullptr);
    m_converter.reset(converter);
    if (converter == nullptr) {
        const char* const name = av_get_pix_fmt_name(format);
        throw Error(std::string("cannot bring pixels of the form ") +
                    (name != nullptr ? name : "?") + " to 4:2:0");
    }
    // Samples of YCbCr keep their values, whatever they are said to mean; RGB becomes what the
    // stream is told.
    const Colour full = {colour.matrix, Range::full};
    setConverterColours(converter, isRgb(frame.format) ? full : colour, colour);
    sws_scale(converter, frame.data, frame.linesize, 0, frame.height, m_planes, m_strides);
}

void Planar420::extend(int width, int height) {
    const Planes size = {{}, {}, width, height};
    for (int i = 0; i < 3; ++i) {
        const size_t w = static_cast<size_t>(size.planeWidth(i));
        const size_t fullWidth = static_cast<size_t>(m_padded.planeWidth(i));
        uint8_t* row = m_planes[i];
        for (int y = 0; y < size.planeHeight(i); ++y, row += m_strides[i]) {
            std::memset(row + w, row[w - 1], fullWidth - w);
        }
        for (int y = size.planeHeight(i); y < m_padded.planeHeight(i); ++y, row += m_strides[i]) {
            std::memcpy(row, row - m_strides[i], fullWidth);
        }
    }
}

}  // namespace vidshow::tools
