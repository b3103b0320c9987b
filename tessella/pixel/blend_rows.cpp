#include <tessella/pixel/blend_rows.h>

#include <tessella/pixel/wide_rows.h>

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void BlendRows(GrBlend const& blend)
{
    if constexpr (kHasWideRows<Colors>)
        RunWide<Surface, Colors>([&]<typename Rows>(Rows) { Rows::Blend(blend); });
    else
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
