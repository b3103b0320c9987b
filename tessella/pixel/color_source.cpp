#include <tessella/pixel/color_source.h>

#include <tessella/pixel/image_contexts.h>
#include <tessella/pixel/screen_base.h>

#include <typeinfo>

namespace {

template <typename Surface, typename Colors>
using ScreenContext = GrGenericContext<GrGenericSurface<GrScreenContextBase, Surface>, Colors>;

}

template <typename Context>
bool GrColorSource::IsOf()
{
    // The library has one description of each class, so that its address is enough.
    if (&typeid(source) != &typeid(Context)) return false;
    extent = static_cast<Context&>(source).ExtentOfClip();
    read = [](GrContext& context, int x, int y, int count, GrColor* room) {
        return static_cast<Context&>(context).ReadClipped(x, y, count, room);
    };
    return true;
}

GrColorSource::GrColorSource(GrContext& copied) : source(copied)
{
    static_cast<void>(IsOf<GrImageContext<GrSurface32, GrColorsRGB>>() ||
        IsOf<GrImageContext<GrSurface32, GrColorsRGBA>>() || IsOf<GrImageContext<GrSurface8, GrColors4>>() ||
        IsOf<GrImageContext<GrSurface8, GrColors8>>() || IsOf<GrImageContext<GrSurface16, GrColors15>>() ||
        IsOf<GrImageContext<GrSurface16, GrColors16>>() || IsOf<GrImageContext<GrSurface24, GrColors24>>() ||
        IsOf<GrImageContext<GrSurface32, GrColors24>>() || IsOf<ScreenContext<GrSurface8, GrColors8>>() ||
        IsOf<ScreenContext<GrSurface16, GrColors15>>() || IsOf<ScreenContext<GrSurface16, GrColors16>>() ||
        IsOf<ScreenContext<GrSurface24, GrColors24>>() || IsOf<ScreenContext<GrSurface32, GrColors24>>());
}
