#include <tools/cgf_glyph.h>

#include <algorithm>

namespace tools {

Glyph const* GlyphFont::Find(char16_t code) const
{
    for (char16_t const candidate : {code, defaultCharacter})
        if (auto const found = glyphs.find(candidate); found != glyphs.end()) return &found->second;
    return nullptr;
}

Glyph Trimmed(Glyph const& glyph)
{
    unsigned x1 = glyph.width;
    unsigned x2 = 0;
    unsigned y1 = glyph.rows;
    unsigned y2 = 0;
    for (unsigned y = 0; y < glyph.rows; ++y) {
        for (unsigned x = 0; x < glyph.width; ++x) {
            if (!glyph.ink[y * glyph.width + x]) continue;
            x1 = std::min(x1, x);
            x2 = std::max(x2, x + 1);
            y1 = std::min(y1, y);
            y2 = y + 1;
        }
    }
    Glyph trimmed;
    trimmed.advance = glyph.advance;
    if (x2 == 0) return trimmed;
    trimmed.left = glyph.left + static_cast<int>(x1);
    trimmed.top = glyph.top - static_cast<int>(y1);
    trimmed.width = x2 - x1;
    trimmed.rows = y2 - y1;
    for (unsigned y = y1; y < y2; ++y) {
        auto const row = glyph.ink.begin() + y * glyph.width;
        trimmed.ink.insert(trimmed.ink.end(), row + x1, row + x2);
    }
    return trimmed;
}

}
