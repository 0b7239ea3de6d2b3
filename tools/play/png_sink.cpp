#include "play/png_sink.h"

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <utility>

#include "common/error.h"
#include "common/png_file.h"

namespace vidshow::tools {

PngSink::PngSink(const std::string& folder, std::vector<uint64_t> picks, bool asked)
    : m_folder(folder),
      m_picks(std::move(picks)),
      m_asked(asked),
      m_converter(AV_PIX_FMT_RGB24, RgbConverter::Quality::best) {
    std::error_code error;
    std::filesystem::create_directories(folder, error);
    if (error) throw Error("cannot make the folder " + folder + ": " + error.message());
}

void PngSink::show(const Picture& picture) {
    if (m_next == m_picks.size() || picture.number != m_picks[m_next]) return;
    ++m_next;
    char name[40];
    std::snprintf(name, sizeof name, "/frame-%06llu.png",
                  static_cast<unsigned long long>(picture.number));
    writePng(m_folder + name,
             m_converter.convert(picture, picture.planes.width, picture.planes.height));
    m_sheet.add(picture);
}

std::string PngSink::finish() {
    if (m_sheet.empty()) throw Error("none of the chosen frames is in the clip");
    writePng(m_folder + "/contact-sheet.png", m_sheet.image());
    if (m_asked && m_next < m_picks.size()) {
        throw Error("the clip has no frame " + std::to_string(m_picks[m_next]));
    }
    return "pictures in " + m_folder;
}

std::vector<uint64_t> spreadPicks(uint64_t frames) {
    constexpr uint64_t kMost = 12;
    const uint64_t count = std::min(frames, kMost);
    std::vector<uint64_t> picks;
    for (uint64_t i = 0; i < count; ++i)
        picks.push_back((2 * i + 1) * frames / (2 * count) + 1);
    return picks;
}

}  // namespace vidshow::tools
