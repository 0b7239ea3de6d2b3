// Conversion fused with scaling, turning or adjustment, beside libswscale and libyuv, each in all
// the ways that it has; the best one counts. And what a pixel costs at every size.
//
// usage: fused_bench [substring of the row's name]
//        fused_bench --sizes      CSV for bench/plot_sizes.py

#include <cstring>

#include "bench/rgb_contenders.h"

namespace {

using namespace bench;

constexpr int kRounds = 11;

Work SwscaleFast(Job job) {
    if (!job.Scales()) return {};
    job.swscaleFlags = SWS_FAST_BILINEAR;
    return Swscale(job, true);
}

/// libyuv's other order: to ARGB first, which is then scaled or turned, and packed.
Work LibyuvConvertedFirst(const Job& job) {
    if (!job.Scales() && job.rotation == 0) return {};
    auto src = std::make_shared<Planes>(job.in);
    const auto bytes = [](Size s) { return static_cast<size_t>(s.w * s.h) * 4; };
    const Size last = job.rotation ? Size{job.out.h, job.out.w} : job.out;
    auto first = std::make_shared<std::vector<uint8_t>>(bytes(job.in));
    auto second = std::make_shared<std::vector<uint8_t>>(bytes(last));
    auto packed = std::make_shared<std::vector<uint8_t>>(bytes(last) / 2);
    return [=] {
        libyuv::MaskCpuFlags(-1);
        LibyuvPack(kArgb32, *src, first->data(), 4 * job.in.w);
        if (job.rotation) {
            libyuv::ARGBRotate(first->data(), 4 * job.in.w, second->data(), 4 * last.w, job.in.w,
                               job.in.h, libyuv::kRotate90);
        } else {
            libyuv::ARGBScale(first->data(), 4 * job.in.w, job.in.w, job.in.h, second->data(),
                              4 * last.w, last.w, last.h, job.filter);
        }
        if (job.format == kRgb565) {
            libyuv::ARGBToRGB565(second->data(), 4 * last.w, packed->data(), 2 * last.w, last.w,
                                 last.h);
        }
    };
}

/// libyuv: a converter, a pass through tables, and a packing pass for RGB565.
Work LibyuvTables(const Job& job) {
    auto src = std::make_shared<Planes>(job.in);
    const size_t pixels = static_cast<size_t>(job.in.w * job.in.h);
    auto argb = std::make_shared<std::vector<uint8_t>>(4 * pixels);
    auto packed = std::make_shared<std::vector<uint8_t>>(2 * pixels);
    auto table = std::make_shared<std::vector<uint8_t>>(4 * 256);
    for (size_t i = 0; i < table->size(); ++i)
        (*table)[i] = static_cast<uint8_t>(std::min<size_t>(i / 4 * 5 / 4, 255));
    return [=] {
        const int w = job.in.w, h = job.in.h;
        libyuv::MaskCpuFlags(-1);
        LibyuvPack(kArgb32, *src, argb->data(), 4 * w);
        libyuv::ARGBColorTable(argb->data(), 4 * w, table->data(), 0, 0, w, h);
        if (job.format == kRgb565)
            libyuv::ARGBToRGB565(argb->data(), 4 * w, packed->data(), 2 * w, w, h);
    };
}

using Kernel = std::function<void(Ours&)>;

Job Scaling(const char* name, Format format, Size in, Size out, Kernel run) {
    return {name, format, in, out, 0, SWS_BILINEAR, libyuv::kFilterBilinear, std::move(run)};
}
Job SameSize(const char* name, Format format, uint32_t rotation, Size size, Kernel run) {
    return {name, format, size, size, rotation, SWS_POINT, libyuv::kFilterNone, std::move(run)};
}

void RszUp565(Ours& o) {
    _QZYCbCr420ToRGB565RszUp(LINES(o), o.from.h, OUT(o), o.to.w, o.to.h);
}
void RszUp32(Ours& o) {
    _QZYCbCr420ToARGB32RszUp(LINES(o), o.from.h, OUT(o), o.to.w, o.to.h, kAlpha);
}
void Rsz565(Ours& o) {
    _QZYCbCr420ToRGB565Rsz(PLAIN(o), OUT(o), o.to.w, o.to.h);
}
void Rsz32(Ours& o) {
    _QZYCbCr420ToARGB32Rsz(PLAIN(o), OUT(o), o.to.w, o.to.h, kAlpha);
}
void Plain565(Ours& o) {
    _QZYCbCr420ToRGB565(PLAIN(o), OUT(o));
}
void Plain32(Ours& o) {
    _QZYCbCr420ToARGB32(PLAIN(o), OUT(o), kAlpha);
}
void Turned565(Ours& o) {
    _QZYCbCr420ToRGB565Rot(PLAIN(o));
}
void Turned32(Ours& o) {
    _QZYCbCr420ToARGB32Rot(PLAIN(o), kAlpha);
}

std::vector<Job> ScalingJobs() {
    const Size hd{1280, 720}, full{1920, 1080}, vga{640, 480}, qvga{320, 240};
    return {
        Scaling("RGB565RszUp", kRgb565, hd, full, RszUp565),
        Scaling("RGB565RszUp, exact 2x", kRgb565, {640, 360}, hd, RszUp565),
        Scaling("RGB565Case1", kRgb565, qvga, {800, 480},
                [](Ours& o) { _QZYCbCr420ToRGB565Case1(LINES(o), OUT(o), o.to.h); }),
        Scaling("RGB565Case2", kRgb565, vga, {960, 480},
                [](Ours& o) { _QZYCbCr420ToRGB565Case2(LINES(o), o.from.h, OUT(o), o.to.h); }),
        Scaling("RGB565Case3", kRgb565, qvga, {480, 272},
                [](Ours& o) {
                    _QZYCbCr420ToRGB565Case3(&o.set, o.set.pLines[0], o.set.pLines[1], o.src.planes,
                                             o.src.strides, OUT(o));
                }),
        Scaling("ARGB32RszUp", kArgb32, hd, full, RszUp32),
        Scaling("ARGB32RszUp, exact 2x", kArgb32, {640, 360}, hd, RszUp32),
        Scaling("ARGB32Case1", kArgb32, qvga, {800, 480},
                [](Ours& o) { _QZYCbCr420ToARGB32Case1(LINES(o), OUT(o), o.to.h, kAlpha); }),
        Scaling(
            "ARGB32Case2", kArgb32, vga, {960, 480},
            [](Ours& o) { _QZYCbCr420ToARGB32Case2(LINES(o), o.from.h, OUT(o), o.to.h, kAlpha); }),
        Scaling("RGB565Rsz", kRgb565, full, hd, Rsz565),
        Scaling("ARGB32Rsz", kArgb32, full, hd, Rsz32),
    };
}

std::vector<Job> SameSizeJobs(Size size) {
    return {
        SameSize("RGB565Rot, clockwise", kRgb565, 2, size, Turned565),
        SameSize("ARGB32Rot, clockwise", kArgb32, 2, size, Turned32),
        SameSize("RGB565, tables", kRgb565, 0, size, Plain565),
        SameSize("ARGB32, tables", kArgb32, 0, size, Plain32),
    };
}

void PrintTable(const char* wanted) {
    PrintHead({"ours", "libswscale", "libswscale, fast", "libyuv", "libyuv, converted first",
               "libyuv, tables"});
    std::vector<Job> jobs = ScalingJobs();
    for (const Job& job : SameSizeJobs({1280, 720}))
        jobs.push_back(job);
    for (const Job& job : jobs) {
        const std::string name = RowName(job.name, job.in, job.out);
        if (!IsWanted(name, wanted)) continue;
        Ours ours(job);
        const bool plain = !job.Scales() && job.rotation == 0;
        PrintRow(name, static_cast<double>(job.out.w) * job.out.h,
                 Race({{"ours", [&] { job.ours(ours); }},
                       {"libswscale", Swscale(job, true)},
                       {"libswscale, fast", SwscaleFast(job)},
                       {"libyuv", Libyuv(job, true)},
                       {"libyuv, converted first", LibyuvConvertedFirst(job)},
                       {"libyuv, tables", plain ? LibyuvTables(job) : Work()}},
                      kRounds));
    }
}

/// Every kind of work at every size, output pixels counted.
void PrintSizes() {
    std::printf("work,width,height,nanoseconds a pixel\n");
    for (const Size out : {Size{176, 144}, Size{352, 288}, Size{640, 480}, Size{1280, 720},
                           Size{1920, 1080}, Size{3840, 2160}}) {
        std::vector<Job> jobs = SameSizeJobs(out);
        const Size half{out.w / 2, out.h / 2}, more{out.w / 2 * 3, out.h / 2 * 3};
        jobs.push_back(Scaling("RGB565RszUp, 2x", kRgb565, half, out, RszUp565));
        jobs.push_back(Scaling("ARGB32RszUp, 2x", kArgb32, half, out, RszUp32));
        jobs.push_back(Scaling("RGB565Rsz, 2/3", kRgb565, more, out, Rsz565));
        jobs.push_back(Scaling("ARGB32Rsz, 2/3", kArgb32, more, out, Rsz32));
        for (const Job& job : jobs) {
            Ours ours(job);
            const double seconds = Race({{"ours", [&] { job.ours(ours); }}}, kRounds).at(0);
            std::printf("\"%s\",%d,%d,%.3f\n", job.name.c_str(), out.w, out.h,
                        seconds * 1e9 / (static_cast<double>(out.w) * out.h));
        }
    }
}

}  // namespace

int main(int argc, char** argv) {
    const char* const argument = argc > 1 ? argv[1] : nullptr;
    if (argument != nullptr && std::strcmp(argument, "--sizes") == 0) {
        PrintSizes();
    } else {
        PrintTable(argument);
    }
    return 0;
}
