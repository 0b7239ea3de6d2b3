// Making and destroying a processor: one zero-filled record, its deinterlace image, its translation
// tables, and what the conversion needs besides (pipeline_init.cpp). All memory of a processor is
// taken here, but for the adjustment tables, which wait until somebody adjusts.

#include "imageproc/processor.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>

#include "imageproc/memory.h"

extern "C" {

// Weak on purpose, alone of all the exported names: a client's own definition takes precedence.
// NOLINTNEXTLINE(readability-redundant-declaration)
extern __attribute__((weak)) const GUID IID_QZ_IMAGEPROC_C;
const GUID IID_QZ_IMAGEPROC_C = {
    0x17A12BC8, 0xDF53, 0x4AC7, {0xBA, 0xCF, 0xE8, 0x54, 0x74, 0x24, 0x27, 0xAE}};

}  // extern "C"

namespace vidshow {
namespace {

constexpr size_t kLumaBytes = 256 * sizeof(uint16_t);
constexpr size_t kChromaBytes = 256 * sizeof(uint32_t);
constexpr size_t kTransAlignment = 4;
constexpr size_t kTransBlockBytes = kLumaBytes + 2 * kChromaBytes + kTransAlignment;
static_assert(kTransBlockBytes == 2564, "the size that the record's documentation states");

constexpr uint64_t kImageAlignment = 16;

struct FreeProcessor {
    void operator()(QZ_IMAGEPROC_PARAMSET* processor) const {
        std::free(processor->pWalker);
        std::free(processor->pLineBlock);
        FreeAdjustTables(*processor);
        std::free(processor->pTransBlock);
        std::free(processor->pReservedBlock);
        std::free(processor->pDeinterlaceBlock);
        std::free(processor);
    }
};
using ProcessorPtr = std::unique_ptr<QZ_IMAGEPROC_PARAMSET, FreeProcessor>;

void StoreSizes(QZ_IMAGEPROC_PARAMSET& processor, const QZ_IMAGEPROC_INIT_PARAMS& params) {
    processor.u32GivenInWidth = params.u32InWidth;
    processor.u32GivenInHeight = params.u32InHeight;
    processor.u32GivenOutWidth = params.u32OutWidth;
    processor.u32GivenOutHeight = params.u32OutHeight;
    constexpr uint32_t kLowBits = 3;
    const uint32_t all =
        params.u32InWidth | params.u32InHeight | params.u32OutWidth | params.u32OutHeight;
    if (all & kLowBits) std::puts("mis-aligned resolution found, patching...");
    processor.u32InWidth = params.u32InWidth & ~kLowBits;
    processor.u32InHeight = params.u32InHeight & ~kLowBits;
    processor.u32OutWidth = params.u32OutWidth & ~kLowBits;
    processor.u32OutHeight = params.u32OutHeight & ~kLowBits;
}

void StoreSettings(QZ_IMAGEPROC_PARAMSET& processor, const QZ_IMAGEPROC_INIT_PARAMS& params) {
    processor.u32CscType = params.u32CscType;
    processor.u32RotationType = params.u32RotationType;
    processor.u32ResizeAlgorithm = params.u32ResizeAlgorithm;
    processor.u32Alpha = params.u32Alpha;
    processor.i32Brightness = kNeutral;
    processor.i32Contrast = kNeutral;
    processor.i32Saturation = kNeutral;
}

// Four planes of full size: what deinterlacing writes and the kernels then read. Zero-filled, so
// that a sample which no mode has written yet is at least the same everywhere.
bool AllocateDeinterlaceImage(QZ_IMAGEPROC_PARAMSET& processor) {
    const uint64_t stride = RoundUp(processor.u32InWidth, kImageAlignment);
    const uint64_t planeBytes = stride * processor.u32InHeight;
    processor.pDeinterlaceBlock = AllocateZeroed(4, planeBytes, kImageAlignment - 1);
    if (!processor.pDeinterlaceBlock) return false;
    uint8_t* const start = AlignUp(processor.pDeinterlaceBlock, kImageAlignment);
    for (size_t i = 0; i < 4; ++i) {
        processor.pDeinterlacePlanes[i] = start + i * static_cast<size_t>(planeBytes);
    }
    processor.u32DeinterlaceStride = static_cast<uint32_t>(stride);
    processor.u32DeinterlaceHeight = processor.u32InHeight;
    return true;
}

bool AllocateTransTables(QZ_IMAGEPROC_PARAMSET& processor) {
    processor.pTransBlock = static_cast<uint8_t*>(std::malloc(kTransBlockBytes));
    if (!processor.pTransBlock) return false;
    uint8_t* const start = AlignUp(processor.pTransBlock, kTransAlignment);
    processor.pTransLuma = ItemsAt<uint16_t>(start);
    processor.pTransCb = ItemsAt<uint32_t>(start + kLumaBytes);
    processor.pTransCr = ItemsAt<uint32_t>(start + kLumaBytes + kChromaBytes);
    RebuildTransTables(processor, kNeutral, kNeutral, kNeutral);
    return true;
}

uint32_t CompareSizes(const QZ_IMAGEPROC_PARAMSET& processor) {
    const int32_t inWidth = static_cast<int32_t>(processor.u32InWidth);
    const int32_t inHeight = static_cast<int32_t>(processor.u32InHeight);
    const int32_t outWidth = static_cast<int32_t>(processor.u32OutWidth);
    const int32_t outHeight = static_cast<int32_t>(processor.u32OutHeight);
    if (inWidth == outWidth && inHeight == outHeight) return kCaseEqual;
    if (inWidth < outWidth && inHeight < outHeight) return kCaseLarger;
    if (inWidth > outWidth && inHeight > outHeight) return kCaseSmaller;
    return kCaseMixed;
}

// The steps stand in an order that shows: messages and result codes follow it.
HRESULT Build(QZ_IMAGEPROC_PARAMSET& processor, const QZ_IMAGEPROC_INIT_PARAMS& params) {
    StoreSizes(processor, params);
    StoreSettings(processor, params);
    if (UpdateColorMatrix(&processor, params.u32ColorMatrix, params.u32YuvRange) != 0) {
        std::puts("Unexpected color matrix index or yuv range!");
        return E_UNEXPECTED;
    }
    StoreColorKey(processor, params.u32ColorKey);
    if (!AllocateDeinterlaceImage(processor)) {
        std::puts("Fail to allocate memory for temp image buf for deinterlaced!");
        return E_OUTOFMEMORY;
    }
    if (!AllocateTransTables(processor)) return E_OUTOFMEMORY;
    processor.u32ResizeCase = CompareSizes(processor);
    const int32_t result = _ImgPrcInit_depend(&processor);
    if (result != 0) {
        std::printf("Fail to init the platform dependent part wit ret = 0x%x!\n",
                    static_cast<uint32_t>(result));
        return E_FAIL;
    }
    return S_OK;
}

}  // namespace
}  // namespace vidshow

extern "C" HRESULT QZ_IMAGEPROC_Create(void** phandle, uint32_t /*reserved*/,
                                       const QZ_IMAGEPROC_INIT_PARAMS* params) {
    using namespace vidshow;
    if (!phandle || *phandle || !params) return E_INVALIDARG;
    QZ_IMAGEPROC_INIT_PARAMS given = {};
    if (params->u32Size > sizeof given) return E_INVALIDARG;
    std::memcpy(&given, params, params->u32Size);

    ProcessorPtr processor(
        static_cast<QZ_IMAGEPROC_PARAMSET*>(std::calloc(1, sizeof(QZ_IMAGEPROC_PARAMSET))));
    if (!processor) {
        std::puts("Fail to allocate memory for image process parameter set!");
        return E_OUTOFMEMORY;
    }
    const HRESULT result = Build(*processor, given);
    if (result == S_OK) *phandle = processor.release();
    return result;
}

extern "C" HRESULT QZ_IMAGEPROC_Destroy(void* handle) {
    using namespace vidshow;
    if (!handle) return E_INVALIDARG;
    ProcessorPtr(static_cast<QZ_IMAGEPROC_PARAMSET*>(handle)).reset();
    return S_OK;
}
