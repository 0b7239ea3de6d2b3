// vidshow-compare: how far two clips or pictures are from each other.

#include <cmath>
#include <cstdio>

#include "common/decoder.h"
#include "common/error.h"
#include "common/png_file.h"
#include "common/progress.h"
#include "common/run_tool.h"
#include "compare/components.h"
#include "compare/difference.h"
#include "compare/options.h"

namespace vidshow::tools {

namespace {

void complain(const std::string& text) {
    std::fprintf(stderr, "vidshow-compare: %s\n", text.c_str());
}

// What was found out of one component.
struct Tally {
    std::string name;
    double squares = 0;
    double samples = 0;
    double ssim = 0;      // sum over the frames
    bool similar = true;  // it has an SSIM

    double mean() const { return squares / samples; }
};

// A number in JSON, which knows no infinity.
std::string number(double value, bool known = true) {
    if (!known || !std::isfinite(value)) return "null";
    char text[40];
    std::snprintf(text, sizeof text, "%.6f", value);
    return text;
}

class Comparison {
  public:
    explicit Comparison(const Options& options)
        : m_options(options), m_a(options.clips[0]), m_b(options.clips[1]) {}

    int run() {
        for (int64_t n = m_options.offset; n < 0; ++n)
            skip(&m_a, m_options.clips[0]);
        for (int64_t n = m_options.offset; n > 0; --n)
            skip(&m_b, m_options.clips[1]);
        compareAll();
        if (!m_options.difference.empty()) writePng(m_options.difference, m_worstPicture);
        m_options.json ? printJson() : print();
        return judge();
    }

  private:
    static void skip(Decoder* clip, const std::string& path) {
        if (clip->next() == nullptr) throw Error(path + " ends before the offset");
    }

    void compareAll() {
        Progress progress(true, m_options.frames.value_or(m_a.announcedFrames()));
        while (m_frames != m_options.frames) {
            const AVFrame* const a = m_a.next();
            const AVFrame* const b = m_b.next();
            m_ended = a == nullptr || b == nullptr;
            if (m_ended) {
                m_longer = a != nullptr ? 0 : b != nullptr ? 1 : -1;
                break;
            }
            compare(*a, *b);
            progress.update(++m_frames);
        }
        if (m_frames == 0) throw Error("there is no pair of frames to compare");
    }

    void compare(const AVFrame& a, const AVFrame& b) {
        const Components components(a);
        const Components others(b);
        const std::string difference = components.differenceTo(others);
        if (!difference.empty()) {
            throw Error("frame " + std::to_string(m_frames + 1) + ": " + difference);
        }
        begin(components);
        std::vector<Samples> left;
        std::vector<Samples> right;
        double squares = 0;
        for (size_t i = 0; i < components.count(); ++i) {
            left.push_back(components.samples(a, i));
            right.push_back(others.samples(b, i));
            squares += add(left[i], right[i], components.peak(), &m_tallies[i]);
        }
        if (squares <= m_worst || m_options.difference.empty()) return;
        m_worst = squares;
        m_worstPicture =
            differencePicture(left, right, components.peak(), components.rgb(), m_options.gain);
    }

    void begin(const Components& components) {
        if (m_tallies.empty()) {
            m_peak = components.peak();
            for (size_t i = 0; i < components.count(); ++i)
                m_tallies.push_back({components.name(i), 0, 0, 0, true});
        }
        bool same = m_tallies.size() == components.count() && m_peak == components.peak();
        for (size_t i = 0; same && i < components.count(); ++i)
            same = m_tallies[i].name == components.name(i);
        if (!same) throw Error("the clips change their format on the way");
    }

    static double add(const Samples& a, const Samples& b, int peak, Tally* tally) {
        const double squares = squaredError(a, b);
        tally->squares += squares;
        tally->samples += static_cast<double>(a.values.size());
        const std::optional<double> similarity = ssim(a, b, peak);
        tally->similar = tally->similar && similarity.has_value();
        tally->ssim += similarity.value_or(0);
        return squares;
    }

    Tally all() const {
        Tally sum = {"all", 0, 0, 0, false};
        for (const Tally& tally : m_tallies) {
            sum.squares += tally.squares;
            sum.samples += tally.samples;
        }
        return sum;
    }

    void printLine(const Tally& tally) const {
        std::printf("%-4s %14.6f %10.4f ", tally.name.c_str(), tally.mean(),
                    psnr(tally.mean(), m_peak));
        if (tally.similar) {
            std::printf("%10.6f\n", tally.ssim / static_cast<double>(m_frames));
        } else {
            std::printf("%10s\n", "-");
        }
    }

    void print() const {
        std::printf("%llu frames\n%-4s %14s %10s %10s\n", static_cast<unsigned long long>(m_frames),
                    "", "MSE", "PSNR, dB", "SSIM");
        for (const Tally& tally : m_tallies)
            printLine(tally);
        printLine(all());
    }

    std::string object(const Tally& tally) const {
        const double mean = tally.mean();
        return "\"" + tally.name + "\": {\"mse\": " + number(mean) +
               ", \"psnr\": " + number(psnr(mean, m_peak)) +
               ", \"ssim\": " + number(tally.ssim / static_cast<double>(m_frames), tally.similar) +
               "}";
    }

    void printJson() const {
        std::string line =
            "{\"frames\": " + std::to_string(m_frames) + ", \"peak\": " + std::to_string(m_peak);
        for (const Tally& tally : m_tallies)
            line += ", " + object(tally);
        std::printf("%s, %s}\n", line.c_str(), object(all()).c_str());
    }

    int judge() const {
        if (m_longer >= 0) {
            complain(m_options.clips[1 - m_longer] + " ends after " + std::to_string(m_frames) +
                     " compared frames, " + m_options.clips[m_longer] + " goes on");
            return kExitDamaged;
        }
        if (!m_ended) return kExitDone;
        for (int i = 0; i < 2; ++i) {
            const std::string damage = (i == 0 ? m_a : m_b).damage();
            if (damage.empty()) continue;
            complain(m_options.clips[i] + " is cut off or damaged: " + damage);
            return kExitDamaged;
        }
        return kExitDone;
    }

    const Options& m_options;
    Decoder m_a;
    Decoder m_b;
    std::vector<Tally> m_tallies;
    int m_peak = 0;
    uint64_t m_frames = 0;
    double m_worst = -1;
    RgbImage m_worstPicture;
    bool m_ended = false;
    int m_longer = -1;  // which clip goes on where the other has ended
};

}  // namespace

}  // namespace vidshow::tools

int main(int argc, char** argv) {
    using namespace vidshow::tools;
    return runTool<Options>(
        "vidshow-compare", [&](Options* options) { return readOptions(argc, argv, options); },
        [](const Options& options) { return Comparison(options).run(); });
}
