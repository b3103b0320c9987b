#pragma once

#include <tessella/cursor.h>

/// A cursor whose shape are the set pixels of a mask.
class GrMaskedCursor : public GrCursor {
public:
    GrMaskedCursor(GrImage* shape, GrBitmap* shapeMask, int hotSpotX, int hotSpotY)
        : GrCursor(shape, shapeMask, hotSpotX, hotSpotY)
    {}
    ~GrMaskedCursor() override { Retire(); }
    void DrawShape(GrContext* target, GrRect const& where, int sx, int sy) override;
};

/// The same in the 4-plane mode, where the screen cannot be read: a byte is loaded into the latches of the
/// graphics controller, and stored with all of its planes behind the last visible row. So what is saved are
/// whole bytes of 8 pixels, row after row without gaps.
class GrMaskedCursor4 final : public GrMaskedCursor {
public:
    using GrMaskedCursor::GrMaskedCursor;
    ~GrMaskedCursor4() override { Retire(); }
    void Show() override;
    /// All that is shown, whatever the area.
    void RestoreRect(GrRect const& area) override;
};
