#pragma once

#include <tessella/pixel/blend.h>

/// Blends as `BlendPixels` does, as fast as the format allows. Instantiated for every image format there is.
template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void BlendRows(GrBlend const& blend);
