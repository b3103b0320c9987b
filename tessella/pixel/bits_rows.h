#pragma once

#include <tessella/pixel/bits.h>
#include <tessella/pixel/surface.h>

/// Paints set bits in the fore pixel and clear ones in the back pixel, or leaves those alone, as fast as the
/// processor can. Instantiated for every surface.
template <GrSurfacePolicy Surface>
void PaintBits(GrBitsBox const& box);
