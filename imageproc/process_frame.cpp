// One frame: its record and its planes are checked here, the work is done in pipeline_frame.cpp.

#include <cstring>

#include "imageproc/processor.h"

namespace vidshow {
namespace {

constexpr HRESULT kNoArgument = 1;  // and every result of the pipeline that has no code of its own
constexpr HRESULT kRecordTooLarge = 2;
constexpr HRESULT kInternalFailure = 15;

constexpr uint32_t kLastInputFormat = QZ_IMAGEPROC_FMT_ABGR32;
constexpr uint32_t kLastOutputFormat = QZ_IMAGEPROC_FMT_RGB5551;

// The code of a missing plane, by the number of planes; that of a zero stride is one more.
constexpr HRESULT kInputCodes[] = {0, 7, 5, 3};
constexpr HRESULT kOutputCodes[] = {0, 13, 11, 9};

uint32_t PlaneCount(uint32_t format) {
    if (format <= QZ_IMAGEPROC_FMT_YCBCR444) return 3;
    return format == QZ_IMAGEPROC_FMT_NV12 ? 2 : 1;
}

template <typename Item>
bool AllNonZero(const Item* items, uint32_t count) {
    if (!items) return false;
    for (uint32_t i = 0; i < count; ++i) {
        if (!items[i]) return false;
    }
    return true;
}

HRESULT CheckPlanes(uint8_t* const* planes, const uint32_t* strides, uint32_t format,
                    const HRESULT codes[4]) {
    const uint32_t count = PlaneCount(format);
    if (!AllNonZero(planes, count)) return codes[count];
    if (!AllNonZero(strides, count)) return codes[count] + 1;
    return S_OK;
}

// Zero keeps the current mode: once chosen, deinterlacing stays on.
void StoreDeinterlaceMode(QZ_IMAGEPROC_PARAMSET& processor, uint32_t mode) {
    if (mode == 0) return;
    const bool planar = InputFormat(processor.u32CscType) <= QZ_IMAGEPROC_FMT_YCBCR444;
    processor.u32DeinterlaceMode = planar ? mode : 0;
}

HRESULT ResultOf(int32_t pipelineResult) {
    switch (pipelineResult) {
        case 0:
            return S_OK;
        case -1:
            return kInternalFailure;
        case -2:
            return E_OUTOFMEMORY;
        case -3:
            return E_NOTIMPL;
        default:
            return kNoArgument;
    }
}

}  // namespace
}  // namespace vidshow

extern "C" HRESULT QZ_IMAGEPROC_ProcessFrame(void* handle, uint8_t* const src[3],
                                             const uint32_t srcStride[3], uint8_t* const dst[3],
                                             const uint32_t dstStride[3],
                                             const QZ_IMAGEPROC_FRAME_PARAMS* frame) {
    using namespace vidshow;
    if (!handle || !frame) return kNoArgument;
    QZ_IMAGEPROC_FRAME_PARAMS given = {};
    if (frame->u32Size > sizeof given) return kRecordTooLarge;
    std::memcpy(&given, frame, frame->u32Size);

    auto& processor = *static_cast<QZ_IMAGEPROC_PARAMSET*>(handle);
    StoreDeinterlaceMode(processor, given.u32DeinterlaceMode);

    const uint32_t input = InputFormat(processor.u32CscType);
    if (input > kLastInputFormat) return E_UNEXPECTED;
    const HRESULT inputCheck = CheckPlanes(src, srcStride, input, kInputCodes);
    if (inputCheck != S_OK) return inputCheck;

    const uint32_t output = OutputFormat(processor.u32CscType);
    if (output > kLastOutputFormat) return E_UNEXPECTED;
    const HRESULT outputCheck = CheckPlanes(dst, dstStride, output, kOutputCodes);
    if (outputCheck != S_OK) return outputCheck;

    return ResultOf(_ImgPrcOneFrame_depend(&processor, src, srcStride, dst, dstStride));
}
