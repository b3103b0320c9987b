#pragma once

#include <cstdint>

/// A colour as it crosses every interface: red in bits 0 to 7, green in 8 to 15, blue in 16 to 23, alpha
/// in 24 to 31. Alpha means something only to images with an alpha channel; everywhere else it is ignored
/// on the way in and 0 on the way out.
using GrColor = std::uint32_t;

/// The colour of the given channels, each 0 to 255.
constexpr GrColor GrMakeColor(std::uint8_t red, std::uint8_t green, std::uint8_t blue, std::uint8_t alpha = 0)
{
    return static_cast<GrColor>(red) | static_cast<GrColor>(green) << 8 | static_cast<GrColor>(blue) << 16 |
        static_cast<GrColor>(alpha) << 24;
}

/// The red channel, 0 to 255.
constexpr std::uint8_t GrRed(GrColor color) { return static_cast<std::uint8_t>(color); }
/// The green channel, 0 to 255.
constexpr std::uint8_t GrGreen(GrColor color) { return static_cast<std::uint8_t>(color >> 8); }
/// The blue channel, 0 to 255.
constexpr std::uint8_t GrBlue(GrColor color) { return static_cast<std::uint8_t>(color >> 16); }
/// The alpha channel, 0 (transparent) to 255.
constexpr std::uint8_t GrAlpha(GrColor color) { return static_cast<std::uint8_t>(color >> 24); }
