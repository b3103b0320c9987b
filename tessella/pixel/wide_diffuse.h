#pragma once

#include <tessella/pixel/diffuse_wave.h>
#include <tessella/pixel/wide_source.h>

#include <algorithm>

namespace wide {

inline constexpr int kFewColumns = 96;  // so few that the error rows have no room for a wave's cells

/// The colours of a row's columns `from` to `to`, as they are wanted before any errors come in. Those that
/// are not drawn are 0; all others have a top byte of 255.
template <typename Format, bool kHasColors, bool kHasAlphas>
GR_INLINE void FillColors(WideSource<Format, kHasColors, kHasAlphas>& source, std::ptrdiff_t y, int from,
    int to, std::uint32_t* colors)
{
    using W = typename Format::Wide;
    using Words = typename W::Words;
    GrBlend const& blend = source.blend;
    unsigned char const* const row = blend.target.address + y * blend.target.stride;
    for (int next = from; next < to; next += W::kLanes) {
        int const x = W::Start(next, from, to);
        int const count = to - x;
        source.Load(y, x, count);
        Words wanted = source.color | 0xFF000000;
        if (source.run == AlphaRun::Clear) wanted = Words{};
        if (source.run == AlphaRun::Mixed) {
            Words below = W::Splat(blend.back);
            if (blend.overDestination) below = Format::Load(row + std::ptrdiff_t{x} * Format::kBytes, count);
            Words const mixed = source.MixedOver(below);
            if constexpr (kHasAlphas) {
                wanted = source.alpha == 255 ? wanted : mixed;
                wanted = source.alpha == 0 ? Words{} : wanted;
            } else {
                wanted = mixed;
            }
        }
        W::template Store<std::uint32_t>(
            reinterpret_cast<unsigned char*>(colors + (x - from)), count, wanted);
    }
}

/// Converts and stores a row's columns `from` to `to`.
template <typename Format, bool kHasAlphas>
GR_INLINE void StoreColors(
    GrBlend const& blend, std::ptrdiff_t y, int from, int to, std::uint32_t const* colors)
{
    using W = typename Format::Wide;
    using Words = typename W::Words;
    unsigned char* const row = blend.target.address + y * blend.target.stride;
    for (int next = from; next < to; next += W::kLanes) {
        int const x = W::Start(next, from, to);
        int const count = to - x;
        unsigned char* const address = row + std::ptrdiff_t{x} * Format::kBytes;
        auto const* const words = reinterpret_cast<unsigned char const*>(colors + (x - from));
        auto const reached = W::template Load<std::uint32_t>(words, count);
        Words pixels = Format::ToPixels(reached);
        if constexpr (kHasAlphas) {
            Words kept = W::Splat(blend.back);
            if (blend.overDestination) kept = Format::Load(address, count);
            pixels = (typename W::Signs)reached < 0 ? pixels : kept;
        }
        Format::Store(address, count, pixels);
    }
}

template <typename Format, typename Part, bool kHasColors, bool kHasAlphas>
GR_INLINE void DiffuseWide(GrBlend const& blend)
{
    using TheWave = Wave<Part, kHasAlphas>;
    int const width = blend.target.width, height = blend.target.height;
    unsigned char few[(kFewColumns + 3 * kWaveRows) * TheWave::kCellBytes];
    unsigned char* const cells = width < kFewColumns ? few : reinterpret_cast<unsigned char*>(blend.errors);
    std::memset(cells, 0, TheWave::kCellBytes * (static_cast<std::size_t>(width) + 3 * kWaveRows));

    WideSource<Format, kHasColors, kHasAlphas> source(blend);
    for (int top = 0; top < height; top += kWaveRows) {
        WaveColors colors{};
        TheWave wave(cells + kWaveRows * TheWave::kCellBytes);
        int const rows = std::min(kWaveRows, height - top);
        for (int start = 0; start < width + kWaveRows; start += kWaveSteps) {
            int const steps = std::min(kWaveSteps, (width + kWaveRows - start + 3) / 4 * 4);
            for (int i = 0; i < rows; ++i)
                FillColors(
                    source, top + i, start, std::min(start + steps, width), colors.rows[i] + kWaveRows);
            wave.Run(colors, steps);
            for (int i = 0; i < rows; ++i) {
                int const from = std::max(start - i, 0);
                StoreColors<Format, kHasAlphas>(blend, top + i, from, std::min(start + steps - i, width),
                    colors.rows[i] + kWaveRows + from - start);
            }
            for (auto& row : colors.rows)
                std::memmove(row, row + steps, kWaveRows * sizeof row[0]);
        }
    }
}

template <typename Colors>
using PartOf = std::conditional_t<std::is_same_v<Colors, GrColors8>, WavePart8,
    WavePart16<std::is_same_v<Colors, GrColors15> ? 0x00060606 : 0x00060206>>;

template <typename Format>
GR_INLINE void DiffuseFormat(GrBlend const& blend)
{
    using Part = PartOf<typename Format::Policy>;
    if (blend.colors)
        blend.alphas ? DiffuseWide<Format, Part, true, true>(blend)
                     : DiffuseWide<Format, Part, true, false>(blend);
    else
        blend.alphas ? DiffuseWide<Format, Part, false, true>(blend)
                     : DiffuseWide<Format, Part, false, false>(blend);
}

}
