#pragma once

// The table-driven YCbCr to RGB arithmetic. Matrix, range, brightness, contrast and saturation are
// folded into three tables of the processor, so that a pixel costs one look-up, three sums and
// three clamps, and a chroma sample pair two look-ups for all the pixels that it colours.

#include <algorithm>

#include "vidshow/imageproc.h"

namespace vidshow {

/// What one chroma sample pair adds to the luma term of its pixels, in 1/128 of an 8-bit level.
struct ChromaTerms {
    int32_t red;
    int32_t green;
    int32_t blue;
    uint32_t code;  ///< Cb << 8 | Cr, the lower part of a colour key
};

/// The translation tables, copied out of the processor so that they stay in registers.
class TransTables {
  public:
    explicit TransTables(const QZ_IMAGEPROC_PARAMSET* p)
        : m_luma(p->pTransLuma), m_cb(p->pTransCb), m_cr(p->pTransCr) {}

    /// The luma term, 0..65535 in 1/128 of an 8-bit level.
    int32_t Luma(uint32_t y) const { return m_luma[y]; }

    /// An entry's high half is the blue or red term, its low half a part of the green one, both in
    /// 1/64. Red and blue are the whole entry shifted, so the top bit of the low half shows as
    /// their last bit; the sum of the green halves wraps to 16 bits. Clients compare pictures bit
    /// for bit, so both stay as they are.
    ChromaTerms Chroma(uint8_t cb, uint8_t cr) const {
        const uint32_t blue = m_cb[cb];
        const uint32_t red = m_cr[cr];
        return {static_cast<int32_t>(red) >> 15, 2 * static_cast<int16_t>(blue + red),
                static_cast<int32_t>(blue) >> 15, static_cast<uint32_t>(cb << 8 | cr)};
    }

    const uint16_t* luma() const { return m_luma; }
    const uint32_t* cb() const { return m_cb; }
    const uint32_t* cr() const { return m_cr; }

  private:
    const uint16_t* m_luma;
    const uint32_t* m_cb;
    const uint32_t* m_cr;
};

/// Cuts a level in 1/128 down to a channel of `kBits` bits: truncated, then clamped.
template <int kBits>
uint32_t Channel(int32_t level) {
    constexpr int32_t kMax = (1 << kBits) - 1;
    return static_cast<uint32_t>(std::clamp(level >> (15 - kBits), 0, kMax));
}

}  // namespace vidshow
