// Two windows, one with a hole: a click raises a window, and dragging moves it. Escape ends. The pointer
// has no picture here; button.cpp makes one.
#include <tessella.h>

#include <cstdio>
#include <memory>

namespace {

/// What the program keeps of a window, behind its `userData`.
struct Pane {
    GrColor color;
};

void Fill(GrContext& context, GrRegion const& region, GrColor color)
{
    context.SetForeColor(color);
    context.FillRegion(region);
}

void Paint(GrEvent const& event)
{
    GrWindow& window = *event.window;
    GrContext& context = *window.GetContext();
    if (auto const* const pane = static_cast<Pane*>(window.userData)) {
        // The context lets through what is seen of the window and of its shadow.
        GrRegion shape = window.region;
        shape.Offset(-window.bounds.x1, -window.bounds.y1);
        context.SetClipRegion(shape);
        Fill(context, event.rect, pane->color);
        int const right = window.bounds.x2 - window.bounds.x1;
        Fill(context, GrRect{0, 0, right, 16}, GrMakeColor(24, 24, 32));
    } else {
        Fill(context, event.rect, GrMakeColor(96, 128, 144));
    }
    window.FreeContext(&context);
}

/// Windows tell what becomes of them, on the thread that has done it and while it does.
void OnWindowEvent(GrEvent const& event)
{
    if (event.type == GrEventPaint) Paint(event);
}

/// A rectangle with a rectangular hole, in window coordinates.
GrRegion FrameShape()
{
    GrRegion shape = GrRect{0, 0, 140, 110};
    shape -= GrRect{30, 40, 110, 90};
    return shape;
}

/// Until Escape is pressed.
void HandleEvents()
{
    GrWindow* dragged = nullptr;
    int grabX = 0, grabY = 0;  // where on it the pointer holds the window
    for (GrEvent event;;) {
        if (!GrGetEvent(event, nullptr)) continue;
        if (event.type == GrEventPaint) {
            Paint(event);
        } else if (event.type == GrEventKeyDown && event.vk == GrVkEscape) {
            return;
        } else if (event.type == GrEventLeftDown && event.window->parent) {
            dragged = event.window;
            dragged->Raise();
            grabX = event.x - dragged->bounds.x1;
            grabY = event.y - dragged->bounds.y1;
        } else if (event.type == GrEventMouseMove && dragged) {
            dragged->Move(event.x - grabX, event.y - grabY);
        } else if (event.type == GrEventLeftUp) {
            dragged = nullptr;
        }
    }
}

}

int main()
{
    unsigned width, height, depth;
    if (!GrInit(width, height, depth, 0)) {
        std::fputs("There is no screen to draw on; tessella-doctor tells why.\n", stderr);
        return 1;
    }
    {
        GrWindow::SetCallback(OnWindowEvent);
        Pane red{GrMakeColor(224, 128, 96)}, yellow{GrMakeColor(240, 216, 128)};
        GrWindow plain(GrWindow::RootWindow(), 30, 20, 160, 120, &red);
        GrWindow frame(GrWindow::RootWindow(), 110, 70, 140, 110, &yellow);
        frame.SetWindowRegion(FrameShape());
        plain.SetShadowed(true);
        frame.SetShadowed(true);
        plain.Show();
        frame.Show();
        HandleEvents();
    }
    GrDone();
}
