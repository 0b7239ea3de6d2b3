#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>

#include "common/error.h"
#include "convert/source.h"

namespace vidshow::tools {

namespace {

constexpr AVRational kUsualFrameRate = {25, 1};

class RawSource : public Source {
  public:
    RawSource(const std::string& path, const Format& format, const Size& size)
        : m_image(format, size.width, size.height), m_file(std::fopen(path.c_str(), "rb")) {
        if (!m_file) throw Error("cannot read " + path + ": " + std::strerror(errno));
        std::error_code noFile;
        const uintmax_t bytes = std::filesystem::file_size(path, noFile);
        if (!noFile) m_frames = bytes / bytesOf(m_image);
    }

    const Image* next() override {
        size_t have = 0;
        const size_t wanted = bytesOf(m_image);
        for (int i = 0; i < m_image.format->planes; ++i) {
            have += std::fread(m_image.data[i], 1, m_image.bytes(i), m_file.get());
        }
        m_cut = have != 0 && have != wanted;
        return have == wanted ? &m_image : nullptr;
    }

    Colour colour() const override { return {}; }
    AVRational frameRate() const override { return kUsualFrameRate; }
    uint64_t announcedFrames() const override { return m_frames; }
    std::string damage() const override {
        return m_cut ? "it ends in the middle of a picture" : "";
    }

  private:
    static size_t bytesOf(const Image& image) {
        size_t bytes = 0;
        for (int i = 0; i < image.format->planes; ++i)
            bytes += image.bytes(i);
        return bytes;
    }
    struct Close {
        void operator()(std::FILE* file) const { std::fclose(file); }
    };
    Image m_image;
    std::unique_ptr<std::FILE, Close> m_file;
    uint64_t m_frames = 0;
    bool m_cut = false;
};

}  // namespace

std::unique_ptr<Source> openRaw(const Options& options) {
    const Format& format = options.given != nullptr ? *options.given : *findFormat("yuv420p");
    return std::make_unique<RawSource>(options.input, format, *options.size);
}

}  // namespace vidshow::tools
