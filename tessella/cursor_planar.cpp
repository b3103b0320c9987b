#include <tessella/cursor_kinds.h>

#include <tessella/screen.h>
#include <tessella/vga_l.h>

#include <algorithm>
#include <cstddef>

#include <sys/mman.h>

namespace {

enum class Direction : unsigned char { Save, Restore };

/// Byte by byte: each load fills the latches that the store behind it takes.
void CopyThroughLatches(
    unsigned char volatile* target, unsigned char const volatile* source, std::size_t count)
{
    for (std::size_t i = 0; i < count; ++i)
        target[i] = source[i];
}

/// Copies a rectangle of the screen, whole bytes wide, to what lies behind the screen or back from there.
void CopyBytes(GrRect const& rect, Direction direction)
{
    if (rect.IsEmpty() || !GrScreen.fbMemory || GrScreen.fbMemory == MAP_FAILED) return;
    std::size_t const stride = GrScreen.stride, visible = stride * GrScreen.height;
    auto const count = static_cast<std::size_t>((rect.x2 - rect.x1) >> 3);
    // Of a shape that is larger than the memory behind the screen, some rows are not kept.
    std::size_t const room = GrScreen.fbLength > visible ? (GrScreen.fbLength - visible) / count : 0;
    std::size_t const rows = std::min(static_cast<std::size_t>(rect.y2 - rect.y1), room);
    unsigned char* shown = GrScreen.fbMemory + static_cast<std::size_t>(rect.y1) * stride + (rect.x1 >> 3);
    unsigned char* saved = GrScreen.fbMemory + visible;
    for (std::size_t row = 0; row < rows; ++row, shown += stride, saved += count)
        if (direction == Direction::Save)
            CopyThroughLatches(saved, shown, count);
        else
            CopyThroughLatches(shown, saved, count);
}

}

void GrMaskedCursor4::Show()
{
    fullRect = PlaceAt(x, y);
    shownRect = Limited(fullRect);
    if (shownRect.x2 - shownRect.x1 < 1 || !GrScreen.context) return;
    GrRect const wholeBytes{shownRect.x1 & ~7, shownRect.y1, (shownRect.x2 + 7) & ~7, shownRect.y2};
    WriteVgaPort(GrVgaWriteLatches);
    CopyBytes(wholeBytes, Direction::Save);
    WriteVgaPort(GrVgaWriteColor);
    DrawShape(GrScreen.context, shownRect, shownRect.x1 - fullRect.x1, shownRect.y1 - fullRect.y1);
    shownRect = wholeBytes;
}

void GrMaskedCursor4::RestoreRect(GrRect const& /*area*/)
{
    if (!GrScreen.context) return;
    RequestVgaPorts();  // this may be the mouse's thread
    WriteVgaPort(GrVgaWriteLatches);
    CopyBytes(shownRect, Direction::Restore);
}
