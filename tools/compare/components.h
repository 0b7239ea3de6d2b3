#pragma once

#include <string>
#include <vector>

#include "common/ffmpeg.h"
#include "compare/quality.h"

namespace vidshow::tools {

/// The components of a clip's pictures: "Y", "Cb" and "Cr", "R", "G" and "B", perhaps "A", or "Y"
/// alone, however a format lays them out.
class Components {
  public:
    /// @throws Error when the frame's format cannot be taken apart
    explicit Components(const AVFrame& frame);

    size_t count() const { return m_names.size(); }
    const std::string& name(size_t component) const { return m_names[component]; }
    int peak() const { return m_peak; }  ///< largest sample
    bool rgb() const { return m_rgb; }

    /// What the two cannot be compared for; "" for nothing.
    std::string differenceTo(const Components& other) const;

    Samples samples(const AVFrame& frame, size_t component) const;

  private:
    std::string text() const;

    const AVPixFmtDescriptor* m_format;
    int m_width;
    int m_height;
    int m_peak;
    bool m_rgb;
    std::vector<std::string> m_names;
};

}  // namespace vidshow::tools
