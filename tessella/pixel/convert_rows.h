#pragma once

#include <tessella/pixel/colors.h>
#include <tessella/pixel/surface.h>

/// `FromPixel` and `ToPixel` of `count` pixels in a row, whose first lies at `pixels`. Instantiated for every
/// image format there is. Any thread.
template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void ReadColors(unsigned char const* pixels, int count, GrColor* colors);
template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void WriteColors(unsigned char* pixels, int count, GrColor const* colors);
