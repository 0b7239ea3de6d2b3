#include "play/sinks.h"

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <filesystem>

#include "common/deinterlace.h"
#include "common/error.h"
#include "common/y4m_sink.h"
#include "play/memory_sink.h"
#include "play/png_sink.h"
#include "play/sdl_sink.h"

namespace vidshow::tools {

namespace {

std::string freshFolder(const std::string& clip) {
    const std::filesystem::path place = std::filesystem::temp_directory_path();
    const std::string name = "vidshow-" + std::filesystem::path(clip).stem().string() + "-XXXXXX";
    std::string path = (place / name).string();
    if (mkdtemp(path.data()) == nullptr) {
        throw Error("cannot make a folder in " + place.string() + ": " + std::strerror(errno));
    }
    return path;
}

std::unique_ptr<Sink> openPng(const Options& options, const std::string& folder) {
    if (!options.picks.empty()) {
        return std::make_unique<PngSink>(folder, options.picks, true);
    }
    // The clip is counted, not asked: a cut one promises more than it has.
    const uint64_t frames =
        std::min(countFrames(options.clip), options.frames.value_or(UINT64_MAX));
    return std::make_unique<PngSink>(folder, spreadPicks(frames), false);
}

std::unique_ptr<Sink> openAutomatic(const Options& options) {
    try {
        return std::make_unique<SdlSink>(options.clip);
    } catch (const Error&) {  // no display, or none that can be reached
        return openPng(options, freshFolder(options.clip));
    }
}

}  // namespace

std::unique_ptr<Sink> openSink(const Options& options, const Decoder& decoder) {
    switch (options.window) {
        case WindowKind::sdl:
            return std::make_unique<SdlSink>(options.clip);
        case WindowKind::png:
            return openPng(options, options.target);
        case WindowKind::y4m:
            return std::make_unique<Y4mSink>(options.target, decoder.frameRate(),
                                             options.deinterlace != kDeinterlaceOff);
        case WindowKind::memory:
            return std::make_unique<MemorySink>();
        case WindowKind::automatic:
            break;
    }
    return openAutomatic(options);
}

}  // namespace vidshow::tools
