// The lane operations of the sse41 back end, for vec_ops_test.cpp.

#include "kernels/vec_ops.h"

#include "kernels/x86/vec_sse41.cpp"

namespace vidshow {
namespace {
namespace lanes_sse41 {
#include "kernels/vec_ops_wrap.h"
}  // namespace lanes_sse41
}  // namespace
}  // namespace vidshow

const vec_ops::Ops vec_ops::kSse41 = vidshow::lanes_sse41::wrap::kOps;
