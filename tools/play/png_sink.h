#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "common/sink.h"
#include "play/contact_sheet.h"

namespace vidshow::tools {

/// Writes chosen pictures as PNG files, and one contact sheet of them.
class PngSink : public Sink {
  public:
    /// @param folder made if it is not there
    /// @param picks  numbers of the frames, rising
    /// @param asked  the user chose the frames: all must come, and none after the last matters
    PngSink(const std::string& folder, std::vector<uint64_t> picks, bool asked);

    void show(const Picture& picture) override;
    std::string finish() override;
    bool satisfied() const override { return m_asked && m_next == m_picks.size(); }
    bool wantsEveryFrame() const override { return true; }

  private:
    const std::string m_folder;
    const std::vector<uint64_t> m_picks;
    const bool m_asked;
    size_t m_next = 0;  // place in m_picks
    RgbConverter m_converter;
    ContactSheet m_sheet;
};

/// Frames spread evenly over so many, each in the middle of its stretch.
std::vector<uint64_t> spreadPicks(uint64_t frames);

}  // namespace vidshow::tools
