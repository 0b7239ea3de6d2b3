#ifndef VIDSHOW_HOST_WINDOW_H
#define VIDSHOW_HOST_WINDOW_H

/// @file
/// A native window for desktops. It has the structure and the rules of the device's window; a
/// program is shown every buffer that is posted or queued, and can make any call fail.
///
/// A window is used from one thread at a time, like the device's; its reference count is atomic.

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>

#include "vidshow-host/export.h"

struct ANativeWindow;

namespace vidshow::host {

/// HAL pixel format of YV12: a Y plane, then Cr, then Cb, chroma rows of half the stride rounded up
/// to 16 bytes. The value spells "YV12".
constexpr int32_t kFormatYv12 = 0x32315659;

/// A posted or queued buffer, valid for the length of the callback.
struct Frame {
    int32_t width;        ///< pixels
    int32_t height;       ///< pixels
    int32_t stride;       ///< pixels from one row to the next
    int32_t format;       ///< `kFormatYv12`, or what the decoder buffer says
    const uint8_t* bits;  ///< the picture, not owned
    size_t bytes;         ///< size of the buffer at `bits`; 0 for a format of unknown layout
    int64_t timestampNs;  ///< set through the window's `perform`; 0 unless set
    bool queued;          ///< came through the window's `queueBuffer`, as a decoder's buffers do
};

/// The calls that can be made to fail.
enum class Call {
    setBuffersGeometry,
    lock,
    unlockAndPost,
    setScalingMode,
    setTimestamp,
    queueBuffer,
    dequeueBuffer,  ///< the hook; a lock takes its buffer without it
    cancelBuffer,
    query  ///< the hook, and the calls that read width, height and format
};
constexpr size_t kCallCount = 9;  ///< values of `Call`

/// What a window is made with.
struct WindowOptions {
    int32_t width = 64;        ///< size and format until the client sets a geometry
    int32_t height = 64;       ///< pixels
    int32_t format = 1;        ///< RGBA 8888, as a fresh surface has
    int32_t bufferCount = 3;   ///< size of the pool, 2 to 32
    int32_t strideAlign = 32;  ///< a row is padded to a multiple of this many pixels, at least 2
    uint8_t fill = 0;          ///< fresh buffers hold this byte
};

/// What a window was last told, and what is going on with it.
struct WindowState {
    int32_t width;               ///< pixels
    int32_t height;              ///< pixels
    int32_t format;              ///< pixel format of its buffers
    int32_t scalingMode;         ///< 0 freeze (initial), 1 scale to window (also by fixing a size)
    bool locked;                 ///< a buffer is locked and not yet posted
    int32_t strongCount;         ///< references, the owner's included
    uint64_t calls[kCallCount];  ///< calls of each kind, failed ones included
};

/// A native window and its owner's reference.
class VIDSHOW_HOST_API Window {
  public:
    /// Makes a window. @param options its size, format and buffers; the number of these is kept
    /// within its range
    explicit Window(const WindowOptions& options = {});
    ~Window();  ///< gives back the owner's reference; the window lives on while others hold it
    Window(const Window&) = delete;
    Window& operator=(const Window&) = delete;

    ANativeWindow* get() const;  ///< no reference is taken

    /// Is called with every buffer posted or queued, on the calling thread, before the call
    /// returns; must not call `onFrame`. Null takes it away.
    void onFrame(std::function<void(const Frame&)> sink);

    /// Makes `times` calls of one kind return `error` (negative errno), after `skip` that succeed.
    /// They have no effect, but that a failed `unlockAndPost` ends the lock.
    void fail(Call call, int error, int times = 1, int skip = 0);

    WindowState state() const;  ///< as it is now

  private:
    struct Impl;
    Impl* m_impl;
};

VIDSHOW_HOST_API int32_t liveWindows();  ///< windows that somebody still holds
VIDSHOW_HOST_API int32_t liveBuffers();  ///< buffers that somebody still holds, windows included

/// A decoder's output: a graphic buffer with metadata, as `Present` takes it on the decoder path.
class VIDSHOW_HOST_API DecoderBuffer {
  public:
    /// A buffer of `kFormatYv12`, or (`withGraphicBuffer` false) one that lost its graphic buffer.
    DecoderBuffer(int32_t width, int32_t height, int32_t strideAlign = 32,
                  bool withGraphicBuffer = true);
    ~DecoderBuffer();
    DecoderBuffer(const DecoderBuffer&) = delete;
    DecoderBuffer& operator=(const DecoderBuffer&) = delete;

    void* mediaBuffer() const;    ///< the `android::MediaBuffer*`
    uint8_t* bits() const;        ///< null without a graphic buffer
    int32_t stride() const;       ///< pixels
    bool rendered() const;        ///< the metadata says that it was shown
    int32_t strongCount() const;  ///< references of the graphic buffer
    void reset();                 ///< clears `rendered`

  private:
    struct Impl;
    Impl* m_impl;
};

/// Sends log lines to a callback instead of standard error; null restores standard error.
/// @param sink receives priority, tag and text
VIDSHOW_HOST_API void setLogSink(std::function<void(int, const char*, const char*)> sink);

}  // namespace vidshow::host

#endif
