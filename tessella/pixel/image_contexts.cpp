#include <tessella/pixel/image_contexts.h>

#include <type_traits>

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
GrImageContext<Surface, Colors>::GrImageContext(GrImage const& image)
    : GrGenericContext<GrGenericSurface<GrImageContextBase<Surface::kBytes>, Surface>, Colors>(image)
{
    if (Colors::kDithers && image.width > 0)
        this->ditherRows = std::make_unique<std::int32_t[]>(static_cast<std::size_t>(image.width) * 3);
}

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
GrContext* CreateImageContext(GrImage* image)
{
    if constexpr (std::is_same_v<Colors, GrColors4>) GrColors4::BuildColorCube();
    return new GrImageContext<Surface, Colors>(*image);
}

template GrContext* CreateImageContext<GrSurface8, GrColors4>(GrImage* image);
template GrContext* CreateImageContext<GrSurface8, GrColors8>(GrImage* image);
template GrContext* CreateImageContext<GrSurface16, GrColors15>(GrImage* image);
template GrContext* CreateImageContext<GrSurface16, GrColors16>(GrImage* image);
template GrContext* CreateImageContext<GrSurface24, GrColors24>(GrImage* image);
template GrContext* CreateImageContext<GrSurface32, GrColors24>(GrImage* image);
template GrContext* CreateImageContext<GrSurface32, GrColorsRGB>(GrImage* image);
template GrContext* CreateImageContext<GrSurface32, GrColorsRGBA>(GrImage* image);
