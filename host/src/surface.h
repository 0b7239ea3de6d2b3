#pragma once

#include <cstdarg>
#include <functional>
#include <vector>

#include "host/src/counted.h"
#include "host/src/pixel_buffer.h"
#include "presenter/android/system_window.h"
#include "vidshow-host/window.h"

namespace vidshow::host {

/// The window behind `Window`: a pool of buffers that the client draws on and the sink is shown.
///
/// A buffer is free, dequeued (by hook or by lock), or shown; a shown one is free again once the
/// next is posted or queued. Buffers are made to the geometry that is asked for when they are
/// dequeued, so that a frame allocates nothing while the geometry stays.
class Surface : public Counted<Surface, ANativeWindow> {
  public:
    explicit Surface(const WindowOptions& options);

    void onFrame(std::function<void(const Frame&)> sink);
    void fail(Call call, int error, int times, int skip);
    WindowState state() const;

  private:
    friend class Counted<Surface, ANativeWindow>;
    enum class Use { free, dequeued, locked, shown };
    struct Slot {
        android::sp<PixelBuffer> buffer;  // null until it is dequeued for the first time
        Use use = Use::free;
    };
    struct Failure {
        int error = 0;
        int times = 0;
        int skip = 0;
    };

    ~Surface() = default;

    // The hooks.
    static Surface* from(ANativeWindow* window) { return static_cast<Surface*>(window); }
    static int onSetSwapInterval(ANativeWindow* window, int interval);
    static int onQuery(const ANativeWindow* window, int what, int* value);
    static int onPerform(ANativeWindow* window, int operation, ...);
    static int onDequeue(ANativeWindow* window, ANativeWindowBuffer** buffer, int* fence);
    static int onQueue(ANativeWindow* window, ANativeWindowBuffer* buffer, int fence);
    static int onCancel(ANativeWindow* window, ANativeWindowBuffer* buffer, int fence);

    int enter(Call call);
    int answer(int what, int* value);
    int dispatch(int operation, va_list arguments);
    int setGeometry(int32_t width, int32_t height, int32_t format);
    int setSize(int32_t width, int32_t height);
    int setFormat(int32_t format);
    int setScalingMode(int mode);
    int setTimestamp(int64_t timestampNs);
    int setBufferCount(size_t count);
    int connectApi(int api);
    int disconnectApi(int api);
    int lock(ANativeWindow_Buffer* out, ARect* dirty);
    int unlockAndPost();
    int takeBuffer(Use use, Slot** taken);
    int queueDequeued(ANativeWindowBuffer* buffer);
    int cancelDequeued(const ANativeWindowBuffer* buffer);
    Slot* slotOf(const ANativeWindowBuffer* buffer);
    bool anyTaken() const;
    void show(Slot* slot, const ANativeWindowBuffer& buffer, bool queued);
    Geometry wanted() const;

    const WindowOptions m_options;
    std::function<void(const Frame&)> m_sink;
    Failure m_failures[kCallCount];
    uint64_t m_calls[kCallCount] = {};

    int32_t m_width = 0;   // 0: the window's own
    int32_t m_height = 0;  // 0: the window's own
    int32_t m_format = 0;  // 0: the window's own
    int m_scalingMode = NATIVE_WINDOW_SCALING_MODE_FREEZE;
    int64_t m_timestampNs = 0;
    int m_api = 0;  // who fills the buffers; 0: nobody yet
    std::vector<Slot> m_slots;
    size_t m_next = 0;         // the slot that has been free for longest, if it is
    Slot* m_locked = nullptr;  // in m_slots
};

}  // namespace vidshow::host
