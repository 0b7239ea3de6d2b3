// A frame of planes through a presenter, beside the same bytes copied with memcpy, plane by plane.
// Both read one picture and write to a pool of three window buffers. What Present may cost over the
// copy is little: the goals are a ratio of at most 1.10 and no allocation. A frame that Present
// deinterlaces on the way stands beside libyuv's averages followed by that copy: at most 1.05.

#include <android/native_window.h>
#include <benchmark/benchmark.h>
#include <libyuv/planar_functions.h>

#include <cstring>
#include <vector>

#include "bench/side_by_side.h"
#include "testkit/allocation_counter.h"
#include "vidshow-host/window.h"
#include "vidshow/android_surface.h"
#include "vidshow/presenter.h"

namespace {

using vidshow::host::kFormatYv12;
using vidshow::host::Window;

constexpr int kPoolFrames = 3;
const GUID kAnyPropertySet = {};

int32_t RoundUpTo16(int32_t n) {
    return (n + 15) / 16 * 16;
}

/// A planar 4:2:0 picture with luma rows of `padding` more bytes than pixels, chroma rows of half.
struct Picture {
    Picture(int32_t pictureWidth, int32_t pictureHeight, int32_t padding)
        : width(pictureWidth), height(pictureHeight) {
        for (int i = 0; i < 3; ++i) {
            const int32_t stride = i == 0 ? width + padding : (width + padding) / 2;
            const int32_t rows = i == 0 ? height : height / 2;
            memory[i].assign(static_cast<size_t>(stride) * static_cast<size_t>(rows), 16);
            planes[i] = memory[i].data();
            strides[i] = static_cast<DWORD>(stride);
        }
    }

    int32_t width;
    int32_t height;
    std::vector<uint8_t> memory[3];
    unsigned char* planes[3];
    DWORD strides[3];
};

/// An enabled stream of the software path on a window of its own.
class Player {
  public:
    Player(int32_t width, int32_t height)
        : m_presenter(static_cast<CVidshow*>(CreateVideoPresenterAdv())) {
        VP_OpenOptionsAdv options = {};
        m_presenter->Open(&options, sizeof options);
        VR_ANDROID_SURFACE_PARAM surface = {nullptr, m_window.get()};
        m_presenter->Set(kAnyPropertySet, JX_PROPID_VP_ANDROID_SURFACE, nullptr, 0, &surface,
                         sizeof surface);
        VP_OPEN_STREAM_PARAMS params = {
            0x1000, static_cast<DWORD>(width), static_cast<DWORD>(height), 0, {}};
        m_presenter->CreateStream(&params, 0, &m_stream);
        m_stream->Open();
        uint8_t enable = 1;
        m_stream->Set(kAnyPropertySet, JX_PROPID_VP_ENABLE, nullptr, 0, &enable, 1);
    }
    ~Player() {
        m_stream->Close();
        m_presenter->DestroyStream(m_stream);
        delete m_presenter;
    }
    Player(const Player&) = delete;
    Player& operator=(const Player&) = delete;

    void Deinterlace(uint32_t mode) {
        m_stream->Set(kAnyPropertySet, JX_PROPID_VP_DEINTERLACE_MODE, nullptr, 0, &mode,
                      sizeof mode);
    }
    bool Present(Picture& picture) {
        return m_stream->Present(picture.planes, picture.strides, 0) == S_OK;
    }

  private:
    Window m_window;
    CVidshow* m_presenter;
    IJxVideoPresenterStream* m_stream = nullptr;
};

/// What a user would write instead, with the window's addresses known beforehand.
class PlainCopy {
  public:
    PlainCopy(int32_t width, int32_t height) {
        ANativeWindow_setBuffersGeometry(m_window.get(), width, height, kFormatYv12);
        for (ANativeWindow_Buffer& buffer : m_pool) {
            ANativeWindow_lock(m_window.get(), &buffer, nullptr);
            ANativeWindow_unlockAndPost(m_window.get());
        }
    }

    void Copy(const Picture& from) {
        const ANativeWindow_Buffer& to = m_pool[m_next];
        m_next = (m_next + 1) % kPoolFrames;
        const int32_t chromaPitch = RoundUpTo16(to.stride / 2);
        uint8_t* const y = static_cast<uint8_t*>(to.bits);
        uint8_t* const cr = y + static_cast<ptrdiff_t>(to.stride) * from.height;
        uint8_t* const cb = cr + static_cast<ptrdiff_t>(chromaPitch) * (from.height / 2);
        CopyPlane(from, 0, y, to.stride, from.width, from.height);
        CopyPlane(from, 1, cb, chromaPitch, from.width / 2, from.height / 2);
        CopyPlane(from, 2, cr, chromaPitch, from.width / 2, from.height / 2);
    }

  private:
    static void CopyPlane(const Picture& from, int plane, uint8_t* to, int32_t pitch, int32_t width,
                          int32_t height) {
        const uint8_t* row = from.planes[plane];
        const int32_t stride = static_cast<int32_t>(from.strides[plane]);
        if (stride == width && pitch == width) {
            std::memcpy(to, row, static_cast<size_t>(width) * static_cast<size_t>(height));
            return;
        }
        for (int32_t y = 0; y < height; ++y, row += stride, to += pitch) {
            std::memcpy(to, row, static_cast<size_t>(width));
        }
    }

    Window m_window;
    ANativeWindow_Buffer m_pool[kPoolFrames] = {};
    int m_next = 0;
};

/// The same with every other line between averaged from its neighbours, by libyuv.
class AveragesAndCopy {
  public:
    AveragesAndCopy(int32_t width, int32_t height)
        : m_between(width, height, 0), m_copy(width, height) {}

    void Copy(const Picture& from) {
        for (int i = 0; i < 3; ++i) {
            const int32_t width = i == 0 ? from.width : from.width / 2;
            const int32_t height = i == 0 ? from.height : from.height / 2;
            Average(from.planes[i], static_cast<int32_t>(from.strides[i]), m_between.planes[i],
                    static_cast<int32_t>(m_between.strides[i]), width, height);
        }
        m_copy.Copy(m_between);
    }

  private:
    /// Even lines as they are, odd ones between them; the last one has no line below it.
    static void Average(const uint8_t* from, int32_t stride, uint8_t* to, int32_t pitch,
                        int32_t width, int32_t height) {
        libyuv::CopyPlane(from, 2 * stride, to, 2 * pitch, width, height / 2);
        libyuv::InterpolatePlane(from, 2 * stride, from + 2 * stride, 2 * stride, to + pitch,
                                 2 * pitch, width, height / 2 - 1, 128);
        const ptrdiff_t last = height - 1;
        libyuv::CopyPlane(from + last * stride, stride, to + last * pitch, pitch, width, 1);
    }

    Picture m_between;
    PlainCopy m_copy;
};

constexpr uint32_t kProgressive = 0, kLinear = 6;  // modes of the stream

template <class Peer, uint32_t kMode>
void PresentBeside(benchmark::State& state) {
    const int32_t width = static_cast<int32_t>(state.range(0));
    const int32_t height = static_cast<int32_t>(state.range(1));
    Picture picture(width, height, static_cast<int32_t>(state.range(2)));
    Player player(width, height);
    player.Deinterlace(kMode);
    Peer peer(width, height);
    for (int i = 0; i < kPoolFrames; ++i) {
        if (!player.Present(picture)) return state.SkipWithError("Present failed");
        peer.Copy(picture);
    }

    SideBySide times;
    uint64_t allocations = 0;
    for (auto _ : state) {
        const double nanoseconds = times.run(
            [&] {
                const uint64_t before = testkit::Allocations();
                benchmark::DoNotOptimize(player.Present(picture));
                allocations += testkit::Allocations() - before;
            },
            [&] {
                peer.Copy(picture);
                benchmark::ClobberMemory();
            });
        state.SetIterationTime(nanoseconds * 1e-9);
    }
    state.counters["present_us"] = times.ours() / 1000;
    state.counters["peer_us"] = times.theirs() / 1000;
    state.counters["ratio"] = times.ratio();
    state.counters["allocations"] =
        benchmark::Counter(static_cast<double>(allocations), benchmark::Counter::kAvgIterations);
}

void Sizes(benchmark::internal::Benchmark* bench) {
    bench->ArgNames({"width", "height", "padding"})
        ->ArgsProduct({{640}, {480}, {0, 64}})
        ->ArgsProduct({{1920}, {1080}, {0, 64}})
        ->ArgsProduct({{3840}, {2160}, {0, 64}})
        ->UseManualTime()
        ->Unit(benchmark::kMicrosecond);
}
BENCHMARK_TEMPLATE(PresentBeside, PlainCopy, kProgressive)->Apply(Sizes);
BENCHMARK_TEMPLATE(PresentBeside, AveragesAndCopy, kLinear)->Apply(Sizes);

}  // namespace
