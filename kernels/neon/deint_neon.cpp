// NEON form of deinterlacing's line operations: 16 bytes a step.

#include <arm_neon.h>

#include <cstring>

#include "kernels/deint_backend.h"

namespace vidshow {
namespace {
namespace deint_neon {

using std::memcpy;

constexpr int32_t kBytes = 16;
constexpr bool kTwoAtOnce = false;
using V = uint8x16_t;

V Load(const uint8_t* p) {
    return vld1q_u8(p);
}
void Store(uint8_t* p, V v) {
    vst1q_u8(p, v);
}
V Average(V a, V b) {
    return vhaddq_u8(a, b);
}

// range before the shift: -510 to 2550
uint8x8_t FilteredHalf(uint8x8_t a, uint8x8_t b, uint8x8_t c, uint8x8_t d, uint8x8_t e) {
    const uint16x8_t twice = vaddq_u16(vshlq_n_u16(vaddl_u8(b, d), 1), vmovl_u8(c));
    const uint16x8_t sum = vsubq_u16(vshlq_n_u16(twice, 1), vaddl_u8(a, e));
    return vqrshrun_n_s16(vreinterpretq_s16_u16(sum), 3);
}
V Filtered(V a, V b, V c, V d, V e) {
    return vcombine_u8(FilteredHalf(vget_low_u8(a), vget_low_u8(b), vget_low_u8(c), vget_low_u8(d),
                                    vget_low_u8(e)),
                       FilteredHalf(vget_high_u8(a), vget_high_u8(b), vget_high_u8(c),
                                    vget_high_u8(d), vget_high_u8(e)));
}

uint8x8_t Mixed(uint8x8_t f, uint8x8_t c) {
    return vrshrn_n_u16(vmlal_u8(vmull_u8(f, vdup_n_u8(5)), c, vdup_n_u8(3)), 3);
}
V Rebuilt(V f, V b, V c, V d) {
    const V between = vandq_u8(vcgeq_u8(c, vminq_u8(b, d)), vcleq_u8(c, vmaxq_u8(b, d)));
    const V mixed =
        vcombine_u8(Mixed(vget_low_u8(f), vget_low_u8(c)), Mixed(vget_high_u8(f), vget_high_u8(c)));
    return vbslq_u8(between, mixed, f);
}

/// The columns of two blocks, lanes not yet added: at most 8 x 255 each.
struct Sums {
    uint16x8_t between[2], within[2];
};
Sums NoSums() {
    const uint16x8_t zero = vdupq_n_u16(0);
    return {{zero, zero}, {zero, zero}};
}
void AddDifferences(Sums& s, V x, V y, V z) {
    s.between[0] = vabal_u8(s.between[0], vget_low_u8(x), vget_low_u8(y));
    s.between[1] = vabal_u8(s.between[1], vget_high_u8(x), vget_high_u8(y));
    s.within[0] = vabal_u8(s.within[0], vget_low_u8(x), vget_low_u8(z));
    s.within[1] = vabal_u8(s.within[1], vget_high_u8(x), vget_high_u8(z));
}

/// All lanes of each, in lanes 0 and 1; at most 16320.
uint16x4_t Across(const uint16x8_t sums[2]) {
    const uint16x4_t first = vpadd_u16(vget_low_u16(sums[0]), vget_high_u16(sums[0]));
    const uint16x4_t second = vpadd_u16(vget_low_u16(sums[1]), vget_high_u16(sums[1]));
    const uint16x4_t pairs = vpadd_u16(first, second);
    return vpadd_u16(pairs, pairs);
}
void StoreScores(uint16_t* scores, const Sums& s) {
    const uint16x4_t between = Across(s.between), within = Across(s.within);
    const uint16x4_t against = vsra_n_u16(within, vmul_n_u16(within, 3), 4);  // product: to 48960
    const uint16x4_t result = vqsub_u16(between, against);
    scores[0] = vget_lane_u16(result, 0);
    scores[1] = vget_lane_u16(result, 1);
}

#include "kernels/deint_body.h"

}  // namespace deint_neon
}  // namespace

constexpr DeintBackend kNeonDeint = deint_neon::MakeBackend();

}  // namespace vidshow
