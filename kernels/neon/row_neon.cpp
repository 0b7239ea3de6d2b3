// NEON form of the row moves: 16 bytes a step.

#include <arm_neon.h>

#include <cstring>

#include "kernels/row_backend.h"

namespace vidshow {
namespace {
namespace rows_neon {

using std::memcpy;

constexpr size_t kBytes = 16;
using V = uint8x16_t;

V Load(const uint8_t* p) {
    return vld1q_u8(p);
}
void Store(uint8_t* p, V v) {
    vst1q_u8(p, v);
}

// Within halves, which then change places.
template <int kPixel>
V ReverseHalves(V v) {
    if constexpr (kPixel == 1) {
        return vrev64q_u8(v);
    } else if constexpr (kPixel == 2) {
        return vreinterpretq_u8_u16(vrev64q_u16(vreinterpretq_u16_u8(v)));
    } else {
        return vreinterpretq_u8_u32(vrev64q_u32(vreinterpretq_u32_u8(v)));
    }
}
template <int kPixel>
V Reverse(V v) {
    const V halves = ReverseHalves<kPixel>(v);
    return vcombine_u8(vget_high_u8(halves), vget_low_u8(halves));
}

void StorePairs(uint8_t* p, V a, V b) {
    const uint8x16x2_t pairs = {{a, b}};
    vst2q_u8(p, pairs);
}
void LoadPairs(const uint8_t* p, V* a, V* b) {
    const uint8x16x2_t apart = vld2q_u8(p);
    *a = apart.val[0];
    *b = apart.val[1];
}

#include "kernels/row_body.h"

}  // namespace rows_neon
}  // namespace

constexpr RowBackend kNeonRows = rows_neon::MakeBackend();

}  // namespace vidshow
