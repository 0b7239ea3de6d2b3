#pragma once

// Progressive clips to weave fields from: their own frames are the truth that a deinterlaced
// picture is held against.

#include <cstdint>
#include <string>
#include <vector>

namespace bench {

struct Plane {
    Plane(int width, int height, uint8_t level = 0)
        : w(width),
          h(height),
          bytes(static_cast<size_t>(width) * static_cast<size_t>(height), level) {}

    uint8_t* line(int y) { return bytes.data() + static_cast<size_t>(y) * static_cast<size_t>(w); }
    const uint8_t* line(int y) const {
        return bytes.data() + static_cast<size_t>(y) * static_cast<size_t>(w);
    }

    int w, h;
    std::vector<uint8_t> bytes;
};

/// Luma, frame by frame.
struct Clip {
    std::string name;
    std::vector<Plane> frames;

    int width() const { return frames.at(0).w; }
    int height() const { return frames.at(0).h; }
    int pictures() const { return static_cast<int>(frames.size() / 2); }

    const Plane& truth(int picture) const { return frames[static_cast<size_t>(picture) * 2]; }
    const Plane& other(int picture) const { return frames[static_cast<size_t>(picture) * 2 + 1]; }
    /// Top lines of frame 2t, bottom lines of frame 2t + 1.
    Plane woven(int picture) const;
};

/// A page of small print and a fan of thin lines, moving slowly: 3/4 of a sample across and 1/4 of
/// one down in every frame.
Clip SlowPan();

/// Discs and a slanted bar, 9 to 17 samples a frame, in front of a background that moves, too.
Clip FastMotion();

}  // namespace bench
