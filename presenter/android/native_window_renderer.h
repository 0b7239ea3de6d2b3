#pragma once

#include "presenter/android/media_framework.h"
#include "presenter/android/system_window.h"

namespace vidshow {

/// Queues a decoder's buffers to a window, unchanged. Counted: hold it in an `android::sp`.
class NativeWindowRenderer : public android::RefBase {
  public:
    /// @param nativeWindow kept by a strong reference of its own; not null
    explicit NativeWindowRenderer(const android::sp<ANativeWindow>& nativeWindow);

    /// Queues the graphic buffer of `buffer`, due at once, and marks `buffer` as rendered for its
    /// owner. A buffer that has lost its graphic buffer, or that the window refuses, is logged and
    /// left unmarked.
    virtual void render(android::MediaBuffer* buffer);

  protected:
    ~NativeWindowRenderer() override;

  private:
    android::sp<ANativeWindow> mNativeWindow;
};

}  // namespace vidshow
