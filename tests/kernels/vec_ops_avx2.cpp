// The lane operations of the avx2 back end, for vec_ops_test.cpp.

#include "kernels/vec_ops.h"

#include "kernels/x86/vec_avx2.cpp"

namespace vidshow {
namespace {
namespace lanes_avx2 {
#include "kernels/vec_ops_wrap.h"
}  // namespace lanes_avx2
}  // namespace
}  // namespace vidshow

const vec_ops::Ops vec_ops::kAvx2 = vidshow::lanes_avx2::wrap::kOps;
