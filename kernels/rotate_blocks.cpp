// Turns of whole planes in square tiles that stay in registers from load to store.
//
// A tile of B rows by B pixels lies in a few 16-byte vectors. One round of interleaving its first
// half with its second moves the highest bit of a pixel's number (row, column) to the lowest place,
// so log2(B) rounds exchange row and column. A quarter turn is that transpose with the rows loaded,
// or stored, in reverse order. The vector types are the compiler's own, so that one source becomes
// NEON, SSE2 or plain code.

#include <cstring>
#include <utility>

#include "vidshow/kernels.h"

namespace {

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

  private:
    static constexpr int kLanes = kVectorBytes / static_cast<int>(sizeof(Pixel));
    static constexpr int kRowBytes = kSize * static_cast<int>(sizeof(Pixel));
    static constexpr int kRowsPerVector = kVectorBytes / kRowBytes;
    static constexpr unsigned kVectors = kSize / kRowsPerVector;
    static constexpr auto kLaneNumbers = std::make_integer_sequence<int, kLanes>();

    typedef Pixel Vector __attribute__((vector_size(kVectorBytes)));
    typedef Pixel Row __attribute__((vector_size(kRowBytes), aligned(1), may_alias));

    template <int... kLane>
    static Vector Join(Row a, Row b, std::integer_sequence<int, kLane...>) {
#if defined(__ARM_NEON)
        // The halves of a register load alone; as a shuffle the compiler makes table look-ups of
        // it.
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

enum class Turn { clockwise, anticlockwise, half };

/// Bytes only: a row of the tile is one word, and reversing its bytes reverses the pixels.
void HalfTurnTile(const uint8_t* src, intptr_t ss, uint8_t* dst, intptr_t ds) {
    constexpr intptr_t kRows = sizeof(uint64_t);
    for (intptr_t i = 0; i < kRows; ++i) {
        uint64_t row;
        std::memcpy(&row, src + i * ss, sizeof row);
        row = __builtin_bswap64(row);
        std::memcpy(dst + (kRows - 1 - i) * ds, &row, sizeof row);
    }
}

template <typename Pixel, int kSize, Turn kTurn>
void TurnTile(const uint8_t* src, intptr_t ss, uint8_t* dst, intptr_t ds) {
    if constexpr (kTurn == Turn::half) {
        static_assert(sizeof(Pixel) == 1 && kSize == 8, "the only half turn there is");
        HalfTurnTile(src, ss, dst, ds);
    } else {
        constexpr intptr_t kLast = kSize - 1;
        constexpr bool kClockwise = kTurn == Turn::clockwise;
        Tile<Pixel, kSize> tile;
        tile.Load(kClockwise ? src + kLast * ss : src, kClockwise ? -ss : ss);
        tile.Transpose();
        tile.Store(kClockwise ? dst : dst + kLast * ds, kClockwise ? ds : -ds);
    }
}

template <typename Pixel, int kSize, Turn kTurn>
int32_t TurnPlane(const uint8_t* src, intptr_t ss, uint8_t* dst, intptr_t ds, intptr_t w,
                  intptr_t h) {
    constexpr intptr_t kBytes = sizeof(Pixel);
    for (intptr_t y = 0; y < h; y += kSize) {
        for (intptr_t x = 0; x < w; x += kSize) {
            // Negative for a tile that overhangs to the left or above.
            const intptr_t fromRight = w - kSize - x, fromBottom = h - kSize - y;
            const intptr_t column = kTurn == Turn::clockwise       ? fromBottom
                                    : kTurn == Turn::anticlockwise ? y
                                                                   : fromRight;
            const intptr_t row = kTurn == Turn::clockwise       ? x
                                 : kTurn == Turn::anticlockwise ? fromRight
                                                                : fromBottom;
            TurnTile<Pixel, kSize, kTurn>(src + y * ss + x * kBytes, ss,
                                          dst + row * ds + column * kBytes, ds);
        }
    }
    return 0;
}

}  // namespace

extern "C" {

int32_t QZ_ImageRotate_90C_u8(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                              int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint8_t, 8, Turn::clockwise>(src, srcStride, dst, dstStride, w, h);
}
int32_t QZ_ImageRotate_90AC_u8(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                               int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint8_t, 8, Turn::anticlockwise>(src, srcStride, dst, dstStride, w, h);
}
int32_t QZ_ImageRotate_180_u8(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                              int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint8_t, 8, Turn::half>(src, srcStride, dst, dstStride, w, h);
}
int32_t QZ_ImageRotate_90C_u16(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                               int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint16_t, 8, Turn::clockwise>(src, srcStride, dst, dstStride, w, h);
}
int32_t QZ_ImageRotate_90AC_u16(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint16_t, 8, Turn::anticlockwise>(src, srcStride, dst, dstStride, w, h);
}
int32_t QZ_ImageRotate_90C_u32(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                               int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint32_t, 4, Turn::clockwise>(src, srcStride, dst, dstStride, w, h);
}
int32_t QZ_ImageRotate_90AC_u32(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint32_t, 4, Turn::anticlockwise>(src, srcStride, dst, dstStride, w, h);
}

}  // extern "C"
