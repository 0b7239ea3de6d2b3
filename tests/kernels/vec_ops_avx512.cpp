// The lane operations of the avx512 back end, for vec_ops_test.cpp.

#include "kernels/vec_ops.h"

#include "kernels/x86/vec_avx512.cpp"

namespace vidshow {
namespace {
namespace lanes_avx512 {
#include "kernels/vec_ops_wrap.h"
}  // namespace lanes_avx512
}  // namespace
}  // namespace vidshow

const vec_ops::Ops vec_ops::kAvx512 = vidshow::lanes_avx512::wrap::kOps;
