// SSE4.1 form of deinterlacing's line operations: 16 bytes a step.

#include <smmintrin.h>

#include <cstring>

#include "kernels/deint_backend.h"

namespace vidshow {
namespace {
namespace deint_sse41 {

using std::memcpy;

constexpr int32_t kBytes = 16;
constexpr bool kTwoAtOnce = true;

#include "kernels/x86/bits128.h"

#include "kernels/x86/deint_ops.h"

#include "kernels/deint_body.h"

}  // namespace deint_sse41
}  // namespace

constexpr DeintBackend kSse41Deint = deint_sse41::MakeBackend();

}  // namespace vidshow
