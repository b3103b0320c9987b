#include <tools/cgf_compose.h>

#include <tools/cgf_face.h>
#include <tools/cgf_unifont.h>

#include <algorithm>
#include <limits>
#include <optional>
#include <unicode/uchar.h>
#include <unicode/unorm2.h>

namespace tools {

namespace {

// At the one size small letters of the outlines are as high as those of the bitmaps, 8 pixels, and capitals
// are at the other, 11 pixels. Between the two nothing else differs: stems are one pixel wide.
constexpr unsigned kSmallLetterSize = 15;
constexpr unsigned kCapitalSize = 16;

// Combining marks that the font goes without; what comes with a mark has a character of its own.
constexpr char16_t kMarksBegin = 0x300;
constexpr char16_t kMarksEnd = 0x346;

// From here on there are arrows, operators, lines and pictures rather than letters and what stands among
// them. The cells have nearly all of them, drawn by one hand.
constexpr char16_t kSymbolsBegin = 0x2190;

constexpr int kAscent = 14;
constexpr unsigned kSideBearing = 1;

/// Whether the character's glyph belongs in a cell of fixed width, in which others stand above and below it.
bool StandsInCell(char16_t code)
{
    switch (u_getIntPropertyValue(code, UCHAR_EAST_ASIAN_WIDTH)) {
    case U_EA_FULLWIDTH:
    case U_EA_HALFWIDTH:
    case U_EA_WIDE: return true;
    default: break;
    }
    switch (ublock_getCode(code)) {
    case UBLOCK_MISCELLANEOUS_TECHNICAL:
    case UBLOCK_BOX_DRAWING:
    case UBLOCK_BLOCK_ELEMENTS:
    case UBLOCK_BRAILLE_PATTERNS: return true;
    default: return false;
    }
}

/// A glyph from a cell, as one that stands among proportional ones. Where its ink touches the cell's side, it
/// is meant to meet its neighbour's.
Glyph Spaced(Glyph const& cell)
{
    auto glyph = Trimmed(cell);
    if (glyph.width == 0) return glyph;
    auto const before = static_cast<unsigned>(glyph.left);
    auto const behind = cell.width - before - glyph.width;
    glyph.left = static_cast<int>(std::min(before, kSideBearing));
    glyph.advance = static_cast<unsigned>(glyph.left) + glyph.width + std::min(behind, kSideBearing);
    return glyph;
}

/// A letter whose accent reaches above the line's cell, with the accent brought down by the empty rows below
/// it, the upper ones first. Where there are too few the accent stays, and may come to lie in the line above.
Glyph Lowered(Glyph const& glyph)
{
    Glyph lowered = glyph;
    for (unsigned y = 0; y < lowered.rows && lowered.top > kAscent;) {
        auto const row = lowered.ink.begin() + y * lowered.width;
        if (std::find(row, row + lowered.width, true) != row + lowered.width) {
            ++y;
            continue;
        }
        lowered.ink.erase(row, row + lowered.width);
        --lowered.rows;
        --lowered.top;
    }
    return lowered.top > kAscent ? glyph : lowered;
}

class Composer {
public:
    explicit Composer(GlyphSources const& sources)
        : bitmaps(sources.bitmaps, Face::kOnlySize), smallLetters(sources.outlines, kSmallLetterSize),
          capitals(sources.outlines, kCapitalSize), cells(ReadUnifont(sources.cells)),
          offsets(ReadUnifontOffsets(sources.offsets))
    {
        for (unsigned code = 1; code <= std::numeric_limits<char16_t>::max(); ++code)
            if (auto const character = static_cast<char16_t>(code); IsInBoth(character))
                alike.emplace(smallLetters.Shape(character), character);
    }

    std::optional<Glyph> Compose(char16_t code) const
    {
        if (code >= kMarksBegin && code < kMarksEnd) return {};
        if (HasBitmap(code)) return Lowered(bitmaps.Read(code));
        if (smallLetters.Has(code) && (code < kSymbolsBegin || u_isalpha(code)))
            return Lowered(FromOutlines(code));
        if (u_hasBinaryProperty(code, UCHAR_DEFAULT_IGNORABLE_CODE_POINT)) return Glyph{};
        return FromCell(code);
    }

private:
    /// The glyph of code 0 is the face's own stand-in for missing ones.
    bool HasBitmap(char16_t code) const { return code != 0 && bitmaps.Has(code); }
    bool IsInBoth(char16_t code) const { return HasBitmap(code) && smallLetters.Has(code); }

    /// The character of the bitmaps that looks the same in the outlines; 0 if there is none.
    char16_t FindAlike(char16_t code) const
    {
        auto const found = alike.find(smallLetters.Shape(code));
        return found == alike.end() ? char16_t{0} : found->second;
    }

    /// The same, for a Cyrillic letter with an accent of which only the letter below it looks the same: the
    /// outlines have Ё wider than Ë.
    char16_t FindAlikeBelowAccent(char16_t code) const
    {
        if (ublock_getCode(code) != UBLOCK_CYRILLIC) return 0;
        UErrorCode error = U_ZERO_ERROR;
        auto const* const normalizer = unorm2_getNFCInstance(&error);
        char16_t parts[2];  // the letter and its accent
        if (unorm2_getDecomposition(normalizer, code, parts, 2, &error) != 2 || U_FAILURE(error)) return 0;
        auto const composed = unorm2_composePair(normalizer, FindAlike(parts[0]), parts[1]);
        return composed > 0 && HasBitmap(static_cast<char16_t>(composed)) ? static_cast<char16_t>(composed)
                                                                          : 0;
    }

    /// Letters that look the same in two alphabets, as they do in the outlines, do so here.
    Glyph FromOutlines(char16_t code) const
    {
        auto twin = FindAlike(code);
        if (twin == 0) twin = FindAlikeBelowAccent(code);
        if (twin != 0) return bitmaps.Read(twin);
        auto glyph = (u_islower(code) ? smallLetters : capitals).Read(code);
        // At these sizes hinting leaves some letters no room.
        if (u_isalpha(code))
            glyph.advance =
                std::max(glyph.advance, static_cast<unsigned>(glyph.left) + glyph.width + kSideBearing);
        return glyph;
    }

    std::optional<Glyph> FromCell(char16_t code) const
    {
        auto const found = cells.find(code);
        if (found == cells.end()) return {};
        auto const offset = offsets.find(code);
        if (offset == offsets.end())
            return StandsInCell(code) ? Trimmed(found->second) : Spaced(found->second);
        auto mark = Trimmed(found->second);
        mark.left += offset->second;
        mark.advance = 0;
        return mark;
    }

    Face bitmaps, smallLetters, capitals;
    Glyphs cells;
    std::map<char16_t, int> offsets;
    std::map<std::string, char16_t> alike;  ///< characters of the bitmaps by their shapes in the outlines
};

}

Glyphs ComposeGlyphs(GlyphSources const& sources)
{
    Composer const composer(sources);
    Glyphs glyphs;
    for (unsigned code = 0; code <= std::numeric_limits<char16_t>::max(); ++code) {
        auto glyph = composer.Compose(static_cast<char16_t>(code));
        if (!glyph) continue;
        glyph->advance = std::max(glyph->advance, 1U);  // to a reader, one without an advance is missing
        glyphs.emplace(static_cast<char16_t>(code), std::move(*glyph));
    }
    return glyphs;
}

}
