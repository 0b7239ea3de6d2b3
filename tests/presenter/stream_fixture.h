#pragma once

#include <gtest/gtest.h>
#include <vidshow-host/window.h>

#include <string>
#include <vector>

#include "presenter/log_capture.h"
#include "presenter/object_image.h"
#include "vidshow/android_surface.h"
#include "vidshow/presenter.h"
#include "vidshow/softrender.h"

using Lines = std::vector<std::string>;
using vidshow::host::Call;
using vidshow::host::Frame;
using vidshow::host::Window;

constexpr DWORD kSoftware = 0x00000000;
constexpr DWORD kDecoderBuffers = 0x01000000;

/// A stream on a window, without a presenter; the renderer record is empty before and after.
class StreamFixture : public testing::Test {
  protected:
    explicit StreamFixture(DWORD format = kSoftware)
        : params{0x1000, 48, 32, format, {}}, stream(&params, window.get(), nullptr) {}

    ~StreamFixture() override {
        stream.Close();
        if (g_SoftRenderer.Handler != nullptr) qz_nativewindow_uninit(&g_SoftRenderer);
    }

    HRESULT SetData(DWORD id, void* data) { return stream.Set(kSet, id, nullptr, 0, data, 0); }
    HRESULT SetWord(DWORD id, DWORD value) { return SetData(id, &value); }
    HRESULT GetData(DWORD id, void* data, DWORD* returned = nullptr) {
        return stream.Get(kSet, id, nullptr, 0, data, 0, returned);
    }
    HRESULT MoveTo(const Window& target) {
        return SetData(JX_PROPID_VP_ANDROID_SURFACE, target.get());
    }
    void OpenAndEnable() {
        ASSERT_EQ(stream.Open(), S_OK);
        ASSERT_EQ(SetWord(JX_PROPID_VP_ENABLE, 1), S_OK);
    }
    StreamImage image() const { return ImageOf(stream); }

    static constexpr GUID kSet = {9, 8, 7, {6, 5, 4, 3, 2, 1, 0, 1}};

    LogCapture log;
    Window window;
    Window otherWindow;
    VP_OPEN_STREAM_PARAMS params;
    CVidshowStream stream;
};
