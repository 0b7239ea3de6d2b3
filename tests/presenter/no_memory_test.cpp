// What happens when `new` finds no memory. The program's own nothrow `new` takes the library's
// place.

#include <gtest/gtest.h>
#include <vidshow-host/window.h>

#include <cstdlib>
#include <new>

#include "presenter/log_capture.h"
#include "presenter/object_image.h"
#include "vidshow/presenter.h"

namespace {

bool g_noMemory = false;

}  // namespace

__attribute__((visibility("default"))) void* operator new(size_t bytes,
                                                          const std::nothrow_t&) noexcept {
    return g_noMemory ? nullptr : ::operator new(bytes);
}

namespace {

using vidshow::host::DecoderBuffer;
using vidshow::host::Window;

class NoMemory {
  public:
    NoMemory() { g_noMemory = true; }
    ~NoMemory() { g_noMemory = false; }
};

const GUID kSet = {};

TEST(NoMemoryTest, FactoryYieldsNull) {
    const NoMemory scope;
    EXPECT_EQ(CreateVideoPresenterAdv(), nullptr);
}

TEST(NoMemoryTest, CreateStreamLeavesTheSlotFree) {
    CVidshow presenter;
    VP_OpenOptionsAdv options = {};
    ASSERT_EQ(presenter.Open(&options, sizeof options), S_OK);
    VP_OPEN_STREAM_PARAMS params = {0x1000, 16, 16, 0, {}};
    IJxVideoPresenterStream* stream = reinterpret_cast<IJxVideoPresenterStream*>(&params);
    {
        const NoMemory scope;
        EXPECT_EQ(presenter.CreateStream(&params, 0, &stream), E_OUTOFMEMORY);
    }
    EXPECT_EQ(stream, nullptr);
    const PresenterImage::Slot slot = ImageOf(presenter).streams[0];
    EXPECT_EQ(slot.used, 0);
    EXPECT_EQ(slot.params.dwType, 0u);
    EXPECT_EQ(slot.stream, nullptr);
    ASSERT_EQ(presenter.CreateStream(&params, 0, &stream), S_OK);
    EXPECT_EQ(ImageOf(presenter).streams[0].stream, stream);
    EXPECT_EQ(presenter.DestroyStream(stream), S_OK);
}

TEST(NoMemoryTest, PresentOfADecoderBufferTakesNothing) {
    Window window;
    const DecoderBuffer buffer(16, 16);
    VP_OPEN_STREAM_PARAMS params = {0x1000, 16, 16, 0x01000000, {}};
    CVidshowStream stream(&params, window.get(), nullptr);
    ASSERT_EQ(stream.Open(), S_OK);
    DWORD on = 1;
    ASSERT_EQ(stream.Set(kSet, JX_PROPID_VP_ENABLE, nullptr, 0, &on, 4), S_OK);
    unsigned char* planes[3] = {static_cast<unsigned char*>(buffer.mediaBuffer())};
    {
        const NoMemory scope;
        EXPECT_EQ(stream.Present(planes, nullptr, 0), E_OUTOFMEMORY);
    }
    EXPECT_EQ(window.state().strongCount, 1);
    EXPECT_FALSE(buffer.rendered());
    EXPECT_EQ(stream.Present(planes, nullptr, 0), S_OK);
}

}  // namespace
