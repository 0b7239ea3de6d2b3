// NEON form of the fused kernels' inner loops: 8 pixels a step.

#include <arm_neon.h>

#include <cstddef>
#include <cstring>

#include "kernels/fused_backend.h"

namespace vidshow {
namespace {
namespace fused_neon {

using std::size_t;

constexpr int32_t kPixels = 8;
using W = uint16x8_t;
using D = uint32x4_t;

W LoadWords(const uint16_t* p) {
    return vld1q_u16(p);
}
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
W Min(W a, W b) {
    return vminq_u16(a, b);
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

D Load(const uint32_t* p) {
    return vld1q_u32(p);
}
D Set(uint32_t x) {
    return vdupq_n_u32(x);
}
D Add(D a, D b) {
    return vaddq_u32(a, b);
}
template <int kBits>
D Shl(D v) {
    return vshlq_n_u32(v, kBits);
}
template <int kBits>
D Shr(D v) {
    return vshrq_n_u32(v, kBits);
}
template <int kBits>
D ShrSigned(D v) {
    return vreinterpretq_u32_s32(vshrq_n_s32(vreinterpretq_s32_u32(v), kBits));
}
void StorePairs(uint8_t* p, W low, W high) {
    const uint16x8x2_t pairs = vzipq_u16(low, high);
    StoreWords(p, pairs.val[0]);
    StoreWords(p + sizeof(W), pairs.val[1]);
}
W LevelsTo565(W r, W g, W b) {
    const W redGreen = vsriq_n_u16(vqshlq_n_u16(r, 1), vqshlq_n_u16(g, 1), 5);
    return vsriq_n_u16(redGreen, vqshlq_n_u16(b, 1), 11);
}
void StoreQuads(uint8_t* p, W b, W g, W r, W a) {
    const uint8x8x4_t quads = {
        {vqshrn_n_u16(b, 7), vqshrn_n_u16(g, 7), vqshrn_n_u16(r, 7), vmovn_u16(a)}};
    vst4_u8(p, quads);
}
uint16x4_t LumaLevels(uint16x4_t samples, D slope, D offset) {
    const D sums = vmlaq_u32(offset, vmovl_u16(samples), slope);
    return vqshrun_n_s32(vreinterpretq_s32_u32(sums), kLumaShift);
}
W LumaTerms(const uint8_t* p, D slope, D offset) {
    const W samples = vmovl_u8(vld1_u8(p));
    return vcombine_u16(LumaLevels(vget_low_u16(samples), slope, offset),
                        LumaLevels(vget_high_u16(samples), slope, offset));
}
D Halved(const uint8_t* p) {
    uint32_t samples;
    std::memcpy(&samples, p, sizeof samples);
    return vmovl_u16(vget_low_u16(vmovl_u8(vreinterpret_u8_u32(vdup_n_u32(samples)))));
}
D OnLine(D samples, D slope, D offset) {
    const int32x4_t sum = vreinterpretq_s32_u32(vmlaq_u32(offset, samples, slope));
    // What rounds down is one too low where it is negative, unless nothing is cut off.
    const D sign = vreinterpretq_u32_s32(vshrq_n_s32(sum, 31));
    const D raised = vsraq_n_u32(vreinterpretq_u32_s32(sum), sign, 32 - kChromaShift);
    return ShrSigned<kChromaShift>(raised);
}
W WidenBytes(const uint8_t* p) {
    return vmovl_u8(vld1_u8(p));
}
W AddW(W a, W b) {
    return vaddq_u16(a, b);
}
W MulW(W a, W b) {
    return vmulq_u16(a, b);
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
void NarrowWords(uint8_t* p, W v) {
    vst1_u8(p, vmovn_u16(v));
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

struct Term {
    W up, down;
};
W ForBoth(int32x4_t terms) {
    const uint16x4_t words = vqmovun_s32(terms);
    const uint16x4x2_t twice = vzip_u16(words, words);
    return vcombine_u16(twice.val[0], twice.val[1]);
}
Term MakeTerm(D terms) {
    const int32x4_t t = vreinterpretq_s32_u32(terms);
    return {ForBoth(t), ForBoth(vnegq_s32(t))};
}

struct Terms {
    Term red, green, blue;
};
// A call would pass all of them through memory.
__attribute__((always_inline)) inline Terms MakeTerms(D red, D green, D blue) {
    return {MakeTerm(red), MakeTerm(green), MakeTerm(blue)};
}

#include "kernels/fused_body.h"

}  // namespace fused_neon
}  // namespace

constexpr FusedBackend kNeonFused = fused_neon::MakeBackend();

}  // namespace vidshow
