#include <support/memory_bundle.h>
#include <tessella/font_factory.h>
#include <tessella/font_ft.h>
#include <tessella/font_substitution.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <ft2build.h>
#include FT_FREETYPE_H

namespace {

std::string ReadFile(std::string const& path)
{
    std::ifstream file(path, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(file), {});
}

GrFontDesc Describe(std::string const& file, int size, bool smooth = true, std::string const& metrics = {})
{
    memoryBundle.files = {
        {"face", ReadFile(FACE)}, {"metrics", ReadFile(METRICS)}, {"bad", std::string(400, 'x')}};
    GrFontDesc desc;
    desc.file = file;
    desc.metrics = metrics;
    desc.size = size;
    desc.flags = {false, smooth, !metrics.empty()};
    return desc;
}

/// What making the font writes; and whether it is valid.
std::string Words(std::string const& file, std::string const& metrics, bool valid)
{
    testing::internal::CaptureStderr();
    EXPECT_EQ(GrFontFT(Describe(file, 140, true, metrics)).IsValid(), valid);
    return testing::internal::GetCapturedStderr();
}

}

TEST(FontFreeType, GlyphsAreFreeTypesOwnRoundedToPixels)
{
    FT_Library library;
    FT_Face face;
    ASSERT_EQ(FT_Init_FreeType(&library) + FT_New_Face(library, FACE, 0, &face), 0);
    for (auto const& [size, pixels, smooth] :
        {std::tuple(135, 13, true), {136, 13, false}, {2800, 13, true}, {1000, 96, false}}) {
        GrFontFT font(Describe("face", size, smooth));
        FT_Set_Pixel_Sizes(face, 0, static_cast<unsigned>(pixels));
        EXPECT_EQ(font.height, (face->size->metrics.height + 32) / 64);
        EXPECT_EQ(font.ascent, (face->size->metrics.ascender + 32) / 64);
        for (unsigned code = ' '; code < 0x180; ++code) {
            GrGlyphInfo info, again;
            ASSERT_TRUE(
                font.GetGlyph(code, info) && font.GetGlyph(0x10000 + code, again) && info.bits == again.bits);
            ASSERT_EQ(FT_Load_Char(face, code, smooth ? 68 : 4164), 0);
            FT_GlyphSlot const slot = face->glyph;
            EXPECT_EQ(info.advance, (slot->advance.x + 32) / 64);
            EXPECT_EQ(std::tuple(info.top, info.left, info.bitsPerPixel),
                std::tuple(slot->bitmap_top, slot->bitmap_left, smooth ? 8u : 1u));
            auto const* const bits = slot->bitmap.buffer;
            std::string ink(bits, bits + slot->bitmap.rows * static_cast<unsigned>(slot->bitmap.pitch));
            if (ink.find_first_not_of('\0') == ink.npos) ink.clear();
            EXPECT_EQ(std::string(info.bits, info.bits + info.rows * info.pitch), ink) << code;
            EXPECT_EQ(info.width, ink.empty() ? 0 : slot->bitmap.width);
        }
    }
    FT_Done_FreeType(library);
}

TEST(FontFreeType, KerningTakesCodesForIndicesAndMeasuringLeavesItOut)
{
    GrFontFT font(Describe("face", 917, true, "metrics"));
    int out[2] = {9, 9};
    EXPECT_TRUE(font.GetKerning(out, 262, 5));
    EXPECT_EQ(std::pair(out[0], out[1]), std::pair(-9, 0));  // -0.103 of 88 pixels
    EXPECT_FALSE(GrFontFT(Describe("face", 917)).GetKerning(out, 262, 5));
    unsigned short const text[] = {5, 262};
    GrGlyphInfo first, second;
    EXPECT_TRUE(font.GetGlyph(5, first) && font.GetGlyph(262, second));
    EXPECT_EQ(font.GetTextWidthW(text, 2), first.advance + second.advance);

    // Upward it comes in 64ths, and is taken as it is.
    GrFontDesc desc = Describe("face", 917, true, "upward");
    memoryBundle.files["upward"] =
        "StartFontMetrics 2.0\nFontBBox 0 0 9 9\nStartCharMetrics 0\nEndCharMetrics\n"
        "StartKernData\nStartKernPairs 1\nKP A V -103 50\nEndKernPairs\nEndKernData\n"
        "EndFontMetrics\n";
    EXPECT_TRUE(GrFontFT(desc).GetKerning(out, 21, 854));
    EXPECT_EQ(std::pair(out[0], out[1]), std::pair(-9, 256));
}

TEST(FontFreeType, WithoutItsFilesItSaysSo)
{
    EXPECT_EQ(Words("none", "none", false), "TESSELLA: Warning! Font file \"none\" not found\r\n");
    EXPECT_EQ(Words("bad", "none", false), "TESSELLA: Failed to load FreeType font \"bad\" code:2\r\n");
    EXPECT_EQ(Words("face", "bad", false), "TESSELLA: Failed to attach metrics font \"bad\" code:2\r\n");
    EXPECT_EQ(Words("face", "none", true), "TESSELLA: Warning! metrics file \"none\" is not found\r\n");
    std::ofstream("face") << std::string(400, 'y');
    EXPECT_EQ(Words("face", "", false), "TESSELLA: Failed to load FreeType font \"face\" code:2\r\n");
    std::filesystem::remove("face");
    memoryBundle.files["fonts.xml"] = "<any><font face='any' file='face' type='ft'/></any>";
    LoadFontTable();
    std::unique_ptr<GrFont> const font(GrFont::Create("any", 140, false, 700, true, true));
    EXPECT_TRUE(dynamic_cast<GrFontFT*>(font.get()) != nullptr && font->GetWeight() == 700);
    ReleaseFontTable();
}
