#pragma once

#include <tessella/coordinates.h>
#include <tessella/pixel/arc.h>
#include <tessella/pixel/clip_walk.h>
#include <tessella/pixel/colors.h>
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
    void DrawLine(int x1, int y1, int x2, int y2) override;
    void DrawArc(int x, int y, int w, int h, int start, int sweep) override;
    void FillArc(int x, int y, int w, int h, int start, int sweep) override;
    void FillPolygon(std::int16_t const xy[], unsigned count) override;

protected:
    using S::S;

private:
    void DrawColumn(GrRegion const& region, int x) const;
    void DrawRun(GrLineWalker line, std::uint64_t count) const;
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
};

#include <tessella/pixel/context_fill.inl>
#include <tessella/pixel/context_shapes.inl>
