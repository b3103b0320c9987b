#include <tools/cgf_writer.h>

#include <concepts>
#include <stdexcept>
#include <utility>

namespace tools {

namespace {

constexpr unsigned kSetCount = 256;
constexpr unsigned kSetSize = 256;

template <typename Record>
void Append(std::string& bytes, Record const& record)
{
    bytes.append(reinterpret_cast<char const*>(&record), sizeof(record));
}

template <typename Field>
Field Fitting(std::integral auto number)
{
    if (!std::in_range<Field>(number)) throw std::runtime_error("is too large");
    return static_cast<Field>(number);
}

void AppendGlyph(std::string& data, Glyph const& glyph)
{
    // Readers would take the position for empty.
    if (glyph.advance == 0) throw std::runtime_error("has no advance");
    Append(data,
        CGF_GlyphRecord{Fitting<std::int8_t>(glyph.left), Fitting<std::int8_t>(glyph.top),
            Fitting<std::uint8_t>(glyph.advance), Fitting<std::uint8_t>(glyph.rows),
            Fitting<std::uint8_t>(glyph.width)});
    std::string bits((glyph.ink.size() + 7) / 8, '\0');
    for (std::size_t i = 0; i < glyph.ink.size(); ++i)
        if (glyph.ink[i]) bits[i / 8] = static_cast<char>(bits[i / 8] | 1 << i % 8);
    data += bits;
}

std::string MakeSet(std::uint8_t fontId, unsigned number, Glyphs const& glyphs)
{
    unsigned const begin = number * kSetSize;
    unsigned const end = begin + kSetSize;
    auto const it = glyphs.lower_bound(static_cast<char16_t>(begin));
    unsigned const first = it != glyphs.end() && it->first < end ? it->first : begin;

    std::string offsets;
    std::string data;
    for (unsigned code = first; code < end; ++code) {
        auto const found = glyphs.find(static_cast<char16_t>(code));
        if (found == glyphs.end()) {
            Append(offsets, kCgfNoGlyph);
            continue;
        }
        try {
            if (data.size() >= kCgfNoGlyph) throw std::runtime_error("lies too far behind its set");
            Append(offsets, static_cast<std::uint16_t>(data.size()));
            AppendGlyph(data, found->second);
        } catch (std::runtime_error const& error) {
            throw std::runtime_error("the glyph of character " + std::to_string(code) + " " + error.what());
        }
    }

    CGF_SetHeader set;
    set.chunkSize = static_cast<std::uint32_t>(sizeof(set) + offsets.size() + data.size());
    set.chunkType = kCgfSetChunk;
    set.fontId = fontId;
    set.number = static_cast<std::uint8_t>(number);
    set.firstCode = first;
    set.glyphCount = static_cast<std::uint8_t>(end - first);  // 256 becomes 0, which means 256
    std::string chunk;
    Append(chunk, set);
    return chunk + offsets + data;
}

}

std::string MakeCgf(CGF_FontHeader font, Glyphs const& glyphs)
{
    font.chunkSize = sizeof(font);
    font.chunkType = kCgfFontChunk;
    std::string chunks;
    Append(chunks, font);
    for (unsigned number = kSetCount; number-- > 0;)
        chunks += MakeSet(font.id, number, glyphs);

    CGF_Header header;
    header.chunkCount = 1 + kSetCount;
    header.chunkBytes = static_cast<std::uint32_t>(chunks.size());
    header.size = static_cast<std::uint32_t>(sizeof(header) + chunks.size());
    std::string file;
    Append(file, header);
    return file + chunks;
}

}
