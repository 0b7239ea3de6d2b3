#pragma once

// Bilinear resampling of pictures with 8-bit samples, strip by strip. A strip is a few hundred
// output columns; the taps of its columns are worked out once and serve every row. A row is made
// in two steps: the two source rows around it are blended into a line of words, all columns alike,
// and then the columns are picked from that line. No memory is allocated.

#include <cstddef>

#include "kernels/corner_step.h"
#include "kernels/plane.h"

namespace vidshow {

struct Size {
    int32_t w;
    int32_t h;
};

inline bool IsEmpty(Size size) {
    return size.w < 1 || size.h < 1;
}

/// Where the output samples along one axis lie between the source samples.
struct Axis {
    int32_t first;  ///< position of output sample 0, 16.16; may lie before the first source sample
    int32_t step;   ///< distance between output samples, 16.16
    int32_t count;  ///< source samples
    bool straight;  ///< output sample i is source sample i

    /// Positions past either end repeat the sample at that end.
    Tap At(int32_t i) const {
        return TapAt(std::clamp(first + i * step, 0, (count - 1) * 65536), count);
    }
};

/// Luma, or any plane with a sample for each pixel: the corners coincide.
inline Axis PixelAxis(int32_t from, int32_t to) {
    return {0, CornerStep(from, to), from, from == to};
}

/// A chroma plane with a sample for two pixels, sizes given in pixels. Chroma sample c is centred
/// between pixels 2c and 2c + 1, at 2c + 1/2. It has to stay there in the output, so with luma's
/// step s output sample c comes from luma position (2c + 1/2) s, which is chroma position
/// c s + (s - 1) / 4. The same holds, mirrored, at the far edge.
inline Axis ChromaAxis(int32_t from, int32_t to) {
    const int32_t step = CornerStep(from, to);
    return {(step - 65536) / 4, step, ChromaSize(from), from == to};
}

/// How the sum of four neighbours, weights in 1/32 along both axes, becomes a sample: it is shifted
/// after the rows have been blended and again after the columns.
struct RoundedMean {
    static constexpr int kShift = 0, kLastShift = 10, kHalf = 1 << 9;
};
/// As the table-driven 4:2:0 kernels do it, bit for bit.
struct TruncatedMean {
    static constexpr int kShift = 4, kLastShift = 6, kHalf = 0;
};

constexpr int32_t kWeightOne = 32;
constexpr int32_t kStripColumns = 256;  ///< output columns of a strip at the most
constexpr int32_t kStripSpan = 1024;    ///< source columns under a strip at the most

/// The taps of a strip of output columns.
class ColumnTaps {
  public:
    explicit ColumnTaps(const Axis& axis) : m_axis(axis) {}

    /// Takes up output columns from `x` on, as many as are wanted and fit. @return how many, >= 1
    int32_t Select(int32_t x, int32_t wanted) {
        m_first = m_axis.At(x).index;
        for (m_count = 0; m_count < std::min(wanted, kStripColumns); ++m_count) {
            const Tap tap = m_axis.At(x + m_count);
            if (tap.next - m_first >= kStripSpan) break;
            m_index[m_count] = static_cast<uint16_t>(tap.index - m_first);
            m_weight[m_count] = static_cast<uint16_t>(tap.weight);
            m_span = tap.next - m_first + 1;
        }
        return m_count;
    }

    int32_t first() const { return m_first; }  ///< source column of entry 0 of the line
    int32_t span() const { return m_span; }    ///< source columns that the strip needs
    int32_t count() const { return m_count; }  ///< output columns

    /// Picks the strip's samples from a line of blended ones, `kChannels` a column. The line holds
    /// one column more than `span`, whatever is in it: the tap of the last column has weight 0.
    template <class Mean, int kChannels>
    void Pick(const uint16_t* line, uint8_t* out) const {
        for (int32_t i = 0; i < m_count; ++i) {
            const uint16_t* t = line + m_index[i] * kChannels;
            const int32_t weight = m_weight[i];
            for (int c = 0; c < kChannels; ++c) {
                const int32_t sum = t[c] * (kWeightOne - weight) + t[c + kChannels] * weight;
                *out++ = static_cast<uint8_t>((sum + Mean::kHalf) >> Mean::kLastShift);
            }
        }
    }

  private:
    Axis m_axis;
    int32_t m_first = 0;
    int32_t m_span = 0;
    int32_t m_count = 0;
    uint16_t m_index[kStripColumns];
    uint16_t m_weight[kStripColumns];
};

/// How pixels of `kChannels` interleaved 8-bit samples are resampled. A kind of pixels is a class
/// with `kBytes`, bytes a pixel, and `Resample`, which makes the strip's pixels from the two source
/// rows, given from column `taps.first()` on, and the weight of the lower one.
template <class Mean, int kChannels>
class BytePixels {
  public:
    static constexpr int kBytes = kChannels;

    void Resample(const uint8_t* upper, const uint8_t* lower, int32_t weight,
                  const ColumnTaps& taps, uint8_t* out) {
        const int32_t samples = taps.span() * kChannels;
        for (int32_t i = 0; i < samples; ++i) {
            const int32_t sum = upper[i] * (kWeightOne - weight) + lower[i] * weight;
            m_line[i] = static_cast<uint16_t>(sum >> Mean::kShift);
        }
        taps.Pick<Mean, kChannels>(m_line, out);
    }

  private:
    static constexpr size_t kLineSamples = (kStripSpan + 1) * kChannels;
    uint16_t m_line[kLineSamples] = {};
};

/// A plane or packed picture, read at another size.
template <class Pixels>
class Sampler {
  public:
    Sampler(const void* data, intptr_t stride, const Axis& across, const Axis& down)
        : m_data(static_cast<const uint8_t*>(data)),
          m_stride(stride),
          m_straight(across.straight && down.straight),
          m_down(down),
          m_taps(across) {}

    /// Chooses the columns of the rows to come, from `x` on. @return how many they are, >= 1
    int32_t Select(int32_t x, int32_t wanted) {
        m_x = x;
        return m_straight ? wanted : m_taps.Select(x, wanted);
    }

    /// The chosen columns of output row `y`, good until the next call. A picture that keeps its
    /// size is not copied.
    const uint8_t* Row(int32_t y) {
        if (m_straight) return At(m_x, y);
        const Tap row = m_down.At(y);
        m_pixels.Resample(At(m_taps.first(), row.index), At(m_taps.first(), row.next), row.weight,
                          m_taps, m_row);
        return m_row;
    }

  private:
    const uint8_t* At(int32_t x, int32_t y) const {
        return m_data + y * m_stride + intptr_t{x} * Pixels::kBytes;
    }

    const uint8_t* m_data;
    intptr_t m_stride;
    bool m_straight;
    int32_t m_x = 0;
    Axis m_down;
    ColumnTaps m_taps;
    Pixels m_pixels;
    uint8_t m_row[kStripColumns * Pixels::kBytes];
};

}  // namespace vidshow
