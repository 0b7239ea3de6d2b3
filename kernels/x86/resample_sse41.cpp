// SSE4.1 form of resampling by rows: 8 source columns, 16 output columns a step.

#include <smmintrin.h>

#include <cstddef>
#include <cstring>

#include "kernels/resample_backend.h"

namespace vidshow {
namespace {
namespace resample_sse41 {

using std::memcpy;
using std::ptrdiff_t;

constexpr size_t kWords = 8;
constexpr int32_t kGroups = 4;

#include "kernels/x86/bits128.h"

V LoadWide(const uint8_t* p) {
    return _mm_cvtepu8_epi16(_mm_loadl_epi64(reinterpret_cast<const V*>(p)));
}

#include "kernels/x86/resample_ops.h"

/// One group of a pair, four levels in words of 32 bits.
V Group(const uint16_t* blended, const NearTaps::Pair& pair, int which) {
    const V taps =
        _mm_shuffle_epi8(Load(blended + pair.first[which]), Load(pair.order + which * 16));
    return Levels(taps, Load(pair.weights + which * 8));
}
V TwoGroups(const uint16_t* blended, const NearTaps::Pair& pair) {
    return _mm_packus_epi32(Group(blended, pair, 0), Group(blended, pair, 1));
}
V PickRow(const uint16_t* blended, const NearTaps::Pair* pairs) {
    return _mm_packus_epi16(TwoGroups(blended, pairs[0]), TwoGroups(blended, pairs[1]));
}

#include "kernels/resample_body.h"

}  // namespace resample_sse41
}  // namespace

constexpr ResampleBackend kSse41Resample = {resample_sse41::BlendRows, resample_sse41::PickColumns};

}  // namespace vidshow
