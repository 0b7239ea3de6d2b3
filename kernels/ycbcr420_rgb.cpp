// Planar 4:2:0 to RGB at the same size, straight and turned. One body walks the picture in 2 x 2
// blocks, which share a chroma sample pair; formats and targets are its parameters. Where the back
// end in use packs a format, rows are converted strip by strip instead, to the same bytes.

#include "kernels/strip_picture.h"

namespace vidshow {
namespace {

/// Cb and Cr share one stride, ss[1]. Blocks are whole, so that an odd width or height converts one
/// more column or row.
template <class Format, class Target>
int32_t ConvertBlocks(const TransTables& tables, uint8_t* const src[3], const uint32_t ss[3],
                      int32_t w, int32_t h, Format format, Target target) {
    RowPair rows{src[0], src[0] + ss[0], src[1], src[2]};
    for (int32_t y = 0; y < h; y += 2) {
        ConvertRows(tables, rows, w, format, target);
        target.NextRows();
        rows.upper = rows.lower + ss[0];
        rows.lower = rows.upper + ss[0];
        rows.cb += ss[1];
        rows.cr += ss[1];
    }
    return 0;
}

/// The rows of the source itself.
class SourcePairs {
  public:
    SourcePairs(uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t rows)
        : m_src(src), m_ss(ss), m_w(w), m_rows(rows) {}

    static constexpr bool kStay = true;
    intptr_t ChromaStride() const { return static_cast<intptr_t>(m_ss[1]); }

    static int32_t columns() { return INT32_MAX - 1; }
    void Select(int32_t x, int32_t count) {
        constexpr int32_t kCacheLine = 64;
        m_x = static_cast<size_t>(x);
        m_count = static_cast<size_t>(count);
        m_last = static_cast<size_t>(std::min(count - 1, kCacheLine));
    }
    RowPair Rows(int32_t y) const {
        const size_t row = static_cast<size_t>(y);
        const uint8_t* const upper = m_src[0] + row * m_ss[0] + m_x;
        const size_t chroma = row / 2 * m_ss[1] + m_x / 2;
        if (y + kAhead + 1 < m_rows) {
            Prefetch(upper + size_t{kAhead} * m_ss[0], m_last);
            Prefetch(upper + size_t{kAhead + 1} * m_ss[0], m_last);
            Prefetch(m_src[1] + chroma + size_t{kAhead / 2} * m_ss[1], m_last / 2);
            Prefetch(m_src[2] + chroma + size_t{kAhead / 2} * m_ss[1], m_last / 2);
        }
        return {upper, upper + m_ss[0], m_src[1] + chroma, m_src[2] + chroma};
    }

    /// Asks for as many columns behind the chosen ones, of rows `y` and `y` + 1.
    void FetchNext(int32_t y) const {
        const size_t next = m_x + m_count, last = m_count - 1;
        if (next + last >= static_cast<size_t>(m_w)) return;
        const size_t row = static_cast<size_t>(y);
        const uint8_t* const upper = m_src[0] + row * m_ss[0] + next;
        const size_t chroma = row / 2 * m_ss[1] + next / 2;
        Prefetch(upper, last);
        Prefetch(upper + m_ss[0], last);
        Prefetch(m_src[1] + chroma, last / 2);
        Prefetch(m_src[2] + chroma, last / 2);
    }

  private:
    static constexpr int32_t kAhead = 8;  // rows

    /// Pieces of rows lie in pages of their own, across which no processor fetches ahead by itself.
    static void Prefetch(const uint8_t* row, size_t last) {
        __builtin_prefetch(row);
        __builtin_prefetch(row + last);
    }

    uint8_t* const* m_src;
    const uint32_t* m_ss;
    int32_t m_w, m_rows;
    size_t m_x = 0;
    size_t m_count = 0;
    size_t m_last = 0;  ///< column of the piece that is fetched ahead
};

template <class Format>
int32_t ConvertStraight(const QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                        int32_t w, int32_t h, void* dst, uint32_t d, Format format) {
    const TransTables tables(p);
    const StripPicture<Format> strips(tables, format, {w, h});
    if (!strips.FitsRows(d)) {
        return ConvertBlocks(tables, src, ss, w, h, format, RowTarget<Format::kBytes>(dst, d));
    }
    strips.ToRows(SourcePairs(src, ss, w, h), dst, d);
    return 0;
}

template <class Format>
int32_t ConvertTurned(const QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                      int32_t w, int32_t h, Format format) {
    if (h < 1) return 0;
    const QZ_ROTATION_WALKER* walker = WalkerOf(p);
    if (!walker) return -1;
    const TransTables tables(p);
    const StripPicture<Format> strips(tables, format, {w, h});
    if (!strips.FitsWalker(*walker)) {
        return ConvertBlocks(tables, src, ss, w, h, format, WalkerTarget<Format::kBytes>(*walker));
    }
    strips.ToWalk(SourcePairs(src, ss, w, h), PackedWalk(*walker));
    return 0;
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t _QZYCbCr420ToRGB565(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                            int32_t w, int32_t h, void* dst, uint32_t d) {
    return ConvertStraight(p, src, ss, w, h, dst, d, Rgb565{});
}

int32_t _QZYCbCr420ToRGB555(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                            int32_t w, int32_t h, void* dst, uint32_t d, uint32_t k) {
    return ConvertStraight(p, src, ss, w, h, dst, d, Rgb5551{k});
}

int32_t _QZYCbCr420ToRGB888(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                            int32_t w, int32_t h, void* dst, uint32_t d) {
    return ConvertStraight(p, src, ss, w, h, dst, d, Rgb888{});
}

int32_t _QZYCbCr420ToARGB32(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                            int32_t w, int32_t h, void* dst, uint32_t d, uint32_t a) {
    return ConvertStraight(p, src, ss, w, h, dst, d, Argb32{a});
}

int32_t _QZYCbCr420ToRGB565Rot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                               const uint32_t ss[3], int32_t w, int32_t h) {
    return ConvertTurned(p, src, ss, w, h, Rgb565{});
}

int32_t _QZYCbCr420ToRGB888Rot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                               const uint32_t ss[3], int32_t w, int32_t h) {
    return ConvertTurned(p, src, ss, w, h, Rgb888{});
}

int32_t _QZYCbCr420ToARGB32Rot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                               const uint32_t ss[3], int32_t w, int32_t h, uint32_t a) {
    return ConvertTurned(p, src, ss, w, h, Argb32{a});
}
