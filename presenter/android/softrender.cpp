// The software renderer. A window is configured once for YV12 buffers of the frame's size; then
// each frame is converted straight into a locked buffer and posted.
//
//     bits                 Y, rows of `stride` bytes
//     + stride x height    Cr, half height
//     behind that          Cb, half height
//
// Where the planes begin follows from the stride as the window gives it; how long their rows are
// follows from the stride rounded up to 16.

#include "vidshow/softrender.h"

#include <android/native_window.h>

#include <cerrno>
#include <cstdint>

#include "presenter/log.h"
#include "vidshow/imageproc.h"

namespace {

using vidshow::kLogError;
using vidshow::Log;
using vidshow::Word;

constexpr int32_t kFormatYv12 = 0x32315659;  // HAL_PIXEL_FORMAT_YV12, spells "YV12"

constexpr uint32_t PathByte(uint32_t fourcc) {
    return fourcc >> 24;
}
constexpr uint32_t ColorByte(uint32_t fourcc) {
    return fourcc >> 16 & 0xFF;
}
constexpr uint32_t RangeByte(uint32_t fourcc) {
    return fourcc >> 8 & 0xFF;
}
constexpr uint32_t MatrixByte(uint32_t fourcc) {
    return fourcc & 0xFF;
}

// Values of the colour byte.
constexpr uint32_t kColorPlanar = 0;
constexpr uint32_t kColorNv12 = 1;
constexpr uint32_t kColorUnconverted = 4;

// Matrix codes are those of coded video streams.
constexpr uint32_t MatrixOfCode(uint32_t code) {
    switch (code) {
        case 1:
            return QZ_IMAGEPROC_MATRIX_BT709;
        case 4:
            return QZ_IMAGEPROC_MATRIX_FCC;
        case 7:
            return QZ_IMAGEPROC_MATRIX_SMPTE240M;
        default:
            return QZ_IMAGEPROC_MATRIX_BT601;
    }
}

QZ_IMAGEPROC_INIT_PARAMS ConverterParams(const ANDROID_SOFTRENDER& render, uint32_t conversion) {
    const uint32_t fourcc = Word(render.Fourcc);
    QZ_IMAGEPROC_INIT_PARAMS params = {};
    params.u32Size = sizeof params;
    params.u32CscType = conversion;
    params.u32RotationType = QZ_IMAGEPROC_ROTATE_NONE;
    params.u32ResizeAlgorithm = QZ_IMAGEPROC_RESIZE_LINEAR;
    params.u32InWidth = params.u32OutWidth = static_cast<uint32_t>(render.InWidth);
    params.u32InHeight = params.u32OutHeight = static_cast<uint32_t>(render.InHeight);
    params.u32ColorMatrix = MatrixOfCode(MatrixByte(fourcc));
    params.u32YuvRange = RangeByte(fourcc);
    return params;
}

// Products and sums of the layout are taken modulo 2^32, as on the 32-bit target.
int32_t Product(int32_t a, int32_t b) {
    return static_cast<int32_t>(static_cast<uint32_t>(a) * static_cast<uint32_t>(b));
}

// Divides truncating, so that strides from -30 to 0 count as none.
int32_t RoundUpTo16(int32_t n) {
    return static_cast<int32_t>(static_cast<uint32_t>(n) + 15) / 16 * 16;
}

struct Layout {
    uint8_t* plane[3];  // Y, Cb, Cr
    uint32_t pitch[3];
};

Layout LayoutOf(const ANativeWindow_Buffer& buffer, int32_t height) {
    const int32_t lumaPitch = RoundUpTo16(buffer.stride);
    const int32_t chromaPitch = RoundUpTo16(buffer.stride / 2);
    const uintptr_t luma = reinterpret_cast<uintptr_t>(buffer.bits);
    const uintptr_t cr = luma + static_cast<uintptr_t>(intptr_t{Product(buffer.stride, height)});
    const uintptr_t cb = cr + static_cast<uint32_t>(Product(height, chromaPitch)) / 2;

    Layout layout;
    layout.plane[0] = reinterpret_cast<uint8_t*>(luma);
    layout.plane[1] = reinterpret_cast<uint8_t*>(cb);
    layout.plane[2] = reinterpret_cast<uint8_t*>(cr);
    layout.pitch[0] = static_cast<uint32_t>(lumaPitch);
    layout.pitch[1] = layout.pitch[2] = static_cast<uint32_t>(chromaPitch);
    return layout;
}

// The lines of a frame carry the entry point's name.
constexpr char kRenderFrame[] = "render_this_frame";

void TraceFrame(void** planes, const DWORD* strides, int32_t width, int32_t height) {
    VIDSHOW_TRACE("[%s %d]:render_this_frame start", kRenderFrame, __LINE__);
    VIDSHOW_TRACE("[%s %d]:ppbPlanes[0] = %p", kRenderFrame, __LINE__, planes[0]);
    VIDSHOW_TRACE("[%s %d]:ppbPlanes[1] = %p", kRenderFrame, __LINE__, planes[1]);
    VIDSHOW_TRACE("[%s %d]:ppbPlanes[2] = %p", kRenderFrame, __LINE__, planes[2]);
    VIDSHOW_TRACE("[%s %d]:pdwStrides[0] = %ld", kRenderFrame, __LINE__, long{LONG(strides[0])});
    VIDSHOW_TRACE("[%s %d]:pdwStrides[1] = %ld", kRenderFrame, __LINE__, long{LONG(strides[1])});
    VIDSHOW_TRACE("[%s %d]:pdwStrides[2] = %ld", kRenderFrame, __LINE__, long{LONG(strides[2])});
    VIDSHOW_TRACE("[%s %d]:width = %d", kRenderFrame, __LINE__, width);
    VIDSHOW_TRACE("[%s %d]:height = %d", kRenderFrame, __LINE__, height);
}

void LogUndrawable(const ANDROID_SOFTRENDER& render) {
    Log(kLogError, "[%s %d]:render_this_frame fail", kRenderFrame, __LINE__);
    Log(kLogError, "[%s %d]:pRender->Handler =%p", kRenderFrame, __LINE__,
        static_cast<void*>(render.Handler));
    Log(kLogError, "[%s %d]:pRender->Converter =%p", kRenderFrame, __LINE__, render.Converter);
    Log(kLogError, "[%s %d]:pRender->InWidth = %d", kRenderFrame, __LINE__, render.InWidth);
    Log(kLogError, "[%s %d]:pRender->InHeight = %d", kRenderFrame, __LINE__, render.InHeight);
}

}  // namespace

extern "C" {

ANDROID_SOFTRENDER g_SoftRenderer = {};

int32_t qz_nativewindow_determin(void** /*ppbPlanes*/, DWORD* /*pdwStrides*/, uint32_t /*width*/,
                                 uint32_t /*height*/, uint32_t fourcc) {
    return PathByte(fourcc) == 0 ? 1 : 0;
}

void* qz_nativewindow_init(void* window, uint32_t width, uint32_t height, uint32_t fourcc) {
    VIDSHOW_TRACE("[%s %d]:init start", __func__, __LINE__);
    VIDSHOW_TRACE("[%s %d]:init start window  = 0x%x", __func__, __LINE__, Word(window));
    if (window == nullptr) {
        Log(kLogError, "[%s %d]:invalid window ", __func__, __LINE__);
        return nullptr;
    }
    // A window that is ours already stays as it is: another size takes another window, or an uninit
    // first. Clients rely on the second call being free.
    if (g_SoftRenderer.Handler == window) return &g_SoftRenderer;

    // Whatever the record held belongs to the stream on the other window and is not released here.
    g_SoftRenderer = ANDROID_SOFTRENDER();
    g_SoftRenderer.dwSize = sizeof g_SoftRenderer;
    ANativeWindow* const handler = static_cast<ANativeWindow*>(window);
    ANativeWindow_acquire(handler);

    VIDSHOW_TRACE("[%s %d]:native_window_set_buffers_geometry type = 0x%x, format = 0x%x", __func__,
                  __LINE__, ColorByte(fourcc), kFormatYv12);
    VIDSHOW_TRACE("[%s %d]:native_window_set_buffers_geometry width = %d, height = %d", __func__,
                  __LINE__, width, height);
    const int32_t error = ANativeWindow_setBuffersGeometry(
        handler, static_cast<int32_t>(width), static_cast<int32_t>(height), kFormatYv12);
    if (error != 0) {
        Log(kLogError, "[%s %d]:native_window_set_buffers_geometry err = 0x%x", __func__, __LINE__,
            error);
        return nullptr;
    }
    g_SoftRenderer.Handler = handler;
    g_SoftRenderer.InWidth = static_cast<int32_t>(width);
    g_SoftRenderer.InHeight = static_cast<int32_t>(height);
    g_SoftRenderer.Fourcc = fourcc;
    if (ColorByte(fourcc) != kColorUnconverted) CreateConverter(&g_SoftRenderer);
    VIDSHOW_TRACE("[%s %d]:init done", __func__, __LINE__);
    return &g_SoftRenderer;
}

void CreateConverter(ANDROID_SOFTRENDER* pRender) {
    if (pRender->Converter != nullptr) {
        QZ_IMAGEPROC_Destroy(pRender->Converter);
        pRender->Converter = nullptr;
    }
    uint32_t conversion = QZ_IMAGEPROC_CSC_YCBCR420_TO_YCBCR420;
    switch (const uint32_t color = ColorByte(Word(pRender->Fourcc))) {
        case kColorPlanar:
            break;
        // 16-bit pixels into the first plane of a YV12 buffer: an odd pair, which clients rely on.
        case kColorNv12:
            conversion = QZ_IMAGEPROC_CSC_NV12_TO_RGB565;
            break;
        default:
            Log(kLogError, "[%s %d]: unsupport input color format = %d", __func__, __LINE__, color);
            return;
    }
    const uint32_t range = RangeByte(Word(pRender->Fourcc));
    if (range > 1) {
        Log(kLogError, "[%s %d]: unsupport input yuv range = %d", __func__, __LINE__, range);
        return;
    }
    const QZ_IMAGEPROC_INIT_PARAMS params = ConverterParams(*pRender, conversion);
    void* handle = nullptr;
    QZ_IMAGEPROC_Create(&handle, 0, &params);
    if (handle == nullptr) {
        Log(kLogError, "[%s %d]: fail to create image processor", __func__, __LINE__);
        return;
    }
    pRender->Converter = handle;
}

void ReleaseConverter(void* converter) {
    if (converter != nullptr) QZ_IMAGEPROC_Destroy(converter);
}

int32_t qz_nativewindow_render(void* handle, void** ppbPlanes, DWORD* pdwStrides, uint32_t width,
                               uint32_t height, uint32_t /*fourcc*/, uint32_t deinterlaceMode) {
    VIDSHOW_TRACE("[%s %d]:render start", __func__, __LINE__);
    if (handle != &g_SoftRenderer) {
        Log(kLogError, "[%s %d]:render, invalid handler", __func__, __LINE__);
        return -1;
    }
    VIDSHOW_TRACE("[%s %d]:lock start", __func__, __LINE__);
    ANativeWindow* const window = g_SoftRenderer.Handler;
    ANativeWindow_Buffer buffer = {};
    // Another stream may have emptied the record; the device does not survive locking no window.
    const int32_t lockError =
        window != nullptr ? ANativeWindow_lock(window, &buffer, nullptr) : -EINVAL;
    if (lockError != 0) {
        Log(kLogError, "[%s %d]:ANativeWindow_lock err = 0x%x", __func__, __LINE__, lockError);
        return -1;
    }
    VIDSHOW_TRACE("[%s %d]:ANativeWindow_lock get buf = %p", __func__, __LINE__, buffer.bits);
    VIDSHOW_TRACE("[%s %d]:lock done", __func__, __LINE__);
    render_this_frame(handle, ppbPlanes, pdwStrides, static_cast<int32_t>(width),
                      static_cast<int32_t>(height), buffer, deinterlaceMode);
    const int32_t postError = ANativeWindow_unlockAndPost(window);
    if (postError != 0) {
        Log(kLogError, "[%s %d]:ANativeWindow_unlockAndPost err = 0x%x", __func__, __LINE__,
            postError);
        return -1;
    }
    VIDSHOW_TRACE("[%s %d]:render done", __func__, __LINE__);
    return 0;
}

int32_t render_this_frame(void* handle, void** ppbPlanes, DWORD* pdwStrides, int32_t width,
                          int32_t height, ANativeWindow_Buffer buffer, uint32_t deinterlaceMode) {
    TraceFrame(ppbPlanes, pdwStrides, width, height);
    const ANDROID_SOFTRENDER& render = *static_cast<const ANDROID_SOFTRENDER*>(handle);
    if (render.Handler == nullptr || render.Converter == nullptr || render.InWidth != width ||
        render.InHeight != height) {
        LogUndrawable(render);
        return 0;
    }
    uint8_t* const in[3] = {static_cast<uint8_t*>(ppbPlanes[0]),
                            static_cast<uint8_t*>(ppbPlanes[1]),
                            static_cast<uint8_t*>(ppbPlanes[2])};
    const uint32_t inPitch[3] = {Word(pdwStrides[0]), Word(pdwStrides[1]), Word(pdwStrides[2])};
    const Layout out = LayoutOf(buffer, render.InHeight);
    VIDSHOW_TRACE("[%s %d]:pOut[0] = %p", __func__, __LINE__, static_cast<void*>(out.plane[0]));
    VIDSHOW_TRACE("[%s %d]:s_out[0] = %ld", __func__, __LINE__, static_cast<long>(out.pitch[0]));
    VIDSHOW_TRACE("[%s %d]:s_out[1] = %ld", __func__, __LINE__, static_cast<long>(out.pitch[1]));

    const QZ_IMAGEPROC_FRAME_PARAMS frame = {sizeof frame, 1, deinterlaceMode};
    [[maybe_unused]] const HRESULT result =  // traced
        QZ_IMAGEPROC_ProcessFrame(render.Converter, in, inPitch, out.plane, out.pitch, &frame);
    VIDSHOW_TRACE("[%s %d]:QZ_IMAGEPROC_ProcessFrame ret = 0x%x", __func__, __LINE__, result);
    VIDSHOW_TRACE("[%s %d]:render_this_frame done", __func__, __LINE__);
    return 0;
}

void qz_nativewindow_uninit(void* handle) {
    VIDSHOW_TRACE("[%s %d]:uninit start", __func__, __LINE__);
    if (handle == nullptr || handle != &g_SoftRenderer) {
        Log(kLogError, "[%s %d]:uninit invalid surface", __func__, __LINE__);
        return;
    }
    if (g_SoftRenderer.Handler != nullptr) ANativeWindow_release(g_SoftRenderer.Handler);
    g_SoftRenderer.Handler = nullptr;
    if (g_SoftRenderer.Converter != nullptr) ReleaseConverter(g_SoftRenderer.Converter);
    g_SoftRenderer.Converter = nullptr;
}

}  // extern "C"
