#include "convert/options.h"

#include <algorithm>
#include <filesystem>

#include "common/command_line.h"
#include "common/error.h"

namespace vidshow::tools {

namespace {

const ProgramText kText = {
    "vidshow-convert",
    VIDSHOW_CONVERT_VERSION,
    "Converts pictures and clips by vidshow's image engine, to the bit",
    {{"Formats",
      "yuv420p, yuv422p, yuv444p, nv12, rgb565, rgb888 (bytes B G R), argb32 (B G R A), abgr32 "
      "(R G B A), yuy2, uyvy, rgb5551. A conversion that the engine lacks is refused with the list "
      "of those that it has. Pictures are cut to multiples of 4 pixels, as the engine does."},
     {"Output",
      "The name of OUT says what is written: .png a picture each, .y4m a clip of yuv420p, .raw, "
      ".yuv, .rgb, .bin, a format's name or no extension raw planes, and any other extension that "
      "FFmpeg's libraries know a file of theirs, by the encoder that they choose for it or "
      "--encoder. Pixels that the encoder does not take are repacked for it. When pictures change "
      "their size, a second file follows, OUT with -2 before its extension, and so on."},
     {"Exit status",
      "0 converted; 1 cannot be converted, read or written; 2 wrong use; 3 the clip is cut off or "
      "damaged, and what there is was converted."}}};

// What the options are read into before they get their meaning.
struct Texts : ClipTexts {
    std::string to;
    std::string format;
    std::string size;
    std::string resize;
    std::string algorithm = "linear";
    std::string rotate = "0";
    std::string mirror;
    std::string colorKey;
    std::string as;
};

const std::map<std::string, uint32_t> kAlgorithms = {
    {"nearest", QZ_IMAGEPROC_RESIZE_NEAREST},
    {"linear", QZ_IMAGEPROC_RESIZE_LINEAR},
    {"nearlinear", QZ_IMAGEPROC_RESIZE_NEARLINEAR}};
const std::map<std::string, uint32_t> kRotations = {{"0", QZ_IMAGEPROC_ROTATE_NONE},
                                                    {"90", QZ_IMAGEPROC_ROTATE_90C},
                                                    {"180", QZ_IMAGEPROC_ROTATE_180},
                                                    {"270", QZ_IMAGEPROC_ROTATE_90AC}};
const std::map<std::string, uint32_t> kMirrors = {{"h", QZ_IMAGEPROC_ROTATE_MIRROR_H},
                                                  {"v", QZ_IMAGEPROC_ROTATE_MIRROR_V}};

CLI::IsMember oneOfFormats() {
    std::vector<std::string> names;
    for (const Format& format : allFormats())
        names.push_back(format.name);
    return oneOf(names);
}

bool allIn(const std::string& text, const char* letters) {
    return !text.empty() && text.find_first_not_of(letters) == std::string::npos;
}

// "640x480", each side from 4 to 16384.
std::optional<Size> readSize(const std::string& text) {
    const size_t cross = text.find('x');
    if (cross == std::string::npos) return std::nullopt;
    const std::string sides[2] = {text.substr(0, cross), text.substr(cross + 1)};
    int values[2] = {};
    for (int i = 0; i < 2; ++i) {
        if (!allIn(sides[i], "0123456789") || sides[i].size() > 5) return std::nullopt;
        values[i] = std::stoi(sides[i]);
        if (values[i] < 4 || values[i] > 16384) return std::nullopt;
    }
    return Size{values[0], values[1]};
}

std::string checkSize(const std::string& text) {
    return readSize(text) ? "" : "'" + text + "' is not a size from 4x4 to 16384x16384";
}

std::string checkKey(const std::string& text) {
    const bool good = text.size() == 6 && allIn(text, "0123456789abcdefABCDEF");
    return good ? "" : "'" + text + "' is not six hexadecimal digits, YYUUVV";
}

std::string checkSetting(const std::string& text) {
    const size_t sign = text.find('=');
    const bool good = sign != std::string::npos && sign != 0;
    return good ? "" : "'" + text + "' is not KEY=VALUE";
}

// Names without a container: what is written is planes.
bool namesPlanes(const std::string& extension) {
    for (const char* const name : {"", "raw", "yuv", "rgb", "bin"}) {
        if (extension == name) return true;
    }
    return findFormat(extension) != nullptr;
}

std::optional<FileKind> fileKind(const std::string& extension) {
    if (namesPlanes(extension)) return FileKind::raw;
    if (extension == "png") return FileKind::png;
    if (extension == "y4m") return FileKind::y4m;
    const bool known = av_guess_format(nullptr, ("x." + extension).c_str(), nullptr) != nullptr;
    return known ? std::optional(FileKind::clip) : std::nullopt;
}

std::string unknownKind(const std::string& extension) {
    return "nothing here writes ." + extension + "; --as raw writes planes";
}

std::string kindName(const Texts& texts, const std::string& output) {
    if (!texts.as.empty()) return texts.as;
    const std::string extension = std::filesystem::path(output).extension();
    return extension.empty() ? "" : extension.substr(1);
}

void declareFiles(CLI::App* app, Options* options, Texts* texts) {
    app->add_option("IN", options->input, "any file that FFmpeg reads, or raw planes (--size)")
        ->required();
    app->add_option("OUT", options->output, "the file to write; - is standard output");
    app->add_option("--size", texts->size, "IN is raw planes of this size")
        ->check(checkSize)
        ->type_name("WxH");
    app->add_option("--format", texts->format,
                    "pixels of raw planes (else yuv420p); for a clip, those the engine is given")
        ->check(oneOfFormats())
        ->type_name("FORMAT");
    app->add_option("--as", texts->as,
                    "png, y4m, raw or an extension of FFmpeg's, whatever the name of OUT says")
        ->check([](const std::string& kind) {
            return fileKind(kind) ? std::string() : unknownKind(kind);
        })
        ->type_name("KIND");
    app->add_option("--encoder", options->encoder, "FFmpeg's encoder of this name writes OUT")
        ->type_name("NAME");
    app->add_option("--encoder-option", options->encoderOptions,
                    "told to the encoder in FFmpeg's words, as crf=18; may be given again")
        ->check(checkSetting)
        ->expected(1)
        ->take_all()
        ->type_name("KEY=VALUE");
    declareFrames(app, &options->frames);
    app->add_flag("--info", options->info,
                  "tell what the engine makes of the conversion; without OUT convert nothing");
    app->add_flag("--json", options->json, "tell it as one JSON object");
}

void declareConversion(CLI::App* app, Texts* texts) {
    app->add_option("--to", texts->to, "format of the output; else what suits OUT")
        ->check(oneOfFormats())
        ->type_name("FORMAT");
    app->add_option("--resize", texts->resize, "size of the picture, before it is turned")
        ->check(checkSize)
        ->type_name("WxH");
    app->add_option("--algorithm", texts->algorithm, "how it is resized")
        ->check(oneOf(kAlgorithms))
        ->type_name("NAME");
    CLI::Option* const mirror =
        app->add_option("--mirror", texts->mirror, "h: left and right exchanged; v: top and bottom")
            ->check(oneOf(kMirrors))
            ->type_name("h|v");
    app->add_option("--rotate", texts->rotate, "how far it is turned clockwise")
        ->check(oneOf(kRotations))
        ->excludes(mirror)
        ->type_name("DEGREES");
    declareDeinterlace(app, texts, "planar input only");
}

void declareColours(CLI::App* app, Options* options, Texts* texts) {
    const CLI::Range byte(0, 255);
    Request* const request = &options->request;
    declareMatrixAndRange(app, texts);
    const char* const names[3] = {"--brightness", "--contrast", "--saturation"};
    for (int i = 0; i < 3; ++i) {
        app->add_option(names[i], request->adjustment[i], "0 to 255, 128 is neutral")
            ->check(byte)
            ->type_name("N");
    }
    app->add_option("--color-key", texts->colorKey, "YYUUVV: not seen in rgb5551")
        ->check(checkKey)
        ->type_name("HEX");
    app->add_option("--alpha", request->alpha, "alpha of argb32, 0 to 255; 255 if not given")
        ->check(byte)
        ->type_name("N");
}

void interpret(const Texts& texts, Options* options) {
    Request& request = options->request;
    if (!texts.size.empty()) options->size = readSize(texts.size);
    options->given = findFormat(texts.format);
    const std::string kind = kindName(texts, options->output);
    if (!fileKind(kind)) throw CLI::ValidationError("OUT", unknownKind(kind));
    options->kind = *fileKind(kind);
    options->extension = kind;
    request.to = findFormat(texts.to);
    if (!texts.resize.empty()) request.resize = readSize(texts.resize);
    request.algorithm = kAlgorithms.at(texts.algorithm);
    request.rotation =
        texts.mirror.empty() ? kRotations.at(texts.rotate) : kMirrors.at(texts.mirror);
    request.matrix = texts.matrixGiven();
    request.range = texts.rangeGiven();
    if (!texts.colorKey.empty()) {
        request.colorKey = static_cast<uint32_t>(std::stoul(texts.colorKey, nullptr, 16));
    }
    request.deinterlace = texts.deinterlaceMode();
}

}  // namespace

std::optional<int> readOptions(int argc, char** argv, Options* options) {
    CommandLine line(kText);
    Texts texts;
    declareFiles(&line.options(), options, &texts);
    declareConversion(&line.options(), &texts);
    declareColours(&line.options(), options, &texts);
    return line.read(argc, argv, [&texts, options] {
        if (options->output.empty() && !options->info) throw CLI::RequiredError("OUT");
        interpret(texts, options);
    });
}

}  // namespace vidshow::tools
