#ifndef VIDSHOW_IMAGEPROC_H
#define VIDSHOW_IMAGEPROC_H

/// @file
/// The image processor: one handle per fixed conversion, one call per frame.
///
/// Create a processor for a pair of formats and sizes, then call `QZ_IMAGEPROC_ProcessFrame` for
/// every frame. Another format, size, rotation or matrix needs another processor. All memory of a
/// processor is taken at creation, but for the adjustment tables, which wait for the first
/// adjustment; a frame takes memory only where RGB becomes 4:2:0.
///
/// Thread rule: a processor is used by one thread at a time; processors share only constants.
/// Diagnostics go to standard output, a line each.

#include "vidshow/types.h"

/// Image formats, input and output alike. Byte orders are in memory, lowest address first.
enum QZ_IMAGEPROC_FMT : uint32_t {
    QZ_IMAGEPROC_FMT_YCBCR420 = 0,  ///< planes Y, Cb, Cr; chroma half width, half height
    QZ_IMAGEPROC_FMT_YCBCR422 = 1,  ///< planes Y, Cb, Cr; chroma half width, full height
    QZ_IMAGEPROC_FMT_YCBCR444 = 2,  ///< planes Y, Cb, Cr; chroma full size
    QZ_IMAGEPROC_FMT_RGB565 = 3,    ///< 16-bit words, red in the top bits
    QZ_IMAGEPROC_FMT_RGB888 = 4,    ///< bytes B, G, R
    QZ_IMAGEPROC_FMT_ARGB32 = 5,    ///< bytes B, G, R, A
    QZ_IMAGEPROC_FMT_YUY2 = 6,      ///< bytes Y0, Cb, Y1, Cr; as input without a conversion
    QZ_IMAGEPROC_FMT_UYVY = 7,      ///< bytes Cb, Y0, Cr, Y1; as input without a conversion
    QZ_IMAGEPROC_FMT_NV12 = 8,      ///< plane Y, plane of pairs Cb, Cr
    QZ_IMAGEPROC_FMT_ABGR32 = 9,    ///< bytes R, G, B, A
    QZ_IMAGEPROC_FMT_RGB5551 = 10,  ///< 16-bit words, red in the top bits; 0 where the colour key
                                    ///< matched, else bit 0 is set; output only
};

/// Conversion code: input format << 8 | output format. Only these exist; creation refuses others.
/// Not turned or resized, whatever the processor was made for: RGB888, YUY2, UYVY and NV12 from
/// 4:2:0, ARGB32 from RGB565, both from NV12. Not turned: RGB565 from 4:2:2. Not resized: 4:2:0
/// from RGB, whose turns (no mirrors; RGB565 by quarters only) cut the picture to multiples of 8.
enum QZ_IMAGEPROC_CSC : uint32_t {
    QZ_IMAGEPROC_CSC_YCBCR420_TO_YCBCR420 = 0,
    QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB565 = 3,
    QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB888 = 4,
    QZ_IMAGEPROC_CSC_YCBCR420_TO_ARGB32 = 5,
    QZ_IMAGEPROC_CSC_YCBCR420_TO_YUY2 = 6,
    QZ_IMAGEPROC_CSC_YCBCR420_TO_UYVY = 7,
    QZ_IMAGEPROC_CSC_YCBCR420_TO_NV12 = 8,
    QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551 = 10,
    QZ_IMAGEPROC_CSC_YCBCR422_TO_RGB565 = 259,
    QZ_IMAGEPROC_CSC_YCBCR444_TO_RGB565 = 515,
    QZ_IMAGEPROC_CSC_YCBCR444_TO_RGB888 = 516,
    QZ_IMAGEPROC_CSC_YCBCR444_TO_ARGB32 = 517,
    QZ_IMAGEPROC_CSC_RGB565_TO_YCBCR420 = 768,
    QZ_IMAGEPROC_CSC_RGB565_TO_RGB565 = 771,
    QZ_IMAGEPROC_CSC_RGB565_TO_ARGB32 = 773,
    QZ_IMAGEPROC_CSC_RGB888_TO_RGB565 = 1027,
    QZ_IMAGEPROC_CSC_RGB888_TO_RGB888 = 1028,
    QZ_IMAGEPROC_CSC_ARGB32_TO_YCBCR420 = 1280,
    QZ_IMAGEPROC_CSC_NV12_TO_YCBCR420 = 2048,
    QZ_IMAGEPROC_CSC_NV12_TO_RGB565 = 2051,
    QZ_IMAGEPROC_CSC_ABGR32_TO_YCBCR420 = 2304,
};

/// Turns and mirrors of the output. A quarter turn makes it as wide as the output height given at
/// creation, and as tall as the output width. Half a turn of a packed output stands flush with the
/// ends of the padded rows, not with their beginnings.
enum QZ_IMAGEPROC_ROTATE : uint32_t {
    QZ_IMAGEPROC_ROTATE_NONE = 0,
    QZ_IMAGEPROC_ROTATE_90AC = 1,      ///< 90 degrees anticlockwise
    QZ_IMAGEPROC_ROTATE_90C = 2,       ///< 90 degrees clockwise
    QZ_IMAGEPROC_ROTATE_180 = 3,       ///< half a turn
    QZ_IMAGEPROC_ROTATE_MIRROR_H = 4,  ///< left and right exchanged
    QZ_IMAGEPROC_ROTATE_MIRROR_V = 5,  ///< top and bottom exchanged
};

/// Resize algorithms. Fixed ratios have kernels of their own with `LINEAR`; otherwise the
/// algorithms differ where upright 4:2:0 is enlarged to RGB565. Any other value is `LINEAR` without
/// those.
enum QZ_IMAGEPROC_RESIZE : uint32_t {
    QZ_IMAGEPROC_RESIZE_NEAREST = 0,
    QZ_IMAGEPROC_RESIZE_LINEAR = 1,
    QZ_IMAGEPROC_RESIZE_NEARLINEAR = 3,  ///< nearest pick from a line doubled linearly
};

/// Colour matrices.
enum QZ_IMAGEPROC_MATRIX : uint32_t {
    QZ_IMAGEPROC_MATRIX_BT601 = 0,
    QZ_IMAGEPROC_MATRIX_BT709 = 1,
    QZ_IMAGEPROC_MATRIX_SMPTE240M = 2,
    QZ_IMAGEPROC_MATRIX_FCC = 3,
};

/// Properties of `QZ_IMAGEPROC_Set` and `QZ_IMAGEPROC_Get`.
enum QZ_IMAGEPROC_PROPID : uint32_t {
    /// Three u32: brightness, contrast, saturation, each 0..255, 128 neutral. Set takes up to 12
    /// bytes, what is missing counts as 0; Get wants room for 12.
    QZ_IMAGEPROC_PROPID_COLORADJUST = 1,
    /// One u32: the colour key, 0x00YYUUVV for RGB5551 output (it reads back translated).
    QZ_IMAGEPROC_PROPID_COLORKEY = 2,
};

/// `QZ_IMAGEPROC_Set` and `QZ_IMAGEPROC_Get` return this for an unknown property id.
constexpr HRESULT QZ_IMAGEPROC_E_PROPID = static_cast<HRESULT>(0x80070490u);

/// What a processor does. If one of the sizes is not a multiple of 4, all four are rounded down to
/// one, and a line on standard output says so. Sizes count as signed numbers.
struct QZ_IMAGEPROC_INIT_PARAMS {
    uint32_t u32Size;             ///< valid bytes of this record, at most 48; the rest counts as 0
    uint32_t u32CscType;          ///< `QZ_IMAGEPROC_CSC`
    uint32_t u32RotationType;     ///< `QZ_IMAGEPROC_ROTATE`
    uint32_t u32ResizeAlgorithm;  ///< `QZ_IMAGEPROC_RESIZE`
    uint32_t u32InWidth;          ///< pixels
    uint32_t u32InHeight;         ///< pixels
    uint32_t u32OutWidth;         ///< pixels, before a quarter turn exchanges the two
    uint32_t u32OutHeight;        ///< pixels, before a quarter turn exchanges the two
    uint32_t u32Alpha;            ///< alpha byte of ARGB32 output, 0..255
    uint32_t u32ColorKey;         ///< 0x00YYUUVV, for RGB5551 output; `CalcColorKey` translates it
    uint32_t u32ColorMatrix;      ///< `QZ_IMAGEPROC_MATRIX`
    uint32_t u32YuvRange;         ///< 0 limited (16..235), 1 full
};
static_assert(sizeof(QZ_IMAGEPROC_INIT_PARAMS) == 48, "twelve words");

/// What one frame asks for.
struct QZ_IMAGEPROC_FRAME_PARAMS {
    uint32_t u32Size;             ///< valid bytes of this record, at most 12
    uint32_t u32Reserved;         ///< ignored
    uint32_t u32DeinterlaceMode;  ///< 0 keeps the current mode; 1..7 choose one, above 7 is fast
};
static_assert(sizeof(QZ_IMAGEPROC_FRAME_PARAMS) == 12, "three words");

/// The processor record; a handle is its address. Every kernel that uses tables receives it.
struct QZ_IMAGEPROC_PARAMSET {
    uint32_t u32CscType;          ///< as given
    uint32_t u32RotationType;     ///< as given
    uint32_t u32ResizeAlgorithm;  ///< as given
    /// 0 equal, 1 mixed, 2 both larger, 3 both smaller; for upright `LINEAR`: 4 twice in both,
    /// 5 2.5 times wide and twice high, 6 1.5 times wide whatever the heights, 7 320 x 240 to 480 x
    /// 272
    uint32_t u32ResizeCase;

    uint32_t u32ColorMatrix;  ///< 0..3
    uint32_t u32FullRange;    ///< 0 or 1
    const double* pYuvToRgb;  ///< twelve doubles of `csc_coef`
    const double* pRgbToYuv;  ///< twelve doubles of `csc_coef`

    int32_t i32Brightness;        ///< as last set, 128 at first
    int32_t i32Contrast;          ///< as last set, 128 at first
    int32_t i32Saturation;        ///< as last set, 128 at first
    uint32_t u32AdjustActive;     ///< 0 or 1: whether adjustment is switched on
    uint8_t* pAdjustBlock;        ///< owned, 512 bytes, null until adjustment is first used
    uint8_t* pAdjustLumaTable;    ///< 256 bytes in pAdjustBlock
    uint8_t* pAdjustChromaTable;  ///< 256 bytes in pAdjustBlock

    uint8_t* pTransBlock;  ///< owned, 2,564 bytes: the tables lie at 0, 512 and 1,536
    uint16_t* pTransLuma;  ///< 256 levels in 1/128
    uint32_t* pTransCb;    ///< 256 pairs: blue term (high half), half of green (low half)
    uint32_t* pTransCr;    ///< 256 pairs: red term (high half), half of green (low half)
    void* pReservedBlock;  ///< owned, always null

    uint32_t u32GivenInWidth;    ///< pixels, as given
    uint32_t u32GivenInHeight;   ///< pixels, as given
    uint32_t u32GivenOutWidth;   ///< pixels, as given
    uint32_t u32GivenOutHeight;  ///< pixels, as given
    uint32_t u32InWidth;         ///< pixels, as used: a multiple of 4
    uint32_t u32InHeight;        ///< pixels, as used: a multiple of 4
    uint32_t u32OutWidth;        ///< pixels, as used: a multiple of 4
    uint32_t u32OutHeight;       ///< pixels, as used: a multiple of 4

    uint8_t* pLineBlock;  ///< owned, null for equal sizes
    uint32_t* pLines[4];  ///< in pLineBlock: the wider picture's width and 4 words, or twice that

    uint32_t u32Alpha;            ///< alpha byte of ARGB32 output, as given
    uint32_t u32ColorKey;         ///< translated where the output is RGB5551
    uint32_t u32DeinterlaceMode;  ///< the current one, 0 at first

    uint8_t* pDeinterlaceBlock;      ///< owned
    uint8_t* pDeinterlacePlanes[4];  ///< in pDeinterlaceBlock, 16-byte aligned
    uint32_t u32DeinterlaceStride;   ///< bytes, in width rounded up to 16
    uint32_t u32DeinterlaceHeight;   ///< rows

    uint32_t u32WalkerSize;  ///< bytes of the walker record: 52 where a pointer has 32 bits
    void* pWalker;           ///< owned `QZ_ROTATION_WALKER` (kernels.h)

    void* pfnMain;  ///< vector kernel of the conversion, or null
    void* pfnLine;  ///< two-row line converter, or null
};

extern "C" {

/// Makes a processor.
/// @param phandle  must hold null; receives the handle, to be given to `QZ_IMAGEPROC_Destroy`
/// @param reserved not read
/// @param params   only its first `u32Size` bytes are read. A matrix index above 3 counts as 0, a
///                 range other than 1 as limited.
/// @return 0; `E_INVALIDARG` for null arguments, an occupied slot or `u32Size` above 48;
///         `E_OUTOFMEMORY`; `E_FAIL` for a conversion or rotation that does not exist, for RGB5551
///         output that is turned or resized, or without memory for line buffers and walker. On
///         failure nothing is kept, and the slot holds null.
VIDSHOW_API HRESULT QZ_IMAGEPROC_Create(void** phandle, uint32_t reserved,
                                        const QZ_IMAGEPROC_INIT_PARAMS* params);

/// Sets a property. Any values are taken, for every conversion.
/// @param handle a processor
/// @param propId `QZ_IMAGEPROC_PROPID`
/// @param data   the values, copied; not null
/// @param size   bytes of `data`: at most 12 for the adjustment, at least 4 for the key
/// @return 0; `E_INVALIDARG` for a null handle, null data or a wrong size; `E_OUTOFMEMORY`, and
///         nothing has changed then; `QZ_IMAGEPROC_E_PROPID` for an unknown id
VIDSHOW_API HRESULT QZ_IMAGEPROC_Set(void* handle, uint32_t propId, const void* data,
                                     uint32_t size);

/// Reads a property.
/// @param handle  a processor
/// @param propId  `QZ_IMAGEPROC_PROPID`
/// @param data    receives the values; not null
/// @param size    room at `data`: at least 12 bytes for the adjustment, 4 for the key
/// @param sizeOut receives the bytes written; may be null
/// @return as `QZ_IMAGEPROC_Set`; for the colour adjustment `E_FAIL`, with values and size written
///         all the same, when this conversion does not apply it
VIDSHOW_API HRESULT QZ_IMAGEPROC_Get(void* handle, uint32_t propId, void* data, uint32_t size,
                                     uint32_t* sizeOut);

/// Switches colour adjustment off. The stored values stay, so that setting the same values again
/// changes nothing.
/// @param handle a processor
/// @return 0; `E_INVALIDARG` for null
VIDSHOW_API HRESULT QZ_IMAGEPROC_Reset(void* handle);

/// Converts one frame. Entries beyond the format's planes are not looked at; nothing outside the
/// pictures is read or written, with these exceptions: 2.5 times wide and twice high (resize case
/// 5) to RGB565 or ARGB32 reads two luma rows and one chroma row behind the source; deinterlacing
/// reads whole source strides, the last row's too, up to the width rounded up to 16; and 4:2:0 to
/// RGB, turned or adjusted, takes the stride of Cb for Cr. A source without pixels makes none. At
/// another size neither side of a picture may be above 16384 pixels, which is not checked.
/// @param handle        a processor
/// @param src,srcStride source planes and strides in bytes
/// @param dst,dstStride destination planes and strides in bytes
/// @param frame         only its first `u32Size` bytes are read. The mode is stored before the
///                      planes are looked at; inputs other than 4:2:0, 4:2:2 and 4:4:4 take none.
/// @return 0 done; 1 null handle or frame record; 2 frame record above 12 bytes; a missing plane or
///         a zero stride: 3/4 three-plane input, 5/6 two-plane input, 7/8 one-plane input, 9/10
///         three-plane output, 11/12 two-plane output, 13/14 one-plane output; 15 internal failure;
///         `E_UNEXPECTED` for a format out of range; `E_OUTOFMEMORY`; `E_NOTIMPL`
VIDSHOW_API HRESULT QZ_IMAGEPROC_ProcessFrame(void* handle, uint8_t* const src[3],
                                              const uint32_t srcStride[3], uint8_t* const dst[3],
                                              const uint32_t dstStride[3],
                                              const QZ_IMAGEPROC_FRAME_PARAMS* frame);

/// Frees a processor and all that it owns; its handle is worth nothing then.
/// @param handle a processor
/// @return 0; `E_INVALIDARG` for null
VIDSHOW_API HRESULT QZ_IMAGEPROC_Destroy(void* handle);

/// Identifier of the engine's interface, {17A12BC8-DF53-4AC7-BACF-E854742427AE}. Data only, and
/// weak, so that a client may bring its own.
extern VIDSHOW_API const GUID IID_QZ_IMAGEPROC_C;

/// Sixteen 3 x 4 matrices, number 4 x standard + kind. Standard: `QZ_IMAGEPROC_MATRIX`. Kind: 0
/// limited YCbCr to RGB, 1 full YUV to RGB, 2 RGB to limited YCbCr, 3 RGB to full YUV. A row is
/// three coefficients and an offset in 8-bit levels. Four decimals, held in single precision.
extern VIDSHOW_API const double csc_coef[16][12];

/// Room for integer forms of the matrices; all zero, neither read nor written here.
extern VIDSHOW_API const int32_t integer_csc_coef[16][12];

/// Stores matrix, range and the two matrix pointers.
/// @param processor   a processor's record, not null
/// @param matrixIndex 0..3; any other value is stored as 0
/// @param range       0 or 1; any other value is stored as 0
/// @return 0, for other values too; the pointers then follow the values as given, to matrices
///         4 x `matrixIndex` + `range` and two further, and must not be followed
VIDSHOW_API int32_t UpdateColorMatrix(QZ_IMAGEPROC_PARAMSET* processor, uint32_t matrixIndex,
                                      uint32_t range);

/// Fills the three translation tables of the table-driven kernels for limited-range samples.
///
/// With b = 2 x (brightness - 128) within -255..255, c and s = contrast and saturation within
/// 0..255 over 128, and every value plus one half truncated toward zero:
/// - luma[i] = ((i - 16) x c + b) x kY x 128, within 0..65535;
/// - cr[i] = kRV x (i - 128) x s x 64 in the high half, the same of kGV in the low half, and cb[i]
///   likewise of kBU and kGU, each within -32768..32767.
/// @param matrix twelve doubles of a YCbCr-to-RGB matrix; its offsets are not used
/// @param luma   256 entries
/// @param cb,cr  256 entries each
/// @param brightness,contrast,saturation 128 is neutral
/// @return 0
VIDSHOW_API int32_t set_transtable(const double* matrix, uint16_t* luma, uint32_t* cb, uint32_t* cr,
                                   int32_t brightness, int32_t contrast, int32_t saturation);

/// The same for full-range samples: i stands in place of i - 16 and of i - 128; chroma is not
/// centred.
/// @copydetails set_transtable
VIDSHOW_API int32_t set_transtable_fullrange(const double* matrix, uint16_t* luma, uint32_t* cb,
                                             uint32_t* cr, int32_t brightness, int32_t contrast,
                                             int32_t saturation);

/// Chooses the vector kernels, refines the resize case, allocates line buffers and walker: the last
/// step of creation, for a record that is filled in up to there. Prints a line when it fails.
/// @param processor a processor's record, not null
/// @return 0; -3 for a conversion, rotation or resize case that does not exist; -2 without memory.
///         What it allocated before it failed stays in the record.
VIDSHOW_API int32_t _ImgPrcInit_depend(QZ_IMAGEPROC_PARAMSET* processor);

/// Runs one frame: deinterlacing if a mode is set, walker set-up, one kernel. Planes and strides
/// are not checked.
/// @param processor     a processor's record, not null
/// @param src,srcStride source planes and strides in bytes
/// @param dst,dstStride destination planes and strides in bytes
/// @return 0, also where no kernel is named for the processor's settings; -1
/// without a walker, or when the deinterlacer refuses; -2 without memory for temporary planes; -3
/// for an output format, rotation or conversion that does not exist
VIDSHOW_API int32_t _ImgPrcOneFrame_depend(QZ_IMAGEPROC_PARAMSET* processor, uint8_t* const src[3],
                                           const uint32_t srcStride[3], uint8_t* const dst[3],
                                           const uint32_t dstStride[3]);

/// @name Entries of the vector kernel table
/// The kernels and their arguments are those of kernels.h. Null beyond the table.
/// @{

/// RGB to 4:2:0.
/// @param kind 0 from RGB565, 1 from ARGB32, 2 from ABGR32
/// @param m    `QZ_IMAGEPROC_MATRIX`
/// @param r    0 limited range, 1 full range
/// @return the kernel's address, or null
VIDSHOW_API void* GetPFN_rgb2yuv(uint32_t kind, uint32_t m, uint32_t r);
/// Two rows of 4:2:0 to spread pixels.
/// @param kind 0 red on top, 1 blue on top
/// @param m    `QZ_IMAGEPROC_MATRIX`
/// @param r    0 limited range, 1 full range
/// @return the kernel's address, or null
VIDSHOW_API void* GetPFN_convert(uint32_t kind, uint32_t m, uint32_t r);
/// 4:2:0 to RGB565, RGB888, ARGB32 or RGB5551.
/// @param format `QZ_IMAGEPROC_FMT` of the output
/// @param m      `QZ_IMAGEPROC_MATRIX`
/// @param r      0 limited range, 1 full range
/// @return the kernel's address; null for any other format
VIDSHOW_API void* GetPFN_yuv2rgb(uint32_t format, uint32_t m, uint32_t r);
/// NV12 to RGB565.
/// @param format `QZ_IMAGEPROC_FMT` of the output
/// @param m      `QZ_IMAGEPROC_MATRIX`
/// @param r      0 limited range, 1 full range
/// @return the kernel's address; null for any other format
VIDSHOW_API void* GetPFN_nv122rgb(uint32_t format, uint32_t m, uint32_t r);
/// @}

/// Tells whether a conversion applies colour adjustment.
/// @param conversion `QZ_IMAGEPROC_CSC`
/// @param resizeCase not looked at
/// @param rotation   `QZ_IMAGEPROC_ROTATE`
/// @return 0 when it does, else -3
VIDSHOW_API int32_t _CheckCapability_depend(int32_t conversion, uint32_t resizeCase,
                                            uint32_t rotation);

/// Stores an adjustment, switches it on or, for three times 128, off, and rebuilds the tables. The
/// stored triple again changes nothing, after a reset too.
/// @param processor a processor's record, not null
/// @param values    brightness, contrast, saturation: 0..255, 128 neutral. Others act as the
///                  nearest of these, a brightness above 255 one level brighter in the translation
///                  tables. Not null.
/// @return 0; -1 without memory, and then nothing is stored
VIDSHOW_API int32_t SetImgColorAdjust(QZ_IMAGEPROC_PARAMSET* processor, const int32_t values[3]);

/// Copies the stored values.
/// @param processor a processor's record, not null
/// @param values    receives brightness, contrast, saturation; not null
/// @return what `_CheckCapability_depend` says of the conversion
VIDSHOW_API int32_t GetImgColorAdjust(QZ_IMAGEPROC_PARAMSET* processor, uint32_t values[3]);

/// Translates a key 0x00YYUUVV in place to RGB5551, bit 0 set, and prints it.
/// @param key not null
/// @return what `printf` returned
VIDSHOW_API int32_t CalcColorKey(uint32_t* key);

/// Translates a key 0x00YYUUVV to RGB565 by the BT.601 limited-range matrix. A channel that comes
/// out negative becomes its maximum.
/// @param format must be 3 (`QZ_IMAGEPROC_FMT_RGB565`)
/// @param key    the key
/// @param out    receives the 16-bit pixel
/// @return 0; `E_INVALIDARG` for null `out`; `E_FAIL` for another format, `out` untouched
VIDSHOW_API int32_t QZ_TranslateColorKey(uint32_t format, uint32_t key, uint32_t* out);

}  // extern "C"

#endif
