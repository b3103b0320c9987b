#pragma once

#include <tessella/cgf_format.h>

#include <string>
#include <vector>

/// A file of bitmap glyphs in the making.
struct CgfFile {
    CGF_Header header;
    std::string chunks;

    template <typename Header>
    void AddChunk(Header chunk, std::uint8_t type, std::string const& body = {})
    {
        chunk.chunkSize = static_cast<std::uint32_t>(sizeof chunk + body.size());
        chunk.chunkType = type;
        chunks += BytesOf(chunk) + body;
        header.chunkCount += 1;
        header.chunkBytes += chunk.chunkSize;
        header.size += chunk.chunkSize;
    }
    /// A set of these records with their bitmaps; there is no glyph where one is empty.
    void AddSet(CGF_SetHeader set, std::vector<std::string> const& glyphs)
    {
        std::string offsets, data;
        for (std::string const& glyph : glyphs) {
            offsets += BytesOf(glyph.empty() ? kCgfNoGlyph : static_cast<std::uint16_t>(data.size()));
            data += glyph;
        }
        set.glyphCount = static_cast<std::uint8_t>(glyphs.size());
        AddChunk(set, kCgfSetChunk, offsets + data);
    }
    std::string Bytes() const { return BytesOf(header) + chunks; }

private:
    template <typename Value>
    static std::string BytesOf(Value const& value)
    {
        return {reinterpret_cast<char const*>(&value), sizeof value};
    }
};

inline CGF_FontHeader CgfFont(unsigned id, unsigned italic, unsigned weight, unsigned height)
{
    CGF_FontHeader font;
    font.id = static_cast<std::uint8_t>(id);
    font.italic = static_cast<std::uint8_t>(italic);
    font.weight = static_cast<std::uint16_t>(weight);
    font.height = static_cast<std::uint8_t>(height);
    font.defaultCharacter = '?';
    return font;
}
