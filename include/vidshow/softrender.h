#ifndef VIDSHOW_SOFTRENDER_H
#define VIDSHOW_SOFTRENDER_H

/// @file
/// The software renderer: draws planar frames into the locked YV12 buffers of a native window.
///
/// There is one renderer record in the process, `g_SoftRenderer`, and the handle that these
/// functions hand out is its address. It is unguarded: all calls come from one presentation thread.
/// `fourcc` is the packed format code of `VP_OPEN_STREAM_PARAMS::dwFormat` (presenter.h).

#include "vidshow/types.h"

// The platform's header where there is one; elsewhere the same two types, so that a program needs
// nothing but this library's headers.
#if defined(__has_include)
#if __has_include(<android/native_window.h>)
#include <android/native_window.h>
#define VIDSHOW_HAS_NATIVE_WINDOW_H 1
#endif
#endif
#ifndef VIDSHOW_HAS_NATIVE_WINDOW_H
struct ANativeWindow;
/// A locked window buffer, as `ANativeWindow_lock` fills it.
typedef struct ANativeWindow_Buffer {
    int32_t width;         ///< pixels
    int32_t height;        ///< pixels
    int32_t stride;        ///< pixels; for YV12 also the bytes of a luma row
    int32_t format;        ///< pixel format of the window's buffers
    void* bits;            ///< the picture, until the buffer is posted
    uint32_t reserved[6];  ///< not looked at
} ANativeWindow_Buffer;
#endif

/// The renderer's state.
struct ANDROID_SOFTRENDER {
    DWORD dwSize;            ///< the record's own size, once initialised
    int32_t InWidth;         ///< frame width that the window was configured for, pixels
    int32_t InHeight;        ///< frame height, pixels
    DWORD Fourcc;            ///< format code
    ANativeWindow* Handler;  ///< the window; one reference is ours
    void* Converter;         ///< image processor handle, owned; null: frames are posted undrawn
};

extern "C" {

/// The one renderer record, zero at load.
extern VIDSHOW_API ANDROID_SOFTRENDER g_SoftRenderer;

/// Tells which way frames go. Nothing but `fourcc` is looked at.
/// @param ppbPlanes,pdwStrides,width,height not looked at; addresses may be null
/// @param fourcc                            the format code
/// @return 1 when frames of `fourcc` take the software path (top byte 0), else 0
VIDSHOW_API int32_t qz_nativewindow_determin(void** ppbPlanes, DWORD* pdwStrides, uint32_t width,
                                             uint32_t height, uint32_t fourcc);

/// Configures `window` for YV12 buffers of the frame's size and makes the converter. A window that
/// is configured already keeps its geometry and converter, whatever size or format is named. When
/// the record is of another window, it forgets that one, whose reference and converter stay for
/// their stream to give back. A window that refuses the geometry keeps the reference, too.
/// @param window        an `ANativeWindow*`, of which a reference is taken until
///                      `qz_nativewindow_uninit`; may be null
/// @param width,height  the frame's size, pixels
/// @param fourcc        the format code
/// @return the renderer handle, also when no converter could be made; null for a null window or
///         when the window refuses the geometry
VIDSHOW_API void* qz_nativewindow_init(void* window, uint32_t width, uint32_t height,
                                       uint32_t fourcc);

/// Locks a buffer, draws the frame and posts it. A frame that cannot be drawn is posted undrawn.
/// @param handle               what `qz_nativewindow_init` returned
/// @param ppbPlanes,pdwStrides three entries each: planes as the format code says, strides in bytes
/// @param width,height         the frame's size, pixels; drawn only when it is the configured one
/// @param fourcc               not looked at: the format is that of `qz_nativewindow_init`
/// @param deinterlaceMode      0 keeps the converter's mode
/// @return 0; -1 for another handle, or when locking or posting fails
VIDSHOW_API int32_t qz_nativewindow_render(void* handle, void** ppbPlanes, DWORD* pdwStrides,
                                           uint32_t width, uint32_t height, uint32_t fourcc,
                                           uint32_t deinterlaceMode);

/// Releases the window and the converter.
/// @param handle what `qz_nativewindow_init` returned; another one, null too, is logged and ignored
VIDSHOW_API void qz_nativewindow_uninit(void* handle);

/// Replaces the record's converter, which is destroyed first, by one for its `Fourcc`, `InWidth`
/// and `InHeight`; leaves none when the format code names an unknown colour format or range, or
/// creation fails.
/// @param pRender a renderer record, not null
VIDSHOW_API void CreateConverter(ANDROID_SOFTRENDER* pRender);

/// Destroys an image processor.
/// @param converter its handle; null does nothing
VIDSHOW_API void ReleaseConverter(void* converter);

/// Draws a frame into a locked YV12 buffer; `stride` and `bits` are used. Planes start where the
/// stride puts them, their rows are as long as the stride and its half rounded up to 16. Logs, and
/// draws nothing, when the record has no window or converter or was configured for another size.
/// @param handle               a renderer record, not null
/// @param ppbPlanes,pdwStrides three entries each, as for `qz_nativewindow_render`
/// @param width,height         the frame's size, pixels
/// @param buffer               the locked buffer
/// @param deinterlaceMode      0 keeps the converter's mode
/// @return 0, whatever happened: the caller posts the buffer in every case
VIDSHOW_API int32_t render_this_frame(void* handle, void** ppbPlanes, DWORD* pdwStrides,
                                      int32_t width, int32_t height, ANativeWindow_Buffer buffer,
                                      uint32_t deinterlaceMode);

}  // extern "C"

#endif
