#pragma once

#include <string>

#include "convert/image.h"
#include "convert/options.h"

namespace vidshow::tools {

/// One processor of the engine: pictures of one size and format into those of another.
class Conversion {
  public:
    /// @throws Error when the engine does not do this; it names what the engine does instead
    Conversion(const Image& first, const Colour& colour, FileKind kind, const Request& request);
    ~Conversion();
    Conversion(const Conversion&) = delete;
    Conversion& operator=(const Conversion&) = delete;

    bool takes(const Image& image, const Colour& colour) const;

    /// @return valid until the next call
    const Image& convert(const Image& image);

    /// What the samples mean.
    const Colour& colour() const { return m_colour; }

    std::string text() const;  ///< what the engine makes of it, in lines
    std::string json() const;  ///< the same as members of a JSON object

  private:
    void check(const Format& to) const;
    void create();
    void adjust();
    const QZ_IMAGEPROC_PARAMSET& record() const;

    const Format* const m_from;
    const Size m_given;
    const Colour m_clipColour;
    const Request m_request;
    Colour m_colour;
    const Ability* m_ability = nullptr;
    Size m_cut = {};
    Size m_target = {};  // before a quarter turn
    Image m_result;
    void* m_handle = nullptr;
};

}  // namespace vidshow::tools
