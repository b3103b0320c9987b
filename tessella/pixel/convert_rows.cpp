#include <tessella/pixel/convert_rows.h>

#include <tessella/pixel/wide_rows.h>

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void ReadColors(unsigned char const* pixels, int count, GrColor* colors)
{
    if constexpr (kHasWideRows<Colors>)
        RunWide<Surface, Colors>([&]<typename Rows>(Rows) { Rows::Read(pixels, count, colors); });
    else
        for (int x = 0; x < count; ++x)
            colors[x] = Colors::FromPixel(Surface::ReadPixel(pixels, x));
}

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void WriteColors(unsigned char* pixels, int count, GrColor const* colors)
{
    if constexpr (kHasWideRows<Colors>)
        RunWide<Surface, Colors>([&]<typename Rows>(Rows) { Rows::Write(pixels, count, colors); });
    else
        for (int x = 0; x < count; ++x)
            Surface::WritePixel(pixels, x, Colors::ToPixel(colors[x]));
}

template void ReadColors<GrSurface8, GrColors4>(unsigned char const* pixels, int count, GrColor* colors);
template void WriteColors<GrSurface8, GrColors4>(unsigned char* pixels, int count, GrColor const* colors);
template void ReadColors<GrSurface8, GrColors8>(unsigned char const* pixels, int count, GrColor* colors);
template void WriteColors<GrSurface8, GrColors8>(unsigned char* pixels, int count, GrColor const* colors);
template void ReadColors<GrSurface16, GrColors15>(unsigned char const* pixels, int count, GrColor* colors);
template void WriteColors<GrSurface16, GrColors15>(unsigned char* pixels, int count, GrColor const* colors);
template void ReadColors<GrSurface16, GrColors16>(unsigned char const* pixels, int count, GrColor* colors);
template void WriteColors<GrSurface16, GrColors16>(unsigned char* pixels, int count, GrColor const* colors);
template void ReadColors<GrSurface24, GrColors24>(unsigned char const* pixels, int count, GrColor* colors);
template void WriteColors<GrSurface24, GrColors24>(unsigned char* pixels, int count, GrColor const* colors);
template void ReadColors<GrSurface32, GrColors24>(unsigned char const* pixels, int count, GrColor* colors);
template void WriteColors<GrSurface32, GrColors24>(unsigned char* pixels, int count, GrColor const* colors);
template void ReadColors<GrSurface32, GrColorsRGB>(unsigned char const* pixels, int count, GrColor* colors);
template void WriteColors<GrSurface32, GrColorsRGB>(unsigned char* pixels, int count, GrColor const* colors);
template void ReadColors<GrSurface32, GrColorsRGBA>(unsigned char const* pixels, int count, GrColor* colors);
template void WriteColors<GrSurface32, GrColorsRGBA>(unsigned char* pixels, int count, GrColor const* colors);
