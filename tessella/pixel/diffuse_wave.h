#pragma once

#include <tessella/pixel/wide.h>

#include <emmintrin.h>

// Error diffusion of sixteen rows at a time. A pixel waits for its left neighbour and for the one above, so
// what can be done at once lies on a slope: each row is a column behind the row above it.
//
//     column  0 1 2 3 4 5 6
//     row 0   . . . . . x         x: what is done at step 5
//     row 1   . . . . x
//     row 2   . . . x
//
// Rows begin and end at different steps. Before its start and behind its end a row is fed with zeros, or with
// whatever follows: errors never go to the left or upward, so that reaches no pixel of the picture.

namespace wide {

constexpr int kWaveRows = 16;
constexpr int kWaveSteps = 128;  // in one go, at most

/// A stretch of the rows: at step t, row k is at its column kWaveRows + t - k here. The first columns are the
/// last of the stretch before, where lower rows have still to go.
struct WaveColors {
    std::uint32_t rows[kWaveRows][kWaveRows + kWaveSteps];
};

/// Four rows of four bytes each, and the parts in which they are worked on.
using FourRows = std::uint8_t __attribute__((vector_size(16)));
using FourWords = std::uint32_t __attribute__((vector_size(16)));

/// For 15 and 16 bits. Their pixels are never brighter than the colour that was wanted, so that no error is
/// negative and all fit into bytes. They are kept twice as large as they are handed on: as the bits `kLost`
/// that a pixel leaves over, but for the lowest of each channel.
template <std::uint32_t kLost>
struct WavePart16 {
    using Vector = FourRows;
    using Mask = std::int8_t __attribute__((vector_size(16)));
    using Cell = std::uint32_t;  // the errors of one pixel
    static constexpr int kParts = 1;

    GR_INLINE static Vector Expand(FourRows const& bytes, int) { return bytes; }
    GR_INLINE static FourRows Pack(Vector const (&parts)[1]) { return parts[0]; }
    GR_INLINE static Mask Spread(FourRows const& mask, int) { return (Mask)mask; }
    /// Each row's errors from the row above; the first row's are the last of `above`.
    GR_INLINE static Vector Shift(Vector const& above, Vector const& errors)
    {
        return (Vector)__builtin_shufflevector((FourWords)above, (FourWords)errors, 3, 4, 5, 6);
    }
    GR_INLINE static Vector Wanted(Vector const& color, Vector const& above, Vector const& left)
    {
        __m128i const errors = _mm_avg_epu8((__m128i)above, (__m128i)left);  // both are even
        return (Vector)_mm_adds_epu8((__m128i)color, errors);
    }
    GR_INLINE static Vector ErrorsOf(Vector const& wanted) { return (Vector)((FourWords)wanted & kLost); }
};

/// For the cube of 8 bits: two rows of 16 bits a channel, with errors of both signs.
struct WavePart8 {
    using Vector = std::int16_t __attribute__((vector_size(16)));
    using Mask = Vector;
    using Pair = std::uint64_t __attribute__((vector_size(16)));
    using Cell = std::uint64_t;
    static constexpr int kParts = 2;

    GR_INLINE static Vector Expand(FourRows const& bytes, int part)
    {
        FourRows const zero{};
        return part == 0 ? (Vector)__builtin_shufflevector(
                               bytes, zero, 0, 16, 1, 16, 2, 16, 3, 16, 4, 16, 5, 16, 6, 16, 7, 16)
                         : (Vector)__builtin_shufflevector(
                               bytes, zero, 8, 16, 9, 16, 10, 16, 11, 16, 12, 16, 13, 16, 14, 16, 15, 16);
    }
    GR_INLINE static Mask Spread(FourRows const& mask, int part)
    {
        return part == 0
            ? (Mask)__builtin_shufflevector(mask, mask, 0, 0, 1, 1, 2, 2, 3, 3, 4, 4, 5, 5, 6, 6, 7, 7)
            : (Mask)__builtin_shufflevector(
                  mask, mask, 8, 8, 9, 9, 10, 10, 11, 11, 12, 12, 13, 13, 14, 14, 15, 15);
    }
    GR_INLINE static FourRows Pack(Vector const (&parts)[2])
    {
        return __builtin_shufflevector((FourRows)parts[0], (FourRows)parts[1], 0, 2, 4, 6, 8, 10, 12, 14, 16,
            18, 20, 22, 24, 26, 28, 30);
    }
    GR_INLINE static Vector Shift(Vector const& above, Vector const& errors)
    {
        return (Vector)__builtin_shufflevector((Pair)above, (Pair)errors, 1, 2);
    }
    GR_INLINE static Vector Wanted(Vector const& color, Vector const& above, Vector const& left)
    {
        __m128i const sum = (__m128i)(color + above + left);
        return (Vector)_mm_max_epi16(_mm_min_epi16(sum, _mm_set1_epi16(255)), _mm_setzero_si128());
    }
    GR_INLINE static Vector ErrorsOf(Vector const& wanted)
    {
        // Products / 2^16: 1286 stands for 2^16 / 51, and the level comes shifted by 8, as does 51.
        __m128i const level = _mm_mulhi_epu16((__m128i)(wanted + 25), _mm_set1_epi16(1286));
        __m128i const reached = _mm_mulhi_epu16(_mm_slli_epi16(level, 8), _mm_set1_epi16(51 << 8));
        Vector const lost = wanted - (Vector)reached;
        return (lost - (lost >> 15)) >> 1;  // toward zero
    }
};

/// Rows become columns, and columns rows.
GR_INLINE void Transpose(FourWords (&lines)[4])
{
    FourWords const low01 = __builtin_shufflevector(lines[0], lines[1], 0, 4, 1, 5);
    FourWords const low23 = __builtin_shufflevector(lines[2], lines[3], 0, 4, 1, 5);
    FourWords const high01 = __builtin_shufflevector(lines[0], lines[1], 2, 6, 3, 7);
    FourWords const high23 = __builtin_shufflevector(lines[2], lines[3], 2, 6, 3, 7);
    lines[0] = __builtin_shufflevector(low01, low23, 0, 1, 4, 5);
    lines[1] = __builtin_shufflevector(low01, low23, 2, 3, 6, 7);
    lines[2] = __builtin_shufflevector(high01, high23, 0, 1, 4, 5);
    lines[3] = __builtin_shufflevector(high01, high23, 2, 3, 6, 7);
}

/// The wave over sixteen rows, from stretch to stretch. Colours with a top byte of 0 are skipped if `kSkips`.
template <typename Part, bool kSkips>
class Wave {
public:
    using Vector = typename Part::Vector;
    static constexpr int kCellBytes = sizeof(typename Part::Cell);

    /// `cells` are the errors from the row above, for each column, and become those of the last row. There
    /// are kWaveRows cells before the first column, and as many behind the last, that mean nothing.
    GR_INLINE explicit Wave(unsigned char* cells) : above(cells) {}

    /// Goes on by some steps, a multiple of 4, and replaces the colours by those to convert.
    GR_INLINE void Run(WaveColors& colors, int steps)
    {
        for (int step = 0; step < steps; step += 4, above += 4 * kCellBytes) {
            // The errors of the row above the next part, one step ago, in their last cells.
            Vector incoming[4];
            for (int i = 0; i < 4; ++i)
                std::memcpy(&incoming[i], above + (i + 1) * kCellBytes - sizeof(Vector), sizeof(Vector));
            for (int four = 0; four < kWaveRows; four += 4) {
                FourWords lines[4];
                for (int i = 0; i < 4; ++i)
                    std::memcpy(&lines[i], &colors.rows[four + i][kWaveRows + step - four - i], 16);
                Transpose(lines);
                Vector wanted[4][Part::kParts];
                for (int part = 0; part < Part::kParts; ++part)
                    RunPart(lines, part, wanted, incoming, left[four / 4 * Part::kParts + part],
                        down[four / 4 * Part::kParts + part]);
                for (int i = 0; i < 4; ++i)
                    lines[i] = (FourWords)Part::Pack(wanted[i]);
                Transpose(lines);
                for (int i = 0; i < 4; ++i)
                    std::memcpy(&colors.rows[four + i][kWaveRows + step - four - i], &lines[i], 16);
            }
            for (int i = 0; i < 4; ++i)
                std::memcpy(above + (i - kWaveRows) * kCellBytes,
                    reinterpret_cast<unsigned char const*>(&incoming[i]) + sizeof(Vector) - kCellBytes,
                    kCellBytes);
        }
    }

private:
    /// Four steps of some rows. Their errors come in from the row above and go out to the row below.
    GR_INLINE static void RunPart(FourWords const (&lines)[4], int part, Vector (&wanted)[4][Part::kParts],
        Vector (&passing)[4], Vector& toRight, Vector& toBelow)
    {
        using Signs = std::int32_t __attribute__((vector_size(16)));
        for (int i = 0; i < 4; ++i) {
            Vector const fromAbove = Part::Shift(passing[i], toBelow);
            passing[i] = toBelow;
            Vector const color = Part::Expand((FourRows)lines[i], part);
            wanted[i][part] = Part::Wanted(color, fromAbove, toRight);
            Vector const errors = Part::ErrorsOf(wanted[i][part]);
            if constexpr (kSkips) {
                auto const drawn = Part::Spread((FourRows)((Signs)lines[i] < 0), part);
                toRight = drawn ? errors : toRight;
                toBelow = drawn ? errors : fromAbove;
            } else {
                toRight = toBelow = errors;
            }
        }
    }

    unsigned char* above;
    Vector left[kWaveRows / 4 * Part::kParts] = {};
    Vector down[kWaveRows / 4 * Part::kParts] = {};
};

}
