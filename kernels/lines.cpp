// The line operations of the scaling kernels: two converted rows blended into one, one converted
// row resampled into an output row.

#include "kernels/corner_step.h"
#include "kernels/spread_pixel.h"
#include "kernels/vec_backend.h"
#include "vidshow/kernels.h"

namespace vidshow {
namespace {

/// Writes pixels of one format, one after the other.
template <class Packer>
class PixelWriter {
  public:
    PixelWriter(void* out, Packer packer) : m_at(static_cast<uint8_t*>(out)), m_packer(packer) {}

    /// Puts the pixel of a sum whose weights add to 2 to the power of `n`.
    template <int n>
    void Put(uint32_t sum) {
        StorePixel<Packer::kBytes>(m_at, m_packer.template Pack<n>(sum));
        m_at += Packer::kBytes;
    }

  private:
    uint8_t* m_at;
    Packer m_packer;
};

/// The weighted sum, weights adding to 32, at a 16.16 position.
uint32_t SumAt(const uint32_t* line, int32_t position) {
    const int32_t i = position >> 16;
    const uint32_t weight = static_cast<uint32_t>(position >> 11 & 31);
    return line[i] * (32 - weight) + line[i + 1] * weight;
}

uint32_t Rgb565At(const uint32_t* line, int32_t position) {
    return SpreadToRgb565().Pack<5>(SumAt(line, position));
}

template <class Packer>
int32_t ResampleLine(const uint32_t* line, void* out, int32_t step, int32_t width, Packer packer) {
    PixelWriter<Packer> writer(out, packer);
    for (int32_t x = 0; x < width; ++x)
        writer.template Put<5>(SumAt(line, x * step));
    return 0;
}

/// Makes three pixels of each two. The last pair has no pixel behind it: it ends on its own second.
template <class Packer>
int32_t TwoToThree(const uint32_t* line, void* out, int32_t srcWidth, Packer packer) {
    PixelWriter<Packer> writer(out, packer);
    for (int32_t x = 0; x < srcWidth; x += 2) {
        const uint32_t a = line[x], b = line[x + 1];
        writer.template Put<0>(a);
        writer.template Put<5>(11 * a + 21 * b);
        if (x + 2 < srcWidth) {
            writer.template Put<5>(21 * b + 11 * line[x + 2]);
        } else {
            writer.template Put<0>(b);
        }
    }
    return 0;
}

/// Makes five pixels of each two; the last pair ends on its own second pixel, twice. The fifth
/// pixel's 19 / 13 puts it nearer `b` than the fourth is. Clients know the picture so.
template <class Packer>
int32_t TwoToFive(const uint32_t* line, void* out, int32_t srcWidth, Packer packer) {
    PixelWriter<Packer> writer(out, packer);
    for (int32_t x = 0; x < srcWidth; x += 2) {
        const uint32_t a = line[x], b = line[x + 1];
        writer.template Put<0>(a);
        writer.template Put<3>(5 * a + 3 * b);
        writer.template Put<5>(7 * a + 25 * b);
        if (x + 2 < srcWidth) {
            const uint32_t c = line[x + 2];
            writer.template Put<4>(13 * b + 3 * c);
            writer.template Put<5>(19 * b + 13 * c);
        } else {
            writer.template Put<0>(b);
            writer.template Put<0>(b);
        }
    }
    return 0;
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t VLerp(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t w,
              int32_t count) {
    const uint32_t below = static_cast<uint32_t>(w);
    const uint32_t above = 32 - below;
    const int32_t quads = std::max(count, 0) / 4;
    ActiveVectorBackend().blend(upper, lower, out, w, quads);
    for (int32_t i = 4 * quads; i < count; ++i) {
        out[i] = (lower[i] * below + upper[i] * above) >> 5 & kSpreadMask;
    }
    return 0;
}

int32_t VLerp_12(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t count) {
    const int32_t quads = std::max(count, 0) / 4;
    ActiveVectorBackend().average(upper, lower, out, quads);
    for (int32_t i = 4 * quads; i < count; ++i)
        out[i] = (upper[i] + lower[i]) >> 1 & kSpreadMask;
    return 0;
}

int32_t HLerp(const uint32_t* line, uint16_t* out, int32_t step, int32_t width) {
    const int32_t pairs = std::max(width, 0) / 2;
    return ResampleLine(line, out, step, 2 * pairs, SpreadToRgb565{});
}

int32_t HLerpRot(const uint32_t* line, uint16_t* out, int32_t step, int32_t width, int32_t pitch) {
    for (int32_t x = 0; x + 1 < width; x += 2) {
        StorePixel<2>(out + ptrdiff_t{x} * pitch, Rgb565At(line, x * step));
        StorePixel<2>(out + ptrdiff_t{x + 1} * pitch, Rgb565At(line, (x + 1) * step));
    }
    return 0;
}

int32_t HLerp24(const uint32_t* line, uint8_t* out, int32_t step, int32_t width) {
    return ResampleLine(line, out, step, width, SpreadToRgb888{});
}

int32_t HLerp32(const uint32_t* line, uint32_t* out, int32_t step, int32_t width, uint32_t a) {
    return ResampleLine(line, out, step, width, SpreadToArgb32{a});
}

int32_t HLerp_Nearest(const uint16_t* line, uint16_t* out, int32_t width, int32_t q, int32_t r) {
    int32_t error = 0;
    const auto next = [&] {
        const uint16_t pixel = *line;
        line += q;
        error += r;
        if (error >= width) {
            error -= width;
            ++line;
        }
        return pixel;
    };
    for (int32_t x = 0; x + 1 < width; x += 2) {
        const uint32_t first = next();
        StorePair<2>(out + x, first, next());
    }
    return 0;
}

int32_t HLerp_23(const uint32_t* line, uint16_t* out, int32_t srcWidth) {
    return TwoToThree(line, out, srcWidth, SpreadToRgb565{});
}

int32_t HLerp32_23(const uint32_t* line, uint32_t* out, int32_t srcWidth, uint32_t a) {
    return TwoToThree(line, out, srcWidth, SpreadToArgb32{a});
}

int32_t HLerp_25(const uint32_t* line, uint16_t* out, int32_t srcWidth) {
    return TwoToFive(line, out, srcWidth, SpreadToRgb565{});
}

int32_t HLerp32_25(const uint32_t* line, uint32_t* out, int32_t srcWidth, uint32_t a) {
    return TwoToFive(line, out, srcWidth, SpreadToArgb32{a});
}
