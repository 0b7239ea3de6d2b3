#ifndef VIDSHOW_KERNELS_H
#define VIDSHOW_KERNELS_H

/// @file
/// The pixel kernels, for callers that need one conversion without a processor around it.
///
/// Conventions, where a kernel does not say otherwise:
/// - `src`, `ss`: planes Y, Cb, Cr and their strides in bytes; `dst`, `d`: a packed picture and its
///   stride in bytes; `dsts`, `ds`: three destination planes and their strides in bytes.
/// - `w`, `h`: source size; `dw`, `dh`: destination size; pixels.
/// - `p`: a processor record, for its translation or adjustment tables and its rotation walker;
///   `a`: alpha byte; `k`: colour key; `lines`: four line buffers of at least max(w, dw) + 4 words.
/// - Planes, strides and sizes are not checked. The result is 0, or -1 where a kernel says so.
/// - A 4:2:0 kernel works on whole 2 x 2 blocks: planes and output hold an odd size rounded up.
/// - Nothing outside the stated size of a plane is read or written, unless a kernel says so.

#include "vidshow/imageproc.h"
#include "vidshow/types.h"

/// Where the pixels of a turned picture go: thirteen words that `_QZ_RotationInit` fills.
///
/// Packed outputs (words 0 to 5): step across and step down in bytes, for a move of two source
/// pixels or rows; addresses of the pixels that receive (x, y), (x + 1, y), (x, y + 1) and
/// (x + 1, y + 1) of the first 2 x 2 source block.
/// Planar outputs: words 0 and 1 the steps of Y for one source pixel or row, 6 and 7 those of Cb, 8
/// and 9 those of Cr; 10, 11, 12 the start addresses of Y, Cb, Cr; 2 to 5 keep what they held.
struct QZ_ROTATION_WALKER {
    intptr_t word[13];
};

/// A picture of three planes, for the deinterlacing modes.
struct QZ_PICTURE {
    uint32_t planes;  ///< always 3 here
    uint8_t* plane[4];
    uint32_t pitch[4];  ///< bytes
    uint32_t width;     ///< luma, pixels
    uint32_t height;
    uint32_t chromaWidth;
    uint32_t chromaHeight;
};

extern "C" {

/// @name Planar 4:2:0 to RGB, table-driven
///
/// Per pixel: red, green and blue are the luma table's entry plus a term of the chroma sample pair,
/// cut to the format's bits (truncated, not rounded) and clamped. A Cb or Cr entry shifted right by
/// 15 is the blue or red term; twice the 16-bit sum of both entries' low halves is the green one.
/// Byte orders: RGB888 B, G, R; ARGB32 B, G, R, A; 16-bit words low byte first. Addresses need no
/// alignment. Nothing is done, and 0 returned, when a height is below 1.
/// @{

/// Same size. All pixels of a 2 x 2 block share its chroma pair. Strides: `ss[0]` luma, `ss[1]`
/// both chroma planes; `ss[2]` is not used. @return 0
VIDSHOW_API int32_t _QZYCbCr420ToRGB565(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                        const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                        uint32_t d);
VIDSHOW_API int32_t _QZYCbCr420ToRGB888(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                        const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                        uint32_t d);
VIDSHOW_API int32_t _QZYCbCr420ToARGB32(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                        const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                        uint32_t d, uint32_t a);
/// RGB5551: red in bits 15-11, green 10-6, blue 5-1, bit 0 set. A pixel whose Y << 16 | Cb << 8 |
/// Cr equals `k`, raw samples against the whole word, becomes 0.
VIDSHOW_API int32_t _QZYCbCr420ToRGB555(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                        const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                        uint32_t d, uint32_t k);

/// Same size, turned: as the straight ones, written through the processor's walker.
/// @return 0; -1 without a walker
VIDSHOW_API int32_t _QZYCbCr420ToRGB565Rot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                           const uint32_t ss[3], int32_t w, int32_t h);
VIDSHOW_API int32_t _QZYCbCr420ToRGB888Rot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                           const uint32_t ss[3], int32_t w, int32_t h);
VIDSHOW_API int32_t _QZYCbCr420ToARGB32Rot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                           const uint32_t ss[3], int32_t w, int32_t h, uint32_t a);

/// Any size, on the fly, corners aligned (step (n - 1) / (m - 1), 16.16): luma bilinear with 5-bit
/// weights, chroma nearest, one pair for a 2 x 2 block of output. One stride for each plane. Source
/// sizes from 1 to 16384, destination sizes from 2; an odd destination size is made one larger by
/// repeating the source's edge. Where the row or column after the last one is wanted, the last is
/// read in its place. @return 0
VIDSHOW_API int32_t _QZYCbCr420ToRGB565Rsz(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                           const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                           uint32_t d, int32_t dw, int32_t dh);
VIDSHOW_API int32_t _QZYCbCr420ToRGB888Rsz(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                           const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                           uint32_t d, int32_t dw, int32_t dh);
VIDSHOW_API int32_t _QZYCbCr420ToARGB32Rsz(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                           const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                           uint32_t d, int32_t dw, int32_t dh, uint32_t a);

/// Any size, turned: as `Rsz`, written through the processor's walker; `dw`, `dh` are the sizes
/// before the turn. @return 0; -1 without a walker
VIDSHOW_API int32_t _QZYCbCr420ToRGB565RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                              const uint32_t ss[3], int32_t w, int32_t h,
                                              int32_t dw, int32_t dh);
VIDSHOW_API int32_t _QZYCbCr420ToRGB888RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                              const uint32_t ss[3], int32_t w, int32_t h,
                                              int32_t dw, int32_t dh);
VIDSHOW_API int32_t _QZYCbCr420ToARGB32RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                              const uint32_t ss[3], int32_t w, int32_t h,
                                              int32_t dw, int32_t dh, uint32_t a);
/// @}

/// @name Line operations of the scaling kernels
/// @{
/// @}

/// @name Rotation
/// @{
/// @}

/// @name Deinterlacing
/// @{
/// @}

/// @name Further formats
/// @{

/// Copies three planes row by row; the chroma planes are half as wide and half as tall, odd sizes
/// rounded up.
VIDSHOW_API int32_t _QZYCbCr420Copy(uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                    int32_t h, uint8_t* const dsts[3], const uint32_t ds[3]);
/// @}

/// @name Vector kernels
/// The whole-frame conversions without scaling, with their own arithmetic: coefficients built in
/// per colour matrix, untouched by colour adjustment. The last number of a name is the matrix
/// (`QZ_IMAGEPROC_MATRIX`): 0 BT.601, 1 BT.709, 2 SMPTE 240M, 3 FCC. `YCbCr420` and `NV12` are
/// limited range, `YUV420` and `NV12FR` full range; full range takes chroma without a bias of 128.
///
/// They exist on every processor, whatever their names say, and give the same bytes everywhere. Any
/// width and height will do, odd ones too: chroma planes hold half the size, rounded up, and not a
/// byte outside the pictures is read or written. There is no alignment to keep. Sizes below 1 do
/// nothing. Source and destination must not overlap. All return 0.
/// @{

#define VIDSHOW_FOUR(head, tail, parameters)      \
    VIDSHOW_API int32_t head##0##tail parameters; \
    VIDSHOW_API int32_t head##1##tail parameters; \
    VIDSHOW_API int32_t head##2##tail parameters; \
    VIDSHOW_API int32_t head##3##tail parameters

/// 16-bit pixels: red (BGR565: blue) in bits 15-11, green in 10-5, blue (red) in 4-0.
/// NV12: plane 1 holds pairs Cb, Cr; the third plane and stride are not looked at.
#define VIDSHOW_TO_PIXELS(head)                                                                  \
    VIDSHOW_FOUR(head, ,                                                                         \
                 (uint8_t* const src[3], const uint32_t ss[3], void* dst, uint32_t d, int32_t w, \
                  int32_t h))
VIDSHOW_TO_PIXELS(_YCbCr420ToRGB565_P3C2_);
VIDSHOW_TO_PIXELS(_YUV420ToRGB565_P3C2_);
VIDSHOW_TO_PIXELS(_YCbCr420ToBGR565_P3C2_);
VIDSHOW_TO_PIXELS(_YUV420ToBGR565_P3C2_);
VIDSHOW_TO_PIXELS(_NV12ToRGB565_P3C2_);
VIDSHOW_TO_PIXELS(_NV12FRToRGB565_P3C2_);
VIDSHOW_TO_PIXELS(_NV12ToBGR565_P3C2_);
VIDSHOW_TO_PIXELS(_NV12FRToBGR565_P3C2_);

/// Bytes: RGB888 blue, green, red; BGR888 red, green, blue.
VIDSHOW_TO_PIXELS(_YCbCr420ToRGB888_P3C3_);
VIDSHOW_TO_PIXELS(_YUV420ToRGB888_P3C3_);
VIDSHOW_TO_PIXELS(_YCbCr420ToBGR888_P3C3_);
VIDSHOW_TO_PIXELS(_YUV420ToBGR888_P3C3_);
#undef VIDSHOW_TO_PIXELS

/// Bytes: ARGB32 blue, green, red, alpha; ABGR32 red, green, blue, alpha.
/// @param a alpha; only its low byte counts
#define VIDSHOW_TO_PIXELS_ALPHA(head)                                                            \
    VIDSHOW_FOUR(head, ,                                                                         \
                 (uint8_t* const src[3], const uint32_t ss[3], void* dst, uint32_t d, int32_t w, \
                  int32_t h, uint32_t a))
VIDSHOW_TO_PIXELS_ALPHA(_YCbCr420ToARGB32_P3C4_);
VIDSHOW_TO_PIXELS_ALPHA(_YUV420ToARGB32_P3C4_);
VIDSHOW_TO_PIXELS_ALPHA(_YCbCr420ToABGR32_P3C4_);
VIDSHOW_TO_PIXELS_ALPHA(_YUV420ToABGR32_P3C4_);
#undef VIDSHOW_TO_PIXELS_ALPHA

/// 16-bit pixels: red (BGR5551: blue) in bits 15-11, green in 10-6, blue (red) in 5-1, bit 0 set.
/// @param k colour key in the same form, bit 0 included; only its low half counts. It is compared
///          with the finished pixel, and a match is written as 0. An even key never matches.
#define VIDSHOW_TO_PIXELS_KEY(head)                                                              \
    VIDSHOW_FOUR(head, ,                                                                         \
                 (uint8_t* const src[3], const uint32_t ss[3], void* dst, uint32_t d, int32_t w, \
                  int32_t h, uint32_t k))
VIDSHOW_TO_PIXELS_KEY(_YCbCr420ToRGB5551_P3C2_);
VIDSHOW_TO_PIXELS_KEY(_YUV420ToRGB5551_P3C2_);
VIDSHOW_TO_PIXELS_KEY(_YCbCr420ToBGR5551_P3C2_);
VIDSHOW_TO_PIXELS_KEY(_YUV420ToBGR5551_P3C2_);
#undef VIDSHOW_TO_PIXELS_KEY

/// Packed RGB to planes Y, Cb, Cr. Chroma is sampled from the even pixels of the even rows, not
/// averaged. 16-bit channels are taken unmasked, eight bits from the top of each field on. Source
/// bytes of ARGB32 and ABGR32 as above; alpha is not looked at.
#define VIDSHOW_TO_PLANES(head)                                               \
    VIDSHOW_FOUR(head, ,                                                      \
                 (const void* src, uint32_t srcStride, uint8_t* const dst[3], \
                  const uint32_t dstStride[3], int32_t w, int32_t h))
VIDSHOW_TO_PLANES(_QZRGB565ToYCbCr420_C2P3_);
VIDSHOW_TO_PLANES(_QZRGB565ToYUV420_C2P3_);
VIDSHOW_TO_PLANES(_QZARGB32ToYCbCr420_C4P3_);
VIDSHOW_TO_PLANES(_QZARGB32ToYUV420_C4P3_);
VIDSHOW_TO_PLANES(_QZABGR32ToYCbCr420_C4P3_);
VIDSHOW_TO_PLANES(_QZABGR32ToYUV420_C4P3_);
#undef VIDSHOW_TO_PLANES

/// Two luma rows of `w` pixels that share (w + 1) / 2 chroma samples become two lines of `w` spread
/// pixels: red (bgr: blue) in bits 26-21, green in 15-10, blue (red) in 4-0, the top bits of the
/// same channels that the conversions above pack.
#define VIDSHOW_TO_LINES(head)                                                   \
    VIDSHOW_FOUR(head, _neon,                                                    \
                 (const uint8_t* luma0, const uint8_t* luma1, const uint8_t* cb, \
                  const uint8_t* cr, uint32_t* line0, uint32_t* line1, int32_t w))
VIDSHOW_TO_LINES(_convert_ycbcr2rgb_);
VIDSHOW_TO_LINES(_convert_yuv2rgb_);
VIDSHOW_TO_LINES(_convert_ycbcr2bgr_);
VIDSHOW_TO_LINES(_convert_yuv2bgr_);
#undef VIDSHOW_TO_LINES
#undef VIDSHOW_FOUR

/// out[i] = (lower[i] w + upper[i] (32 - w)) >> 5, masked with 0x07E0FC1F; `w` 0..32.
/// Works in fours: `count` is rounded down to a multiple of 4, but four entries are always made.
/// `out` may be one of the sources.
VIDSHOW_API int32_t _vlerp_neon(const uint32_t* upper, const uint32_t* lower, uint32_t* out,
                                int32_t w, int32_t count);

/// out[i] = (upper[i] + lower[i]) >> 1, masked with 0x07E0FC1F; `count` as for `_vlerp_neon`.
VIDSHOW_API int32_t _vlerp12_neon(const uint32_t* upper, const uint32_t* lower, uint32_t* out,
                                  int32_t count);

/// Bilinear resampling of a line of spread pixels to an RGB565 row: pixel i stands at `i * step`.
/// @param step  distance of two pixels in the line, 16.16 fixed point; its top five fraction bits
///              weigh
/// @param width pixels to make; an odd one is rounded down. The entry right of the last position is
///              read, even where its weight is 0.
VIDSHOW_API int32_t _hlerp_neon(const uint32_t* line, uint16_t* out, int32_t step, int32_t width);
/// @}

}  // extern "C"

#endif
