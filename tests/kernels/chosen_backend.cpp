// Linked into test programs that know nothing of back ends, so that CTest can start them once for
// each.
#include "kernels/vec_backend_env.h"
