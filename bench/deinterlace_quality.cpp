// Deinterlaced pictures held against the truth: fields are woven from the frames of progressive
// clips, taken apart again by our modes and by FFmpeg's filters, and compared with the frame of the
// kept field's time.
//
// usage: deinterlace_quality [CLIP [FOLDER FOR PICTURES]]
//
// CLIP is decoded, and the peers are run, by the `ffmpeg` command; without CLIP only the clips that
// this program makes are measured, and only with our modes. The status is 0 if the x mode is where
// it should be: nowhere below `linear`, and a still picture comes back.

#include <unistd.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <random>

#include "bench/deinterlace_clips.h"
#include "vidshow/kernels.h"

namespace {

using bench::Clip;
using bench::Plane;

using Deinterlace = std::function<Plane(const Plane& woven, int picture)>;

constexpr const char* kModes[] = {"none", "fast", "discard", "bob", "blend", "mean", "linear", "x"};
constexpr int kLinear = 6, kX = 7;

Plane Ours(const Plane& woven, int mode) {
    Plane source = woven, result = woven;
    QZ_PICTURE src = {}, dst = {};
    src.plane[0] = source.bytes.data();  // no chroma: its planes are skipped
    dst.plane[0] = result.bytes.data();
    src.pitch[0] = dst.pitch[0] = static_cast<uint32_t>(woven.w);
    // The merge of aligned lines spills over the last one.
    source.bytes.resize(source.bytes.size() + 2 * static_cast<size_t>(woven.w));
    result.bytes.resize(source.bytes.size());
    src.plane[0] = source.bytes.data();
    dst.plane[0] = result.bytes.data();
    DeInterlace(&dst, &src, woven.w, woven.h, 0, 0, mode);
    result.bytes.resize(woven.bytes.size());
    return result;
}

// ---- measures
// ------------------------------------------------------------------------------------

double Decibels(double squares, double samples) {
    return squares == 0 ? 99 : 10 * std::log10(255.0 * 255.0 * samples / squares);
}

struct Tally {
    double squares = 0, samples = 0;
    double decibels() const { return samples == 0 ? 0 : Decibels(squares, samples); }
};

constexpr int kBlock = 8;
constexpr int kMoving = 4;  // mean difference of the two times, levels

template <typename F>
double BlockSum(const Plane& a, const Plane& b, int left, int top, F f) {
    double sum = 0;
    for (int y = top; y < top + kBlock; ++y) {
        for (int x = left; x < left + kBlock; ++x)
            sum += f(a.line(y)[x] - b.line(y)[x]);
    }
    return sum;
}

/// Structural similarity of two blocks, with its authors' constants.
double BlockSimilarity(const Plane& a, const Plane& b, int left, int top) {
    double sa = 0, sb = 0, saa = 0, sbb = 0, sab = 0;
    for (int y = top; y < top + kBlock; ++y) {
        for (int x = left; x < left + kBlock; ++x) {
            const double p = a.line(y)[x], q = b.line(y)[x];
            sa += p;
            sb += q;
            saa += p * p;
            sbb += q * q;
            sab += p * q;
        }
    }
    constexpr double kN = kBlock * kBlock, kC1 = 6.5025, kC2 = 58.5225;
    const double ma = sa / kN, mb = sb / kN;
    const double va = saa / kN - ma * ma, vb = sbb / kN - mb * mb, cov = sab / kN - ma * mb;
    return (2 * ma * mb + kC1) * (2 * cov + kC2) / ((ma * ma + mb * mb + kC1) * (va + vb + kC2));
}

struct Score {
    double whole = 0;  // PSNR, mean over the pictures
    Tally moving;
    double similarity = 0;
};

Score Measure(const Clip& clip, const Deinterlace& deinterlace) {
    Score score;
    double blocks = 0;
    for (int t = 0; t < clip.pictures(); ++t) {
        const Plane made = deinterlace(clip.woven(t), t);
        const Plane& truth = clip.truth(t);
        Tally picture;
        for (int y = 0; y + kBlock <= truth.h; y += kBlock) {
            for (int x = 0; x + kBlock <= truth.w; x += kBlock) {
                const double squares = BlockSum(made, truth, x, y, [](double d) { return d * d; });
                const double motion =
                    BlockSum(clip.other(t), truth, x, y, [](double d) { return std::fabs(d); });
                picture.squares += squares;
                picture.samples += kBlock * kBlock;
                if (motion > kMoving * kBlock * kBlock) {
                    score.moving.squares += squares;
                    score.moving.samples += kBlock * kBlock;
                }
                score.similarity += BlockSimilarity(made, truth, x, y);
                ++blocks;
            }
        }
        score.whole += picture.decibels() / clip.pictures();
    }
    score.similarity /= blocks;
    return score;
}

void Print(const Clip& clip, const std::string& by, const Score& s) {
    std::printf("| %s | %s | %.2f | %.2f | %.4f |\n", clip.name.c_str(), by.c_str(), s.whole,
                s.moving.decibels(), s.similarity);
    std::fflush(stdout);
}

// ---- FFmpeg
// --------------------------------------------------------------------------------------

/// Raw 4:2:0 files in a folder of their own.
class Workshop {
  public:
    Workshop() {
        char path[] = "/tmp/deinterlace-XXXXXX";
        if (mkdtemp(path) != nullptr) m_folder = path;
    }
    ~Workshop() { run("rm -r '" + m_folder + "'"); }
    Workshop(const Workshop&) = delete;
    Workshop& operator=(const Workshop&) = delete;

    static bool run(const std::string& command) { return std::system(command.c_str()) == 0; }
    std::string file(const char* name) const { return m_folder + "/" + name; }

    std::vector<Plane> read(const std::string& path, int w, int h) const {
        std::vector<Plane> frames;
        Plane luma(w, h);
        std::vector<uint8_t> chroma(luma.bytes.size() / 2);
        std::FILE* const in = std::fopen(path.c_str(), "rb");
        if (in == nullptr) return frames;
        while (std::fread(luma.bytes.data(), 1, luma.bytes.size(), in) == luma.bytes.size() &&
               std::fread(chroma.data(), 1, chroma.size(), in) == chroma.size())
            frames.push_back(luma);
        std::fclose(in);
        return frames;
    }

    void write(const std::string& path, const std::vector<Plane>& frames) const {
        std::FILE* const out = std::fopen(path.c_str(), "wb");
        if (out == nullptr) return;
        const std::vector<uint8_t> chroma(frames.at(0).bytes.size() / 2, 128);
        for (const Plane& frame : frames) {
            std::fwrite(frame.bytes.data(), 1, frame.bytes.size(), out);
            std::fwrite(chroma.data(), 1, chroma.size(), out);
        }
        std::fclose(out);
    }

  private:
    std::string m_folder;
};

std::string RawInput(const std::string& path, int w, int h) {
    return "ffmpeg -v error -y -f rawvideo -pix_fmt yuv420p -s " + std::to_string(w) + "x" +
           std::to_string(h) + " -i '" + path + "'";
}

constexpr const char* kPeers[] = {"pp=li",
                                  "pp=ci",
                                  "pp=md",
                                  "pp=fd",
                                  "pp=l5",
                                  "w3fdif=mode=frame:parity=tff:filter=simple",
                                  "w3fdif=mode=frame:parity=tff:filter=complex",
                                  "yadif=mode=send_frame:parity=tff",
                                  "bwdif=mode=send_frame:parity=tff"};

Clip Decode(const Workshop& workshop, const std::string& path) {
    Clip clip = {"street", {}};
    const std::string raw = workshop.file("clip.yuv");
    if (Workshop::run("ffmpeg -v error -y -i '" + path +
                      "' -vf scale=768:576 -pix_fmt yuv420p -f rawvideo '" + raw + "'"))
        clip.frames = workshop.read(raw, 768, 576);
    return clip;
}

std::vector<Plane> Peer(const Workshop& workshop, const Clip& clip, const char* filter) {
    const std::string out = workshop.file("peer.yuv");
    const bool done =
        Workshop::run(RawInput(workshop.file("woven.yuv"), clip.width(), clip.height()) +
                      " -vf setfield=tff," + filter + " -f rawvideo '" + out + "'");
    return done ? workshop.read(out, clip.width(), clip.height()) : std::vector<Plane>();
}

void MeasurePeers(const Workshop& workshop, const Clip& clip) {
    std::vector<Plane> woven;
    for (int t = 0; t < clip.pictures(); ++t)
        woven.push_back(clip.woven(t));
    workshop.write(workshop.file("woven.yuv"), woven);
    for (const char* const filter : kPeers) {
        std::vector<Plane> made = Peer(workshop, clip, filter);
        if (made.empty()) continue;
        made.resize(static_cast<size_t>(clip.pictures()), made.back());
        Print(clip, filter,
              Measure(clip, [&](const Plane&, int t) { return made[static_cast<size_t>(t)]; }));
    }
}

// ---- what must not happen
// ------------------------------------------------------------------------

/// Share of samples that the x mode changes in frames that are whole, percent.
double ChangedWhenStill(const Clip& clip) {
    double changed = 0, samples = 0;
    for (const Plane& frame : clip.frames) {
        const Plane made = Ours(frame, kX);
        for (size_t i = 0; i < made.bytes.size(); ++i)
            changed += made.bytes[i] != frame.bytes[i];
        samples += static_cast<double>(made.bytes.size());
    }
    return 100 * changed / samples;
}

/// Blocks that are kept in one of 50 noisy pictures of a still scene and not in the next, percent.
double FlickerInNoise(const Clip& clip, double deviation) {
    std::mt19937 random(50);
    std::normal_distribution<double> noise(0, deviation);
    const Plane& still = clip.truth(0);
    const int across = still.w / kBlock, down = still.h / kBlock;
    std::vector<bool> before;
    double flips = 0, blocks = 0;
    for (int picture = 0; picture < 50; ++picture) {
        Plane noisy = still;
        for (uint8_t& s : noisy.bytes)
            s = static_cast<uint8_t>(std::clamp(std::lround(s + noise(random)), 0l, 255l));
        const Plane made = Ours(noisy, kX);
        std::vector<bool> kept;
        for (int i = 0; i < across * down; ++i) {
            kept.push_back(BlockSum(made, noisy, i % across * kBlock, i / across * kBlock,
                                    [](double d) { return std::fabs(d); }) == 0);
        }
        for (size_t i = 0; i < before.size(); ++i)
            flips += kept[i] != before[i];
        blocks += static_cast<double>(before.size());
        before = kept;
    }
    return 100 * flips / blocks;
}

// ---- pictures
// ------------------------------------------------------------------------------------

Plane Crop(const Plane& from, int left, int top, int w, int h) {
    Plane out(w, h);
    for (int y = 0; y < h; ++y)
        std::copy_n(from.line(top + y) + left, w, out.line(y));
    return out;
}

/// Woven, linear, fast, x, and the truth, side by side, twice as large.
void SavePicture(const Workshop& workshop, const Clip& clip, int t, int left, int top,
                 const std::string& path) {
    constexpr int kW = 128, kH = 128;
    const Plane woven = clip.woven(t);
    Plane sheet(kW * 5, kH);
    const Plane all[] = {woven, Ours(woven, kLinear), Ours(woven, 1), Ours(woven, kX),
                         clip.truth(t)};
    for (int i = 0; i < 5; ++i) {
        const Plane part = Crop(all[i], left, top, kW, kH);
        for (int y = 0; y < kH; ++y)
            std::copy_n(part.line(y), kW, sheet.line(y) + i * kW);
    }
    workshop.write(workshop.file("sheet.yuv"), {sheet});
    Workshop::run(RawInput(workshop.file("sheet.yuv"), sheet.w, sheet.h) +
                  " -vf scale=iw*2:ih*2:flags=neighbor,format=gray -frames:v 1 '" + path + "'");
}

bool Check(bool holds, const char* what, const Clip& clip) {
    if (!holds) std::fprintf(stderr, "%s: %s\n", clip.name.c_str(), what);
    return holds;
}

bool MeasureClip(const Workshop* workshop, const Clip& clip) {
    bool good = true;
    Score linear;
    for (int mode = 0; mode <= kX; ++mode) {
        const Score score =
            Measure(clip, [&](const Plane& woven, int) { return Ours(woven, mode); });
        Print(clip, kModes[mode], score);
        if (mode == kLinear) linear = score;
        if (mode == kX) {
            good = Check(
                score.whole >= linear.whole && score.moving.decibels() >= linear.moving.decibels(),
                "x is worse than linear", clip);
        }
    }
    if (workshop != nullptr) MeasurePeers(*workshop, clip);
    return good;
}

bool CheckStill(const Clip& clip) {
    const double changed = ChangedWhenStill(clip), flicker = FlickerInNoise(clip, 2);
    std::printf("| %s | %.4f | %.4f |\n", clip.name.c_str(), changed, flicker);
    std::fflush(stdout);
    return Check(changed <= 0.1, "x changes a still picture", clip);
}

}  // namespace

int main(int argc, char** argv) {
    std::vector<Clip> clips;
    const Workshop workshop;
    const bool withPeers = argc > 1;
    if (withPeers) clips.push_back(Decode(workshop, argv[1]));
    clips.push_back(bench::SlowPan());
    clips.push_back(bench::FastMotion());
    for (const Clip& clip : clips) {
        if (!Check(clip.pictures() > 0, "cannot be decoded", clip)) return 2;
    }

    bool good = true;
    std::printf("| clip | by | PSNR, dB | moving blocks, dB | SSIM |\n|---|---|--:|--:|--:|\n");
    for (const Clip& clip : clips)
        good = MeasureClip(withPeers ? &workshop : nullptr, clip) && good;
    std::printf(
        "\n| clip | still picture: changed, %% | noise: changing blocks, %% |\n|---|--:|--:|\n");
    for (const Clip& clip : clips)
        good = CheckStill(clip) && good;
    if (argc > 2) {
        const std::string folder = argv[2];
        SavePicture(workshop, clips[0], 20, 420, 330, folder + "/deinterlace-street.png");
        SavePicture(workshop, clips[1], 5, 250, 180, folder + "/deinterlace-pan.png");
    }
    return good ? 0 : 1;
}
