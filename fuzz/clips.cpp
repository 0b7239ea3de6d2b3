// Damaged clips through the tools: their decoder and raw reader, then the converter's or the
// player's way of a frame to the library. A clip gives whole frames or is refused with one clear
// line; nothing of ours ends the program and nothing stays behind.

#include <cstdlib>
#include <exception>
#include <memory>
#include <new>
#include <optional>

#include "common/decoder.h"
#include "common/error.h"
#include "convert/conversion.h"
#include "convert/source.h"
#include "fuzz/bytes.h"
#include "fuzz/clip_files.h"
#include "play/decoder_buffers.h"
#include "play/planar420.h"
#include "play/presenter.h"
#include "vidshow-host/window.h"

extern "C" {
#include <libavutil/cpu.h>
}

namespace {

using namespace vidshow::tools;
namespace host = vidshow::host;
using fuzz::Bytes;
using fuzz::Contents;
using fuzz::Require;

constexpr int kMostFrames = 8;

/// What every case uses.
struct Process {
    Process() {
        av_log_set_level(AV_LOG_QUIET);
        av_cpu_force_count(1);  // threads to decode would cost more than the decoding
        host::setLogSink([](int, const char*, const char*) {});
        for (const fuzz::ClipKind& kind : fuzz::kClipKinds)
            clips.push_back(fuzz::MakeClip(kind));
        // A damaged size makes pictures of any size; large ones would only cost time.
        av_max_alloc(1 << 20);
    }

    std::vector<Contents> clips;
    fuzz::MemoryFile file;
};

void RequireWhole(const AVFrame& frame) {
    const AVPixelFormat format = static_cast<AVPixelFormat>(frame.format);
    const int planes = av_pix_fmt_count_planes(format);
    Require(frame.width > 0 && frame.height > 0 && planes > 0, "a frame has a size and a form");
    for (int plane = 0; plane < planes; ++plane) {
        const int rowBytes = av_image_get_linesize(format, frame.width, plane);
        Require(frame.data[plane] != nullptr && std::abs(frame.linesize[plane]) >= rowBytes,
                "a frame's planes hold its width");
    }
}

/// The player's way of a frame: through a stream onto a window.
class Screen {
  public:
    explicit Screen(bool decoderBuffers)
        : m_decoderBuffers(decoderBuffers),
          m_presenter(m_window.get()),
          m_planar(decoderBuffers ? 1 : 4) {
        m_window.onFrame([this](const host::Frame& frame) { Note(frame); });
    }

    void SetDeinterlace(uint32_t mode) { m_presenter.setDeinterlace(mode); }

    void Show(const AVFrame& frame) {
        const Colour colour = colourOf(frame);
        const Planes planes = m_planar.from(frame, colour);
        Require(planes.width >= frame.width && planes.height >= frame.height,
                "no edge of a picture is lost");
        m_presenter.setFormat({static_cast<uint32_t>(planes.width),
                               static_cast<uint32_t>(planes.height), Code(colour)});
        m_shown = {};
        Require(HandOver(planes) == S_OK, "a whole frame can be presented");
        Require(m_shown.width >= frame.width && m_shown.height >= frame.height,
                "it arrives at the window");
    }

  private:
    uint32_t Code(const Colour& colour) const {
        if (m_decoderBuffers) return 1u << 24;
        return (colour.range == Range::full ? 1u << 8 : 0) | matrixCode(colour.matrix);
    }

    HRESULT HandOver(const Planes& planes) {
        unsigned char* entries[3];
        DWORD strides[3];
        for (int i = 0; i < 3; ++i) {
            entries[i] = const_cast<unsigned char*>(planes.data[i]);
            strides[i] = static_cast<DWORD>(planes.stride[i]);
        }
        if (m_decoderBuffers) {
            entries[0] = static_cast<unsigned char*>(m_buffers.fill(planes).mediaBuffer());
        }
        return m_presenter.present(entries, strides);
    }

    void Note(const host::Frame& frame) { m_shown = frame; }

    const bool m_decoderBuffers;
    host::Window m_window;
    Presenter m_presenter;
    Planar420 m_planar;
    DecoderBuffers m_buffers;
    host::Frame m_shown = {};
};

// Returns how many frames the clip gave, those behind a seek too.
int Play(Bytes& bytes, const std::string& path) {
    Decoder decoder(path);
    Screen screen(bytes.Bit());
    screen.SetDeinterlace(bytes.Bit() ? bytes.Below(8) : 0);
    int frames = 0;
    for (; frames < kMostFrames; ++frames) {
        const AVFrame* const frame = decoder.next();
        if (frame == nullptr) break;
        RequireWhole(*frame);
        screen.Show(*frame);
        if (frames > 0 && bytes.Below(8) == 7) decoder.seek(bytes.Below(4) / 25.0);
    }
    Require(decoder.frameSeconds() > 0, "a frame lasts");
    Require(decoder.damage().find('\n') == std::string::npos, "what is wrong is told in a line");
    return frames;
}

// As the command line takes it.
Size AnySize(Bytes& bytes) {
    return {4 + static_cast<int>(bytes.Below(40)), 4 + static_cast<int>(bytes.Below(40))};
}

Request AnyRequest(Bytes& bytes) {
    const std::vector<Format>& formats = allFormats();
    Request request;
    if (bytes.Bit()) request.to = &formats[bytes.Below(16) % formats.size()];
    if (bytes.Bit()) request.resize = AnySize(bytes);
    request.rotation = bytes.Bit() ? bytes.Below(6) : 0;
    request.deinterlace = bytes.Bit() ? bytes.Below(8) : 0;
    if (bytes.Bit()) request.adjustment[1] = bytes.Byte();
    return request;
}

void Convert(Source& source, const Options& options) {
    std::optional<Conversion> conversion;
    for (int i = 0; i < kMostFrames; ++i) {
        const Image* const image = source.next();
        if (image == nullptr) break;
        Require(image->width > 0 && image->height > 0, "a picture has a size");
        if (!conversion || !conversion->takes(*image, source.colour())) {
            conversion.emplace(*image, source.colour(), options.kind, options.request);
        }
        const Image& result = conversion->convert(*image);
        Require(result.format != nullptr && result.width > 0 && result.height > 0,
                "a picture is made of it");
    }
    Require(source.damage().find('\n') == std::string::npos, "what is wrong is told in a line");
}

void ConvertClip(Bytes& bytes, const std::string& path) {
    Options options;
    options.input = path;
    options.kind = bytes.Bit() ? FileKind::png : FileKind::clip;
    options.request = AnyRequest(bytes);
    if (bytes.Below(8) == 7) options.given = &allFormats()[bytes.Below(10)];
    Convert(*openClip(options), options);
}

// Planes without a head, of which none or a piece may be missing.
void ConvertRaw(Bytes& bytes, fuzz::MemoryFile& file) {
    Options options;
    options.input = file.path();
    options.given = &allFormats()[bytes.Below(11)];
    options.size = AnySize(bytes);
    options.request = AnyRequest(bytes);
    Contents planes(bytes.Below(8192));
    fuzz::Samples(bytes.Word()).Fill(planes.data(), planes.size());
    file.Set(planes);
    Convert(*openRaw(options), options);
}

Contents Damaged(Bytes& bytes, Contents clip) {
    fuzz::Damage damage(bytes);
    for (uint32_t left = bytes.Below(6); left > 0; --left)
        damage.Do(clip);
    return clip;
}

// The input itself, which the fuzzer makes what it likes of.
Contents Rest(Bytes& bytes) {
    Contents clip;
    for (uint32_t left = bytes.Below(256); left > 0; --left)
        clip.push_back(bytes.Byte());
    return clip;
}

void Run(Bytes& bytes, Process& process) {
    constexpr uint32_t kRaw = fuzz::kClipKindCount;
    uint32_t kind = bytes.Below(fuzz::kClipKindCount + 2);
    if (kind == kRaw) return ConvertRaw(bytes, process.file);
    if (kind == fuzz::kSlowClipKind && bytes.Below(8) != 0) kind = 0;
    const bool plays = bytes.Bit();
    const Contents clip = kind == kRaw + 1 ? Rest(bytes) : Damaged(bytes, process.clips[kind]);
    process.file.Set(clip);
    if (!plays) return ConvertClip(bytes, process.file.path());
    const int frames = Play(bytes, process.file.path());
    const bool isWhole = kind != kRaw + 1 && clip == process.clips[kind];
    Require(!isWhole || frames >= fuzz::kPicturesOfAClip, "a whole clip gives all its frames");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static Process process;
    Bytes bytes(data, size);
    try {
        Run(bytes, process);
    } catch (const Error& error) {
        const std::string text = error.what();
        Require(!text.empty() && text.find('\n') == std::string::npos,
                "a clip is refused with one line");
    } catch (const std::bad_alloc&) {  // of a damaged size
    }
    return 0;
}
