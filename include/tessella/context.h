#pragma once

#include <tessella/color.h>
#include <tessella/export.h>
#include <tessella/region.h>
#include <tessella/types.h>

#include <cstdint>

/// The raster mode that paints in the fore and back colours; every other value inverts the pixels.
enum : std::uint32_t { GrRasterModeCopy = 4 };

/// The one drawing interface, over the screen as well as over images in memory.
///
/// A context has a clip region, an origin, two colours, an 8 by 8 pattern and a raster mode. All operations
/// take context coordinates; the surface coordinate of a point is its context coordinate plus the origin.
/// Nothing is ever painted outside the clip region, and drawing reports nothing: where the clip is empty,
/// nothing happens. If memory runs out, `std::bad_alloc` leaves the operation and the context stays usable.
///
/// Whoever made a context deletes it. It does not own the pixels that it draws on, which must outlive it, and
/// the region that it is limited to must lie on them: nothing checks that.
///
/// Contexts are for one thread at a time, whichever surface they draw on. Those of the screen keep clear of
/// the library's own input threads by themselves.
///
/// The operations are declared in the order of their table, which is part of the library's interface.
class GR_API GrContext {
public:
    GrContext() = default;
    GrContext(GrContext const&) = delete;
    GrContext& operator=(GrContext const&) = delete;
    virtual ~GrContext() = default;

    /// Restricts drawing to `region` (context coordinates, as the origin is now), within the context's limit.
    /// The clip lies on the surface: a later `SetOrigin` does not move it.
    virtual void SetClipRegion(GrRegion const& region) = 0;
    /// Writes the clip region, in context coordinates, into `region`.
    virtual void GetClipRegion(GrRegion& region) = 0;
    /// Takes a rectangle away from the clip.
    virtual void ExcludeClipRect(GrRect const& rect) = 0;
    /// Takes a region away from the clip.
    virtual void ExcludeClipRegion(GrRegion const& region) = 0;
    /// Makes the clip as large as the context's limit again.
    virtual void ResetClipRegion() = 0;
    /// Writes the smallest rectangle around the clip, in context coordinates, into `rect`; around an empty
    /// clip, the empty rectangle at surface point (0, 0).
    virtual void GetClipRect(GrRect& rect) = 0;

    /// Puts context point (0, 0) at `x`, `y` from the context's base origin.
    virtual void SetOrigin(int x, int y) = 0;
    /// Where context point (0, 0) lies, from the context's base origin.
    virtual void GetOrigin(int& x, int& y) = 0;

    /// Chooses the colour of clear pattern bits, converted to a pixel value once, here.
    virtual void SetBackColor(GrColor color) = 0;
    /// Chooses the colour of set pattern bits, converted to a pixel value once, here.
    virtual void SetForeColor(GrColor color) = 0;

    /// Chooses the pattern, copied from eight bytes, one a row, bit 0 being the leftmost pixel. It is
    /// anchored to the surface, not to the origin, and moved by `dx` to the right and `dy` downward, of any
    /// sign. A clear bit paints the back colour, or nothing if `transparent` is set. A new context's pattern
    /// is all ones.
    virtual void SetPattern(std::uint8_t const bits[8], int dx, int dy, bool transparent) = 0;

    /// `GrRasterModeCopy`, or any other value to invert pixels.
    virtual void SetRasterMode(std::uint32_t mode) = 0;
    /// The value last set; `GrRasterModeCopy` in a new context.
    virtual std::uint32_t GetRasterMode() = 0;

    /// The colour of one pixel; 0 outside the clip, as is a black pixel inside it, and where there are no
    /// pixels. Only true-colour images give an alpha value.
    virtual GrColor GetPixel(int x, int y) = 0;
    /// Paints one pixel through pattern and raster mode.
    virtual void DrawPixel(int x, int y) = 0;
    /// Paints a region through pattern and raster mode.
    virtual void FillRegion(GrRegion const& region) = 0;

    /// Paints a line between two points, both included, through pattern and raster mode. It is always drawn
    /// from its upper end, so the two may change places.
    virtual void DrawLine(int x1, int y1, int x2, int y2) = 0;

    /// Paints the outline of an ellipse, or an arc of it, through pattern and raster mode. The ellipse
    /// reaches from column `x` to `x` + `w` and from row `y` to `y` + `h`, ends included; if one is below 0,
    /// nothing is painted. Angles are in 64ths of a degree, 0 at 3 o'clock and growing anticlockwise: the arc
    /// begins at `start` and covers `sweep`, clockwise if that is negative; 23040 or more either way is the
    /// whole ellipse. An arc that lies within one quadrant reaches back along the ellipse to where the
    /// quadrant begins, at its smallest angle. With `w` 0 or 1, only the middle row or two rows are painted.
    virtual void DrawArc(int x, int y, int w, int h, int start, int sweep) = 0;
    /// Paints what lies inside the outline that `DrawArc` paints with the same arguments: an ellipse or a
    /// pie, with its tip at the centre, no pixel twice except that the two cut edges of a pie may meet in
    /// some. With `w` or `h` below 2, nothing is painted. Of very tall ellipses the rows at both ends may
    /// stay unpainted.
    virtual void FillArc(int x, int y, int w, int h, int start, int sweep) = 0;

    /// Paints a polygon through pattern and raster mode. `xy` holds the x and the y of each of its `count`
    /// vertices; fewer than 3 paint nothing. It is meant for polygons that a horizontal line cuts at most
    /// twice: each row is painted from the edges on one side to those on the other, the rightmost column and
    /// the lowest row excluded, so that polygons with common edges share no pixel.
    virtual void FillPolygon(std::int16_t const xy[], unsigned count) = 0;

    /// Does nothing, unless the context can copy from another: then it fills the rectangle `dst` from
    /// `source`, whose point `sx`, `sy`, in its own context coordinates, goes to the top left corner.
    virtual void CopyFromContext(GrRect const& dst, GrContext* source, int sx, int sy);
};

/// What contexts over images offer beyond `GrContext`.
class GR_API GrContextI : public GrContext {
public:
    /// Puts both the base origin and the origin at surface point `x`, `y`.
    virtual void SetBaseOrigin(int x, int y) = 0;
    /// Sets the outermost bound of the clip, relative to the base origin, and resets the clip to it. It must
    /// lie within the image: nothing checks that.
    virtual void SetLimitRegion(GrRegion const& region) = 0;
};
