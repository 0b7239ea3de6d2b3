#include "play/player.h"

#include <cstdio>
#include <utility>

namespace vidshow::tools {

namespace {

using Clock = std::chrono::steady_clock;

constexpr int kEngineBlock = 4;  // pixels
constexpr int kAnySize = 1;      // decoder buffers are not drawn on

constexpr uint32_t kDecoderBufferPath = 1u << 24;
constexpr uint32_t kFullRange = 1u << 8;  // three planes: bits 16 to 23 stay 0

}  // namespace

Player::Player(const Options& options, Sink* sink)
    : m_options(options),
      m_sink(sink),
      m_presenter(m_window.get()),
      m_planar(options.path == Path::software ? kEngineBlock : kAnySize) {
    m_window.onFrame([this](const host::Frame& frame) { onWindowFrame(frame); });
    host::setLogSink([this](int, const char*, const char* text) { m_logged = text; });
    m_presenter.setDeinterlace(options.deinterlace);
}

Player::~Player() {
    host::setLogSink(nullptr);
}

bool Player::present(const AVFrame& frame, uint64_t number) {
    m_expected.look = lookOf(frame);
    m_expected.planes.width = frame.width;
    m_expected.planes.height = frame.height;
    m_expected.number = number;
    m_arrived = false;
    m_logged.clear();

    const Planes planes = m_planar.from(frame, m_expected.look.colour);
    m_presenter.setFormat({static_cast<uint32_t>(planes.width),
                           static_cast<uint32_t>(planes.height),
                           formatCode(m_expected.look.colour)});
    return judge(handOver(planes));
}

Look Player::lookOf(const AVFrame& frame) const {
    Look look;
    look.colour = colourOf(frame);
    look.colour.matrix = m_options.matrix.value_or(look.colour.matrix);
    look.colour.range = m_options.range.value_or(look.colour.range);
    if (frame.sample_aspect_ratio.num > 0 && frame.sample_aspect_ratio.den > 0) {
        look.pixelAspect = frame.sample_aspect_ratio;
    }
    look.chroma = frame.chroma_location;
    look.interlaced = frame.interlaced_frame != 0;
    look.topFieldFirst = frame.top_field_first != 0;
    return look;
}

uint32_t Player::formatCode(const Colour& colour) const {
    if (m_options.path == Path::decoder) return kDecoderBufferPath;
    return (colour.range == Range::full ? kFullRange : 0) | matrixCode(colour.matrix);
}

HRESULT Player::handOver(const Planes& planes) {
    unsigned char* entries[3];
    DWORD strides[3];
    for (int i = 0; i < 3; ++i) {
        // `Present` only reads them; its signature is older than that promise.
        entries[i] = const_cast<unsigned char*>(planes.data[i]);
        strides[i] = static_cast<DWORD>(planes.stride[i]);
    }
    host::DecoderBuffer* buffer = nullptr;
    if (m_options.path == Path::decoder) {
        buffer = &m_buffers.fill(planes);
        entries[0] = static_cast<unsigned char*>(buffer->mediaBuffer());
    }
    m_sinkTime = std::chrono::nanoseconds(0);
    const Clock::time_point start = Clock::now();
    const HRESULT result = m_presenter.present(entries, strides);
    m_presentTime += Clock::now() - start - m_sinkTime;
    ++m_presents;
    if (buffer != nullptr && !buffer->rendered()) m_arrived = false;
    return result;
}

bool Player::judge(HRESULT result) {
    if (m_sinkError) std::rethrow_exception(std::exchange(m_sinkError, nullptr));
    // A frame that could not be drawn is posted all the same; only the log tells.
    if (result == S_OK && m_arrived && m_logged.empty()) return true;
    char text[40];
    std::snprintf(text, sizeof text, "Present gives 0x%08x", static_cast<unsigned>(result));
    m_failure = m_logged.empty() ? text : text + (": " + m_logged);
    return false;
}

// Runs inside `Present`, through which nothing may be thrown.
void Player::onWindowFrame(const host::Frame& frame) {
    const Clock::time_point start = Clock::now();
    m_arrived = frame.format == host::kFormatYv12 && frame.width >= m_expected.planes.width &&
                frame.height >= m_expected.planes.height;
    if (m_arrived) {
        Picture picture = m_expected;
        picture.planes = yv12Planes(frame.bits, frame.width, frame.height, frame.stride);
        picture.planes.width = m_expected.planes.width;
        picture.planes.height = m_expected.planes.height;
        try {
            m_sink->show(picture);
        } catch (...) {
            m_sinkError = std::current_exception();
        }
    }
    m_sinkTime = Clock::now() - start;
}

}  // namespace vidshow::tools
