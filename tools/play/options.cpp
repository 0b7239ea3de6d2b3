#include "play/options.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <iterator>
#include <map>

#include "common/deinterlace.h"
#include "common/error.h"
#include "vidshow/presenter.h"

namespace vidshow::tools {

namespace {

const char kDescription[] =
    "Plays a clip through vidshow's presenter and shows what arrives at the window.";

const char kFooter[] =
    "In the window: space pauses, left and right seek 5 s back and forward, f is full screen, d "
    "goes\n"
    "to the next deinterlace mode, q or Esc ends.\n"
    "Exit status: 0 played; 1 cannot be played or written, or frames failed; 2 wrong use; 3 the "
    "clip\n"
    "is cut off or damaged, and what there is was shown.";

// What the options are read into before they get their meaning.
struct Texts {
    std::string window;
    std::string path = "software";
    std::string deinterlace = "off";
    std::string matrix;
    std::string range;
    bool noPace = false;
};

const std::map<std::string, Path> kPaths = {{"software", Path::software},
                                            {"decoder", Path::decoder}};
const std::map<std::string, Matrix> kMatrices = {{"bt601", Matrix::bt601},
                                                 {"bt709", Matrix::bt709},
                                                 {"smpte240m", Matrix::smpte240m},
                                                 {"fcc", Matrix::fcc}};
const std::map<std::string, Range> kRanges = {{"limited", Range::limited}, {"full", Range::full}};

template <typename T>
CLI::IsMember oneOf(const std::map<std::string, T>& names) {
    std::vector<std::string> keys;
    for (const auto& entry : names)
        keys.push_back(entry.first);
    return CLI::IsMember(keys);
}

CLI::IsMember oneOfModes() {
    return CLI::IsMember(
        std::vector<std::string>(kDeinterlaceNames.begin(), kDeinterlaceNames.end()));
}

// "sdl", "png:DIR", "y4m:FILE" or "memory". Returns false for anything else.
bool readWindow(const std::string& text, Options* options) {
    const size_t colon = text.find(':');
    const std::string kind = text.substr(0, colon);
    const bool named = colon != std::string::npos;
    options->target = named ? text.substr(colon + 1) : std::string();
    if (kind == "sdl" && !named) {
        options->window = WindowKind::sdl;
    } else if (kind == "memory" && !named) {
        options->window = WindowKind::memory;
    } else if (kind == "png" && !options->target.empty()) {
        options->window = WindowKind::png;
    } else if (kind == "y4m" && !options->target.empty()) {
        options->window = WindowKind::y4m;
    } else {
        return false;
    }
    return true;
}

// A number from 1 that is written in digits alone.
std::string checkCount(const std::string& text) {
    const bool digits = !text.empty() && text.size() <= 18 &&
                        text.find_first_not_of("0123456789") == std::string::npos;
    const bool some = digits && text.find_first_not_of('0') != std::string::npos;
    return some ? "" : "'" + text + "' is not a number from 1 on";
}

std::string checkWindow(const std::string& text) {
    Options scratch;
    return readWindow(text, &scratch) ? "" : text + " is none of sdl, png:DIR, y4m:FILE, memory";
}

void declare(CLI::App* app, Options* options, Texts* texts) {
    app->add_option("CLIP", options->clip, "any file that FFmpeg reads")->required();
    app->add_option("--window", texts->window,
                    "sdl, png:DIR (pictures and a contact sheet), y4m:FILE (- is standard output)\n"
                    "or memory; without it sdl where there is a display, else png")
        ->check(checkWindow)
        ->type_name("KIND");
    app->add_option("--pick", options->picks,
                    "frames to write as pictures, counted from 1; without it up to 12, spread")
        ->delimiter(',')
        ->check(checkCount)
        ->type_name("N,N,...");
    app->add_option("--path", texts->path,
                    "software: planes are drawn into the window's buffers;\n"
                    "decoder: decoder buffers are queued unchanged")
        ->check(oneOf(kPaths))
        ->type_name("PATH");
    app->add_option("--deinterlace", texts->deinterlace,
                    "off, fast, discard, bob, blend, mean, linear or x; software path only")
        ->check(oneOfModes())
        ->type_name("MODE");
    app->add_option("--matrix", texts->matrix, "bt601, bt709, smpte240m or fcc; else the clip's")
        ->check(oneOf(kMatrices))
        ->type_name("MATRIX");
    app->add_option("--range", texts->range, "limited or full; else the clip's")
        ->check(oneOf(kRanges))
        ->type_name("RANGE");
    app->add_option("--frames", options->frames, "stop after so many frames")
        ->check(checkCount)
        ->type_name("N");
    app->add_flag("--no-pace", texts->noPace,
                  "as fast as it goes; png and y4m are never held to the clip's pace");
    app->set_version_flag("--version",
                          std::string("vidshow-play " VIDSHOW_PLAY_VERSION ", ") + getVersion());
}

uint32_t modeNumber(const std::string& name) {
    const auto found = std::find(kDeinterlaceNames.begin(), kDeinterlaceNames.end(), name);
    return static_cast<uint32_t>(std::distance(kDeinterlaceNames.begin(), found));
}

void interpret(const Texts& texts, Options* options) {
    if (!texts.window.empty()) readWindow(texts.window, options);
    options->path = kPaths.at(texts.path);
    options->deinterlace = modeNumber(texts.deinterlace);
    if (!texts.matrix.empty()) options->matrix = kMatrices.at(texts.matrix);
    if (!texts.range.empty()) options->range = kRanges.at(texts.range);
    options->pace = !texts.noPace;
    std::sort(options->picks.begin(), options->picks.end());
    options->picks.erase(std::unique(options->picks.begin(), options->picks.end()),
                         options->picks.end());
}

}  // namespace

std::optional<int> readOptions(int argc, char** argv, Options* options) {
    CLI::App app(kDescription, "vidshow-play");
    app.footer(kFooter);
    app.failure_message([](const CLI::App*, const CLI::Error& error) {
        return std::string("vidshow-play: ") + error.what() + " (--help tells more)\n";
    });
    Texts texts;
    declare(&app, options, &texts);
    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& end) {
        return app.exit(end) == 0 ? kExitDone : kExitUsage;
    }
    interpret(texts, options);
    return std::nullopt;
}

}  // namespace vidshow::tools
