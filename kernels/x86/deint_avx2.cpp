// AVX2 form of deinterlacing's line operations: 32 bytes a step.

#include <immintrin.h>

#include <cstring>

#include "kernels/deint_backend.h"

namespace vidshow {
namespace {
namespace deint_avx2 {

using std::memcpy;

constexpr int32_t kBytes = 32;
constexpr bool kTwoAtOnce = true;

#include "kernels/x86/bits256.h"

#include "kernels/x86/deint_ops.h"

#include "kernels/deint_body.h"

}  // namespace deint_avx2
}  // namespace

constexpr DeintBackend kAvx2Deint = deint_avx2::MakeBackend();

}  // namespace vidshow
