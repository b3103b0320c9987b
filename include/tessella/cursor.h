#pragma once

#include <tessella/bitmap.h>
#include <tessella/context.h>
#include <tessella/export.h>
#include <tessella/image.h>
#include <tessella/types.h>

#include <cstdint>
#include <memory>

/// The picture of the pointer. At most one cursor is current; it follows the mouse by itself, on the mouse's
/// thread, even while the application is busy. Drawing on the screen takes it away where they meet, and puts
/// it back.
///
/// The application makes cursors, has one shown and deletes them, on its own thread during a session. After a
/// change of mode no cursor is current, and new ones must be made: they belong to the mode that they were
/// made in. All else here is for the library.
class GR_API GrCursor {
public:
    /// A new cursor with its hot spot, the pixel that points, at `hotX`, `hotY` of `image`, whose size is the
    /// cursor's. Cursor and caller part here: the cursor owns image and mask. The caller deletes the cursor.
    ///
    /// With a mask, of the image's size, its set pixels are shown; the image must be in the screen's format.
    /// With null, a true-colour image is blended by its alpha plane, which it must have; on a VGA's screen of
    /// 16 colours such a cursor can't put back what it has covered.
    static GrCursor* CreateInstance(GrImage* image, GrBitmap* mask, int hotX, int hotY);

    GrCursor(GrCursor const&) = delete;
    GrCursor& operator=(GrCursor const&) = delete;
    /// If the cursor is the current one, none is from now on; its picture stays until something is painted
    /// there.
    virtual ~GrCursor();

    /// Makes the cursor the current one, where the one before stood, or without one in the middle of the
    /// screen, until the pointer moves or something is drawn: so activate a new one before deleting the old.
    /// Nothing happens if it was made in another mode.
    virtual void Activate();

    /// Draws the part of the shape from its pixel `sx`, `sy` on to the rectangle `where` of a surface, in
    /// surface coordinates, unclipped.
    virtual void DrawShape(GrContext* target, GrRect const& where, int sx, int sy) = 0;

    /// Puts back what lies under the cursor in `area` of the screen, which it covers. Under the screen's
    /// lock.
    virtual void RestoreRect(GrRect const& area);

    /// Saves what lies under the cursor and draws it. Under the screen's lock.
    virtual void Show();

    /// Moves the hot spot to a point of the screen, or nothing while drawing holds the screen: then that puts
    /// the cursor to the pointer's latest place. Any thread.
    GR_INTERNAL void Move(int newX, int newY);

protected:
    /// For the classes that know how to draw the shape.
    GR_INTERNAL GrCursor(GrImage* shape, GrBitmap* shapeMask, int hotSpotX, int hotSpotY);

    /// Ceases to be current. The first thing in each destructor of a class that can be made: until then the
    /// mouse's thread may be drawing the shape.
    GR_INTERNAL void Retire();

    /// Where the shape lies with its hot spot at a point of the screen.
    GR_INTERNAL GrRect PlaceAt(int atX, int atY) const;
    /// What of a rectangle is on the screen; empty where nothing is.
    GR_INTERNAL static GrRect Limited(GrRect rect);

    std::unique_ptr<GrImage> const image;  ///< the shape
    std::unique_ptr<GrBitmap> const mask;  ///< null for shapes with alpha
    std::int32_t const hotX;               ///< the hot spot, in the image
    std::int32_t const hotY;               ///< the same

    // All that changes is guarded by the screen's lock.
    std::int32_t x = 0;        ///< where the hot spot is on the screen
    std::int32_t y = 0;        ///< the same
    std::int32_t oldX = 0;     ///< the same before the last move
    std::int32_t oldY = 0;     ///< the same
    GrRect shownRect{};        ///< what the drawn cursor covers of the screen
    GrRect fullRect{};         ///< the same with what lies beside the screen
    GrRect overlapRect{};      ///< what the places before and after a short move have in common
    GrRect restoreTopRect{};   ///< what such a move leaves, above or below
    GrRect restoreSideRect{};  ///< what it leaves at the side of the overlap
    GrRect newSideRect{};      ///< what it gains at the side of the overlap
    GrRect newTopRect{};       ///< what it gains above or below

    std::unique_ptr<GrImage> const composeImage;      ///< where the picture after a short move is made
    std::unique_ptr<GrContext> const composeContext;  ///< over it
    std::unique_ptr<GrImage> const saveImage;         ///< the pixels under the drawn cursor

private:
    friend class GrScreenGuard;
    friend void GrHideCursor();

    GR_INTERNAL void PlanShortMove(GrRect const& next);
    GR_INTERNAL void ShowAfterShortMove(int left, int top);
};
