// RGB sources turned into 4:2:0: the one conversion that takes memory for a frame. A turn goes
// through temporary planes; they are taken, and may be missing, without a turn too.

#include "imageproc/rgb_to_planar.h"

#include <cstdlib>
#include <cstring>

namespace vidshow {
namespace {

class TemporaryPlanes {
  public:
    explicit TemporaryPlanes(const FrameJob& job)
        : m_lumaBytes(static_cast<size_t>(job.w) * static_cast<size_t>(job.h)) {
        m_planes[0] = Take(m_lumaBytes);
        m_planes[1] = Take(m_lumaBytes / 4);
        m_planes[2] = Take(m_lumaBytes / 4);
    }
    ~TemporaryPlanes() {
        std::free(m_planes[0]);
        std::free(m_planes[1]);
        std::free(m_planes[2]);
    }
    TemporaryPlanes(const TemporaryPlanes&) = delete;
    TemporaryPlanes& operator=(const TemporaryPlanes&) = delete;

    bool complete() const { return m_planes[0] && m_planes[1] && m_planes[2]; }
    uint8_t* const* planes() const { return m_planes; }
    void Clear() {
        std::memset(m_planes[0], 0, m_lumaBytes);
        std::memset(m_planes[1], 0, m_lumaBytes / 4);
        std::memset(m_planes[2], 0, m_lumaBytes / 4);
    }

  private:
    static uint8_t* Take(size_t bytes) {
        return static_cast<uint8_t*>(std::malloc(bytes ? bytes : 1));  // no bytes may give null
    }
    const size_t m_lumaBytes;
    uint8_t* m_planes[3];
};

void Convert(const FrameJob& job, uint8_t* const* planes, const uint32_t* strides, int32_t w,
             int32_t h) {
    using Kernel = int32_t (*)(const void* src, uint32_t srcStride, uint8_t* const dst[3],
                               const uint32_t dstStride[3], int32_t w, int32_t h);
    reinterpret_cast<Kernel>(job.p->pfnMain)(job.src[0], job.ss[0], planes, strides, w, h);
}

}  // namespace

int32_t ConvertRgbToPlanar(const FrameJob& job) {
    const TemporaryPlanes temporary(job);
    if (!temporary.complete()) return kNoMemory;
    Convert(job, job.dst, job.ds, job.w, job.h);
    return kDone;
}

int32_t ConvertRgbToPlanarTurned(const FrameJob& job, const PlaneTurn& turn) {
    TemporaryPlanes temporary(job);
    if (!temporary.complete()) return kNoMemory;
    const int32_t w = job.w / 8 * 8;
    const int32_t h = job.h / 8 * 8;
    // The planes are written at the full width and read at the rounded one: the rows of another
    // width come out sheared, and clients rely on the pixels. Reading then meets the columns
    // between the two widths, which nothing writes.
    const uint32_t width = static_cast<uint32_t>(job.w);
    const uint32_t rounded = static_cast<uint32_t>(w);
    if (rounded != width) temporary.Clear();
    const uint32_t strides[3] = {width, width / 2, width / 2};
    Convert(job, temporary.planes(), strides, w, h);
    for (size_t i = 0; i < 3; ++i) {
        const int32_t divisor = i == 0 ? 1 : 2;
        TurnPlane(turn, temporary.planes()[i], rounded / static_cast<uint32_t>(divisor), job.dst[i],
                  job.ds[i], w / divisor, h / divisor);
    }
    return kDone;
}

}  // namespace vidshow
