#include "testkit/random.h"

#include <gtest/gtest.h>

#include <cstdlib>

namespace testkit {

namespace {

class SeedPrinter : public testing::EmptyTestEventListener {
    void OnTestPartResult(const testing::TestPartResult& result) override {
        if (result.failed()) std::printf("(rerun with VIDSHOW_TEST_SEED=%u)\n", Seed());
    }
};

}  // namespace

uint32_t Seed() {
    static const uint32_t seed = [] {
        testing::UnitTest::GetInstance()->listeners().Append(new SeedPrinter);
        const char* text = std::getenv("VIDSHOW_TEST_SEED");
        return text ? static_cast<uint32_t>(std::strtoul(text, nullptr, 0)) : 20261121u;
    }();
    return seed;
}

std::mt19937 Random(uint32_t salt) {
    std::seed_seq sequence{Seed(), salt};
    return std::mt19937(sequence);
}

void FillSamples(std::mt19937& random, uint8_t* data, size_t bytes) {
    for (size_t i = 0; i < bytes; ++i) {
        const uint32_t bits = static_cast<uint32_t>(random());
        const bool extreme = (bits & 0x700) == 0;
        data[i] = static_cast<uint8_t>(extreme ? (bits & 1) * 255 : bits >> 16);
    }
}

}  // namespace testkit
