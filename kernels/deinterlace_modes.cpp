// The modes that copy and average whole lines: discard, bob, blend, mean and linear. They differ in
// one function over a plane.

#include "kernels/deinterlace_plane.h"

namespace vidshow {
namespace {

using Merge = int32_t(uint8_t* dst, const uint8_t* a, const uint8_t* b, int32_t count);

struct LineWork {
    DeinterlacePlane plane;
    int32_t field;
    Merge* merge;

    void mergeTo(int32_t to, int32_t a, int32_t b) const {
        merge(plane.target(to), plane.source(a), plane.source(b),
              static_cast<int32_t>(plane.lineBytes));
    }
};

bool InEights(const QZ_PICTURE& picture) {
    uintptr_t all = 0;
    for (int i = 0; i < 3; ++i)
        all |= reinterpret_cast<uintptr_t>(picture.plane[i]) | picture.pitch[i];
    return all % 8 == 0;
}

// `MergeNeon` spills over the line's end. Nobody asked for less sees it gone: clients rely on it.
Merge* ChooseMerge(const DeinterlaceJob& job) {
    if (job.reach == Reach::planes) return MergeGeneric;
    return InEights(*job.src) && InEights(*job.dst) ? MergeNeon : MergeGeneric;
}

/// The last pair of lines stays as it is, and with the bottom field kept, so does line 0: there,
/// the other field lacks a neighbour. `between` makes the line behind a kept one.
template <typename Between>
void KeepField(const LineWork& work, Between between) {
    const DeinterlacePlane& p = work.plane;
    int32_t line = 0;
    if (work.field != 0) p.copy(line++, 0);
    for (; p.height - line > 2; line += 2) {
        p.copy(line, line);
        between(line);
    }
    p.copy(line, line);
    if (work.field == 0) p.copy(line + 1, line + 1);
}

void Linear(const LineWork& work) {
    KeepField(work, [&](int32_t line) { work.mergeTo(line + 1, line, line + 2); });
}

void Bob(const LineWork& work) {
    KeepField(work, [&](int32_t line) { work.plane.copy(line + 1, line); });
}

void Discard(const LineWork& work) {
    const DeinterlacePlane& p = work.plane;
    for (int32_t line = 0; line < p.height; ++line) {
        int32_t kept = line / 2 * 2 + (work.field != 0 ? 1 : 0);
        while (kept >= p.height)
            kept -= kept >= 2 ? 2 : 1;  // an odd height ends with a line of the other field
        p.copy(line, kept);
    }
}

void Blend(const LineWork& work) {
    const DeinterlacePlane& p = work.plane;
    p.copy(0, 0);
    // Lines without a gap between them are one long line, unless each spills over the next.
    // In place, each has to be written before the next is read, so none is shorter than a step.
    constexpr size_t kLongestStep = 64;
    const bool gapless = p.srcPitch == p.lineBytes && p.dstPitch == p.lineBytes;
    if (gapless && p.lineBytes >= kLongestStep && work.merge == MergeGeneric && p.height > 1) {
        const size_t bytes = p.lineBytes * static_cast<size_t>(p.height - 1);
        if (bytes <= INT32_MAX) {
            MergeGeneric(p.target(1), p.source(0), p.source(1), static_cast<int32_t>(bytes));
            return;
        }
    }
    for (int32_t line = 1; line < p.height; ++line)
        work.mergeTo(line, line - 1, line);
}

void Mean(const LineWork& work) {
    const int32_t last = work.plane.height - 1;
    for (int32_t line = 0; line <= last; line += 2) {
        work.mergeTo(line, line, line < last ? line + 1 : last);
        work.plane.copy(line + 1, work.plane.target(line));
    }
}

using Mode = void(const LineWork& work);

int32_t RunPlanes(const DeinterlaceJob& job, int32_t lastChroma, Mode* mode) {
    if (job.chroma < kChroma420 || job.chroma > lastChroma) return 0;
    Merge* const merge = ChooseMerge(job);
    for (int i = 0; i < 3; ++i) {
        const LineWork work = {SizedPlaneOf(job, i), job.field, merge};
        if (!work.plane.isMissing()) mode(work);
    }
    return 0;
}

void CopyPlane(const LineWork& work) {
    for (int32_t line = 0; line < work.plane.height; ++line)
        work.plane.copy(line, line);
}

// These modes know no 4:4:4. Where nothing may stay unwritten, such a picture passes through.
int32_t RunSubsampled(const DeinterlaceJob& job, Mode* mode) {
    if (job.reach == Reach::planes && job.chroma == kChroma444) {
        return RunPlanes(job, kChroma444, CopyPlane);
    }
    return RunPlanes(job, kChroma422, mode);
}

}  // namespace

int32_t DeinterlaceLinear(const DeinterlaceJob& job) {
    return RunPlanes(job, kChroma444, Linear);
}
int32_t DeinterlaceBob(const DeinterlaceJob& job) {
    return RunSubsampled(job, Bob);
}
int32_t DeinterlaceDiscard(const DeinterlaceJob& job) {
    return RunSubsampled(job, Discard);
}
int32_t DeinterlaceBlend(const DeinterlaceJob& job) {
    return RunSubsampled(job, Blend);
}
int32_t DeinterlaceMean(const DeinterlaceJob& job) {
    return RunSubsampled(job, Mean);
}

}  // namespace vidshow
