#pragma once

// Tiles of pixels that stay in registers from load to store.
//
// The rows of a tile lie one after the other in a few 16-byte vectors. One round of interleaving
// the first half of them with the second moves the highest bit of a pixel's number (row, column) to
// the lowest place, so as many rounds as the row has bits exchange row and column. The vector types
// are the compiler's own, so that one source becomes NEON, SSE2 or plain code.

#include <cstdint>
#include <cstring>
#include <utility>

#if defined(__ARM_NEON)
#include <arm_neon.h>
#endif

namespace vidshow {

constexpr int kVectorBytes = 16;

/// Moves to another row. On ARM, where the compiler would work out the addresses of all rows and
/// run out of registers for them, it does not see how.
template <typename Byte>
inline void Step(Byte*& row, intptr_t bytes) {
    row += bytes;
#if defined(__ARM_NEON)
    __asm__("" : "+r"(row));
#endif
}

/// Lanes kFirst, kFirst + 1, ... of a and of b by turns.
template <int kFirst, typename Vector, int... kLane>
inline Vector Interleave(Vector a, Vector b, std::integer_sequence<int, kLane...>) {
    constexpr int kLanes = sizeof...(kLane);
    return __builtin_shufflevector(a, b, (kFirst + kLane / 2 + kLane % 2 * kLanes)...);
}

/// A tile of kRows x kColumns pixels, powers of two; kColumns x kRows once it is transposed. Rows
/// of 8 bytes share a vector; those of 16 fill it.
template <typename Pixel, int kRows, int kColumns = kRows>
class Tile {
  public:
    typedef Pixel Vector __attribute__((vector_size(kVectorBytes)));

    /// @param step bytes from a row to the next, negative to load from the last row upwards
    void Load(const uint8_t* row, intptr_t step) {
        for (Vector& vector : m_vector) {
            const Loaded first = *reinterpret_cast<const Loaded*>(row);
            Step(row, step);
            if constexpr (kLoadedPerVector == 1) {
                vector = first;
            } else {
                vector = Join(first, *reinterpret_cast<const Loaded*>(row), kLaneNumbers);
                Step(row, step);
            }
        }
    }

    void Transpose() {
        for (int round = 1; round < kRows; round *= 2) {
            Vector next[kVectors];
            for (unsigned i = 0; i < kVectors / 2; ++i) {
                const Vector a = m_vector[i], b = m_vector[i + kVectors / 2];
                next[2 * i] = Interleave<0>(a, b, kLaneNumbers);
                next[2 * i + 1] = Interleave<kLanes / 2>(a, b, kLaneNumbers);
            }
            std::memcpy(m_vector, next, sizeof next);
        }
    }

    /// Of the transposed tile. @param step as of `Load`
    void Store(uint8_t* row, intptr_t step) const {
        for (const Vector& vector : m_vector) {
            Stored part[kVectorBytes / sizeof(Stored)];
            std::memcpy(part, &vector, kVectorBytes);
            for (const Stored& one : part) {
                *reinterpret_cast<Stored*>(row) = one;
                Step(row, step);
            }
        }
    }

    /// Row i, where a row fills a vector.
    Vector& operator[](int i) {
        static_assert(kLoadedPerVector == 1, "a vector is a row");
        return m_vector[i];
    }

  private:
    static constexpr int kLanes = kVectorBytes / static_cast<int>(sizeof(Pixel));
    static constexpr int kLoadedBytes = kColumns * static_cast<int>(sizeof(Pixel));
    static constexpr int kStoredBytes = kRows * static_cast<int>(sizeof(Pixel));
    static constexpr int kLoadedPerVector = kVectorBytes / kLoadedBytes;
    static constexpr unsigned kVectors = kRows / kLoadedPerVector;
    static constexpr auto kLaneNumbers = std::make_integer_sequence<int, kLanes>();

    typedef Pixel Loaded __attribute__((vector_size(kLoadedBytes), aligned(1), may_alias));
    typedef Pixel Stored __attribute__((vector_size(kStoredBytes), aligned(1), may_alias));

    template <int... kLane>
    static Vector Join(Loaded a, Loaded b, std::integer_sequence<int, kLane...>) {
#if defined(__ARM_NEON)
        // The halves of a register load alone; a shuffle would become table look-ups here.
        return reinterpret_cast<Vector>(
            vcombine_u8(reinterpret_cast<uint8x8_t>(a), reinterpret_cast<uint8x8_t>(b)));
#else
        return __builtin_shufflevector(a, b, kLane...);
#endif
    }

    Vector m_vector[kVectors];
};

/// Turns rows to columns that lie next to each other, in tiles of kRows x kColumns, going down each
/// column of tiles before the next, so that what is stored grows by the tile and not by the pixel.
/// Parts of a tile are turned as whole ones.
/// @param to     of the first pixel
/// @param across from there to the next pixel of its row, any number of bytes
/// @param down   to the pixel of the next row: a pixel's size, or that backwards
template <typename Pixel, int kRows, int kColumns>
void TurnTiles(uint8_t* to, intptr_t across, intptr_t down, const uint8_t* from, intptr_t stride,
               intptr_t columns, intptr_t rows) {
    // A tile's own rows go next to each other in the order in which they are loaded.
    const bool upwards = down < 0;
    const intptr_t step = upwards ? -stride : stride;
    if (upwards) {
        from += (kRows - 1) * stride;
        to += (kRows - 1) * down;
    }
    for (intptr_t x = 0; x < columns; x += kColumns) {
        const uint8_t* row = from + x * static_cast<intptr_t>(sizeof(Pixel));
        uint8_t* at = to + x * across;
        for (intptr_t y = 0; y < rows; y += kRows) {
            Tile<Pixel, kRows, kColumns> tile;
            tile.Load(row, step);
            tile.Transpose();
            tile.Store(at, across);
            row += kRows * stride;
            at += kRows * down;
        }
    }
}

}  // namespace vidshow
