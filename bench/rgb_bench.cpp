// The table-driven 4:2:0 to RGB kernels beside libswscale and libyuv, each with its vector code and
// without it, on the same pictures in the same run.
//
// usage: rgb_bench [substring of the row's name]

#include <cstdlib>

#include "bench/rgb_contenders.h"

namespace {

using namespace bench;

std::vector<Job> SameSizeJobs(Size size) {
    const auto job = [=](const char* name, Format format, uint32_t rotation, auto run) {
        return Job{name, format, size, size, rotation, SWS_POINT, libyuv::kFilterNone, run};
    };
    return {
        job("RGB565", kRgb565, 0, [](Ours& o) { _QZYCbCr420ToRGB565(PLAIN(o), OUT(o)); }),
        job("RGB5551", kRgb5551, 0, [](Ours& o) { _QZYCbCr420ToRGB555(PLAIN(o), OUT(o), 1); }),
        job("RGB888", kRgb888, 0, [](Ours& o) { _QZYCbCr420ToRGB888(PLAIN(o), OUT(o)); }),
        job("ARGB32", kArgb32, 0, [](Ours& o) { _QZYCbCr420ToARGB32(PLAIN(o), OUT(o), kAlpha); }),
        job("RGB565Rot", kRgb565, 2, [](Ours& o) { _QZYCbCr420ToRGB565Rot(PLAIN(o)); }),
        job("RGB888Rot", kRgb888, 2, [](Ours& o) { _QZYCbCr420ToRGB888Rot(PLAIN(o)); }),
        job("ARGB32Rot", kArgb32, 2, [](Ours& o) { _QZYCbCr420ToARGB32Rot(PLAIN(o), kAlpha); }),
    };
}

std::vector<Job> ResizeJobs(Size in, Size out) {
    const auto job = [=](const char* name, Format format, uint32_t rotation, auto run) {
        return Job{name, format, in, out, rotation, SWS_BILINEAR, libyuv::kFilterBilinear, run};
    };
    return {
        job("RGB565Rsz", kRgb565, 0,
            [](Ours& o) { _QZYCbCr420ToRGB565Rsz(PLAIN(o), OUT(o), o.to.w, o.to.h); }),
        job("RGB888Rsz", kRgb888, 0,
            [](Ours& o) { _QZYCbCr420ToRGB888Rsz(PLAIN(o), OUT(o), o.to.w, o.to.h); }),
        job("ARGB32Rsz", kArgb32, 0,
            [](Ours& o) { _QZYCbCr420ToARGB32Rsz(PLAIN(o), OUT(o), o.to.w, o.to.h, kAlpha); }),
        job("RGB565RszRot", kRgb565, 2,
            [](Ours& o) { _QZYCbCr420ToRGB565RszRot(PLAIN(o), o.to.w, o.to.h); }),
        job("RGB888RszRot", kRgb888, 2,
            [](Ours& o) { _QZYCbCr420ToRGB888RszRot(PLAIN(o), o.to.w, o.to.h); }),
        job("ARGB32RszRot", kArgb32, 2,
            [](Ours& o) { _QZYCbCr420ToARGB32RszRot(PLAIN(o), o.to.w, o.to.h, kAlpha); }),
    };
}

std::vector<Job> EnlargeJobs(Size in, Size out) {
    const auto job = [=](const char* name, Format format, uint32_t rotation, auto run) {
        return Job{name, format, in, out, rotation, SWS_BILINEAR, libyuv::kFilterBilinear, run};
    };
    const auto nearest = [=](const char* name, auto run) {
        return Job{name, kRgb565, in, out, 0, SWS_POINT, libyuv::kFilterNone, run};
    };
    return {
        job("RGB565RszUp", kRgb565, 0,
            [](Ours& o) { _QZYCbCr420ToRGB565RszUp(LINES(o), o.from.h, OUT(o), o.to.w, o.to.h); }),
        job("RGB888RszUp", kRgb888, 0,
            [](Ours& o) { _QZYCbCr420ToRGB888RszUp(LINES(o), o.from.h, OUT(o), o.to.w, o.to.h); }),
        job("ARGB32RszUp", kArgb32, 0,
            [](Ours& o) {
                _QZYCbCr420ToARGB32RszUp(LINES(o), o.from.h, OUT(o), o.to.w, o.to.h, kAlpha);
            }),
        job("RGB565RszUpRot", kRgb565, 2,
            [](Ours& o) {
                _QZYCbCr420ToRGB565RszUpRot(
                    LINES(o), o.from.h, reinterpret_cast<void*>(o.walker.word[2]),
                    static_cast<int32_t>(o.walker.word[1] / 2),
                    static_cast<int32_t>(o.walker.word[0] / 2), o.to.w, o.to.h);
            }),
        nearest("RGB565RszUp_Nearest",
                [](Ours& o) {
                    _QZYCbCr420ToRGB565RszUp_Nearest(LINES(o), o.from.h, OUT(o), o.to.w, o.to.h);
                }),
        nearest("RGB565RszUp_NearLinear",
                [](Ours& o) {
                    _QZYCbCr420ToRGB565RszUp_NearLinear(LINES(o), o.from.h, OUT(o), o.to.w, o.to.h);
                }),
    };
}

std::vector<Job> FixedRatioJobs() {
    const auto job = [](const char* name, Format format, Size in, Size out, auto run) {
        return Job{name, format, in, out, 0, SWS_BILINEAR, libyuv::kFilterBilinear, run};
    };
    const Size sd{640, 360};
    return {
        job("RGB565Case1", kRgb565, sd, {1600, 720},
            [](Ours& o) { _QZYCbCr420ToRGB565Case1(LINES(o), OUT(o), o.to.h); }),
        job("ARGB32Case1", kArgb32, sd, {1600, 720},
            [](Ours& o) { _QZYCbCr420ToARGB32Case1(LINES(o), OUT(o), o.to.h, kAlpha); }),
        job("RGB565Case2", kRgb565, sd, {960, 540},
            [](Ours& o) { _QZYCbCr420ToRGB565Case2(LINES(o), o.from.h, OUT(o), o.to.h); }),
        job("ARGB32Case2", kArgb32, sd, {960, 540},
            [](Ours& o) { _QZYCbCr420ToARGB32Case2(LINES(o), o.from.h, OUT(o), o.to.h, kAlpha); }),
        job("RGB565Case3", kRgb565, {320, 240}, {480, 272},
            [](Ours& o) {
                _QZYCbCr420ToRGB565Case3(&o.set, o.set.pLines[0], o.set.pLines[1], o.src.planes,
                                         o.src.strides, OUT(o));
            }),
    };
}

void Measure(const Job& job, const char* wanted) {
    const std::string name = RowName(job.name, job.in, job.out);
    if (!IsWanted(name, wanted)) return;
    Ours ours(job);
    PrintRace(name, static_cast<double>(job.out.w) * job.out.h,
              {[&] { job.ours(ours); }, Swscale(job, true), Libyuv(job, true), Swscale(job, false),
               Libyuv(job, false)});
}

}  // namespace

int main(int argc, char** argv) {
    const char* wanted = argc > 1 ? argv[1] : nullptr;
    PrintHead(kPeers);
    std::vector<Job> jobs;
    for (const auto& group :
         {SameSizeJobs({1280, 720}), ResizeJobs({640, 360}, {1280, 720}),
          ResizeJobs({1280, 720}, {640, 360}), ResizeJobs({1280, 720}, {852, 480}),
          EnlargeJobs({640, 360}, {1280, 720}), EnlargeJobs({852, 480}, {1280, 720}),
          FixedRatioJobs()}) {
        jobs.insert(jobs.end(), group.begin(), group.end());
    }
    for (const Job& job : jobs)
        Measure(job, wanted);
    return 0;
}
