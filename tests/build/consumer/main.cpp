// Uses an installed copy: one frame from the factory to a window.

#include <vidshow-host/window.h>
#include <vidshow/android_surface.h>
#include <vidshow/imageproc.h>
#include <vidshow/kernels.h>
#include <vidshow/platform.h>
#include <vidshow/presenter.h>
#include <vidshow/softrender.h>

#include <cstdio>
#include <cstring>
#include <memory>
#include <vector>

int main() {
    int shown = 0;
    vidshow::host::Window window;
    window.onFrame([&](const vidshow::host::Frame& frame) {
        if (frame.width == 64 && frame.height == 48 && frame.bits[0] == 77) ++shown;
    });

    const std::unique_ptr<CVidshow> presenter(static_cast<CVidshow*>(CreateVideoPresenterAdv()));
    VP_OpenOptionsAdv options{};
    VR_ANDROID_SURFACE_PARAM surface{nullptr, window.get()};
    VP_OPEN_STREAM_PARAMS params{0x1000, 64, 48, 0, {}};
    IJxVideoPresenterStream* stream = nullptr;
    DWORD on = 1;
    if (presenter->Open(&options, sizeof options) != S_OK ||
        presenter->Set(IID_IJxVideoPresenterAdv, JX_PROPID_VP_ANDROID_SURFACE, nullptr, 0, &surface,
                       sizeof surface) != S_OK ||
        presenter->CreateStream(&params, 0, &stream) != S_OK || stream->Open() != S_OK ||
        presenter->Set(IID_IJxVideoPresenterAdv, JX_PROPID_VP_ENABLE, nullptr, 0, &on, 4) != S_OK) {
        std::fprintf(stderr, "the presenter could not be set up\n");
        return 1;
    }
    std::vector<unsigned char> pixels(64 * 48 * 3 / 2, 77);
    unsigned char* planes[3] = {pixels.data(), pixels.data() + 64 * 48,
                                pixels.data() + 64 * 48 * 5 / 4};
    DWORD strides[3] = {64, 32, 32};
    const bool presented = stream->Present(planes, strides, 0) == S_OK;
    stream->Close();
    presenter->DestroyStream(stream);
    std::printf("%s: %d frame shown\n", getVersion(), shown);
    return presented && shown == 1 ? 0 : 1;
}
