#pragma once

#include "look.h"
#include "pointers.h"

#include <tessella.h>

namespace desktop {

/// A window and what it does. Only `Paint` draws; everything else changes what is to be seen, and invalidates
/// it. Points are in coordinates of the window.
class Pane {
public:
    /// A hidden window at this place of the screen.
    Pane(GrWindow& parent, GrRect const& place);
    virtual ~Pane() = default;
    Pane(Pane const&) = delete;
    Pane& operator=(Pane const&) = delete;

    GrWindow& Window() { return window; }
    int Width() const { return window.bounds.x2 - window.bounds.x1; }
    int Height() const { return window.bounds.y2 - window.bounds.y1; }
    GrRect All() const { return {0, 0, Width(), Height()}; }

    /// Paints the window; the context is clipped to what is due.
    virtual void Paint(GrContext& context) = 0;

    /// The left button goes down, the pointer moves while it is held, wherever it is then, and it goes up.
    virtual void Press(Point) {}
    virtual void Drag(Point) {}
    virtual void Release(Point) {}
    /// The pointer moves over the window, and leaves it.
    virtual void Hover(Point) {}
    virtual void Leave() {}
    /// The wheel is turned, +1 being towards the user.
    virtual void Wheel(int) {}
    virtual void Key(GrEvent const&) {}
    /// The pointer's shape at a point.
    virtual Pointer PointerAt(Point) const { return Pointer::Arrow; }

protected:
    GrWindow window;
};

/// Null for the root.
Pane* PaneOf(GrWindow const* window);
/// Carries out a paint event for a window of a pane.
void PaintPane(GrEvent const& event);

}
