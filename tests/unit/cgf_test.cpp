#include <support/cgf_file.h>
#include <tessella/cgf.h>

#include <gtest/gtest.h>

namespace {

bool Parse(CGF_Container& container, std::string const& file)
{
    std::vector<unsigned char> const bytes(file.begin(), file.end());  // nothing behind the last byte
    return container.Parse(bytes);
}

/// A record of one row, and its bit.
std::string Glyph(char advance, char bit) { return {1, 2, advance, 1, 1, bit}; }

TEST(Cgf, MissingGlyphsAreTheDefaultOneEvenIfItsSetWasReplaced)
{
    CgfFile file;
    file.AddChunk(CgfFont(1, 0, 400, 9), kCgfFontChunk);
    CGF_SetHeader set;
    set.fontId = 1;
    set.firstCode = '?';
    file.AddSet(set, {Glyph(3, 0), Glyph(3, 1)});
    file.AddChunk(_tagCGF_CHUNK{}, 3, "skipped");
    set.firstCode = 'a';
    std::vector<std::string> glyphs(256, Glyph(3, 2));
    glyphs[1].clear();
    glyphs[2] = Glyph(0, 3);
    file.AddSet(set, glyphs);
    set.number = 1;
    set.firstCode = 0x10100;
    file.AddSet(set, {Glyph(3, 4)});
    CGF_Container container;
    ASSERT_TRUE(Parse(container, file.Bytes() + "beyond the end"));
    auto const bit = [&](unsigned code) { return *container.FindFontById(1)->GetGlyph(code)->bits; };
    for (unsigned const code : {0u, 0x3Fu, 0x40u, 0x62u, 0x63u, 0x100u, 0x161u, 0x20100u, 0x300u})
        EXPECT_EQ(bit(code), 0) << code;
    EXPECT_EQ(bit('a') + bit('d') + bit(0xFF), 2 * 3);
    EXPECT_EQ(bit(0x10100), 4);
}

TEST(Cgf, ParsingStopsAtWhatIsWrongAndKeepsWhatCameBefore)
{
    CgfFile file;
    file.AddChunk(CgfFont(1, 0, 400, 9), kCgfFontChunk);
    CGF_SetHeader set;
    set.fontId = 1;
    set.firstCode = '?';
    file.AddSet(set, {"\1\2\3\1\10q"});
    enum { kFont = 148, kSet = kFont + 87, kEnd = kSet + 12 + 2 + 6 };
    ASSERT_EQ(file.header.size, kEnd);
    static constexpr struct {
        std::size_t place;
        int byte;
        bool font, glyphs, taken;
    } kChanges[] = {
        {kEnd - 1, 0, true, true, true},             // ink
        {10, 1, false, false, false},                // magic
        {16, kFont - 1, false, false, false},        // size of the file
        {16, kSet - 1, false, false, false},         // which ends within the font
        {140, 1, true, false, false},                // fewer chunks than there are
        {140, 3, true, true, false},                 // and more
        {144, 1, true, false, false},                // their sum: the first one passes it, but is kept
        {kFont, 86, false, false, false},            // size of the font
        {kFont, 4, false, false, false},             // less than a chunk's head
        {kFont + 5, 0, false, false, false},         // a font without a number
        {kSet, 21, true, false, false},              // size of the set: beyond the end
        {kSet, 13, true, false, false},              // within the offsets
        {kSet + 5, 2, true, false, false},           // another font's set
        {kSet + 12, 2, true, false, false},          // offset of a record beyond the end
        {kSet + 12 + 2 + 3, 2, true, false, false},  // its rows
    };
    for (auto const& change : kChanges) {
        CGF_Container container;
        std::string bytes = file.Bytes();
        bytes[change.place] = static_cast<char>(change.byte);
        EXPECT_EQ(Parse(container, bytes), change.taken) << change.place;
        auto const* const font = container.FindFontById(1);
        EXPECT_EQ(font != nullptr, change.font) << change.place;
        EXPECT_EQ(font != nullptr && font->GetGlyph(0) != nullptr, change.glyphs) << change.place;
    }
}

}
