#include "common/colour.h"

namespace vidshow::tools {

namespace {

constexpr int kFirstHdLine = 720;

Matrix matrixOf(const AVFrame& frame) {
    switch (frame.colorspace) {
        case AVCOL_SPC_BT709:
        case AVCOL_SPC_BT2020_NCL:
        case AVCOL_SPC_BT2020_CL:
            return Matrix::bt709;
        case AVCOL_SPC_FCC:
            return Matrix::fcc;
        case AVCOL_SPC_SMPTE240M:
            return Matrix::smpte240m;
        case AVCOL_SPC_BT470BG:
        case AVCOL_SPC_SMPTE170M:
            return Matrix::bt601;
        default:
            return frame.height >= kFirstHdLine ? Matrix::bt709 : Matrix::bt601;
    }
}

// Grey without a word on its range comes from picture formats, which use all of it.
bool isFullRange(const AVFrame& frame) {
    const AVPixFmtDescriptor* const format =
        av_pix_fmt_desc_get(static_cast<AVPixelFormat>(frame.format));
    const bool grey = format != nullptr && format->nb_components <= 2 && !isRgb(frame.format);
    switch (frame.format) {
        case AV_PIX_FMT_YUVJ420P:
        case AV_PIX_FMT_YUVJ422P:
        case AV_PIX_FMT_YUVJ444P:
        case AV_PIX_FMT_YUVJ440P:
        case AV_PIX_FMT_YUVJ411P:
            return true;
        default:
            return frame.color_range == AVCOL_RANGE_JPEG ||
                   (grey && frame.color_range == AVCOL_RANGE_UNSPECIFIED);
    }
}

int converterMatrix(Matrix matrix) {
    switch (matrix) {
        case Matrix::bt709:
            return SWS_CS_ITU709;
        case Matrix::smpte240m:
            return SWS_CS_SMPTE240M;
        case Matrix::fcc:
            return SWS_CS_FCC;
        case Matrix::bt601:
            break;
    }
    return SWS_CS_ITU601;
}

}  // namespace

bool isRgb(int format) {
    const AVPixFmtDescriptor* const descriptor =
        av_pix_fmt_desc_get(static_cast<AVPixelFormat>(format));
    return descriptor != nullptr &&
           (descriptor->flags & (AV_PIX_FMT_FLAG_RGB | AV_PIX_FMT_FLAG_PAL)) != 0;
}

Colour colourOf(const AVFrame& frame) {
    // RGB is full itself, but is made into 4:2:0 of the usual range.
    const bool full = !isRgb(frame.format) && isFullRange(frame);
    return {matrixOf(frame), full ? Range::full : Range::limited};
}

uint32_t matrixCode(Matrix matrix) {
    switch (matrix) {
        case Matrix::bt709:
            return AVCOL_SPC_BT709;
        case Matrix::fcc:
            return AVCOL_SPC_FCC;
        case Matrix::smpte240m:
            return AVCOL_SPC_SMPTE240M;
        case Matrix::bt601:
            break;
    }
    return AVCOL_SPC_SMPTE170M;
}

void setConverterColours(SwsContext* converter, const Colour& source, const Colour& destination) {
    constexpr int kNeutralBrightness = 0;
    constexpr int kNeutral = 1 << 16;  // contrast and saturation, 16.16
    sws_setColorspaceDetails(
        converter, sws_getCoefficients(converterMatrix(source.matrix)), source.range == Range::full,
        sws_getCoefficients(converterMatrix(destination.matrix)), destination.range == Range::full,
        kNeutralBrightness, kNeutral, kNeutral);
}

}  // namespace vidshow::tools
