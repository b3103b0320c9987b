#pragma once

#include <tools/cgf_glyph.h>

#include <string>

namespace tools {

/// Reads the glyphs of GNU Unifont's `unifont.hex`. They fill their cells, of 8 or 16 pixels, which stand
/// side by side. Throws `std::runtime_error` if a text cannot be read.
Glyphs ReadUnifont(std::string const& path);

/// Reads how far to the left of the pen the cells of combining characters begin, in pixels, from the list
/// that goes with the glyphs; other characters' begin at the pen. Throws as above.
std::map<char16_t, int> ReadUnifontOffsets(std::string const& path);

}
