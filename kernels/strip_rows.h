#pragma once

// 4:2:0 row pairs to pixels at vector speed. Where all tables prove to be straight lines, samples
// become pixels in one go. Tables that hold anything else are looked up, one sample after the
// other, which no vector does faster; the sums, clamps and packing behind that go by the step all
// the same. Exactly the samples and pixels of whole blocks are read and written, as the portable
// form does.

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
    static constexpr FusedBackend::Pack FusedBackend::*kPack = nullptr;
    static uint32_t Alpha(const Format&) { return 0; }
};
template <>
struct FusedForm<Rgb565> {
    static constexpr FusedBackend::Pack FusedBackend::*kPack = &FusedBackend::toRgb565;
    static uint32_t Alpha(const Rgb565&) { return 0; }
};
template <>
struct FusedForm<Rgb5551> {
    static constexpr FusedBackend::Pack FusedBackend::*kPack = &FusedBackend::toRgb5551;
    static uint32_t Alpha(const Rgb5551&) { return 0; }
};
template <>
struct FusedForm<Rgb888> {
    static constexpr FusedBackend::Pack FusedBackend::*kPack = &FusedBackend::toRgb888;
    static uint32_t Alpha(const Rgb888&) { return 0; }
};
template <>
struct FusedForm<Argb32> {
    static constexpr FusedBackend::Pack FusedBackend::*kPack = &FusedBackend::toArgb32;
    static uint32_t Alpha(const Argb32& format) { return format.alpha; }
};
template <>
struct FusedForm<SpreadRgb> {
    static constexpr FusedBackend::Pack FusedBackend::*kPack = &FusedBackend::toSpread;
    static uint32_t Alpha(const SpreadRgb&) { return 0; }
};
template <>
struct FusedForm<PlanarRgb> {
    static constexpr FusedBackend::Pack FusedBackend::*kPack = &FusedBackend::toPlanes;
    static uint32_t Alpha(const PlanarRgb&) { return 0; }
};
/// @}

/// Converts row pairs.
class StripRows {
  public:
    /// Ready only where the back end in use has a loop for the format.
    template <class Format>
    StripRows(const TransTables& tables, const Format& format)
        : m_tables(tables),
          m_bytes(Format::kBytes),
          m_hasRoom(std::is_same_v<Format, PlanarRgb>),
          m_alpha(FusedForm<Format>::Alpha(format)) {
        if constexpr (std::is_same_v<Format, Rgb5551>) m_key = format.key;
        const FusedBackend* const backend = ActiveFusedBackend();
        if (FusedForm<Format>::kPack && backend) m_pack = backend->*FusedForm<Format>::kPack;
    }

    bool ready() const { return m_pack.terms != nullptr; }

    /// Looks whether the tables can do without look-ups, which pays for itself within a few rows.
    void StraightenTables();

    /// @param width in pixels, even
    void Convert(const RowPair& rows, int32_t width, uint8_t* upper, uint8_t* lower) const;

  private:
    static constexpr int32_t kStrip = 128;          // pixels that are looked up at a time
    static constexpr uint32_t kNoKey = UINT32_MAX;  // samples have 24 bits

    void ConvertAll(const RowPair& rows, int32_t width, uint8_t* upper, uint8_t* lower) const;
    void ConvertSteps(const RowPair& rows, int32_t pixels, uint8_t* upper, uint8_t* lower) const;
    void ConvertPart(const RowPair& rows, int32_t width, uint8_t* upper, uint8_t* lower) const;
    void ConvertStrip(const RowPair& rows, int32_t pixels, uint8_t* upper, uint8_t* lower) const;

    TransTables m_tables;
    int m_bytes;
    bool m_hasRoom;  ///< behind the lines, for whole steps
    uint32_t m_alpha;
    uint32_t m_key = kNoKey;
    FusedBackend::Pack m_pack{nullptr, nullptr};
    bool m_straight = false;
    TableLines m_lines{};
};

}  // namespace vidshow
