#pragma once

#include <tools/cgf_glyph.h>

#include <string>
#include <string_view>

namespace tools {

/// A picture of glyphs, as large as they need.
class GlyphPicture {
public:
    /// With boxes, the room that each glyph takes on its line is tinted, and in it the baseline.
    enum class Boxes : bool { No, Yes };

    /// The font outlives the picture.
    GlyphPicture(GlyphFont const& itsFont, Boxes itsBoxes) : font(itsFont), boxes(itsBoxes) {}

    /// Adds lines of text, one right below the other; a newline begins the next.
    void AddText(std::u16string_view text);

    /// Adds the 256 characters of a set, 16 in a row, behind the hexadecimal digits that their codes begin
    /// with. Where there is no glyph, there is a gap.
    void AddSet(unsigned number);

    /// Writes a PNG file, each pixel enlarged to `scale` in both directions. Gives an empty text, or why the
    /// file couldn't be written; it is then gone.
    std::string Save(std::string const& path, unsigned scale) const;

private:
    struct Placed {
        Glyph const* glyph;
        int pen, baseline;  ///< from the start of the first line
    };

    void AddLine(std::u16string_view line);

    GlyphFont const& font;
    Boxes boxes;
    int nextBaseline = 0;
    std::vector<Placed> placed;
};

}
