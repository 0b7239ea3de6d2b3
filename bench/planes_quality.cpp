// How good resized 4:2:0 pictures are: PSNR of each plane on real frames, beside bilinear
// resampling in floating point, libswscale's and libyuv's.
//
// usage: planes_quality video
//
// The truth of a larger picture is the frame itself, its source the frame made smaller in floating
// point; the truth of a smaller picture is the frame made smaller so. Our kernels align the corners
// of source and destination, the others their edges; each is measured in its own geometry.

#include <cstdlib>

#include "bench/ideal_resample.h"
#include "libyuv.h"
#include "vidshow/kernels.h"

extern "C" {
#include <libavutil/log.h>
#include <libswscale/swscale.h>
}

namespace {

using namespace bench;

struct Planes {
    PlaneF plane[3];
};

Planes Widen(const Frame420& frame) {
    return {
        {bench::Widen(frame.plane[0]), bench::Widen(frame.plane[1]), bench::Widen(frame.plane[2])}};
}

Planes Resized(const Frame420& frame, Size to, Geometry geometry, Filter filter) {
    const Axis x = LumaAxis(geometry, frame.plane[0].w, to.w);
    const Axis y = LumaAxis(geometry, frame.plane[0].h, to.h);
    Planes out = Widen(frame);
    out.plane[0] = Resample(out.plane[0], to, x, y, filter);
    for (int i = 1; i < 3; ++i) {
        out.plane[i] = Resample(out.plane[i], {to.w / 2, to.h / 2}, ChromaAtChroma(x),
                                ChromaAtChroma(y), filter);
    }
    return out;
}

/// Runs a resize into a frame of size `to`.
template <class Run>
Planes Run8(Frame420& frame, Size to, Run run) {
    Frame420 out;
    for (int i = 0; i < 3; ++i) {
        const int w = i ? to.w / 2 : to.w, h = i ? to.h / 2 : to.h;
        out.plane[i] = {w, h, std::vector<uint8_t>(static_cast<size_t>(w * h))};
    }
    run(Source(frame), Source(out));
    return Widen(out);
}

Planes Rsz(Frame420& frame, Size to) {
    return Run8(frame, to, [](const Source& from, const Source& out) {
        _QZYCbCr420Rsz(from.planes, from.strides, from.w, from.h, out.planes, out.strides, out.w,
                       out.h);
    });
}

Planes FloatingPoint(Frame420& frame, Size to) {
    return Resized(frame, to, Geometry::corners, Filter::bilinear);
}

Planes Swscale(Frame420& frame, Size to) {
    return Run8(frame, to, [](const Source& from, const Source& out) {
        SwsContext* context =
            sws_getContext(from.w, from.h, AV_PIX_FMT_YUV420P, out.w, out.h, AV_PIX_FMT_YUV420P,
                           SWS_BILINEAR | SWS_ACCURATE_RND, nullptr, nullptr, nullptr);
        const int fromStrides[3] = {from.w, from.w / 2, from.w / 2};
        const int outStrides[3] = {out.w, out.w / 2, out.w / 2};
        sws_scale(context, from.planes, fromStrides, 0, from.h, out.planes, outStrides);
        sws_freeContext(context);
    });
}

Planes Libyuv(Frame420& frame, Size to) {
    return Run8(frame, to, [](const Source& from, const Source& out) {
        libyuv::I420Scale(from.planes[0], from.w, from.planes[1], from.w / 2, from.planes[2],
                          from.w / 2, from.w, from.h, out.planes[0], out.w, out.planes[1],
                          out.w / 2, out.planes[2], out.w / 2, out.w, out.h,
                          libyuv::kFilterBilinear);
    });
}

struct Contender {
    const char* name;
    Geometry geometry;
    Planes (*run)(Frame420&, Size to);
};

const Contender kContenders[] = {
    {"Rsz", Geometry::corners, Rsz},
    {"bilinear, floating point", Geometry::corners, FloatingPoint},
    {"libswscale bilinear", Geometry::edges, Swscale},
    {"libyuv bilinear", Geometry::edges, Libyuv},
};
constexpr size_t kCount = sizeof kContenders / sizeof kContenders[0];

double SquaredError(const PlaneF& a, const PlaneF& b) {
    double sum = 0;
    for (size_t i = 0; i < a.samples.size(); ++i)
        sum += (a.samples[i] - b.samples[i]) * (a.samples[i] - b.samples[i]);
    return sum / static_cast<double>(a.samples.size());
}

/// Sums of mean squared errors, plane by plane.
struct Errors {
    double toTruth[3] = {};
    double toIdeal[3] = {};
};

void MeasureFrame(const Frame420& frame, Size from, Size to, Errors (&errors)[kCount]) {
    const bool enlarge = to.w == frame.plane[0].w;
    for (size_t c = 0; c < kCount; ++c) {
        const Geometry geometry = kContenders[c].geometry;
        Frame420 source = enlarge ? Smaller(frame, from, geometry) : frame;
        const Planes truth = enlarge ? Widen(frame) : Resized(frame, to, geometry, Filter::area);
        const Planes ideal = Resized(source, to, geometry, Filter::bilinear);
        const Planes result = kContenders[c].run(source, to);
        for (int i = 0; i < 3; ++i) {
            errors[c].toTruth[i] += SquaredError(result.plane[i], truth.plane[i]);
            errors[c].toIdeal[i] += SquaredError(result.plane[i], ideal.plane[i]);
        }
    }
}

void Measure(const std::vector<Frame420>& frames, Size from, Size to) {
    Errors errors[kCount];
    for (const Frame420& frame : frames)
        MeasureFrame(frame, from, to, errors);
    const double count = static_cast<double>(frames.size());
    for (size_t c = 0; c < kCount; ++c) {
        std::printf("| %dx%d to %dx%d | %s |", from.w, from.h, to.w, to.h, kContenders[c].name);
        for (double error : errors[c].toTruth)
            std::printf(" %.2f |", Psnr(error / count));
        for (double error : errors[c].toIdeal)
            std::printf(" %.2f |", Psnr(error / count));
        std::printf("\n");
    }
    std::fflush(stdout);
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: planes_quality video\n");
        return 2;
    }
    const std::vector<Frame420> frames = ReadFrames(argv[1], 8);
    if (frames.empty()) {
        std::fprintf(stderr, "planes_quality: no 4:2:0 frames in %s\n", argv[1]);
        return 1;
    }
    av_log_set_level(AV_LOG_ERROR);
    const Size full{frames[0].plane[0].w, frames[0].plane[0].h};
    const auto part = [&](int times, int of) {
        return Size{full.w * times / of / 4 * 4, full.h * times / of / 4 * 4};
    };
    std::printf("| resize | by | Y | Cb | Cr | Y to ideal | Cb to ideal | Cr to ideal |\n");
    std::printf("|---|---|--:|--:|--:|--:|--:|--:|\n");
    for (const auto& [times, of] : {std::pair(1, 2), std::pair(2, 3), std::pair(9, 10)})
        Measure(frames, part(times, of), full);
    for (const auto& [times, of] : {std::pair(9, 10), std::pair(2, 3), std::pair(1, 2)})
        Measure(frames, full, part(times, of));
    return 0;
}
