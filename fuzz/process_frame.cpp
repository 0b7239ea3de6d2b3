// ProcessFrame of every conversion: any sizes, strides, placements, matrices, adjustments and
// deinterlacing modes. Nothing outside the pictures is touched, and every vector back end makes the
// bytes of the plain one.

#include <optional>

#include "fuzz/back_ends.h"
#include "fuzz/bytes.h"
#include "fuzz/planes.h"
#include "imageproc/picture_sizes.h"
#include "vidshow/imageproc.h"

namespace {

using fuzz::Bytes;
using fuzz::Placement;
using fuzz::Planes;
using fuzz::Require;
using imageproc_test::Size;

// Ratios that have kernels of their own come up as often as the others.
Size OutputSize(Bytes& bytes, const Size& in, bool isLarge) {
    switch (bytes.Below(6)) {
        case 0:
        case 1:
            return in;
        case 2:
            return {2 * in.w, 2 * in.h};
        case 3:
            return {5 * in.w / 2, 2 * in.h};
        case 4:
            return {3 * in.w / 2, bytes.Below(isLarge ? 80 : 32)};
        default:
            return {bytes.Below(isLarge ? 120 : 60), bytes.Below(isLarge ? 100 : 32)};
    }
}

bool SharesChromaStride(uint32_t code) {
    return code == 3 || code == 4 || code == 5 || code == 10;
}

struct Case {
    explicit Case(Bytes& bytes) {
        const uint32_t code = bytes.Of(imageproc_test::kCodes);
        // Small pictures have all the edges that large ones have, and are quicker.
        const bool isLarge = bytes.Below(8) == 7;
        Size in = {bytes.Below(isLarge ? 80 : 44), bytes.Below(isLarge ? 64 : 20)};
        if (bytes.Below(4) != 0) in = {in.w & ~3u, in.h & ~3u};
        Size out = OutputSize(bytes, in, isLarge);
        if (bytes.Below(255) == 254) {
            in = {320, 240};
            out = {480, 272};
        }
        params = {sizeof params, code,         bytes.Below(6), bytes.Below(5),
                  in.w,          in.h,         out.w,          out.h,
                  bytes.Byte(),  bytes.Word(), bytes.Below(6), bytes.Below(3)};
        mode = bytes.Bit() ? bytes.Below(10) : 0;
        isAdjusted = bytes.Bit();
        for (uint32_t& value : values)
            value = bytes.Bit() ? bytes.Byte() : bytes.Word();
        placement = bytes.Bit() ? Placement::end : Placement::start;
        for (uint32_t& pad : pads)
            pad = bytes.Bit() ? 4 * bytes.Below(8) : bytes.Below(300);
        // Some kernels to RGB take the stride of Cb for Cr, too.
        if (SharesChromaStride(code)) pads[2] = pads[1];
        seed = bytes.Word();
    }

    QZ_IMAGEPROC_INIT_PARAMS params;
    uint32_t mode;
    bool isAdjusted;
    uint32_t values[3];
    Placement placement;
    uint32_t pads[6];  // of the source's strides, then the destination's
    uint32_t seed;
};

// 2.5 times as wide reads behind the source, unless it reads the processor's own image.
uint32_t RowsBehind(const QZ_IMAGEPROC_PARAMSET& p, bool isDeinterlaced) {
    const bool readsBehind = p.u32ResizeCase == 5 && (p.u32CscType == 3 || p.u32CscType == 5);
    return readsBehind && !isDeinterlaced ? 2 : 0;
}

void MakePlanes(Planes& planes, const std::vector<Size>& sizes, const uint32_t* pads,
                Placement placement, uint32_t rowsBehind, bool wholeLastRow) {
    for (size_t i = 0; i < sizes.size(); ++i) {
        const uint32_t stride = std::max(sizes[i].w + pads[i], 1u);
        const uint32_t rows = sizes[i].h ? sizes[i].h + (i == 0 ? rowsBehind : rowsBehind / 2) : 0;
        planes.Add({sizes[i].w, rows, stride, wholeLastRow ? stride : sizes[i].w, placement});
    }
}

class Frame {
  public:
    Frame(const Case& c, const QZ_IMAGEPROC_PARAMSET& p)
        : m_case(c),
          m_isFlush(imageproc_test::GoesThroughWalker(p.u32CscType) && p.u32RotationType == 3) {
        const Size in = {p.u32InWidth, p.u32InHeight};
        const Size out = imageproc_test::Extent(p.u32CscType, p.u32RotationType, in,
                                                {p.u32OutWidth, p.u32OutHeight});
        const uint32_t input = p.u32CscType >> 8;
        const bool isDeinterlaced = c.mode != 0 && input <= 2;  // which reads whole strides
        MakePlanes(m_src, imageproc_test::PlanesOf(input, in), c.pads, c.placement,
                   RowsBehind(p, isDeinterlaced), isDeinterlaced);
        MakePlanes(m_dst, imageproc_test::PlanesOf(p.u32CscType & 255, out), c.pads + 3,
                   c.placement, 0, m_isFlush);
        m_src.FillRandom(fuzz::Samples(c.seed));
        m_given = m_src.Snapshot();
    }

    std::vector<uint8_t> Run(void* handle) {
        constexpr uint8_t kFill = 0x5A;
        m_dst.Fill(kFill);
        const QZ_IMAGEPROC_FRAME_PARAMS frame = {sizeof frame, 0, m_case.mode};
        const HRESULT result = QZ_IMAGEPROC_ProcessFrame(handle, m_src.plane, m_src.stride,
                                                         m_dst.plane, m_dst.stride, &frame);
        Require(result == S_OK, "the frame is made");
        Require(m_src.Snapshot() == m_given, "the source stays as it was");
        // Some kernels round strides down to a multiple of 4, and write that much further left.
        const bool standsWhereAsked =
            (m_dst.stride[0] | m_dst.stride[1] | m_dst.stride[2]) % 4 == 0;
        Require(!standsWhereAsked || m_dst.RestIs(kFill, m_isFlush),
                "bytes outside the picture stay as they were");
        return m_dst.Snapshot();
    }

  private:
    const Case& m_case;
    const bool m_isFlush;
    Planes m_src;
    Planes m_dst;
    std::vector<uint8_t> m_given;  // the source's bytes
};

class Processor {
  public:
    explicit Processor(const Case& c) {
        const HRESULT result = QZ_IMAGEPROC_Create(&m_handle, 0, &c.params);
        Require((result == S_OK) == (m_handle != nullptr), "a handle comes with success only");
        const bool isKeyed = c.params.u32CscType == QZ_IMAGEPROC_CSC_YCBCR420_TO_RGB5551;
        Require(result == S_OK || (isKeyed && result == E_FAIL), "the conversion exists");
        if (m_handle == nullptr || !c.isAdjusted) return;
        Require(QZ_IMAGEPROC_Set(m_handle, QZ_IMAGEPROC_PROPID_COLORADJUST, c.values, 12) == S_OK,
                "every adjustment is taken");
    }
    ~Processor() { QZ_IMAGEPROC_Destroy(m_handle); }
    Processor(const Processor&) = delete;
    Processor& operator=(const Processor&) = delete;

    void* handle() const { return m_handle; }

  private:
    void* m_handle = nullptr;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    Bytes bytes(data, size);
    const Case c(bytes);
    std::optional<Frame> frame;  // of all back ends: pages are dear
    fuzz::RequireSameBytes([&]() -> std::vector<uint8_t> {
        const Processor processor(c);
        if (processor.handle() == nullptr) return {};
        if (!frame) frame.emplace(c, *static_cast<QZ_IMAGEPROC_PARAMSET*>(processor.handle()));
        return frame->Run(processor.handle());
    });
    return 0;
}
