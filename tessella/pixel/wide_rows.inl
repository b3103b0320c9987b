#include <tessella/pixel/wide_bits.h>
#include <tessella/pixel/wide_blend.h>
#include <tessella/pixel/wide_convert.h>
#include <tessella/pixel/wide_diffuse.h>
#include <tessella/pixel/wide_rows.h>

// `kLanesHere` comes from the source that includes this: the lanes that it is compiled for.

template <int kLanes, GrSurfacePolicy Surface, GrColorsPolicy Colors>
void GrWideRows<kLanes, Surface, Colors>::Blend(GrBlend const& blend)
{
    using Format = GrWideFormat<GrWide<kLanes>, Surface, Colors>;
    // Where nothing is drawn, nothing is diffused.
    bool const diffuses = blend.errors && (blend.alphas || blend.alpha != 0);
    if constexpr (Colors::kDithers)
        if (diffuses) return wide::DiffuseFormat<Format>(blend);
    // Fewer lanes waste less on narrow rows, such as those of glyphs.
    if (kLanes == 16 && blend.target.width <= 8)
        wide::BlendFormat<GrWideFormat<GrWide<8>, Surface, Colors>>(blend);
    else
        wide::BlendFormat<Format>(blend);
}

template <int kLanes, GrSurfacePolicy Surface, GrColorsPolicy Colors>
void GrWideRows<kLanes, Surface, Colors>::Read(unsigned char const* pixels, int count, GrColor* colors)
{
    wide::ReadWide<GrWideFormat<GrWide<kLanes>, Surface, Colors>>(pixels, count, colors);
}

template <int kLanes, GrSurfacePolicy Surface, GrColorsPolicy Colors>
void GrWideRows<kLanes, Surface, Colors>::Write(unsigned char* pixels, int count, GrColor const* colors)
{
    wide::WriteWide<GrWideFormat<GrWide<kLanes>, Surface, Colors>>(pixels, count, colors);
}

template <int kLanes, GrSurfacePolicy Surface>
void GrWideBits<kLanes, Surface>::Paint(GrBitsBox const& box)
{
    if (kLanes == 16 && box.target.width <= 8)
        wide::PaintBitsOf<GrWide<8>, Surface>(box);
    else
        wide::PaintBitsOf<GrWide<kLanes>, Surface>(box);
}

template struct GrWideBits<kLanesHere, GrSurface8>;
template struct GrWideBits<kLanesHere, GrSurface16>;
template struct GrWideBits<kLanesHere, GrSurface24>;
template struct GrWideBits<kLanesHere, GrSurface32>;
template struct GrWideRows<kLanesHere, GrSurface8, GrColors8>;
template struct GrWideRows<kLanesHere, GrSurface16, GrColors15>;
template struct GrWideRows<kLanesHere, GrSurface16, GrColors16>;
template struct GrWideRows<kLanesHere, GrSurface24, GrColors24>;
template struct GrWideRows<kLanesHere, GrSurface32, GrColors24>;
template struct GrWideRows<kLanesHere, GrSurface32, GrColorsRGB>;
