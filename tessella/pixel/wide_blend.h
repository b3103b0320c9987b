#pragma once

#include <tessella/pixel/wide_source.h>

namespace wide {

inline constexpr std::uint32_t kLaneNumbers[] = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15};

template <typename Format, bool kHasColors, bool kHasAlphas>
GR_INLINE void BlendWide(GrBlend const& job)
{
    using W = typename Format::Wide;
    using Words = typename W::Words;

    WideSource<Format, kHasColors, kHasAlphas> source(job);
    GrBlend const& blend = source.blend;
    Words const fore = W::Splat(blend.fore), back = W::Splat(blend.back);
    Words const lanes = W::Read(kLaneNumbers);
    int const width = blend.target.width;
    unsigned char* row = blend.target.address;
    for (std::ptrdiff_t y = 0; y < blend.target.height; ++y, row += blend.target.stride)
        for (int next = 0; next < width; next += W::kLanes) {
            int const x = W::Start(next, 0, width);
            int const count = width - x;
            unsigned char* const to = row + std::ptrdiff_t{x} * Format::kBytes;
            source.Load(y, x, count);
            if (source.run == AlphaRun::Clear) {
                if (!blend.overDestination) Format::Store(to, count, back);
                continue;
            }
            Words opaque = fore;
            if constexpr (kHasColors) opaque = Format::ToPixels(source.color);
            if (source.run == AlphaRun::Opaque) {
                Format::Store(to, count, opaque);
                continue;
            }
            // Over the back colour everything is as if the target held that everywhere.
            Words below = back;
            if (blend.overDestination) below = Format::Load(to, count);
            Words pixels = Format::ToPixels(source.MixedOver(below));
            if constexpr (kHasAlphas) {
                pixels = source.alpha == 255 ? opaque : pixels;
                pixels = source.alpha == 0 ? below : pixels;
            }
            // What was blended before must not be blended again; all else comes to the same.
            if (x < next && blend.overDestination)
                pixels = lanes < W::Splat(static_cast<unsigned>(next - x)) ? below : pixels;
            Format::Store(to, count, pixels);
        }
}

template <typename Format>
GR_INLINE void BlendFormat(GrBlend const& blend)
{
    if (blend.colors)
        blend.alphas ? BlendWide<Format, true, true>(blend) : BlendWide<Format, true, false>(blend);
    else
        blend.alphas ? BlendWide<typename Format::Unturned, false, true>(blend)
                     : BlendWide<typename Format::Unturned, false, false>(blend);
}

}
