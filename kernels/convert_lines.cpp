// Source rows on their way into the line buffers of the scaling kernels.

#include "kernels/strip_rows.h"

namespace vidshow {
namespace {

/// Two lines of pixels of one width.
template <class Pixel>
class LineTarget {
  public:
    LineTarget(Pixel* upper, Pixel* lower) : m_upper(upper), m_lower(lower) {}

    void Put(const Block& b) {
        m_upper[0] = static_cast<Pixel>(b.topLeft);
        m_upper[1] = static_cast<Pixel>(b.topRight);
        m_lower[0] = static_cast<Pixel>(b.bottomLeft);
        m_lower[1] = static_cast<Pixel>(b.bottomRight);
        m_upper += 2;
        m_lower += 2;
    }

  private:
    Pixel* m_upper;
    Pixel* m_lower;
};

template <class Pixel, class Format>
int32_t ConvertPair(const QZ_IMAGEPROC_PARAMSET* p, const RowPair& rows, Pixel* upper, Pixel* lower,
                    int32_t width, Format format) {
    const TransTables tables(p);
    StripRows strips(tables, format);
    if (strips.ready()) {
        strips.Convert(rows, width, AsBytes(upper), AsBytes(lower));
    } else {
        ConvertRows(tables, rows, width, format, LineTarget<Pixel>(upper, lower));
    }
    return 0;
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t _convert(QZ_IMAGEPROC_PARAMSET* p, const uint8_t* upper, const uint8_t* lower, uint8_t cb,
                 uint8_t cr, uint32_t out[4]) {
    LineTarget<uint32_t> target(out, out + 2);
    ConvertRows(TransTables(p), {upper, lower, &cb, &cr}, 2, SpreadRgb{}, target);
    return 0;
}

int32_t Convert(QZ_IMAGEPROC_PARAMSET* p, const uint8_t* upper, const uint8_t* lower,
                const uint8_t* cb, const uint8_t* cr, uint32_t* upperOut, uint32_t* lowerOut,
                int32_t width) {
    return ConvertPair(p, {upper, lower, cb, cr}, upperOut, lowerOut, width / 2 * 2, SpreadRgb{});
}

int32_t Convert_565(QZ_IMAGEPROC_PARAMSET* p, const uint8_t* upper, const uint8_t* lower,
                    const uint8_t* cb, const uint8_t* cr, uint16_t* upperOut, uint16_t* lowerOut,
                    int32_t width) {
    return ConvertPair(p, {upper, lower, cb, cr}, upperOut, lowerOut, width / 2 * 2, Rgb565{});
}

int32_t DoubleLine(const uint32_t* line, uint16_t* out, int32_t width) {
    uint32_t previous = width > 0 ? line[0] : 0;
    for (int32_t x = 0; x < width; ++x) {
        const uint32_t pixel = line[x];
        StorePair<2>(out + 2 * x, SpreadToRgb565().Pack<1>(previous + pixel),
                     SpreadToRgb565().Pack<0>(pixel));
        previous = pixel;
    }
    return 0;
}
