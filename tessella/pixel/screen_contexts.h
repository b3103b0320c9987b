#pragma once

#include <tessella/pixel/colors.h>
#include <tessella/pixel/surface.h>
#include <tessella/region.h>

class GrContext;

/// A new context over the screen, limited to `region` (screen coordinates), with both origins at `x`, `y`. It
/// fits only a mode of its own pixel format. The caller deletes it. Instantiated for every packed mode.
template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
GrContext* CreateScreenContext(GrRegion const& region, int x, int y);

/// The same for the 16-colour mode, whose screen is not packed.
GrContext* CreatePlanarScreenContext(GrRegion const& region, int x, int y);
