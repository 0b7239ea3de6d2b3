// The avx512 back end's source once more, its instructions computed by portable code: what proves
// it on processors that cannot run it. It has names of its own beside those of the real one.

#define kAvx512Backend kPortableAvx512Backend
#define lanes_avx512 lanes_avx512_portable

#include "kernels/vec_ops.h"

#include "kernels/x86/vec_avx512.cpp"

namespace vidshow {
namespace {
namespace lanes_avx512 {
#include "kernels/vec_ops_wrap.h"
}  // namespace lanes_avx512
}  // namespace
}  // namespace vidshow

const vec_ops::Ops vec_ops::kAvx512Portable = vidshow::lanes_avx512::wrap::kOps;
