#include "gstreamer/padded_frame.h"

#include <algorithm>
#include <cstddef>
#include <cstring>

#include "vidshow/kernels.h"

namespace vidshow::gst {

namespace {

constexpr int kUnit = 4;

int roundedUp(int size) {
    return (size + kUnit - 1) / kUnit * kUnit;
}

// A plane in units of a sample, or of a pair of them.
struct Plane {
    int width;
    int height;
    size_t unit;  // bytes
};

Plane planeOf(const Picture& picture, int index, int width, int height) {
    if (index == 0) return {width, height, 1};
    return {(width + 1) / 2, (height + 1) / 2, picture.pairs ? size_t{2} : size_t{1}};
}

void copyRow(const uint8_t* from, const Plane& own, uint8_t* to, const Plane& padded) {
    const size_t have = static_cast<size_t>(own.width) * own.unit;
    std::memcpy(to, from, have);
    for (size_t at = have; at < static_cast<size_t>(padded.width) * own.unit; at += own.unit)
        std::memcpy(to + at, from + have - own.unit, own.unit);
}

}  // namespace

Picture PaddedFrame::from(const Picture& picture) {
    const Picture whole = extended(picture);
    return whole.pairs ? split(whole) : whole;
}

// The presenter's own way with two planes is meant for windows of RGB565.
Picture PaddedFrame::split(const Picture& picture) {
    Picture result = picture;
    result.pairs = false;
    uint8_t* to[3];
    uint32_t toStrides[3];
    for (int i = 0; i < 3; ++i) {
        const int part = i == 0 ? 1 : 2;
        const size_t stride = static_cast<size_t>(picture.width / part);
        m_split[i].resize(stride * static_cast<size_t>(picture.height / part));
        to[i] = m_split[i].data();
        toStrides[i] = static_cast<uint32_t>(stride);
        result.planes[i] = to[i];
        result.strides[i] = static_cast<int>(stride);
    }
    // The kernel only reads them; its signature is older than that promise.
    uint8_t* const from[3] = {const_cast<uint8_t*>(picture.planes[0]),
                              const_cast<uint8_t*>(picture.planes[1]), nullptr};
    const uint32_t fromStrides[3] = {static_cast<uint32_t>(picture.strides[0]),
                                     static_cast<uint32_t>(picture.strides[1]), 0};
    _QZNV12ToYCbCr420(from, fromStrides, picture.width, picture.height, to, toStrides);
    return result;
}

Picture PaddedFrame::extended(const Picture& picture) {
    Picture result = picture;
    result.width = roundedUp(picture.width);
    result.height = roundedUp(picture.height);
    if (result.width == picture.width && result.height == picture.height) return picture;
    for (int i = 0; i < picture.planeCount(); ++i) {
        const Plane own = planeOf(picture, i, picture.width, picture.height);
        const Plane padded = planeOf(picture, i, result.width, result.height);
        const size_t stride = static_cast<size_t>(padded.width) * padded.unit;
        m_planes[i].resize(stride * static_cast<size_t>(padded.height));
        for (int y = 0; y < padded.height; ++y) {
            const ptrdiff_t row = std::min(y, own.height - 1);
            copyRow(picture.planes[i] + row * picture.strides[i], own,
                    m_planes[i].data() + static_cast<size_t>(y) * stride, padded);
        }
        result.planes[i] = m_planes[i].data();
        result.strides[i] = static_cast<int>(stride);
    }
    return result;
}

}  // namespace vidshow::gst
