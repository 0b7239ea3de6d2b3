// The vector line operations on spread pixels: red in bits 26-21, green in 15-10, blue in 4-0, far
// enough apart for weights that add to 32 to blend all three in one multiplication.

#include <cstring>

#include "kernels/vec_backend.h"
#include "vidshow/kernels.h"

namespace {

using vidshow::ActiveVectorBackend;

/// Whole quads of `count` entries, at least one: line buffers hold four spare entries for it.
int32_t Quads(int32_t count) {
    return count < 8 ? 1 : count / 4;
}

/// The bilinear mix at 16.16 position `p`, weights adding to 32, packed to RGB565.
uint32_t MixTo565(const uint32_t* line, uint32_t p) {
    const uint32_t* const at = line + (p >> 16);
    const uint32_t right = (p >> 11) & 31;
    const uint32_t x = at[0] * (32 - right) + at[1] * right;
    return ((x >> 16) & 0xF800) | ((x >> 10) & 0x07E0) | ((x >> 5) & 0x001F);
}

}  // namespace

extern "C" int32_t _vlerp_neon(const uint32_t* upper, const uint32_t* lower, uint32_t* out,
                               int32_t w, int32_t count) {
    ActiveVectorBackend().blend(upper, lower, out, w, Quads(count));
    return 0;
}

extern "C" int32_t _vlerp12_neon(const uint32_t* upper, const uint32_t* lower, uint32_t* out,
                                 int32_t count) {
    ActiveVectorBackend().average(upper, lower, out, Quads(count));
    return 0;
}

extern "C" int32_t _hlerp_neon(const uint32_t* line, uint16_t* out, int32_t step, int32_t width) {
    const uint32_t advance = static_cast<uint32_t>(step);
    uint32_t p = 0;
    for (int32_t pairs = width / 2; pairs > 0; --pairs, p += 2 * advance, out += 2) {
        const uint16_t pixels[2] = {static_cast<uint16_t>(MixTo565(line, p)),
                                    static_cast<uint16_t>(MixTo565(line, p + advance))};
        std::memcpy(out, pixels, sizeof pixels);
    }
    return 0;
}
