#pragma once

#include <cstdint>
#include <map>
#include <vector>

namespace tools {

/// A glyph as a bitmap, beside the pen on the baseline.
struct Glyph {
    int left = 0;  ///< from the pen to the bitmap's left edge, in pixels
    int top = 0;   ///< from the baseline up to the bitmap's top row
    unsigned advance = 0;
    unsigned width = 0;
    unsigned rows = 0;
    std::vector<bool> ink;  ///< row by row from the top, without gaps

    bool operator==(Glyph const&) const = default;
};

/// Glyphs by the codes of their characters.
using Glyphs = std::map<char16_t, Glyph>;

/// A font with its measures in pixels.
struct GlyphFont {
    int height = 0;
    int ascent = 0;  ///< from the top of the cell to the baseline
    char16_t defaultCharacter = 0;
    Glyphs glyphs;

    /// The glyph that stands for the character, the default character's if it has none; null if there is
    /// neither.
    Glyph const* Find(char16_t code) const;
};

/// The glyph without the empty rows and columns around its ink, which stays where it is.
Glyph Trimmed(Glyph const& glyph);

}
