#pragma once

// The line modes once more, on a memory of their own: source and destination lie in one array of
// bytes, so that spilling merges, overlapping lines and work in place come out by themselves, and
// every byte that nobody may touch is compared, too. Written from what the modes promise, sample by
// sample; nothing here calls the library.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "testkit/guarded_buffer.h"
#include "testkit/random.h"
#include "vidshow/kernels.h"

namespace deinterlace_test {

using testkit::GuardedBuffer;

enum Mode { off, fast, discard, bob, blend, mean, linear, x };
constexpr Mode kLineModes[] = {fast, discard, bob, blend, mean, linear};

/// Where the planes of a picture lie in the memory.
struct Layout {
    size_t plane[3];
    uint32_t pitch[3];
};

/// What is asked for.
struct Request {
    Mode mode;
    int chroma;
    int w, h;
    int field;
    bool inFrame;  ///< as a processor's frame: nothing spills, nothing is left out
};

inline std::ostream& operator<<(std::ostream& out, const Request& r) {
    return out << "mode " << r.mode << " chroma " << r.chroma << " " << r.w << "x" << r.h
               << " field " << r.field << (r.inFrame ? " in a frame" : "");
}

class Model {
  public:
    Model(std::vector<uint8_t> memory, const Layout& src, const Layout& dst, const Request& request)
        : bytes(std::move(memory)), m_src(src), m_dst(dst), m_r(request) {}

    std::vector<uint8_t> bytes;

    /// @return what the mode returns
    int run() {
        const bool planes444 = m_r.chroma == 2;
        if (m_r.mode == fast) {
            if (m_r.chroma < 0 || m_r.chroma > 2 || m_r.w % 4 || m_r.h % 4) return -1;
        } else if (m_r.chroma < 0 || m_r.chroma > 2) {
            return 0;
        } else if (planes444 && m_r.mode != linear && !m_r.inFrame) {
            return 0;
        }
        for (int i = 0; i < 3; ++i) {
            m_w = i && m_r.chroma < 2 ? m_r.w / 2 : m_r.w;
            m_h = i && m_r.chroma == 0 ? m_r.h / 2 : m_r.h;
            m_s = m_src.plane[i];
            m_sp = m_src.pitch[i];
            m_d = m_dst.plane[i];
            m_dp = m_dst.pitch[i];
            m_line = m_r.inFrame ? std::min(m_sp, m_dp) : m_sp;
            plane(planes444);
        }
        return 0;
    }

  private:
    void plane(bool is444) {
        if (m_r.mode == fast) return runFast();
        if (m_r.mode == linear) return keepField(true);
        if (is444) {
            for (int y = 0; y < m_h; ++y)
                copy(y, src(y));
            return;
        }
        switch (m_r.mode) {
            case bob:
                return keepField(false);
            case discard:
                return runDiscard();
            case blend:
                return runBlend();
            default:
                return runMean();
        }
    }

    size_t src(int y) const { return m_s + static_cast<size_t>(y) * m_sp; }
    size_t dst(int y) const { return m_d + static_cast<size_t>(y) * m_dp; }

    void copy(int y, size_t from) {
        if (y >= m_h) return;
        const std::vector<uint8_t> line(&bytes[from], &bytes[from] + m_line);
        std::copy(line.begin(), line.end(), bytes.begin() + static_cast<ptrdiff_t>(dst(y)));
    }

    bool aligned() const {
        for (int i = 0; i < 3; ++i) {
            if ((m_src.plane[i] | m_dst.plane[i] | m_src.pitch[i] | m_dst.pitch[i]) & 7)
                return false;
        }
        return true;
    }

    void merge(int y, size_t a, size_t b) {
        const bool spills = !m_r.inFrame && aligned();
        const int step = spills ? 16 : 8;
        size_t to = dst(y);
        for (int left = static_cast<int>(m_line); left > 0; left -= 8) {
            const int n = spills ? step : std::min(step, left);
            uint8_t out[16];
            for (int i = 0; i < n; ++i) {
                const size_t k = static_cast<size_t>(i);
                out[i] = static_cast<uint8_t>((bytes[a + k] + bytes[b + k]) / 2);
            }
            for (int i = 0; i < n; ++i)
                bytes[to + static_cast<size_t>(i)] = out[i];
            a += static_cast<size_t>(n);
            b += static_cast<size_t>(n);
            to += static_cast<size_t>(n);
        }
    }

    void keepField(bool interpolate) {
        int at = 0;
        if (m_r.field == 1) {
            copy(0, src(0));
            at = 1;
        }
        while (at + 2 < m_h) {
            copy(at, src(at));
            if (interpolate) {
                merge(at + 1, src(at), src(at + 2));
            } else {
                copy(at + 1, src(at));
            }
            at += 2;
        }
        copy(at, src(at));
        if (m_r.field == 0) copy(at + 1, src(at + 1));
    }

    void runDiscard() {
        int from = m_r.field;
        for (int y = 0; y < m_h; y += 2, from += 2) {
            if (from >= m_h) from = m_h == 1 ? 0 : m_h - 2;
            copy(y, src(from));
            copy(y + 1, src(from));
        }
    }

    void runBlend() {
        if (m_h > 0) copy(0, src(0));
        for (int y = 1; y < m_h; ++y)
            merge(y, src(y - 1), src(y));
    }

    void runMean() {
        for (int y = 0; y < m_h; y += 2) {
            merge(y, src(y), src(std::min(y + 1, m_h - 1)));
            copy(y + 1, dst(y));
        }
    }

    // Group by group: narrow planes have groups that reach into the lines below.
    void runFast() {
        if (m_h == 0 || m_w == 0) return;
        const bool inPlace = m_s == m_d && m_sp == m_dp;
        const int columns =
            m_r.inFrame ? std::min(m_w, static_cast<int>(m_line)) : std::max(m_w / 8, 1) * 8;
        std::vector<uint8_t> above(&bytes[m_s], &bytes[m_s] + columns);
        for (int y = 1; y < m_h; y += 2) {
            if (!inPlace) copy(y - 1, src(y - 1));
            for (int x = 0; x < columns; x += 8)
                filterGroup(y, x, std::min(8, columns - x), inPlace ? &above : nullptr);
        }
    }

    void filterGroup(int y, int x, int count, std::vector<uint8_t>* above) {
        const int last = m_h - 1;
        const auto at = [&](int line, int i) {
            return int{bytes[src(std::clamp(line, 0, last)) + static_cast<size_t>(x + i)]};
        };
        uint8_t out[8];
        for (int i = 0; i < count; ++i) {
            const int a = above ? (*above)[static_cast<size_t>(x + i)] : at(y - 2, i);
            const int sum =
                4 * (at(y - 1, i) + at(y + 1, i)) + 2 * at(y, i) - (a + at(y + 2, i)) + 4;
            out[i] = static_cast<uint8_t>(std::clamp(sum < 0 ? -1 : sum / 8, 0, 255));
        }
        for (int i = 0; i < count; ++i) {
            if (above) (*above)[static_cast<size_t>(x + i)] = static_cast<uint8_t>(at(y, i));
        }
        std::copy(out, out + count, bytes.begin() + static_cast<ptrdiff_t>(dst(y)) + x);
    }

    Layout m_src, m_dst;
    Request m_r;
    int m_w = 0, m_h = 0;
    size_t m_s = 0, m_d = 0, m_sp = 0, m_dp = 0, m_line = 0;
};

/// Random memory with one or two pictures in it. Every byte of it is compared.
class Memory {
  public:
    Memory(std::mt19937& random, size_t bytes) : m_bytes(bytes + 16) {
        testkit::FillSamples(random, m_bytes.data(), m_bytes.size());
        m_start = (16 - reinterpret_cast<uintptr_t>(m_bytes.data()) % 16) % 16;
    }

    QZ_PICTURE at(const Layout& layout) {
        QZ_PICTURE picture = {};
        picture.planes = 3;
        for (int i = 0; i < 3; ++i) {
            picture.plane[i] = m_bytes.data() + m_start + layout.plane[i];
            picture.pitch[i] = layout.pitch[i];
        }
        return picture;
    }

    std::vector<uint8_t> copy() const {
        return std::vector<uint8_t>(m_bytes.begin() + static_cast<ptrdiff_t>(m_start),
                                    m_bytes.end());
    }

    testing::AssertionResult is(const std::vector<uint8_t>& expected) const {
        for (size_t i = 0; i < expected.size(); ++i) {
            const int found = m_bytes[m_start + i];
            if (found == expected[i]) continue;
            return testing::AssertionFailure()
                   << "byte " << i << " is " << found << ", not " << int{expected[i]};
        }
        return testing::AssertionSuccess();
    }

  private:
    std::vector<uint8_t> m_bytes;
    size_t m_start;  // aligned to 16
};

/// Lays planes out from `start` on, each with `slack` bytes behind it. @return where they end
inline size_t LayOut(Layout& layout, size_t start, const uint32_t pitch[3], int h, int chroma,
                     size_t slack) {
    for (int i = 0; i < 3; ++i) {
        const int lines = i && chroma == 0 ? h / 2 : h;
        layout.plane[i] = start;
        layout.pitch[i] = pitch[i];
        start += pitch[i] * static_cast<size_t>(lines) + slack;
    }
    return start;
}

}  // namespace deinterlace_test
