#pragma once

#include <tessella/region.h>

/// The visible pixels of the mode in force, in screen coordinates.
GrRegion WholeScreen();

/// Paints the whole screen black; does nothing without a context.
void ClearScreen();

/// Releases the context that covers the screen, and what it dithers with.
void DeleteScreenContext();
