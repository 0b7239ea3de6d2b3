// Which back end the vector kernels run on: chosen once per process, never per row.

#include <atomic>
#include <cstring>

#include "kernels/deint_backend.h"
#include "kernels/fused_backend.h"
#include "kernels/resample_backend.h"
#include "kernels/row_backend.h"
#include "kernels/vec_backend.h"

namespace vidshow {
namespace {

struct Candidate {
    const VectorBackend* backend;
    const DeintBackend* deinterlace;
    const RowBackend* rows;
    const FusedBackend* fused;
    const ResampleBackend* resample;
    bool (*fits)();  // whether this processor, and its system, can run it
};

bool Always() {
    return true;
}

// The processor's features are asked for by name; the init call makes that safe in the constructors
// of other static objects, too.
#ifdef VIDSHOW_VECTOR_AVX512
bool HasAvx512() {
    __builtin_cpu_init();
    return __builtin_cpu_supports("avx512bw");
}
#endif
#ifdef VIDSHOW_VECTOR_AVX2
bool HasAvx2() {
    __builtin_cpu_init();
    return __builtin_cpu_supports("avx2");
}
#endif
#ifdef VIDSHOW_VECTOR_SSE41
bool HasSse41() {
    __builtin_cpu_init();
    return __builtin_cpu_supports("sse4.1");
}
#endif

/// Best first; the last one runs everywhere.
constexpr Candidate kCandidates[] = {
#ifdef VIDSHOW_VECTOR_AVX512
    {&kAvx512Backend, &kAvx2Deint, &kAvx2Rows, &kAvx2Fused, &kAvx2Resample,
     HasAvx512},  // the others have no wider form
#endif
#ifdef VIDSHOW_VECTOR_AVX2
    {&kAvx2Backend, &kAvx2Deint, &kAvx2Rows, &kAvx2Fused, &kAvx2Resample, HasAvx2},
#endif
#ifdef VIDSHOW_VECTOR_SSE41
    {&kSse41Backend, &kSse41Deint, &kSse41Rows, &kSse41Fused, &kSse41Resample, HasSse41},
#endif
#ifdef VIDSHOW_VECTOR_NEON
    {&kNeonBackend, &kNeonDeint, &kNeonRows, &kNeonFused, &kNeonResample,
     Always},  // this build is for processors that have it
#endif
    {&kScalarBackend, &kScalarDeint, &kScalarRows, nullptr, nullptr, Always},
};

// Constant-initialised and plain to load, so that a kernel may be called while other static
// objects are still being made. Two threads that choose at once choose the same.
std::atomic<const VectorBackend*> g_active{nullptr};

const Candidate& ActiveCandidate() {
    const VectorBackend* const active = &ActiveVectorBackend();
    const Candidate* candidate = kCandidates;
    while (candidate->backend != active)
        ++candidate;
    return *candidate;
}

}  // namespace

const VectorBackend& ActiveVectorBackend() {
    const VectorBackend* backend = g_active.load(std::memory_order_relaxed);
    if (backend == nullptr) {
        const Candidate* candidate = kCandidates;
        while (!candidate->fits())
            ++candidate;
        backend = candidate->backend;
        g_active.store(backend, std::memory_order_relaxed);
    }
    return *backend;
}

const DeintBackend& ActiveDeintBackend() {
    return *ActiveCandidate().deinterlace;
}

const RowBackend& ActiveRowBackend() {
    return *ActiveCandidate().rows;
}

const ResampleBackend* ActiveResampleBackend() {
    return ActiveCandidate().resample;
}

const FusedBackend* ActiveFusedBackend() {
    return ActiveCandidate().fused;
}

const VectorBackend* FindVectorBackend(const char* name) {
    for (const Candidate& candidate : kCandidates) {
        if (std::strcmp(candidate.backend->name, name) != 0) continue;
        return candidate.fits() ? candidate.backend : nullptr;
    }
    return nullptr;
}

void UseVectorBackend(const VectorBackend* backend) {
    g_active.store(backend, std::memory_order_relaxed);
}

}  // namespace vidshow
