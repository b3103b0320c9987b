#include <tessella/pixel/convert_rows.h>

#include <tessella/pixel/wide_formats.h>

namespace {

template <typename Format>
GR_INLINE void ReadWide(unsigned char const* pixels, int count, GrColor* colors)
{
    for (int next = 0; next < count; next += kWide) {
        int const x = WideStart(next, 0, count);
        auto const some = Format::Load(pixels + std::ptrdiff_t{x} * Format::Width::kBytes, count - x);
        StoreSome<4>(reinterpret_cast<unsigned char*>(colors + x), count - x, Format::FromPixels(some));
    }
}

template <typename Format>
GR_INLINE void WriteWide(unsigned char* pixels, int count, GrColor const* colors)
{
    for (int next = 0; next < count; next += kWide) {
        int const x = WideStart(next, 0, count);
        auto const* const from = reinterpret_cast<unsigned char const*>(colors + x);
        WideWords const some = LoadSome<4, WideWords>(from, count - x);
        Format::Store(pixels + std::ptrdiff_t{x} * Format::Width::kBytes, count - x, Format::ToPixels(some));
    }
}

GR_CLONES void Read(Wide8, unsigned char const* pixels, int count, GrColor* colors)
{
    ReadWide<Wide8>(pixels, count, colors);
}
GR_CLONES void Write(Wide8, unsigned char* pixels, int count, GrColor const* colors)
{
    WriteWide<Wide8>(pixels, count, colors);
}

GR_CLONES void Read(Wide15, unsigned char const* pixels, int count, GrColor* colors)
{
    ReadWide<Wide15>(pixels, count, colors);
}
GR_CLONES void Write(Wide15, unsigned char* pixels, int count, GrColor const* colors)
{
    WriteWide<Wide15>(pixels, count, colors);
}

GR_CLONES void Read(Wide16, unsigned char const* pixels, int count, GrColor* colors)
{
    ReadWide<Wide16>(pixels, count, colors);
}
GR_CLONES void Write(Wide16, unsigned char* pixels, int count, GrColor const* colors)
{
    WriteWide<Wide16>(pixels, count, colors);
}

GR_CLONES void Read(Wide24<GrSurface24>, unsigned char const* pixels, int count, GrColor* colors)
{
    ReadWide<Wide24<GrSurface24>>(pixels, count, colors);
}
GR_CLONES void Write(Wide24<GrSurface24>, unsigned char* pixels, int count, GrColor const* colors)
{
    WriteWide<Wide24<GrSurface24>>(pixels, count, colors);
}

GR_CLONES void Read(Wide24<GrSurface32>, unsigned char const* pixels, int count, GrColor* colors)
{
    ReadWide<Wide24<GrSurface32>>(pixels, count, colors);
}
GR_CLONES void Write(Wide24<GrSurface32>, unsigned char* pixels, int count, GrColor const* colors)
{
    WriteWide<Wide24<GrSurface32>>(pixels, count, colors);
}

GR_CLONES void Read(WideRGB, unsigned char const* pixels, int count, GrColor* colors)
{
    ReadWide<WideRGB>(pixels, count, colors);
}
GR_CLONES void Write(WideRGB, unsigned char* pixels, int count, GrColor const* colors)
{
    WriteWide<WideRGB>(pixels, count, colors);
}

}

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void ReadColors(unsigned char const* pixels, int count, GrColor* colors)
{
    if constexpr (requires { WideOf(Surface{}, Colors{}); })
        Read(decltype(WideOf(Surface{}, Colors{})){}, pixels, count, colors);
    else
        for (int x = 0; x < count; ++x)
            colors[x] = Colors::FromPixel(Surface::ReadPixel(pixels, x));
}

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void WriteColors(unsigned char* pixels, int count, GrColor const* colors)
{
    if constexpr (requires { WideOf(Surface{}, Colors{}); })
        Write(decltype(WideOf(Surface{}, Colors{})){}, pixels, count, colors);
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
