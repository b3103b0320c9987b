#pragma once

#include <tessella/window.h>

/// What all windows share. The application's thread only, like the tree itself.

struct GrRootWindow : GrWindow {};

/// The root of the tree. Visible during a session; its corner stays at 0, 0.
extern GrRootWindow Screen;

/// Where events of windows go; null until the application sets it.
extern void (*Callback)(GrEvent const&);

/// The pixels of the screen that are up to date. All others within the root wait for paint.
extern GrRegion ValidRegion;
