#pragma once

#include <tessella/window.h>

#include <atomic>

// What all windows share. The application's thread only, like the tree itself.

/// The one window that has no parent, so that nobody else can make one.
struct GrRootWindow : GrWindow {};

/// The root of the tree. Visible during a session; its corner stays at 0, 0.
extern GrRootWindow Screen;

/// Where events of windows go; null until the application sets it.
extern void (*Callback)(GrEvent const&);

/// The pixels of the screen that are up to date. All others within the root wait for paint.
extern GrRegion ValidRegion;

/// What the screen shows is somebody else's. Set by the console's signal handler, which may have come in the
/// midst of a merge and leaves the regions alone.
extern std::atomic<bool> screenLost;

/// If the screen is lost, makes all of it due for paint. Done before anything looks at what is valid: what a
/// handler has found out counts from then on.
void InvalidateLostScreen();
