#include <examples/gallery/pages.h>
#include <support/on_console.h>

#include <gtest/gtest.h>
#include <png.h>

#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <string>

// The pages of the gallery in every format, small, against pictures that somebody has looked at. A page that
// differs is left in the build folder, beside its reference and a picture of where the two differ. With
// TESSELLA_BLESS set, the pages become the references.

namespace {

using gallery::ImageFormat;
using gallery::Page;

constexpr int kWidth = 128, kHeight = 96;
using Bytes = std::vector<std::uint8_t>;

int const languageIsSet = setenv("LC_ALL", "en", 1);  // it chooses fonts

/// Three bytes a pixel, red first; empty if there is no such picture.
Bytes ReadPng(std::string const& path)
{
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    if (!png_image_begin_read_from_file(&image, path.c_str())) return {};
    image.format = PNG_FORMAT_RGB;
    Bytes bytes(PNG_IMAGE_SIZE(image));
    return png_image_finish_read(&image, nullptr, bytes.data(), 0, nullptr) ? bytes : Bytes{};
}

void WritePng(std::string const& path, Bytes const& bytes)
{
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    image.width = kWidth;
    image.height = kHeight;
    image.format = PNG_FORMAT_RGB;
    ASSERT_TRUE(png_image_write_to_file(&image, path.c_str(), 0, bytes.data(), 0, nullptr)) << path;
}

void ExpectReference(Page const& page, std::string const& format, Bytes const& actual)
{
    std::string const name = std::string(page.name).append("-").append(format);
    std::string const reference = PICTURE_REFERENCES + name + ".png", miss = PICTURE_MISSES + name;
    if (std::getenv("TESSELLA_BLESS")) return WritePng(reference, actual);
    Bytes const wanted = ReadPng(reference);
    for (char const* const left : {".actual.png", ".reference.png", ".difference.png"})
        std::filesystem::remove(miss + left);
    if (wanted == actual) return;
    WritePng(miss + ".actual.png", actual);
    ADD_FAILURE() << name << " is not its reference: see " << miss << ".*.png";
    if (wanted.size() != actual.size()) return;
    WritePng(miss + ".reference.png", wanted);
    Bytes difference(actual.size());
    for (std::size_t i = 0; i < actual.size(); i += 3)
        if (std::memcmp(&wanted[i], &actual[i], 3) != 0)
            difference[i] = 255;
        else
            difference[i] = difference[i + 1] = difference[i + 2] = actual[i + 1] / 4;
    WritePng(miss + ".difference.png", difference);
}

std::unique_ptr<GrImage> DrawToImage(Page const& page, ImageFormat const& format)
{
    auto image = gallery::NewImage(format, kWidth, kHeight, [](int, int) -> GrColor { return 0; });
    std::unique_ptr<GrContext> const context(image->GetContext());
    page.draw({*context, format, kWidth, kHeight});
    return image;
}

Bytes PictureOf(GrImage const& image)
{
    std::unique_ptr<GrContext> const context(image.GetContext());
    Bytes bytes;
    for (int y = 0; y < kHeight; ++y)
        for (int x = 0; x < kWidth; ++x) {
            GrColor const color = context->GetPixel(x, y);
            bytes.insert(bytes.end(), {GrRed(color), GrGreen(color), GrBlue(color)});
        }
    return bytes;
}

void ExpectSameOnScreen(Page const& page, ImageFormat const& format, GrImage const& image)
{
    page.draw({*GrScreen.context, format, kWidth, kHeight});
    std::size_t const row = kWidth * GrScreen.bytesPerPixel;
    for (unsigned y = 0; y < kHeight; ++y)
        ASSERT_EQ(std::memcmp(GrScreen.fbMemory + y * GrScreen.stride, image.pixels + y * row, row), 0)
            << page.name << ", row " << y;
}

TEST(Pictures, OfEveryPageAreTheSameOnTheScreenAndInImages)
{
    for (char const* const mode : {"128x96x8", "128x96x15", "128x96x16", "128x96x24", "128x96x32"}) {
        SCOPED_TRACE(mode);
        OnConsole(mode, nullptr, [](console::VirtualConsole&) {
            Sizes sizes;
            ASSERT_TRUE(Init(sizes));
            ImageFormat const format{static_cast<int>(sizes.depth), 0};
            for (Page const& page : gallery::Pages()) {
                auto const image = DrawToImage(page, format);
                ExpectSameOnScreen(page, format, *image);
                ExpectReference(page, std::to_string(sizes.depth), PictureOf(*image));
            }
            GrDone();
        });
    }
}

TEST(Pictures, OfEveryPageInTheFormatsThatOnlyImagesHave)
{
    OnConsole("128x96x32", nullptr, [](console::VirtualConsole&) {
        Sizes sizes;
        ASSERT_TRUE(Init(sizes));
        for (Page const& page : gallery::Pages()) {
            ExpectReference(page, "4", PictureOf(*DrawToImage(page, {4, 0})));
            ExpectReference(page, "24", PictureOf(*DrawToImage(page, {32, GrImageTrueColor})));
            ExpectReference(page, "premultiplied",
                PictureOf(*DrawToImage(page, {32, GrImageTrueColor | GrImagePremultiplied})));
        }
        GrDone();
    });
}

TEST(Pictures, OfTextOweNothingToTheMachineButItsLanguage)
{
    struct Setting {
        char const *variable, *value;
        bool isSame;
    };
    for (Setting const& setting : {Setting{"FONTCONFIG_FILE", "/dev/null", true}, {"HOME", "/nowhere", true},
             {"LC_ALL", "tr_TR.ISO-8859-9", true}, {"LC_ALL", "none", true}, {"LC_ALL", "zh_TW.BIG5", false}})
        OnConsole("128x96x32", nullptr, [&setting](console::VirtualConsole&) {
            setenv(setting.variable, setting.value, 1);
            Sizes sizes;
            ASSERT_TRUE(Init(sizes));
            auto const image = DrawToImage({"text", gallery::DrawTexts}, {32, GrImageTrueColor});
            EXPECT_EQ(PictureOf(*image) == ReadPng(PICTURE_REFERENCES "text-24.png"), setting.isSame)
                << setting.variable << '=' << setting.value;
            GrDone();
        });
}

}
