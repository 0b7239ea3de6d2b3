#include "convert/conversion.h"

#include <fcntl.h>
#include <unistd.h>

#include <cstdio>

#include "common/error.h"
#include "convert/choice.h"

namespace vidshow::tools {

namespace {

constexpr int kSizeUnit = 4;

const char* const kMatrixNames[] = {"bt601", "bt709", "smpte240m", "fcc"};

Size cutTo(const Size& size, int unit) {
    return {size.width / unit * unit, size.height / unit * unit};
}

std::string text(const Size& size) {
    return std::to_string(size.width) + "x" + std::to_string(size.height);
}

bool quarterTurn(uint32_t rotation) {
    return rotation == QZ_IMAGEPROC_ROTATE_90AC || rotation == QZ_IMAGEPROC_ROTATE_90C;
}

// The engine tells of itself on standard output, where pixels may have to go.
class Silence {
  public:
    Silence() : m_output(dup(STDOUT_FILENO)) {
        std::fflush(stdout);
        const int nothing = open("/dev/null", O_WRONLY);
        dup2(nothing, STDOUT_FILENO);
        close(nothing);
    }
    ~Silence() {
        std::fflush(stdout);
        dup2(m_output, STDOUT_FILENO);
        close(m_output);
    }
    Silence(const Silence&) = delete;
    Silence& operator=(const Silence&) = delete;

  private:
    const int m_output;
};

bool isPlanar(const Format& format) {
    return format.planes == 3;
}

bool serves(const Ability& ability, const Request& request) {
    return (ability.rotations >> request.rotation & 1) != 0 &&
           (ability.resizes || !request.resize.has_value());
}

// For a file whose format is not chosen: the first of these that the engine makes of the input.
const Format& suitable(const Format& from, FileKind kind, const Request& request) {
    if (request.to != nullptr) return *request.to;
    const bool rgbOnly = kind == FileKind::png;
    for (const char* name : {"yuv420p", "rgb888", "argb32", "rgb565"}) {
        const Format* const to = findFormat(name);
        if (rgbOnly ? !to->packedRgb() : kind != FileKind::clip) continue;
        const Ability* const ability = findAbility(from, *to);
        if (ability != nullptr && serves(*ability, request)) return *to;
    }
    return *findFormat(rgbOnly ? "rgb565" : "yuv420p");
}

}  // namespace

Conversion::Conversion(const Image& first, const Colour& colour, FileKind kind,
                       const Request& request)
    : m_from(first.format),
      m_given{first.width, first.height},
      m_clipColour(colour),
      m_request(request),
      m_colour{request.matrix.value_or(colour.matrix), request.range.value_or(colour.range)} {
    const Format& to = suitable(*m_from, kind, request);
    m_ability = findAbility(*m_from, to);
    check(to);
    const bool turned = request.rotation != QZ_IMAGEPROC_ROTATE_NONE;
    m_cut = cutTo(m_given, turned ? m_ability->turnUnit : kSizeUnit);
    m_target = cutTo(request.resize.value_or(m_cut), kSizeUnit);
    if (m_cut.width == 0 || m_cut.height == 0) {
        throw Error("a picture of " + tools::text(m_given) + " is too small for the engine");
    }
    const bool across = quarterTurn(request.rotation);
    m_result = Image(to, across ? m_target.height : m_target.width,
                     across ? m_target.width : m_target.height);
    create();
    try {
        adjust();
    } catch (...) {
        QZ_IMAGEPROC_Destroy(m_handle);
        throw;
    }
}

Conversion::~Conversion() {
    QZ_IMAGEPROC_Destroy(m_handle);
}

void Conversion::check(const Format& to) const {
    if (m_ability == nullptr) {
        throw Error("the engine does not convert " + std::string(m_from->name) + " to " + to.name +
                    "; from " + m_from->name + " it has: " + outputsFrom(*m_from));
    }
    const std::string pair = std::string(m_from->name) + " to " + to.name;
    if (m_request.resize && !m_ability->resizes) throw Error(pair + " cannot be resized");
    if ((m_ability->rotations >> m_request.rotation & 1) == 0) {
        throw Error(pair + " cannot be turned that way (" + kRotationNames[m_request.rotation] +
                    ")");
    }
    if (m_request.deinterlace != 0 && !isPlanar(*m_from)) {
        throw Error(std::string(m_from->name) + " cannot be deinterlaced; planar input can");
    }
}

void Conversion::create() {
    QZ_IMAGEPROC_INIT_PARAMS params = {};
    params.u32Size = sizeof params;
    params.u32CscType = m_ability->code;
    params.u32RotationType = m_request.rotation;
    params.u32ResizeAlgorithm = m_request.algorithm;
    params.u32InWidth = static_cast<uint32_t>(m_cut.width);
    params.u32InHeight = static_cast<uint32_t>(m_cut.height);
    params.u32OutWidth = static_cast<uint32_t>(m_target.width);
    params.u32OutHeight = static_cast<uint32_t>(m_target.height);
    params.u32Alpha = m_request.alpha;
    params.u32ColorKey = m_request.colorKey;
    params.u32ColorMatrix = static_cast<uint32_t>(m_colour.matrix);
    params.u32YuvRange = m_colour.range == Range::full ? 1 : 0;
    const Silence silence;
    if (QZ_IMAGEPROC_Create(&m_handle, 0, &params) != 0) {
        throw Error("the engine refuses the conversion");
    }
}

// The engine says that upright RGB565 is not adjusted; its kernels do it all the same.
void Conversion::adjust() {
    if (!m_request.adjusts()) return;
    uint32_t stored[3] = {};
    uint32_t size = 0;
    const bool applied = QZ_IMAGEPROC_Set(m_handle, QZ_IMAGEPROC_PROPID_COLORADJUST,
                                          m_request.adjustment, sizeof stored) == 0 &&
                         (QZ_IMAGEPROC_Get(m_handle, QZ_IMAGEPROC_PROPID_COLORADJUST, stored,
                                           sizeof stored, &size) == 0 ||
                          m_ability->code == QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB565);
    if (!applied) {
        throw Error(std::string(m_from->name) + " to " + m_result.format->name +
                    " takes no brightness, contrast or saturation here");
    }
}

bool Conversion::takes(const Image& image, const Colour& colour) const {
    return image.format == m_from && image.width == m_given.width &&
           image.height == m_given.height && colour == m_clipColour;
}

const Image& Conversion::convert(const Image& image) {
    const QZ_IMAGEPROC_FRAME_PARAMS frame = {sizeof frame, 0, m_request.deinterlace};
    const HRESULT result = QZ_IMAGEPROC_ProcessFrame(m_handle, image.data, image.strides,
                                                     m_result.data, m_result.strides, &frame);
    if (result != 0) throw Error("the engine fails with " + std::to_string(result));
    return m_result;
}

const QZ_IMAGEPROC_PARAMSET& Conversion::record() const {
    return *static_cast<const QZ_IMAGEPROC_PARAMSET*>(m_handle);
}

std::string Conversion::text() const {
    const QZ_IMAGEPROC_PARAMSET& p = record();
    std::string lines = std::string("conversion: ") + m_from->name + " to " +
                        m_result.format->name + ", code " + std::to_string(p.u32CscType) + "\n";
    lines += "size: " + tools::text(m_cut) + " to " + tools::text(m_target);
    if (m_cut.width != m_given.width || m_cut.height != m_given.height) {
        lines += ", cut from " + tools::text(m_given);
    }
    lines += "\nturn: " + std::string(kRotationNames[p.u32RotationType]);
    lines +=
        "\nresize case: " + std::to_string(p.u32ResizeCase) + ", " + kCaseNames[p.u32ResizeCase];
    lines += "\nalgorithm: " + std::to_string(p.u32ResizeAlgorithm);
    lines += "\ncolours: " + std::string(kMatrixNames[p.u32ColorMatrix]) +
             (p.u32FullRange != 0 ? ", full range" : ", limited range");
    lines += "\nadjustment: " + std::string(p.u32AdjustActive != 0 ? "on" : "off");
    const Choice choice = choiceFor(p);
    lines += "\nkernel: " + choice.kernel + "\nwhy: " + choice.why;
    return lines + "\n";
}

std::string Conversion::json() const {
    const QZ_IMAGEPROC_PARAMSET& p = record();
    const Choice choice = choiceFor(p);
    const auto number = [](const char* name, uint32_t value) {
        return ", \"" + std::string(name) + "\": " + std::to_string(value);
    };
    const auto boolean = [](const char* name, bool value) {
        return ", \"" + std::string(name) + "\": " + (value ? "true" : "false");
    };
    return "\"from\": \"" + std::string(m_from->name) + "\", \"to\": \"" + m_result.format->name +
           "\"" + number("code", p.u32CscType) + number("inWidth", p.u32InWidth) +
           number("inHeight", p.u32InHeight) +
           number("outWidth", static_cast<uint32_t>(m_result.width)) +
           number("outHeight", static_cast<uint32_t>(m_result.height)) +
           number("rotation", p.u32RotationType) + number("resizeCase", p.u32ResizeCase) +
           number("algorithm", p.u32ResizeAlgorithm) + ", \"matrix\": \"" +
           kMatrixNames[p.u32ColorMatrix] + "\"" + boolean("fullRange", p.u32FullRange != 0) +
           boolean("adjusted", p.u32AdjustActive != 0) + ", \"kernel\": \"" + choice.kernel +
           "\", \"why\": \"" + choice.why + "\"";
}

}  // namespace vidshow::tools
