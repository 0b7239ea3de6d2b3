// The vector kernels one by one, as the published table names them: all 30 families and their four
// matrices, at small and odd sizes, with planes that end or begin at an unmapped page. Every back
// end makes the plain one's bytes, nothing outside the picture is touched, and the source stays.

#include <string>
#include <vector>

#include "fuzz/back_ends.h"
#include "fuzz/bytes.h"
#include "fuzz/planes.h"
#include "kernels/vec_list.h"
#include "kernels/vec_table.h"
#include "vidshow/kernels.h"

namespace {

using fuzz::Bytes;
using fuzz::Placement;
using fuzz::Planes;
using fuzz::Require;
using namespace vidshow::vec;

enum Direction { toPlanes, toLines, toPixels };
enum Tail { none, alpha, key };

struct Family {
    Direction direction;
    Pixels pixels;
    Chroma chroma;
    Tail tail;
};

#define TO_PLANES(name, range, source, order) {toPlanes, source, planar, none},
#define TO_LINES(name, range, order) {toLines, spread, planar, none},
#define TO_PIXELS(name, range, chroma, pixels, order, tail) {toPixels, pixels, chroma, tail},
constexpr Family kFamilies[] = {VIDSHOW_VECTOR_FAMILIES(TO_PLANES, TO_LINES, TO_PIXELS)};
static_assert(sizeof kFamilies / sizeof kFamilies[0] == 30);

constexpr uint32_t kBytesPerPixel[] = {2, 3, 4, 2, 4};

struct Case {
    explicit Case(Bytes& bytes)
        : family(bytes.Below(30)),
          matrix(bytes.Below(4)),
          w(1 + bytes.Below(bytes.Below(8) == 0 ? 600 : 80)),
          h(kFamilies[family].direction == toLines ? 2 : 1 + bytes.Below(7)),
          placement(bytes.Bit() ? Placement::end : Placement::start),
          extra(bytes.Word()) {
        for (uint32_t& pad : pads)
            pad = bytes.Bit() ? bytes.Below(40) : 0;
        seed = bytes.Word();
    }

    uint32_t family, matrix, w, h;
    Placement placement;
    uint32_t extra;
    uint32_t pads[4];  // of the planes' strides and of the pixels'
    uint32_t seed;
};

void AddPlane(Planes& planes, uint32_t rowBytes, uint32_t rows, uint32_t pad, Placement placement) {
    planes.Add({rowBytes, rows, rowBytes + pad, rowBytes, placement});
}

/// The planes and the pixels of a case, whichever of them is the source.
class Picture {
  public:
    explicit Picture(const Case& c) : m_case(c), m_family(kFamilies[c.family]) {
        const uint32_t columns = (c.w + 1) / 2, rows = (c.h + 1) / 2;
        AddPlane(m_planes, c.w, c.h, c.pads[0], c.placement);
        if (m_family.chroma == pairs) {
            AddPlane(m_planes, 2 * columns, rows, c.pads[1], c.placement);
        } else {
            AddPlane(m_planes, columns, rows, c.pads[1], c.placement);
            AddPlane(m_planes, columns, rows, c.pads[2], c.placement);
        }
        // Words of two lines are aligned.
        const uint32_t pad = m_family.direction == toLines ? c.pads[3] & ~3u : c.pads[3];
        AddPlane(m_pixels, c.w * kBytesPerPixel[m_family.pixels], c.h, pad, c.placement);
        source().FillRandom(fuzz::Samples(c.seed));
    }

    /// @return what the kernel in the table made
    std::vector<uint8_t> Run() {
        constexpr uint8_t kFill = 0x5A;
        made().Fill(kFill);
        const std::vector<uint8_t> before = source().Snapshot();
        Require(Call() == 0, "a kernel succeeds");
        Require(source().Snapshot() == before, "the source stays as it was");
        Require(made().RestIs(kFill, false), "bytes outside the picture stay as they were");
        return made().Snapshot();
    }

  private:
    Planes& source() { return m_family.direction == toPlanes ? m_pixels : m_planes; }
    Planes& made() { return m_family.direction == toPlanes ? m_planes : m_pixels; }

    template <typename... Types>
    int32_t CallTable(Types... arguments) {
        void* const kernel = vidshow::kVectorKernels[4 * m_case.family + m_case.matrix];
        return reinterpret_cast<int32_t (*)(Types...)>(kernel)(arguments...);
    }

    int32_t Call() {
        const int32_t w = static_cast<int32_t>(m_case.w), h = static_cast<int32_t>(m_case.h);
        uint8_t* const* const planes = m_planes.plane;
        const uint32_t* const strides = m_planes.stride;
        void* const pixels = m_pixels.plane[0];
        const uint32_t stride = m_pixels.stride[0];
        if (m_family.direction == toPlanes)
            return CallTable(static_cast<const void*>(pixels), stride, planes, strides, w, h);
        if (m_family.direction == toPixels && m_family.tail == none)
            return CallTable(planes, strides, pixels, stride, w, h);
        if (m_family.direction == toPixels)
            return CallTable(planes, strides, pixels, stride, w, h, m_case.extra);
        uint32_t* const line = static_cast<uint32_t*>(pixels);
        return CallTable<const uint8_t*, const uint8_t*, const uint8_t*, const uint8_t*, uint32_t*,
                         uint32_t*, int32_t>(planes[0], planes[0] + strides[0], planes[1],
                                             planes[2], line, line + stride / sizeof *line, w);
    }

    const Case& m_case;
    const Family m_family;
    Planes m_planes;
    Planes m_pixels;
};

/// The blends of spread lines: `count` pixels, in fours.
std::vector<uint8_t> Blend(const Case& c) {
    const size_t count = 4 * static_cast<size_t>(1 + c.w % 20);
    std::vector<uint32_t> upper(count), lower(count), made(2 * count);
    fuzz::Samples samples(c.seed);
    samples.Fill(reinterpret_cast<uint8_t*>(upper.data()), count * sizeof(uint32_t));
    samples.Fill(reinterpret_cast<uint8_t*>(lower.data()), count * sizeof(uint32_t));
    const int32_t pixels = static_cast<int32_t>(count);
    _vlerp_neon(upper.data(), lower.data(), made.data(), static_cast<int32_t>(c.extra % 33),
                pixels);
    _vlerp12_neon(upper.data(), lower.data(), made.data() + count, pixels);
    const auto* const bytes = reinterpret_cast<const uint8_t*>(made.data());
    return std::vector<uint8_t>(bytes, bytes + made.size() * sizeof made[0]);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    Bytes bytes(data, size);
    const Case c(bytes);
    fuzz::RequireSameBytes([&] { return Picture(c).Run(); });
    fuzz::RequireSameBytes([&] { return Blend(c); });
    return 0;
}
