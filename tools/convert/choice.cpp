#include "convert/choice.h"

#include <dlfcn.h>

#include <cctype>

#include "imageproc/conversions.h"

namespace vidshow::tools {

const char* const kRotationNames[6] = {
    "none",        "90 degrees anticlockwise", "90 degrees clockwise",
    "half a turn", "left and right exchanged", "top and bottom exchanged"};
const char* const kCaseNames[8] = {"same size",
                                   "one side larger, the other smaller or equal",
                                   "both sides larger",
                                   "both sides smaller",
                                   "exactly twice in both directions",
                                   "exactly 2.5 times wide, twice high",
                                   "exactly 1.5 times wide",
                                   "320x240 to 480x272"};

namespace {

std::string algorithmName(uint32_t algorithm) {
    switch (algorithm) {
        case QZ_IMAGEPROC_RESIZE_NEAREST:
            return "nearest";
        case QZ_IMAGEPROC_RESIZE_LINEAR:
            return "linear";
        case QZ_IMAGEPROC_RESIZE_NEARLINEAR:
            return "nearlinear";
        default:
            return std::to_string(algorithm);
    }
}

// "_QZYCbCr420ToRGB565" of "ToPacked<_QZYCbCr420ToRGB565>"; a row that names none has the vector
// kernel, or turns by tiles.
std::string kernelName(const Row& row, const QZ_IMAGEPROC_PARAMSET& p) {
    const std::string text = row.name;
    const size_t start = text.find("_QZ");
    if (start != std::string::npos) {
        size_t end = start;
        while (end < text.size() && (std::isalnum(text[end]) != 0 || text[end] == '_'))
            ++end;
        return text.substr(start, end - start);
    }
    Dl_info info = {};
    if (p.pfnMain == nullptr || dladdr(p.pfnMain, &info) == 0 || info.dli_sname == nullptr) {
        return text;
    }
    const bool turned = text.find("Turned") != std::string::npos;
    return info.dli_sname + (turned ? ", then " + text : std::string());
}

std::string reasons(const Row& row, const QZ_IMAGEPROC_PARAMSET& p) {
    std::string list;
    const auto add = [&list](uint32_t condition, const std::string& text) {
        if (condition == kAny) return;
        list += (list.empty() ? "" : "; ") + text;
    };
    const bool upright = p.u32RotationType == QZ_IMAGEPROC_ROTATE_NONE;
    add(row.rotations, upright ? "not turned" : kRotationNames[p.u32RotationType]);
    add(row.cases, kCaseNames[p.u32ResizeCase]);
    add(row.algorithms, "algorithm " + algorithmName(p.u32ResizeAlgorithm));
    add(row.adjust, p.u32AdjustActive != 0 ? "colours adjusted" : "colours not adjusted");
    return list.empty() ? "the only one of this conversion" : list;
}

}  // namespace

Choice choiceFor(const QZ_IMAGEPROC_PARAMSET& processor) {
    const vidshow::Conversion* const conversion = FindConversion(processor.u32CscType);
    const Row* const row = conversion != nullptr ? ChooseRow(*conversion, processor) : nullptr;
    if (row == nullptr) return {"none", "the pipeline has none for these settings"};
    return {kernelName(*row, processor), reasons(*row, processor)};
}

}  // namespace vidshow::tools
