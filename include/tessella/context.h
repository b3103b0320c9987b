#pragma once

#include <tessella/color.h>
#include <tessella/export.h>
#include <tessella/region.h>
#include <tessella/types.h>

#include <cstdint>

class GrBitmap;
class GrFont;
class GrImage;

/// How `GrContext::DrawImageAlpha` blends.
struct GrBlendParams {
    bool overDestination;  ///< over what the surface holds; else over the back colour, everywhere
    bool dither;           ///< diffuse the error of converting, in formats of at most 16 bits
    bool uniformAlpha;     ///< `alpha` holds for all pixels; else each has its own in the alpha plane
    std::uint8_t alpha;    ///< 0 transparent to 255 opaque
};
static_assert(sizeof(GrBlendParams) == 4);

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
/// A VGA's screen of 16 colours can't be read back. There `GetPixel` gives black, blending is over the back
/// colour, whatever `overDestination` says, and `ReadImage` gives nothing of use. Pixels that share a byte
/// with one that is painted, eight side by side, may change, and inverting twice doesn't bring back what was.
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
    /// Blends the fore colour over the smallest rectangle around `region`, holes included, with the same
    /// alpha everywhere, 0 transparent to 255 opaque. Formats of at most 16 bits diffuse errors.
    virtual void FillRegionAlpha(GrRegion const& region, std::uint8_t alpha) = 0;

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

    /// Draws `length` characters, each byte being one, with the pen beginning at `x` on the baseline `y`. A
    /// character without a glyph is left out. Bitmap glyphs are drawn as by `DrawBitmapTransparent`, grey
    /// ones blend the fore colour over what is there. Unless `transparent` is set, the back colour is painted
    /// behind: in the boxes of the glyphs, where bitmap glyphs then ignore pattern and raster mode, and in
    /// the rest of the cells, from the first pen to the last and as high as the font. Kerning moves a glyph,
    /// but not the pen. A font that emboldens strikes each glyph a second time, one pixel to the right,
    /// behind a column of back colour if that is painted, and the pen moves one pixel further. Nothing
    /// happens if the font is not valid. It must not be null and must derive from `GrFontBase`.
    virtual void DrawText(
        int x, int y, unsigned char const* text, unsigned length, GrFont* font, bool transparent) = 0;
    /// The same for 16-bit characters.
    virtual void DrawTextW(
        int x, int y, unsigned short const* text, unsigned length, GrFont* font, bool transparent) = 0;

    /// Paints the set pixels of a bitmap in the fore colour and the clear ones in the back colour, with its
    /// top left corner at `x`, `y`. Pattern and raster mode are not looked at.
    virtual void DrawBitmap(int x, int y, GrBitmap const& bitmap) = 0;
    /// Paints the set pixels of a bitmap through pattern and raster mode and leaves the clear ones alone.
    virtual void DrawBitmapTransparent(int x, int y, GrBitmap const& bitmap) = 0;

    /// Copies those pixels of an image to the rectangle `dst` that are set in `mask`, which belongs to the
    /// image: pixel `sx`, `sy` of both goes to the top left corner. Does nothing if the image and the mask
    /// are of different sizes. The image must be in the context's own format: nothing tests or converts it.
    /// As with all operations on images, the pixels that are asked for must lie in the image: only the
    /// surface clips.
    virtual void DrawImageMasked(
        GrRect const& dst, GrImage const& image, GrBitmap const& mask, int sx, int sy) = 0;
    /// Copies an image to the rectangle `dst`; its pixel `sx`, `sy` goes to the top left corner.
    ///
    /// An image with an alpha plane is blended as its flags say, see `DrawImageAlpha`: if it is not of true
    /// colour, that is reported by a failed assertion and nothing is drawn. Others are copied as they are if
    /// their `bits` and `bytes` are those of the context's format, which is fast. All others are converted as
    /// `CopyFromContext` does, without diffusing errors; pixels that are not in the image become black then.
    /// Nothing is drawn if the image's format has no context.
    virtual void DrawImage(GrRect const& dst, GrImage const& image, int sx, int sy) = 0;
    /// Blends a true-colour image into the rectangle `dst`, or the fore colour if `image` is null; its pixel
    /// `sx`, `sy` goes to the top left corner. An image without pixels, but with an alpha plane, gives the
    /// fore colour its shape. Pixels are expected to be multiplied by the alpha of the image's own plane
    /// already; a uniform alpha is multiplied in here.
    ///
    /// With `overDestination`, alpha 0 leaves a pixel alone; otherwise it takes the back colour. Products are
    /// shifted, not rounded, so that blends come out a little dark, and a sum above 255 runs over into the
    /// next channel.
    ///
    /// An image that is not of true colour is reported by a failed assertion and not drawn. Nor is anything
    /// drawn if `uniformAlpha` is not set and there is no alpha plane.
    virtual void DrawImageAlpha(
        GrRect const& dst, GrImage const* image, int sx, int sy, GrBlendParams const& params) = 0;
    /// Copies the rectangle `src` of the surface to an image, from its pixel `dx`, `dy` on. If `bits` and
    /// `bytes` of the image are those of the context's format, pixels outside the clip are not written, and
    /// the others must lie in the image. Otherwise the pixels are converted, those outside the clip become
    /// black, and the image's bounds hold.
    virtual void ReadImage(GrRect const& src, GrImage& image, int dx, int dy) = 0;

    /// `DrawImageMasked` without clip, origin and lock, for callers that have clipped already: `dst` is in
    /// surface coordinates and must lie on the surface, and on the screen nobody else may draw meanwhile.
    virtual void DrawImageMaskedDirect(
        GrRect const& dst, GrImage const& image, GrBitmap const& mask, int sx, int sy) = 0;
    /// `DrawImage` in the same way, for images in the context's own format only: nothing tests or converts
    /// it, and an alpha plane is not looked at.
    virtual void DrawImageDirect(GrRect const& dst, GrImage const& image, int sx, int sy) = 0;
    /// `DrawImageAlpha` in the same way, for true-colour images only; `image` is not null.
    virtual void DrawImageAlphaDirect(
        GrRect const& dst, GrImage const* image, int sx, int sy, GrBlendParams const& params) = 0;
    /// `ReadImage` in the same way, for images in the context's own format only.
    virtual void ReadImageDirect(GrRect const& src, GrImage& image, int dx, int dy) = 0;

    /// Fills the rectangle `dst` from another context, whose point `sx`, `sy`, in its own context
    /// coordinates, goes to the top left corner, converting each colour. Where the source's `GetPixel` yields
    /// 0, as outside its clip, the pixel becomes black. Within one surface, pixels are copied from the top
    /// left on, also those that have been painted just before: overlaps are not taken care of. Contexts that
    /// cannot copy do nothing, and neither does any with a null `source`.
    virtual void CopyFromContext(GrRect const& dst, GrContext* source, int sx, int sy);
};

/// What contexts over images offer beyond `GrContext`.
class GR_API GrContextI : public GrContext {
public:
    /// Fills the whole image from a stream of pixels: what `GrImage::Load` does, with the flags that the
    /// image had when the context was made. `data` and `step` are as there.
    virtual void LoadPixels(std::uint8_t const* data, unsigned step) = 0;
    /// Fills the image from a stream of pixels as `LoadPixels` does, diffusing the errors of the conversion
    /// whatever the flags say. `alpha` is null or holds one value for each pixel of the image: pixels with a
    /// value below 255 are left alone. Fourth bytes of the stream are not looked at. Does nothing in formats
    /// of 24 and 32 bits.
    virtual void LoadPixelsDithered(std::uint8_t const* data, std::uint8_t const* alpha, unsigned step) = 0;
    /// Writes the whole image as a stream of pixels: what `GrImage::Unload` does. `data` and `step` are as
    /// there.
    virtual void UnloadPixels(std::uint8_t* data, unsigned step) = 0;

    /// Puts both the base origin and the origin at surface point `x`, `y`.
    virtual void SetBaseOrigin(int x, int y) = 0;
    /// Sets the outermost bound of the clip, relative to the base origin, and resets the clip to it. It must
    /// lie within the image: nothing checks that.
    virtual void SetLimitRegion(GrRegion const& region) = 0;
};
