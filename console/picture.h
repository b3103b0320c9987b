#pragma once

#include <console/state.h>

#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace console {

/// What a screen shows: rows from the top, three bytes a pixel, red first.
struct Picture {
    unsigned width = 0;
    unsigned height = 0;
    std::vector<std::uint8_t> bytes;

    /// As 0xRRGGBB.
    std::uint32_t At(unsigned x, unsigned y) const;
};

/// Shows video memory as the screen does; the colour map counts in modes with one. The memory holds all of
/// the mode's rows.
Picture TakePicture(DisplayMode const& mode, ColourMap const& colours, std::span<unsigned char const> memory);

/// Writes a PNG file. Gives an empty text, or why the file couldn't be written; it is then gone.
std::string SavePicture(Picture const& picture, std::string const& path);

}
