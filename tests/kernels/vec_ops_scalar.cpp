// The lane operations of the scalar back end, for vec_ops_test.cpp.

#include "kernels/vec_ops.h"

#include "kernels/vec_scalar.cpp"

namespace vidshow {
namespace {
namespace lanes_scalar {
#include "kernels/vec_ops_wrap.h"
}  // namespace lanes_scalar
}  // namespace
}  // namespace vidshow

const vec_ops::Ops vec_ops::kScalar = vidshow::lanes_scalar::wrap::kOps;
