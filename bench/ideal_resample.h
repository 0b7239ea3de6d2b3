#pragma once

// Resampling in floating point, for judging pictures: between the two nearest samples, or with a
// triangle as wide as the new pixels, which is how a smaller picture is made well.

#include <algorithm>
#include <cmath>

#include "bench/video_frames.h"

namespace bench {

struct Size {
    int w, h;
};

struct PlaneF {
    int w = 0;
    int h = 0;
    std::vector<double> samples;

    double at(int x, int y) const {
        return samples[static_cast<size_t>(y) * static_cast<size_t>(w) + static_cast<size_t>(x)];
    }
};

/// Output i lies at scale * i + offset of the input.
struct Axis {
    double scale, offset;
};

enum class Geometry { corners, edges };

inline Axis LumaAxis(Geometry geometry, int from, int to) {
    if (geometry == Geometry::corners) return {(from - 1.0) / (to - 1.0), 0};
    const double scale = static_cast<double>(from) / to;
    return {scale, (scale - 1) / 2};
}

/// The chroma sample k of a plane lies between luma samples 2k and 2k + 1. From a luma position to
/// one in the chroma plane, per output luma sample or per output chroma sample.
inline Axis ChromaAtLuma(Axis luma) {
    return {luma.scale / 2, (luma.offset - 0.5) / 2};
}
inline Axis ChromaAtChroma(Axis luma) {
    return {luma.scale, (luma.scale * 0.5 + luma.offset - 0.5) / 2};
}

/// Triangle-weighted resampling along x; `half` is the triangle's half width in input samples.
inline PlaneF ResampleRows(const PlaneF& in, int w, Axis axis, double half) {
    PlaneF out{w, in.h, {}};
    for (int y = 0; y < in.h; ++y) {
        for (int x = 0; x < w; ++x) {
            const double at = std::clamp(axis.scale * x + axis.offset, 0.0, in.w - 1.0);
            double sum = 0, weights = 0;
            for (int i = static_cast<int>(std::ceil(at - half)); i <= at + half; ++i) {
                const double weight = 1 - std::abs(at - i) / half;
                sum += weight * in.at(std::clamp(i, 0, in.w - 1), y);
                weights += weight;
            }
            out.samples.push_back(sum / weights);
        }
    }
    return out;
}

inline PlaneF Transpose(const PlaneF& in) {
    PlaneF out{in.h, in.w, {}};
    for (int x = 0; x < in.w; ++x) {
        for (int y = 0; y < in.h; ++y)
            out.samples.push_back(in.at(x, y));
    }
    return out;
}

/// How wide the triangle is: one sample on each side, or as wide as the new pixels.
enum class Filter { bilinear, area };

inline PlaneF Resample(const PlaneF& in, Size to, Axis x, Axis y, Filter filter) {
    const auto half = [&](Axis axis) {
        return filter == Filter::area ? std::max(1.0, axis.scale) : 1.0;
    };
    const PlaneF wide = ResampleRows(in, to.w, x, half(x));
    return Transpose(ResampleRows(Transpose(wide), to.h, y, half(y)));
}

inline PlaneF Widen(const Plane8& in) {
    PlaneF out{in.w, in.h, {}};
    out.samples.assign(in.samples.begin(), in.samples.end());
    return out;
}

inline Plane8 Round(const PlaneF& in) {
    Plane8 out{in.w, in.h, {}};
    for (double s : in.samples)
        out.samples.push_back(static_cast<uint8_t>(std::lround(s)));
    return out;
}

/// A frame made smaller, chroma kept between its luma samples.
inline Frame420 Smaller(const Frame420& frame, Size to, Geometry geometry) {
    const Axis x = LumaAxis(geometry, frame.plane[0].w, to.w);
    const Axis y = LumaAxis(geometry, frame.plane[0].h, to.h);
    Frame420 out;
    out.plane[0] = Round(Resample(Widen(frame.plane[0]), to, x, y, Filter::area));
    for (int i = 1; i < 3; ++i) {
        out.plane[i] = Round(Resample(Widen(frame.plane[i]), {to.w / 2, to.h / 2},
                                      ChromaAtChroma(x), ChromaAtChroma(y), Filter::area));
    }
    return out;
}

/// A frame's planes as the kernels take them.
struct Source {
    explicit Source(Frame420& frame) {
        for (int i = 0; i < 3; ++i) {
            planes[i] = frame.plane[i].samples.data();
            strides[i] = static_cast<uint32_t>(frame.plane[i].w);
        }
        w = frame.plane[0].w;
        h = frame.plane[0].h;
    }

    uint8_t* planes[3];
    uint32_t strides[3];
    int w, h;
};

inline double Psnr(double error) {
    return error == 0 ? INFINITY : 10 * std::log10(255 * 255 / error);
}

}  // namespace bench
