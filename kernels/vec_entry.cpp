// The exported names of the vector kernels and their table, generated from vec_list.h. An entry
// chooses constants, describes its picture as a job, and hands it to the back end in use.

#include "kernels/vec_backend.h"
#include "kernels/vec_coef.h"
#include "kernels/vec_list.h"
#include "kernels/vec_table.h"
#include "vidshow/kernels.h"

namespace vidshow {
namespace {

template <vec::Range kRange, vec::Chroma kChroma, vec::Pixels kPixels, vec::Order kOrder>
int32_t ToPixels(int matrix, uint8_t* const src[3], const uint32_t ss[3], void* dst, uint32_t d,
                 int32_t w, int32_t h, uint32_t extra) {
    constexpr bool kPaired = kChroma == vec::pairs;  // a third plane is neither needed nor read
    const size_t cbStride = ss[1], crStride = kPaired ? ss[1] : ss[2];
    uint8_t* const out = static_cast<uint8_t*>(dst);
    const ToPixelsJob job = {{src[0], src[0] + ss[0]},
                             src[1],
                             kPaired ? src[1] : src[2],
                             {out, out + d},
                             size_t{2} * ss[0],
                             cbStride,
                             crStride,
                             size_t{2} * d,
                             w,
                             h,
                             extra,
                             &kToRgb[kRange][matrix]};
    ActiveVectorBackend().toPixels[kChroma][kPixels][kOrder](job);
    return 0;
}

template <vec::Range kRange, vec::Order kOrder>
int32_t ToLines(int matrix, const uint8_t* luma0, const uint8_t* luma1, const uint8_t* cb,
                const uint8_t* cr, uint32_t* line0, uint32_t* line1, int32_t w) {
    const ToPixelsJob job = {{luma0, luma1},
                             cb,
                             cr,
                             {reinterpret_cast<uint8_t*>(line0), reinterpret_cast<uint8_t*>(line1)},
                             0,
                             0,
                             0,
                             0,
                             w,
                             2,
                             0,
                             &kToRgb[kRange][matrix]};
    ActiveVectorBackend().toPixels[vec::planar][vec::spread][kOrder](job);
    return 0;
}

template <vec::Range kRange, vec::Pixels kSource, vec::Order kOrder>
int32_t ToPlanes(int matrix, const void* src, uint32_t srcStride, uint8_t* const dst[3],
                 const uint32_t dstStride[3], int32_t w, int32_t h) {
    const uint8_t* const in = static_cast<const uint8_t*>(src);
    const ToPlanesJob job = {{in, in + srcStride},
                             {dst[0], dst[0] + dstStride[0]},
                             dst[1],
                             dst[2],
                             size_t{2} * srcStride,
                             size_t{2} * dstStride[0],
                             dstStride[1],
                             dstStride[2],
                             w,
                             h,
                             &kToYuv[kRange][matrix]};
    ActiveVectorBackend().toPlanes[kSource == vec::argb32][kOrder](job);
    return 0;
}

}  // namespace
}  // namespace vidshow

// NOLINTBEGIN(bugprone-reserved-identifier,bugprone-macro-parentheses): the names are published
using namespace vidshow;

#define TO_PLANES_N(name, n, range, source, order)                                                 \
    extern "C" int32_t name##n(const void* src, uint32_t srcStride, uint8_t* const dst[3],         \
                               const uint32_t dstStride[3], int32_t w, int32_t h) {                \
        return ToPlanes<vec::range, vec::source, vec::order>(n, src, srcStride, dst, dstStride, w, \
                                                             h);                                   \
    }

#define TO_LINES_N(name, n, range, order)                                                    \
    extern "C" int32_t name##n##_neon(const uint8_t* luma0, const uint8_t* luma1,            \
                                      const uint8_t* cb, const uint8_t* cr, uint32_t* line0, \
                                      uint32_t* line1, int32_t w) {                          \
        return ToLines<vec::range, vec::order>(n, luma0, luma1, cb, cr, line0, line1, w);    \
    }

#define PARAMETER_none
#define PARAMETER_alpha , uint32_t a
#define PARAMETER_key , uint32_t k
#define ARGUMENT_none 0
#define ARGUMENT_alpha a
#define ARGUMENT_key k
#define TO_PIXELS_N(name, n, range, chroma, pixels, order, tail)                                   \
    extern "C" int32_t name##n(uint8_t* const src[3], const uint32_t ss[3], void* dst, uint32_t d, \
                               int32_t w, int32_t h PARAMETER_##tail) {                            \
        return ToPixels<vec::range, vec::chroma, vec::pixels, vec::order>(n, src, ss, dst, d, w,   \
                                                                          h, ARGUMENT_##tail);     \
    }

#define TO_PLANES(name, ...)          \
    TO_PLANES_N(name, 0, __VA_ARGS__) \
    TO_PLANES_N(name, 1, __VA_ARGS__) \
    TO_PLANES_N(name, 2, __VA_ARGS__) \
    TO_PLANES_N(name, 3, __VA_ARGS__)
#define TO_LINES(name, ...)          \
    TO_LINES_N(name, 0, __VA_ARGS__) \
    TO_LINES_N(name, 1, __VA_ARGS__) \
    TO_LINES_N(name, 2, __VA_ARGS__) \
    TO_LINES_N(name, 3, __VA_ARGS__)
#define TO_PIXELS(name, ...)          \
    TO_PIXELS_N(name, 0, __VA_ARGS__) \
    TO_PIXELS_N(name, 1, __VA_ARGS__) \
    TO_PIXELS_N(name, 2, __VA_ARGS__) \
    TO_PIXELS_N(name, 3, __VA_ARGS__)

VIDSHOW_VECTOR_FAMILIES(TO_PLANES, TO_LINES, TO_PIXELS)

#define ADDRESS(name) reinterpret_cast<void*>(&name)
#define FOUR(name, ...) ADDRESS(name##0), ADDRESS(name##1), ADDRESS(name##2), ADDRESS(name##3),
#define FOUR_NEON(name, ...) \
    ADDRESS(name##0_neon), ADDRESS(name##1_neon), ADDRESS(name##2_neon), ADDRESS(name##3_neon),

void* const vidshow::kVectorKernels[] = {VIDSHOW_VECTOR_FAMILIES(FOUR, FOUR_NEON, FOUR)};
// NOLINTEND(bugprone-reserved-identifier,bugprone-macro-parentheses)
