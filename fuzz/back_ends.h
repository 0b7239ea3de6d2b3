#pragma once

#include <vector>

#include "kernels/vec_backend.h"

namespace fuzz {

/// The back ends that are built in and run on this processor; the plain one first.
inline std::vector<const vidshow::VectorBackend*> BackEnds() {
    std::vector<const vidshow::VectorBackend*> all;
    for (const char* name : {
             "scalar",
#ifdef VIDSHOW_VECTOR_SSE41
             "sse41",
#endif
#ifdef VIDSHOW_VECTOR_AVX2
             "avx2",
#endif
#ifdef VIDSHOW_VECTOR_NEON
             "neon",
#endif
         }) {
        if (const auto* const backend = vidshow::FindVectorBackend(name)) all.push_back(backend);
    }
    return all;
}

}  // namespace fuzz
