// NEON form of resampling by rows: 16 source columns, 8 output columns a step.

#include <arm_neon.h>

#include <cstddef>
#include <cstring>

#include "kernels/resample_backend.h"

namespace vidshow {
namespace {
namespace resample_neon {

using std::memcpy;
using std::ptrdiff_t;

constexpr size_t kWords = 16;
constexpr int32_t kGroups = 2;

struct Weights {
    uint8x8_t above, below;
};

Weights WeightsOf(uint32_t weight) {
    return {vdup_n_u8(static_cast<uint8_t>(32 - weight)), vdup_n_u8(static_cast<uint8_t>(weight))};
}
uint16x8_t Mean(uint8x8_t a, uint8x8_t b, const Weights& w) {
    return vrshrq_n_u16(vmlal_u8(vmull_u8(a, w.above), b, w.below), 2);
}
void MeanStep(uint16_t* out, const uint8_t* a, const uint8_t* b, const Weights& w) {
    const uint8x16_t upper = vld1q_u8(a), lower = vld1q_u8(b);
    vst1q_u16(out, Mean(vget_low_u8(upper), vget_low_u8(lower), w));
    vst1q_u16(out + 8, Mean(vget_high_u8(upper), vget_high_u8(lower), w));
}

/// Four words of each of two spans of eight. The intrinsic would have the compiler copy a span to a
/// pair of registers first, which it is already.
uint16x8_t Pick(uint16x8_t here, uint16x8_t next, uint8x8_t ofHere, uint8x8_t ofNext) {
    uint16x8_t words;
    __asm__("vtbl.8 %e0, {%e1, %f1}, %P3\n\tvtbl.8 %f0, {%e2, %f2}, %P4"
            : "=&w"(words)
            : "w"(here), "w"(next), "w"(ofHere), "w"(ofNext));
    return words;
}

// The sums end below 65536, and so they do when half a level is added: 16 bits hold them.
void PickStep(uint8_t* out, ptrdiff_t stride, const uint16_t* blended, ptrdiff_t step,
              const NearTaps::Pair* pair) {
    const uint8x16_t ofHere = vld1q_u8(pair->order), ofNext = vld1q_u8(pair->order + 16);
    const uint16x8_t weights = vld1q_u16(pair->weights), rest = vld1q_u16(pair->weights + 8);
    const uint16_t* atHere = blended + pair->first[0];
    const uint16_t* atNext = blended + pair->first[1];
    for (int32_t r = 0; r < kBandRows; ++r) {
        const uint16x8_t here = vld1q_u16(atHere), next = vld1q_u16(atNext);
        const uint16x8_t first = Pick(here, next, vget_low_u8(ofHere), vget_low_u8(ofNext));
        const uint16x8_t second = Pick(here, next, vget_high_u8(ofHere), vget_high_u8(ofNext));
        vst1_u8(out, vrshrn_n_u16(vmlaq_u16(vmulq_u16(first, weights), second, rest), 8));
        atHere += step;
        atNext += step;
        out += stride;
    }
}

#include "kernels/resample_body.h"

}  // namespace resample_neon
}  // namespace

constexpr ResampleBackend kNeonResample = {resample_neon::BlendRows, resample_neon::PickColumns};

}  // namespace vidshow
