#pragma once

// Planes for kernel tests: exactly as many bytes as the geometry says, between unmapped pages, so
// that one byte too far in either direction ends the program. Odd sizes give unaligned rows.

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <vector>

#include "testkit/guarded_buffer.h"
#include "testkit/random.h"

namespace testkit {

using Placement = GuardedBuffer::Placement;
using Bytes = std::vector<uint8_t>;

constexpr Placement kPlacements[] = {Placement::end, Placement::start};

inline std::string PlacementName(Placement placement) {
    return placement == Placement::end ? "_end" : "_start";
}

/// `height` rows of `width` bytes, `stride` apart; the last row has no padding.
class Plane {
  public:
    Plane(int32_t width, int32_t height, int32_t pad = 0, Placement placement = Placement::end)
        : m_width(width),
          m_height(height),
          m_stride(width + pad),
          m_memory(std::make_unique<GuardedBuffer>(Size(width, height, m_stride), placement)) {}

    Plane& Fill(std::mt19937& random) {
        FillSamples(random, m_memory->data(), m_memory->size());
        return *this;
    }
    Plane& Fill(uint8_t value) {
        if (m_memory->size() != 0) std::memset(m_memory->data(), value, m_memory->size());
        return *this;
    }

    uint8_t* data() { return m_memory->data(); }
    uint32_t stride() const { return static_cast<uint32_t>(m_stride); }
    int32_t width() const { return m_width; }
    int32_t height() const { return m_height; }
    uint8_t& at(int32_t x, int32_t y) { return (*m_memory)[Offset(x, y)]; }
    size_t Offset(int32_t x, int32_t y) const { return static_cast<size_t>(y * m_stride + x); }
    Bytes bytes() const { return Bytes(m_memory->data(), m_memory->data() + m_memory->size()); }

  private:
    static size_t Size(int32_t width, int32_t height, int32_t stride) {
        if (width <= 0 || height <= 0) return 0;
        return static_cast<size_t>((height - 1) * stride + width);
    }

    int32_t m_width;
    int32_t m_height;
    int32_t m_stride;
    std::unique_ptr<GuardedBuffer> m_memory;
};

/// Three planes as the kernels take them.
struct Picture {
    Plane planes[3];
    uint8_t* addresses[3];
    uint32_t strides[3];

    Picture(Plane y, Plane cb, Plane cr)
        : planes{std::move(y), std::move(cb), std::move(cr)},
          addresses{planes[0].data(), planes[1].data(), planes[2].data()},
          strides{planes[0].stride(), planes[1].stride(), planes[2].stride()} {}

    Picture& Fill(std::mt19937& random) & {
        for (Plane& plane : planes)
            plane.Fill(random);
        return *this;
    }
    Picture&& Fill(std::mt19937& random) && { return std::move(Fill(random)); }
    std::vector<Bytes> bytes() const {
        return {planes[0].bytes(), planes[1].bytes(), planes[2].bytes()};
    }
};

/// A picture of w x h pixels whose chroma planes are cw x ch; `pad` widens the rows, each plane's
/// by a different amount unless it is 0.
inline Picture MakePicture(int32_t w, int32_t h, int32_t cw, int32_t ch, int32_t pad,
                           Placement placement) {
    return Picture(Plane(w, h, pad, placement), Plane(cw, ch, 2 * pad, placement),
                   Plane(cw, ch, 3 * pad, placement));
}

/// 4:2:0 with an odd size rounded up.
inline Picture MakePicture420(int32_t w, int32_t h, int32_t pad = 0,
                              Placement placement = Placement::end) {
    return MakePicture(w, h, (w + 1) / 2, (h + 1) / 2, pad, placement);
}

}  // namespace testkit
