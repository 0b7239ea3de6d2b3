// The lane operations of the neon back end, for vec_ops_test.cpp.

#include "kernels/vec_ops.h"

#include "kernels/neon/vec_neon.cpp"

namespace vidshow {
namespace {
namespace lanes_neon {
#include "kernels/vec_ops_wrap.h"
}  // namespace lanes_neon
}  // namespace
}  // namespace vidshow

const vec_ops::Ops vec_ops::kNeon = vidshow::lanes_neon::wrap::kOps;
