// NEON back end of the vector kernels: 8 lanes, 16 pixels a step.
//
// The lanes of a Wide are the even pixels in lo and the odd ones in hi: loads and stores part and
// join them on the way, and both take the same chroma, which frees registers for the constants.

#include <arm_neon.h>

#include <cstring>

#include "kernels/vec_backend.h"

namespace vidshow {
namespace {
namespace lanes_neon {

using std::memcpy;

constexpr int kLanes = 8;
using V = uint16x8_t;
using B = uint8x8_t;
struct Wide {
    V lo, hi;
};

V Set(uint16_t x) {
    return vdupq_n_u16(x);
}
B SetBytes(uint8_t x) {
    return vdup_n_u8(x);
}
V Times(B a, B b) {
    return vmull_u8(a, b);
}
V MinusTimes(V v, B a, B b) {
    return vmlsl_u8(v, a, b);
}

B LoadChroma(const uint8_t* p) {
    return vld1_u8(p);
}
void LoadPairs(const uint8_t* p, B& first, B& second) {
    const uint8x8x2_t pairs = vld2_u8(p);
    first = pairs.val[0];
    second = pairs.val[1];
}
Wide LoadLuma(const uint8_t* p, B k) {
    const uint8x8x2_t bytes = vld2_u8(p);
    return {Times(bytes.val[0], k), Times(bytes.val[1], k)};
}
template <class Form>
V Offset(int16_t x, Form) {
    return vreinterpretq_u16_s16(vdupq_n_s16(x));
}
template <class Form>
V AddTerm(V term, B a, B b, Form) {
    return vmlal_u8(term, a, b);
}
Wide Double(V t) {
    return {t, t};
}

V Channel(V y, V term, vec::ForBytes) {
    return vreinterpretq_u16_s16(vqaddq_s16(vreinterpretq_s16_u16(y), vreinterpretq_s16_u16(term)));
}
/// Shifted left by 2 with saturation: the level stands in the high byte.
V Channel(V y, V term, vec::ForWords) {
    return vqshluq_n_s16(vreinterpretq_s16_u16(Channel(y, term, vec::ForBytes())), 2);
}

// Addresses of pixels are odd when a caller's are. The 16-bit loads and stores do not mind.
uint16_t* Words16(uint8_t* p) {
    return static_cast<uint16_t*>(static_cast<void*>(p));
}
const uint16_t* Words16(const uint8_t* p) {
    return static_cast<const uint16_t*>(static_cast<const void*>(p));
}
void StoreWords(uint8_t* out, V even, V odd) {
    vst2q_u16(Words16(out), uint16x8x2_t{{even, odd}});
}
V Pack565(V a, V b, V c) {
    return vsriq_n_u16(vsriq_n_u16(a, b, 5), c, 11);
}
void Store565(uint8_t* out, Wide a, Wide b, Wide c) {
    StoreWords(out, Pack565(a.lo, b.lo, c.lo), Pack565(a.hi, b.hi, c.hi));
}
V Pack5551(V a, V b, V c, V key) {
    const V pixel = vorrq_u16(vsriq_n_u16(vsriq_n_u16(a, b, 5), c, 10), vdupq_n_u16(1));
    return vbicq_u16(pixel, vceqq_u16(pixel, key));
}
void Store5551(uint8_t* out, Wide a, Wide b, Wide c, V key) {
    StoreWords(out, Pack5551(a.lo, b.lo, c.lo, key), Pack5551(a.hi, b.hi, c.hi, key));
}

B Levels(V sums) {
    return vqshrun_n_s16(vreinterpretq_s16_u16(sums), 6);
}
uint8x16_t Levels(Wide a) {
    const uint8x8x2_t inOrder = vzip_u8(Levels(a.lo), Levels(a.hi));
    return vcombine_u8(inOrder.val[0], inOrder.val[1]);
}
void Store888(uint8_t* out, Wide a, Wide b, Wide c) {
    vst3q_u8(out, uint8x16x3_t{{Levels(a), Levels(b), Levels(c)}});
}
void Store8888(uint8_t* out, Wide a, Wide b, Wide c, V d) {
    const uint8x8_t top = vmovn_u16(d);
    vst4q_u8(out, uint8x16x4_t{{Levels(a), Levels(b), Levels(c), vcombine_u8(top, top)}});
}

V SpreadLower(V b, V c) {
    return vsliq_n_u16(vshrq_n_u16(c, 11), vshrq_n_u16(b, 10), 10);
}
V SpreadUpper(V a) {
    return vshlq_n_u16(vshrq_n_u16(a, 10), 5);
}
/// From their lower and upper words.
uint32x4x2_t Pixels32(V lower, V upper) {
    const uint16x8x2_t pixels = vzipq_u16(lower, upper);
    return {{vreinterpretq_u32_u16(pixels.val[0]), vreinterpretq_u32_u16(pixels.val[1])}};
}
__attribute__((always_inline)) inline void StoreSpread(uint8_t* out, Wide a, Wide b, Wide c) {
    uint32_t* const words = static_cast<uint32_t*>(static_cast<void*>(out));
    const uint32x4x2_t even = Pixels32(SpreadLower(b.lo, c.lo), SpreadUpper(a.lo));
    const uint32x4x2_t odd = Pixels32(SpreadLower(b.hi, c.hi), SpreadUpper(a.hi));
    vst2q_u32(words, uint32x4x2_t{{even.val[0], odd.val[0]}});
    vst2q_u32(words + 8, uint32x4x2_t{{even.val[1], odd.val[1]}});
}

using Words = uint16x8x2_t;  // even and odd pixels
using Quads = uint8x16x4_t;
Words LoadWords(const uint8_t* p) {
    return vld2q_u16(Words16(p));
}
Quads LoadQuads(const uint8_t* p) {
    return vld4q_u8(p);
}

/// As bytes for luma; with their signs, in one register, for chroma.
struct Weights {
    B luma[3];
    uint16x4_t chroma;
};
using WordWeights = Weights;
using QuadWeights = Weights;
Weights SetWeights(int a, int b, int c) {
    const auto bytes = [](int x) { return SetBytes(static_cast<uint8_t>(x)); };
    const auto word = [](int x) { return static_cast<uint16_t>(x); };
    const uint16_t words[4] = {word(a), word(b), word(c), 0};
    return {{bytes(a), bytes(b), bytes(c)}, vld1_u16(words)};
}
Weights LumaWords(int a, int b, int c) {
    return SetWeights(a, b, c);
}
Weights ChromaWords(int a, int b, int c) {
    return SetWeights(a, b, c);
}
Weights LumaQuads(int a, int b, int c) {
    return SetWeights(a, b, c);
}
Weights ChromaQuads(int a, int b, int c) {
    return SetWeights(a, b, c);
}

V LumaSum(B a, B b, B c, const Weights& w) {
    return vmlal_u8(vmlal_u8(Times(a, w.luma[0]), b, w.luma[1]), c, w.luma[2]);
}
V LumaSum(V words, const Weights& w) {
    return LumaSum(vshrn_n_u16(words, 8), vshrn_n_u16(words, 3), vshl_n_u8(vmovn_u16(words), 3), w);
}

struct WordSums {  // even and odd pixels
    V even, odd;
};
struct QuadSums {  // in order
    V lo, hi;
};
WordSums LumaSums(const Words& p, const Weights& w) {
    return {LumaSum(p.val[0], w), LumaSum(p.val[1], w)};
}
QuadSums LumaSums(const Quads& p, const Weights& w) {
    return {LumaSum(vget_low_u8(p.val[0]), vget_low_u8(p.val[1]), vget_low_u8(p.val[2]), w),
            LumaSum(vget_high_u8(p.val[0]), vget_high_u8(p.val[1]), vget_high_u8(p.val[2]), w)};
}

V ChromaSum(V a, V b, V c, const Weights& w) {
    return vmlaq_lane_u16(vmlaq_lane_u16(vmulq_lane_u16(a, w.chroma, 0), b, w.chroma, 1), c,
                          w.chroma, 2);
}
V LowByte(V v) {
    return vandq_u16(v, vdupq_n_u16(0xFF));
}
V EvenSums(const Words& p, const Weights& w) {
    const V evens = p.val[0];
    return ChromaSum(vshrq_n_u16(evens, 8), LowByte(vshrq_n_u16(evens, 3)),
                     LowByte(vshlq_n_u16(evens, 3)), w);
}
V EvenSums(const Quads& p, const Weights& w) {
    const auto evens = [](uint8x16_t x) { return LowByte(vreinterpretq_u16_u8(x)); };
    return ChromaSum(evens(p.val[0]), evens(p.val[1]), evens(p.val[2]), w);
}

B Narrow(V sums, V offset) {
    const B rounded = vreinterpret_u8_s8(vqrshrn_n_s16(vreinterpretq_s16_u16(sums), 8));
    return vadd_u8(rounded, vmovn_u16(offset));
}
void StoreLuma(uint8_t* out, WordSums s, V offset) {
    vst2_u8(out, uint8x8x2_t{{Narrow(s.even, offset), Narrow(s.odd, offset)}});
}
void StoreLuma(uint8_t* out, QuadSums s, V offset) {
    vst1q_u8(out, vcombine_u8(Narrow(s.lo, offset), Narrow(s.hi, offset)));
}
void StoreChroma(uint8_t* cbOut, uint8_t* crOut, V cb, V cr, V offset) {
    vst1_u8(cbOut, Narrow(cb, offset));
    vst1_u8(crOut, Narrow(cr, offset));
}

void StoreMasked(uint32_t* out, uint32x4_t v) {
    vst1q_u32(out, vandq_u32(v, vdupq_n_u32(0x07E0FC1F)));
}
void BlendQuad(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t w) {
    const uint32_t below = static_cast<uint32_t>(w);
    const uint32x4_t sum = vmulq_n_u32(vld1q_u32(upper), 32 - below);
    StoreMasked(out, vshrq_n_u32(vmlaq_n_u32(sum, vld1q_u32(lower), below), 5));
}
void AverageQuad(const uint32_t* upper, const uint32_t* lower, uint32_t* out) {
    StoreMasked(out, vshrq_n_u32(vaddq_u32(vld1q_u32(upper), vld1q_u32(lower)), 1));
}

#include "kernels/vec_body.h"

}  // namespace lanes_neon
}  // namespace

constexpr VectorBackend kNeonBackend = lanes_neon::MakeBackend("neon");

}  // namespace vidshow
