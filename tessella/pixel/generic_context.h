#pragma once

#include <common/assert.h>
#include <tessella/coordinates.h>
#include <tessella/font.h>
#include <tessella/pixel/arc.h>
#include <tessella/pixel/bits_rows.h>
#include <tessella/pixel/blend_rows.h>
#include <tessella/pixel/clip_walk.h>
#include <tessella/pixel/color_source.h>
#include <tessella/pixel/colors.h>
#include <tessella/pixel/convert_rows.h>
#include <tessella/pixel/edge_walker.h>
#include <tessella/pixel/generic_surface.h>
#include <tessella/pixel/line_walker.h>
#include <tessella/pixel/polygon_walker.h>
#include <tessella/region_cut.h>

/// The drawing operations that move pixel values converted once, when the colour was set. `S` is the surface
/// layer: where the pixels lie, and how wide they are.
template <typename S>
class GrGenericContextBase : public S {
public:
    void GetClipRect(GrRect& rect) override;
    void SetRasterMode(std::uint32_t mode) override { this->rasterMode = mode; }
    std::uint32_t GetRasterMode() override { return this->rasterMode; }
    void DrawPixel(int x, int y) override;
    void FillRegion(GrRegion const& region) override;
    void FillRegionAlpha(GrRegion const& region, std::uint8_t alpha) override;
    void DrawLine(int x1, int y1, int x2, int y2) override;
    void DrawArc(int x, int y, int w, int h, int start, int sweep) override;
    void FillArc(int x, int y, int w, int h, int start, int sweep) override;
    void FillPolygon(std::int16_t const xy[], unsigned count) override;
    void DrawText(
        int x, int y, unsigned char const* text, unsigned length, GrFont* font, bool transparent) override
    {
        DrawCharacters(x, y, text, length, *font, transparent);
    }
    void DrawTextW(
        int x, int y, unsigned short const* text, unsigned length, GrFont* font, bool transparent) override
    {
        DrawCharacters(x, y, text, length, *font, transparent);
    }
    void DrawBitmap(int x, int y, GrBitmap const& bitmap) override;
    void DrawBitmapTransparent(int x, int y, GrBitmap const& bitmap) override;
    void DrawImageMasked(
        GrRect const& dst, GrImage const& image, GrBitmap const& mask, int sx, int sy) override;
    void DrawImageMaskedDirect(
        GrRect const& dst, GrImage const& image, GrBitmap const& mask, int sx, int sy) override;
    void DrawImageDirect(GrRect const& dst, GrImage const& image, int sx, int sy) override;
    void ReadImageDirect(GrRect const& src, GrImage& image, int dx, int dy) override;

protected:
    using S::S;

    GrRect OnSurface(GrRect const& rect) const { return Moved(rect, this->originX, this->originY); }
    GrRect InContext(GrRect const& rect) const
    {
        return {SeenFrom(rect.x1, this->originX), SeenFrom(rect.y1, this->originY),
            SeenFrom(rect.x2, this->originX), SeenFrom(rect.y2, this->originY)};
    }

    /// Visits the clip within `target` (surface coordinates), range by range, with the screen's guard held:
    /// `visit` gets the range's columns and rows and the source point that goes to its top left, while `sx`,
    /// `sy` goes to that of the target.
    template <typename Visit>
    void WalkClip(GrRect const& target, int sx, int sy, Visit const& visit);

    /// False for rectangles that select no pixel, or where there are none.
    bool HasPixelsIn(GrRect const& rect) const { return !rect.IsEmpty() && this->HasPixels(); }

    void MaskedRows(
        GrRange xRange, GrRange yRange, GrImage const& image, GrBitmap const& mask, int sx, int sy) const;

    /// Paints bits from surface point `x`, `y` on: set ones through pattern and raster mode and no others, or
    /// all of them in the fore and back colour.
    void DrawBits(int x, int y, GrBits const& bits, bool transparent);

private:
    /// The row that begins at an address of the surface.
    unsigned char* RowAt(std::uintptr_t address) const
    {
        unsigned char* const base = this->PixelBase();
        return base + static_cast<std::ptrdiff_t>(address - reinterpret_cast<std::uintptr_t>(base));
    }
    void DrawColumn(GrRegion const& region, int x) const;
    void DrawRun(GrLineWalker line, std::uint64_t count) const;
    void DrawSolidRun(GrLineWalker const& line, std::uint64_t count) const;
    void DrawOutline(GrArcState const& arc) const;
    template <typename Paint>
    static void WalkOutline(GrEllipseWalk walk, Paint paint);
    void FillEllipse(GrEllipseWalk walk, GrRegion const& region) const;
    void FillWedges(GrArcState const& arc) const;

    /// Paints the pixels of `line`, a rectangle one row high, that belong to `region`; `row` is where its row
    /// begins.
    void FillScan(unsigned char* row, GrRegion const& region, GrRect const& line) const;
    /// The same with all lines that `walker` gives, one in each row.
    template <typename Walker>
    void FillLines(GrRegion const& region, Walker& walker) const;

    class TextBack;
    class TextInk;
    template <typename Character>
    void DrawCharacters(int x, int y, Character const* text, unsigned length, GrFont& font, bool transparent);
    /// Draws a glyph whose bitmap goes to `box`, in surface coordinates; and once more, a pixel beside it.
    void StrikeGlyph(GrRect const& box, GrGlyphInfo const& glyph, bool transparent);
    void Embolden(GrRect const& box, GrGlyphInfo const& glyph, bool transparent);
};

/// The drawing operations that convert between colours and pixels.
template <typename S, GrColorsPolicy Colors>
class GrGenericContext : public GrGenericContextBase<S>, public Colors {
    static_assert(sizeof(typename S::Pixel) == sizeof(typename Colors::Pixel));

public:
    using Pixel = typename Colors::Pixel;

    using GrGenericContextBase<S>::GrGenericContextBase;

    void SetBackColor(GrColor color) override { this->backColor = Colors::ToPixel(color); }
    void SetForeColor(GrColor color) override { this->foreColor = Colors::ToPixel(color); }
    GrColor GetPixel(int x, int y) override;
    void DrawImage(GrRect const& dst, GrImage const& image, int sx, int sy) override;
    void DrawImageAlpha(
        GrRect const& dst, GrImage const* image, int sx, int sy, GrBlendParams const& params) override;
    void ReadImage(GrRect const& src, GrImage& image, int dx, int dy) override;
    void DrawImageAlphaDirect(
        GrRect const& dst, GrImage const* image, int sx, int sy, GrBlendParams const& params) override;
    void CopyFromContext(GrRect const& dst, GrContext* source, int sx, int sy) override;

    /// For others to copy from: where the pixels lie that the clip lets through, and what `GetPixel` yields
    /// for `count` pixels from `x`, `y` on. It is either put into `room`, or lies where the pixels do.
    GrPixelExtent ExtentOfClip() const;
    GrColor const* ReadClipped(int x, int y, int count, GrColor* room) const;

private:
    static constexpr char kSource[] = GR_SOURCE("tessella/context");

    /// All other images are converted pixel by pixel.
    static bool HasOwnFormat(GrImage const& image)
    {
        return image.bits == Colors::kBits && image.bytes == S::kBytes;
    }

    void BlendRange(GrRange xRange, GrRange yRange, GrImage const* image, int sx, int sy,
        GrBlendParams const& params) const;
};

#include <tessella/pixel/context_bits.inl>
#include <tessella/pixel/context_blend.inl>
#include <tessella/pixel/context_convert.inl>
#include <tessella/pixel/context_fill.inl>
#include <tessella/pixel/context_shapes.inl>
#include <tessella/pixel/context_text.inl>
