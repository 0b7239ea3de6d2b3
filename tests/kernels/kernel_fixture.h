#pragma once

// What a direct call of a kernel needs: a processor record filled by hand, planes and pictures
// between unmapped pages. Nothing here calls the library.

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <cstring>
#include <memory>
#include <random>
#include <vector>

#include "testkit/guarded_buffer.h"
#include "testkit/random.h"
#include "vidshow/kernels.h"

namespace kernel_test {

using testkit::GuardedBuffer;
using Placement = GuardedBuffer::Placement;

constexpr Placement kPlacements[] = {Placement::end, Placement::start};

/// One 8-bit plane of random samples that ends (or begins) exactly at an unmapped page: the bytes
/// are those of `h` rows of `w`, the last row without its padding.
class Plane {
  public:
    Plane(std::mt19937& random, int32_t w, int32_t h, uint32_t stride, Placement placement)
        : m_buffer(Bytes(w, h, stride), placement), m_stride(stride) {
        testkit::FillSamples(random, m_buffer.data(), m_buffer.size());
    }

    uint8_t* data() { return m_buffer.data(); }
    uint32_t stride() const { return m_stride; }
    uint8_t& at(int32_t x, int32_t y) {
        return m_buffer[static_cast<size_t>(y) * m_stride + static_cast<size_t>(x)];
    }

  private:
    static size_t Bytes(int32_t w, int32_t h, uint32_t stride) {
        return h < 1 ? 0 : stride * static_cast<size_t>(h - 1) + static_cast<size_t>(w);
    }

    GuardedBuffer m_buffer;
    uint32_t m_stride;
};

/// How much wider the strides of the three planes are than their rows.
using Padding = std::array<uint32_t, 3>;

/// Planes Y, Cb, Cr; chroma half as wide and tall, odd sizes rounded up.
class Picture420 {
  public:
    Picture420(std::mt19937& random, int32_t w, int32_t h, Padding pad, Placement placement)
        : y(random, w, h, static_cast<uint32_t>(w) + pad[0], placement),
          cb(random, (w + 1) / 2, (h + 1) / 2, static_cast<uint32_t>((w + 1) / 2) + pad[1],
             placement),
          cr(random, (w + 1) / 2, (h + 1) / 2, static_cast<uint32_t>((w + 1) / 2) + pad[2],
             placement),
          planes{y.data(), cb.data(), cr.data()},
          strides{y.stride(), cb.stride(), cr.stride()} {}

    Plane y;
    Plane cb;
    Plane cr;
    uint8_t* planes[3];
    uint32_t strides[3];
};

/// A packed output picture in front of or behind an unmapped page, and what is expected in it. The
/// model calls `Expect`; `Check` then compares every byte, the untouched ones between the rows and
/// in front of the picture included.
class Canvas {
  public:
    /// @param rowBytes bytes of the visible rows, @param lead bytes in front of the picture
    Canvas(std::mt19937& random, int32_t rowBytes, int32_t rows, uint32_t stride,
           Placement placement, uint32_t lead = 0)
        : m_buffer(lead + stride * static_cast<size_t>(rows - 1) + static_cast<size_t>(rowBytes),
                   placement),
          m_stride(stride),
          m_passedStride(stride),
          m_lead(lead) {
        testkit::FillSamples(random, m_buffer.data(), m_buffer.size());
        m_expected.assign(m_buffer.data(), m_buffer.data() + m_buffer.size());
    }

    uint8_t* data() { return m_buffer.data() + m_lead; }

    /// The stride for the kernel; `PassStride` makes it another than the one the picture has.
    uint32_t stride() const { return m_passedStride; }
    void PassStride(uint32_t stride) { m_passedStride = stride; }

    /// Expects the low `bytes` bytes of `pixel` at `offset` bytes from the picture's start.
    void ExpectAt(ptrdiff_t offset, uint32_t pixel, int bytes) {
        for (int i = 0; i < bytes; ++i) {
            m_expected.at(m_lead + static_cast<size_t>(offset + i)) =
                static_cast<uint8_t>(pixel >> (8 * i));
        }
    }
    void Expect(int32_t x, int32_t y, uint32_t pixel, int bytes) {
        ExpectAt(static_cast<ptrdiff_t>(m_stride) * y + ptrdiff_t{x} * bytes, pixel, bytes);
    }

    testing::AssertionResult Check() const {
        for (size_t i = 0; i < m_expected.size(); ++i) {
            if (m_buffer[i] == m_expected[i]) continue;
            return testing::AssertionFailure()
                   << "byte " << static_cast<ptrdiff_t>(i) - static_cast<ptrdiff_t>(m_lead)
                   << " of the picture (stride " << m_stride << ") is " << int{m_buffer[i]}
                   << ", not " << int{m_expected[i]};
        }
        return testing::AssertionSuccess();
    }

  private:
    GuardedBuffer m_buffer;
    uint32_t m_stride;
    uint32_t m_passedStride;
    size_t m_lead;
    std::vector<uint8_t> m_expected;
};

/// A processor record with tables of its own, for kernels that are called directly.
class Processor {
  public:
    Processor() {
        set.pTransLuma = m_luma.data();
        set.pTransCb = m_cb.data();
        set.pTransCr = m_cr.data();
    }
    Processor(const Processor&) = delete;
    Processor& operator=(const Processor&) = delete;

    /// Tables are inputs: any bits may stand in them.
    void UseRandomTables(std::mt19937& random) {
        static constexpr uint32_t kExtremes[] = {0,          0xFFFFFFFF, 0x7FFFFFFF, 0x80000000,
                                                 0x00008000, 0x7FFF7FFF, 0x80008000, 0x0000FFFF};
        for (uint16_t& entry : m_luma)
            entry = static_cast<uint16_t>(random());
        m_luma[0] = 0;
        m_luma[255] = 0xFFFF;
        for (auto* table : {&m_cb, &m_cr}) {
            for (uint32_t& entry : *table)
                entry = static_cast<uint32_t>(random());
            for (size_t i = 0; i < 8; ++i)
                (*table)[i * 36 % 256] = kExtremes[i];
            (*table)[255] = kExtremes[random() % 8];
        }
    }

    /// BT.601, limited range, neutral.
    void UseRealTables() {
        const auto pack = [](double high, double low) {
            return static_cast<uint32_t>(static_cast<int32_t>(high)) << 16 |
                   (static_cast<uint32_t>(static_cast<int32_t>(low)) & 0xFFFF);
        };
        for (int i = 0; i < 256; ++i) {
            const size_t n = static_cast<size_t>(i);
            m_luma[n] = static_cast<uint16_t>(i < 16 ? 0 : (i - 16) * 1.1644 * 128 + 0.5);
            m_cb[n] = pack((i - 128) * 2.0172 * 64 + 0.5, (i - 128) * -0.3918 * 64 + 0.5);
            m_cr[n] = pack((i - 128) * 1.596 * 64 + 0.5, (i - 128) * -0.813 * 64 + 0.5);
        }
    }

    /// Four line buffers for lines of up to `width` pixels, four entries longer as the pipeline
    /// makes them, each between unmapped pages.
    void UseLines(int32_t width) {
        for (size_t i = 0; i < 4; ++i) {
            m_lines[i] = std::make_unique<GuardedBuffer>((static_cast<size_t>(width) + 4) * 4);
            set.pLines[i] = static_cast<uint32_t*>(static_cast<void*>(m_lines[i]->data()));
        }
    }

    void UseWalker(const QZ_ROTATION_WALKER& walker) {
        m_walker = walker;
        set.pWalker = &m_walker;
    }

    uint16_t& luma(size_t i) { return m_luma[i]; }
    uint32_t& cb(size_t i) { return m_cb[i]; }
    uint32_t& cr(size_t i) { return m_cr[i]; }

    QZ_IMAGEPROC_PARAMSET set{};

  private:
    std::array<uint16_t, 256> m_luma{};
    std::array<uint32_t, 256> m_cb{};
    std::array<uint32_t, 256> m_cr{};
    std::unique_ptr<GuardedBuffer> m_lines[4];
    QZ_ROTATION_WALKER m_walker{};
};

/// Byte offset, from the picture's start, of the pixel that a source pixel becomes in a packed
/// picture turned by `type`. `w`, `h` are the sizes before the turn, `p` bytes a pixel. A half turn
/// lies flush with the end of the padded rows.
inline ptrdiff_t TurnedOffset(uint32_t type, int32_t x, int32_t y, int32_t w, int32_t h,
                              uint32_t stride, int p) {
    const ptrdiff_t s = static_cast<ptrdiff_t>(stride);
    switch (type) {
        case QZ_IMAGEPROC_ROTATE_90AC:
            return s * (w - 1 - x) + y * p;
        case QZ_IMAGEPROC_ROTATE_90C:
            return s * x + (h - 1 - y) * p;
        case QZ_IMAGEPROC_ROTATE_180:
            return s * (h - y) - (x + 1) * p;
        case QZ_IMAGEPROC_ROTATE_MIRROR_H:
            return s * y + (w - 1 - x) * p;
        case QZ_IMAGEPROC_ROTATE_MIRROR_V:
            return s * (h - 1 - y) + x * p;
        default:
            return s * y + x * p;
    }
}

/// The walker of a packed picture, from where its first 2 x 2 block and the next ones lie.
inline QZ_ROTATION_WALKER PackedWalker(uint32_t type, const uint8_t* dst, int32_t w, int32_t h,
                                       uint32_t stride, int p) {
    const auto at = [&](int32_t x, int32_t y) {
        return reinterpret_cast<intptr_t>(dst) + TurnedOffset(type, x, y, w, h, stride, p);
    };
    return {{at(2, 0) - at(0, 0), at(0, 2) - at(0, 0), at(0, 0), at(1, 0), at(0, 1), at(1, 1)}};
}

}  // namespace kernel_test
