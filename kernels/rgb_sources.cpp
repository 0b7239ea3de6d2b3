// RGB pictures at another size, turned, reduced or expanded. Resampling is bilinear in each channel
// at the source's own depth and rounds to nearest, so a picture that keeps its size keeps its
// pixels.

#include "kernels/pixel_walk.h"
#include "kernels/rgb_formats.h"

namespace vidshow {
namespace {

/// A channel of an RGB565 word.
struct Field {
    int shift;
    int bits;
};
constexpr Field kFields[] = {{0, 5}, {5, 6}, {11, 5}};  // blue, green, red
constexpr int kChannels = 3;

/// One field of eight neighbouring RGB565 words.
struct FieldSamples {
    static constexpr int kBytes = 2;
    Field field;

    Words operator()(const uint8_t* at) const {
        Words words;
        std::memcpy(&words, at, sizeof words);
        const uint16_t mask = static_cast<uint16_t>((1u << field.bits) - 1);
        return words >> field.shift & mask;
    }
};

/// RGB565 words, each field resampled alone.
class Rgb565Pixels {
  public:
    static constexpr int kBytes = FieldSamples::kBytes;

    void Resample(const RowTaps& rows, const ColumnTaps& taps, uint8_t* out, intptr_t stride) {
        for (int f = 0; f < kChannels; ++f) {
            m_resampler.Run(rows, taps, {kFields[f]}, m_channel[f][0], kStripColumns);
        }
        for (int r = 0; r < kBandRows; ++r) {
            for (int32_t i = 0; i < taps.count(); ++i) {
                uint32_t word = 0;
                for (int f = 0; f < kChannels; ++f) {
                    word |= static_cast<uint32_t>(m_channel[f][r][i]) << kFields[f].shift;
                }
                StorePixel<kBytes>(out + i * kBytes, word);
            }
            out += stride;
        }
    }

  private:
    BandResampler<RoundedMean, FieldSamples, 1> m_resampler;
    uint8_t m_channel[kChannels][kBandRows][kStripColumns];
};

using Rgb888Pixels = BytePixels<RoundedMean, kChannels>;

/// The top bits of three 8-bit channels.
inline uint32_t Reduced(uint32_t blue, uint32_t green, uint32_t red) {
    return blue >> 3 | green >> 2 << 5 | red >> 3 << 11;
}

/// Stores a band of RGB888 pixels as RGB565.
void StoreReduced(const Walk& walk, int32_t x, int32_t y, const Band& band) {
    const intptr_t across = walk.across;
    for (int32_t r = 0; r < band.rows; ++r) {
        const uint8_t* bgr = band.Row(r);
        uint8_t* at = walk.At(x, y + r);
        for (int32_t i = 0; i < band.columns; ++i) {
            StorePixel<Rgb565Pixels::kBytes>(at, Reduced(bgr[0], bgr[1], bgr[2]));
            bgr += kChannels;
            at += across;
        }
    }
}

using StoreFunction = void (*)(const Walk&, int32_t, int32_t, const Band&);

template <class Pixels, StoreFunction kStore = StoreBand<Pixels::kBytes>>
int32_t Move(const QZ_ROTATION_WALKER* walker, const void* src, intptr_t stride, Size from,
             Size to) {
    if (walker == nullptr || src == nullptr) return -1;
    if (IsEmpty(from) || IsEmpty(to)) return 0;
    const Walk walk = PackedWalk(*walker);
    Sampler<Pixels> sampler(src, stride, PixelAxis(from.w, to.w), PixelAxis(from.h, to.h));
    const bool tall = sampler.IsStraight() && kStore == StoreBand<2>;
    ForEachBand(
        sampler, to, walk,
        [&](int32_t x, int32_t y, const Band& band) { kStore(walk, x, y, band); },
        tall ? kTallRows : kBandRows);
    return 0;
}

inline uint32_t LoadWord(const uint8_t* at) {
    uint16_t word;
    std::memcpy(&word, at, sizeof word);
    return word;
}

/// The three fields at the top of their bytes, the low bits 0.
inline uint32_t Expand(uint32_t word, uint32_t alpha) {
    constexpr uint32_t kBlue = 0x001F, kGreen = 0x07E0, kRed = 0xF800;
    return alpha | (word & kRed) << 8 | (word & kGreen) << 5 | (word & kBlue) << 3;
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t _QZRGB565ToARGB32(const void* src, int32_t srcPixels, void* dst, int32_t dstPixels,
                          int32_t w, int32_t h, uint32_t a) {
    if (!HaveAll(src, dst)) return -1;
    const uint8_t* from = static_cast<const uint8_t*>(src);
    uint8_t* to = static_cast<uint8_t*>(dst);
    constexpr int kFromBytes = Rgb565::kBytes, kToBytes = Argb32::kBytes;
    const uint32_t alpha = a << 24;
    for (int32_t y = 0; y < h; ++y) {
        for (int32_t x = 0; x < w; ++x) {
            StorePixel<kToBytes>(to + x * kToBytes, Expand(LoadWord(from + x * kFromBytes), alpha));
        }
        from += intptr_t{srcPixels} * kFromBytes;
        to += intptr_t{dstPixels} * kToBytes;
    }
    return 0;
}

int32_t _QZRGB565RszRot(const QZ_ROTATION_WALKER* walker, const void* src, int32_t srcPixels,
                        int32_t w, int32_t h, int32_t dw, int32_t dh) {
    const intptr_t stride = intptr_t{srcPixels} * Rgb565Pixels::kBytes;
    return Move<Rgb565Pixels>(walker, src, stride, {w, h}, {dw, dh});
}

int32_t _QZRGB888RszRot(const QZ_ROTATION_WALKER* walker, const void* src, int32_t srcStride,
                        int32_t w, int32_t h, int32_t dw, int32_t dh) {
    return Move<Rgb888Pixels>(walker, src, srcStride, {w, h}, {dw, dh});
}

int32_t _QZRGB888ToRGB565RszRot(const QZ_ROTATION_WALKER* walker, const void* src,
                                int32_t srcStride, int32_t w, int32_t h, int32_t dw, int32_t dh) {
    return Move<Rgb888Pixels, StoreReduced>(walker, src, srcStride, {w, h}, {dw, dh});
}
