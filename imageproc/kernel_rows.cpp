// The kernel of every conversion. The first row whose conditions hold serves the frame; decide here
// and nowhere else.

#include "imageproc/pipeline.h"
#include "imageproc/processor.h"
#include "vidshow/kernels.h"

namespace vidshow {
namespace {

// Conditions are sets: bit n stands for value n.
constexpr uint32_t Bit(uint32_t n) {
    return n < 32 ? 1u << n : 0;
}
template <typename... Rest>
constexpr uint32_t Only(Rest... values) {
    return (Bit(values) | ...);
}
constexpr uint32_t kAny = 0xFFFFFFFF;

constexpr uint32_t kUpright = Only(QZ_IMAGEPROC_ROTATE_NONE);
constexpr uint32_t kSameSize = Only(kCaseEqual);
constexpr uint32_t kPlain = Only(0u);

struct Row {
    uint32_t code;
    uint32_t rotations;
    uint32_t cases;
    uint32_t algorithms;
    uint32_t adjust;
    int32_t (*run)(const FrameJob& job);
};

// A kernel's own result is ignored.
constexpr int32_t Ran(int32_t /*kernelResult*/) {
    return kDone;
}

constexpr Row kRows[] = {
    {QZ_IMAGEPROC_CSC_YCBCR420_TO_YCBCR420, kUpright, kSameSize, kAny, kPlain,
     [](const FrameJob& f) { return Ran(_QZYCbCr420Copy(f.src, f.ss, f.w, f.h, f.dst, f.ds)); }},
};

bool Serves(const Row& row, const QZ_IMAGEPROC_PARAMSET& p) {
    const auto holds = [](uint32_t set, uint32_t value) {
        return set == kAny || (set & Bit(value));
    };
    return row.code == p.u32CscType && holds(row.rotations, p.u32RotationType) &&
           holds(row.cases, p.u32ResizeCase) && holds(row.algorithms, p.u32ResizeAlgorithm) &&
           holds(row.adjust, p.u32AdjustActive);
}

}  // namespace

int32_t RunKernel(const FrameJob& job) {
    for (const Row& row : kRows) {
        if (Serves(row, *job.p)) return row.run(job);
    }
    return kDone;
}

}  // namespace vidshow
