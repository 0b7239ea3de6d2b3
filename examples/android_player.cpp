// What a media player does: loads the plug-in, makes a presenter, hands it the native window and
// calls Present once per decoded frame. The window here is the desktop's stand-in, and the frames
// are plain grey; everything between the two comments "device" is as it stands on a device.

#include <dlfcn.h>

#include <cstdio>
#include <memory>
#include <vector>

#include "vidshow-host/window.h"
#include "vidshow/android_surface.h"
#include "vidshow/presenter.h"

namespace {

constexpr GUID kPlayer = {};  // the property set is never looked at
constexpr DWORD kWidth = 320, kHeight = 240;

// device {
class Screen {
  public:
    bool Open(const char* plugin, JavaVM* jvm, ANativeWindow* window) {
        void* const module = dlopen(plugin, RTLD_NOW);
        void* const create = module != nullptr ? dlsym(module, "CreateVideoPresenterAdv") : nullptr;
        if (create == nullptr) return false;
        m_presenter.reset(static_cast<CVidshow*>(reinterpret_cast<void* (*)()>(create)()));

        VP_OpenOptionsAdv options{};
        VR_ANDROID_SURFACE_PARAM surface{jvm, window};
        VP_OPEN_STREAM_PARAMS params{0x1000, kWidth, kHeight, 0 /* planar, BT.601, limited */, {}};
        return m_presenter != nullptr && m_presenter->Open(&options, sizeof options) == S_OK &&
               Set(JX_PROPID_VP_ANDROID_SURFACE, &surface, sizeof surface) &&
               m_presenter->CreateStream(&params, 0, &m_stream) == S_OK &&
               m_stream->Open() == S_OK && Enable(1);
    }
    bool Enable(DWORD on) { return Set(JX_PROPID_VP_ENABLE, &on, sizeof on); }
    bool Show(unsigned char* planes[3], DWORD strides[3]) {
        return m_stream->Present(planes, strides, 0) == S_OK;
    }
    ~Screen() {
        if (m_stream == nullptr) return;
        m_stream->Close();  // gives back the window; DestroyStream would not
        m_presenter->DestroyStream(m_stream);
    }

  private:
    bool Set(DWORD property, void* data, DWORD size) {
        return m_presenter->Set(kPlayer, property, nullptr, 0, data, size) == S_OK;
    }
    std::unique_ptr<CVidshow> m_presenter;  // the plug-in stays loaded: it holds the code
    IJxVideoPresenterStream* m_stream = nullptr;
};
// } device

void Print(const vidshow::host::Frame& frame) {
    const size_t chroma = static_cast<size_t>(frame.stride * frame.height);  // Cr, then Cb
    std::printf("shown: %d x %d, Y %d, Cr %d\n", frame.width, frame.height, frame.bits[0],
                frame.bits[chroma]);
}

}  // namespace

int main(int argc, char** argv) {
    vidshow::host::Window window;  // on a device: ANativeWindow_fromSurface(env, surface)
    window.onFrame(Print);
    {
        Screen screen;
        if (!screen.Open(argc > 1 ? argv[1] : "libvidshowhw2-19.so", nullptr, window.get()))
            return 1;
        const unsigned char levels[] = {16, 89, 162, 235};
        for (const unsigned char level : levels) {
            std::vector<unsigned char> luma(kWidth * kHeight, level), chroma(luma.size() / 4, 128);
            unsigned char* planes[] = {luma.data(), chroma.data(), chroma.data()};
            DWORD strides[] = {kWidth, kWidth / 2, kWidth / 2};
            if (!screen.Show(planes, strides)) return 1;
        }
    }
    std::printf("the window is held by %d\n", window.state().strongCount);
    return 0;
}
