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
constexpr size_t kLanes = 4;
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
void Store(uint8_t* p, D v) {
    vst1q_u8(p, vreinterpretq_u8_u32(v));
}
D Set(uint32_t x) {
    return vdupq_n_u32(x);
}
D And(D a, D b) {
    return vandq_u32(a, b);
}
D Or(D a, D b) {
    return vorrq_u32(a, b);
}
D Add(D a, D b) {
    return vaddq_u32(a, b);
}
D Sub(D a, D b) {
    return vsubq_u32(a, b);
}
D Mul(D a, D b) {
    return vmulq_u32(a, b);
}
template <int kBits>
D Shl(D v) {
    return vshlq_n_u32(v, kBits);
}
template <int kBits>
D Shr(D v) {
    return vshrq_n_u32(v, kBits);
}
void StorePairs(uint8_t* p, W low, W high) {
    const uint16x8x2_t pairs = vzipq_u16(low, high);
    StoreWords(p, pairs.val[0]);
    StoreWords(p + sizeof(W), pairs.val[1]);
}
uint16x4_t LumaLevels(uint16x4_t samples, D slope, D offset) {
    const D sums = vmlaq_u32(offset, vmovl_u16(samples), slope);
    return vqshrun_n_s32(vreinterpretq_s32_u32(sums), kLineShift);
}
W LumaTerms(const uint8_t* p, D slope, D offset) {
    const W samples = vmovl_u8(vld1_u8(p));
    return vcombine_u16(LumaLevels(vget_low_u16(samples), slope, offset),
                        LumaLevels(vget_high_u16(samples), slope, offset));
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
/// Bytes of `from` by their numbers.
uint8x16_t PickBytes(uint8x16_t from, uint8x16_t numbers) {
    const uint8x8x2_t halves = {{vget_low_u8(from), vget_high_u8(from)}};
    return vcombine_u8(vtbl2_u8(halves, vget_low_u8(numbers)),
                       vtbl2_u8(halves, vget_high_u8(numbers)));
}
D WeighPairs(const uint16_t* columns, int32_t quad, const ColumnPicks& picks) {
    const W near = vld1q_u16(columns + picks.first[quad]);
    const uint8x16_t pairs = PickBytes(vreinterpretq_u8_u16(near), vld1q_u8(picks.bytes[quad]));
    return vpaddlq_u16(vmulq_u16(vreinterpretq_u16_u8(pairs), vld1q_u16(picks.weight[quad])));
}
void StoreBytes(uint8_t* p, D v) {
    const uint16x4_t words = vmovn_u32(v);
    const uint32x2_t bytes = vreinterpret_u32_u8(vmovn_u16(vcombine_u16(words, words)));
    const uint32_t word = vget_lane_u32(bytes, 0);
    std::memcpy(p, &word, sizeof word);
}
D Pick(const uint32_t* p, D index) {
    // Byte b of word i is byte 4 i + b.
    const D words = vmlaq_u32(Set(0x03020100), index, Set(0x04040404));
    return vreinterpretq_u32_u8(
        PickBytes(vreinterpretq_u8_u32(Load(p)), vreinterpretq_u8_u32(words)));
}
void StoreLow(uint8_t* p, D v) {
    vst1_u8(p, vreinterpret_u8_u16(vmovn_u32(v)));
}

/// Of terms, one for two pixels: those above zero, and those below without their sign, each cut to
/// 65535 and given to both pixels.
struct Term {
    W up, down;
};
W ForBoth(int32x4_t terms) {
    const uint16x4_t words = vqmovun_s32(terms);
    const uint16x4x2_t twice = vzip_u16(words, words);
    return vcombine_u16(twice.val[0], twice.val[1]);
}
Term MakeTerm(int32x4_t terms) {
    return {ForBoth(terms), ForBoth(vnegq_s32(terms))};
}

struct Terms {
    Term red, green, blue;
};
Terms LoadTerms(const uint32_t* blue, const uint32_t* red) {
    const int32x4_t b = vreinterpretq_s32_u32(Load(blue)), r = vreinterpretq_s32_u32(Load(red));
    // Twice the sum of the low halves, wrapped to 16 bits.
    const int32x4_t green = vshrq_n_s32(vshlq_n_s32(vaddq_s32(b, r), 16), 15);
    return {MakeTerm(vshrq_n_s32(r, 15)), MakeTerm(green), MakeTerm(vshrq_n_s32(b, 15))};
}

#include "kernels/fused_body.h"

}  // namespace fused_neon
}  // namespace

constexpr FusedBackend kNeonFused = fused_neon::MakeBackend();

}  // namespace vidshow
