// Deinterlacing as frames run it: any size, format and pitches, planes of whole lines that touch
// unmapped pages. Nothing but the destination is written, and every vector back end makes the bytes
// of the plain one.

#include "fuzz/back_ends.h"
#include "fuzz/bytes.h"
#include "fuzz/planes.h"
#include "vidshow/kernels.h"

namespace {

using fuzz::Bytes;
using fuzz::Planes;
using fuzz::Require;

struct Case {
    explicit Case(Bytes& bytes)
        : chroma(bytes.Below(3)),
          width(bytes.Below(70)),
          height(bytes.Below(34)),
          mode(bytes.Below(10)),
          isInPlace(bytes.Below(4) == 0),
          placement(bytes.Bit() ? fuzz::Placement::end : fuzz::Placement::start) {
        if (bytes.Below(4) != 0) {  // what a processor asks for
            width &= ~3u;
            height &= ~3u;
        }
        for (uint32_t& pad : pads)
            pad = bytes.Bit() ? 8 * bytes.Below(6) : bytes.Below(300);
        seed = bytes.Word();
    }

    void Make(Planes& planes, const uint32_t* padding) const {
        for (int i = 0; i < 3; ++i) {
            const uint32_t w = i > 0 && chroma <= 1 ? width / 2 : width;
            const uint32_t h = i > 0 && chroma == 0 ? height / 2 : height;
            const uint32_t stride = std::max(w + padding[i], 1u);
            planes.Add({w, h, stride, stride, placement});
        }
    }

    uint32_t chroma;
    uint32_t width;
    uint32_t height;
    uint32_t mode;
    bool isInPlace;
    fuzz::Placement placement;
    uint32_t pads[6];  // of the source, then of the destination
    uint32_t seed;
};

std::vector<uint8_t> Run(const Case& c) {
    Planes src, dst;
    c.Make(src, c.pads);
    c.Make(dst, c.pads + 3);
    src.FillRandom(fuzz::Samples(c.seed));
    dst.Fill(0x5A);
    Planes& out = c.isInPlace ? src : dst;
    const std::vector<uint8_t> source = src.Snapshot();
    QZ_IMAGEPROC_PARAMSET p = {};
    p.u32CscType = c.chroma << 8;
    p.u32InWidth = c.width;
    p.u32InHeight = c.height;
    p.u32DeinterlaceMode = c.mode;
    Require(QZ_DeInterlace(&p, src.plane, src.stride, out.plane, out.stride) == 0,
            "planar pictures are taken");
    Require(c.isInPlace || src.Snapshot() == source, "the source stays as it was");
    return out.Snapshot();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    Bytes bytes(data, size);
    const Case c(bytes);
    fuzz::RequireSameBytes([&] { return Run(c); });
    return 0;
}
