// The window's hooks and settings. Error numbers are those that the device's window answers with.

#include "host/src/surface.h"

#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <utility>

namespace vidshow::host {

namespace {

constexpr int kMinBuffers = 2;  // one shown, one drawn on
constexpr int kMaxBuffers = 32;

// The hooks from before there were fences.
int dequeueWithoutFence(ANativeWindow* window, ANativeWindowBuffer** buffer) {
    int fence = -1;
    return window->dequeueBuffer(window, buffer, &fence);
}
int lockWithoutFence(ANativeWindow*, ANativeWindowBuffer*) {
    return 0;  // a dequeued buffer can be drawn on at once
}
int queueWithoutFence(ANativeWindow* window, ANativeWindowBuffer* buffer) {
    return window->queueBuffer(window, buffer, -1);
}
int cancelWithoutFence(ANativeWindow* window, ANativeWindowBuffer* buffer) {
    return window->cancelBuffer(window, buffer, -1);
}

// A fence is the callee's to close. Nothing draws behind our back here, so none is waited for.
void closeFence(int fence) {
    if (fence >= 0) close(fence);
}

}  // namespace

Surface::Surface(const WindowOptions& options)
    : m_options(options),
      m_slots(static_cast<size_t>(std::clamp(options.bufferCount, kMinBuffers, kMaxBuffers))) {
    maxSwapInterval = 1;
    xdpi = 160;
    ydpi = 160;
    setSwapInterval = onSetSwapInterval;
    query = onQuery;
    perform = onPerform;
    dequeueBuffer = onDequeue;
    queueBuffer = onQueue;
    cancelBuffer = onCancel;
    dequeueBuffer_DEPRECATED = dequeueWithoutFence;
    lockBuffer_DEPRECATED = lockWithoutFence;
    queueBuffer_DEPRECATED = queueWithoutFence;
    cancelBuffer_DEPRECATED = cancelWithoutFence;
}

void Surface::onFrame(std::function<void(const Frame&)> sink) {
    m_sink = std::move(sink);
}

void Surface::fail(Call call, int error, int times, int skip) {
    m_failures[static_cast<size_t>(call)] = {error, times, skip};
}

// Counts a call. Returns the error that it is to fail with, or 0.
int Surface::enter(Call call) {
    ++m_calls[static_cast<size_t>(call)];
    Failure& failure = m_failures[static_cast<size_t>(call)];
    if (failure.times <= 0) return 0;
    if (failure.skip > 0) {
        --failure.skip;
        return 0;
    }
    --failure.times;
    return failure.error;
}

WindowState Surface::state() const {
    const Geometry geometry = wanted();
    WindowState state = {geometry.width,
                         geometry.height,
                         geometry.format,
                         m_scalingMode,
                         m_locked != nullptr,
                         strongCount(),
                         {}};
    std::copy(std::begin(m_calls), std::end(m_calls), state.calls);
    return state;
}

Geometry Surface::wanted() const {
    return {m_width != 0 ? m_width : m_options.width, m_height != 0 ? m_height : m_options.height,
            m_format != 0 ? m_format : m_options.format};
}

int Surface::onSetSwapInterval(ANativeWindow*, int) {
    return 0;
}

int Surface::onQuery(const ANativeWindow* window, int what, int* value) {
    return from(const_cast<ANativeWindow*>(window))->answer(what, value);
}

int Surface::onPerform(ANativeWindow* window, int operation, ...) {
    va_list arguments;
    va_start(arguments, operation);
    const int result = from(window)->dispatch(operation, arguments);
    va_end(arguments);
    return result;
}

int Surface::onDequeue(ANativeWindow* window, ANativeWindowBuffer** buffer, int* fence) {
    Surface* const self = from(window);
    if (const int error = self->enter(Call::dequeueBuffer)) return error;
    Slot* slot = nullptr;
    if (const int error = self->takeBuffer(Use::dequeued, &slot)) return error;
    *buffer = slot->buffer.get();
    *fence = -1;
    return 0;
}

int Surface::onQueue(ANativeWindow* window, ANativeWindowBuffer* buffer, int fence) {
    closeFence(fence);
    const int error = from(window)->enter(Call::queueBuffer);
    return error != 0 ? error : from(window)->queueDequeued(buffer);
}

int Surface::onCancel(ANativeWindow* window, ANativeWindowBuffer* buffer, int fence) {
    closeFence(fence);
    const int error = from(window)->enter(Call::cancelBuffer);
    return error != 0 ? error : from(window)->cancelDequeued(buffer);
}

int Surface::answer(int what, int* value) {
    if (const int error = enter(Call::query)) return error;
    const Geometry geometry = wanted();
    switch (what) {
        case NATIVE_WINDOW_WIDTH:
            *value = geometry.width;
            return 0;
        case NATIVE_WINDOW_HEIGHT:
            *value = geometry.height;
            return 0;
        case NATIVE_WINDOW_FORMAT:
            *value = geometry.format;
            return 0;
        case NATIVE_WINDOW_DEFAULT_WIDTH:
            *value = m_options.width;
            return 0;
        case NATIVE_WINDOW_DEFAULT_HEIGHT:
            *value = m_options.height;
            return 0;
        case NATIVE_WINDOW_MIN_UNDEQUEUED_BUFFERS:
            *value = 1;
            return 0;
        case NATIVE_WINDOW_CONCRETE_TYPE:
            *value = NATIVE_WINDOW_SURFACE;
            return 0;
        case NATIVE_WINDOW_QUEUES_TO_WINDOW_COMPOSER:
        case NATIVE_WINDOW_TRANSFORM_HINT:
        case NATIVE_WINDOW_CONSUMER_RUNNING_BEHIND:
            *value = 0;
            return 0;
        default:
            return -EINVAL;
    }
}

int Surface::dispatch(int operation, va_list arguments) {
    switch (operation) {
        case NATIVE_WINDOW_CONNECT:
        case NATIVE_WINDOW_DISCONNECT:
        case NATIVE_WINDOW_SET_USAGE:
        case NATIVE_WINDOW_SET_CROP:
        case NATIVE_WINDOW_SET_BUFFERS_TRANSFORM:
        case NATIVE_WINDOW_SET_POST_TRANSFORM_CROP:
            return 0;  // nothing here is composed, so these change nothing
        case NATIVE_WINDOW_SET_BUFFER_COUNT:
            return setBufferCount(va_arg(arguments, size_t));
        case NATIVE_WINDOW_SET_BUFFERS_GEOMETRY: {
            const int width = va_arg(arguments, int);
            const int height = va_arg(arguments, int);
            return setGeometry(width, height, va_arg(arguments, int));
        }
        case NATIVE_WINDOW_SET_BUFFERS_DIMENSIONS:
        case NATIVE_WINDOW_SET_BUFFERS_USER_DIMENSIONS: {
            const int width = va_arg(arguments, int);
            return setSize(width, va_arg(arguments, int));
        }
        case NATIVE_WINDOW_SET_BUFFERS_FORMAT:
            return setFormat(va_arg(arguments, int));
        case NATIVE_WINDOW_SET_BUFFERS_TIMESTAMP:
            return setTimestamp(va_arg(arguments, int64_t));
        case NATIVE_WINDOW_SET_SCALING_MODE:
            return setScalingMode(va_arg(arguments, int));
        case NATIVE_WINDOW_LOCK: {
            ANativeWindow_Buffer* const out = va_arg(arguments, ANativeWindow_Buffer*);
            return lock(out, va_arg(arguments, ARect*));
        }
        case NATIVE_WINDOW_UNLOCK_AND_POST:
            return unlockAndPost();
        case NATIVE_WINDOW_API_CONNECT:
            return connectApi(va_arg(arguments, int));
        case NATIVE_WINDOW_API_DISCONNECT:
            return disconnectApi(va_arg(arguments, int));
        default:
            return -ENOENT;
    }
}

int Surface::setGeometry(int32_t width, int32_t height, int32_t format) {
    if (const int error = enter(Call::setBuffersGeometry)) return error;
    if (const int error = setFormat(format)) return error;
    if (const int error = setSize(width, height)) return error;
    // A client that fixes the size of its buffers wants them stretched to the window.
    m_scalingMode =
        width != 0 ? NATIVE_WINDOW_SCALING_MODE_SCALE_TO_WINDOW : NATIVE_WINDOW_SCALING_MODE_FREEZE;
    return 0;
}

int Surface::setSize(int32_t width, int32_t height) {
    if (width < 0 || height < 0 || (width == 0) != (height == 0)) return -EINVAL;
    m_width = width;
    m_height = height;
    return 0;
}

int Surface::setFormat(int32_t format) {
    if (format < 0) return -EINVAL;
    m_format = format;
    return 0;
}

int Surface::setScalingMode(int mode) {
    if (const int error = enter(Call::setScalingMode)) return error;
    if (mode < NATIVE_WINDOW_SCALING_MODE_FREEZE || mode > NATIVE_WINDOW_SCALING_MODE_SCALE_CROP) {
        return -EINVAL;  // the device's surfaces do not know "no scale, crop" either
    }
    m_scalingMode = mode;
    return 0;
}

int Surface::setTimestamp(int64_t timestampNs) {
    if (const int error = enter(Call::setTimestamp)) return error;
    m_timestampNs = timestampNs;
    return 0;
}

int Surface::setBufferCount(size_t count) {
    if (count == 0) count = static_cast<size_t>(m_options.bufferCount);
    if (count < kMinBuffers || count > kMaxBuffers || anyTaken()) return -EINVAL;
    m_slots.resize(count);
    m_next = 0;
    return 0;
}

int Surface::connectApi(int api) {
    if (api < NATIVE_WINDOW_API_EGL || api > NATIVE_WINDOW_API_CAMERA || m_api != 0) return -EINVAL;
    m_api = api;
    return 0;
}

// The buffers go with whoever filled them, a locked one too.
int Surface::disconnectApi(int api) {
    if (api == 0 || api != m_api) return -EINVAL;
    m_api = 0;
    m_locked = nullptr;
    std::fill(m_slots.begin(), m_slots.end(), Slot());
    return 0;
}

}  // namespace vidshow::host
