// Properties of a processor: colour adjustment and colour key.

#include <cstdio>
#include <cstring>

#include "imageproc/processor.h"

namespace vidshow {

void StoreColorKey(QZ_IMAGEPROC_PARAMSET& processor, uint32_t key) {
    processor.u32ColorKey = key;
    if (processor.u32CscType == QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551) {
        CalcColorKey(&processor.u32ColorKey);
    }
}

namespace {

constexpr uint32_t kAdjustBytes = 3 * sizeof(uint32_t);
constexpr uint32_t kKeyBytes = sizeof(uint32_t);

HRESULT SetAdjust(QZ_IMAGEPROC_PARAMSET& processor, const void* data, uint32_t size) {
    if (!data || size > kAdjustBytes) return E_INVALIDARG;
    int32_t values[3] = {};
    std::memcpy(values, data, size);
    return SetImgColorAdjust(&processor, values) == 0 ? S_OK : E_OUTOFMEMORY;
}

HRESULT GetAdjust(QZ_IMAGEPROC_PARAMSET& processor, void* data, uint32_t size, uint32_t* sizeOut) {
    if (!data || size < kAdjustBytes) return E_INVALIDARG;
    uint32_t values[3];
    const int32_t capability = GetImgColorAdjust(&processor, values);
    std::memcpy(data, values, kAdjustBytes);
    if (sizeOut) *sizeOut = kAdjustBytes;
    return capability == 0 ? S_OK : E_FAIL;
}

HRESULT SetKey(QZ_IMAGEPROC_PARAMSET& processor, const void* data, uint32_t size) {
    if (!data || size < kKeyBytes) return E_INVALIDARG;
    uint32_t key;
    std::memcpy(&key, data, kKeyBytes);
    StoreColorKey(processor, key);
    return S_OK;
}

HRESULT GetKey(const QZ_IMAGEPROC_PARAMSET& processor, void* data, uint32_t size,
               uint32_t* sizeOut) {
    if (!data || size < kKeyBytes) return E_INVALIDARG;
    std::memcpy(data, &processor.u32ColorKey, kKeyBytes);
    if (sizeOut) *sizeOut = kKeyBytes;
    return S_OK;
}

HRESULT Unknown(uint32_t propId) {
    std::printf("invalid propid = 0x%x!\n", propId);
    return QZ_IMAGEPROC_E_PROPID;
}

}  // namespace
}  // namespace vidshow

extern "C" HRESULT QZ_IMAGEPROC_Set(void* handle, uint32_t propId, const void* data,
                                    uint32_t size) {
    using namespace vidshow;
    if (!handle) return E_INVALIDARG;
    auto& processor = *static_cast<QZ_IMAGEPROC_PARAMSET*>(handle);
    switch (propId) {
        case QZ_IMAGEPROC_PROPID_COLORADJUST:
            return SetAdjust(processor, data, size);
        case QZ_IMAGEPROC_PROPID_COLORKEY:
            return SetKey(processor, data, size);
        default:
            return Unknown(propId);
    }
}

extern "C" HRESULT QZ_IMAGEPROC_Get(void* handle, uint32_t propId, void* data, uint32_t size,
                                    uint32_t* sizeOut) {
    using namespace vidshow;
    if (!handle) return E_INVALIDARG;
    auto& processor = *static_cast<QZ_IMAGEPROC_PARAMSET*>(handle);
    switch (propId) {
        case QZ_IMAGEPROC_PROPID_COLORADJUST:
            return GetAdjust(processor, data, size, sizeOut);
        case QZ_IMAGEPROC_PROPID_COLORKEY:
            return GetKey(processor, data, size, sizeOut);
        default:
            return Unknown(propId);
    }
}

extern "C" HRESULT QZ_IMAGEPROC_Reset(void* handle) {
    using namespace vidshow;
    if (!handle) return E_INVALIDARG;
    auto& processor = *static_cast<QZ_IMAGEPROC_PARAMSET*>(handle);
    processor.u32AdjustActive = 0;
    FreeAdjustTables(processor);
    // The stored triple stays, so that setting it again changes nothing: clients rely on it.
    RebuildTransTables(processor, kNeutral, kNeutral, kNeutral);
    return S_OK;
}
