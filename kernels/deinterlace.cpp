// The exported modes, and the choice between them.

#include "kernels/deinterlace.h"

namespace vidshow {
namespace {

using Mode = int32_t(const DeinterlaceJob& job);

constexpr Mode* kModes[] = {nullptr,          DeinterlaceFast, DeinterlaceDiscard, DeinterlaceBob,
                            DeinterlaceBlend, DeinterlaceMean, DeinterlaceLinear,  DeinterlaceX};
static_assert(sizeof kModes / sizeof kModes[0] == kModeX + 1, "one for each number");

// What a mode itself says stays here: a picture that it refuses is shown as it was.
int32_t Deinterlace(const DeinterlaceJob& job, uint32_t mode) {
    if (job.dst == nullptr || job.src == nullptr) return -1;
    if (mode == kModeOff) return 0;
    (mode <= kModeX ? kModes[mode] : DeinterlaceFast)(job);
    return 0;
}

void FillPicture(QZ_PICTURE& picture, uint8_t* const planes[3], const uint32_t strides[3],
                 const QZ_IMAGEPROC_PARAMSET& p, int32_t chroma) {
    picture = {};
    picture.planes = 3;
    for (int i = 0; i < 3; ++i) {
        picture.plane[i] = planes[i];
        picture.pitch[i] = strides[i];
    }
    picture.width = p.u32InWidth;
    picture.height = p.u32InHeight;
    picture.chromaWidth = chroma <= kChroma422 ? p.u32InWidth / 2 : p.u32InWidth;
    picture.chromaHeight = chroma == kChroma420 ? p.u32InHeight / 2 : p.u32InHeight;
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

extern "C" {

int32_t QZ_DeInterlace(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                       uint8_t* const dsts[3], const uint32_t ds[3]) {
    const uint32_t format = p->u32CscType >> 8;
    if (format > QZ_IMAGEPROC_FMT_YCBCR444) return -1;
    const int32_t chroma = static_cast<int32_t>(format);  // the formats stand in the same order
    QZ_PICTURE from, to;
    FillPicture(from, src, ss, *p, chroma);
    FillPicture(to, dsts, ds, *p, chroma);
    return Deinterlace({&to, &from, chroma, static_cast<int32_t>(p->u32InWidth),
                        static_cast<int32_t>(p->u32InHeight), 0, Reach::planes},
                       p->u32DeinterlaceMode);
}

int32_t DeInterlace(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t w, int32_t h, int32_t field,
                    int32_t chroma, int32_t mode) {
    return Deinterlace({dst, src, chroma, w, h, field, Reach::pitch}, static_cast<uint32_t>(mode));
}

int32_t picture_deinterlace_fast(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t chroma, int32_t w,
                                 int32_t h) {
    return DeinterlaceFast({dst, src, chroma, w, h, 0, Reach::pitch});
}
int32_t picture_deinterlace_discard(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t chroma,
                                    int32_t w, int32_t h, int32_t field) {
    return DeinterlaceDiscard({dst, src, chroma, w, h, field, Reach::pitch});
}
int32_t picture_deinterlace_bob(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t chroma, int32_t w,
                                int32_t h, int32_t field) {
    return DeinterlaceBob({dst, src, chroma, w, h, field, Reach::pitch});
}
int32_t picture_deinterlace_blend(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t chroma, int32_t w,
                                  int32_t h) {
    return DeinterlaceBlend({dst, src, chroma, w, h, 0, Reach::pitch});
}
int32_t picture_deinterlace_mean(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t chroma, int32_t w,
                                 int32_t h) {
    return DeinterlaceMean({dst, src, chroma, w, h, 0, Reach::pitch});
}
int32_t picture_deinterlace_linear(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t chroma,
                                   int32_t w, int32_t h, int32_t field) {
    return DeinterlaceLinear({dst, src, chroma, w, h, field, Reach::pitch});
}
int32_t picture_deinterlace_x(QZ_PICTURE* dst, const QZ_PICTURE* src, int32_t chroma, int32_t w,
                              int32_t h) {
    return DeinterlaceX({dst, src, chroma, w, h, 0, Reach::pitch});
}

}  // extern "C"
