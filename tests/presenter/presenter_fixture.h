#pragma once

#include <gtest/gtest.h>
#include <vidshow-host/window.h>

#include "presenter/log_capture.h"
#include "presenter/object_image.h"
#include "vidshow/android_surface.h"
#include "vidshow/presenter.h"
#include "vidshow/softrender.h"

using Lines = std::vector<std::string>;
using vidshow::host::Window;

inline const GUID kAnyPropertySet = {1, 2, 3, {4, 5, 6, 7, 8, 9, 10, 11}};

/// One presenter from the factory, still closed, and two windows.
class PresenterFixture : public testing::Test {
  protected:
    PresenterFixture() : presenter(static_cast<CVidshow*>(CreateVideoPresenterAdv())) {}

    ~PresenterFixture() override {
        CVidshowStream* left[4] = {};
        if (presenter != nullptr) {
            const PresenterImage image = ImageOf(*presenter);
            for (size_t i = 0; i < 4; ++i)
                left[i] = image.streams[i].stream;
        }
        delete presenter;
        for (CVidshowStream* stream : left)
            delete stream;  // the presenter leaves them allocated
        if (g_SoftRenderer.Handler != nullptr) qz_nativewindow_uninit(&g_SoftRenderer);
    }

    HRESULT Open() {
        for (DWORD i = 0; i < 10; ++i)
            options.words[i] = 0x0A000000 + i;
        return presenter->Open(&options, sizeof options);
    }

    HRESULT SetData(DWORD id, void* data) {
        return presenter->Set(kAnyPropertySet, id, nullptr, 0, data, 0);
    }
    HRESULT SetWord(DWORD id, DWORD value) { return SetData(id, &value); }
    HRESULT SetSurface(DWORD id, ANativeWindow* surface) {
        VR_ANDROID_SURFACE_PARAM record = {nullptr, surface};
        return SetData(id, &record);
    }

    HRESULT GetData(DWORD id, void* data, DWORD* returned = nullptr) {
        return presenter->Get(kAnyPropertySet, id, nullptr, 0, data, 0, returned);
    }
    DWORD GetWord(DWORD id) {
        DWORD value = 0xCCCCCCCC;
        EXPECT_EQ(GetData(id, &value), S_OK);
        return value;
    }

    /// A stream of the planar software format unless told otherwise; null if that failed.
    CVidshowStream* CreateStream(DWORD width = 64, DWORD height = 32, DWORD format = 0) {
        VP_OPEN_STREAM_PARAMS params = {0x1000, width, height, format, {}};
        IJxVideoPresenterStream* stream = nullptr;
        EXPECT_EQ(presenter->CreateStream(&params, 0, &stream), S_OK);
        return static_cast<CVidshowStream*>(stream);
    }

    LogCapture log;
    Window window;
    Window otherWindow;
    VP_OpenOptionsAdv options = {};
    CVidshow* presenter;
};
