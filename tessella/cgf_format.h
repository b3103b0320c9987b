#pragma once

#include <cstdint>

// A file of bitmap glyphs, such as `glyphset.cgf`. All numbers are little-endian, as in memory, and nothing
// behind the file's header is aligned.
//
//   CGF_Header
//   chunks, one behind the other, each beginning with _tagCGF_CHUNK; those of unknown type are skipped
//     CGF_FontHeader                       one face at one size
//     CGF_SetHeader                        up to 256 glyphs of a font that stands before it
//       an offset (16 bits) for each glyph, from the start of the glyphs' data; kCgfNoGlyph: there is none
//       the glyphs' data: a CGF_GlyphRecord for each, and its bitmap
//
// A bitmap is one stream of bits without padding between its rows: pixel x, y is bit y * width + x, counted
// from the lowest bit of each byte. Set bits are ink.

struct CGF_Header {
    char16_t magic[6] = u"CGF10";
    std::uint32_t format = 0x0101;
    std::uint32_t size = sizeof(CGF_Header);  ///< of the whole file, in bytes
    char16_t notice[60] = u"Tessella bitmap font";
    std::uint32_t chunkCount = 0;
    std::uint32_t chunkBytes = 0;  ///< sum of the chunks' sizes
};

enum : std::uint8_t { kCgfFontChunk = 1, kCgfSetChunk = 2 };

struct [[gnu::packed]] _tagCGF_CHUNK {  // NOLINT(bugprone-reserved-identifier): the format's own name
    std::uint32_t chunkSize = 0;        ///< in bytes, with this header
    std::uint8_t chunkType = 0;
};

struct [[gnu::packed]] CGF_FontHeader : _tagCGF_CHUNK {
    std::uint8_t id = 0;                   ///< not 0
    std::uint32_t descriptionLength = 80;  ///< from this field to the face's end
    std::uint8_t height = 0;               ///< of the cell, in pixels
    std::uint8_t italic = 0;               ///< 0: upright
    std::uint16_t weight = 0;              ///< 400 regular, 700 bold
    std::uint8_t reserved[2] = {0, 1};
    std::uint32_t defaultCharacter = 0;  ///< whose glyph stands in for missing ones
    std::uint8_t ascent = 0;             ///< from the top of the cell to the baseline, in pixels
    std::uint8_t bitsPerPixel = 1;
    char16_t face[32] = {};  ///< with a zero behind it
    std::uint8_t reservedEnd = 0;
};

struct [[gnu::packed]] CGF_SetHeader : _tagCGF_CHUNK {
    std::uint8_t fontId = 0;
    std::uint8_t number = 0;      ///< high byte of its characters' codes
    std::uint32_t firstCode = 0;  ///< of the first glyph
    std::uint8_t glyphCount = 0;  ///< 0: 256
};

struct CGF_GlyphRecord {
    std::int8_t left = 0;      ///< from the pen to the bitmap's left edge, in pixels
    std::int8_t top = 0;       ///< from the baseline up to the bitmap's top row
    std::uint8_t advance = 0;  ///< of the pen; 0: as if there were no glyph
    std::uint8_t rows = 0;
    std::uint8_t width = 0;
};

inline constexpr std::uint16_t kCgfNoGlyph = 0xFFFF;

static_assert(sizeof(CGF_Header) == 148 && sizeof(_tagCGF_CHUNK) == 5 && sizeof(CGF_FontHeader) == 87);
static_assert(sizeof(CGF_SetHeader) == 12 && sizeof(CGF_GlyphRecord) == 5);
