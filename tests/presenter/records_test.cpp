// Record layouts and identifiers, as other modules were compiled against them.

#include <gtest/gtest.h>

#include <cstddef>
#include <cstdio>
#include <cstring>
#include <string>

#include "vidshow/android_surface.h"
#include "vidshow/imageproc.h"
#include "vidshow/presenter.h"
#include "vidshow/softrender.h"

namespace {

static_assert(sizeof(VP_OpenOptionsAdv) == 40, "ten words");
static_assert(sizeof(VP_OPEN_STREAM_PARAMS) == 36, "nine words");
static_assert(offsetof(VP_OPEN_STREAM_PARAMS, dwType) == 0, "word 0");
static_assert(offsetof(VP_OPEN_STREAM_PARAMS, dwWidth) == 4, "word 1");
static_assert(offsetof(VP_OPEN_STREAM_PARAMS, dwHeight) == 8, "word 2");
static_assert(offsetof(VP_OPEN_STREAM_PARAMS, dwFormat) == 12, "word 3");
static_assert(offsetof(VP_OPEN_STREAM_PARAMS, dwReserved) == 16, "words 4 to 8");
static_assert(sizeof(QZ_IMAGEPROC_INIT_PARAMS) == 48, "twelve words");
static_assert(sizeof(QZ_IMAGEPROC_FRAME_PARAMS) == 12, "three words");

static_assert(offsetof(ANDROID_SOFTRENDER, dwSize) == 0, "word 0");
static_assert(offsetof(ANDROID_SOFTRENDER, InWidth) == 4, "word 1");
static_assert(offsetof(ANDROID_SOFTRENDER, InHeight) == 8, "word 2");
static_assert(offsetof(ANDROID_SOFTRENDER, Fourcc) == 12, "word 3");
static_assert(offsetof(ANDROID_SOFTRENDER, Handler) == 16, "after four words");
static_assert(offsetof(ANDROID_SOFTRENDER, Converter) == 16 + sizeof(void*), "after the window");
static_assert(sizeof(void*) != 4 || sizeof(ANDROID_SOFTRENDER) == 24, "six words");
static_assert(sizeof(void*) != 4 || sizeof(VR_ANDROID_SURFACE_PARAM) == 8, "two words");

static_assert(offsetof(ANativeWindow_Buffer, stride) == 8, "third number");
static_assert(offsetof(ANativeWindow_Buffer, bits) == 16, "after four numbers");

static_assert(JX_PROPID_VP_STATUS == 0x0000, "id");
static_assert(JX_PROPID_VP_ENABLE == 0x0001, "id");
static_assert(JX_PROPID_VP_RECT_DST == 0x0002, "id");
static_assert(JX_PROPID_VP_RECT_SRC == 0x0003, "id");
static_assert(JX_PROPID_VP_PARAM_0303 == 0x0303, "id");
static_assert(JX_PROPID_VP_ANDROID_SURFACE2 == 0x030A, "id");
static_assert(JX_PROPID_VP_OPTIONS_PAIR == 0x0310, "id");
static_assert(JX_PROPID_VP_ANDROID_SURFACE == 0x0313, "id");
static_assert(JX_PROPID_VP_PARAM_0401 == 0x0401, "id");
static_assert(JX_PROPID_VP_PARAM_0402 == 0x0402, "id");
static_assert(JX_PROPID_VP_DEINTERLACE_MODE == 0x0403, "id");
static_assert(JX_PROPID_VP_PARAM_0409 == 0x0409, "id");
static_assert(JX_PROPID_VP_OPEN_OPTIONS == 0x0603, "id");

static_assert(static_cast<uint32_t>(S_OK) == 0, "code");
static_assert(static_cast<uint32_t>(S_FALSE) == 1, "code");
static_assert(static_cast<uint32_t>(E_NOTIMPL) == 0x80004001, "code");
static_assert(static_cast<uint32_t>(E_POINTER) == 0x80004003, "code");
static_assert(static_cast<uint32_t>(E_FAIL) == 0x80004005, "code");
static_assert(static_cast<uint32_t>(E_UNEXPECTED) == 0x8000FFFF, "code");
static_assert(static_cast<uint32_t>(E_HANDLE) == 0x80070006, "code");
static_assert(static_cast<uint32_t>(E_OUTOFMEMORY) == 0x8007000E, "code");
static_assert(static_cast<uint32_t>(E_INVALIDARG) == 0x80070057, "code");

// The registry form, as it is written in documentation and registries.
std::string RegistryForm(const GUID& id) {
    char text[40];
    std::snprintf(text, sizeof text, "{%08X-%04X-%04X-%02X%02X-%02X%02X%02X%02X%02X%02X}",
                  static_cast<unsigned>(id.Data1), id.Data2, id.Data3, id.Data4[0], id.Data4[1],
                  id.Data4[2], id.Data4[3], id.Data4[4], id.Data4[5], id.Data4[6], id.Data4[7]);
    return text;
}

TEST(Identifiers, HaveTheirValues) {
    EXPECT_EQ(RegistryForm(IID_IUnknown), "{2CB59F1F-85A5-43ED-C000-000000000046}");
    EXPECT_EQ(RegistryForm(IID_IJxVideoPresenter), "{9ECCFCCA-EB44-11D4-B365-0001022A4A87}");
    EXPECT_EQ(RegistryForm(IID_IJxVideoPresenterAdv), "{022CF5CC-85A3-43AA-9471-675B6658A27B}");
    EXPECT_EQ(RegistryForm(IID_IJxVideoPresenterStream), "{B1D629AA-D7AA-4EFD-BA6B-7A54C899C5BF}");
    EXPECT_EQ(RegistryForm(IID_IJxVideoPresenterAnimation),
              "{8B931611-377A-4B2A-BC27-923ABCF375CF}");
    EXPECT_EQ(RegistryForm(IID_IJxFont), "{C540BF80-6776-4097-9A98-7174D6E7169B}");
    EXPECT_EQ(RegistryForm(IID_IQzvmVideoMixer), "{6C889F37-336B-4FDA-854E-203D2236311E}");
    EXPECT_EQ(RegistryForm(IID_IQzvmVideoContext), "{51BC25C8-51A2-4E0A-9467-31FBE8FFCC4F}");
}

TEST(Identifiers, RootDiffersFromTheWellKnownOneInItsFirstEightBytesOnly) {
    const uint8_t wellKnown[16] = {0, 0, 0, 0, 0, 0, 0, 0, 0xC0, 0, 0, 0, 0, 0, 0, 0x46};
    EXPECT_NE(std::memcmp(&IID_IUnknown, wellKnown, 8), 0);
    EXPECT_EQ(std::memcmp(reinterpret_cast<const uint8_t*>(&IID_IUnknown) + 8, wellKnown + 8, 8),
              0);
}

}  // namespace
