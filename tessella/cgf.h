#pragma once

#include <tessella/cgf_format.h>

#include <list>
#include <memory>
#include <span>
#include <vector>

/// A glyph of a set, whose data `bits` points into.
class CGF_Glyph {
public:
    std::int8_t top = 0;
    std::int8_t left = 0;
    std::uint8_t advance = 0;
    std::uint8_t width = 0;
    std::uint8_t rows = 0;
    std::int32_t offset = -1;  ///< of the record in the set's data; -1: there is no glyph
    unsigned char const* bits = nullptr;

    virtual ~CGF_Glyph() = default;
};

/// The glyphs of up to 256 characters in a row.
class CGF_Set {
public:
    /// The set of a chunk; null if the chunk is too short for what it says it holds. `bitsPerPixel` is that
    /// of the font: bitmaps of other than 1 have a byte a pixel.
    static std::unique_ptr<CGF_Set> Read(std::span<unsigned char const> chunk, unsigned bitsPerPixel);

    CGF_Set(CGF_Set const&) = delete;
    CGF_Set& operator=(CGF_Set const&) = delete;
    virtual ~CGF_Set() = default;

    /// Null if there is none.
    CGF_Glyph const* GetGlyph(unsigned code) const
    {
        unsigned const position = code - firstCode;
        return position < glyphs.size() && glyphs[position].offset >= 0 ? &glyphs[position] : nullptr;
    }
    std::uint8_t Number() const { return number; }

private:
    explicit CGF_Set(CGF_SetHeader const& header)
        : glyphs(header.glyphCount == 0 ? 256 : header.glyphCount), firstCode(header.firstCode),
          number(header.number)
    {}
    bool ReadGlyph(CGF_Glyph& glyph, unsigned bitsPerPixel);

    std::vector<CGF_Glyph> glyphs;    ///< one a position
    std::vector<unsigned char> data;  ///< records and bitmaps
    std::uint32_t const firstCode;
    std::uint8_t const number;
};

/// A font of a container: the sets of its glyphs by the high byte of the characters' codes.
class CGF_Font : public CGF_FontHeader {
public:
    explicit CGF_Font(CGF_FontHeader const& header) : CGF_FontHeader(header) {}
    CGF_Font(CGF_Font const&) = delete;
    CGF_Font& operator=(CGF_Font const&) = delete;
    virtual ~CGF_Font() = default;

    /// Takes a set, in place of the one that has had its number.
    void AddSet(std::unique_ptr<CGF_Set> set);

    /// The glyph of a character, or else that of the default character; null if that has none either.
    CGF_Glyph const* GetGlyph(unsigned code) const
    {
        CGF_Set const* const set = sets[code >> 8 & 0xFF];
        CGF_Glyph const* const glyph = set ? set->GetGlyph(code) : nullptr;
        return glyph && glyph->advance != 0 ? glyph : defaultGlyph;
    }

private:
    CGF_Set const* sets[256] = {};
    CGF_Glyph const* defaultGlyph = nullptr;
    /// All that came, since the default glyph may be of a set that was replaced.
    std::vector<std::unique_ptr<CGF_Set const>> owned;
};

/// Takes chunks as they come, each given with all of its bytes. Every operation is false if nothing more is
/// to come.
class CGF_ChunkProcessor {
public:
    virtual ~CGF_ChunkProcessor() = default;
    virtual bool ProcessChunk(std::span<unsigned char const> chunk) = 0;
    virtual bool ProcessFont(std::span<unsigned char const> chunk) = 0;
    virtual bool ProcessSet(std::span<unsigned char const> chunk) = 0;
};

/// The fonts of a file, decoded once and kept in memory.
class CGF_Container final : public CGF_ChunkProcessor, public CGF_Header {
public:
    /// By what else than their number fonts are told apart.
    struct Key {
        std::uint8_t italic;  ///< not 0: an italic font, of any weight
        std::uint16_t weight;
    };

    /// Takes the fonts of a file, or of as much as there is of it; nothing of its memory is used later. True
    /// if all chunks could be taken and their sizes are right. What was taken before a failure stays.
    bool Parse(std::span<unsigned char const> file);

    /// The font with this number that stands last in the file; null if there is none.
    CGF_Font const* FindFontById(std::uint8_t id) const;
    CGF_Font const* FindFont(Key const& key) const;

    bool ProcessChunk(std::span<unsigned char const> chunk) override;
    bool ProcessFont(std::span<unsigned char const> chunk) override;
    bool ProcessSet(std::span<unsigned char const> chunk) override;

private:
    std::list<CGF_Font> fonts;  ///< the last of the file first
};
