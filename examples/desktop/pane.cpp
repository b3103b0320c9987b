#include "pane.h"

namespace desktop {

Pane::Pane(GrWindow& parent, GrRect const& place)
    : window(&parent, place.x1, place.y1, place.x2 - place.x1, place.y2 - place.y1, this)
{}

Pane* PaneOf(GrWindow const* window) { return window ? static_cast<Pane*>(window->userData) : nullptr; }

void PaintPane(GrEvent const& event)
{
    GrWindow& window = *event.window;
    GrContext* const context = window.GetContext();
    GrRegion due = window.region;  // the context reaches over the window's shadow, too
    due.Offset(-window.bounds.x1, -window.bounds.y1);
    due &= event.rect;
    context->SetClipRegion(due);
    PaneOf(&window)->Paint(*context);
    window.FreeContext(context);
}

}
