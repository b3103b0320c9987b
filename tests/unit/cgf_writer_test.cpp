#include <support/layout_file.h>
#include <tools/cgf_compose.h>
#include <tools/cgf_face.h>
#include <tools/cgf_font.h>
#include <tools/cgf_inspect.h>
#include <tools/cgf_unifont.h>
#include <tools/cgf_writer.h>

#include <gtest/gtest.h>

#include <bit>
#include <cstring>
#include <set>

namespace {

/// The font that the library carries, as its reader gives it.
tools::GlyphFont const& Shipped()
{
    static CGF_Container container;
    static bool const parsed = container.Parse(ReadBytes(GLYPHSET));
    static auto const font = tools::TakeFont(*container.FindFontById(1));
    EXPECT_TRUE(parsed);
    return font;
}

std::string Drawn(char16_t code)
{
    auto const& glyph = Shipped().glyphs.at(code);
    std::string text;
    for (unsigned i = 0; i < glyph.ink.size(); ++i)
        text.append(i % glyph.width == 0 ? 1 : 0, '\n').append(1, glyph.ink[i] ? '#' : '.');
    return text;
}

/// The rows of a cell, or of a glyph as it stands there, up to 16 pixels each.
using Rows = std::array<unsigned long, 16>;

Rows RowsOf(tools::Glyph const& glyph, int shift)
{
    Rows rows{};
    for (unsigned i = 0; i < glyph.ink.size(); ++i)
        if (glyph.ink[i])
            rows.at(14 - static_cast<unsigned>(glyph.top) + i / glyph.width) |= 1UL
                << (static_cast<int>(glyph.width - 1 - i % glyph.width) + shift);
    return rows;
}

TEST(Glyphset, HoldsWhatTheSourcesHave)
{
    EXPECT_EQ(Shipped().height, 17);
    EXPECT_EQ(Shipped().ascent, 14);
    EXPECT_EQ(Shipped().defaultCharacter, u'?');
    EXPECT_EQ(Shipped().glyphs, tools::ComposeGlyphs({BITMAPS, OUTLINES, CELLS, OFFSETS}));

    auto const file = ReadBytes(GLYPHSET);
    EXPECT_EQ(tools::InspectCgf(file).problems, std::vector<std::string>());
    CGF_SetHeader set;
    std::size_t at = sizeof(CGF_Header) + sizeof(CGF_FontHeader);
    for (unsigned number = 256; number-- > 0; at += set.chunkSize) {
        std::memcpy(&set, &file.at(at), sizeof(set));
        EXPECT_EQ(+set.number, number);
        EXPECT_EQ(+set.firstCode, number == 3 ? 0x346 : number << 8);
        EXPECT_EQ(+set.glyphCount, number == 3 ? 186 : 0);
    }
    EXPECT_EQ(at, file.size());
}

TEST(Glyphset, LeavesTheInkOfCellsAsItIs)
{
    tools::Face const bitmaps(BITMAPS, tools::Face::kOnlySize);
    tools::Face const outlines(OUTLINES, 15);
    std::ifstream cells(CELLS);
    unsigned count = 0;
    for (std::string line; std::getline(cells, line);) {
        auto const code = static_cast<char16_t>(std::stoul(line, nullptr, 16));
        bool const missing = code >= 0x300 && code < 0x346;
        ASSERT_EQ(Shipped().glyphs.contains(code), !missing) << line;
        if (missing || (code && bitmaps.Has(code)) || outlines.Has(code)) continue;
        auto const& glyph = Shipped().glyphs.at(code);
        Rows cell;
        unsigned long all = 0;
        std::size_t const width = (line.size() - 5) / 16;
        for (unsigned y = 0; y < 16; ++y)
            all |= cell[y] = std::stoul(line.substr(5 + y * width, width), nullptr, 16);
        if (glyph.width == 0 && (all == 0 || glyph.advance == 1)) continue;  // invisible by its nature
        int const behind = std::countr_zero(all);
        EXPECT_EQ(RowsOf(glyph, behind), cell) << line;
        bool const isFixed = code >= 0x4E00 && code < 0xA000;
        EXPECT_TRUE(!isFixed || glyph.left + static_cast<int>(glyph.width) + behind == 16) << line;
        ++count;
    }
    EXPECT_GT(count, 55000U);
}

TEST(Glyphset, LooksLikeOneHand)
{
    EXPECT_EQ(Drawn(u'x'), "\n##...##\n.#...#.\n..#.#..\n...#...\n...#...\n..#.#..\n.#...#.\n##...##");
    EXPECT_EQ(Drawn(u'А'), Drawn(u'A'));
    EXPECT_EQ(Drawn(u'Ű').substr(0, 36), "\n....#.#.\n...#.#..\n..#.#...\n#......#");
    EXPECT_EQ(Shipped().glyphs.at(u' ').ink.size(), 0U);
    auto const heights = [](std::u16string_view letters) {
        std::set<std::pair<int, unsigned>> found;  // above the baseline, and in all
        for (char16_t const code : letters)
            found.emplace(Shipped().glyphs.at(code).top, Shipped().glyphs.at(code).rows);
        return found;
    };
    EXPECT_EQ(heights(u"xzvnrгжикмптшъэюяκπτ"), (std::set{std::pair(8, 8U)}));
    EXPECT_EQ(heights(u"ABEHTXZБГЖИКЛПЧШЫЮЯΓΔΛΞΠΣ"), (std::set{std::pair(11, 11U)}));
    for (auto const& [top, rows] : heights(u"ÅÉÑÇŰŐŮŘĎŤŠĄĘŻŚĞİŞЁЙЎЩЦфруΆΐβμζξφ中语한かカ"))
        EXPECT_TRUE(top <= 14 && static_cast<int>(rows) - top <= 3) << top << " " << rows;
    for (char16_t code = 0x391; code <= 0x44F; ++code) {
        auto const& glyph = Shipped().glyphs.at(code);
        EXPECT_GE(glyph.left, 0) << unsigned{code};
        EXPECT_LE(static_cast<unsigned>(glyph.left) + glyph.width, glyph.advance) << unsigned{code};
    }
}

TEST(CgfWriter, FileLooksByteForByteLikeThis)
{
    CGF_FontHeader font;
    font.id = 7;
    tools::Glyph const glyph{-2, 3, 4, 3, 3, {1, 0, 1, 0, 1, 0, 0, 0, 1}};
    auto const file = tools::MakeCgf(font, {{0x1FE, glyph}, {0x200, {0, 0, 9, 0, 0, {}}}});
    std::string const set1("\x17\0\0\0\2\7\1\xFE\1\0\0\2\0\0\xFF\xFF\xFE\3\4\3\3\x15\1", 23);
    std::string const set0("\x0C\2\0\0\2\7\0\0\0\0\0\0\xFF\xFF", 14);
    std::string const set2("\x11\2\0\0\2\7\2\0\2\0\0\0\0\0\xFF\xFF", 16);
    auto const at = file.size() - 524 - 23 - 529;
    EXPECT_EQ(file.substr(at, 16), set2);
    EXPECT_EQ(file.substr(at + 524, 5), std::string("\0\0\x09\0\0", 5));
    EXPECT_EQ(file.substr(at + 529, 23), set1);
    EXPECT_EQ(file.substr(at + 529 + 23, 14), set0);
    EXPECT_EQ(file.substr(0, 12), std::string("C\0G\0F\0\x31\0\x30\0\0\0", 12));
    EXPECT_EQ(file.size(), 148U + 87 + 253 * 524 + 524 + 23 + 529);

    std::vector<bool> const large(255 * 255);
    tools::Glyphs tooLarge;
    for (char16_t code = 0; code < 10; ++code)
        tooLarge[code] = {0, 0, 1, 255, 255, large};
    for (auto const& bad : {tools::Glyphs{{1, {}}}, {{1, {0, 0, 256, 0, 0, {}}}},
             {{1, {-129, 0, 1, 0, 0, {}}}}, {{1, {0, 128, 1, 0, 0, {}}}}, {{1, {0, 0, 1, 256, 0, {}}}},
             {{1, {0, 0, 1, 0, 256, {}}}}, tooLarge})
        EXPECT_THROW(tools::MakeCgf(font, bad), std::runtime_error);
}

TEST(Unifont, TellsWhereATextIsWrong)
{
    auto const path = testing::TempDir() + "tessella-unifont-" + std::to_string(getpid());
    for (std::string const& line : std::vector<std::string>{"", "41", "41:", "x:00", "41:0", "10000:00",
             "41:" + std::string(32, 'g'), "41:" + std::string(48, '0')}) {
        std::ofstream(path) << "40:" << std::string(32, '0') << "\n" << line << "\n";
        try {
            tools::ReadUnifont(path);
            ADD_FAILURE() << line;
        } catch (std::runtime_error const& error) {
            EXPECT_NE(std::string(error.what()).find(path + ":2: "), std::string::npos) << error.what();
        }
    }
    std::remove(path.c_str());
    EXPECT_THROW(tools::ReadUnifont(path), std::runtime_error);
}

}
