#include <tessella/window_state.h>

#include <common/assert.h>
#include <tessella/context.h>
#include <tessella/screen.h>

// What is seen of a window is computed afresh at each request. A window's pixels are what its ancestors leave
// it: from the root downward, at each level the siblings above the path are taken away, and then the next
// window of the path cuts its own shape out of what remains.

namespace {

constexpr char kSource[] = GR_SOURCE("tessella/window");

}

void GrWindow::DoGetClipRegion(GrRegion& out, GrWindow const* stop, bool fromValid, bool withShadow)
{
    if (!IsVisible()) {
        out.Clear();
        return;
    }
    if (this == &Screen) {
        if (fromValid) {
            InvalidateLostScreen();
            out = ValidRegion;
        } else {
            out = bounds;
        }
    } else {
        if (!GR_ASSERT_TEXT(parent, "parent != 0")) {
            out.Clear();
            return;
        }
        parent->DoGetClipRegion(out, this, fromValid, withShadow);
        if (withShadow && shadow) {
            GrRegion extent = region;
            extent += *shadow;
            out &= extent;
        } else {
            out &= region;
        }
    }
    for (GrWindow const* child = first; child && child != stop && out; child = child->next) {
        if (!child->IsVisible()) continue;
        out -= child->region;
        if (withShadow && child->shadow) out -= *child->shadow;
    }
}

GrWindow* GrWindow::WindowAtXY(int x, int y, bool withShadow)
{
    GR_ASSERT_TEXT(Screen.IsVisible(), "Screen->IsVisible()");
    if (x < 0 || x >= Screen.bounds.x2 || y < 0 || y >= Screen.bounds.y2) return nullptr;
    GrWindow* best = &Screen;
    for (GrWindow* window = Screen.first; window;) {
        bool const hit = window->IsVisible() &&
            (window->region.Contains(x, y) ||
                (withShadow && window->shadow && window->shadow->Contains(x, y)));
        if (hit) best = window;
        window = hit ? window->first : window->next;
    }
    return best;
}

void GrWindow::Raise()
{
    if (!prev) return;
    GrRegion before, after;
    DoGetClipRegion(before, first, false, true);
    RemoveFromParent();
    InsertToParent();
    DoGetClipRegion(after, first, false, true);
    after -= before;
    ValidRegion -= after;
}

// Shadows count when a window is raised, and do not when it is lowered.
void GrWindow::Lower()
{
    if (!GR_ASSERT_TEXT(parent, "parent != 0") || !next) return;
    GrRegion before, after;
    DoGetClipRegion(before, first, false, false);
    RemoveFromParent();
    prev = parent->last;
    (prev ? prev->next : parent->first) = this;
    parent->last = this;
    DoGetClipRegion(after, first, false, false);
    before -= after;
    ValidRegion -= before;
}

GrContext* GrWindow::GetContext()
{
    if (context) return context;
    if (!GrScreen.createScreenContext) return nullptr;
    GrRegion clip;
    DoGetClipRegion(clip, nullptr, false, true);
    return GrScreen.createScreenContext(clip, bounds.x1, bounds.y1);
}

GrContext* GrWindow::GetNonclipContext()
{
    if (!GrScreen.createScreenContext) return nullptr;
    GrRegion clip;
    DoGetClipRegion(clip, first, false, false);
    return GrScreen.createScreenContext(clip, bounds.x1, bounds.y1);
}

void GrWindow::FreeContext(GrContext* freed) const
{
    if (freed != context) delete freed;
}
