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
/// - Sources are only read; no memory is kept. Null addresses are not allowed, unless a kernel says
///   what it makes of them.
///
/// Thread rule: any number of threads may call, each with destinations and line buffers of its own.
/// They may share a processor record that nobody changes meanwhile; a walker is one picture's.

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
    intptr_t word[13];  ///< steps in bytes, and addresses, as listed above
};

/// A picture of three planes, for the deinterlacing modes.
struct QZ_PICTURE {
    uint32_t planes;        ///< always 3 here
    uint8_t* plane[4];      ///< addresses of Y, Cb and Cr, not owned; the fourth is not looked at
    uint32_t pitch[4];      ///< bytes from one line to the next
    uint32_t width;         ///< luma, pixels
    uint32_t height;        ///< luma, lines
    uint32_t chromaWidth;   ///< chroma, samples
    uint32_t chromaHeight;  ///< chroma, lines
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
/// @copydoc _QZYCbCr420ToRGB565
VIDSHOW_API int32_t _QZYCbCr420ToRGB888(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                        const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                        uint32_t d);
/// @copydoc _QZYCbCr420ToRGB565
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
/// @copydoc _QZYCbCr420ToRGB565Rot
VIDSHOW_API int32_t _QZYCbCr420ToRGB888Rot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                           const uint32_t ss[3], int32_t w, int32_t h);
/// @copydoc _QZYCbCr420ToRGB565Rot
VIDSHOW_API int32_t _QZYCbCr420ToARGB32Rot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                           const uint32_t ss[3], int32_t w, int32_t h, uint32_t a);

/// Any size, on the fly, corners aligned (step (n - 1) / (m - 1), 16.16): luma bilinear with 5-bit
/// weights, chroma nearest, one pair for a 2 x 2 block of output. One stride for each plane. Source
/// sizes from 1 to 16384, which is for the caller to keep, destination sizes from 2; an odd
/// destination size is made one larger by repeating the source's edge. Where the row or column
/// after the last one is wanted, the last is read in its place. @return 0
VIDSHOW_API int32_t _QZYCbCr420ToRGB565Rsz(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                           const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                           uint32_t d, int32_t dw, int32_t dh);
/// @copydoc _QZYCbCr420ToRGB565Rsz
VIDSHOW_API int32_t _QZYCbCr420ToRGB888Rsz(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                           const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                           uint32_t d, int32_t dw, int32_t dh);
/// @copydoc _QZYCbCr420ToRGB565Rsz
VIDSHOW_API int32_t _QZYCbCr420ToARGB32Rsz(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                           const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                           uint32_t d, int32_t dw, int32_t dh, uint32_t a);

/// Any size, turned: as `Rsz`, written through the processor's walker; `dw`, `dh` are the sizes
/// before the turn. @return 0; -1 without a walker
VIDSHOW_API int32_t _QZYCbCr420ToRGB565RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                              const uint32_t ss[3], int32_t w, int32_t h,
                                              int32_t dw, int32_t dh);
/// @copydoc _QZYCbCr420ToRGB565RszRot
VIDSHOW_API int32_t _QZYCbCr420ToRGB888RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                              const uint32_t ss[3], int32_t w, int32_t h,
                                              int32_t dw, int32_t dh);
/// @copydoc _QZYCbCr420ToRGB565RszRot
VIDSHOW_API int32_t _QZYCbCr420ToARGB32RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                              const uint32_t ss[3], int32_t w, int32_t h,
                                              int32_t dw, int32_t dh, uint32_t a);

/// Enlarged through line buffers, bilinear on all channels, corners aligned: source rows become
/// spread pixels (see the line operations), two are blended with 5-bit weights, the blend is
/// resampled. `w` even, at least 2; RGB565 wants `dw` even. `d` counts rounded down to a multiple
/// of 4. Meant to enlarge; any size from 2 x 2 works. @return 0; -1 without line buffers
VIDSHOW_API int32_t _QZYCbCr420ToRGB565RszUp(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                             uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                             int32_t h, void* dst, uint32_t d, int32_t dw,
                                             int32_t dh);
/// @copydoc _QZYCbCr420ToRGB565RszUp
VIDSHOW_API int32_t _QZYCbCr420ToRGB888RszUp(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                             uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                             int32_t h, void* dst, uint32_t d, int32_t dw,
                                             int32_t dh);
/// @copydoc _QZYCbCr420ToRGB565RszUp
VIDSHOW_API int32_t _QZYCbCr420ToARGB32RszUp(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                             uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                             int32_t h, void* dst, uint32_t d, int32_t dw,
                                             int32_t dh, uint32_t a);

/// Enlarged and turned: output row 0 begins at `start`, the next row `rowStep` bytes further, the
/// next pixel of a row `pixelStep` bytes further; both may be negative, `pixelStep` is even.
/// @return 0; -1 for null `start` or without line buffers
VIDSHOW_API int32_t _QZYCbCr420ToRGB565RszUpRot(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                                uint8_t* const src[3], const uint32_t ss[3],
                                                int32_t w, int32_t h, void* start, int32_t rowStep,
                                                int32_t pixelStep, int32_t dw, int32_t dh);

/// Enlarged by picking the nearest pixel and row: output i comes from source i x n / m, truncated.
/// `w` and `dw` even; uses two line buffers; `d` counts rounded down to a multiple of 4. A row that
/// repeats is copied from the row above, `dw` pixels. @return 0; -1 without line buffers
VIDSHOW_API int32_t _QZYCbCr420ToRGB565RszUp_Nearest(QZ_IMAGEPROC_PARAMSET* p,
                                                     uint32_t* const lines[4],
                                                     uint8_t* const src[3], const uint32_t ss[3],
                                                     int32_t w, int32_t h, void* dst, uint32_t d,
                                                     int32_t dw, int32_t dh);
/// The same from lines that `DoubleLine` made twice as wide; uses four line buffers.
VIDSHOW_API int32_t _QZYCbCr420ToRGB565RszUp_NearLinear(QZ_IMAGEPROC_PARAMSET* p,
                                                        uint32_t* const lines[4],
                                                        uint8_t* const src[3], const uint32_t ss[3],
                                                        int32_t w, int32_t h, void* dst, uint32_t d,
                                                        int32_t dw, int32_t dh);

/// 2.5 times as wide (`w` a multiple of 4 for RGB565, of 2 for ARGB32) and twice as tall: `dh` is
/// twice the source height. The last row's average reads past the source: there must be two more
/// readable luma rows and one more chroma row behind an even source height. `d` counts rounded down
/// to a multiple of 4. @return 0; -1 without line buffers
VIDSHOW_API int32_t _QZYCbCr420ToRGB565Case1(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                             uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                             void* dst, uint32_t d, int32_t dh);
/// @copydoc _QZYCbCr420ToRGB565Case1
VIDSHOW_API int32_t _QZYCbCr420ToARGB32Case1(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                             uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                             void* dst, uint32_t d, int32_t dh, uint32_t a);

/// 1.5 times as wide (`w` a multiple of 4 for RGB565, of 2 for ARGB32), any height, rows as in
/// `RszUp`. `d` counts rounded down to a multiple of 4. @return 0; -1 without line buffers
VIDSHOW_API int32_t _QZYCbCr420ToRGB565Case2(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                             uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                             int32_t h, void* dst, uint32_t d, int32_t dh);
/// @copydoc _QZYCbCr420ToRGB565Case2
VIDSHOW_API int32_t _QZYCbCr420ToARGB32Case2(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                             uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                             int32_t h, void* dst, uint32_t d, int32_t dh,
                                             uint32_t a);

/// 320 x 240 to 480 x 272. Rows lie at y x 239 / 271 and are blended with the nearest of the
/// weights 0, 1/8, 1/4, 1/2, 3/4, 7/8. `line0` and `line1` hold at least 320 words each.
/// @return 0; -1 for a null line
VIDSHOW_API int32_t _QZYCbCr420ToRGB565Case3(QZ_IMAGEPROC_PARAMSET* p, uint32_t* line0,
                                             uint32_t* line1, uint8_t* const src[3],
                                             const uint32_t ss[3], void* dst, uint32_t d);
/// @}

/// @name Line operations of the scaling kernels
///
/// A spread pixel is a word with red (6 bits) in bits 26-21, green (6 bits) in bits 15-10, blue (5
/// bits) in bits 4-0 and zeros between, so that one multiplication weighs all three. Counts and
/// widths below 1 do nothing; output addresses need no alignment. All return 0.
/// @{

/// Two luma rows that share a chroma row, to two lines of spread pixels, by the tables of `p`.
/// `width` is the pixels of each row, even; `width` / 2 chroma samples are read.
VIDSHOW_API int32_t Convert(QZ_IMAGEPROC_PARAMSET* p, const uint8_t* upper, const uint8_t* lower,
                            const uint8_t* cb, const uint8_t* cr, uint32_t* upperOut,
                            uint32_t* lowerOut, int32_t width);
/// The same to two lines of RGB565 pixels.
VIDSHOW_API int32_t Convert_565(QZ_IMAGEPROC_PARAMSET* p, const uint8_t* upper,
                                const uint8_t* lower, const uint8_t* cb, const uint8_t* cr,
                                uint16_t* upperOut, uint16_t* lowerOut, int32_t width);
/// One 2 x 2 block to spread pixels: two luma samples at `upper`, two at `lower`, one chroma pair;
/// `out` receives top left, top right, bottom left, bottom right.
VIDSHOW_API int32_t _convert(QZ_IMAGEPROC_PARAMSET* p, const uint8_t* upper, const uint8_t* lower,
                             uint8_t cb, uint8_t cr, uint32_t out[4]);
/// `width` spread pixels to twice as many RGB565 pixels: pixel 2i is the average of pixels i - 1
/// and i (the first pairs with itself), pixel 2i + 1 is pixel i.
VIDSHOW_API int32_t DoubleLine(const uint32_t* line, uint16_t* out, int32_t width);

/// out[i] = (lower[i] x w + upper[i] x (32 - w)) >> 5, fields kept apart; `w` 0..32, `count` words.
VIDSHOW_API int32_t VLerp(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t w,
                          int32_t count);
/// out[i] = (upper[i] + lower[i]) >> 1, fields kept apart.
VIDSHOW_API int32_t VLerp_12(const uint32_t* upper, const uint32_t* lower, uint32_t* out,
                             int32_t count);

/// Bilinear: output i lies at i x `step` (16.16) of the line, between two spread pixels, weighed by
/// the top five bits of the fraction; nothing is rounded. Reads one entry past the last pixel (with
/// weight 0 at the exact right edge). `width` output pixels, an odd one is left out.
VIDSHOW_API int32_t HLerp(const uint32_t* line, uint16_t* out, int32_t step, int32_t width);
/// The same with RGB565 pixels `pitch` 16-bit units apart: a row becomes a column.
VIDSHOW_API int32_t HLerpRot(const uint32_t* line, uint16_t* out, int32_t step, int32_t width,
                             int32_t pitch);
/// The same to RGB888, any width.
VIDSHOW_API int32_t HLerp24(const uint32_t* line, uint8_t* out, int32_t step, int32_t width);
/// The same to ARGB32, any width.
VIDSHOW_API int32_t HLerp32(const uint32_t* line, uint32_t* out, int32_t step, int32_t width,
                            uint32_t a);
/// Nearest: the line's cursor moves `q` pixels for each output pixel, and one more whenever the
/// remainders `r` have added up to `width`. An odd last pixel is left out.
VIDSHOW_API int32_t HLerp_Nearest(const uint16_t* line, uint16_t* out, int32_t width, int32_t q,
                                  int32_t r);

/// 2 pixels a, b and the next one c to 3: a, (11a + 21b) / 32, (21b + 11c) / 32; the last pixel of
/// the row repeats b. Reads exactly `srcWidth` pixels: a multiple of 4, for `HLerp32_23` of 2.
VIDSHOW_API int32_t HLerp_23(const uint32_t* line, uint16_t* out, int32_t srcWidth);
/// @copydoc HLerp_23
VIDSHOW_API int32_t HLerp32_23(const uint32_t* line, uint32_t* out, int32_t srcWidth, uint32_t a);
/// 2 pixels to 5: a, (5a + 3b) / 8, (7a + 25b) / 32, (13b + 3c) / 16, (19b + 13c) / 32; the last
/// two pixels of the row repeat b. Widths as for `HLerp_23`.
VIDSHOW_API int32_t HLerp_25(const uint32_t* line, uint16_t* out, int32_t srcWidth);
/// @copydoc HLerp_25
VIDSHOW_API int32_t HLerp32_25(const uint32_t* line, uint32_t* out, int32_t srcWidth, uint32_t a);
/// @}

/// @name Rotation
/// @{

/// Fills the walker of a processor (`pWalker`) for one destination, by the processor's output
/// format (the low byte of `u32CscType`) and its rotation type.
///
/// RGB565, RGB5551, YUY2, UYVY and NV12 (2 bytes a pixel), RGB888 (3) and ARGB32 (4) get the packed
/// layout for `dst[0]`; 4:2:0 gets the planar one, its chroma planes `outWidth` / 2 by
/// `outHeight` / 2, rounded down. A half turn of a packed picture starts flush with the end of the
/// last padded row, `dstStride[0]` x `outHeight` bytes behind `dst[0]`; that of a plane starts at
/// the last visible sample.
/// @param p                  a processor's record
/// @param outWidth,outHeight size before a quarter turn exchanges the two, pixels
/// @param dst,dstStride      addresses, and strides in bytes, of the planes that the format has
/// @return 0; -1 without processor or walker; -3 for another output format or a rotation above 5
VIDSHOW_API int32_t _QZ_RotationInit(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const dst[3],
                                     int32_t outWidth, int32_t outHeight,
                                     const int32_t dstStride[3]);
/// @}

/// @name Turns of one plane in square tiles: 8 x 8 pixels of 8 or 16 bits, 4 x 4 of 32 bits
///
/// Strides are in bytes for every pixel size; `w` and `h` are the source size in pixels. Source
/// pixel (x, y) goes to column `h` - 1 - y, row x (`90C`, clockwise); column y, row `w` - 1 - x
/// (`90AC`, anticlockwise); column `w` - 1 - x, row `h` - 1 - y (`180`).
///
/// Sizes are rounded up to whole tiles, W x H: W columns of H source rows are read, and the same
/// formulas, with the true `w` and `h`, place the overhang outside the destination. `90C` fills
/// columns `h` - H to `h` - 1 of rows 0 to W - 1, so it reaches left of the destination and below;
/// `90AC` columns 0 to H - 1 of rows `w` - W to `w` - 1, right and above; `180` columns `w` - W to
/// `w` - 1 of rows `h` - H to `h` - 1, left and above. A caller whose sizes are no multiples of the
/// tile has room there. Tiles run left to right, bands top to bottom; a later tile overwrites.
/// Source and destination do not overlap; no alignment is asked for. Without pixels nothing is
/// touched. @return 0
/// @{

/// Bytes, clockwise.
VIDSHOW_API int32_t QZ_ImageRotate_90C_u8(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                          int32_t dstStride, int32_t w, int32_t h);
/// Bytes, anticlockwise.
VIDSHOW_API int32_t QZ_ImageRotate_90AC_u8(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                           int32_t dstStride, int32_t w, int32_t h);
/// Bytes, half a turn.
VIDSHOW_API int32_t QZ_ImageRotate_180_u8(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                          int32_t dstStride, int32_t w, int32_t h);
/// 16-bit pixels, clockwise.
VIDSHOW_API int32_t QZ_ImageRotate_90C_u16(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                           int32_t dstStride, int32_t w, int32_t h);
/// 16-bit pixels, anticlockwise.
VIDSHOW_API int32_t QZ_ImageRotate_90AC_u16(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                            int32_t dstStride, int32_t w, int32_t h);
/// 32-bit pixels, clockwise.
VIDSHOW_API int32_t QZ_ImageRotate_90C_u32(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                           int32_t dstStride, int32_t w, int32_t h);
/// 32-bit pixels, anticlockwise.
VIDSHOW_API int32_t QZ_ImageRotate_90AC_u32(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                            int32_t dstStride, int32_t w, int32_t h);
/// @}

/// @name Deinterlacing
///
/// A picture woven of two fields, top (even lines, from 0) and bottom (odd lines), becomes one
/// whose lines go together. Planes are worked on one by one: luma `w` x `h`; chroma half as wide
/// for `chroma` 0 (4:2:0) and 1 (4:2:2), half as tall for 0; for 2 (4:4:4) as luma; halves are
/// rounded down. The planes come from the picture records, the sizes from the arguments. Planes
/// with a null address on either side are skipped. Source and destination may be the same planes.
/// @{

/// Deinterlaces a frame of a processor: input size and format and the current mode are the
/// processor's, the top field is kept. Nothing outside the destination planes (their lines are `ds`
/// bytes long) is written, and nothing past a source plane's last stride read. Every sample of the
/// destination is made: `fast` reaches the last column, and the modes that know no 4:4:4 pass such
/// a picture through. Where `fast` refuses a size, the destination stays as it was.
/// @return 0; -1 when the input format is none of the three with planes of their own
VIDSHOW_API int32_t QZ_DeInterlace(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                   const uint32_t ss[3], uint8_t* const dsts[3],
                                   const uint32_t ds[3]);

/// Runs one mode: 0 none (nothing is copied), 1 fast, 2 discard, 3 bob, 4 blend, 5 mean, 6 linear,
/// 7 x, any other number fast. What the mode returns is not passed on.
/// @param dst,src pictures, which may share their planes
/// @param w,h     size of the luma plane, pixels
/// @param field   the field that discard, bob and linear keep: 0 top, 1 bottom
/// @param chroma  0 is 4:2:0, 1 is 4:2:2, 2 is 4:4:4
/// @param mode    0 to 7
/// @return 0; -1 for a null picture
VIDSHOW_API int32_t DeInterlace(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t w, int32_t h,
                                int32_t field, int32_t chroma, int32_t mode);
/// @}

/// @name Deinterlacing modes
///
/// As under deinterlacing. Discard, bob, blend, mean and linear copy and average whole lines of one
/// source pitch, not of the width: a destination whose pitch is smaller has room for the rest
/// behind its last line. Where all six addresses and pitches are multiples of 8, averages are made
/// by `MergeNeon`, which reads and writes up to 15 bytes more than two source pitches: there is
/// room for one more line behind both pictures. Otherwise `MergeGeneric` makes them. Except for
/// linear, these modes leave planes of a 4:4:4 picture as they are. An odd height has no line
/// written behind its last one.
/// @return 0
/// @{

/// Every line of one field twice.
VIDSHOW_API int32_t picture_deinterlace_discard(QZ_PICTURE* dst, const QZ_PICTURE* src,
                                                int32_t chroma, int32_t w, int32_t h,
                                                int32_t field);
/// The same, but the last line of the other field stays, and with the bottom field kept, line 0. An
/// odd height with the bottom field kept leaves the last line unwritten.
VIDSHOW_API int32_t picture_deinterlace_bob(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t chroma,
                                            int32_t w, int32_t h, int32_t field);
/// Every line averaged with the one above.
VIDSHOW_API int32_t picture_deinterlace_blend(QZ_PICTURE* dst, const QZ_PICTURE* src,
                                              int32_t chroma, int32_t w, int32_t h);
/// Each pair of lines averaged, and that line twice. A last line without a partner stays.
VIDSHOW_API int32_t picture_deinterlace_mean(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t chroma,
                                             int32_t w, int32_t h);
/// One field, and between its lines their averages; edges as `picture_deinterlace_bob` has them.
VIDSHOW_API int32_t picture_deinterlace_linear(QZ_PICTURE* dst, const QZ_PICTURE* src,
                                               int32_t chroma, int32_t w, int32_t h, int32_t field);
/// Top lines are copied, one source pitch each; bottom lines are made by `deinterlace_line` from
/// the two lines above, the line itself and the two lines below, the edges repeated. Columns go in
/// whole groups of 8, at least one: the last columns of other widths keep what they held. In place,
/// `deinterlace_line_inplace` filters through a line buffer from the heap.
/// @return 0; -1 without doing anything when `w` or `h` is no multiple of 4 or `chroma` is not 0 to
///         2, and without memory for the line buffer
VIDSHOW_API int32_t picture_deinterlace_fast(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t chroma,
                                             int32_t w, int32_t h);
/// Top lines are kept. Blocks of 8 x 8 whose fields belong together are kept whole; where they do
/// not, bottom lines are made anew; in between, averaged. Exactly the planes' samples are read and
/// written, whatever the pitches.
VIDSHOW_API int32_t picture_deinterlace_x(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t chroma,
                                          int32_t w, int32_t h);
/// @}

/// @name Lines of the deinterlacing modes
///
/// Averages are truncated. Lines may be the same; where they overlap otherwise, a step has read its
/// bytes before it writes, and steps go upwards. All return 0.
/// @{

/// dst[i] = (a[i] + b[i]) >> 1, exactly `count` bytes: eight a step, then one.
VIDSHOW_API int32_t MergeGeneric(uint8_t* dst, const uint8_t* a, const uint8_t* b, int32_t count);
/// The same sixteen bytes a step, a step for every eight of `count` or part of them: about twice
/// `count` bytes are read and written. The same on every processor.
VIDSHOW_API int32_t MergeNeon(uint8_t* dst, const uint8_t* a, const uint8_t* b, int32_t count);

/// dst[i] = (4 (b[i] + d[i]) + 2 c[i] - (a[i] + e[i]) + 4) >> 3, clamped to 0..255, for `size`
/// bytes rounded down to a multiple of 8, but at least 8. `dst` may be one of the lines.
VIDSHOW_API int32_t deinterlace_line(uint8_t* dst, const uint8_t* a, const uint8_t* b,
                                     const uint8_t* c, const uint8_t* d, const uint8_t* e,
                                     int32_t size);
/// The same with `buf` as a, written over `c`; `buf` receives what `c` held. `d` and `e` may be
/// `c`.
VIDSHOW_API int32_t deinterlace_line_inplace(uint8_t* buf, const uint8_t* b, uint8_t* c,
                                             const uint8_t* d, const uint8_t* e, int32_t size);
/// @}

/// @name Blocks of the x mode
///
/// Blocks begin at a top line; pitches in bytes.
/// @{

/// How much a block looks like two fields that do not belong together: the differences of
/// neighbouring lines less 19/16 of those of lines two apart, 0 to 16320. Reads two lines below the
/// block.
VIDSHOW_API int32_t XDeint8x8Detect(const uint8_t* src, int32_t pitch);
/// The highest of the blocks in `w` x `h` samples, both multiples of 8.
VIDSHOW_API int32_t XDeintNxNDetect(const uint8_t* src, int32_t pitch, int32_t w, int32_t h);

/// Copies `w` x `h` samples. @return 0
VIDSHOW_API int32_t XDeintNxNFrame(uint8_t* dst, int32_t dstPitch, const uint8_t* src,
                                   int32_t srcPitch, int32_t w, int32_t h);
/// Copies top lines and makes bottom lines: as `deinterlace_line` does, f; but where the sample c
/// itself lies between those above and below, (5 f + 3 c + 4) >> 3. The line above and two lines
/// below are read. Not in place. @return 0
VIDSHOW_API int32_t XDeintNxNField(uint8_t* dst, int32_t dstPitch, const uint8_t* src,
                                   int32_t srcPitch, int32_t w, int32_t h);
/// @copydoc XDeintNxNField
VIDSHOW_API int32_t XDeint8x8Field(uint8_t* dst, int32_t dstPitch, const uint8_t* src,
                                   int32_t srcPitch);
/// The same at an edge of the picture: only `above` and `below` lines around the block are there to
/// be read; what else the filter asks for is mirrored.
VIDSHOW_API int32_t XDeint8x8FieldE(uint8_t* dst, int32_t dstPitch, const uint8_t* src,
                                    int32_t srcPitch, int32_t above, int32_t below);
/// As `XDeint8x8Field`, with every bottom sample averaged with the one that it replaces. @return 0
VIDSHOW_API int32_t XDeint8x8Merge(uint8_t* dst, int32_t dstPitch, const uint8_t* src,
                                   int32_t srcPitch);
/// @}

/// @name Further formats
///
/// Each returns 0, or -1 when a plane that it needs, or the tables or the walker that it needs, are
/// missing (null); then nothing is written. Sizes below 1 leave nothing to do.
/// @{

/// Interleaves 4:2:0 planes to packed 4:2:2: bytes Y0, Cb, Y1, Cr a pair of pixels. Two rows share
/// a chroma row as it is. The chroma strides are rounded down to a multiple of 4. A row of odd
/// width ends with a whole pair that repeats the last luma sample: `dst` holds the width rounded up
/// to 2. An odd last row is written alone.
VIDSHOW_API int32_t _QZYCbCr420ToYUY2(void* dst, uint32_t d, uint8_t* const src[3],
                                      const uint32_t ss[3], int32_t w, int32_t h);

/// The same, bytes Cb, Y0, Cr, Y1.
VIDSHOW_API int32_t _QZYCbCr420ToUYVY(void* dst, uint32_t d, uint8_t* const src[3],
                                      const uint32_t ss[3], int32_t w, int32_t h);

/// Copies luma and interleaves chroma to pairs Cb, Cr in `dsts[1]`. Chroma is `w` / 2 pairs by
/// `h` / 2 rows, rounded down: a picture of one row has none. The third destination is not looked
/// at.
VIDSHOW_API int32_t _QZYCbCr420ToNV12(uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                      int32_t h, uint8_t* const dsts[3], const uint32_t ds[3]);

/// The reverse; the third source is not looked at.
VIDSHOW_API int32_t _QZNV12ToYCbCr420(uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                      int32_t h, uint8_t* const dsts[3], const uint32_t ds[3]);

/// Copies three planes row by row; the chroma planes are half as wide and half as tall, odd sizes
/// rounded up.
VIDSHOW_API int32_t _QZYCbCr420Copy(uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                    int32_t h, uint8_t* const dsts[3], const uint32_t ds[3]);

/// The same through the processor's adjustment tables: `pAdjustLumaTable` for Y,
/// `pAdjustChromaTable` for Cb and Cr.
VIDSHOW_API int32_t _QZYCbCrAdjust(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                   const uint32_t ss[3], int32_t w, int32_t h,
                                   uint8_t* const dsts[3], const uint32_t ds[3]);

/// 4:2:2 planes to RGB565 by the arithmetic of the 4:2:0 kernels, every row with a chroma row of
/// its own. Exactly `w` columns are written, also of an odd width.
VIDSHOW_API int32_t _QZYCbCr422ToRGB565(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                        const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                        uint32_t d);

/// The same at another size, as `_QZYCbCr420ToRGB565Rsz` resizes: luma bilinear and truncated,
/// chroma nearest, one chroma column for a pair of output pixels, the chroma row of the upper luma
/// row. Sizes are 1 to 16384.
VIDSHOW_API int32_t _QZYCbCr422ToRGB565Rsz(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                           const uint32_t ss[3], int32_t w, int32_t h, void* dst,
                                           uint32_t d, int32_t dw, int32_t dh);

/// Expands RGB565 to ARGB32: each field at the top of its byte, the low bits 0. `srcPixels` and
/// `dstPixels` are strides in pixels: 16-bit and 32-bit units.
VIDSHOW_API int32_t _QZRGB565ToARGB32(const void* src, int32_t srcPixels, void* dst,
                                      int32_t dstPixels, int32_t w, int32_t h, uint32_t a);
/// @}

/// @name 4:2:0 to 4:2:0 at another size, turned, adjusted
///
/// Answers as under further formats. Resampling is bilinear with 16.16 positions, corners aligned
/// (step (n - 1) / (m - 1)), and 5-bit weights: down first, rounded to 1/8 of a level, then across,
/// rounded to nearest. Chroma keeps its place in the middle between two luma samples: output chroma
/// sample c comes from chroma position c s + (s - 1) / 4, s being luma's step; past the edge the
/// edge is repeated. Equal sizes reproduce the picture. Sizes are 1 to 16384, which is for the
/// caller to keep; a single output column or row is the first one. Chroma planes are half as wide
/// and tall, odd sizes rounded up; those behind a walker are rounded down. `Adjust` passes every
/// output sample through the processor's adjustment tables. `Rot` writes through a planar walker;
/// `dw`, `dh` are the sizes before the turn.
/// @{

/// Resized.
VIDSHOW_API int32_t _QZYCbCr420Rsz(uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                   int32_t h, uint8_t* const dsts[3], const uint32_t ds[3],
                                   int32_t dw, int32_t dh);
/// Turned.
VIDSHOW_API int32_t _QZYCbCr420Rot(const QZ_ROTATION_WALKER* walker, uint8_t* const src[3],
                                   const uint32_t ss[3], int32_t w, int32_t h);
/// Resized and turned.
VIDSHOW_API int32_t _QZYCbCr420RszRot(const QZ_ROTATION_WALKER* walker, uint8_t* const src[3],
                                      const uint32_t ss[3], int32_t w, int32_t h, int32_t dw,
                                      int32_t dh);
/// Resized and adjusted.
VIDSHOW_API int32_t _QZYCbCr420RszAdjust(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                         const uint32_t ss[3], int32_t w, int32_t h,
                                         uint8_t* const dsts[3], const uint32_t ds[3], int32_t dw,
                                         int32_t dh);
/// Turned and adjusted.
VIDSHOW_API int32_t _QZYCbCr420RotAdjust(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                         const uint32_t ss[3], int32_t w, int32_t h);
/// Resized, turned and adjusted.
VIDSHOW_API int32_t _QZYCbCr420RszRotAdjust(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                            const uint32_t ss[3], int32_t w, int32_t h, int32_t dw,
                                            int32_t dh);
/// @}

/// @name 4:4:4 planes to RGB at any size, through the processor's packed walker
///
/// Answers as under further formats. All three planes are resampled as 4:2:0's luma is above, so
/// every output pixel has its own chroma pair; then the arithmetic of the 4:2:0 kernels. Line
/// buffers are not needed. `dw`, `dh` are the sizes before the turn.
/// @{

/// To RGB565.
VIDSHOW_API int32_t _QZYCbCr444ToRGB565RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                              const uint32_t ss[3], int32_t w, int32_t h,
                                              int32_t dw, int32_t dh);
/// To RGB888.
VIDSHOW_API int32_t _QZYCbCr444ToRGB888RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                              const uint32_t ss[3], int32_t w, int32_t h,
                                              int32_t dw, int32_t dh);
/// To ARGB32.
VIDSHOW_API int32_t _QZYCbCr444ToARGB32RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                              const uint32_t ss[3], int32_t w, int32_t h,
                                              int32_t dw, int32_t dh, uint32_t a);
/// @}

/// @name RGB pictures at any size, through a packed walker
///
/// Answers as under further formats. Bilinear as 4:2:0's luma above, in each channel at the
/// source's depth, rounded to nearest; equal sizes reproduce the picture. RGB888 becomes RGB565 by
/// dropping the low bits of the result. `dw`, `dh` are the sizes before the turn.
/// @{

/// RGB565 to RGB565; `srcPixels` is a stride in pixels.
VIDSHOW_API int32_t _QZRGB565RszRot(const QZ_ROTATION_WALKER* walker, const void* src,
                                    int32_t srcPixels, int32_t w, int32_t h, int32_t dw,
                                    int32_t dh);
/// RGB888 to RGB565; `srcStride` is in bytes.
VIDSHOW_API int32_t _QZRGB888ToRGB565RszRot(const QZ_ROTATION_WALKER* walker, const void* src,
                                            int32_t srcStride, int32_t w, int32_t h, int32_t dw,
                                            int32_t dh);
/// RGB888 to RGB888; `srcStride` is in bytes.
VIDSHOW_API int32_t _QZRGB888RszRot(const QZ_ROTATION_WALKER* walker, const void* src,
                                    int32_t srcStride, int32_t w, int32_t h, int32_t dw,
                                    int32_t dh);
/// @}

/// Declares a kernel for each of the four matrices; gone at the end of this file.
#define VIDSHOW_FOUR(head, tail, parameters)      \
    /** With the coefficients of BT.601. */       \
    VIDSHOW_API int32_t head##0##tail parameters; \
    /** With the coefficients of BT.709. */       \
    VIDSHOW_API int32_t head##1##tail parameters; \
    /** With the coefficients of SMPTE 240M. */   \
    VIDSHOW_API int32_t head##2##tail parameters; \
    /** With the coefficients of FCC. */          \
    VIDSHOW_API int32_t head##3##tail parameters
/// Declares four kernels from planes to pixels.
#define VIDSHOW_TO_PIXELS(head)                                                                  \
    VIDSHOW_FOUR(head, ,                                                                         \
                 (uint8_t* const src[3], const uint32_t ss[3], void* dst, uint32_t d, int32_t w, \
                  int32_t h))
/// Declares four kernels from planes to pixels with alpha.
#define VIDSHOW_TO_PIXELS_ALPHA(head)                                                            \
    VIDSHOW_FOUR(head, ,                                                                         \
                 (uint8_t* const src[3], const uint32_t ss[3], void* dst, uint32_t d, int32_t w, \
                  int32_t h, uint32_t a))
/// Declares four kernels from planes to pixels with a key.
#define VIDSHOW_TO_PIXELS_KEY(head)                                                              \
    VIDSHOW_FOUR(head, ,                                                                         \
                 (uint8_t* const src[3], const uint32_t ss[3], void* dst, uint32_t d, int32_t w, \
                  int32_t h, uint32_t k))
/// Declares four kernels from pixels to planes.
#define VIDSHOW_TO_PLANES(head)                                               \
    VIDSHOW_FOUR(head, ,                                                      \
                 (const void* src, uint32_t srcStride, uint8_t* const dst[3], \
                  const uint32_t dstStride[3], int32_t w, int32_t h))
/// Declares four operations from planes to lines of spread pixels.
#define VIDSHOW_TO_LINES(head)                                                   \
    VIDSHOW_FOUR(head, _neon,                                                    \
                 (const uint8_t* luma0, const uint8_t* luma1, const uint8_t* cb, \
                  const uint8_t* cr, uint32_t* line0, uint32_t* line1, int32_t w))

/// @name Vector kernels to 16-bit pixels
/// The whole-frame conversions without scaling, with their own arithmetic: coefficients built in
/// per colour matrix, untouched by colour adjustment. The last number of a name is the matrix
/// (`QZ_IMAGEPROC_MATRIX`): 0 BT.601, 1 BT.709, 2 SMPTE 240M, 3 FCC. `YCbCr420` and `NV12` are
/// limited range, `YUV420` and `NV12FR` full range; full range takes chroma without a bias of 128.
///
/// They exist on every processor, whatever their names say, and give the same bytes everywhere. Any
/// width and height will do, odd ones too: chroma planes hold half the size, rounded up, and not a
/// byte outside the pictures is read or written. There is no alignment to keep. Sizes below 1 do
/// nothing. Source and destination must not overlap. All return 0.
///
/// To 16-bit pixels: red (BGR565: blue) in bits 15-11, green in 10-5, blue (red) in 4-0.
/// NV12: plane 1 holds pairs Cb, Cr; the third plane and stride are not looked at.
/// @{

VIDSHOW_TO_PIXELS(_YCbCr420ToRGB565_P3C2_);
VIDSHOW_TO_PIXELS(_YUV420ToRGB565_P3C2_);
VIDSHOW_TO_PIXELS(_YCbCr420ToBGR565_P3C2_);
VIDSHOW_TO_PIXELS(_YUV420ToBGR565_P3C2_);
VIDSHOW_TO_PIXELS(_NV12ToRGB565_P3C2_);
VIDSHOW_TO_PIXELS(_NV12FRToRGB565_P3C2_);
VIDSHOW_TO_PIXELS(_NV12ToBGR565_P3C2_);
VIDSHOW_TO_PIXELS(_NV12FRToBGR565_P3C2_);
/// @}

/// @name Vector kernels to three bytes a pixel
/// As those above. RGB888 is blue, green, red; BGR888 red, green, blue.
/// @{

VIDSHOW_TO_PIXELS(_YCbCr420ToRGB888_P3C3_);
VIDSHOW_TO_PIXELS(_YUV420ToRGB888_P3C3_);
VIDSHOW_TO_PIXELS(_YCbCr420ToBGR888_P3C3_);
VIDSHOW_TO_PIXELS(_YUV420ToBGR888_P3C3_);
/// @}

/// @name Vector kernels to four bytes a pixel
/// As those above. ARGB32 is blue, green, red, alpha; ABGR32 red, green, blue, alpha. Of the alpha
/// `a` only the low byte counts.
/// @{

VIDSHOW_TO_PIXELS_ALPHA(_YCbCr420ToARGB32_P3C4_);
VIDSHOW_TO_PIXELS_ALPHA(_YUV420ToARGB32_P3C4_);
VIDSHOW_TO_PIXELS_ALPHA(_YCbCr420ToABGR32_P3C4_);
VIDSHOW_TO_PIXELS_ALPHA(_YUV420ToABGR32_P3C4_);
/// @}

/// @name Vector kernels to 16-bit pixels with a colour key
/// As those above. Red (BGR5551: blue) in bits 15-11, green in 10-6, blue (red) in 5-1, bit 0 set.
/// `k` is a colour key in the same form, bit 0 included; only its low half counts. It is compared
/// with the finished pixel, and a match is written as 0. An even key never matches.
/// @{

VIDSHOW_TO_PIXELS_KEY(_YCbCr420ToRGB5551_P3C2_);
VIDSHOW_TO_PIXELS_KEY(_YUV420ToRGB5551_P3C2_);
VIDSHOW_TO_PIXELS_KEY(_YCbCr420ToBGR5551_P3C2_);
VIDSHOW_TO_PIXELS_KEY(_YUV420ToBGR5551_P3C2_);
/// @}

/// @name Vector kernels from packed RGB to planes
/// As those above. Planes are Y, Cb, Cr; chroma is sampled from the even pixels of the even rows,
/// not averaged. 16-bit channels are taken unmasked, eight bits from the top of each field on.
/// Source bytes of ARGB32 and ABGR32 as above; alpha is not looked at.
/// @{

VIDSHOW_TO_PLANES(_QZRGB565ToYCbCr420_C2P3_);
VIDSHOW_TO_PLANES(_QZRGB565ToYUV420_C2P3_);
VIDSHOW_TO_PLANES(_QZARGB32ToYCbCr420_C4P3_);
VIDSHOW_TO_PLANES(_QZARGB32ToYUV420_C4P3_);
VIDSHOW_TO_PLANES(_QZABGR32ToYCbCr420_C4P3_);
VIDSHOW_TO_PLANES(_QZABGR32ToYUV420_C4P3_);
/// @}

/// @name Vector operations on lines
/// As those above. Two luma rows of `w` pixels that share (w + 1) / 2 chroma samples become two
/// lines of `w` spread pixels: red (bgr: blue) in bits 26-21, green in 15-10, blue (red) in 4-0,
/// the top bits of the same channels that the conversions above pack.
/// @{

VIDSHOW_TO_LINES(_convert_ycbcr2rgb_);
VIDSHOW_TO_LINES(_convert_yuv2rgb_);
VIDSHOW_TO_LINES(_convert_ycbcr2bgr_);
VIDSHOW_TO_LINES(_convert_yuv2bgr_);

/// out[i] = (lower[i] w + upper[i] (32 - w)) >> 5, masked with 0x07E0FC1F; `w` 0..32.
/// Works in fours: `count` is rounded down to a multiple of 4, but four entries are always made.
/// `out` may be one of the sources.
VIDSHOW_API int32_t _vlerp_neon(const uint32_t* upper, const uint32_t* lower, uint32_t* out,
                                int32_t w, int32_t count);

/// out[i] = (upper[i] + lower[i]) >> 1, masked with 0x07E0FC1F; `count` as for `_vlerp_neon`.
VIDSHOW_API int32_t _vlerp12_neon(const uint32_t* upper, const uint32_t* lower, uint32_t* out,
                                  int32_t count);

/// Bilinear resampling of a line of spread pixels to an RGB565 row: pixel i stands at `i * step`.
/// @param line  spread pixels
/// @param out   receives `width` pixels
/// @param step  distance of two pixels in the line, 16.16 fixed point; its top five fraction bits
///              weigh
/// @param width pixels to make; an odd one is rounded down. The entry right of the last position is
///              read, even where its weight is 0.
/// @return 0
VIDSHOW_API int32_t _hlerp_neon(const uint32_t* line, uint16_t* out, int32_t step, int32_t width);
/// @}

#undef VIDSHOW_TO_PIXELS
#undef VIDSHOW_TO_PIXELS_ALPHA
#undef VIDSHOW_TO_PIXELS_KEY
#undef VIDSHOW_TO_PLANES
#undef VIDSHOW_TO_LINES
#undef VIDSHOW_FOUR

}  // extern "C"

#endif
