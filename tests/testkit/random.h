#pragma once

#include <cstddef>
#include <cstdint>
#include <random>

namespace testkit {

/// The seed of this run: VIDSHOW_TEST_SEED if set, else a fixed one; printed with every failure.
uint32_t Seed();

/// A generator that starts from the seed and `salt`, so that tests do not share a sequence.
std::mt19937 Random(uint32_t salt);

/// Fills a block with random bytes; every eighth one or so is an extreme (0 or 255).
void FillSamples(std::mt19937& random, uint8_t* data, size_t bytes);

}  // namespace testkit
