// The x mode: top lines stay; whether bottom lines stay too is decided for each 8 x 8 block, from
// this one picture.
//
// Two fields of one moment make neighbouring lines alike, more than lines two apart. Where things
// moved between the fields it is the other way round: lines of one field still go on from one
// another, and the fields stand like the teeth of two combs. A block's score is the difference of
// both, and it counts for the blocks around it, too, since motion seldom ends with a block:
//
//   frame  the block stays as it is, sample for sample: nothing of a still picture gets lost
//   field  its bottom lines are made anew, by the filter that `fast` puts everywhere; a sample that
//          lies between its neighbours above and below still counts, as it may well be right
//   merge  in between, and two blocks from a field: the average of both, so that a score on the
//          brink does not show
//
// Thresholds and weights were chosen by measurement, as was a filter that knows no direction: to
// look for edges among lines of one field went wrong more often than right. See
// docs/performance/quality-deinterlace.md.

#include <algorithm>

#include "kernels/deint_backend.h"
#include "kernels/deinterlace_plane.h"

namespace vidshow {
namespace {

constexpr int32_t kBlock = 8;

/// As the votes have it.
enum Choice : uint8_t { frame = 0, merge = 1, field = 2 };

/// Scores from which on a block is merged, or made anew: one and a half levels, and two, for each
/// sample of a block.
constexpr int kMergeFrom = 96;
constexpr int kFieldFrom = 128;

/// Wider pictures go in strips of so many columns, each on its own. It bounds what lies on the
/// stack.
constexpr int32_t kStrip = 4096;
constexpr int32_t kStripBlocks = kStrip / kBlock;

/// The five lines of the filter; what lies outside the picture is mirrored.
struct Taps {
    const uint8_t *a, *b, *c, *d, *e;
};

/// One bottom line by choice.
void MakeLine(const DeintBackend& ops, Choice choice, uint8_t* dst, const Taps& t, int32_t count) {
    if (choice == frame) {
        if (dst != t.c) std::memcpy(dst, t.c, static_cast<size_t>(count));
        return;
    }
    (choice == field ? ops.rebuild : ops.rebuildHalf)(dst, t.a, t.b, t.c, t.d, t.e, count);
}

/// What the blocks of one row say, as bits, with silent ones on both sides.
struct Votes {
    static constexpr uint8_t kMerge = 1, kField = 2;
    static constexpr int32_t kMargin = 8;
    uint8_t all[kMargin + kStripBlocks + kMargin];

    uint8_t* of(int32_t block) { return all + kMargin + block; }
};

uint64_t EightFrom(const uint8_t* votes) {
    uint64_t word;
    std::memcpy(&word, votes, sizeof word);
    return word;
}

constexpr uint64_t kMergeBits = 0x0101010101010101 * Votes::kMerge;
constexpr uint64_t kFieldBits = 0x0101010101010101 * Votes::kField;

/// Neighbouring blocks of one choice.
struct Run {
    int32_t x;
    int32_t columns;
    Choice choice;
};

/// Columns of a plane, at most `kStrip`.
class Strip {
  public:
    explicit Strip(const DeinterlacePlane& plane)
        : m_plane(plane),
          m_blocks((plane.width + kBlock - 1) / kBlock),
          m_rows((plane.height + kBlock - 1) / kBlock) {
        std::memset(m_votes, 0, sizeof m_votes);
        std::memset(&m_near, 0, sizeof m_near);
        std::memset(&m_far, 0, sizeof m_far);
    }

    void run() {
        vote(0);
        vote(1);
        // Rows below are looked at before this one is written, which may be in the same place.
        for (int32_t row = 0; row < m_rows; ++row) {
            vote(row + 2);
            choose(row);
            write(row);
        }
    }

  private:
    Votes& votes(int32_t row) { return m_votes[(row + kRows) % kRows]; }

    // Rows beyond the picture are silent, and so is one that is too narrow to judge by.
    void vote(int32_t row) {
        uint8_t* const out = votes(row).of(0);
        std::memset(out, 0, static_cast<size_t>(m_blocks));
        if (row >= m_rows || m_plane.width < kBlock || m_plane.height < 3) return;
        uint16_t scores[kStripBlocks];
        score(row, scores);
        for (int32_t i = 0; i < m_blocks; ++i) {
            const int merges = scores[i] >= kMergeFrom, makes = scores[i] >= kFieldFrom;
            out[i] = static_cast<uint8_t>(merges * Votes::kMerge + makes * Votes::kField);
        }
    }

    // A block's lines and the two below it; near the lower edge of the picture, the last ones that
    // there are. Lines of rows that are written already are out of bounds.
    void score(int32_t row, uint16_t* scores) const {
        const int32_t first =
            std::max({0, (row - 1) * kBlock, std::min(row * kBlock, m_plane.height - 2 - kBlock)});
        const int32_t lines = std::min(kBlock, m_plane.height - 2 - first);
        const int32_t whole = m_plane.width / kBlock;
        const uint8_t* const start = m_plane.source(first);
        m_ops.scores(start, m_plane.srcPitch, whole, lines, scores);
        if (whole < m_blocks) {  // the last columns, with their neighbours to the left
            m_ops.scores(start + m_plane.width - kBlock, m_plane.srcPitch, 1, lines,
                         scores + whole);
        }
    }

    // Three rows and columns around a block count in full, five to say that fields are near. Eight
    // blocks at once: rows first, then across.
    void choose(int32_t row) {
        for (int32_t i = 0; i < m_blocks; i += 8) {
            const auto of = [&](int32_t by) { return EightFrom(votes(row + by).of(i)); };
            const uint64_t near = of(-1) | of(0) | of(1), far = of(-2) | near | of(2);
            std::memcpy(m_near.of(i), &near, sizeof near);
            std::memcpy(m_far.of(i), &far, sizeof far);
        }
        for (int32_t i = 0; i < m_blocks; i += 8) {
            uint64_t near = 0, far = 0;
            for (int32_t by = -1; by <= 1; ++by)
                near |= EightFrom(m_near.of(i + by));
            for (int32_t by = -2; by <= 2; ++by)
                far |= EightFrom(m_far.of(i + by));
            const uint64_t makes = near & kFieldBits;
            const uint64_t merges = (near & kMergeBits) | (far & kFieldBits) >> 1;
            const uint64_t choices = makes | (merges & ~(makes >> 1));
            std::memcpy(m_choices + i, &choices, sizeof choices);
        }
        findRuns();
    }

    // Blocks of one choice go together, whatever their number.
    void findRuns() {
        m_runs = 0;
        for (int32_t block = 0; block < m_blocks;) {
            const int32_t first = block;
            const uint8_t choice = m_choices[first];
            while (block < m_blocks && m_choices[block] == choice)
                ++block;
            const int32_t x = first * kBlock;
            m_run[m_runs++] = {x, std::min(block * kBlock, m_plane.width) - x,
                               static_cast<Choice>(choice)};
        }
    }

    void write(int32_t row) {
        const int32_t end = std::min((row + 1) * kBlock, m_plane.height);
        for (int32_t line = row * kBlock; line < end; ++line) {
            if (line % 2 == 0) {
                copyLine(line);
            } else {
                makeLine(line);
            }
        }
    }

    void copyLine(int32_t line) const {
        uint8_t* const to = m_plane.target(line);
        const uint8_t* const from = m_plane.source(line);
        if (to != from) std::memcpy(to, from, static_cast<size_t>(m_plane.width));
    }

    void makeLine(int32_t line) {
        const Taps t = tapsOf(line);
        for (int32_t i = 0; i < m_runs; ++i) {
            const int32_t x = m_run[i].x;
            MakeLine(m_ops, m_run[i].choice, m_plane.target(line) + x,
                     {t.a + x, t.b + x, t.c + x, t.d + x, t.e + x}, m_run[i].columns);
        }
    }

    Taps tapsOf(int32_t line) {
        const bool first = line < 2, last = line + 2 >= m_plane.height;
        Taps t = {};
        t.c = m_plane.source(line);
        t.b = m_plane.source(line - 1);
        t.d = line + 1 < m_plane.height ? m_plane.source(line + 1) : t.b;
        t.e = last ? nullptr : m_plane.source(line + 2);
        t.a = first ? nullptr : m_plane.source(line - 2);
        if (m_plane.isInPlace()) keepLine(line, t);
        if (t.a == nullptr) t.a = t.e != nullptr ? t.e : t.c;
        if (t.e == nullptr) t.e = t.a;
        return t;
    }

    // In place, the bottom line above has been made anew by now: it is taken from a copy.
    void keepLine(int32_t line, Taps& t) {
        uint8_t* const now = m_kept[line / 2 % 2];
        std::memcpy(now, t.c, static_cast<size_t>(m_plane.width));
        if (t.a != nullptr) t.a = m_kept[(line / 2 + 1) % 2];
    }

    static constexpr int32_t kRows = 5;

    const DeintBackend& m_ops = ActiveDeintBackend();
    DeinterlacePlane m_plane;
    int32_t m_blocks;
    int32_t m_rows;
    Votes m_votes[kRows];
    Votes m_near, m_far;  // of three and of five rows together
    uint8_t m_choices[kStripBlocks];
    Run m_run[kStripBlocks];
    int32_t m_runs = 0;
    uint8_t m_kept[2][kStrip];
};

void MakePlane(const DeinterlacePlane& plane) {
    for (int32_t x = 0; x < plane.width; x += kStrip) {
        DeinterlacePlane strip = plane;
        strip.src += x;
        strip.dst += x;
        strip.width = std::min(plane.width - x, kStrip);
        Strip(strip).run();
    }
}

/// Lines and columns that begin at a top line, with what can be read around them.
struct Area {
    uint8_t* dst;
    intptr_t dstPitch;
    const uint8_t* src;
    intptr_t srcPitch;
    int32_t width;
    int32_t height;
};

// Lines beyond `above` and `below` are mirrored.
int32_t MakeArea(Choice choice, const Area& area, int32_t above, int32_t below) {
    const DeintBackend& ops = ActiveDeintBackend();
    for (int32_t y = 0; y < area.height; ++y) {
        const uint8_t* const line = area.src + area.srcPitch * y;
        uint8_t* const to = area.dst + area.dstPitch * y;
        const bool bottom = y % 2 != 0;
        const auto at = [&](int32_t by) { return line + area.srcPitch * by; };
        const auto has = [&](int32_t by) {
            return y + by >= -above && y + by < area.height + below;
        };
        Taps t = {line, line, line, line, line};
        if (bottom) {
            t.b = at(-1);
            t.d = has(1) ? at(1) : t.b;
            t.a = has(-2) ? at(-2) : has(2) ? at(2) : line;
            t.e = has(2) ? at(2) : t.a;
        }
        MakeLine(ops, bottom ? choice : frame, to, t, area.width);
    }
    return 0;
}

constexpr int32_t kAll = 2;  // lines around an area that the filter can ask for

}  // namespace

int32_t DeinterlaceX(const DeinterlaceJob& job) {
    if (job.chroma < kChroma420 || job.chroma > kChroma444) return 0;
    for (int i = 0; i < 3; ++i) {
        DeinterlacePlane plane = SizedPlaneOf(job, i);
        if (plane.isMissing() || plane.height <= 0) continue;
        if (job.reach == Reach::planes) {
            plane.width = std::min(plane.width, static_cast<int32_t>(plane.lineBytes));
        }
        MakePlane(plane);
    }
    return 0;
}

}  // namespace vidshow

using namespace vidshow;

extern "C" {

int32_t XDeintNxNDetect(const uint8_t* src, int32_t pitch, int32_t w, int32_t h) {
    int32_t highest = 0;
    for (int32_t y = 0; y < h; y += kBlock) {
        for (int32_t x = 0; x < w; x += kBlock) {
            uint16_t score = 0;
            ActiveDeintBackend().scores(src + intptr_t{pitch} * y + x, static_cast<size_t>(pitch),
                                        1, kBlock, &score);
            highest = std::max(highest, int32_t{score});
        }
    }
    return highest;
}
int32_t XDeint8x8Detect(const uint8_t* src, int32_t pitch) {
    return XDeintNxNDetect(src, pitch, kBlock, kBlock);
}

int32_t XDeintNxNFrame(uint8_t* dst, int32_t dstPitch, const uint8_t* src, int32_t srcPitch,
                       int32_t w, int32_t h) {
    return MakeArea(frame, {dst, dstPitch, src, srcPitch, w, h}, kAll, kAll);
}
int32_t XDeintNxNField(uint8_t* dst, int32_t dstPitch, const uint8_t* src, int32_t srcPitch,
                       int32_t w, int32_t h) {
    return MakeArea(field, {dst, dstPitch, src, srcPitch, w, h}, kAll, kAll);
}
int32_t XDeint8x8Field(uint8_t* dst, int32_t dstPitch, const uint8_t* src, int32_t srcPitch) {
    return MakeArea(field, {dst, dstPitch, src, srcPitch, kBlock, kBlock}, kAll, kAll);
}
int32_t XDeint8x8FieldE(uint8_t* dst, int32_t dstPitch, const uint8_t* src, int32_t srcPitch,
                        int32_t above, int32_t below) {
    return MakeArea(field, {dst, dstPitch, src, srcPitch, kBlock, kBlock}, above, below);
}
int32_t XDeint8x8Merge(uint8_t* dst, int32_t dstPitch, const uint8_t* src, int32_t srcPitch) {
    return MakeArea(merge, {dst, dstPitch, src, srcPitch, kBlock, kBlock}, kAll, kAll);
}

}  // extern "C"
