// RGB pictures at another size, turned, reduced or expanded. Resampling is bilinear in each channel
// at the source's own depth and rounds to nearest, so a picture that keeps its size keeps its
// pixels.

#include "kernels/pixel_walk.h"
#include "kernels/rgb_formats.h"

namespace vidshow {
namespace {

/// A channel of an RGB565 word: its bits, and how many low bits of an 8-bit channel are above it.
struct Field {
    int shift;
    int bits;

    uint32_t Of(uint32_t word) const { return word >> shift & ((1u << bits) - 1); }
    uint32_t Put(uint32_t value) const { return value << shift; }
    uint32_t Reduced(uint8_t channel) const { return Put(channel >> (8 - bits)); }
};
constexpr Field kFields[] = {{0, 5}, {5, 6}, {11, 5}};  // blue, green, red
constexpr int kChannels = 3;

inline uint32_t LoadWord(const uint8_t* at) {
    uint16_t word;
    std::memcpy(&word, at, sizeof word);
    return word;
}

/// RGB565 words, each field along a line of its own.
class Rgb565Pixels {
  public:
    static constexpr int kBytes = 2;

    void Resample(const uint8_t* upper, const uint8_t* lower, int32_t weight,
                  const ColumnTaps& taps, uint8_t* out) {
        for (int f = 0; f < kChannels; ++f) {
            Blend(kFields[f], upper, lower, static_cast<uint32_t>(weight), taps.span());
            taps.Pick<RoundedMean, 1>(m_line, m_channel[f]);
        }
        for (int32_t i = 0; i < taps.count(); ++i) {
            uint32_t word = 0;
            for (int f = 0; f < kChannels; ++f) {
                word |= kFields[f].Put(m_channel[f][i]);
            }
            StorePixel<kBytes>(out + i * kBytes, word);
        }
    }

  private:
    void Blend(Field field, const uint8_t* upper, const uint8_t* lower, uint32_t weight,
               int32_t count) {
        for (int32_t i = 0; i < count; ++i) {
            const uint32_t above = field.Of(LoadWord(upper + i * kBytes));
            const uint32_t below = field.Of(LoadWord(lower + i * kBytes));
            m_line[i] = static_cast<uint16_t>(above * (kWeightOne - weight) + below * weight);
        }
    }

    uint16_t m_line[kStripSpan + 1] = {};
    uint8_t m_channel[kChannels][kStripColumns];
};

using Rgb888Pixels = BytePixels<RoundedMean, kChannels>;

/// Stores a run of pixels as they are.
template <class Pixels>
struct Keep {
    static void Store(const Walk& walk, int32_t x, int32_t y, const uint8_t* pixels,
                      int32_t count) {
        StoreRun<Pixels::kBytes>(walk, x, y, pixels, count);
    }
};

/// Stores a run of RGB888 pixels as RGB565, the low bits cut off.
struct Reduce {
    static void Store(const Walk& walk, int32_t x, int32_t y, const uint8_t* bgr, int32_t count) {
        uint8_t* at = walk.At(x, y);
        for (int32_t i = 0; i < count; ++i) {
            const uint32_t word = kFields[0].Reduced(bgr[0]) | kFields[1].Reduced(bgr[1]) |
                                  kFields[2].Reduced(bgr[2]);
            StorePixel<Rgb565Pixels::kBytes>(at, word);
            bgr += kChannels;
            at += walk.across;
        }
    }
};

template <class Pixels, class Output>
int32_t Move(const QZ_ROTATION_WALKER* walker, const void* src, intptr_t stride, Size from,
             Size to) {
    if (walker == nullptr || src == nullptr) return -1;
    if (IsEmpty(from) || IsEmpty(to)) return 0;
    const Walk walk = PackedWalk(*walker);
    Sampler<Pixels> sampler(src, stride, PixelAxis(from.w, to.w), PixelAxis(from.h, to.h));
    ForEachRun(sampler, to, walk, [&](int32_t x, int32_t y, const uint8_t* pixels, int32_t count) {
        Output::Store(walk, x, y, pixels, count);
    });
    return 0;
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
    return Move<Rgb565Pixels, Keep<Rgb565Pixels>>(walker, src, stride, {w, h}, {dw, dh});
}

int32_t _QZRGB888RszRot(const QZ_ROTATION_WALKER* walker, const void* src, int32_t srcStride,
                        int32_t w, int32_t h, int32_t dw, int32_t dh) {
    return Move<Rgb888Pixels, Keep<Rgb888Pixels>>(walker, src, srcStride, {w, h}, {dw, dh});
}

int32_t _QZRGB888ToRGB565RszRot(const QZ_ROTATION_WALKER* walker, const void* src,
                                int32_t srcStride, int32_t w, int32_t h, int32_t dw, int32_t dh) {
    return Move<Rgb888Pixels, Reduce>(walker, src, srcStride, {w, h}, {dw, dh});
}
