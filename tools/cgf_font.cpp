#include <tools/cgf_font.h>

#include <limits>

namespace tools {

namespace {

Glyph TakeGlyph(CGF_Glyph const& glyph)
{
    Glyph taken{glyph.left, glyph.top, glyph.advance, glyph.width, glyph.rows, {}};
    for (unsigned bit = 0; bit < taken.width * taken.rows; ++bit)
        taken.ink.push_back(glyph.bits[bit / 8] >> bit % 8 & 1);
    return taken;
}

}

GlyphFont TakeFont(CGF_Font const& font)
{
    GlyphFont taken{font.height, font.ascent, static_cast<char16_t>(font.defaultCharacter), {}};
    auto const* const missing = font.GetGlyph(font.defaultCharacter);
    for (unsigned code = 0; code <= std::numeric_limits<char16_t>::max(); ++code) {
        auto const* const glyph = font.GetGlyph(code);
        if (glyph != nullptr && (glyph != missing || code == font.defaultCharacter))
            taken.glyphs.emplace(static_cast<char16_t>(code), TakeGlyph(*glyph));
    }
    return taken;
}

}
