// Which back end the vector kernels run on: chosen once per process, never per row.

#include <atomic>
#include <cstring>

#include "kernels/vec_backend.h"

namespace vidshow {
namespace {

struct Candidate {
    const VectorBackend* backend;
    bool (*fits)();  // whether this processor, and its system, can run it
};

bool Always() {
    return true;
}

/// Best first; the last one runs everywhere.
constexpr Candidate kCandidates[] = {
    {&kScalarBackend, Always},
};

// Constant-initialised and plain to load, so that a kernel may be called while other static
// objects are still being made. Two threads that choose at once choose the same.
std::atomic<const VectorBackend*> g_active{nullptr};

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

bool ForceVectorBackend(const char* name) {
    for (const Candidate& candidate : kCandidates) {
        if (std::strcmp(candidate.backend->name, name) != 0) continue;
        if (!candidate.fits()) return false;
        g_active.store(candidate.backend, std::memory_order_relaxed);
        return true;
    }
    return false;
}

}  // namespace vidshow
