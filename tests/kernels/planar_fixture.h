#pragma once

// Pictures of three planes for direct calls of kernels: sources and destinations between unmapped
// pages, and where a turn puts a pixel.

#include <string>

#include "kernels/kernel_fixture.h"

namespace kernel_test {

inline std::string PlacementName(Placement placement) {
    return placement == Placement::end ? "end" : "start";
}

/// Sizes of the luma plane and of both chroma planes.
struct PlaneSizes {
    int32_t w, h;
    int32_t cw, ch;

    int32_t Width(int plane) const { return plane == 0 ? w : cw; }
    int32_t Height(int plane) const { return plane == 0 ? h : ch; }
};

/// 4:2:0, odd sizes rounded up, or down.
inline PlaneSizes Sizes420(int32_t w, int32_t h) {
    return {w, h, (w + 1) / 2, (h + 1) / 2};
}
inline PlaneSizes Sizes420Down(int32_t w, int32_t h) {
    return {w, h, w / 2, h / 2};
}

/// Random samples; each plane's rows have their own padding.
class Source {
  public:
    Source(std::mt19937& random, const PlaneSizes& size, Padding pad, Placement placement)
        : plane{Plane(random, size.w, size.h, Stride(size.w, pad[0]), placement),
                Plane(random, size.cw, size.ch, Stride(size.cw, pad[1]), placement),
                Plane(random, size.cw, size.ch, Stride(size.cw, pad[2]), placement)},
          planes{plane[0].data(), plane[1].data(), plane[2].data()},
          strides{plane[0].stride(), plane[1].stride(), plane[2].stride()} {}

    Plane plane[3];
    uint8_t* planes[3];
    uint32_t strides[3];

  private:
    static uint32_t Stride(int32_t width, uint32_t pad) {
        return static_cast<uint32_t>(width) + pad;
    }
};

/// Three planes to be written. `Expect` says what belongs into a sample; `Check` compares every
/// byte of all three, the ones between the rows included.
class Target {
  public:
    Target(std::mt19937& random, const PlaneSizes& size, Padding pad, Placement placement)
        : plane{Make(random, size.w, size.h, pad[0], placement),
                Make(random, size.cw, size.ch, pad[1], placement),
                Make(random, size.cw, size.ch, pad[2], placement)},
          planes{plane[0].data(), plane[1].data(), plane[2].data()},
          strides{plane[0].stride(), plane[1].stride(), plane[2].stride()} {}

    void Expect(int i, int32_t x, int32_t y, uint32_t sample) { plane[i].Expect(x, y, sample, 1); }

    testing::AssertionResult Check() const {
        for (int i = 0; i < 3; ++i) {
            const testing::AssertionResult result = plane[i].Check();
            if (!result) return testing::AssertionResult(result) << " in plane " << i;
        }
        return testing::AssertionSuccess();
    }

    Canvas plane[3];
    uint8_t* planes[3];
    uint32_t strides[3];

  private:
    static Canvas Make(std::mt19937& random, int32_t w, int32_t h, uint32_t pad,
                       Placement placement) {
        const uint32_t stride = static_cast<uint32_t>(w) + pad;
        return h < 1 ? Canvas(random, 0, 1, stride, placement)
                     : Canvas(random, w, h, stride, placement);
    }
};

/// A column and a row.
struct Spot {
    int32_t x, y;
};

/// Where pixel (x, y) of a w x h picture goes: what the six types mean, one by one.
inline Spot Turned(uint32_t type, Spot at, int32_t w, int32_t h) {
    switch (type) {
        case QZ_IMAGEPROC_ROTATE_90AC:
            return {at.y, w - 1 - at.x};
        case QZ_IMAGEPROC_ROTATE_90C:
            return {h - 1 - at.y, at.x};
        case QZ_IMAGEPROC_ROTATE_180:
            return {w - 1 - at.x, h - 1 - at.y};
        case QZ_IMAGEPROC_ROTATE_MIRROR_H:
            return {w - 1 - at.x, at.y};
        case QZ_IMAGEPROC_ROTATE_MIRROR_V:
            return {at.x, h - 1 - at.y};
        default:
            return at;
    }
}

inline bool IsQuarterTurn(uint32_t type) {
    return type == QZ_IMAGEPROC_ROTATE_90AC || type == QZ_IMAGEPROC_ROTATE_90C;
}

}  // namespace kernel_test
