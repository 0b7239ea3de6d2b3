#pragma once

// Square tiles of pixels that stay in registers from load to store.
//
// A tile of B rows by B pixels lies in a few 16-byte vectors. One round of interleaving its first
// half with its second moves the highest bit of a pixel's number (row, column) to the lowest place,
// so log2(B) rounds exchange row and column. The vector types are the compiler's own, so that one
// source becomes NEON, SSE2 or plain code.

#include <cstdint>
#include <cstring>
#include <utility>

namespace vidshow {

constexpr int kVectorBytes = 16;

/// Lanes kFirst, kFirst + 1, ... of a and of b by turns.
template <int kFirst, typename Vector, int... kLane>
inline Vector Interleave(Vector a, Vector b, std::integer_sequence<int, kLane...>) {
    constexpr int kLanes = sizeof...(kLane);
    return __builtin_shufflevector(a, b, (kFirst + kLane / 2 + kLane % 2 * kLanes)...);
}

/// A square of kSize x kSize pixels. Two rows of 8 bytes share a vector; one of 16 fills it.
template <typename Pixel, int kSize>
class Tile {
  public:
    typedef Pixel Vector __attribute__((vector_size(kVectorBytes)));

    /// @param step bytes from a row to the next, negative to load from the last row upwards
    void Load(const uint8_t* row, intptr_t step) {
        for (Vector& vector : m_vector) {
            if constexpr (kRowsPerVector == 1) {
                vector = *reinterpret_cast<const Row*>(row);
            } else {
                vector = Join(*reinterpret_cast<const Row*>(row),
                              *reinterpret_cast<const Row*>(row + step), kLaneNumbers);
            }
            row += kRowsPerVector * step;
        }
    }

    void Transpose() {
        for (int round = 1; round < kSize; round *= 2) {
            Vector next[kVectors];
            for (unsigned i = 0; i < kVectors / 2; ++i) {
                const Vector a = m_vector[i], b = m_vector[i + kVectors / 2];
                next[2 * i] = Interleave<0>(a, b, kLaneNumbers);
                next[2 * i + 1] = Interleave<kLanes / 2>(a, b, kLaneNumbers);
            }
            std::memcpy(m_vector, next, sizeof next);
        }
    }

    void Store(uint8_t* row, intptr_t step) const {
        for (const Vector& vector : m_vector) {
            Row part[kVectorBytes / sizeof(Row)];
            std::memcpy(part, &vector, kVectorBytes);
            for (const Row& one : part) {
                *reinterpret_cast<Row*>(row) = one;
                row += step;
            }
        }
    }

    /// Row i, where a row fills a vector.
    Vector& operator[](int i) {
        static_assert(kRowsPerVector == 1, "a vector is a row");
        return m_vector[i];
    }

  private:
    static constexpr int kLanes = kVectorBytes / static_cast<int>(sizeof(Pixel));
    static constexpr int kRowBytes = kSize * static_cast<int>(sizeof(Pixel));
    static constexpr int kRowsPerVector = kVectorBytes / kRowBytes;
    static constexpr unsigned kVectors = kSize / kRowsPerVector;
    static constexpr auto kLaneNumbers = std::make_integer_sequence<int, kLanes>();

    typedef Pixel Row __attribute__((vector_size(kRowBytes), aligned(1), may_alias));

    template <int... kLane>
    static Vector Join(Row a, Row b, std::integer_sequence<int, kLane...>) {
#if defined(__ARM_NEON)
        // The halves of a register load alone; a shuffle would become table look-ups here.
        const Row rows[2] = {a, b};
        Vector both;
        std::memcpy(&both, rows, sizeof both);
        return both;
#else
        return __builtin_shufflevector(a, b, kLane...);
#endif
    }

    Vector m_vector[kVectors];
};

}  // namespace vidshow
