// Creation records and property calls. Nothing is refused but what the interface says, a refusal
// leaves no handle, and what was set reads back.

#include <algorithm>
#include <cstring>

#include "fuzz/bytes.h"
#include "imageproc/picture_sizes.h"
#include "vidshow/imageproc.h"

namespace {

using fuzz::Bytes;
using fuzz::Require;

// Mostly values that mean something; now and then any at all.
uint32_t Choice(Bytes& bytes, uint32_t bound) {
    return bytes.Below(8) == 0 ? bytes.Word() : bytes.Below(bound);
}

QZ_IMAGEPROC_INIT_PARAMS Record(Bytes& bytes) {
    QZ_IMAGEPROC_INIT_PARAMS p = {};
    p.u32Size = bytes.Below(8) == 0 ? Choice(bytes, 64) : sizeof p;
    p.u32CscType = bytes.Below(8) == 0 ? bytes.Word() : bytes.Of(imageproc_test::kCodes);
    p.u32RotationType = Choice(bytes, 7);
    p.u32ResizeAlgorithm = Choice(bytes, 5);
    p.u32InWidth = bytes.Below(600);  // larger ones would only try the heap
    p.u32InHeight = bytes.Below(400);
    p.u32OutWidth = bytes.Bit() ? p.u32InWidth : bytes.Below(600);
    p.u32OutHeight = bytes.Bit() ? p.u32InHeight : bytes.Below(400);
    p.u32Alpha = bytes.Word();
    p.u32ColorKey = bytes.Word();
    p.u32ColorMatrix = Choice(bytes, 5);
    p.u32YuvRange = Choice(bytes, 3);
    return p;
}

// What the interface's documentation says of this record.
HRESULT Expected(const QZ_IMAGEPROC_INIT_PARAMS& given) {
    if (given.u32Size > sizeof given) return E_INVALIDARG;
    QZ_IMAGEPROC_INIT_PARAMS p = {};
    std::memcpy(&p, &given, given.u32Size);
    const auto* const end = std::end(imageproc_test::kCodes);
    if (std::find(std::begin(imageproc_test::kCodes), end, p.u32CscType) == end) return E_FAIL;
    if (p.u32RotationType > QZ_IMAGEPROC_ROTATE_MIRROR_V) return E_FAIL;
    const bool isResized = p.u32InWidth / 4 != p.u32OutWidth / 4 ||  //
                           p.u32InHeight / 4 != p.u32OutHeight / 4;
    const bool isKeyed = p.u32CscType == QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551;
    if (isKeyed && (p.u32RotationType != 0 || isResized)) return E_FAIL;
    return S_OK;
}

class Properties {
  public:
    Properties(Bytes& bytes, void* handle) : m_bytes(bytes), m_handle(handle) {}

    void Step() {
        switch (m_bytes.Below(6)) {
            case 0:
            case 1:
                return SetAdjustment();
            case 2:
                return GetAdjustment();
            case 3:
                return SetKey();
            case 4:
                Require(QZ_IMAGEPROC_Reset(m_handle) == S_OK, "a reset succeeds");
                return;
            default:
                return Unknown();
        }
    }

  private:
    void SetAdjustment() {
        uint32_t values[3];
        for (uint32_t& value : values)
            value = m_bytes.Bit() ? m_bytes.Byte() : m_bytes.Word();
        const uint32_t size = m_bytes.Below(4) == 0 ? m_bytes.Below(20) : 12;
        const HRESULT result =
            QZ_IMAGEPROC_Set(m_handle, QZ_IMAGEPROC_PROPID_COLORADJUST, values, size);
        Require(result == (size <= 12 ? S_OK : E_INVALIDARG), "up to twelve bytes are taken");
        if (result != S_OK) return;
        std::memset(m_values, 0, sizeof m_values);
        std::memcpy(m_values, values, size);
    }

    void GetAdjustment() {
        uint32_t values[4] = {1, 2, 3, 4};
        const uint32_t size = m_bytes.Below(20);
        uint32_t written = 0;
        const HRESULT result =
            QZ_IMAGEPROC_Get(m_handle, QZ_IMAGEPROC_PROPID_COLORADJUST, values, size, &written);
        if (size < 12) return Require(result == E_INVALIDARG, "there must be room");
        Require(result == S_OK || result == E_FAIL, "read, applied or not");
        Require(written == 12 && values[3] == 4, "twelve bytes are written");
        Require(std::memcmp(values, m_values, 12) == 0, "what was set reads back");
    }

    void SetKey() {
        uint32_t key = m_bytes.Word();
        const uint32_t size = m_bytes.Below(10);
        const HRESULT result = QZ_IMAGEPROC_Set(m_handle, QZ_IMAGEPROC_PROPID_COLORKEY, &key, size);
        Require(result == (size >= 4 ? S_OK : E_INVALIDARG), "four bytes are wanted");
    }

    void Unknown() {
        uint32_t words[4] = {};
        const uint32_t id = m_bytes.Bit() ? 0 : m_bytes.Word() | 4;
        const uint32_t size = m_bytes.Below(17);
        Require(QZ_IMAGEPROC_Set(m_handle, id, words, size) == QZ_IMAGEPROC_E_PROPID,
                "there is no such property to set");
        Require(QZ_IMAGEPROC_Get(m_handle, id, words, size, nullptr) == QZ_IMAGEPROC_E_PROPID,
                "nor to get");
    }

    Bytes& m_bytes;
    void* const m_handle;
    uint32_t m_values[3] = {128, 128, 128};
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    Bytes bytes(data, size);
    const QZ_IMAGEPROC_INIT_PARAMS record = Record(bytes);
    void* handle = nullptr;
    const HRESULT result = QZ_IMAGEPROC_Create(&handle, bytes.Word(), &record);
    Require(result == Expected(record), "creation answers as documented");
    Require((handle != nullptr) == (result == S_OK), "a handle comes with success only");
    if (handle == nullptr) return 0;
    Properties properties(bytes, handle);
    while (!bytes.empty())
        properties.Step();
    Require(QZ_IMAGEPROC_Destroy(handle) == S_OK, "it can be destroyed");
    return 0;
}
