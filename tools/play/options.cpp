#include "play/options.h"

#include <algorithm>

#include "common/command_line.h"

namespace vidshow::tools {

namespace {

const ProgramText kText = {
    "vidshow-play",
    VIDSHOW_PLAY_VERSION,
    "Plays a clip through vidshow's presenter and shows what arrives at the window",
    {{"Keys",
      "In the window: space pauses, left and right seek 5 s back and forward, f is full screen, d "
      "goes to the next deinterlace mode, q or Esc ends."},
     {"Exit status",
      "0 played; 1 cannot be played or written, or frames failed; 2 wrong use; 3 the clip is cut "
      "off or damaged, and what there is was shown."}}};

// What the options are read into before they get their meaning.
struct Texts : ClipTexts {
    std::string window;
    std::string path = "software";
    bool noPace = false;
};

const std::map<std::string, Path> kPaths = {{"software", Path::software},
                                            {"decoder", Path::decoder}};

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
    declareDeinterlace(app, texts, "software path only");
    declareMatrixAndRange(app, texts);
    declareFrames(app, &options->frames);
    app->add_flag("--no-pace", texts->noPace,
                  "as fast as it goes; png and y4m are never held to the clip's pace");
}

void interpret(const Texts& texts, Options* options) {
    if (!texts.window.empty()) readWindow(texts.window, options);
    options->path = kPaths.at(texts.path);
    options->deinterlace = texts.deinterlaceMode();
    options->matrix = texts.matrixGiven();
    options->range = texts.rangeGiven();
    options->pace = !texts.noPace;
    std::sort(options->picks.begin(), options->picks.end());
    options->picks.erase(std::unique(options->picks.begin(), options->picks.end()),
                         options->picks.end());
}

}  // namespace

std::optional<int> readOptions(int argc, char** argv, Options* options) {
    CommandLine line(kText);
    Texts texts;
    declare(&line.options(), options, &texts);
    if (const std::optional<int> status = line.read(argc, argv)) return status;
    interpret(texts, options);
    return std::nullopt;
}

}  // namespace vidshow::tools
