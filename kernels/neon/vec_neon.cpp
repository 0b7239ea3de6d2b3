// NEON back end of the vector kernels: 8 lanes, 16 pixels a step; 32 when 32-bit pixels are read.
//
// The lanes of a Wide are the even pixels in lo and the odd ones in hi: loads and stores part and
// join them on the way, and both take the same chroma, which frees registers for the constants.
//
// tests/kernels/neon_loops.cmake keeps count of the instructions.

#include <arm_neon.h>

#include <cstring>

#include "kernels/vec_backend.h"

namespace vidshow {
namespace {
namespace lanes_neon {

using std::memcpy;

constexpr int kLanes = 8, kQuadStep = 32, kAhead = 0;
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
    const uint16x8x2_t words = {{even, odd}};
    vst2q_u16(Words16(out), words);
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
    const uint8x16x3_t pixels = {{Levels(a), Levels(b), Levels(c)}};
    vst3q_u8(out, pixels);
}
void Store8888(uint8_t* out, Wide a, Wide b, Wide c, V d) {
    const uint8x8_t top = vmovn_u16(d);
    const uint8x16x4_t pixels = {{Levels(a), Levels(b), Levels(c), vcombine_u8(top, top)}};
    vst4q_u8(out, pixels);
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
    const uint32x4x2_t first = {{even.val[0], odd.val[0]}}, second = {{even.val[1], odd.val[1]}};
    vst2q_u32(words, first);
    vst2q_u32(words + 8, second);
}

/// As bytes for luma; with their signs, in one register, for chroma.
struct Weights {
    B luma[3];
    uint16x4_t chroma;
};
struct WordWeights : Weights {};
struct QuadWeights : Weights {};
Weights SetWeights(int a, int b, int c) {
    const auto bytes = [](int x) { return SetBytes(static_cast<uint8_t>(x)); };
    const auto word = [](int x) { return static_cast<uint16_t>(x); };
    const uint16_t words[4] = {word(a), word(b), word(c), 0};
    return {{bytes(a), bytes(b), bytes(c)}, vld1_u16(words)};
}
WordWeights LumaWords(int a, int b, int c) {
    return {SetWeights(a, b, c)};
}
WordWeights ChromaWords(int a, int b, int c) {
    return {SetWeights(a, b, c)};
}
QuadWeights LumaQuads(int a, int b, int c) {
    return {SetWeights(a, b, c)};
}
QuadWeights ChromaQuads(int a, int b, int c) {
    return {SetWeights(a, b, c)};
}

struct Sums {
    V even, odd;
};
using Words = uint16x8x2_t;  // even and odd pixels
Words LoadPixels(const uint8_t*& p, const WordWeights&) {
    const Words words = vld2q_u16(Words16(p));
    p += sizeof words;
    return words;
}
V LumaSum(V words, const Weights& w) {
    const V red = Times(vshrn_n_u16(words, 8), w.luma[0]);
    const V redGreen = vmlal_u8(red, vshrn_n_u16(words, 3), w.luma[1]);
    return vmlal_u8(redGreen, vshl_n_u8(vmovn_u16(words), 3), w.luma[2]);
}
Sums LumaSums(const Words& p, const Weights& w) {
    return {LumaSum(p.val[0], w), LumaSum(p.val[1], w)};
}
V LowByte(V v) {
    return vandq_u16(v, vdupq_n_u16(0xFF));
}
V EvenSums(const Words& p, const Weights& w) {
    const V evens = p.val[0];
    const V red = vmulq_lane_u16(vshrq_n_u16(evens, 8), w.chroma, 0);
    const V redGreen = vmlaq_lane_u16(red, LowByte(vshrq_n_u16(evens, 3)), w.chroma, 1);
    return vmlaq_lane_u16(redGreen, LowByte(vshlq_n_u16(evens, 3)), w.chroma, 2);
}

B Narrow(V sums, V offset) {
    const B rounded = vreinterpret_u8_s8(vqrshrn_n_s16(vreinterpretq_s16_u16(sums), 8));
    return vadd_u8(rounded, vget_low_u8(vreinterpretq_u8_u16(offset)));
}
void StoreLuma(uint8_t*& out, Sums s, V offset) {
    const uint8x8x2_t bytes = {{Narrow(s.even, offset), Narrow(s.odd, offset)}};
    vst2_u8(out, bytes);
    out += sizeof bytes;
}
void StoreChroma(uint8_t*& cbOut, uint8_t*& crOut, V cb, V cr, V offset) {
    vst1_u8(cbOut, Narrow(cb, offset));
    vst1_u8(crOut, Narrow(cr, offset));
    cbOut += sizeof(B);
    crOut += sizeof(B);
}

// Steps from 32-bit pixels are written in assembly: GCC copies what a structured load has filled
// before it works on it, runs out of registers, and needs a third more instructions. Four sums are
// under way at any time, because each instruction of one has to wait for the one before.
// clang-format off

/// The first three bytes of 16 pixels, to q8, q9, q10; q11 is overwritten.
#define VIDSHOW_LOAD_16(IN)                      \
    "vld4.8 {d16, d18, d20, d22}, [" IN "]!\n\t" \
    "vld4.8 {d17, d19, d21, d23}, [" IN "]!\n\t"

/// Of these: sums for luma, to q12 and q13; for chroma, from even pixels, to CB and CR.
#define VIDSHOW_SUMS_OF_16(CB, CR)        \
    "vmull.u8 q12, d16, %P[y0]\n\t"       \
    "vmull.u8 q13, d17, %P[y0]\n\t"       \
    "vbic.i16 q8, #0xFF00\n\t"            \
    "vmlal.u8 q12, d18, %P[y1]\n\t"       \
    "vmlal.u8 q13, d19, %P[y1]\n\t"       \
    "vmul.i16 " CB ", q8, %P[cb][0]\n\t"  \
    "vmul.i16 " CR ", q8, %P[cr][0]\n\t"  \
    "vbic.i16 q9, #0xFF00\n\t"            \
    "vmlal.u8 q12, d20, %P[y2]\n\t"       \
    "vmlal.u8 q13, d21, %P[y2]\n\t"       \
    "vmla.i16 " CB ", q9, %P[cb][1]\n\t"  \
    "vmla.i16 " CR ", q9, %P[cr][1]\n\t"  \
    "vbic.i16 q10, #0xFF00\n\t"           \
    "vmla.i16 " CB ", q10, %P[cb][2]\n\t" \
    "vmla.i16 " CR ", q10, %P[cr][2]\n\t"

__attribute__((always_inline)) inline void StepsToPlanes(
    vec::PlanesAt at, int32_t steps, const vec::ToYuvLanes<Wide, QuadWeights>& c) {
    asm volatile(
        "1:\n\t"
        // The upper row: luma to q6 and q7, chroma to q14 and q15.
        VIDSHOW_LOAD_16("%[in0]")
        VIDSHOW_SUMS_OF_16("q14", "q15")
        VIDSHOW_LOAD_16("%[in0]")
        "vqrshrn.s16 d12, q12, #8\n\t"
        "vqrshrn.s16 d13, q13, #8\n\t"
        "vqrshrn.s16 d28, q14, #8\n\t"
        "vqrshrn.s16 d30, q15, #8\n\t"
        VIDSHOW_SUMS_OF_16("q11", "q7")
        "vqrshrn.s16 d29, q11, #8\n\t"
        "vqrshrn.s16 d31, q7, #8\n\t"
        VIDSHOW_LOAD_16("%[in1]")
        "vqrshrn.s16 d14, q12, #8\n\t"
        "vqrshrn.s16 d15, q13, #8\n\t"
        "vadd.i8 q14, q14, %q[middle]\n\t"
        "vadd.i8 q15, q15, %q[middle]\n\t"
        "vadd.i8 q6, q6, %q[offset]\n\t"
        "vadd.i8 q7, q7, %q[offset]\n\t"
        "vst1.8 {d28-d29}, [%[cbOut]]!\n\t"
        "vst1.8 {d30-d31}, [%[crOut]]!\n\t"
        "vst1.8 {d12-d15}, [%[luma0]]!\n\t"
        // The lower row: sums in q6, q7 and q11, q15, where the loads leave alpha.
        "vld4.8 {d24, d26, d28, d30}, [%[in1]]!\n\t"
        "vld4.8 {d25, d27, d29, d31}, [%[in1]]!\n\t"
        "vmull.u8 q6, d16, %P[y0]\n\t"
        "vmull.u8 q7, d17, %P[y0]\n\t"
        "vmull.u8 q11, d24, %P[y0]\n\t"
        "vmull.u8 q15, d25, %P[y0]\n\t"
        "vmlal.u8 q6, d18, %P[y1]\n\t"
        "vmlal.u8 q7, d19, %P[y1]\n\t"
        "vmlal.u8 q11, d26, %P[y1]\n\t"
        "vmlal.u8 q15, d27, %P[y1]\n\t"
        "vmlal.u8 q6, d20, %P[y2]\n\t"
        "vmlal.u8 q7, d21, %P[y2]\n\t"
        "vmlal.u8 q11, d28, %P[y2]\n\t"
        "vmlal.u8 q15, d29, %P[y2]\n\t"
        "vqrshrn.s16 d12, q6, #8\n\t"
        "vqrshrn.s16 d13, q7, #8\n\t"
        "vqrshrn.s16 d14, q11, #8\n\t"
        "vqrshrn.s16 d15, q15, #8\n\t"
        "subs %[steps], %[steps], #1\n\t"
        "vadd.i8 q6, q6, %q[offset]\n\t"
        "vadd.i8 q7, q7, %q[offset]\n\t"
        "vst1.8 {d12-d15}, [%[luma1]]!\n\t"
        "bne 1b"
        : [in0] "+r"(at.in[0]), [in1] "+r"(at.in[1]), [luma0] "+r"(at.luma[0]),
          [luma1] "+r"(at.luma[1]), [cbOut] "+r"(at.cb), [crOut] "+r"(at.cr), [steps] "+r"(steps)
        : [y0] "w"(c.y.luma[0]), [y1] "w"(c.y.luma[1]), [y2] "w"(c.y.luma[2]),
          [cb] "x"(c.cb.chroma), [cr] "x"(c.cr.chroma), [offset] "w"(c.lumaOffset),
          [middle] "w"(c.chromaOffset)
        : "q6", "q7", "q8", "q9", "q10", "q11", "q12", "q13", "q14", "q15", "cc", "memory");
}
// clang-format on

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
