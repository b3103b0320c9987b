#pragma once

#include <tools/cgf_glyph.h>

#include <string>

namespace tools {

/// The font of the library's own is put together from these files. resources/fonts tells where they come
/// from.
struct GlyphSources {
    std::string bitmaps;   ///< the face that sets the measures, in bitmaps
    std::string outlines;  ///< a face like it, in outlines, with more alphabets
    std::string cells;     ///< glyphs of nearly every character, in cells
    std::string offsets;   ///< where the cells of combining characters stand
};

/// The glyphs of all characters of the Basic Multilingual Plane that the sources have, made to stand on one
/// baseline in a cell of 17 pixels, 14 of them above it. Throws `std::runtime_error` if a file cannot be
/// read.
Glyphs ComposeGlyphs(GlyphSources const& sources);

}
