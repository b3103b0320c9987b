#include <tessella/cursor.h>

#include <tessella/coordinates.h>
#include <tessella/cursor_state.h>
#include <tessella/screen.h>
#include <tessella/screen_guard.h>

#include <algorithm>
#include <mutex>

// The cursor is drawn into the framebuffer itself, so it keeps what lies under it. A move by less than its
// size composes the new picture off the screen: what is saved of the overlap, and the fresh pixels of the two
// strips that are new. The strips that it leaves are restored before, and the picture is written in one go,
// so the shape never vanishes between two places.
//
//     +----------------+             to the left and up:   restoreTop lies below the new place,
//     |   new place    |                                   restoreSide to the right of it,
//     |      +---------+------+                            newSide left of the overlap,
//     |      | overlap | side |                            newTop above both
//     +------+---------+------+
//            |       top      |
//            +----------------+ old place

GrCursor::GrCursor(GrImage* shape, GrBitmap* shapeMask, int hotSpotX, int hotSpotY)
    : image(shape), mask(shapeMask), hotX(hotSpotX), hotY(hotSpotY),
      composeImage(std::make_unique<GrImage>(shape->width, shape->height, 0)),
      composeContext(composeImage->GetContext()),
      saveImage(std::make_unique<GrImage>(shape->width, shape->height, 0))
{}

GrCursor::~GrCursor() = default;

void GrCursor::Retire()
{
    std::scoped_lock const lock(screenMutex);
    GrCursor* self = this;
    currentCursor.compare_exchange_strong(self, nullptr);
}

void GrCursor::Activate()
{
    if (saveImage->bytes != static_cast<int>(GrScreen.bytesPerPixel) ||
        saveImage->bits != static_cast<int>(GrScreen.depth))
        return;
    std::scoped_lock const lock(screenMutex);
    GrCursor* const before = currentCursor;
    if (before == this) return;
    bool const first = hideCount.fetch_add(1, std::memory_order_relaxed) == 0;
    int const atX = before ? before->x : static_cast<int>(GrScreen.width >> 1);
    int const atY = before ? before->y : static_cast<int>(GrScreen.height >> 1);
    if (first && before) before->RestoreRect(before->shownRect);
    currentCursor = this;
    x = atX;
    y = atY;
    if (first) GrShowCursor();  // not only drawn, but known to be: a change of mode has hidden the one before
    hideCount.fetch_sub(1, std::memory_order_relaxed);
}

GrRect GrCursor::Limited(GrRect rect)
{
    rect.x1 = std::max(rect.x1, 0);
    rect.y1 = std::max(rect.y1, 0);
    rect.x2 = std::min(rect.x2, static_cast<int>(GrScreen.width));
    rect.y2 = std::min(rect.y2, static_cast<int>(GrScreen.height));
    rect.x1 = std::min(rect.x1, rect.x2);
    rect.y1 = std::min(rect.y1, rect.y2);
    return rect;
}

GrRect GrCursor::PlaceAt(int atX, int atY) const
{
    GrRect const whole{0, 0, image->width, image->height};
    return Moved(whole, SeenFrom(atX, hotX), SeenFrom(atY, hotY));
}

void GrCursor::RestoreRect(GrRect const& area)
{
    if (area.IsEmpty() || !GrScreen.context) return;
    GrScreen.context->DrawImageDirect(area, *saveImage, area.x1 - x + hotX, area.y1 - y + hotY);
}

void GrCursor::Show()
{
    fullRect = PlaceAt(x, y);
    shownRect = Limited(fullRect);
    if (shownRect.x2 - shownRect.x1 < 1 || !GrScreen.context) return;
    if (!overlapRect.IsEmpty()) return ShowAfterShortMove(fullRect.x1, fullRect.y1);
    int const sx = shownRect.x1 - fullRect.x1;
    int const sy = shownRect.y1 - fullRect.y1;
    GrScreen.context->ReadImageDirect(shownRect, *saveImage, sx, sy);
    DrawShape(GrScreen.context, shownRect, sx, sy);
}

void GrCursor::ShowAfterShortMove(int left, int top)
{
    for (GrRect const& strip : {newSideRect, newTopRect})
        GrScreen.context->ReadImageDirect(strip, *composeImage, strip.x1 - left, strip.y1 - top);
    composeContext->DrawImageDirect(Moved(overlapRect, -left, -top), *saveImage, overlapRect.x1 - oldX + hotX,
        overlapRect.y1 - oldY + hotY);
    GrRect const whole{0, 0, image->width, image->height};
    composeContext->ReadImageDirect(whole, *saveImage, 0, 0);
    DrawShape(composeContext.get(), whole, 0, 0);
    GrScreen.context->DrawImageDirect(shownRect, *composeImage, shownRect.x1 - left, shownRect.y1 - top);
    overlapRect.x2 = overlapRect.x1;
}

void GrCursor::Move(int newX, int newY)
{
    std::scoped_lock const lock(screenMutex);
    if (hideCount.load(std::memory_order_relaxed) != 0) return;
    oldX = x;
    oldY = y;
    GrRect const next = PlaceAt(newX, newY);
    if (GrScreen.depth != 4 && next.x1 < fullRect.x2 && next.x1 > SeenFrom(fullRect.x1, image->width) &&
        next.y1 < fullRect.y2 && next.y1 > SeenFrom(fullRect.y1, image->height)) {
        PlanShortMove(next);
        RestoreRect(restoreTopRect);
        RestoreRect(restoreSideRect);
    } else {
        RestoreRect(shownRect);
    }
    x = newX;
    y = newY;
    Show();
}

void GrCursor::PlanShortMove(GrRect const& next)
{
    GrRect const& old = fullRect;
    bool const toLeft = next.x1 <= old.x1;
    bool const up = next.y1 <= old.y1;
    GrRange const overlapX = toLeft ? GrRange{old.x1, next.x2} : GrRange{next.x1, old.x2};
    GrRange const overlapY = up ? GrRange{old.y1, next.y2} : GrRange{next.y1, old.y2};
    GrRange const leftX = toLeft ? GrRange{next.x2, old.x2} : GrRange{old.x1, next.x1};
    GrRange const leftY = up ? GrRange{next.y2, old.y2} : GrRange{old.y1, next.y1};
    GrRange const gainedX = toLeft ? GrRange{next.x1, old.x1} : GrRange{old.x2, next.x2};
    GrRange const gainedY = up ? GrRange{next.y1, old.y1} : GrRange{old.y2, next.y2};
    auto const onScreen = [](GrRange const& xs, GrRange const& ys) {
        return Limited({xs.r1, ys.r1, xs.r2, ys.r2});
    };
    overlapRect = onScreen(overlapX, overlapY);
    restoreTopRect = onScreen({old.x1, old.x2}, leftY);
    restoreSideRect = onScreen(leftX, overlapY);
    newSideRect = onScreen(gainedX, overlapY);
    newTopRect = onScreen({next.x1, next.x2}, gainedY);
}
