#pragma once

// The 30 families of vector kernels in the published order of the kernel table; every family has
// four members, one a colour matrix (BT.601, BT.709, SMPTE 240M, FCC). Whoever expands the list
// says what a line becomes:
//
//   TO_PLANES(name, range, source, order)                  packed RGB to 4:2:0
//   TO_LINES (name, range, order)                          two rows of 4:2:0 to two spread lines
//   TO_PIXELS(name, range, chroma, pixels, order, tail)    4:2:0 to packed RGB
//
//   name    the exported name up to the number of the matrix
//   range   limited or full
//   order   rgb or bgr: bgr exchanges red and blue
//   chroma  planar: planes Cb and Cr; pairs: one plane of Cb, Cr bytes
//   tail    the seventh argument: none, alpha or key
//
// The table's index rules count on this order: add nothing, move nothing.

// clang-format off
#define VIDSHOW_VECTOR_FAMILIES(TO_PLANES, TO_LINES, TO_PIXELS)              \
    TO_PLANES(_QZRGB565ToYCbCr420_C2P3_, limited, rgb565,   rgb)             \
    TO_PLANES(_QZRGB565ToYUV420_C2P3_,   full,    rgb565,   rgb)             \
    TO_PLANES(_QZARGB32ToYCbCr420_C4P3_, limited, argb32,   rgb)             \
    TO_PLANES(_QZARGB32ToYUV420_C4P3_,   full,    argb32,   rgb)             \
    TO_PLANES(_QZABGR32ToYCbCr420_C4P3_, limited, argb32,   bgr)             \
    TO_PLANES(_QZABGR32ToYUV420_C4P3_,   full,    argb32,   bgr)             \
    TO_LINES(_convert_ycbcr2rgb_,        limited, rgb)                       \
    TO_LINES(_convert_yuv2rgb_,          full,    rgb)                       \
    TO_LINES(_convert_ycbcr2bgr_,        limited, bgr)                       \
    TO_LINES(_convert_yuv2bgr_,          full,    bgr)                       \
    TO_PIXELS(_YCbCr420ToRGB565_P3C2_,   limited, planar, rgb565,  rgb, none)  \
    TO_PIXELS(_YUV420ToRGB565_P3C2_,     full,    planar, rgb565,  rgb, none)  \
    TO_PIXELS(_YCbCr420ToBGR565_P3C2_,   limited, planar, rgb565,  bgr, none)  \
    TO_PIXELS(_YUV420ToBGR565_P3C2_,     full,    planar, rgb565,  bgr, none)  \
    TO_PIXELS(_YCbCr420ToRGB888_P3C3_,   limited, planar, rgb888,  rgb, none)  \
    TO_PIXELS(_YUV420ToRGB888_P3C3_,     full,    planar, rgb888,  rgb, none)  \
    TO_PIXELS(_YCbCr420ToBGR888_P3C3_,   limited, planar, rgb888,  bgr, none)  \
    TO_PIXELS(_YUV420ToBGR888_P3C3_,     full,    planar, rgb888,  bgr, none)  \
    TO_PIXELS(_YCbCr420ToARGB32_P3C4_,   limited, planar, argb32,  rgb, alpha) \
    TO_PIXELS(_YUV420ToARGB32_P3C4_,     full,    planar, argb32,  rgb, alpha) \
    TO_PIXELS(_YCbCr420ToABGR32_P3C4_,   limited, planar, argb32,  bgr, alpha) \
    TO_PIXELS(_YUV420ToABGR32_P3C4_,     full,    planar, argb32,  bgr, alpha) \
    TO_PIXELS(_YCbCr420ToRGB5551_P3C2_,  limited, planar, rgb5551, rgb, key)   \
    TO_PIXELS(_YUV420ToRGB5551_P3C2_,    full,    planar, rgb5551, rgb, key)   \
    TO_PIXELS(_YCbCr420ToBGR5551_P3C2_,  limited, planar, rgb5551, bgr, key)   \
    TO_PIXELS(_YUV420ToBGR5551_P3C2_,    full,    planar, rgb5551, bgr, key)   \
    TO_PIXELS(_NV12ToRGB565_P3C2_,       limited, pairs,  rgb565,  rgb, none)  \
    TO_PIXELS(_NV12FRToRGB565_P3C2_,     full,    pairs,  rgb565,  rgb, none)  \
    TO_PIXELS(_NV12ToBGR565_P3C2_,       limited, pairs,  rgb565,  bgr, none)  \
    TO_PIXELS(_NV12FRToBGR565_P3C2_,     full,    pairs,  rgb565,  bgr, none)
// clang-format on
