#pragma once

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "testkit/random.h"
#include "vidshow/types.h"

/// One plane of samples, held without padding.
struct Plane {
    size_t width;
    size_t height;
    std::vector<uint8_t> samples;

    /// Whether the rows lie at `at`, `pitch` bytes apart; says where they do not.
    testing::AssertionResult isAt(const uint8_t* at, size_t pitch) const {
        for (size_t row = 0; row < height; ++row) {
            for (size_t x = 0; x < width; ++x) {
                if (at[row * pitch + x] == samples[row * width + x]) continue;
                return testing::AssertionFailure() << "row " << row << ", column " << x;
            }
        }
        return testing::AssertionSuccess();
    }
};

/// A random planar 4:2:0 frame as clients hand it in, with rows that are longer than the picture.
class YuvFrame {
  public:
    YuvFrame(size_t width, size_t height, uint32_t salt)
        : m_random(testkit::Random(salt)),
          m_plane{Make(width, height), Make(width / 2, height / 2), Make(width / 2, height / 2)} {
        for (size_t i = 0; i < 3; ++i) {
            const size_t stride = m_plane[i].width + 5 + 2 * i;
            m_strides[i] = static_cast<DWORD>(stride);
            m_memory[i].resize(stride * m_plane[i].height);
            testkit::FillSamples(m_random, m_memory[i].data(), m_memory[i].size());
            for (size_t row = 0; row < m_plane[i].height; ++row) {
                std::memcpy(&m_memory[i][row * stride], &m_plane[i].samples[row * m_plane[i].width],
                            m_plane[i].width);
            }
            m_planes[i] = m_memory[i].data();
        }
    }
    YuvFrame(const YuvFrame&) = delete;
    YuvFrame& operator=(const YuvFrame&) = delete;

    unsigned char** planes() { return m_planes; }
    void** voidPlanes() { return reinterpret_cast<void**>(m_planes); }
    DWORD* strides() { return m_strides; }
    const Plane& y() const { return m_plane[0]; }
    const Plane& cb() const { return m_plane[1]; }
    const Plane& cr() const { return m_plane[2]; }

  private:
    Plane Make(size_t width, size_t height) {
        Plane plane = {width, height, std::vector<uint8_t>(width * height)};
        testkit::FillSamples(m_random, plane.samples.data(), plane.samples.size());
        return plane;
    }

    std::mt19937 m_random;
    Plane m_plane[3];  // Y, Cb, Cr
    std::vector<uint8_t> m_memory[3];
    unsigned char* m_planes[3];
    DWORD m_strides[3];
};
