// vidshow-convert: the image engine on the command line.

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <optional>

#include "common/error.h"
#include "common/progress.h"
#include "common/run_tool.h"
#include "convert/conversion.h"
#include "convert/options.h"
#include "convert/output.h"
#include "convert/source.h"

namespace vidshow::tools {

namespace {

void complain(const std::string& text) {
    std::fprintf(stderr, "vidshow-convert: %s\n", text.c_str());
}

struct Tally {
    uint64_t frames = 0;
    double milliseconds = 0;  // in the engine
};

void tell(const Options& options, const Conversion& conversion, const Tally& tally) {
    std::FILE* const out = options.output == "-" ? stderr : stdout;
    if (options.json) {
        std::fprintf(out, "{%s, \"frames\": %llu, \"engineMilliseconds\": %.3f}\n",
                     conversion.json().c_str(), static_cast<unsigned long long>(tally.frames),
                     tally.milliseconds);
    } else if (options.info) {
        std::fputs(conversion.text().c_str(), out);
    }
}

class Converter {
  public:
    explicit Converter(const Options& options)
        : m_options(options), m_source(options.size ? openRaw(options) : openClip(options)) {}

    int run() {
        const Image* image = m_source->next();
        if (image == nullptr) throw Error("there is no whole picture in " + m_options.input);
        adapt(*image);
        if (!m_options.output.empty()) convertAll(image);
        tell(m_options, *m_conversion, m_tally);
        const std::string damage = m_ended ? m_source->damage() : std::string();
        if (damage.empty()) return kExitDone;
        complain(m_options.input + " is cut off or damaged: " + damage);
        return kExitDamaged;
    }

  private:
    // Clips may change their size and colours on the way.
    void adapt(const Image& image) {
        if (m_conversion && m_conversion->takes(image, m_source->colour())) return;
        m_conversion.emplace(image, m_source->colour(), m_options.kind, m_options.request);
    }

    uint64_t expectedFrames() const {
        const uint64_t announced = m_source->announcedFrames();
        if (!m_options.frames) return announced;
        return announced != 0 ? std::min(announced, *m_options.frames) : *m_options.frames;
    }

    void convertAll(const Image* image) {
        const std::unique_ptr<Output> output = openOutput(m_options, m_source->frameRate());
        Progress progress(true, expectedFrames());
        for (; image != nullptr; image = m_source->next()) {
            adapt(*image);
            const auto start = std::chrono::steady_clock::now();
            const Image& result = m_conversion->convert(*image);
            const std::chrono::duration<double, std::milli> time =
                std::chrono::steady_clock::now() - start;
            m_tally.milliseconds += time.count();
            output->write(result, m_conversion->colour());
            progress.update(++m_tally.frames);
            if (m_tally.frames == m_options.frames) break;
        }
        m_ended = image == nullptr;
        output->finish();
    }

    const Options& m_options;
    const std::unique_ptr<Source> m_source;
    std::optional<Conversion> m_conversion;
    Tally m_tally;
    bool m_ended = false;
};

}  // namespace

}  // namespace vidshow::tools

int main(int argc, char** argv) {
    using namespace vidshow::tools;
    return runTool<Options>(
        "vidshow-convert", [&](Options* options) { return readOptions(argc, argv, options); },
        [](const Options& options) { return Converter(options).run(); });
}
