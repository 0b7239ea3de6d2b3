#pragma once

// Bilinear resampling of pictures with 8-bit samples. It goes strip by strip, a strip being some
// hundred output columns whose taps are worked out once, and within a strip band by band, a band
// being eight output rows. The two source rows around each of the eight are blended, and the result
// is kept column by column, eight rows a vector. So picking an output column is a blend of two
// vectors, whatever the scale; a transpose makes rows of it again. No memory is allocated.
//
// Where the processor can pick samples within a register, planes of bytes that shrink to no less
// than a half go row by row instead: the rows are blended as they lie, and picked from.

#include <cstddef>
#include <type_traits>

#include "kernels/corner_step.h"
#include "kernels/plane.h"
#include "kernels/resample_backend.h"
#include "kernels/tile.h"

namespace vidshow {

struct Size {
    int32_t w;
    int32_t h;
};

inline bool IsEmpty(Size size) {
    return size.w < 1 || size.h < 1;
}

/// Where the output samples along one axis lie between the source samples.
struct Axis {
    int32_t first;  ///< position of output sample 0, 16.16; may lie before the first source sample
    int32_t step;   ///< distance between output samples, 16.16
    int32_t count;  ///< source samples
    bool straight;  ///< output sample i is source sample i

    /// Positions past either end repeat the sample at that end.
    Tap At(int32_t i) const {
        return TapAt(std::clamp(first + i * step, 0, (count - 1) * 65536), count);
    }
};

/// Luma, or any plane with a sample for each pixel: the corners coincide.
inline Axis PixelAxis(int32_t from, int32_t to) {
    return {0, CornerStep(from, to), from, from == to};
}

/// A chroma plane with a sample for two pixels, sizes given in pixels. Chroma sample c is centred
/// between pixels 2c and 2c + 1, at 2c + 1/2. It has to stay there in the output, so with luma's
/// step s output sample c comes from luma position (2c + 1/2) s, which is chroma position
/// c s + (s - 1) / 4. The same holds, mirrored, at the far edge.
inline Axis ChromaAxis(int32_t from, int32_t to) {
    const int32_t step = CornerStep(from, to);
    return {(step - 65536) / 4, step, ChromaSize(from), from == to};
}

constexpr int32_t kStripColumns = 128;  ///< output columns of a strip at the most

/// A sample of each row of a band, or eight neighbouring samples of a row.
typedef uint16_t Words __attribute__((vector_size(2 * kBandRows)));

/// The weighted mean of two samples, weights in 1/32, cut down by kShift bits.
template <int kShift, int kHalf>
inline Words Blend(Words a, Words b, uint16_t weight) {
    constexpr uint16_t kOne = 32, kRound = kHalf;
    return (a * static_cast<uint16_t>(kOne - weight) + b * weight + kRound) >> kShift;
}

/// How the mean of four neighbours is made: down first, then across. All of it fits 16 bits.
struct RoundedMean {
    /// In 1/8 of a level, at most 2,040.
    static Words Down(Words a, Words b, uint16_t weight) { return Blend<2, 2>(a, b, weight); }
    static Words Across(Words a, Words b, uint16_t weight) { return Blend<8, 128>(a, b, weight); }
};
/// As the table-driven 4:2:0 kernels do it, bit for bit.
struct TruncatedMean {
    /// In 1/2 of a level, at most 510.
    static Words Down(Words a, Words b, uint16_t weight) { return Blend<4, 0>(a, b, weight); }
    static Words Across(Words a, Words b, uint16_t weight) { return Blend<6, 0>(a, b, weight); }
};

/// The taps of a strip of output columns.
class ColumnTaps {
  public:
    explicit ColumnTaps(const Axis& axis) : m_axis(axis) {}

    /// Takes up output columns from `x` on, as many as are wanted and fit. @return how many, >= 1
    int32_t Select(int32_t x, int32_t wanted) {
        m_first = m_axis.At(x).index;
        for (m_count = 0; m_count < std::min(wanted, kStripColumns); ++m_count) {
            const Tap tap = m_axis.At(x + m_count);
            if (tap.next - m_first >= kStripSpan) break;
            m_index[m_count] = static_cast<uint16_t>(tap.index - m_first);
            m_weight[m_count] = static_cast<uint16_t>(tap.weight);
            m_span = tap.next - m_first + 1;
        }
        m_isNear = GroupNear();
        return m_count;
    }

    int32_t first() const { return m_first; }  ///< source column of entry 0
    int32_t span() const { return m_span; }    ///< source columns that the strip needs
    int32_t count() const { return m_count; }  ///< output columns

    /// The same taps in groups; null when they are too far apart.
    const NearTaps* near() const { return m_isNear ? &m_near : nullptr; }
    int32_t groups() const { return (m_count + NearTaps::kGroup - 1) / NearTaps::kGroup; }

    /// Picks the strip's samples, `kChannels` a column, from blended source columns. There is one
    /// source column more than `span`, whatever is in it: the tap of the last one has weight 0.
    template <class Mean, int kChannels>
    void Pick(const Words* columns, uint8_t (*out)[kBandRows]) const {
        for (int32_t i = 0; i < m_count; ++i) {
            const Words* at = columns + m_index[i] * kChannels;
            for (int c = 0; c < kChannels; ++c) {
                const Words mean = Mean::Across(at[c], at[c + kChannels], m_weight[i]);
                StoreBytes(mean, out[i * kChannels + c]);
            }
        }
    }

  private:
    static void StoreBytes(Words words, uint8_t* out) {
        typedef uint8_t Bytes __attribute__((vector_size(sizeof(Words))));
        const Bytes low = __builtin_shufflevector(reinterpret_cast<Bytes>(words), Bytes{}, 0, 2, 4,
                                                  6, 8, 10, 12, 14, 16, 18, 20, 22, 24, 26, 28, 30);
        std::memcpy(out, &low, kBandRows);
    }

    /// @return whether every group lies within the span that groups have
    bool GroupNear() {
        m_near = {};
        for (int32_t i = 0; i < m_count; ++i) {
            constexpr int kColumns = 2 * NearTaps::kGroup;
            NearTaps::Pair& pair = m_near.pairs[i / kColumns];
            uint32_t& first = pair.first[i % kColumns / NearTaps::kGroup];
            if (i % NearTaps::kGroup == 0) first = m_index[i];
            const int32_t word = m_index[i] - static_cast<int32_t>(first);
            if (word + 1 >= NearTaps::kSpan) return false;
            for (int second = 0; second < 2; ++second) {
                uint8_t* const order =
                    pair.order + NearTaps::Pair::PlaceOfTap(i % kColumns, second);
                order[0] = static_cast<uint8_t>(2 * (word + second));
                order[1] = static_cast<uint8_t>(order[0] + 1);
                pair.weights[NearTaps::Pair::PlaceOfWeight(i % kColumns, second)] =
                    static_cast<uint16_t>(second != 0 ? m_weight[i] : 32 - m_weight[i]);
            }
        }
        return true;
    }

    Axis m_axis;
    NearTaps m_near;
    bool m_isNear = false;
    int32_t m_first = 0;
    int32_t m_span = 0;
    int32_t m_count = 0;
    uint16_t m_index[kStripColumns];
    uint16_t m_weight[kStripColumns];
};

/// Eight neighbouring bytes as words.
struct ByteSamples {
    static constexpr int kBytes = 1;

    Words operator()(const uint8_t* at) const {
        typedef uint8_t Bytes __attribute__((vector_size(kBandRows), aligned(1), may_alias));
        const Bytes bytes = *reinterpret_cast<const Bytes*>(at);
        const Bytes zero = {};
        return reinterpret_cast<Words>(__builtin_shufflevector(bytes, zero, 0, 8, 1, 9, 2, 10, 3,
                                                               11, 4, 12, 5, 13, 6, 14, 7, 15));
    }
};

/// Resamples pixels of `kChannels` interleaved samples.
template <class Mean, class Samples, int kChannels>
class BandResampler {
  public:
    /// Leaves the strip's eight rows in `out`, `stride` bytes apart; a row there has room for
    /// `kStripColumns` pixels.
    void Run(const RowTaps& rows, const ColumnTaps& taps, const Samples& samples, uint8_t* out,
             intptr_t stride) {
        if constexpr (kGoesByRows) {
            const ResampleBackend* const backend = ActiveResampleBackend();
            if (backend != nullptr && taps.near() != nullptr) {
                return RunByRows(*backend, rows, taps, out, stride);
            }
        }
        BlendRows(rows, samples, taps.span() * kChannels);
        taps.Pick<Mean, kChannels>(m_columns, m_picked);
        for (int32_t i = 0; i < taps.count() * kChannels; i += kBandRows) {
            Tile<uint8_t, kBandRows> tile;
            tile.Load(m_picked[i], kBandRows);
            tile.Transpose();
            tile.Store(out + i, stride);
        }
    }

  private:
    static constexpr bool kGoesByRows =
        std::is_same_v<Mean, RoundedMean> && std::is_same_v<Samples, ByteSamples> && kChannels == 1;

    void RunByRows(const ResampleBackend& backend, const RowTaps& rows, const ColumnTaps& taps,
                   uint8_t* out, intptr_t stride) {
        backend.blend(m_blended, kBlendedWords, rows, static_cast<size_t>(taps.span()));
        backend.pick(out, stride, m_blended, kBlendedWords, *taps.near(), taps.groups());
    }

    void BlendRows(const RowTaps& rows, const Samples& samples, int32_t count) {
        const int32_t whole = count / kBandRows * kBandRows;
        for (int32_t i = 0; i < whole; i += kBandRows) {
            BlendEight(rows, samples, i, i * Samples::kBytes);
        }
        if (whole == count) return;
        // The last ones are copied first, because nothing behind them may be read.
        uint8_t tail[2][kBandRows][sizeof(Words)] = {};
        RowTaps copied = rows;
        const size_t bytes = static_cast<size_t>(count - whole) * Samples::kBytes;
        for (int r = 0; r < kBandRows; ++r) {
            std::memcpy(tail[0][r], rows.upper[r] + whole * Samples::kBytes, bytes);
            std::memcpy(tail[1][r], rows.lower[r] + whole * Samples::kBytes, bytes);
            copied.upper[r] = tail[0][r];
            copied.lower[r] = tail[1][r];
        }
        BlendEight(copied, samples, whole, 0);
    }

    void BlendEight(const RowTaps& rows, const Samples& samples, int32_t column, int32_t offset) {
        Tile<uint16_t, kBandRows> tile;
        for (int r = 0; r < kBandRows; ++r) {
            tile[r] = Mean::Down(samples(rows.upper[r] + offset), samples(rows.lower[r] + offset),
                                 rows.weight[r]);
        }
        tile.Transpose();
        tile.Store(reinterpret_cast<uint8_t*>(m_columns + column), sizeof(Words));
    }

    /// Words from one blended row to the next: the last step and the last group run over.
    static constexpr int32_t kBlendedWords = kStripSpan + 2 * kVectorBytes;
    static constexpr size_t kColumns = kStripSpan * kChannels + kBandRows;
    static constexpr size_t kPicked = kStripColumns * kChannels;
    Words m_columns[kColumns] = {};
    uint8_t m_picked[kPicked][kBandRows] = {};
    uint16_t m_blended[kGoesByRows ? kBandRows * kBlendedWords : 1] = {};
};

/// A kind of pixels: `kBytes` in memory, and `Resample`, which leaves a strip's eight rows as
/// `BandResampler::Run` does.
template <class Mean, int kChannels>
class BytePixels {
  public:
    static constexpr int kBytes = kChannels;

    void Resample(const RowTaps& rows, const ColumnTaps& taps, uint8_t* out, intptr_t stride) {
        m_resampler.Run(rows, taps, ByteSamples(), out, stride);
    }

  private:
    BandResampler<Mean, ByteSamples, kChannels> m_resampler;
};

/// Some columns of up to eight rows.
struct Band {
    const uint8_t* data;
    intptr_t stride;
    int32_t rows;
    int32_t columns;

    const uint8_t* Row(int32_t i) const { return data + i * stride; }
};

/// A plane or packed picture, read at another size.
template <class Pixels>
class Sampler {
  public:
    Sampler(const void* data, intptr_t stride, const Axis& across, const Axis& down)
        : m_data(static_cast<const uint8_t*>(data)),
          m_stride(stride),
          m_straight(across.straight && down.straight),
          m_down(down),
          m_taps(across) {}

    /// Names where the output's rows lie, so that bands can be made there; a plane of bytes only.
    void MakeAt(uint8_t* out, intptr_t stride) {
        m_out = out;
        m_outStride = stride;
    }

    /// Chooses the columns of the bands to come, from `x` on. @return how many they are, >= 1
    int32_t Select(int32_t x, int32_t wanted) {
        m_x = x;
        return m_columns = m_straight ? wanted : m_taps.Select(x, wanted);
    }

    /// Whether the picture keeps its size: its rows are not copied then, and come at any number.
    bool IsStraight() const { return m_straight; }

    /// Output rows `y` to `y` + `rows` - 1 of the chosen columns, good until the next call.
    /// @param rows 1 to 8, or any number of a straight picture
    Band Rows(int32_t y, int32_t rows) {
        if (m_straight) return {At(m_x, y), m_stride, rows, m_columns};
        RowTaps taps;
        for (int r = 0; r < kBandRows; ++r) {
            const Tap tap = m_down.At(y + std::min(r, rows - 1));
            taps.upper[r] = At(m_taps.first(), tap.index);
            taps.lower[r] = At(m_taps.first(), tap.next);
            taps.weight[r] = static_cast<uint16_t>(tap.weight);
        }
        const bool inPlace = m_out != nullptr && rows == kBandRows && m_taps.near() != nullptr &&
                             m_columns % NearTaps::kWholeColumns == 0;
        uint8_t* const at = inPlace ? m_out + y * m_outStride + m_x : m_rows;
        const intptr_t stride = inPlace ? m_outStride : intptr_t{kRowBytes};
        m_pixels.Resample(taps, m_taps, at, stride);
        return {at, stride, rows, m_columns};
    }

  private:
    static constexpr size_t kRowBytes = kStripColumns * Pixels::kBytes;

    const uint8_t* At(int32_t x, int32_t y) const {
        return m_data + y * m_stride + intptr_t{x} * Pixels::kBytes;
    }

    const uint8_t* m_data;
    intptr_t m_stride;
    uint8_t* m_out = nullptr;
    intptr_t m_outStride = 0;
    bool m_straight;
    int32_t m_x = 0;
    int32_t m_columns = 0;
    Axis m_down;
    ColumnTaps m_taps;
    Pixels m_pixels;
    uint8_t m_rows[kBandRows * kRowBytes];
};

}  // namespace vidshow
