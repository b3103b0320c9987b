#include <tessella/pixel/colors.h>

#include <gtest/gtest.h>

#include <cstdlib>

namespace {

struct Channels {
    unsigned red, green, blue, alpha;
};

GrColor Color(Channels c) { return c.red | c.green << 8 | c.blue << 16 | c.alpha << 24; }

/// Every red with every green; blue and alpha run along.
template <typename Visit>
void ForManyColors(Visit visit)
{
    for (unsigned red = 0; red < 256; ++red)
        for (unsigned green = 0; green < 256; ++green)
            visit(Channels{red, green, (red * 7 + green * 13) % 256, (red * 3 + green) % 256});
}

TEST(Colors, PackedFormatsKeepTheHighBitsOfEachChannel)
{
    ForManyColors([](Channels c) {
        ASSERT_EQ(GrColors15::ToPixel(Color(c)), c.red / 8 * 1024 + c.green / 8 * 32 + c.blue / 8);
        ASSERT_EQ(GrColors16::ToPixel(Color(c)), c.red / 8 * 2048 + c.green / 4 * 32 + c.blue / 8);
        ASSERT_EQ(GrColors24::ToPixel(Color(c)), c.red * 65536 + c.green * 256 + c.blue);
        ASSERT_EQ(GrColorsRGB::ToPixel(Color(c)), Color(c));
    });
    EXPECT_EQ(GrColors24::ToPixel(0x11223344), 0x00443322u);
}

TEST(Colors, PackedFormatsReadBackWithoutFillingTheLowBits)
{
    for (unsigned p = 0; p < 65536; ++p) {
        auto const pixel = static_cast<std::uint16_t>(p);
        ASSERT_EQ(GrColors15::FromPixel(pixel), Color({p / 1024 % 32 * 8, p / 32 % 32 * 8, p % 32 * 8, 0}));
        ASSERT_EQ(GrColors16::FromPixel(pixel), Color({p / 2048 * 8, p / 32 % 64 * 4, p % 32 * 8, 0}));
    }
    EXPECT_EQ(GrColors16::FromPixel(0xFFFF), 0xF8FCF8u);
    EXPECT_EQ(GrColors24::FromPixel(0xFF443322), 0x00223344u);
    EXPECT_EQ(GrColorsRGB::FromPixel(0x80123456), 0x80123456u);
}

TEST(Colors, CubeRoundsToTheNearestOfSixLevels)
{
    ForManyColors([](Channels c) {
        auto const level = [](unsigned channel) {
            unsigned nearest = 0;
            for (unsigned i = 1; i < 6; ++i)
                if (std::abs(int(channel - i * 51)) < std::abs(int(channel - nearest * 51))) nearest = i;
            return nearest;
        };
        ASSERT_EQ(GrColors8::ToPixel(Color(c)), 20 + level(c.red) + 6 * level(c.green) + 36 * level(c.blue));
    });
    EXPECT_EQ(GrColors8::ToPixel(0x000000), 20);
    EXPECT_EQ(GrColors8::ToPixel(0xFFFFFF), 235);
    EXPECT_EQ(GrColors8::ToPixel(0x0000FF), 25);
}

TEST(Colors, CubeReadsIndicesOutsideItThroughTheSameArithmetic)
{
    for (unsigned index = 20; index < 236; ++index) {
        GrColor const color = GrColors8::FromPixel(static_cast<std::uint8_t>(index));
        ASSERT_EQ(GrColors8::ToPixel(color), index);
        ASSERT_EQ(color % 51, 0u);
    }
    EXPECT_EQ(GrColors8::FromPixel(0), 0u);
    EXPECT_EQ(GrColors8::FromPixel(255), 0xFFFFFFu);
    EXPECT_EQ(GrColors8::FromPixel(236), Color({0, 0, 0, 0}) + (6 * 51u << 16));  // 306: blue runs into alpha
    EXPECT_EQ(GrColors8::FromPixel(19), Color({153, 0, 0, 0}) + (7 * 51u << 16));  // 19 - 20 wraps to 255
}

TEST(Colors, SixteenColoursAreFoundThroughTheDarkCornersOfTheCells)
{
    // In the order blue, green, red, as a VGA shows its text colours.
    static constexpr GrColor kVga[16] = {0x000000, 0xAA0000, 0x00AA00, 0xAAAA00, 0x0000AA, 0xAA00AA, 0x0055AA,
        0xAAAAAA, 0x555555, 0xFF5555, 0x55FF55, 0xFFFF55, 0x5555FF, 0xFF55FF, 0x55FFFF, 0xFFFFFF};
    GrColors4::BuildColorCube();
    EXPECT_EQ(GrColors4::ToPixel(0xFFFFFF), 15);
    EXPECT_EQ(GrColors4::ToPixel(0x1F1F1F), 0);
    for (unsigned index = 0; index < 16; ++index) {
        EXPECT_EQ(GrColors4::ToPixel(kVga[index]), index) << index;
        EXPECT_EQ(GrColors4::FromPixel(static_cast<std::uint8_t>(0xF0 | index)), kVga[index]);
    }
    ForManyColors([](Channels c) {
        Channels const corner{c.red & 0xE0, c.green & 0xE0, c.blue & 0xE0, 0};
        ASSERT_EQ(GrColors4::ToPixel(Color(c)), NearestPaletteIndex(Color(corner)));
    });
    EXPECT_EQ(NearestPaletteIndex(0x550000), 0) << "as far from black as from entry 1: the lower index wins";
    EXPECT_EQ(NearestPaletteIndex(0xFF560000), 1) << "alpha plays no part";
}

TEST(Colors, PremultiplyingShiftsAndDividingSpills)
{
    ForManyColors([](Channels c) {
        std::uint32_t const pixel =
            Color({c.red * c.alpha / 256, c.green * c.alpha / 256, c.blue * c.alpha / 256, c.alpha});
        ASSERT_EQ(GrColorsRGBA::ToPixel(Color(c)), pixel);
        if (c.alpha == 0) return;
        ASSERT_EQ(GrColorsRGBA::FromPixel(pixel),
            Color({(pixel & 0xFF) * 256 / c.alpha, (pixel >> 8 & 0xFF) * 256 / c.alpha,
                (pixel >> 16 & 0xFF) * 256 / c.alpha, c.alpha}));
    });
    EXPECT_EQ(GrColorsRGBA::ToPixel(0x80FFFFFF), 0x807F7F7Fu);
    EXPECT_EQ(GrColorsRGBA::ToPixel(0xFFFFFFFF), 0xFFFEFEFEu);
    EXPECT_EQ(GrColorsRGBA::FromPixel(0x00123456), 0u);
    EXPECT_EQ(GrColorsRGBA::FromPixel(0x01000002), 0x01000200u) << "2 * 256 / 1 runs into green";
    EXPECT_EQ(GrColorsRGBA::FromPixel(0x01000200), 0x01020000u) << "green into blue";
    EXPECT_EQ(GrColorsRGBA::FromPixel(0x01020000), 0x03000000u) << "blue into alpha";
}

}
