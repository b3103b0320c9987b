#pragma once

#include <tessella/pixel/wide_formats.h>

/// Blends as `BlendPixels` does with error rows, in the formats that dither. Any thread.
void DiffuseRows(Wide8, GrBlend const& blend);
void DiffuseRows(Wide15, GrBlend const& blend);
void DiffuseRows(Wide16, GrBlend const& blend);
