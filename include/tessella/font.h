#pragma once

#include <tessella/export.h>

#include <cstdint>

/// One glyph, as `GrFont::GetGlyph` tells it.
struct GrGlyphInfo {
    std::int32_t top = 0;       ///< pixels from the baseline up to the bitmap's top row
    std::int32_t left = 0;      ///< pixels from the pen to the bitmap's left edge
    std::uint32_t advance = 0;  ///< pixels that the pen moves on; taken as signed when it is drawn
    std::uint32_t width = 0;    ///< of the bitmap, in pixels
    std::uint32_t rows = 0;     ///< of the bitmap

    /// Bytes from row to row of the bitmap. 0: all rows are one stream of bits, without padding, the lowest
    /// bit of each byte first. Not looked at with grey levels, whose rows are `width` bytes.
    std::uint32_t pitch = 0;
    /// 1: a set bit is ink; with a pitch, the highest bit of a byte is the leftmost pixel. Any other number:
    /// grey levels of a byte each, 0 none to 255 full; 8 is the usual one.
    std::uint32_t bitsPerPixel = 0;
    unsigned char const* bits = nullptr;  ///< the font's, as long as it lives; no pixels: not looked at
};

/// What an application gets from the library for text: an object that knows the size of its cells, measures
/// strings and hands out glyphs. `GrContext::DrawText` draws with it.
///
/// Whoever made a font deletes it. Fonts have no locks: the application's thread makes and uses them. What is
/// measured is in pixels, and a text's characters are codes as they stand: nothing is decoded.
///
/// An application may bring its own kinds of font. They derive from `GrFontBase`, never from this directly:
/// drawing relies on that. The operations are declared in the order of their table, which is part of the
/// library's interface.
class GR_API GrFont {
public:
    GrFont() = default;
    GrFont(GrFont const&) = delete;
    GrFont& operator=(GrFont const&) = delete;
    virtual ~GrFont() = default;

    /// The font for a request, which the caller deletes, during a session. `face` names a face, and the
    /// font's file where the table of fonts names none; null counts as "". `size` is in thousandths of 96
    /// pixels: 140 makes scalable letters 13 pixels high; of the pixels the low eight bits count. `weight` is
    /// 400 for regular and 700 for bold letters; `smooth` asks for grey levels, `kerning` for pairs of
    /// letters being moved together. Never fails and never returns null: when the font that was asked for
    /// cannot be had, for whatever reason, it is the built-in one, which has one size and one weight. The
    /// reason then stands on the standard error stream. If the library's own resources are missing, too, the
    /// font is not valid, and draws nothing.
    static GrFont* Create(
        char const* face, unsigned int size, bool italic, unsigned int weight, bool smooth, bool kerning);

    /// The height of a cell.
    virtual unsigned GetHeight() const = 0;
    /// From the top of a cell to the baseline.
    virtual unsigned GetAscent() const = 0;
    /// The weight in effect, which may be another than the one that was asked for.
    virtual unsigned GetWeight() const = 0;

    /// How far `length` characters move the pen; kerning does not. A character without a glyph counts as 1,
    /// though it moves nothing when it is drawn, and so does every character of a font that is not valid.
    /// Emboldening is left out.
    virtual unsigned GetTextWidth(unsigned char const* text, unsigned length) = 0;
    /// The same for 16-bit characters; 1 more for each of them if the font emboldens.
    virtual unsigned GetTextWidthW(unsigned short const* text, unsigned length) = 0;

    /// False if the font has nothing to draw with. Its glyphs must not be asked for then.
    virtual bool IsValid() const = 0;

    /// The glyph of a character. False, with `info` unchanged, if there is none. The library's scalable fonts
    /// take codes beyond 0xFFFF by their low 16 bits; the built-in one shows its substitute for them.
    virtual bool GetGlyph(unsigned code, GrGlyphInfo& info) = 0;
    /// How far the glyph of `code` is moved if it follows that of `previous`: to the right by `out[0]`,
    /// downward by `out[1]`. False if it stays where it is. The pen does not move. (The library's scalable
    /// fonts give the vertical part as their file has it, upward in 64ths of a pixel; hardly any has one.)
    virtual bool GetKerning(int out[2], unsigned code, unsigned previous) = 0;
};

/// What all fonts have in common.
class GR_API GrFontBase : public GrFont {
public:
    std::uint32_t height = 1;  ///< of a cell
    std::uint32_t ascent = 1;  ///< from the top of a cell to the baseline
    bool smooth;               ///< grey levels were asked for
    std::uint32_t weight;      ///< in effect
    /// Every glyph is struck twice, one pixel apart. The library never sets it.
    bool embolden = false;
    bool valid = false;  ///< for the font's own class to set, once it is ready

    unsigned GetHeight() const override { return height; }
    unsigned GetAscent() const override { return ascent; }
    unsigned GetWeight() const override { return weight; }
    bool IsValid() const override { return valid; }

protected:
    /// A font that is not valid yet.
    GrFontBase(bool wantsSmooth, std::uint32_t wantedWeight) : smooth(wantsSmooth), weight(wantedWeight) {}
};

/// Has the fonts that the table of substitutions wants drawn by FreeType made from now on. `GrInit` does this
/// itself; the application's thread.
GR_API void GrEnableFreeType();
