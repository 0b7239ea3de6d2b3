// NEON form of the fused kernels' inner loops: words of 128 bits.

#include <arm_neon.h>

#include <cstddef>

#include "kernels/fused_backend.h"

namespace vidshow {
namespace {
namespace fused_neon {

using std::size_t;

constexpr int32_t kPixels = 8;
using W = uint16x8_t;
using B = uint8x16_t;

struct EvenOdd {
    W even, odd;
};

void StoreWords(uint8_t* p, W v) {
    vst1q_u8(p, vreinterpretq_u8_u16(v));
}
W SetWords(int x) {
    return vdupq_n_u16(static_cast<uint16_t>(x));
}
W AddSat(W a, W b) {
    return vqaddq_u16(a, b);
}
W SubSat(W a, W b) {
    return vqsubq_u16(a, b);
}
W AddSigned(W a, W b) {
    return vreinterpretq_u16_s16(vqaddq_s16(vreinterpretq_s16_u16(a), vreinterpretq_s16_u16(b)));
}
W AddW(W a, W b) {
    return vaddq_u16(a, b);
}
W SubW(W a, W b) {
    return vsubq_u16(a, b);
}
W MulW(W a, W b) {
    return vmulq_u16(a, b);
}
W SetFraction(int x) {
    return SetWords(x);
}
W TimesFraction(W v, W fraction) {
    // The high half of the doubled product.
    return vreinterpretq_u16_s16(
        vqdmulhq_s16(vreinterpretq_s16_u16(v), vreinterpretq_s16_u16(fraction)));
}
W AndW(W a, W b) {
    return vandq_u16(a, b);
}
W OrW(W a, W b) {
    return vorrq_u16(a, b);
}
template <int kBits>
W ShlW(W v) {
    return vshlq_n_u16(v, kBits);
}
template <int kBits>
W ShrW(W v) {
    return vshrq_n_u16(v, kBits);
}

template <int kBits>
W ShrSignedW(W v) {
    return vreinterpretq_u16_s16(vshrq_n_s16(vreinterpretq_s16_u16(v), kBits));
}

W WidenBytes(const uint8_t* p) {
    return vmovl_u8(vld1_u8(p));
}
EvenOdd WidenPairs(const uint8_t* p) {
    const uint8x8x2_t bytes = vld2_u8(p);
    return {vmovl_u8(bytes.val[0]), vmovl_u8(bytes.val[1])};
}
EvenOdd LoadPairs(const uint16_t* p) {
    const uint16x8x2_t pairs = vld2q_u16(p);
    return {pairs.val[0], pairs.val[1]};
}

// Bytes of even pixels stand in front of those of the odd ones.
template <int kBits>
B Channel(const EvenOdd& levels) {
    const B bytes = vcombine_u8(vqshrun_n_s16(vreinterpretq_s16_u16(levels.even), 6),
                                vqshrun_n_s16(vreinterpretq_s16_u16(levels.odd), 6));
    if constexpr (kBits == 8) {
        return bytes;
    } else {
        return vshrq_n_u8(bytes, 8 - kBits);
    }
}
B Packed(W first, W second) {
    const uint8x8x2_t parted = vuzp_u8(vmovn_u16(first), vmovn_u16(second));
    return vcombine_u8(parted.val[0], parted.val[1]);
}
B SetBytes(int x) {
    return vdupq_n_u8(static_cast<uint8_t>(x));
}
template <int kBits>
B ShlB(B v) {
    return vshlq_n_u8(v, kBits);
}
template <int kBits>
B ShrB(B v) {
    return vshrq_n_u8(v, kBits);
}
void StoreBytes(uint8_t* p, B v) {
    const uint8x8x2_t pairs = {{vget_low_u8(v), vget_high_u8(v)}};
    vst2_u8(p, pairs);
}
void StorePairs(uint8_t* p, W low, W high) {
    const uint16x8x2_t pairs = vzipq_u16(low, high);
    StoreWords(p, pairs.val[0]);
    StoreWords(p + sizeof(W), pairs.val[1]);
}
void StoreTwos(uint8_t* p, B low, B high) {
    const uint8x8x4_t quads = {
        {vget_low_u8(low), vget_low_u8(high), vget_high_u8(low), vget_high_u8(high)}};
    vst4_u8(p, quads);
}
void StoreRgb565(uint8_t* p, B r, B g, B b) {
    StoreTwos(p, vsriq_n_u8(vshlq_n_u8(g, 3), b, 3), vsriq_n_u8(r, g, 5));
}
void StoreRgb5551(uint8_t* p, B r, B g, B b) {
    const B low = vsriq_n_u8(vshlq_n_u8(g, 3), b, 2);
    StoreTwos(p, vorrq_u8(low, SetBytes(1)), vsriq_n_u8(r, g, 5));
}
uint8x8x2_t InOrder(B v) {
    return vzip_u8(vget_low_u8(v), vget_high_u8(v));
}
void StoreThrees(uint8_t* p, B blue, B green, B red) {
    const uint8x8x2_t b = InOrder(blue), g = InOrder(green), r = InOrder(red);
    const uint8x8x3_t first = {{b.val[0], g.val[0], r.val[0]}};
    const uint8x8x3_t second = {{b.val[1], g.val[1], r.val[1]}};
    vst3_u8(p, first);
    vst3_u8(p + sizeof first, second);
}
void StoreFours(uint8_t* p, B blue, B green, B red, B alpha) {
    const uint8x8x2_t b = InOrder(blue), g = InOrder(green), r = InOrder(red), a = InOrder(alpha);
    const uint8x8x4_t first = {{b.val[0], g.val[0], r.val[0], a.val[0]}};
    const uint8x8x4_t second = {{b.val[1], g.val[1], r.val[1], a.val[1]}};
    vst4_u8(p, first);
    vst4_u8(p + sizeof first, second);
}

/// Bytes of a span of 16 by their numbers. The intrinsic would have the compiler copy the span to a
/// pair of registers first, which it is already.
uint8x8_t PickBytes(uint8x16_t span, uint8x8_t numbers) {
    uint8x8_t bytes;
    __asm__("vtbl.8 %P0, {%e1, %f1}, %P2" : "=w"(bytes) : "w"(span), "w"(numbers));
    return bytes;
}
void PickGroup(const uint8_t* span, const uint8_t* order, uint8_t* out) {
    vst1_u8(out, PickBytes(vld1q_u8(span), vld1_u8(order)));
}

/// The pairs of a group of columns, its weights being in order of the pairs' halves.
struct Pairs {
    uint16x4_t first, second;

    Pairs(const uint16_t* columns, const uint8_t* order) {
        const uint8x16_t near = vreinterpretq_u8_u16(vld1q_u16(columns));
        first = vreinterpret_u16_u8(PickBytes(near, vld1_u8(order)));
        second = vreinterpret_u16_u8(PickBytes(near, vld1_u8(order + 8)));
    }
};
void PickColumns(const uint16_t* columns, const WordTaps& taps, size_t group, uint8_t* out) {
    const Pairs low(columns + taps.first[group], taps.order[group]);
    const Pairs high(columns + taps.first[group + 1], taps.order[group + 1]);
    const uint16_t *const w = taps.weights[group], *const v = taps.weights[group + 1];
    const W sums = vmlaq_u16(
        vmulq_u16(vcombine_u16(low.first, high.first), vcombine_u16(vld1_u16(w), vld1_u16(v))),
        vcombine_u16(low.second, high.second), vcombine_u16(vld1_u16(w + 4), vld1_u16(v + 4)));
    vst1_u8(out, vshrn_n_u16(sums, 6));
}
constexpr int32_t kBytes = 16;

struct ByteWeights {
    uint8x8_t above, below;
};
ByteWeights WeightsOf(int32_t weight) {
    return {vdup_n_u8(static_cast<uint8_t>(32 - weight)), vdup_n_u8(static_cast<uint8_t>(weight))};
}
uint8x8_t Blended(uint8x8_t a, uint8x8_t b, const ByteWeights& w) {
    return vshrn_n_u16(vmlal_u8(vmull_u8(a, w.above), b, w.below), 5);
}
void BlendStep(const uint8_t* upper, const uint8_t* lower, const ByteWeights& weights,
               uint8_t* out) {
    const uint8x16_t a = vld1q_u8(upper), b = vld1q_u8(lower);
    vst1q_u8(out, vcombine_u8(Blended(vget_low_u8(a), vget_low_u8(b), weights),
                              Blended(vget_high_u8(a), vget_high_u8(b), weights)));
}

struct Step {
    size_t first;
    uint8x16_t order, weights;

    Step(const ByteTaps& taps, size_t group)
        : first(taps.first[group]),
          order(vld1q_u8(taps.order[group])),
          weights(vld1q_u8(taps.weights[group])) {}
    W Weigh(const uint8_t* plane) const {
        const uint8x16_t near = vld1q_u8(plane + first);
        const uint8x8_t a = PickBytes(near, vget_low_u8(order));
        const uint8x8_t b = PickBytes(near, vget_high_u8(order));
        return vmlal_u8(vmull_u8(a, vget_low_u8(weights)), b, vget_high_u8(weights));
    }
};
using JoinedStep = Step;

#include "kernels/fused_body.h"

}  // namespace fused_neon
}  // namespace

constexpr FusedBackend kNeonFused = fused_neon::MakeBackend();

}  // namespace vidshow
