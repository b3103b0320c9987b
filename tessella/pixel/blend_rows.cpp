#include <tessella/pixel/blend_rows.h>

#include <tessella/pixel/diffuse_rows.h>
#include <tessella/pixel/wide_source.h>

namespace {

constexpr WideWords kLanes = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15};

template <typename Format, bool kHasColors, bool kHasAlphas>
GR_INLINE void BlendWide(GrBlend const& job)
{
    WideSource<Format, kHasColors, kHasAlphas> source(job);
    GrBlend const& blend = source.blend;
    WideWords const fore = Splat(blend.fore), back = Splat(blend.back);
    int const width = blend.target.width;
    unsigned char* row = blend.target.address;
    for (std::ptrdiff_t y = 0; y < blend.target.height; ++y, row += blend.target.stride)
        for (int next = 0; next < width; next += kWide) {
            int const x = WideStart(next, 0, width);
            int const count = width - x;
            unsigned char* const to = row + std::ptrdiff_t{x} * Format::Width::kBytes;
            source.Load(y, x, count);
            if (source.run == AlphaRun::Clear) {
                if (!blend.overDestination) Format::Store(to, count, back);
                continue;
            }
            WideWords opaque = fore;
            if constexpr (kHasColors) opaque = Format::ToPixels(source.color);
            if (source.run == AlphaRun::Opaque) {
                Format::Store(to, count, opaque);
                continue;
            }
            // Over the back colour everything is as if the target held that everywhere.
            WideWords below = back;
            if (blend.overDestination) below = Format::Load(to, count);
            WideWords pixels = Format::ToPixels(source.MixedOver(below));
            if constexpr (kHasAlphas) {
                pixels = source.alpha == 255 ? opaque : pixels;
                pixels = source.alpha == 0 ? below : pixels;
            }
            // What was blended before must not be blended again; all else comes to the same.
            if (x < next && blend.overDestination)
                pixels = kLanes < Splat(static_cast<unsigned>(next - x)) ? below : pixels;
            Format::Store(to, count, pixels);
        }
}

template <typename Format>
GR_INLINE void BlendFormat(GrBlend const& blend)
{
    if (blend.colors)
        blend.alphas ? BlendWide<Format, true, true>(blend) : BlendWide<Format, true, false>(blend);
    else
        blend.alphas ? BlendWide<Format, false, true>(blend) : BlendWide<Format, false, false>(blend);
}

GR_CLONES void Blend(Wide8, GrBlend const& blend) { BlendFormat<Wide8>(blend); }
GR_CLONES void Blend(Wide15, GrBlend const& blend) { BlendFormat<Wide15>(blend); }
GR_CLONES void Blend(Wide16, GrBlend const& blend) { BlendFormat<Wide16>(blend); }
GR_CLONES void Blend(Wide24<GrSurface24>, GrBlend const& blend) { BlendFormat<Wide24<GrSurface24>>(blend); }
GR_CLONES void Blend(Wide24<GrSurface32>, GrBlend const& blend) { BlendFormat<Wide24<GrSurface32>>(blend); }
GR_CLONES void Blend(WideRGB, GrBlend const& blend) { BlendFormat<WideRGB>(blend); }

}

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void BlendRows(GrBlend const& blend)
{
    if constexpr (requires { WideOf(Surface{}, Colors{}); }) {
        decltype(WideOf(Surface{}, Colors{})) const format;
        if (!blend.errors || (!blend.alphas && blend.alpha == 0)) return Blend(format, blend);
        if constexpr (Colors::kDithers) return DiffuseRows(format, blend);
    }
    BlendPixels<Surface, Colors>(blend);
}

template void BlendRows<GrSurface8, GrColors4>(GrBlend const& blend);
template void BlendRows<GrSurface8, GrColors8>(GrBlend const& blend);
template void BlendRows<GrSurface16, GrColors15>(GrBlend const& blend);
template void BlendRows<GrSurface16, GrColors16>(GrBlend const& blend);
template void BlendRows<GrSurface24, GrColors24>(GrBlend const& blend);
template void BlendRows<GrSurface32, GrColors24>(GrBlend const& blend);
template void BlendRows<GrSurface32, GrColorsRGB>(GrBlend const& blend);
template void BlendRows<GrSurface32, GrColorsRGBA>(GrBlend const& blend);
