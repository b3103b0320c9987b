#include <support/cgf_file.h>
#include <support/seed.h>
#include <tessella/cgf.h>

#include <gtest/gtest.h>

#include <map>
#include <random>
#include <tuple>

namespace {

bool Parse(CGF_Container& container, std::string const& file)
{
    std::vector<unsigned char> const bytes(file.begin(), file.end());  // nothing behind the last byte
    return container.Parse(bytes);
}

// The judge is a map from characters to what stands in the file.
TEST(Cgf, EveryCharacterGetsItsGlyphOrTheDefaultOne)
{
    unsigned const seed = NewSeed();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    for (int round = 0; round < 40; ++round) {
        CgfFile file;
        auto font = CgfFont(9, 0, 400, 17);
        font.bitsPerPixel = round % 4 == 0 ? 8 : 1;
        file.AddChunk(font, kCgfFontChunk);
        std::map<unsigned, std::string> expected;
        std::string fallback;
        for (unsigned left = random() % 6; left > 0; --left) {
            CGF_SetHeader set;
            set.fontId = 9;
            set.number = static_cast<std::uint8_t>(random() % 3);
            set.firstCode = set.number * 256u + random() % 2 * (random() % 300 + random() % 2 * 0x10000);
            std::erase_if(expected, [&](auto const& entry) { return entry.first / 256 % 256 == set.number; });
            std::vector<std::string> glyphs(random() % 2 ? 256 : random() % 255 + 1);
            for (unsigned code = set.firstCode; std::string & glyph : glyphs) {
                auto const advance = random() % 3, rows = random() % 22, width = random() % 22;
                auto const size = font.bitsPerPixel == 1 ? (rows * width + 7) / 8 : rows * width;
                if (random() % 4 != 0)
                    for (auto const byte : {random(), random(), advance, rows, width})
                        glyph += static_cast<char>(byte);
                if (!glyph.empty()) glyph += std::string(size, static_cast<char>(random()));
                if (!glyph.empty() && advance != 0 && code / 256 % 256 == set.number) expected[code] = glyph;
                ++code;
            }
            file.AddSet(set, glyphs);
            file.AddChunk(_tagCGF_CHUNK{}, 3, "skipped");
            if (expected.contains('?')) fallback = expected['?'];
        }
        CGF_Container container;
        ASSERT_TRUE(Parse(container, file.Bytes() + "beyond the end"));
        for (unsigned code = 0; code < 0x10400; ++code) {
            auto const* const glyph = container.FindFontById(9)->GetGlyph(code);
            std::string got;
            std::string const& wanted = expected.contains(code) ? expected[code] : fallback;
            if (glyph)
                for (int byte : {+glyph->left, +glyph->top, +glyph->advance, +glyph->rows, +glyph->width})
                    got += static_cast<char>(byte);
            if (glyph) got.append(reinterpret_cast<char const*>(glyph->bits), wanted.size() - 5);
            ASSERT_EQ(got, wanted) << code;
        }
    }
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
