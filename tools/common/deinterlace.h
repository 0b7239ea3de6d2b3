#pragma once

#include <array>
#include <cstdint>

namespace vidshow::tools {

/// The presenter's deinterlace modes: a name's place is the mode's number.
constexpr std::array<const char*, 8> kDeinterlaceNames = {"off",   "fast", "discard", "bob",
                                                          "blend", "mean", "linear",  "x"};
constexpr uint32_t kDeinterlaceOff = 0;

}  // namespace vidshow::tools
