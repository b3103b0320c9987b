#include <tessella/pixel/screen_contexts.h>

#include <tessella/pixel/generic_context.h>
#include <tessella/pixel/screen_base.h>
#include <tessella/pixel/surface_planar.h>

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
GrContext* CreateScreenContext(GrRegion const& region, int x, int y)
{
    return new GrGenericContext<GrGenericSurface<GrScreenContextBase, Surface>, Colors>(region, x, y);
}

template GrContext* CreateScreenContext<GrSurface8, GrColors8>(GrRegion const& region, int x, int y);
template GrContext* CreateScreenContext<GrSurface16, GrColors15>(GrRegion const& region, int x, int y);
template GrContext* CreateScreenContext<GrSurface16, GrColors16>(GrRegion const& region, int x, int y);
template GrContext* CreateScreenContext<GrSurface24, GrColors24>(GrRegion const& region, int x, int y);
template GrContext* CreateScreenContext<GrSurface32, GrColors24>(GrRegion const& region, int x, int y);

GrContext* CreatePlanarScreenContext(GrRegion const& region, int x, int y)
{
    GrColors4::BuildColorCube();
    return new GrGenericContext<GrSurface4, GrColors4>(region, x, y);
}
