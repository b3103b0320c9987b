#include <tessella/cgf.h>

#include <algorithm>
#include <cstring>

namespace {

/// A record of the file, which may stand at any address.
template <typename Record>
Record Load(unsigned char const* bytes)
{
    Record record;
    std::memcpy(&record, bytes, sizeof(Record));
    return record;
}

template <typename Test>
CGF_Font const* FirstOf(std::list<CGF_Font> const& fonts, Test test)
{
    auto const font = std::ranges::find_if(fonts, test);
    return font != fonts.end() ? &*font : nullptr;
}

}

std::unique_ptr<CGF_Set> CGF_Set::Read(std::span<unsigned char const> chunk, unsigned bitsPerPixel)
{
    if (chunk.size() < sizeof(CGF_SetHeader)) return nullptr;
    std::unique_ptr<CGF_Set> set(new CGF_Set(Load<CGF_SetHeader>(chunk.data())));
    auto const offsets = chunk.subspan(sizeof(CGF_SetHeader));
    std::size_t const length = set->glyphs.size() * sizeof kCgfNoGlyph;
    if (offsets.size() < length) return nullptr;
    set->data.assign(offsets.begin() + static_cast<std::ptrdiff_t>(length), offsets.end());
    unsigned char const* at = offsets.data();
    for (CGF_Glyph& glyph : set->glyphs) {
        auto const offset = Load<std::uint16_t>(at);
        at += sizeof offset;
        if (offset == kCgfNoGlyph) continue;
        glyph.offset = offset;
        if (!set->ReadGlyph(glyph, bitsPerPixel)) return nullptr;
    }
    return set;
}

bool CGF_Set::ReadGlyph(CGF_Glyph& glyph, unsigned bitsPerPixel)
{
    auto const offset = static_cast<std::size_t>(glyph.offset);
    if (data.size() < offset + sizeof(CGF_GlyphRecord)) return false;
    auto const record = Load<CGF_GlyphRecord>(data.data() + offset);
    glyph.left = record.left;
    glyph.top = record.top;
    glyph.advance = record.advance;
    glyph.rows = record.rows;
    glyph.width = record.width;
    glyph.bits = data.data() + offset + sizeof record;
    std::size_t const pixels = std::size_t{record.rows} * record.width;
    std::size_t const size = bitsPerPixel == 1 ? (pixels + 7) / 8 : pixels;
    return data.size() - offset - sizeof record >= size;
}

void CGF_Font::AddSet(std::unique_ptr<CGF_Set> set)
{
    owned.push_back(std::move(set));
    sets[owned.back()->Number()] = owned.back().get();
    defaultGlyph = GetGlyph(defaultCharacter);
}

bool CGF_Container::Parse(std::span<unsigned char const> file)
{
    if (file.size() < sizeof(CGF_Header)) return false;
    auto const header = Load<CGF_Header>(file.data());
    if (std::memcmp(header.magic, magic, sizeof magic) != 0 || header.size < sizeof header) return false;
    static_cast<CGF_Header&>(*this) = header;

    auto rest = file.first(std::min<std::size_t>(file.size(), header.size)).subspan(sizeof header);
    std::size_t sum = 0;
    for (auto left = chunkCount; left > 0; --left) {
        if (rest.size() < sizeof(_tagCGF_CHUNK)) return false;
        std::size_t const length = Load<_tagCGF_CHUNK>(rest.data()).chunkSize;
        if (length < sizeof(_tagCGF_CHUNK) || length > rest.size()) return false;
        if (!ProcessChunk(rest.first(length))) return false;
        sum += length;
        if (sum > chunkBytes) return false;
        rest = rest.subspan(length);
    }
    return sum == chunkBytes;
}

bool CGF_Container::ProcessChunk(std::span<unsigned char const> chunk)
{
    switch (Load<_tagCGF_CHUNK>(chunk.data()).chunkType) {
    case kCgfFontChunk: return ProcessFont(chunk);
    case kCgfSetChunk: return ProcessSet(chunk);
    default: return true;
    }
}

// A font without a number stays, though nobody can find it by that.
bool CGF_Container::ProcessFont(std::span<unsigned char const> chunk)
{
    if (chunk.size() < sizeof(CGF_FontHeader)) return false;
    fonts.emplace_front(Load<CGF_FontHeader>(chunk.data()));
    return fonts.front().id != 0;
}

bool CGF_Container::ProcessSet(std::span<unsigned char const> chunk)
{
    if (chunk.size() < sizeof(CGF_SetHeader)) return false;
    auto const id = Load<CGF_SetHeader>(chunk.data()).fontId;
    auto const font = std::ranges::find_if(fonts, [&](CGF_Font const& f) { return f.id == id; });
    if (font == fonts.end()) return false;
    auto set = CGF_Set::Read(chunk, font->bitsPerPixel);
    if (!set) return false;
    font->AddSet(std::move(set));
    return true;
}

CGF_Font const* CGF_Container::FindFontById(std::uint8_t id) const
{
    return FirstOf(fonts, [&](CGF_Font const& font) { return font.id == id; });
}

CGF_Font const* CGF_Container::FindFont(Key const& key) const
{
    return FirstOf(fonts,
        [&](CGF_Font const& font) { return key.italic != 0 ? font.italic != 0 : font.weight == key.weight; });
}
