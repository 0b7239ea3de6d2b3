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
/// @{
/// @}

}  // extern "C"

#endif
