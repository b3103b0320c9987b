#include <tools/cgf_inspect.h>

#include <tessella/cgf_format.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <map>
#include <set>
#include <unicode/unistr.h>

namespace tools {

namespace {

constexpr unsigned kSetSize = 256;
constexpr std::uint32_t kDescriptionLength = 80;

using Bytes = std::span<unsigned char const>;

/// A record of the file, which may stand at any address. The caller has seen that there are enough bytes.
template <typename Record>
Record Load(Bytes bytes)
{
    Record record;
    std::memcpy(&record, bytes.data(), sizeof(record));
    return record;
}

std::string Hex(unsigned number, int digits)
{
    char text[16];
    std::snprintf(text, sizeof(text), "%0*X", digits, number);
    return text;
}

std::string Code(unsigned code) { return "U+" + Hex(code, 4); }

std::string Count(std::size_t count, char const* thing)
{
    return std::to_string(count) + " " + thing + (count == 1 ? "" : "s");
}

class Inspector {
public:
    CgfInspection Inspect(Bytes file);

private:
    struct Font {
        unsigned defaultCharacter;
        std::set<unsigned> sets;
        std::set<unsigned> characters;  ///< that have a glyph
    };

    void InspectChunk(Bytes chunk);
    void InspectFont(Bytes chunk);
    void InspectSet(Bytes chunk);
    void InspectGlyphs(Bytes offsets, Bytes data, unsigned code, Font& font);
    /// The text of a field, up to its zero, in UTF-8.
    std::string TextOf(void const* field, std::size_t size);

    void Tell(std::string const& content) { found.contents.push_back(content); }
    void Complain(std::string const& problem) { found.problems.push_back(place + problem); }

    CgfInspection found;
    std::string place;  ///< what is looked at, in front of each problem
    std::map<unsigned, Font> fonts;
};

CgfInspection Inspector::Inspect(Bytes file)
{
    CGF_Header const expected;
    if (file.size() < sizeof(expected) ||
        std::memcmp(file.data(), expected.magic, sizeof(expected.magic)) != 0) {
        Complain("not a file of bitmap glyphs");
        return found;
    }
    auto const header = Load<CGF_Header>(file);
    Tell(TextOf(header.notice, sizeof(header.notice)) + ", " + Count(file.size(), "byte") + ", " +
        Count(header.chunkCount, "chunk"));
    if (header.format != expected.format) Complain("unknown format 0x" + Hex(header.format, 4));
    if (header.size != file.size()) Complain("its header speaks of " + Count(header.size, "byte"));

    auto rest = file.subspan(sizeof(header));
    if (header.chunkBytes != rest.size())
        Complain("its header speaks of " + Count(header.chunkBytes, "byte") + " of chunks");
    for (std::uint32_t number = 0; number < header.chunkCount; ++number) {
        place = "chunk " + std::to_string(number) + " at " + std::to_string(file.size() - rest.size()) + ": ";
        auto const size = rest.size() < sizeof(_tagCGF_CHUNK) ? 0 : Load<_tagCGF_CHUNK>(rest).chunkSize;
        if (size < sizeof(_tagCGF_CHUNK) || size > rest.size()) {
            Complain("doesn't end within the file");
            return found;
        }
        InspectChunk(rest.first(size));
        rest = rest.subspan(size);
    }
    place.clear();
    if (!rest.empty()) Complain(Count(rest.size(), "byte") + " behind the chunks");
    for (auto const& [id, font] : fonts)
        if (!font.characters.contains(font.defaultCharacter))
            Complain("font " + std::to_string(id) + " has no glyph of its default character");
    return found;
}

void Inspector::InspectChunk(Bytes chunk)
{
    auto const header = Load<_tagCGF_CHUNK>(chunk);
    if (header.chunkType == kCgfFontChunk) return InspectFont(chunk);
    if (header.chunkType == kCgfSetChunk) return InspectSet(chunk);
    Tell("unknown chunk of type " + std::to_string(header.chunkType) + ", " + Count(chunk.size(), "byte"));
}

void Inspector::InspectFont(Bytes chunk)
{
    if (chunk.size() < sizeof(CGF_FontHeader)) return Complain("too short for a font");
    auto const font = Load<CGF_FontHeader>(chunk);
    Tell("font " + std::to_string(font.id) + ": " + TextOf(font.face, sizeof(font.face)) + ", " +
        Count(font.height, "pixel") + " high, " + std::to_string(font.ascent) +
        " of them above the baseline, weight " + std::to_string(font.weight) +
        (font.italic != 0 ? ", italic" : "") + ", default character " + Code(font.defaultCharacter));
    if (chunk.size() != sizeof(font) || font.descriptionLength != kDescriptionLength)
        Complain("not as long as a font");
    if (font.id == 0) Complain("the font has the number 0");
    if (font.bitsPerPixel != 1) Complain("the bitmaps have more than two colours");
    if (font.ascent > font.height) Complain("the baseline lies below the cell");
    if (!fonts.try_emplace(font.id, Font{font.defaultCharacter, {}, {}}).second)
        Complain("there is a font " + std::to_string(font.id) + " already");
}

void Inspector::InspectSet(Bytes chunk)
{
    if (chunk.size() < sizeof(CGF_SetHeader)) return Complain("too short for a set");
    auto const set = Load<CGF_SetHeader>(chunk);
    unsigned const count = set.glyphCount == 0 ? kSetSize : set.glyphCount;
    auto const rest = chunk.subspan(sizeof(set));
    if (rest.size() < count * sizeof(kCgfNoGlyph)) return Complain("too short for its offsets");
    auto const font = fonts.find(set.fontId);
    if (font == fonts.end()) return Complain("there is no font " + std::to_string(set.fontId) + " before it");
    if (!font->second.sets.insert(set.number).second) Complain("the font has this set already");
    if (set.firstCode / kSetSize != set.number || (set.firstCode + count - 1) / kSetSize != set.number)
        Complain("it has characters that are not of set " + Hex(set.number, 2));

    auto const before = font->second.characters.size();
    auto const offsets = rest.first(count * sizeof(kCgfNoGlyph));
    InspectGlyphs(offsets, rest.subspan(offsets.size()), set.firstCode, font->second);
    Tell("set " + Hex(set.number, 2) + " of font " + std::to_string(set.fontId) + ": " +
        Count(font->second.characters.size() - before, "glyph") + " of " + Count(count, "character") +
        " from " + Code(set.firstCode) + ", " + Count(chunk.size(), "byte"));
}

void Inspector::InspectGlyphs(Bytes offsets, Bytes data, unsigned code, Font& font)
{
    std::size_t end = 0;
    for (; !offsets.empty(); offsets = offsets.subspan(sizeof(kCgfNoGlyph)), ++code) {
        auto const offset = Load<std::uint16_t>(offsets);
        if (offset == kCgfNoGlyph) continue;
        auto const name = "the glyph of " + Code(code);
        if (offset != end) Complain(name + " doesn't begin where the one before it ends");
        if (offset + sizeof(CGF_GlyphRecord) > data.size()) return Complain(name + " lies behind the set");
        auto const glyph = Load<CGF_GlyphRecord>(data.subspan(offset));
        end = offset + sizeof(glyph) + (std::size_t{glyph.rows} * glyph.width + 7) / 8;
        if (end > data.size()) return Complain(name + " doesn't end within the set");
        if (glyph.advance != 0) font.characters.insert(code);
    }
    if (end != data.size()) Complain(Count(data.size() - end, "byte") + " behind the glyphs");
}

std::string Inspector::TextOf(void const* field, std::size_t size)
{
    std::u16string text(size / sizeof(char16_t), u'\0');
    std::memcpy(text.data(), field, size);
    auto const end = text.find(u'\0');
    if (end == text.npos) Complain("a text has no end");
    std::string converted;
    icu::UnicodeString(false, text.data(), static_cast<int32_t>(std::min(end, text.size())))
        .toUTF8String(converted);
    return converted;
}

}

CgfInspection InspectCgf(std::span<unsigned char const> file) { return Inspector().Inspect(file); }

}
