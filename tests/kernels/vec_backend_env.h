#pragma once

// Runs a whole test program on the vector back end that VIDSHOW_VECTOR_BACKEND names; without it,
// on the one that the library would choose. CTest starts these programs once for every back end.

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

#include "kernels/vec_backend.h"

namespace vec_test {

class ChosenBackend : public testing::Environment {
  public:
    void SetUp() override {
        const char* const name = std::getenv("VIDSHOW_VECTOR_BACKEND");
        if (name == nullptr) return;
        const vidshow::VectorBackend* const backend = vidshow::FindVectorBackend(name);
        if (backend == nullptr) GTEST_SKIP() << "this processor cannot run " << name;
        vidshow::UseVectorBackend(backend);
    }
};

/// Whether this run is one of those that try every sample: the library's choice and the plain form.
/// Back ends in between have the same operations tried one by one.
inline bool TriesEverySample() {
    const char* const name = std::getenv("VIDSHOW_VECTOR_BACKEND");
    return name == nullptr || std::string(name) == "scalar";
}

inline testing::Environment* const g_chosen = testing::AddGlobalTestEnvironment(new ChosenBackend);

}  // namespace vec_test
