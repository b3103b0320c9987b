#pragma once

#include <console/state.h>

#include <cstdint>
#include <span>
#include <string>
#include <variant>
#include <vector>

namespace console {

/// What a screen shows: rows from the top, three bytes a pixel, red first.
struct Picture {
    unsigned width = 0;
    unsigned height = 0;
    std::vector<std::uint8_t> bytes;

    /// As 0xRRGGBB.
    std::uint32_t At(unsigned x, unsigned y) const;
    bool operator==(Picture const&) const = default;
};

/// Shows video memory as the screen does; the colour map counts in modes with one. The memory holds all of
/// the mode's rows; in the 4-plane mode, the words of its planes.
Picture TakePicture(DisplayMode const& mode, ColourMap const& colours, std::span<unsigned char const> memory);

/// Writes a PNG file. Gives an empty text, or why the file couldn't be written; it is then gone.
std::string SavePicture(Picture const& picture, std::string const& path);

/// Reads a PNG file of any kind. Gives why it cannot be read otherwise.
std::variant<Picture, std::string> LoadPicture(std::string const& path);

/// Shows where two pictures of one size differ: in red, over a faded first one.
Picture Difference(Picture const& a, Picture const& b);

}
