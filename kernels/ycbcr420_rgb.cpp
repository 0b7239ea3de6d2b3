// Planar 4:2:0 to RGB at the same size, straight and turned. One body walks the picture in 2 x 2
// blocks, which share a chroma sample pair; formats and targets are its parameters.

#include "kernels/convert_rows.h"

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

template <class Format>
int32_t ConvertStraight(const QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                        int32_t w, int32_t h, void* dst, uint32_t d, Format format) {
    return ConvertBlocks(TransTables(p), src, ss, w, h, format, RowTarget<Format::kBytes>(dst, d));
}

template <class Format>
int32_t ConvertTurned(const QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                      int32_t w, int32_t h, Format format) {
    if (h < 1) return 0;
    const QZ_ROTATION_WALKER* walker = WalkerOf(p);
    if (!walker) return -1;
    return ConvertBlocks(TransTables(p), src, ss, w, h, format,
                         WalkerTarget<Format::kBytes>(*walker));
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
