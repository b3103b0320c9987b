#include <support/child_process.h>
#include <support/seed.h>
#include <tools/cgf_font.h>
#include <tools/cgf_inspect.h>
#include <tools/cgf_picture.h>
#include <tools/cgf_writer.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <png.h>
#include <random>

namespace {

tools::Glyphs const kGlyphs = {{u'?', {0, 2, 2, 1, 2, {1, 1}}}, {u'x', {-1, 1, 3, 3, 2, {1, 0, 1, 0, 1, 0}}}};

std::string SmallFile()
{
    CGF_FontHeader font;
    font.id = 1;
    font.height = 4;
    font.ascent = 3;
    font.defaultCharacter = u'?';
    return tools::MakeCgf(font, kGlyphs);
}

std::span<unsigned char const> BytesOf(std::string const& text)
{
    return {reinterpret_cast<unsigned char const*>(text.data()), text.size()};
}

/// A picture's rows without its margins, a letter a pixel.
std::string ReadPicture(std::string const& path, unsigned margin)
{
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    if (png_image_begin_read_from_file(&image, path.c_str()) == 0) return image.message;
    image.format = PNG_FORMAT_GRAY;
    std::vector<png_byte> pixels(PNG_IMAGE_SIZE(image));
    png_image_finish_read(&image, nullptr, pixels.data(), 0, nullptr);
    std::string text;
    for (unsigned y = margin; y < image.height - margin; ++y) {
        text += '\n';
        for (unsigned x = margin; x < image.width - margin; ++x) {
            auto const grey = pixels[y * image.width + x];
            text += grey == 0 ? '#' : grey == 255 ? ' ' : grey < 200 ? '_' : '.';
        }
    }
    return text;
}

TEST(CgfInspection, FindsFaultWithWhateverTheReaderRefuses)
{
    auto const sound = SmallFile();
    ASSERT_TRUE(tools::InspectCgf(BytesOf(sound)).problems.empty());
    auto const seed = NewSeed();
    std::mt19937 random(seed);
    unsigned refused = 0;
    for (int round = 0; round < 300; ++round) {
        auto damaged = sound;
        for (auto times = 1 + random() % 3; times > 0; --times) {
            // What lies between the beginning and the last set is offsets of no glyphs.
            auto const from = random() % 2 == 0 ? 0 : 148 + 87 + 255 * 524 - 8;
            damaged.at(from + random() % 256) = random() % 4 == 0 ? static_cast<char>(random()) : '\0';
        }
        if (random() % 8 == 0) damaged.resize(random() % damaged.size());
        auto const inspection = tools::InspectCgf(BytesOf(damaged));
        if (CGF_Container().Parse(BytesOf(damaged))) continue;
        ++refused;
        ASSERT_FALSE(inspection.problems.empty()) << "seed " << seed << ", round " << round;
    }
    EXPECT_GT(refused, 50U);
}

TEST(GlyphPicture, PaintsInkOverTheRoomOfGlyphs)
{
    tools::GlyphFont const font{4, 3, u'?', kGlyphs};
    tools::GlyphPicture picture(font, tools::GlyphPicture::Boxes::Yes);
    picture.AddText(u"xq\nx");
    auto const path = testing::TempDir() + "tessella-glyphs-" + std::to_string(getpid()) + ".png";
    ASSERT_EQ(picture.Save(path, 1), "");
    EXPECT_EQ(ReadPicture(path, 8), "\n .....\n ...#.\n#.#.#.\n #____\n ...  \n ...  \n#.#.  \n #__  ");
    tools::GlyphPicture twice(font, tools::GlyphPicture::Boxes::No);
    twice.AddText(u"?");
    ASSERT_EQ(twice.Save(path, 2), "");
    EXPECT_EQ(ReadPicture(path, 16), "\n    \n    \n##  \n##  \n##  \n##  \n    \n    ");
    std::filesystem::remove(path);
    EXPECT_EQ(twice.Save(path, 1U << 16), "the picture would be too large");
}

TEST(CgfTool, TellsAndShows)
{
    auto const folder = testing::TempDir() + "tessella-cgf-" + std::to_string(getpid());
    std::filesystem::create_directory(folder);
    auto bytes = SmallFile();
    std::ofstream(folder + "/sound", std::ios::binary) << bytes;
    bytes.at(16) = 1;
    std::ofstream(folder + "/damaged", std::ios::binary) << bytes;
    for (auto const& [words, status, answer] :
        {std::tuple{"list sound", 0, "set 00 of font 1: 2 glyphs of 193 characters from U+003F, "},
            {"check sound", 0, ""}, {"check damaged", 1, "damaged: its header speaks of 1"},
            {"list damaged", 1, "font 1: , 4 pixels high"}, {"check .", 1, ".: cannot be read"},
            {"render --set 00 damaged p.png", 1, "damaged: something is wrong"},
            {"render --set 0 --text xy --scale 2 sound p.png && cat p.png", 0, "PNG"},
            {"render --font 2 --text x sound p.png", 1, "has no font 2"},
            {"render --text x sound none/p.png", 1, "none/p.png: cannot be written: No such"},
            {"", 2, "the command is missing"}, {"show sound", 2, "unknown command 'show'"},
            {"check sound sound", 2, "one word too many"}, {"list --all", 2, "option '--all'"},
            {"render sound p.png", 2, "neither --text nor"},
            {"render --set 100 sound p.png", 2, "'100' is no number that"},
            {"render --text", 2, "the text is missing"}, {"render --text \xFF sound p.png", 2, "no UTF-8"},
            {"render --text x sound", 2, "picture's name is missing"}, {"render --colour", 2, "--colour"}}) {
        auto const command = "cd " + folder + " && " CGF_TOOL " " + words + " 2>&1";
        auto const outcome = RunChild([&] { return execl("/bin/sh", "sh", "-c", command.c_str(), nullptr); });
        EXPECT_EQ(WEXITSTATUS(outcome.status), status) << words;
        EXPECT_NE(outcome.out.find(answer), std::string::npos) << words << "\n" << outcome.out;
    }
    std::filesystem::remove_all(folder);
}

}
