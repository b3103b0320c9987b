#pragma once

#include <tessella.h>

#include <cstdint>
#include <memory>
#include <vector>

namespace gallery {

struct Point {
    int x, y;
};

/// Colours are opaque, for the formats that know alpha.
constexpr GrColor Rgb(int red, int green, int blue)
{
    auto const channel = [](int value) { return static_cast<std::uint8_t>(value); };
    return GrMakeColor(channel(red), channel(green), channel(blue), 255);
}
constexpr GrColor kPaper = Rgb(250, 247, 238);
constexpr GrColor kShade = Rgb(214, 208, 196);
constexpr GrColor kInk = Rgb(34, 40, 54);

/// The book's bright colours; after the last comes the first again.
GrColor Hue(int index);
/// `part` 0 is the first colour, 256 the second; so is anything below, and beyond.
GrColor Mix(GrColor first, GrColor second, int part);
constexpr GrColor WithAlpha(GrColor color, int alpha)
{
    return (color & 0xFFFFFF) | static_cast<GrColor>(alpha) << 24;
}

/// A pixel format, as images tell it. Those of 24 bits have as many bytes a pixel as the screen's, if the
/// screen has such; else 3.
struct ImageFormat {
    int bits;
    std::uint32_t flags;
};

/// The colours of a picture, in 1024ths of its sides.
using Picture = GrColor(int x, int y);
/// Mountains at sunset.
Picture Landscape;
/// Colours from dark to bright, one below the other.
Picture Ramps;

/// A picture in some format, which fits the session's mode.
std::unique_ptr<GrImage> NewImage(ImageFormat const& format, int width, int height, Picture picture);

/// Fills an image; `colorAt` gives the colour of a pixel, with its alpha.
template <typename ColorAt>
void LoadImage(GrImage& image, ColorAt colorAt)
{
    std::vector<GrColor> colors;
    for (int y = 0; y < image.height; ++y)
        for (int x = 0; x < image.width; ++x)
            colors.push_back(colorAt(x, y));
    image.Load(reinterpret_cast<std::uint8_t const*>(colors.data()), 4);
}

/// A new image with an alpha plane, filled in the same way.
template <typename ColorAt>
std::unique_ptr<GrImage> NewAlphaImage(int width, int height, ColorAt colorAt, std::uint32_t flags = 0)
{
    auto image = std::make_unique<GrImage>(width, height, flags | GrImageHasAlpha);
    LoadImage(*image, colorAt);
    return image;
}

/// A mask of those pixels that `isSet` says.
template <typename IsSet>
std::unique_ptr<GrBitmap> NewMask(int width, int height, IsSet isSet)
{
    auto mask = std::make_unique<GrBitmap>(width, height);
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x)
            if (isSet(x, y))
                mask->data[y * ((width + 7) / 8) + x / 8] |= static_cast<unsigned char>(1 << x % 8);
    return mask;
}

}
