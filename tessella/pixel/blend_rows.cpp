#include <tessella/pixel/blend_rows.h>

#include <tessella/pixel/pixel_extent.h>
#include <tessella/pixel/wide_rows.h>

namespace {

/// True if the source is a part of what is painted on: then each pixel is mixed from what is there by then.
template <GrSurfacePolicy Surface>
bool PaintsOnItsSource(GrBlend const& blend)
{
    auto const& [address, stride, width, height] = blend.target;
    if (!blend.colors) return false;
    GrPixelExtent const painted{
        address, address + (height - 1) * stride + std::ptrdiff_t{width} * Surface::kBytes};
    std::ptrdiff_t const read = std::ptrdiff_t{height - 1} * blend.sourceWidth + width;
    return painted.Meets({blend.colors, blend.colors + read * std::ptrdiff_t{sizeof(GrColor)}});
}

}

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void BlendRows(GrBlend const& blend)
{
    if constexpr (kHasWideRows<Colors>)
        if (!PaintsOnItsSource<Surface>(blend))
            return RunWide<Surface, Colors>([&]<typename Rows>(Rows) { Rows::Blend(blend); });
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
