#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace playkit {

/// A frame's three planes without padding.
struct RawFrame {
    int width;
    int height;
    std::vector<uint8_t> planes[3];
};

/// Decodes a clip of 8-bit planar 4:2:0 by FFmpeg's libraries, on its own, without the player.
std::vector<RawFrame> decodeAll(const std::string& path);

}  // namespace playkit
