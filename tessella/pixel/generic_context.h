#pragma once

#include <tessella/coordinates.h>
#include <tessella/pixel/clip_walk.h>
#include <tessella/pixel/colors.h>
#include <tessella/pixel/generic_surface.h>
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

protected:
    using S::S;
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
