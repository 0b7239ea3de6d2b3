#include "convert/format.h"

namespace vidshow::tools {

namespace {

constexpr uint32_t kUpright = 1u << QZ_IMAGEPROC_ROTATE_NONE;
constexpr uint32_t kQuarters =
    kUpright | 1u << QZ_IMAGEPROC_ROTATE_90AC | 1u << QZ_IMAGEPROC_ROTATE_90C;
constexpr uint32_t kTurns = kQuarters | 1u << QZ_IMAGEPROC_ROTATE_180;
constexpr uint32_t kAll =
    kTurns | 1u << QZ_IMAGEPROC_ROTATE_MIRROR_H | 1u << QZ_IMAGEPROC_ROTATE_MIRROR_V;

constexpr int kSizeUnit = 4;
constexpr int kRgbTurnUnit = 8;

// As the comment on QZ_IMAGEPROC_CSC tells.
constexpr Ability kAbilities[] = {
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_YCBCR420, kAll, true, kSizeUnit},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB565, kAll, true, kSizeUnit},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB888, kUpright, false, kSizeUnit},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_ARGB32, kAll, true, kSizeUnit},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_YUY2, kUpright, false, kSizeUnit},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_UYVY, kUpright, false, kSizeUnit},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_NV12, kUpright, false, kSizeUnit},
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551, kUpright, false, kSizeUnit},
    {QZ_IMAGEPROC_CSC_YCBCR422_TO_RGB565, kUpright, true, kSizeUnit},
    {QZ_IMAGEPROC_CSC_YCBCR444_TO_RGB565, kAll, true, kSizeUnit},
    {QZ_IMAGEPROC_CSC_YCBCR444_TO_RGB888, kAll, true, kSizeUnit},
    {QZ_IMAGEPROC_CSC_YCBCR444_TO_ARGB32, kAll, true, kSizeUnit},
    {QZ_IMAGEPROC_CSC_RGB565_TO_YCBCR420, kQuarters, false, kRgbTurnUnit},
    {QZ_IMAGEPROC_CSC_RGB565_TO_RGB565, kAll, true, kSizeUnit},
    {QZ_IMAGEPROC_CSC_RGB565_TO_ARGB32, kUpright, false, kSizeUnit},
    {QZ_IMAGEPROC_CSC_RGB888_TO_RGB565, kAll, true, kSizeUnit},
    {QZ_IMAGEPROC_CSC_RGB888_TO_RGB888, kAll, true, kSizeUnit},
    {QZ_IMAGEPROC_CSC_ARGB32_TO_YCBCR420, kTurns, false, kRgbTurnUnit},
    {QZ_IMAGEPROC_CSC_NV12_TO_YCBCR420, kUpright, false, kSizeUnit},
    {QZ_IMAGEPROC_CSC_NV12_TO_RGB565, kUpright, false, kSizeUnit},
    {QZ_IMAGEPROC_CSC_ABGR32_TO_YCBCR420, kTurns, false, kRgbTurnUnit},
};

AVPixelFormat withoutJpegsNames(AVPixelFormat pixels) {
    switch (pixels) {
        case AV_PIX_FMT_YUVJ420P:
            return AV_PIX_FMT_YUV420P;
        case AV_PIX_FMT_YUVJ422P:
            return AV_PIX_FMT_YUV422P;
        case AV_PIX_FMT_YUVJ444P:
            return AV_PIX_FMT_YUV444P;
        default:
            return pixels;
    }
}

}  // namespace

size_t Format::rowBytes(int plane, int width) const {
    if (plane == 0) return static_cast<size_t>(width) * static_cast<size_t>(bytes);
    const int samples = (width + (1 << shiftX) - 1) >> shiftX;
    return static_cast<size_t>(samples) * static_cast<size_t>(chromaBytes);
}

int Format::rows(int plane, int height) const {
    return plane == 0 ? height : (height + (1 << shiftY) - 1) >> shiftY;
}

bool Format::packedRgb() const {
    return planes == 1 && number != QZ_IMAGEPROC_FMT_YUY2 && number != QZ_IMAGEPROC_FMT_UYVY;
}

const std::vector<Format>& allFormats() {
    static const std::vector<Format> formats = {
        {"yuv420p", QZ_IMAGEPROC_FMT_YCBCR420, AV_PIX_FMT_YUV420P, 3, 1, 1, 1, 1},
        {"yuv422p", QZ_IMAGEPROC_FMT_YCBCR422, AV_PIX_FMT_YUV422P, 3, 1, 1, 1, 0},
        {"yuv444p", QZ_IMAGEPROC_FMT_YCBCR444, AV_PIX_FMT_YUV444P, 3, 1, 1, 0, 0},
        {"rgb565", QZ_IMAGEPROC_FMT_RGB565, AV_PIX_FMT_RGB565LE, 1, 2, 0, 0, 0},
        {"rgb888", QZ_IMAGEPROC_FMT_RGB888, AV_PIX_FMT_BGR24, 1, 3, 0, 0, 0},
        {"argb32", QZ_IMAGEPROC_FMT_ARGB32, AV_PIX_FMT_BGRA, 1, 4, 0, 0, 0},
        {"yuy2", QZ_IMAGEPROC_FMT_YUY2, AV_PIX_FMT_YUYV422, 1, 2, 0, 0, 0},
        {"uyvy", QZ_IMAGEPROC_FMT_UYVY, AV_PIX_FMT_UYVY422, 1, 2, 0, 0, 0},
        {"nv12", QZ_IMAGEPROC_FMT_NV12, AV_PIX_FMT_NV12, 2, 1, 2, 1, 1},
        {"abgr32", QZ_IMAGEPROC_FMT_ABGR32, AV_PIX_FMT_RGBA, 1, 4, 0, 0, 0},
        {"rgb5551", QZ_IMAGEPROC_FMT_RGB5551, AV_PIX_FMT_NONE, 1, 2, 0, 0, 0},
    };
    return formats;
}

const Format* findFormat(const std::string& name) {
    for (const Format& format : allFormats()) {
        if (name == format.name) return &format;
    }
    return nullptr;
}

const Format* formatOf(AVPixelFormat pixels) {
    for (const Format& format : allFormats()) {
        if (format.pixels == withoutJpegsNames(pixels)) return &format;
    }
    return nullptr;
}

const Ability* findAbility(const Format& from, const Format& to) {
    for (const Ability& ability : kAbilities) {
        if (ability.code == (uint32_t{from.number} << 8 | to.number)) return &ability;
    }
    return nullptr;
}

std::string outputsFrom(const Format& from) {
    std::string names;
    for (const Format& to : allFormats()) {
        if (findAbility(from, to) != nullptr)
            names += (names.empty() ? "" : ", ") + std::string(to.name);
    }
    return names.empty() ? "nothing" : names;
}

}  // namespace vidshow::tools
