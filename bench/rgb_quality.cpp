// How good the resized pictures are: PSNR of the table-driven resizes on real frames, beside
// bilinear resampling in floating point and libswscale's.
//
// usage: rgb_quality video
//
// The truth is made in floating point from the full frame: chroma interpolated, converted to RGB,
// and for a smaller picture filtered with a triangle as wide as the new pixels. For a larger
// picture the source is the frame made smaller in that way. The kernels align the corners of source
// and destination, libswscale their edges; each is measured against a truth in its own geometry.
// RGB565 counts as what a display makes of it: top bits repeated below.

#include <algorithm>
#include <cmath>
#include <cstdlib>

#include "bench/ideal_resample.h"
#include "vidshow/kernels.h"

extern "C" {
#include <libswscale/swscale.h>
}

namespace {

using namespace bench;

struct Rgb {
    PlaneF channel[3];  // red, green, blue
};

/// BT.601, limited range.
Rgb ToRgb(const PlaneF& y, const PlaneF& cb, const PlaneF& cr) {
    Rgb rgb;
    for (PlaneF& channel : rgb.channel)
        channel = {y.w, y.h, {}};
    for (size_t i = 0; i < y.samples.size(); ++i) {
        const double luma = 1.1644 * (y.samples[i] - 16);
        const double blue = cb.samples[i] - 128, red = cr.samples[i] - 128;
        const double value[3] = {luma + 1.596 * red, luma - 0.3918 * blue - 0.813 * red,
                                 luma + 2.0172 * blue};
        for (int c = 0; c < 3; ++c) {
            rgb.channel[c].samples.push_back(std::clamp(value[c], 0.0, 255.0));
        }
    }
    return rgb;
}

/// Bilinear in floating point, planes first, RGB after.
Rgb IdealBilinear(const Frame420& frame, Size to, Geometry geometry) {
    const Plane8& luma = frame.plane[0];
    const Axis x = LumaAxis(geometry, luma.w, to.w), y = LumaAxis(geometry, luma.h, to.h);
    PlaneF planes[3];
    planes[0] = Resample(Widen(luma), to, x, y, Filter::bilinear);
    for (int i = 1; i < 3; ++i) {
        planes[i] =
            Resample(Widen(frame.plane[i]), to, ChromaAtLuma(x), ChromaAtLuma(y), Filter::bilinear);
    }
    return ToRgb(planes[0], planes[1], planes[2]);
}

Rgb Truth(const Frame420& frame, Size to, Geometry geometry) {
    const Size full{frame.plane[0].w, frame.plane[0].h};
    Rgb rgb = IdealBilinear(frame, full, Geometry::edges);
    const Axis x = LumaAxis(geometry, full.w, to.w), y = LumaAxis(geometry, full.h, to.h);
    for (PlaneF& channel : rgb.channel)
        channel = Resample(channel, to, x, y, Filter::area);
    return rgb;
}

Rgb FromArgb32(const std::vector<uint8_t>& bytes, Size size) {
    Rgb rgb;
    for (int c = 0; c < 3; ++c) {
        rgb.channel[c] = {size.w, size.h, {}};
        for (size_t i = 0; i < bytes.size(); i += 4) {
            rgb.channel[c].samples.push_back(bytes[i + 2 - static_cast<size_t>(c)]);
        }
    }
    return rgb;
}

Rgb FromRgb565(const std::vector<uint8_t>& bytes, Size size) {
    Rgb rgb;
    for (PlaneF& channel : rgb.channel)
        channel = {size.w, size.h, {}};
    for (size_t i = 0; i < bytes.size(); i += 2) {
        const int pixel = bytes[i] | bytes[i + 1] << 8;
        const int red = pixel >> 11, green = pixel >> 5 & 63, blue = pixel & 31;
        rgb.channel[0].samples.push_back(red << 3 | red >> 2);
        rgb.channel[1].samples.push_back(green << 2 | green >> 4);
        rgb.channel[2].samples.push_back(blue << 3 | blue >> 2);
    }
    return rgb;
}

double SquaredError(const Rgb& a, const Rgb& b) {
    double sum = 0;
    for (int c = 0; c < 3; ++c) {
        const auto& x = a.channel[c].samples;
        const auto& y = b.channel[c].samples;
        for (size_t i = 0; i < x.size(); ++i)
            sum += (x[i] - y[i]) * (x[i] - y[i]) / 3;
    }
    return sum / static_cast<double>(a.channel[0].samples.size());
}

/// What the kernels need: tables and line buffers.
class Processor {
  public:
    explicit Processor(int width) {
        set_transtable(csc_coef[0], m_luma, m_cb, m_cr, 128, 128, 128);
        set.pTransLuma = m_luma;
        set.pTransCb = m_cb;
        set.pTransCr = m_cr;
        const size_t line = static_cast<size_t>(width) + 4;
        m_lines.resize(4 * line);
        for (size_t i = 0; i < 4; ++i)
            set.pLines[i] = &m_lines[i * line];
    }

    QZ_IMAGEPROC_PARAMSET set{};

  private:
    uint16_t m_luma[256];
    uint32_t m_cb[256];
    uint32_t m_cr[256];
    std::vector<uint32_t> m_lines;
};

enum class Depth { rgb565, argb32 };

template <class Run>
Rgb Packed(Depth depth, Size to, Run run) {
    const int bytes = depth == Depth::rgb565 ? 2 : 4;
    std::vector<uint8_t> out(static_cast<size_t>(to.w) * static_cast<size_t>(to.h * bytes));
    run(out.data(), static_cast<uint32_t>(to.w * bytes));
    return depth == Depth::rgb565 ? FromRgb565(out, to) : FromArgb32(out, to);
}

Rgb Rsz(Frame420& frame, Size to, Depth depth) {
    Processor p(std::max(frame.plane[0].w, to.w));
    Source s(frame);
    return Packed(depth, to, [&](uint8_t* out, uint32_t stride) {
        if (depth == Depth::rgb565) {
            _QZYCbCr420ToRGB565Rsz(&p.set, s.planes, s.strides, s.w, s.h, out, stride, to.w, to.h);
        } else {
            _QZYCbCr420ToARGB32Rsz(&p.set, s.planes, s.strides, s.w, s.h, out, stride, to.w, to.h,
                                   255);
        }
    });
}

Rgb RszUp(Frame420& frame, Size to, Depth depth) {
    Processor p(std::max(frame.plane[0].w, to.w));
    Source s(frame);
    return Packed(depth, to, [&](uint8_t* out, uint32_t stride) {
        if (depth == Depth::rgb565) {
            _QZYCbCr420ToRGB565RszUp(&p.set, p.set.pLines, s.planes, s.strides, s.w, s.h, out,
                                     stride, to.w, to.h);
        } else {
            _QZYCbCr420ToARGB32RszUp(&p.set, p.set.pLines, s.planes, s.strides, s.w, s.h, out,
                                     stride, to.w, to.h, 255);
        }
    });
}

bool IsCase3(Size from, Size to) {
    return from.w == 320 && from.h == 240 && to.w == 480 && to.h == 272;
}
bool IsCase2(Size from, Size to) {
    return 2 * to.w == 3 * from.w;
}
bool IsCase1(Size from, Size to) {
    return 2 * to.w == 5 * from.w && to.h == 2 * from.h;
}

/// The fixed-ratio kernel of these sizes.
Rgb FixedRatio(Frame420& frame, Size to, Depth) {
    for (Plane8& plane : frame.plane) {  // Case1 reads on behind the source
        plane.samples.insert(plane.samples.end(), plane.samples.end() - 2 * plane.w,
                             plane.samples.end());
    }
    Processor p(std::max(frame.plane[0].w, to.w));
    Source s(frame);
    return Packed(Depth::rgb565, to, [&](uint8_t* out, uint32_t stride) {
        if (IsCase3({s.w, s.h}, to)) {
            _QZYCbCr420ToRGB565Case3(&p.set, p.set.pLines[0], p.set.pLines[1], s.planes, s.strides,
                                     out, stride);
        } else if (IsCase2({s.w, s.h}, to)) {
            _QZYCbCr420ToRGB565Case2(&p.set, p.set.pLines, s.planes, s.strides, s.w, s.h, out,
                                     stride, to.h);
        } else {
            _QZYCbCr420ToRGB565Case1(&p.set, p.set.pLines, s.planes, s.strides, s.w, out, stride,
                                     to.h);
        }
    });
}

bool HasFixedRatio(Size from, Size to) {
    return IsCase1(from, to) || IsCase2(from, to) || IsCase3(from, to);
}

Rgb Swscale(Frame420& frame, Size to, Depth depth) {
    Source s(frame);
    return Packed(depth, to, [&](uint8_t* out, uint32_t stride) {
        SwsContext* context = sws_getContext(
            s.w, s.h, AV_PIX_FMT_YUV420P, to.w, to.h,
            depth == Depth::rgb565 ? AV_PIX_FMT_RGB565LE : AV_PIX_FMT_BGRA,
            depth == Depth::rgb565 ? SWS_BILINEAR | SWS_ACCURATE_RND
                                   : SWS_BILINEAR | SWS_ACCURATE_RND | SWS_FULL_CHR_H_INT,
            nullptr, nullptr, nullptr);
        const int strides[3] = {s.w, s.w / 2, s.w / 2};
        uint8_t* planes[1] = {out};
        const int outStride = static_cast<int>(stride);
        sws_scale(context, s.planes, strides, 0, s.h, planes, &outStride);
        sws_freeContext(context);
    });
}

/// One way to resize, in the geometry that it follows.
struct Contender {
    const char* name;
    Geometry geometry;
    Depth depth;
    Rgb (*run)(Frame420&, Size to, Depth);
    bool (*fits)(Size from, Size to);
};

bool Always(Size, Size) {
    return true;
}

Rgb FloatingPoint(Frame420& frame, Size to, Depth) {
    return IdealBilinear(frame, to, Geometry::corners);
}

const Contender kContenders[] = {
    {"Rsz, ARGB32", Geometry::corners, Depth::argb32, Rsz, Always},
    {"RszUp, ARGB32", Geometry::corners, Depth::argb32, RszUp, Always},
    {"bilinear, floating point", Geometry::corners, Depth::argb32, FloatingPoint, Always},
    {"libswscale bilinear, ARGB32", Geometry::edges, Depth::argb32, Swscale, Always},
    {"Rsz, RGB565", Geometry::corners, Depth::rgb565, Rsz, Always},
    {"RszUp, RGB565", Geometry::corners, Depth::rgb565, RszUp, Always},
    {"fixed ratio, RGB565", Geometry::corners, Depth::rgb565, FixedRatio, HasFixedRatio},
    {"libswscale bilinear, RGB565", Geometry::edges, Depth::rgb565, Swscale, Always},
};
constexpr size_t kCount = sizeof kContenders / sizeof kContenders[0];

/// A frame at one size, and what it should become, in one geometry.
struct Task {
    Task(const Frame420& frame, Size from, Size to, Geometry geometry)
        : source(frame.plane[0].w == from.w ? frame : Smaller(frame, from, geometry)),
          truth(Truth(frame, to, geometry)),
          ideal(IdealBilinear(source, to, geometry)) {}

    Frame420 source;
    Rgb truth;
    Rgb ideal;
};

/// Measures every contender from `from` (the frame's own size, or smaller) to `to`.
void Measure(const std::vector<Frame420>& frames, Size from, Size to) {
    double toTruth[kCount] = {}, toIdeal[kCount] = {};
    const double part = 1.0 / static_cast<double>(frames.size());
    for (const Frame420& frame : frames) {
        const Task tasks[] = {{frame, from, to, Geometry::corners},
                              {frame, from, to, Geometry::edges}};
        for (size_t i = 0; i < kCount; ++i) {
            const Contender& c = kContenders[i];
            if (!c.fits(from, to)) continue;
            const Task& task = tasks[c.geometry == Geometry::edges];
            Frame420 source = task.source;
            const Rgb result = c.run(source, to, c.depth);
            toTruth[i] += SquaredError(result, task.truth) * part;
            toIdeal[i] += SquaredError(result, task.ideal) * part;
        }
    }
    for (size_t i = 0; i < kCount; ++i) {
        if (!kContenders[i].fits(from, to)) continue;
        std::printf("| %dx%d to %dx%d | %s | %.2f | %.2f |\n", from.w, from.h, to.w, to.h,
                    kContenders[i].name, Psnr(toTruth[i]), Psnr(toIdeal[i]));
    }
    std::fflush(stdout);
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: rgb_quality video\n");
        return 2;
    }
    const std::vector<Frame420> frames = bench::ReadFrames(argv[1], 8);
    if (frames.empty()) {
        std::fprintf(stderr, "rgb_quality: no 4:2:0 frames in %s\n", argv[1]);
        return 1;
    }
    av_log_set_level(AV_LOG_ERROR);
    const Size full{frames[0].plane[0].w, frames[0].plane[0].h};
    const auto part = [&](int times, int of) {
        return Size{full.w * times / of / 4 * 4, full.h * times / of / 4 * 4};
    };
    std::printf("| resize | by | dB to the truth | dB to floating-point bilinear |\n");
    std::printf("|---|---|--:|--:|\n");
    Measure(frames, part(1, 2), full);
    Measure(frames, part(2, 3), full);
    Measure(frames, {304, 288}, {760, 576});
    Measure(frames, {320, 240}, {480, 272});
    Measure(frames, full, part(1, 2));
    Measure(frames, full, part(2, 3));
    return 0;
}
