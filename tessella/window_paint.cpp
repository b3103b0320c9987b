#include <tessella/window_state.h>

#include <common/assert.h>
#include <tessella/coordinates.h>
#include <tessella/session_state.h>

#include <new>

// Nobody keeps a list of what is to be painted. One region tells what of the screen is valid, and a paint
// event is computed when it is asked for: the first invalid point has an owner, who gets all that is invalid
// of him in one go. So a pass has about as many events as windows that are touched.

constinit std::atomic<bool> screenLost{false};

namespace {

constexpr char kSource[] = GR_SOURCE("tessella/window");

/// Sees to it that the point counts as valid. A merge of regions with gaps between their rows may leave it
/// out, and then the same point would be chosen for ever.
void MakeValid(int x, int y)
{
    GrRegion invalid = Screen.bounds;
    invalid -= ValidRegion;
    if (!invalid.Contains(x, y)) return;
    // What is cut out of a rectangle has no gaps: with such regions the operators are exact.
    invalid -= GrRect{x, y, x + 1, y + 1};
    ValidRegion = Screen.bounds;
    ValidRegion -= invalid;
}

/// Paints the window's shadow in the area, and leaves the window's own part.
void PaintShadow(GrWindow& window, GrRegion& area)
{
    GrRegion shadowArea = area;
    shadowArea &= *window.shadow;
    window.DrawShadow(shadowArea);
    if (window.shadow) area -= *window.shadow;  // a handler may have taken it away meanwhile
}

}

void WalkPaint(GrRegion& area, GrEvent& event, bool markValid)
{
    int x = 0, y = 0;
    area.GetSomePoint(x, y);
    GrWindow* window = GrWindow::WindowAtXY(x, y, markValid);
    if (!GR_ASSERT_TEXT(window, "window != 0")) window = &Screen;
    GrRegion clip;
    window->DoGetClipRegion(clip, nullptr, false, markValid);
    area &= clip;
    GR_ASSERT_TEXT(area, "reg");

    // A part of each ancestor's subtree becomes valid, so none of them is invalid as a whole any more.
    window->flags &= ~GrWindowInvalidated;
    for (GrWindow* ancestor = window->parent; ancestor; ancestor = ancestor->parent)
        ancestor->ResetInvalidated();

    if (markValid) {
        // Valid before it is painted: what the handler invalidates while it paints is not lost.
        ValidRegion += area;
        MakeValid(x, y);
        if (window->shadow) PaintShadow(*window, area);
    }

    GrRect outer{};
    area.GetOuterRect(outer);
    event.rect = {SeenFrom(outer.x1, window->bounds.x1), SeenFrom(outer.y1, window->bounds.y1),
        SeenFrom(outer.x2, window->bounds.x1), SeenFrom(outer.y2, window->bounds.y1)};
    event.window = window;
    event.type = GrEventPaint;
}

void InvalidateLostScreen()
{
    if (!screenLost.load(std::memory_order_relaxed) || !screenLost.exchange(false)) return;
    try {
        Screen.FullInvalidate(true);
    } catch (std::bad_alloc const&) {
        screenLost = true;
        throw;
    }
}

bool GrWindow::IsInvalidated() const
{
    InvalidateLostScreen();
    for (GrWindow const* window = this; window; window = window->parent)
        if (window->flags & GrWindowInvalidated) return true;
    return (Screen.flags & GrWindowInvalidated) != 0;
}

void GrWindow::Invalidate()
{
    if (IsInvalidated()) return;
    GrRegion clip;
    DoGetClipRegion(clip, nullptr, true, false);
    ValidRegion -= clip;
}

void GrWindow::Invalidate(GrRect const& rect)
{
    if (IsInvalidated()) return;
    GrRegion clip;
    DoGetClipRegion(clip, nullptr, true, false);
    clip &= Moved(rect, bounds.x1, bounds.y1);
    ValidRegion -= clip;
}

void GrWindow::FullInvalidate(bool force)
{
    if (!force && IsInvalidated()) return;
    GrRegion clip;
    DoGetClipRegion(clip, first, true, shadow != nullptr);
    ValidRegion -= clip;
    flags |= GrWindowInvalidated;
}

void GrWindow::ResetInvalidated()
{
    InvalidateLostScreen();
    for (GrWindow* child = first; child; child = child->next)
        if (child->flags & GrWindowInvalidated) child->ResetInvalidated();
    flags &= ~GrWindowInvalidated;
}

bool GrWindow::GetPaintEvent(GrEvent* event)
{
    if (!screenVisible) return false;
    if (!GR_ASSERT_TEXT(Screen.IsVisible(), "Screen->IsVisible()")) return false;
    GrRegion area = Screen.bounds;
    return GetPaintEvent(event, area);
}

bool GrWindow::GetPaintEvent(GrEvent* event, GrRegion& area)
{
    InvalidateLostScreen();
    area -= ValidRegion;
    if (!area) return false;
    if (event) WalkPaint(area, *event, true);
    return true;
}

// The argument has never limited anything, and applications rely on all paint being delivered.
void GrWindow::Repaint(GrRegion const&)
{
    if (!screenVisible || !Callback) return;
    GrEvent event;
    while (GetPaintEvent(&event))
        Callback(event);
}
