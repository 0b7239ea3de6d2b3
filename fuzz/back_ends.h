#pragma once

#include <cstdint>
#include <utility>
#include <vector>

#include "fuzz/bytes.h"
#include "kernels/vec_backend.h"

namespace fuzz {

/// The back ends that are built in and run on this processor; the plain one first.
inline std::vector<const vidshow::VectorBackend*> BackEnds() {
    std::vector<const vidshow::VectorBackend*> all;
    for (const char* name : {"scalar", "sse41", "avx2", "avx512", "neon"}) {
        if (const auto* const backend = vidshow::FindVectorBackend(name)) all.push_back(backend);
    }
    return all;
}

/// Calls `run`, which returns the bytes that it made, on every back end. Aborts if they differ.
template <typename Run>
void RequireSameBytes(Run run) {
    static const auto backEnds = BackEnds();
    std::vector<uint8_t> plain;
    for (const vidshow::VectorBackend* backEnd : backEnds) {
        vidshow::UseVectorBackend(backEnd);
        std::vector<uint8_t> made = run();
        if (backEnd == backEnds.front()) {
            plain = std::move(made);
        } else {
            Require(made == plain, "every back end makes the same bytes");
        }
    }
}

}  // namespace fuzz
