#pragma once

// 4:2:0 row pairs to pixels at vector speed. The tables may hold anything, so chroma samples are
// looked up one by one, which no vector does faster, and so is luma, unless its table proves to be
// a straight line. What follows, the sums, clamps and packing, is nine tenths of the work and goes
// sixteen pixels at a time. Exactly the samples and pixels of whole blocks are read and written, as
// the portable form does.

#include <type_traits>

#include "kernels/convert_rows.h"
#include "kernels/fused_backend.h"
#include "kernels/spread_pixel.h"

namespace vidshow {

/// A line of pixels as the loops of a back end take it.
template <class Pixel>
uint8_t* AsBytes(Pixel* line) {
    return static_cast<uint8_t*>(static_cast<void*>(line));
}

/// Lines of planes as a format. They have room for whole steps.
struct PlanarRgb {
    static constexpr int kBytes = 1;
};

/// @name Which loop of a back end packs a format, and the alpha that it is given
/// @{
template <class Format>
struct FusedForm {
    static constexpr FusedBackend::Pack* FusedBackend::*kPack = nullptr;
    static uint32_t Alpha(const Format&) { return 0; }
};
template <>
struct FusedForm<Rgb565> {
    static constexpr FusedBackend::Pack* FusedBackend::*kPack = &FusedBackend::toRgb565;
    static uint32_t Alpha(const Rgb565&) { return 0; }
};
template <>
struct FusedForm<Argb32> {
    static constexpr FusedBackend::Pack* FusedBackend::*kPack = &FusedBackend::toArgb32;
    static uint32_t Alpha(const Argb32& format) { return format.alpha; }
};
template <>
struct FusedForm<SpreadRgb> {
    static constexpr FusedBackend::Pack* FusedBackend::*kPack = &FusedBackend::toSpread;
    static uint32_t Alpha(const SpreadRgb&) { return 0; }
};
template <>
struct FusedForm<PlanarRgb> {
    static constexpr FusedBackend::Pack* FusedBackend::*kPack = &FusedBackend::toPlanes;
    static uint32_t Alpha(const PlanarRgb&) { return 0; }
};
/// @}

/// Converts row pairs strip by strip.
class StripRows {
  public:
    /// Ready only where the back end in use has a loop for the format.
    template <class Format>
    StripRows(const TransTables& tables, const Format& format)
        : m_tables(tables),
          m_bytes(Format::kBytes),
          m_hasRoom(std::is_same_v<Format, PlanarRgb>),
          m_alpha(FusedForm<Format>::Alpha(format)) {
        const FusedBackend* const backend = ActiveFusedBackend();
        if (FusedForm<Format>::kPack && backend) m_pack = backend->*FusedForm<Format>::kPack;
    }

    bool ready() const { return m_pack != nullptr; }

    /// Looks whether luma can do without look-ups, which pays for itself within a few rows.
    void StraightenLuma();

    /// @param width in pixels, even
    void Convert(RowPair rows, int32_t width, uint8_t* upper, uint8_t* lower);

  private:
    static constexpr int32_t kStrip = 128;  // pixels

    void LookUp(const RowPair& rows, int32_t pixels);
    void LookUpLuma(const uint8_t* samples, int32_t pixels, uint16_t* terms) const;
    void PackSome(int32_t first, int32_t pixels, uint8_t* upper, uint8_t* lower) const;

    TransTables m_tables;
    int m_bytes;
    bool m_hasRoom;  ///< behind the lines, for whole steps
    uint32_t m_alpha;
    FusedBackend::Pack* m_pack = nullptr;
    FusedBackend::Luma* m_luma = nullptr;  ///< null: look luma up
    LumaLine m_line{0, 0};
    uint16_t m_upper[kStrip] = {};
    uint16_t m_lower[kStrip] = {};
    uint32_t m_blue[kStrip / 2] = {};
    uint32_t m_red[kStrip / 2] = {};
};

}  // namespace vidshow
