#pragma once

// Lines of planes: what the vector back ends enlarge through, where the portable form has spread
// pixels. A channel is below 64 and weights are in 1/32, so that weighed sums of bytes fit 16 bits,
// where a spread pixel takes 32 and a wide multiplication. The sums are those of a spread pixel's
// fields, which do not touch each other, and so are the pixels.

#include "kernels/strip_rows.h"

namespace vidshow {

/// Between entry `index` of an axis and the one behind it, `weight` / 32 on the way.
struct AxisTap {
    int32_t index;
    int32_t weight;  ///< 0..31
};

/// @name What a back end has for a format
/// @{
template <class Packer>
struct PlanarForm;
template <>
struct PlanarForm<SpreadToRgb565> {
    static constexpr auto kEnlarge = &FusedBackend::enlargeToRgb565;
    static uint32_t Alpha(const SpreadToRgb565&) { return 0; }
};
template <>
struct PlanarForm<SpreadToRgb888> {
    static constexpr auto kEnlarge = &FusedBackend::enlargeToRgb888;
    static uint32_t Alpha(const SpreadToRgb888&) { return 0; }
};
template <>
struct PlanarForm<SpreadToArgb32> {
    static constexpr auto kEnlarge = &FusedBackend::enlargeToArgb32;
    static uint32_t Alpha(const SpreadToArgb32& packer) { return packer.alpha; }
};
/// @}

/// The taps of an enlarged line, and the loops for them.
class PlanarLines {
  public:
    /// Whether there are loops for lines of `width` pixels that become `pixels`.
    static bool Fit(int32_t width, int32_t pixels) {
        return ActiveFusedBackend() && width > 0 && width % 2 == 0 && width <= kPlanarPixels &&
               pixels > 0 && pixels <= kPlanarPixels;
    }

    /// @param columns `pixels`, and `At(x)`, the tap of output column x
    template <class Columns, class Packer>
    PlanarLines(int32_t width, const Columns& columns, const Packer& packer)
        : m_backend(*ActiveFusedBackend()),
          m_bytes(Packer::kBytes),
          m_alpha(PlanarForm<Packer>::Alpha(packer)),
          m_width(width),
          m_pixels(columns.pixels) {
        m_taps.joined = AreClose(columns);
        m_enlarge = (m_backend.*PlanarForm<Packer>::kEnlarge).with[m_taps.joined];
        // What fills the last step up repeats the last column.
        for (int32_t x = 0; x < WholeSteps(m_pixels); ++x) {
            const AxisTap tap = columns.At(std::min(x, m_pixels - 1));
            m_taps.Set(x, tap.index, tap.weight);
        }
    }

    uint8_t* line(int i) { return m_lines[i]; }  ///< 0 to 3

    void Blend(const uint8_t* upper, const uint8_t* lower, uint8_t* out, int32_t weight) const {
        m_backend.blendPlanes(upper, lower, weight, m_width, out);
    }

    /// Makes the output row of a line.
    void Enlarge(const uint8_t* line, uint8_t* out) const;

  private:
    /// Whether the columns of every two groups pick from the same bytes.
    template <class Columns>
    static bool AreClose(const Columns& columns) {
        constexpr int32_t kTwo = 2 * ByteTaps::kGroup;
        for (int32_t x = 0; x < columns.pixels; x += kTwo) {
            const int32_t last = columns.At(std::min(x + kTwo, columns.pixels) - 1).index;
            if (last + 1 - columns.At(x).index >= static_cast<int32_t>(ByteTaps::kItems))
                return false;
        }
        return true;
    }

    static int32_t WholeSteps(int32_t count) {
        return (count + kFusedStep - 1) / kFusedStep * kFusedStep;
    }

    const FusedBackend& m_backend;
    FusedBackend::EnlargePlanes* m_enlarge;
    int m_bytes;
    uint32_t m_alpha;
    int32_t m_width;
    int32_t m_pixels;
    ByteTaps m_taps;
    uint8_t m_lines[4][kPlanes * kPlaneBytes];
};

}  // namespace vidshow
