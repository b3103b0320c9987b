#pragma once

#include <tessella/event.h>
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

/// Chooses the owner of the area's first point, cuts the area to what is seen of him, and fills in the event.
/// With `markValid` the area counts as valid from then on, and the owner's shadow in it is painted: it leaves
/// the area. Otherwise there are no shadows, and nothing becomes valid. The area must not be empty.
void WalkPaint(GrRegion& area, GrEvent& event, bool markValid);

/// What a window of this shape casts, in the same coordinates.
GrRegion ShadowOf(GrRegion const& shape);
