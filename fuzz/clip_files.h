#pragma once

#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <string>
#include <vector>

#include "convert/encoder.h"
#include "fuzz/bytes.h"

namespace fuzz {

using Contents = std::vector<uint8_t>;

/// A file that has a path and needs no disk.
class MemoryFile {
  public:
    MemoryFile()
        : m_file(memfd_create("clip", MFD_CLOEXEC)),
          m_path("/proc/self/fd/" + std::to_string(m_file)) {
        Require(m_file >= 0, "there are files in memory");
    }
    ~MemoryFile() { close(m_file); }
    MemoryFile(const MemoryFile&) = delete;
    MemoryFile& operator=(const MemoryFile&) = delete;

    const std::string& path() const { return m_path; }

    void Set(const Contents& contents) {
        const ssize_t size = static_cast<ssize_t>(contents.size());
        Require(ftruncate(m_file, size) == 0 &&
                    pwrite(m_file, contents.data(), contents.size(), 0) == size,
                "a file in memory can be written");
    }
    Contents Get() const {
        Contents contents(static_cast<size_t>(lseek(m_file, 0, SEEK_END)));
        Require(pread(m_file, contents.data(), contents.size(), 0) ==
                    static_cast<ssize_t>(contents.size()),
                "a file in memory can be read");
        return contents;
    }

  private:
    const int m_file;
    const std::string m_path;
};

struct ClipKind {
    const char* extension;
    const char* encoder;  ///< FFmpeg's name; empty: what suits the container
    int width;
    int height;
};

/// Containers and codecs that are found by what a file begins with, and whose readers are used to
/// damage.
constexpr ClipKind kClipKinds[] = {
    {"y4m", "", 18, 14},       {"mp4", "mpeg4", 16, 16},     {"mkv", "ffv1", 17, 15},
    {"avi", "mjpeg", 16, 16},  {"ts", "mpeg2video", 16, 16}, {"webm", "libvpx", 16, 16},
    {"gif", "", 16, 12},       {"flv", "flv", 16, 16},       {"nut", "rawvideo", 12, 10},
    {"mov", "png", 10, 10},    {"mov", "qtrle", 16, 16},     {"ogv", "libtheora", 16, 16},
    {"mp4", "libx264", 16, 16}};
constexpr uint32_t kClipKindCount = std::size(kClipKinds);

/// The last one takes its reader several times as long as the others.
constexpr uint32_t kSlowClipKind = kClipKindCount - 1;

constexpr int kPicturesOfAClip = 2;

/// A whole clip as the converter writes it.
inline Contents MakeClip(const ClipKind& kind) {
    using namespace vidshow::tools;
    const MemoryFile file;
    Options options;
    options.kind = FileKind::clip;
    options.extension = kind.extension;
    options.encoder = kind.encoder;
    if (options.encoder == "libx264") options.encoderOptions = {"preset=ultrafast"};
    const AvPtr<AVFrame> frame(checkMemory(av_frame_alloc()));
    frame->format = AV_PIX_FMT_YUV420P;
    frame->width = kind.width;
    frame->height = kind.height;
    Require(av_frame_get_buffer(frame.get(), 0) == 0, "there is memory for a small picture");
    Encoder encoder(chooseEncoding(options, {25, 1}), file.path(), *frame);
    Samples samples(static_cast<uint32_t>(kind.width));
    for (int64_t number = 0; number < kPicturesOfAClip; ++number) {
        Require(av_frame_make_writable(frame.get()) == 0, "a picture can be painted");
        for (int plane = 0; plane < 3; ++plane) {
            const int rows = plane == 0 ? kind.height : (kind.height + 1) / 2;
            samples.Fill(frame->data[plane],
                         static_cast<size_t>(rows) * static_cast<size_t>(frame->linesize[plane]));
        }
        frame->pts = number;
        encoder.write(frame.get());
    }
    encoder.finish();
    return file.Get();
}

/// Breaks a clip at places that the input names.
class Damage {
  public:
    explicit Damage(Bytes& bytes) : m_bytes(bytes) {}

    void Do(Contents& clip) {
        if (clip.empty()) return;
        const size_t at = Place(clip);
        const auto begin = clip.begin() + static_cast<ptrdiff_t>(at);
        switch (m_bytes.Below(7)) {
            case 0:
                clip[at] = static_cast<uint8_t>(clip[at] ^ (1u << m_bytes.Below(8)));
                return;
            case 1:
                clip[at] = m_bytes.Byte();
                return;
            case 2:
                return Overwrite(clip, at);
            case 3:
                return clip.resize(at);
            case 4:
                clip.erase(begin, begin + Length(clip, at));
                return;
            case 5: {
                const Contents again(begin, begin + Length(clip, at));
                clip.insert(begin, again.begin(), again.end());
                return;
            }
            default:
                clip.insert(begin, m_bytes.Below(64), m_bytes.Byte());
        }
    }

  private:
    // Heads of files deserve their share.
    size_t Place(const Contents& clip) {
        return m_bytes.Below(m_bytes.Bit() ? 256 : 65536) % clip.size();
    }
    ptrdiff_t Length(const Contents& clip, size_t at) {
        return static_cast<ptrdiff_t>(std::min<size_t>(1 + m_bytes.Below(512), clip.size() - at));
    }
    // Sizes and counts are whole words, of either byte order.
    void Overwrite(Contents& clip, size_t at) {
        const uint32_t words[] = {0, 1, 0x7FFFFFFF, 0x80000000, 0xFFFFFFFF, 0x00010000, 0x10};
        const uint32_t word = m_bytes.Bit() ? m_bytes.Word() : m_bytes.Of(words);
        const bool upwards = m_bytes.Bit();
        for (size_t i = 0; i < 4 && at + i < clip.size(); ++i)
            clip[at + i] = static_cast<uint8_t>(word >> 8 * (upwards ? i : 3 - i));
    }

    Bytes& m_bytes;
};

}  // namespace fuzz
