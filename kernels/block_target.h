#pragma once

// Where the pixels of a 2 x 2 block go: two rows of a packed picture, or the four places that a
// rotation walker names. A kernel fills a pair of rows block by block, left to right, through a
// copy of the target, and moves the target itself from pair to pair.

#include "kernels/rgb_formats.h"
#include "vidshow/kernels.h"

namespace vidshow {

/// The four pixels of a block.
struct Block {
    uint32_t topLeft;
    uint32_t topRight;
    uint32_t bottomLeft;
    uint32_t bottomRight;
};

/// Rows of a packed picture, one stride apart.
template <int kBytes>
class RowTarget {
  public:
    RowTarget(void* dst, uint32_t stride)
        : m_row(static_cast<uint8_t*>(dst)), m_at(m_row), m_stride(stride) {}

    void Put(const Block& b) {
        StorePair<kBytes>(m_at, b.topLeft, b.topRight);
        StorePair<kBytes>(m_at + m_stride, b.bottomLeft, b.bottomRight);
        m_at += 2 * kBytes;
    }

    void NextRows() {
        m_row += 2 * m_stride;
        m_at = m_row;
    }

  private:
    uint8_t* m_row;
    uint8_t* m_at;
    size_t m_stride;
};

/// The turned or mirrored picture behind a rotation walker. The four places keep their distances,
/// so one offset moves them all.
template <int kBytes>
class WalkerTarget {
  public:
    explicit WalkerTarget(const QZ_ROTATION_WALKER& w)
        : m_across(w.word[0]),
          m_down(w.word[1]),
          m_topLeft(w.word[2]),
          m_topRight(w.word[3]),
          m_bottomLeft(w.word[4]),
          m_bottomRight(w.word[5]) {}

    void Put(const Block& b) {
        StorePixel<kBytes>(Place(m_topLeft), b.topLeft);
        StorePixel<kBytes>(Place(m_topRight), b.topRight);
        StorePixel<kBytes>(Place(m_bottomLeft), b.bottomLeft);
        StorePixel<kBytes>(Place(m_bottomRight), b.bottomRight);
        m_offset += m_across;
    }

    void NextRows() {
        m_rowOffset += m_down;
        m_offset = m_rowOffset;
    }

  private:
    void* Place(intptr_t start) const { return reinterpret_cast<void*>(start + m_offset); }

    intptr_t m_across;
    intptr_t m_down;
    intptr_t m_topLeft;
    intptr_t m_topRight;
    intptr_t m_bottomLeft;
    intptr_t m_bottomRight;
    intptr_t m_rowOffset = 0;
    intptr_t m_offset = 0;
};

/// The walker of a processor, or null.
inline const QZ_ROTATION_WALKER* WalkerOf(const QZ_IMAGEPROC_PARAMSET* p) {
    return static_cast<const QZ_ROTATION_WALKER*>(p->pWalker);
}

}  // namespace vidshow
