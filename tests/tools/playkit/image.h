#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "playkit/reference.h"

namespace playkit {

struct Rgb {
    int red;
    int green;
    int blue;
};

/// A picture of 24-bit RGB.
struct Image {
    int width = 0;
    int height = 0;
    std::vector<uint8_t> bytes;

    Rgb at(int x, int y) const;
};

/// Reads a PNG file; a failure fails the test.
Image readPng(const std::string& path);

/// The share of red and blue in luma, from which a matrix follows.
struct Weights {
    double red;
    double blue;
};
constexpr Weights kBt601 = {0.299, 0.114};
constexpr Weights kBt709 = {0.2126, 0.0722};
constexpr Weights kSmpte240m = {0.212, 0.087};
constexpr Weights kFcc = {0.30, 0.11};

/// The colour of one pixel by the matrix's definition, where chroma does not change around it.
Rgb colourAt(const RawFrame& frame, int x, int y, const Weights& weights, bool fullRange = false);

/// Fails the test when a channel is further off than this.
void expectNear(const Rgb& shown, const Rgb& expected, int tolerance);

}  // namespace playkit
