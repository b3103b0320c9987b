#pragma once

#include <tessella/pixel/colors.h>
#include <tessella/pixel/error_rows.h>
#include <tessella/pixel/surface.h>

#include <cstring>
#include <optional>

/// A rectangle to blend, clipped already, and what to blend into it.
struct GrBlend {
    GrRows target;
    unsigned char const* colors;  ///< the source's, `GrColor` values; null: the fore colour everywhere
    unsigned char const* alphas;  ///< the source's, one a pixel; null: `alpha` everywhere
    int sourceWidth;              ///< pixels from row to row of both
    std::uint8_t alpha;
    bool overDestination;      ///< over what the target holds; else over the back colour
    std::uint32_t fore, back;  ///< pixels
    std::int32_t* errors;      ///< room for the rows of a `GrErrorRows`; null: errors are not diffused
};

/// Each channel times `alpha` / 256; the alpha is left out.
constexpr GrColor Faded(GrColor color, unsigned alpha)
{
    return (color & 0xFF) * alpha >> 8 | ((color >> 8 & 0xFF) * alpha & 0xFF00) |
        ((color >> 16 & 0xFF) * alpha << 8 & 0xFF0000);
}

/// A colour, multiplied by its alpha already, over another, of which `rest` / 256 shows through. There is no
/// rounding, and nothing stops a sum at 255: its ninth bit spills into the next channel.
constexpr GrColor Mixed(GrColor source, GrColor destination, unsigned rest)
{
    GrColor const red = (source & 0xFF) + ((destination & 0xFF) * rest >> 8);
    GrColor const green = (source & 0xFF00) + ((destination >> 8 & 0xFF) * rest & 0xFF00);
    GrColor const blue = (source & 0xFF0000) + ((destination >> 16 & 0xFF) * rest << 8 & 0xFF0000);
    return red | green | blue | 0xFF000000;
}

/// Blends pixel by pixel, where `read` and `write` get at a row's pixels; columns count from the target's
/// first one.
template <GrColorsPolicy Colors, typename Read, typename Write>
void BlendEach(GrBlend const& blend, Read read, Write write)
{
    using Pixel = typename Colors::Pixel;
    auto const forePixel = static_cast<Pixel>(blend.fore), backPixel = static_cast<Pixel>(blend.back);
    GrColor const fore = Colors::FromPixel(forePixel), back = Colors::FromPixel(backPixel);
    std::optional<GrErrorRows> errors;
    if (blend.errors) errors.emplace(blend.errors, blend.target.width);

    unsigned char* row = blend.target.address;
    for (std::ptrdiff_t y = 0; y < blend.target.height; ++y, row += blend.target.stride) {
        if (errors) errors->StartRow();
        for (int x = 0; x < blend.target.width; ++x) {
            std::ptrdiff_t const index = y * blend.sourceWidth + x;
            unsigned const alpha = blend.alphas ? blend.alphas[index] : blend.alpha;
            if (alpha == 0) {
                if (!blend.overDestination) write(row, x, backPixel);
                continue;
            }
            GrColor color = fore;
            if (blend.colors) std::memcpy(&color, blend.colors + index * 4, sizeof color);
            Pixel pixel;
            if (alpha == 255) {
                pixel = blend.colors ? Colors::ToPixel(color) : forePixel;
            } else {
                if (!blend.colors || !blend.alphas) color = Faded(color, alpha);
                GrColor const below =
                    blend.overDestination ? Colors::FromPixel(static_cast<Pixel>(read(row, x))) : back;
                color = Mixed(color, below, 255 - alpha);
                pixel = Colors::ToPixel(color);
            }
            if (errors) pixel = errors->Diffuse<Colors>(color, x);
            write(row, x, pixel);
        }
    }
}

/// The plain form, whose pixels every faster one has to give.
template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void BlendPixels(GrBlend const& blend)
{
    BlendEach<Colors>(
        blend, [](unsigned char const* row, int x) { return Surface::ReadPixel(row, x); },
        [](unsigned char* row, int x, auto pixel) { Surface::WritePixel(row, x, pixel); });
}
