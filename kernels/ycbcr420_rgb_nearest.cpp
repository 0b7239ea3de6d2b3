// Planar 4:2:0 to RGB565, enlarged by picking the nearest pixel. Rows are picked as pixels are: by
// a quotient and a remainder that carries over (Bresenham's walk).

#include <cstring>

#include "kernels/line_buffers.h"

namespace vidshow {
namespace {

/// 0, n / m, 2n / m ...: whole parts, without a division for each.
class Walk {
  public:
    Walk(int32_t n, int32_t m) : m_quotient(n / m), m_remainder(n % m), m_modulus(m) {}

    int32_t at() const { return m_at; }

    void Advance() {
        m_at += m_quotient;
        m_error += m_remainder;
        if (m_error >= m_modulus) {
            m_error -= m_modulus;
            ++m_at;
        }
    }

  private:
    int32_t m_quotient;
    int32_t m_remainder;
    int32_t m_modulus;
    int32_t m_at = 0;
    int32_t m_error = 0;
};

/// Makes `dh` rows of `dw` pixels. `convert(row)` fills the two RGB565 `lines`, of `lineWidth`
/// pixels, with source rows `row` and `row + 1`; nothing is converted after the last row needed.
template <class ConvertPair>
void PickRows(const uint16_t* const lines[2], int32_t lineWidth, int32_t h, void* dst, uint32_t d,
              int32_t dw, int32_t dh, ConvertPair convert) {
    Walk walk(h, dh);
    int32_t pair = -1;
    int32_t previous = -1;
    for (int32_t y = 0; y < dh; ++y, walk.Advance()) {
        uint16_t* out = RowAt<uint16_t>(dst, WordStep(d), y);
        const int32_t row = walk.at();
        if (row == previous) {
            std::memcpy(out, RowAt<uint16_t>(dst, WordStep(d), y - 1), static_cast<size_t>(dw) * 2);
            continue;
        }
        if (row / 2 != pair) {
            pair = row / 2;
            convert(2 * pair);
        }
        HLerp_Nearest(lines[row % 2], out, dw, lineWidth / dw, lineWidth % dw);
        previous = row;
    }
}

uint16_t* AsRgb565(uint32_t* line) {
    return static_cast<uint16_t*>(static_cast<void*>(line));
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t _QZYCbCr420ToRGB565RszUp_Nearest(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                         uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                         int32_t h, void* dst, uint32_t d, int32_t dw, int32_t dh) {
    if (h < 1 || dh < 1 || dw < 1) return 0;
    if (!HasLines(lines, 2)) return -1;
    uint16_t* const picked[2] = {AsRgb565(lines[0]), AsRgb565(lines[1])};
    const SourceRows source(src, ss, h);
    PickRows(picked, w, h, dst, d, dw, dh, [&](int32_t row) {
        const RowPair rows = source.At(row);
        Convert_565(p, rows.upper, rows.lower, rows.cb, rows.cr, picked[0], picked[1], w);
    });
    return 0;
}

int32_t _QZYCbCr420ToRGB565RszUp_NearLinear(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                            uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                            int32_t h, void* dst, uint32_t d, int32_t dw,
                                            int32_t dh) {
    if (h < 1 || dh < 1 || dw < 1) return 0;
    if (!HasLines(lines, 4)) return -1;
    uint16_t* const doubled[2] = {AsRgb565(lines[2]), AsRgb565(lines[3])};
    const SourceRows source(src, ss, h);
    PickRows(doubled, 2 * w, h, dst, d, dw, dh, [&](int32_t row) {
        const RowPair rows = source.At(row);
        Convert(p, rows.upper, rows.lower, rows.cb, rows.cr, lines[0], lines[1], w);
        DoubleLine(lines[0], doubled[0], w);
        DoubleLine(lines[1], doubled[1], w);
    });
    return 0;
}
