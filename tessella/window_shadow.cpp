#include <tessella/window_state.h>

#include <tessella/coordinates.h>
#include <tessella/image.h>
#include <tessella/screen.h>

#include <algorithm>
#include <memory>
#include <utility>

// A shadow is a dark copy of what lies under it. There is no transparency in the tree, so the windows below
// paint what is to be seen of them into an image, which is darkened and put on the screen. Their handlers
// notice nothing: the image's context is what they get for their window's.

namespace {

constexpr int kShadowOffset = 5;  // to the right, and downward
constexpr std::uint8_t kShadowAlpha = 40;

/// Has a window paint off screen while it lives.
class OffScreen {
public:
    OffScreen(GrWindow& window, GrContext* context)
        : painted(window), before(std::exchange(window.context, context))
    {}
    OffScreen(OffScreen const&) = delete;
    OffScreen& operator=(OffScreen const&) = delete;
    ~OffScreen() { painted.context = before; }

private:
    GrWindow& painted;
    GrContext* const before;  // not null if the window's handler has asked for paint within a pass
};

/// Empty bands count, too: cutting such a region fills the rows behind them.
bool IsWithin(GrRegion const& region, GrRect const& rect)
{
    for (int i = 0; i < region.bands.item_count; ++i) {
        auto const& band = region.bands.items[i];
        if (band.r1 < rect.y1 || band.r2 > rect.y2) return false;
        for (int j = 0; j < band.item_count; ++j)
            if (band.items[j].r1 < rect.x1 || band.items[j].r2 > rect.x2) return false;
    }
    return true;
}

/// An image has no room for what lies beyond it, and merges of regions with gaps between their rows may give
/// pixels that neither of them has. What is cut out of a rectangle lies in it.
void KeepWithin(GrRegion& region, GrRect const& rect)
{
    if (IsWithin(region, rect)) return;
    GrRegion missing = rect;
    missing -= region;
    region = rect;
    region -= missing;
}

/// Leaves what comes behind the point, from top to bottom and from left to right.
void DropUpTo(GrRegion& region, int x, int y)
{
    GrRect outer{};
    region.GetOuterRect(outer);
    // Between rows with gaps the operators may leave or lose pixels. What is cut out of a rectangle has none.
    GrRegion missing = outer;
    missing -= region;
    region = GrRect{outer.x1, y, outer.x2, outer.y2};
    region -= GrRect{outer.x1, y, x + 1, y + 1};
    region -= missing;
}

/// Has each window that is seen in `area`, shadows aside, paint its part of it into the image behind
/// `context`, which stands for the screen's rectangle `rect`.
void PaintBelow(GrContextI& context, GrRect const& rect, GrRegion const& area)
{
    GrRegion rest = area;
    while (rest) {
        int x = 0, y = 0;
        rest.GetSomePoint(x, y);
        GrRegion part = rest;
        GrEvent event;
        WalkPaint(part, event, false);
        KeepWithin(part, rect);
        GrWindow& window = *event.window;
        int const left = window.bounds.x1, top = window.bounds.y1;
        part.Offset(-left, -top);
        context.SetBaseOrigin(SeenFrom(left, rect.x1), SeenFrom(top, rect.y1));
        context.SetLimitRegion(part);
        if (Callback) {
            OffScreen const pass(window, &context);
            Callback(event);
        }
        part.Offset(left, top);
        rest -= part;
        // Shapes with gaps between their rows may own a point that their clip leaves out.
        int nextX = 0, nextY = 0;
        rest.GetSomePoint(nextX, nextY);
        if (rest && std::pair(nextY, nextX) <= std::pair(y, x)) DropUpTo(rest, x, y);
    }
}

/// Limits the screen's own context while it lives.
class ScreenClip {
public:
    ScreenClip(GrContext& screen, GrRegion const& area) : context(screen) { context.SetClipRegion(area); }
    ScreenClip(ScreenClip const&) = delete;
    ScreenClip& operator=(ScreenClip const&) = delete;
    ~ScreenClip() { context.ResetClipRegion(); }

private:
    GrContext& context;
};

/// Paints the shadow in `area`, which lies in `rect`.
void PaintShadowRect(GrRect const& wholeRect, GrRegion area)
{
    if (!area || !GrScreen.context) return;
    // Windows may be far larger than the screen. The corner stays: patterns are aligned with it.
    GrRect const rect{wholeRect.x1, wholeRect.y1, std::min(wholeRect.x2, Screen.bounds.x2),
        std::min(wholeRect.y2, Screen.bounds.y2)};
    if (rect.IsEmpty()) return;
    KeepWithin(area, rect);
    GrImage image(SeenFrom(rect.x2, rect.x1), SeenFrom(rect.y2, rect.y1), 0);
    // What is made for an image is a context of images.
    std::unique_ptr<GrContextI> const context(static_cast<GrContextI*>(GrScreen.createImageContext(&image)));
    PaintBelow(*context, rect, area);
    if (!GrScreen.context) return;  // a handler has ended the session or lost the mode

    context->SetBaseOrigin(SeenFrom(0, rect.x1), SeenFrom(0, rect.y1));
    context->SetLimitRegion(area);
    context->SetForeColor(0);
    context->FillRegionAlpha(rect, kShadowAlpha);

    ScreenClip const clip(*GrScreen.context, area);
    GrScreen.context->DrawImage(rect, image, 0, 0);
}

}

GrRegion ShadowOf(GrRegion const& shape)
{
    GrRegion shadow = shape;
    shadow.Offset(kShadowOffset, kShadowOffset);
    shadow -= shape;
    return shadow;
}

void GrWindow::SetShadowed(bool shadowed)
{
    if (shadowed == (shadow != nullptr)) return;
    if (shadowed) {
        shadow = new GrRegion(ShadowOf(region));
        flags |= GrWindowShadowed;
        flags &= ~GrWindowInvalidated;
        FullInvalidate(false);
    } else {
        FullInvalidate(false);
        delete std::exchange(shadow, nullptr);
        flags &= ~GrWindowShadowed;
    }
}

// A window that is a rectangle has an L for a shadow. Each of its strips gets an image of its own, so that
// none is as large as the window.
void GrWindow::DrawShadow(GrRegion& area)
{
    GrRect const moved = Moved(bounds, kShadowOffset, kShadowOffset);
    for (GrRect const& strip :
        {GrRect{bounds.x2, moved.y1, moved.x2, bounds.y2}, GrRect{moved.x1, bounds.y2, moved.x2, moved.y2}}) {
        GrRegion part = area;
        part &= strip;
        PaintShadowRect(strip, part);
        area -= part;
    }
    GrRect rest{};
    area.GetOuterRect(rest);
    PaintShadowRect(rest, area);
}
