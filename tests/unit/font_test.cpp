#include <support/cgf_file.h>
#include <support/memory_bundle.h>
#include <tessella/font.h>
#include <tessella/font_factory.h>

#include <gtest/gtest.h>

#include <memory>

namespace {

std::unique_ptr<GrFont> Create(bool italic, unsigned weight)
{
    return std::unique_ptr<GrFont>(GrFont::Create("any", 300, italic, weight, false, true));
}

/// What creating a font writes while the archive holds this file alone; and whether the font is valid.
std::string Words(std::string const& file, bool valid, char const* name = "glyphset.cgf")
{
    memoryBundle.files = {{name, file}};
    testing::internal::CaptureStderr();
    EXPECT_EQ(Create(false, 400)->IsValid(), valid);
    return testing::internal::GetCapturedStderr();
}

TEST(Font, WithoutAFactoryOrAFileTheRequestGoesToTheBuiltInFont)
{
    CgfFile file;
    file.AddChunk(CgfFont(1, 0, 400, 10), kCgfFontChunk);
    file.AddChunk(CgfFont(2, 0, 700, 12), kCgfFontChunk);
    EXPECT_EQ(Words(file.Bytes(), true), "TESSELLA: Warning! Unknown font type 0\r\n");
    memoryBundle.files["fonts.xml"] = "<any><font face='any' file='none' type='ft' weight='bold'/></any>";
    LoadFontTable();
    testing::internal::CaptureStderr();
    EXPECT_EQ(Create(false, 400)->GetHeight(), 10u);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "TESSELLA: Warning! Font file \"none\" not found\r\n");
    std::unique_ptr<GrFont> const nameless(GrFont::Create(nullptr, 0, false, 700, false, false));
    EXPECT_EQ(nameless->GetHeight(), 12u);
}

TEST(Font, SlantOrWeightChooseAndTheFirstFontServesAllOthers)
{
    CgfFile file;
    file.AddChunk(CgfFont(1, 0, 400, 10), kCgfFontChunk);
    file.AddChunk(CgfFont(2, 1, 700, 12), kCgfFontChunk);
    file.AddChunk(CgfFont(3, 0, 700, 13), kCgfFontChunk);
    file.AddChunk(CgfFont(4, 0, 700, 14), kCgfFontChunk);
    memoryBundle.files["glyphset.cgf"] = file.Bytes();
    LoadFontTable();
    auto const kept = Create(false, 0x10000 + 700);
    EXPECT_EQ(kept->GetHeight(), 14u);
    memoryBundle.files.clear();  // all of them share what the first one read
    EXPECT_EQ(Create(true, 400)->GetHeight(), 12u);
    EXPECT_EQ(Create(true, 400)->GetWeight(), 700u);
    EXPECT_EQ(Create(false, 500)->GetHeight(), 10u);
    EXPECT_EQ(Create(false, 500)->GetWeight(), 400u);
}

TEST(Font, MeasuringAddsWidthsAndOnesForWhatIsMissing)
{
    CgfFile file;
    file.AddChunk(CgfFont(1, 0, 400, 10), kCgfFontChunk);
    CGF_SetHeader set;
    set.fontId = 1;
    set.firstCode = 'a';
    file.AddSet(set, {{"\0\0\x6\0\0", 5}, {"\0\0\x7\0\0", 5}});
    LoadFontTable();
    EXPECT_EQ(Words(file.Bytes(), true), "");
    auto const font = Create(false, 400);
    EXPECT_EQ(font->GetTextWidth(reinterpret_cast<unsigned char const*>("abz"), 3), 6u + 7u + 1u);
    unsigned short const wide[] = {'b', 0x4E00};
    static_cast<GrFontBase&>(*font).embolden = true;
    EXPECT_EQ(font->GetTextWidthW(wide, 2), 7u + 1u + 2u);
    EXPECT_EQ(font->GetTextWidth(nullptr, 0), 0u);
    static_cast<GrFontBase&>(*font).valid = false;
    EXPECT_EQ(font->GetTextWidthW(wide, 2), 2u + 2u);
}

TEST(Font, WithoutAWholeFileItSaysSoAndUsesWhatThereIs)
{
    CgfFile file;
    file.AddChunk(CgfFont(1, 0, 400, 10), kCgfFontChunk);
    LoadFontTable();
    std::string const whole = file.Bytes(), shortRead = "Assertion failed: rs==(h.size-sz), file ";
    EXPECT_TRUE(Words(whole.substr(0, whole.size() - 1), false).starts_with(shortRead));
    file.header.size += 1;
    EXPECT_TRUE(Words(file.Bytes(), true).starts_with(shortRead));
    EXPECT_NE(Words({}, false).find("tessella/font_cgf.cpp, line 52"), std::string::npos);
    EXPECT_EQ(
        Words(std::string(17, '\0') + '\1' + std::string(300, '\0'), false), "");  // 256 bytes of nothing
    EXPECT_NE(Words(whole, false, "other")
                  .find("file != 0, file " TESSELLA_BUILD_FOLDER "tessella/font_cgf.cpp, line 42"),
        std::string::npos);
    RegisterFontFactory(0, [](GrFontDesc const&) -> GrFont* { return nullptr; });
    LoadFontTable();
    EXPECT_EQ(Words(whole, true), "");
}

}
