#include "convert/options.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <iterator>
#include <map>

#include "common/deinterlace.h"
#include "common/error.h"

namespace vidshow::tools {

namespace {

const char kDescription[] = "Converts pictures and clips by vidshow's image engine, to the bit.";

const char kFooter[] =
    "Formats: yuv420p, yuv422p, yuv444p, nv12, rgb565, rgb888 (bytes B G R), argb32 (B G R A),\n"
    "abgr32 (R G B A), yuy2, uyvy, rgb5551. A conversion that the engine lacks is refused with "
    "the\n"
    "list of those that it has. Pictures are cut to multiples of 4 pixels, as the engine does.\n"
    "Exit status: 0 converted; 1 cannot be converted, read or written; 2 wrong use; 3 the clip is\n"
    "cut off or damaged, and what there is was converted.";

// What the options are read into before they get their meaning.
struct Texts {
    std::string to;
    std::string format;
    std::string size;
    std::string resize;
    std::string algorithm = "linear";
    std::string rotate = "0";
    std::string mirror;
    std::string matrix;
    std::string range;
    std::string colorKey;
    std::string deinterlace = "off";
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
const std::map<std::string, Matrix> kMatrices = {{"bt601", Matrix::bt601},
                                                 {"bt709", Matrix::bt709},
                                                 {"smpte240m", Matrix::smpte240m},
                                                 {"fcc", Matrix::fcc}};
const std::map<std::string, Range> kRanges = {{"limited", Range::limited}, {"full", Range::full}};
const std::map<std::string, FileKind> kKinds = {
    {"png", FileKind::png}, {"y4m", FileKind::y4m}, {"raw", FileKind::raw}};

template <typename T>
CLI::IsMember oneOf(const std::map<std::string, T>& names) {
    std::vector<std::string> keys;
    for (const auto& entry : names)
        keys.push_back(entry.first);
    return CLI::IsMember(keys);
}

CLI::IsMember oneOfFormats() {
    std::vector<std::string> names;
    for (const Format& format : allFormats())
        names.push_back(format.name);
    return CLI::IsMember(names);
}

CLI::IsMember oneOfModes() {
    return CLI::IsMember(
        std::vector<std::string>(kDeinterlaceNames.begin(), kDeinterlaceNames.end()));
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

void declareFiles(CLI::App* app, Options* options, Texts* texts) {
    app->add_option("IN", options->input, "any file that FFmpeg reads, or raw planes (--size)")
        ->required();
    app->add_option(
        "OUT", options->output,
        "a name ending in .png or .y4m, any other for raw planes; - is standard output");
    app->add_option("--size", texts->size, "IN is raw planes of this size")
        ->check(checkSize)
        ->type_name("WxH");
    app->add_option("--format", texts->format,
                    "pixels of raw planes (else yuv420p); for a clip, those the engine is given")
        ->check(oneOfFormats())
        ->type_name("FORMAT");
    app->add_option("--as", texts->as, "png, y4m or raw, whatever the name of OUT says")
        ->check(oneOf(kKinds))
        ->type_name("KIND");
    app->add_option("--frames", options->frames, "stop after so many frames")
        ->check(CLI::Range(uint64_t{1}, uint64_t{1} << 40))
        ->type_name("N");
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
    app->add_option("--algorithm", texts->algorithm, "nearest, linear or nearlinear")
        ->check(oneOf(kAlgorithms))
        ->type_name("NAME");
    CLI::Option* const mirror =
        app->add_option("--mirror", texts->mirror, "h: left and right exchanged; v: top and bottom")
            ->check(oneOf(kMirrors))
            ->type_name("h|v");
    app->add_option("--rotate", texts->rotate, "clockwise: 0, 90, 180 or 270")
        ->check(oneOf(kRotations))
        ->excludes(mirror)
        ->type_name("DEGREES");
    app->add_option("--deinterlace", texts->deinterlace,
                    "off, fast, discard, bob, blend, mean, linear or x; planar input only")
        ->check(oneOfModes())
        ->type_name("MODE");
}

void declareColours(CLI::App* app, Options* options, Texts* texts) {
    const CLI::Range byte(0, 255);
    Request* const request = &options->request;
    app->add_option("--matrix", texts->matrix, "bt601, bt709, smpte240m or fcc; else the clip's")
        ->check(oneOf(kMatrices))
        ->type_name("MATRIX");
    app->add_option("--range", texts->range, "limited or full; else the clip's")
        ->check(oneOf(kRanges))
        ->type_name("RANGE");
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
    app->set_version_flag("--version", "vidshow-convert " VIDSHOW_CONVERT_VERSION);
}

FileKind kindOf(const Texts& texts, const std::string& output) {
    if (!texts.as.empty()) return kKinds.at(texts.as);
    const size_t dot = output.rfind('.');
    const auto found = kKinds.find(dot == std::string::npos ? "" : output.substr(dot + 1));
    return found == kKinds.end() ? FileKind::raw : found->second;
}

void interpret(const Texts& texts, Options* options) {
    Request& request = options->request;
    if (!texts.size.empty()) options->size = readSize(texts.size);
    options->given = findFormat(texts.format);
    options->kind = kindOf(texts, options->output);
    request.to = findFormat(texts.to);
    if (!texts.resize.empty()) request.resize = readSize(texts.resize);
    request.algorithm = kAlgorithms.at(texts.algorithm);
    request.rotation =
        texts.mirror.empty() ? kRotations.at(texts.rotate) : kMirrors.at(texts.mirror);
    if (!texts.matrix.empty()) request.matrix = kMatrices.at(texts.matrix);
    if (!texts.range.empty()) request.range = kRanges.at(texts.range);
    if (!texts.colorKey.empty()) {
        request.colorKey = static_cast<uint32_t>(std::stoul(texts.colorKey, nullptr, 16));
    }
    const auto mode =
        std::find(kDeinterlaceNames.begin(), kDeinterlaceNames.end(), texts.deinterlace);
    request.deinterlace = static_cast<uint32_t>(std::distance(kDeinterlaceNames.begin(), mode));
}

}  // namespace

std::optional<int> readOptions(int argc, char** argv, Options* options) {
    CLI::App app(kDescription, "vidshow-convert");
    app.footer(kFooter);
    app.failure_message([](const CLI::App*, const CLI::Error& error) {
        return std::string("vidshow-convert: ") + error.what() + " (--help tells more)\n";
    });
    Texts texts;
    declareFiles(&app, options, &texts);
    declareConversion(&app, &texts);
    declareColours(&app, options, &texts);
    try {
        app.parse(argc, argv);
        if (options->output.empty() && !options->info) throw CLI::RequiredError("OUT");
    } catch (const CLI::ParseError& end) {
        return app.exit(end) == 0 ? kExitDone : kExitUsage;
    }
    interpret(texts, options);
    return std::nullopt;
}

}  // namespace vidshow::tools
