// The x mode: top lines stay; whether bottom lines stay too is decided for each 8 x 8 block, from
// this one picture.
//
// Two fields of one moment make neighbouring lines alike, more than lines two apart. Where things
// moved between the fields it is the other way round: lines of one field still go on from one
// another, and the fields stand like the teeth of two combs. A block's score is the difference of
// both; the highest of the block and its eight neighbours decides, since motion seldom ends with a
// block. Then
//
//   frame  the block stays as it is, sample for sample: nothing of a still picture gets lost
//   field  its bottom lines are made anew, by the filter that `fast` puts everywhere
//   merge  in between, the average of both, so that a score on the brink does not show
//
// Thresholds and weights were chosen by measurement: docs/performance/quality-deinterlace.md.

#include <algorithm>

#include "kernels/deinterlace_lines.h"
#include "kernels/deinterlace_plane.h"

namespace vidshow {
namespace {

enum Choice : uint8_t { frame, merge, field };

/// Scores from which on a block is merged, or made anew: three quarters of a level, and not quite
/// two levels, for each sample of a block on either side of a line.
constexpr int kMergeFrom = 96;
constexpr int kFieldFrom = 240;

/// Wider pictures go in strips of so many columns, each on its own. It bounds what lies on the
/// stack.
constexpr int32_t kStrip = 4096;
constexpr int32_t kStripBlocks = kStrip / kBlock;

/// The five lines of the filter around `line`; what lies outside the picture is mirrored.
struct Taps {
    const uint8_t *a, *b, *c, *d, *e;
};

/// One bottom line by choice.
void MakeLine(Choice choice, uint8_t* dst, const Taps& t, int32_t count) {
    const size_t bytes = static_cast<size_t>(count);
    switch (choice) {
        case frame:
            if (dst != t.c) std::memcpy(dst, t.c, bytes);
            break;
        case merge:
            FilterHalfLine(dst, t.a, t.b, t.c, t.d, t.e, count);
            break;
        case field:
            FilterLine(dst, t.a, t.b, t.c, t.d, t.e, count);
            break;
    }
}

/// Columns of a plane, at most `kStrip`.
class Strip {
  public:
    explicit Strip(const DeinterlacePlane& plane)
        : m_plane(plane), m_blocks((plane.width + kBlock - 1) / kBlock) {}

    void run() {
        const int32_t rows = (m_plane.height + kBlock - 1) / kBlock;
        score(0);
        // The row below is looked at before this one is written, which may be in the same place.
        for (int32_t row = 0; row < rows; ++row) {
            if (row + 1 < rows) score(row + 1);
            choose(row, rows);
            write(row);
        }
    }

  private:
    uint16_t* scores(int32_t row) { return m_scores[row % 3] + 1; }

    // A block's lines and the two below it; near the lower edge of the picture, the last ones that
    // there are. Lines of rows that are written already are out of bounds.
    void score(int32_t row) {
        const int32_t first =
            std::max({0, (row - 1) * kBlock, std::min(row * kBlock, m_plane.height - 2 - kBlock)});
        const int32_t lines = std::min(kBlock, m_plane.height - 2 - first);
        uint16_t* const out = scores(row);
        std::fill(out, out + m_blocks, uint16_t{0});
        if (m_plane.width < kBlock) return;  // too little to judge by: it stays
        const size_t pitch = m_plane.srcPitch;
        const int32_t whole = m_plane.width / kBlock;
        CombScores(m_plane.source(first), pitch, whole, lines, out);
        if (whole < m_blocks) {  // the last columns, with their neighbours to the left
            CombScores(m_plane.source(first) + m_plane.width - kBlock, pitch, 1, lines,
                       out + whole);
        }
    }

    void choose(int32_t row, int32_t rows) {
        const uint16_t* const here = scores(row);
        const uint16_t* const above = row > 0 ? scores(row - 1) : here;
        const uint16_t* const below = row + 1 < rows ? scores(row + 1) : here;
        uint16_t highest[kStripBlocks + 2] = {};
        for (int32_t i = 0; i < m_blocks; ++i)
            highest[i + 1] = std::max({above[i], here[i], below[i]});
        for (int32_t i = 0; i < m_blocks; ++i) {
            const int score = std::max({highest[i], highest[i + 1], highest[i + 2]});
            m_choices[i] = score < kMergeFrom ? frame : score < kFieldFrom ? merge : field;
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

    // Blocks of one choice go together, whatever their number.
    void makeLine(int32_t line) {
        const Taps whole = tapsOf(line);
        for (int32_t block = 0; block < m_blocks;) {
            const int32_t first = block;
            const Choice choice = m_choices[first];
            while (block < m_blocks && m_choices[block] == choice)
                ++block;
            const int32_t x = first * kBlock;
            const int32_t count = std::min(block * kBlock, m_plane.width) - x;
            const Taps t = {whole.a + x, whole.b + x, whole.c + x, whole.d + x, whole.e + x};
            MakeLine(choice, m_plane.target(line) + x, t, count);
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

    DeinterlacePlane m_plane;
    int32_t m_blocks;
    Choice m_choices[kStripBlocks];
    uint16_t m_scores[3][kStripBlocks + 2];
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
        MakeLine(bottom ? choice : frame, to, t, area.width);
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
            CombScores(src + intptr_t{pitch} * y + x, static_cast<size_t>(pitch), 1, kBlock,
                       &score);
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
