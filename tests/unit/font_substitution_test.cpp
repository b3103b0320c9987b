#include <support/memory_bundle.h>
#include <tessella/font_substitution.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

namespace {

/// Where the process stands, from its start to its end.
struct Folder {
    Folder() { std::filesystem::current_path(mkdtemp(name.data())); }
    ~Folder() { std::filesystem::remove_all(name); }
    std::string name = testing::TempDir() + "tessella_fonts_XXXXXX";
} const folder;

std::string ReadFile(char const* path)
{
    std::ifstream file(path);
    return std::string(std::istreambuf_iterator<char>(file), {});
}

/// What reading this table from the archive writes.
std::string Read(std::string const& table)
{
    memoryBundle.files = {{"fonts.xml", table}};
    testing::internal::CaptureStderr();
    ReadFontTable();
    return testing::internal::GetCapturedStderr();
}

/// What becomes of a request for a face as a file of the same name.
std::string Resolve(std::string const& face, int size, unsigned weight)
{
    GrFontDesc request;
    request.face = request.file = face;
    request.size = size;
    request.weight = weight;
    GrFontDesc desc = request;
    testing::internal::CaptureStderr();
    bool const found = ResolveFace(desc, request);
    std::string const warning = "TESSELLA: Warning! Face \"" + desc.face + "\" is not found\r\n";
    EXPECT_EQ(testing::internal::GetCapturedStderr(), found ? "" : warning);
    return desc.face + '|' + desc.file + '|' + desc.metrics + '|' + std::to_string(desc.size) + '|' +
        std::to_string(desc.weight) + '|' + std::to_string(desc.type) + (found ? "" : "|none");
}

}

TEST(FontSubstitution, ShippedTables)
{
    for (bool const cjk : {false, true}) {
        EXPECT_EQ(Read(ReadFile(cjk ? RESOURCES "fonts-cjk.xml" : RESOURCES "fonts.xml")), "");
        std::string const regular = cjk ? "helvetica||141|600|0" : "Nimbus_Sans.afm||141|600|1";
        std::string const bold = cjk ? "helvetica||14|601|0" : "Nimbus_Sans_Bold.afm||14|601|1";
        EXPECT_EQ(Resolve("helvetica", 141, 600), "scalable|" + regular);
        EXPECT_EQ(Resolve("helvetica", 14, 601), "scalable bold|" + bold);
        EXPECT_EQ(Resolve("helvetica", 140, 600), "helvetica|helvetica||140|600|0");
        EXPECT_EQ(Resolve("helvetica", 140, 601), "helvetica bold|helvetica||140|601|0");
        EXPECT_EQ(Resolve("Helvetica", 140, 400), "Helvetica|Helvetica||140|400|0|none");
    }
}

TEST(FontSubstitution, OddTables)
{
    EXPECT_EQ(Read(R"(<any><font face="bex" size="9" weight="Bold" other="">
            <switch by="size"><case value="9"><font type="ft"/></case></switch></font>
        <substitute><no/><font face="b" weight="bold" type="FT" size="7x" metrics="m" file="f">
            <switch by="size"><odd value="9"><no/><font file="nine"/></odd><default/>
                <case value="7"><font file="never"/></case></switch>
            <switch by="colour"><case value=""><font file="never"/></case><case><font file="never"/></case>
                <default><font face="&#x162;&#x165;&#x178;"/><font face="never"/></default></switch></font>
            <font face="" type="ft"><switch by="weight">
                <case value="regular"><font metrics="thin"/></case></switch></font>
            <font face="a"/></substitute><substitute><font face="b" metrics="never"/></substitute>
        <font face="bex" file="never"/></any>)"),
        "");
    EXPECT_EQ(Resolve("b", 9, 601), "bex|nine|m|9|400|1");
    EXPECT_EQ(Resolve("b", 7, 400), "bex|f|m|9|400|1");
    EXPECT_EQ(Resolve("a", -5, 600), "|a|thin|-5|600|1|none");
    EXPECT_EQ(Resolve("a", -5, 601), "|a||-5|601|1|none");

    std::string nested = "<any>";
    for (int i = 0; i < 100000; ++i)
        nested += "<font face='x'><switch><default>";
    EXPECT_EQ(Read(nested), "TESSELLA: filed to parse substitutes line:1 column:3200006\n");
    EXPECT_EQ(Resolve("x", 1, 400), "x|x||1|400|0");
}

TEST(FontSubstitution, FileInTheWorkingDirectoryGoesFirst)
{
    std::string const archived = "<any><font face='a' file='archived'/></any>";
    std::ofstream("fonts.xml") << "<any><font face='a' file='plain'/>\n<";
    EXPECT_EQ(Read(archived), "TESSELLA: filed to parse substitutes line:2 column:1\n");
    EXPECT_EQ(Resolve("a", 1, 400), "a|plain||1|400|0");
    std::filesystem::remove("fonts.xml");
    EXPECT_EQ(Read(archived), "");
    EXPECT_EQ(Resolve("a", 1, 400), "a|archived||1|400|0");
    memoryBundle.files.clear();
    ReadFontTable();
    EXPECT_FALSE(HasFontTable());
    EXPECT_EQ(Resolve("a", 1, 400), "a|a||1|400|0|none");
}
