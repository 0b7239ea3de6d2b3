#pragma once

#include <cstdint>
#include <memory>

#include "vidshow/presenter.h"

struct ANativeWindow;

namespace vidshow::tools {

/// What a stream is made for.
struct StreamFormat {
    uint32_t width;   ///< pixels
    uint32_t height;  ///< pixels
    uint32_t code;    ///< `VP_OPEN_STREAM_PARAMS::dwFormat`

    bool operator==(const StreamFormat& other) const {
        return width == other.width && height == other.height && code == other.code;
    }
};

/// The presenter as a media player drives it: opened, given a window, with one stream.
class Presenter {
  public:
    /// @throws Error when a call of the presenter fails
    explicit Presenter(ANativeWindow* window);
    ~Presenter();
    Presenter(const Presenter&) = delete;
    Presenter& operator=(const Presenter&) = delete;

    /// Opens a stream for frames of this format, unless that is the one that is open.
    void setFormat(const StreamFormat& format);

    /// Holds for every stream from now on.
    void setDeinterlace(uint32_t mode);

    /// Shows a frame; see `IJxVideoPresenterStream::Present`.
    HRESULT present(unsigned char** planes, DWORD* strides);

  private:
    struct Delete {
        void operator()(IJxVideoPresenterAdv* presenter) const {
            delete static_cast<CVidshow*>(presenter);
        }
    };
    void setWindow(ANativeWindow* window);
    void openStream();
    void closeStream();

    std::unique_ptr<IJxVideoPresenterAdv, Delete> m_presenter;
    IJxVideoPresenterStream* m_stream = nullptr;
    StreamFormat m_format = {};
    uint32_t m_deinterlace = 0;
};

}  // namespace vidshow::tools
