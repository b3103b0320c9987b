#include <tessella/window_state.h>

#include <common/assert.h>
#include <tessella/coordinates.h>
#include <tessella/screen.h>

#include <algorithm>

GrRootWindow Screen;
void (*Callback)(GrEvent const&) = nullptr;
GrRegion ValidRegion;

namespace {

constexpr char kSource[] = GR_SOURCE("tessella/window");

void Send(std::uint32_t type, GrWindow* window, GrRect const& rect = {})
{
    if (!Callback) return;
    GrEvent event;
    event.type = type;
    event.window = window;
    event.rect = rect;
    Callback(event);
}

/// Leaves the lists as they are if the window stands in none.
void Unlink(GrWindow& window)
{
    GrWindow& parent = *window.parent;
    if (window.prev)
        window.prev->next = window.next;
    else if (parent.first == &window)
        parent.first = window.next;
    if (window.next)
        window.next->prev = window.prev;
    else if (parent.last == &window)
        parent.last = window.prev;
    window.prev = window.next = nullptr;
}

GrRect OuterRect(GrRegion const& region)
{
    GrRect rect{};
    region.GetOuterRect(rect);
    return rect;
}

}

void GrWindow::InitWindows()
{
    GR_ASSERT_TEXT(!Screen.IsVisible(), "!Screen->IsVisible()");
    GR_ASSERT_TEXT(!Screen.first, "Screen->first == 0");
    GR_ASSERT_TEXT(!Screen.last, "Screen->last == 0");
    GR_ASSERT_TEXT(Screen.bounds.x1 == 0, "Screen->bounds.x1 == 0");
    GR_ASSERT_TEXT(Screen.bounds.y1 == 0, "Screen->bounds.y1 == 0");
    GR_ASSERT_TEXT(!Callback, "Callback == 0");
    GR_ASSERT(!ValidRegion);
    Screen.flags |= GrWindowVisible;
    Screen.bounds.x2 = static_cast<int>(GrScreen.width);
    Screen.bounds.y2 = static_cast<int>(GrScreen.height);
}

void GrWindow::ShutdownWindows()
{
    Screen.flags &= ~GrWindowVisible;
    Callback = nullptr;
    ValidRegion.Clear();
    Screen.region.Clear();
    Screen.reservedRegion.Clear();
}

void GrWindow::OnVideoModeChanged()
{
    ValidRegion.Clear();
    Screen.reservedRegion.Clear();
    GrRect const whole{0, 0, static_cast<int>(GrScreen.width), static_cast<int>(GrScreen.height)};
    if (whole == Screen.bounds) return;
    Screen.bounds = whole;
    Screen.region = whole;
    Send(GrEventWindowChanged, &Screen, whole);
}

GrWindow* GrWindow::RootWindow()
{
    GR_ASSERT_TEXT(Screen.IsVisible(), "Screen->IsVisible()");
    return &Screen;
}

void GrWindow::SetCallback(void (*callback)(GrEvent const&))
{
    GR_ASSERT_TEXT(Screen.IsVisible(), "Screen->IsVisible()");
    GR_ASSERT_TEXT(callback, "callback != 0");
    Callback = callback;
}

GrWindow::GrWindow(GrWindow* p, int x, int y, int width, int height, void* data) : userData(data), parent(p)
{
    GR_ASSERT_TEXT(p, "p != 0");
    GR_ASSERT_TEXT(Callback, "Callback != 0");
    bounds = {x, y, Moved(x, std::max(width, 0)), Moved(y, std::max(height, 0))};
    region = bounds;
    InsertToParent();
    Send(GrEventWindowCreated, this, bounds);
    Send(GrEventWindowChanged, this, bounds);
}

GrWindow::~GrWindow()
{
    if (this == &Screen) return;  // the end of the program; the application's windows may outlive the root
    GR_ASSERT_TEXT(!first, "first == 0");
    GR_ASSERT_TEXT(!last, "last == 0");
    GR_ASSERT_TEXT(Callback, "Callback != 0");
    for (GrWindow* orphan = first; orphan;) {
        GrWindow* const following = orphan->next;
        orphan->parent = orphan->prev = orphan->next = nullptr;
        orphan = following;
    }
    first = last = nullptr;
    Send(GrEventWindowDestroyed, this);
    if (IsVisible()) FullInvalidate(false);
    RemoveFromParent();
    delete shadow;
}

void GrWindow::InsertToParent()
{
    bool const hasParent = GR_ASSERT_TEXT(parent, "parent!=0");
    GR_ASSERT_TEXT(!next, "next==0");
    GR_ASSERT_TEXT(!prev, "prev==0");
    if (!hasParent) return;
    Unlink(*this);  // linked in twice, a list would run in circles
    next = parent->first;
    (next ? next->prev : parent->last) = this;
    parent->first = this;
}

void GrWindow::RemoveFromParent()
{
    if (GR_ASSERT_TEXT(parent, "parent!=0")) Unlink(*this);
}

void GrWindow::SetParent(GrWindow* newParent)
{
    GR_ASSERT_TEXT(newParent, "nparent!=0");
    RemoveFromParent();
    if (this == &Screen) return;  // a root with a parent would run in circles
    parent = newParent;
    InsertToParent();
}

void GrWindow::Show()
{
    if (IsVisible()) return;
    flags |= GrWindowVisible;
    flags &= ~GrWindowInvalidated;
    FullInvalidate(false);
    Send(GrEventWindowShown, this);
}

void GrWindow::Hide()
{
    if (!IsVisible()) return;
    FullInvalidate(false);
    flags &= ~(GrWindowVisible | GrWindowInvalidated);
    Send(GrEventWindowHidden, this);
}

void GrWindow::Move(int x, int y)
{
    GR_ASSERT_TEXT(Screen.IsVisible(), "Screen->IsVisible()");
    if (!GR_ASSERT_TEXT(parent, "parent != 0")) return;  // the root stays where it is
    int const dx = SeenFrom(x, bounds.x1);
    int const dy = SeenFrom(y, bounds.y1);
    if (dx == 0 && dy == 0) return;
    FullInvalidate(false);
    DoMove(dx, dy);
    flags &= ~GrWindowInvalidated;
    FullInvalidate(false);
    Send(GrEventWindowChanged, this, OuterRect(region));
}

void GrWindow::DoMove(int dx, int dy)
{
    bounds = Moved(bounds, dx, dy);
    region.Offset(dx, dy);
    if (shadow) shadow->Offset(dx, dy);
    for (GrWindow* child = first; child; child = child->next)
        child->DoMove(dx, dy);
}

void GrWindow::SetWindowRegion(GrRegion const& shape)
{
    if (this == &Screen) return;
    FullInvalidate(false);
    region = shape;
    region.Offset(bounds.x1, bounds.y1);
    region.GetOuterRect(bounds);
    if (shadow) *shadow = ShadowOf(region);
    flags &= ~GrWindowInvalidated;
    FullInvalidate(false);
    Send(GrEventWindowChanged, this, bounds);
}
