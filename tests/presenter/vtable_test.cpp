// Calls through the slots of the vtables, as a client compiled long ago makes them.

#include <gtest/gtest.h>
#include <vidshow-host/window.h>

#include <cstring>
#include <new>

#include "presenter/log_capture.h"
#include "presenter/object_image.h"
#include "vidshow/android_surface.h"
#include "vidshow/presenter.h"

namespace {

using vidshow::host::Window;

// A member function is called like a function with the object in front.
template <typename Result, typename... Arguments>
Result CallSlot(void* object, size_t slot, Arguments... arguments) {
    using Function = Result (*)(void*, Arguments...);
    void** vtable = nullptr;
    std::memcpy(&vtable, object, sizeof vtable);
    Function function = nullptr;
    std::memcpy(&function, &vtable[slot], sizeof function);
    return function(object, arguments...);
}

const GUID kSet = {1, 2, 3, {}};
void* const kNoData = nullptr;
constexpr DWORD kNoBytes = 0;

TEST(VtableTest, PresenterSlots) {
    void* const presenter = CreateVideoPresenterAdv();
    ASSERT_NE(presenter, nullptr);
    void** const nowhere = nullptr;
    EXPECT_EQ(CallSlot<HRESULT>(presenter, 0, &kSet, nowhere), E_NOTIMPL);
    EXPECT_EQ(CallSlot<HRESULT>(presenter, 1), E_NOTIMPL);
    EXPECT_EQ(CallSlot<HRESULT>(presenter, 2), E_NOTIMPL);
    EXPECT_EQ(CallSlot<HRESULT>(presenter, 5, DWORD{0}), S_FALSE);

    VP_OpenOptionsAdv options = {};
    EXPECT_EQ(CallSlot<HRESULT>(presenter, 3, &options, DWORD{39}), E_INVALIDARG);
    EXPECT_EQ(CallSlot<HRESULT>(presenter, 3, &options, DWORD{40}), S_OK);
    EXPECT_EQ(CallSlot<HRESULT>(presenter, 5, DWORD{0}), S_OK);

    DWORD value = 0xABCD;
    void* const data = &value;
    EXPECT_EQ(
        CallSlot<HRESULT>(presenter, 7, &kSet, DWORD{0x0401}, kNoData, kNoBytes, data, DWORD{4}),
        S_OK);
    value = 0;
    DWORD returned = 0;
    EXPECT_EQ(CallSlot<HRESULT>(presenter, 6, &kSet, DWORD{0x0401}, kNoData, kNoBytes, data,
                                DWORD{4}, &returned),
              S_OK);
    EXPECT_EQ(value, 0xABCDu);
    EXPECT_EQ(returned, 4u);

    VP_OPEN_STREAM_PARAMS params = {0x1000, 16, 16, 0, {}};
    IJxVideoPresenterStream* stream = nullptr;
    EXPECT_EQ(CallSlot<HRESULT>(presenter, 8, &params, DWORD{0}, &stream), S_OK);
    ASSERT_NE(stream, nullptr);
    EXPECT_EQ(CallSlot<HRESULT>(presenter, 9, stream), S_OK);
    EXPECT_EQ(CallSlot<HRESULT>(presenter, 9, stream), E_FAIL);

    EXPECT_EQ(CallSlot<HRESULT>(presenter, 4), S_OK);
    EXPECT_EQ(CallSlot<HRESULT>(presenter, 5, DWORD{0}), S_FALSE);
    CallSlot<void>(presenter, 11);  // frees it, or the leak checker complains
}

TEST(VtableTest, StreamSlots) {
    VP_OPEN_STREAM_PARAMS params = {0x1000, 16, 16, 0, {}};
    void* const stream = new CVidshowStream(&params, nullptr, nullptr);
    void** const nowhere = nullptr;
    EXPECT_EQ(CallSlot<HRESULT>(stream, 0, &kSet, nowhere), E_NOTIMPL);
    EXPECT_EQ(CallSlot<HRESULT>(stream, 1), E_NOTIMPL);
    EXPECT_EQ(CallSlot<HRESULT>(stream, 2), E_NOTIMPL);
    unsigned char** const noSurface = nullptr;
    DWORD* const noStride = nullptr;
    EXPECT_EQ(CallSlot<HRESULT>(stream, 7, noSurface, noStride), E_UNEXPECTED);
    EXPECT_EQ(CallSlot<HRESULT>(stream, 8), E_UNEXPECTED);
    EXPECT_EQ(CallSlot<HRESULT>(stream, 4), E_UNEXPECTED);
    EXPECT_EQ(CallSlot<HRESULT>(stream, 3), S_OK);
    EXPECT_EQ(CallSlot<HRESULT>(stream, 3), E_UNEXPECTED);
    EXPECT_EQ(CallSlot<HRESULT>(stream, 7, noSurface, noStride), S_OK);
    EXPECT_EQ(CallSlot<HRESULT>(stream, 8), S_OK);

    DWORD value = 0xABCD;
    void* const data = &value;
    EXPECT_EQ(CallSlot<HRESULT>(stream, 6, &kSet, DWORD{0x0403}, kNoData, kNoBytes, data, DWORD{4}),
              S_OK);
    value = 0;
    EXPECT_EQ(CallSlot<HRESULT>(stream, 5, &kSet, DWORD{0x0403}, kNoData, kNoBytes, data, DWORD{4},
                                noStride),
              S_OK);
    EXPECT_EQ(value, 0xABCDu);

    EXPECT_EQ(CallSlot<HRESULT>(stream, 9, noSurface, noStride, DWORD{0}), E_FAIL) << "not enabled";
    VR_ANIMATION_PARAMS* const noAnimation = nullptr;
    EXPECT_EQ(CallSlot<HRESULT>(stream, 10, noAnimation), E_NOTIMPL);
    EXPECT_EQ(CallSlot<HRESULT>(stream, 11), E_NOTIMPL);
    EXPECT_EQ(CallSlot<HRESULT>(stream, 4), S_OK);
    CallSlot<void>(stream, 13);
}

TEST(VtableTest, CompleteDestructorEndsTheObjectAndLeavesItsStorage) {
    Window window;
    alignas(CVidshow) unsigned char storage[sizeof(CVidshow)];
    CVidshow* const presenter = new (storage) CVidshow;
    VP_OpenOptionsAdv options = {};
    ASSERT_EQ(presenter->Open(&options, sizeof options), S_OK);
    VR_ANDROID_SURFACE_PARAM record = {nullptr, window.get()};
    ASSERT_EQ(presenter->Set(kSet, JX_PROPID_VP_ANDROID_SURFACE, nullptr, 0, &record, 8), S_OK);
    ASSERT_EQ(window.state().strongCount, 2);
    CallSlot<void>(static_cast<void*>(presenter), 10);
    EXPECT_EQ(window.state().strongCount, 1) << "closed";

    alignas(CVidshowStream) unsigned char place[sizeof(CVidshowStream)];
    VP_OPEN_STREAM_PARAMS params = {0x1000, 16, 16, 0, {}};
    CVidshowStream* const stream = new (place) CVidshowStream(&params, nullptr, nullptr);
    CallSlot<void>(static_cast<void*>(stream), 12);
}

TEST(VtableTest, InterfacesStartWhereTheObjectsStart) {
    void* const made = CreateVideoPresenterAdv();
    CVidshow* const presenter = static_cast<CVidshow*>(made);
    EXPECT_EQ(static_cast<void*>(static_cast<IJxVideoPresenterAdv*>(presenter)), made);
    EXPECT_EQ(static_cast<void*>(static_cast<IUnknown*>(presenter)), made);
    delete static_cast<CVidshow*>(static_cast<IJxVideoPresenterAdv*>(presenter));
}

}  // namespace
