#pragma once

#include <optional>
#include <string_view>

namespace console {

inline constexpr unsigned kLongestSide = 8192;    // pixels
inline constexpr unsigned kLongestPitch = 65536;  // bytes

/// A video mode of the virtual adapter. The depth names the pixels as one speaks of them: 4 (through a colour
/// map, a bit in each of four planes), 8 (through the colour map), 15 (5-5-5), 16 (5-6-5), 24 (three bytes)
/// and 32 (24 bits of colour in four bytes).
struct DisplayMode {
    unsigned width = 1024;
    unsigned height = 768;
    unsigned depth = 32;
    unsigned pitch = 4096;  ///< bytes from one row to the next

    bool operator==(DisplayMode const&) const = default;
};

struct ColourField {
    unsigned offset = 0;
    unsigned length = 0;
};

/// What the driver tells of a pixel.
struct PixelFormat {
    unsigned bits = 0;  ///< of memory, the unused ones included
    ColourField red, green, blue, transparency;
};

unsigned BytesPerPixel(unsigned depth);  ///< of packed pixels
PixelFormat FormatOf(unsigned depth);

/// Reads "WIDTHxHEIGHTxDEPTH" and sets the shortest pitch. Nothing if it is malformed, if a side isn't from 1
/// to 8192, or if the adapter doesn't know the depth. Planes have whole bytes a row and a short window.
std::optional<DisplayMode> ParseMode(std::string_view text);

/// Reads "BITS:RED,GREEN,BLUE", the last three being lengths of fields. Nothing if malformed.
std::optional<PixelFormat> ParseFormat(std::string_view text);

/// False if the adapter cannot have rows of so many bytes in this mode.
bool IsPitchValid(DisplayMode const& mode, unsigned pitch);

/// A plain decimal number that takes the whole text.
std::optional<unsigned> ParseNumber(std::string_view text);

}
