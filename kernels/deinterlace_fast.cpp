// The `fast` mode: even lines stay, odd lines go through a five-tap filter across lines.

#include <algorithm>
#include <cstdlib>
#include <memory>

#include "kernels/deint_backend.h"
#include "kernels/deinterlace_plane.h"

namespace vidshow {
namespace {

struct Free {
    void operator()(uint8_t* block) const { std::free(block); }
};
using LineBuffer = std::unique_ptr<uint8_t, Free>;

bool Refuses(const DeinterlaceJob& job) {
    return job.chroma < kChroma420 || job.chroma > kChroma444 || job.width % 4 != 0 ||
           job.height % 4 != 0;
}

/// The lines of the filter whose middle is `line`; beyond the plane its edge is repeated.
struct Taps {
    Taps(const DeinterlacePlane& p, int32_t line)
        : a(p.source(std::max(line - 2, 0))),
          b(p.source(line - 1)),
          c(p.source(line)),
          d(p.source(std::min(line + 1, p.height - 1))),
          e(p.source(std::min(line + 2, p.height - 1))) {}
    const uint8_t *a, *b, *c, *d, *e;
};

// The columns that are filtered. The exported functions go by whole groups, at least one, and leave
// the last columns of other widths: clients rely on both.
int32_t Columns(const DeinterlacePlane& p, Reach reach) {
    if (reach == Reach::planes) return std::min(p.width, static_cast<int32_t>(p.lineBytes));
    return std::max(p.width / kFilterGroup, 1) * kFilterGroup;
}

void FilterPlane(const DeinterlacePlane& p, int32_t columns) {
    DeintBackend::Filter* const filter = ActiveDeintBackend().filter;
    for (int32_t line = 1; line < p.height; line += 2) {
        p.copy(line - 1, line - 1);
        const Taps t(p, line);
        filter(p.target(line), t.a, t.b, t.c, t.d, t.e, columns);
    }
}

/// `kept` holds the unfiltered line two lines above, which has been overwritten by then.
void FilterPlaneInPlace(const DeinterlacePlane& p, int32_t columns, uint8_t* kept) {
    DeintBackend::FilterInPlace* const filter = ActiveDeintBackend().filterInPlace;
    std::memcpy(kept, p.src, static_cast<size_t>(columns));
    for (int32_t line = 1; line < p.height; line += 2) {
        const Taps t(p, line);
        // The last line stands in for those below it, as it was before the filter goes over it.
        filter(kept, t.b, p.target(line), t.d, t.e, columns);
    }
}

}  // namespace

int32_t DeinterlaceFast(const DeinterlaceJob& job) {
    if (Refuses(job)) return -1;
    if (job.width <= 0 || job.height <= 0) return 0;
    LineBuffer kept;
    DeinterlacePlane p = {};
    int32_t width = job.width, height = job.height;
    for (int i = 0; i < 3; ++i) {
        // Chroma sizes are halved once, and stay so for the second chroma plane.
        if (i == 1 && job.chroma <= kChroma422) width /= 2;
        if (i == 1 && job.chroma == kChroma420) height /= 2;
        p = PlaneOf(job, i);
        if (p.isMissing()) continue;
        p.width = width;
        p.height = height;
        const int32_t columns = Columns(p, job.reach);
        if (!p.isInPlace()) {
            FilterPlane(p, columns);
            continue;
        }
        const int32_t bytes = std::max(job.width, kFilterGroup);
        if (!kept) kept.reset(static_cast<uint8_t*>(std::malloc(static_cast<size_t>(bytes))));
        if (!kept) return -1;
        FilterPlaneInPlace(p, columns, kept.get());
    }
    return 0;
}

}  // namespace vidshow
