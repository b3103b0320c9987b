#include <support/seed.h>
#include <tessella/image.h>
#include <tessella/pixel/generic_context.h>
#include <tessella/pixel/wide_rows.h>

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <random>
#include <vector>

namespace {

/// Compares the rows for one width of registers with those that go pixel by pixel: first on all pairs of
/// alpha and channel and, in 16 bits, all pixels, then on random ones of all sizes.
template <int kLanes, typename Surface, typename Colors>
void JudgeRows()
{
    using Rows = GrWideRows<kLanes, Surface, Colors>;
    using Pixel = typename Colors::Pixel;
    SCOPED_TRACE(std::to_string(kLanes) + " lanes, " + std::to_string(Colors::kBits) + " bits");
    std::mt19937 random(NewSeed());
    for (unsigned round = 0; round < 150; ++round) {
        bool const all = round == 0;
        unsigned const width = all ? 256 : 1 + random() % (round % 2 ? 300 : 20),
                       height = all ? 256 : 1 + random() % 35;
        std::size_t const area = width * height;
        std::vector<unsigned char> target(area * Surface::kBytes), alphas(area), written(target);
        std::vector<GrColor> colors(area), read(area);
        unsigned run = 0;  // like an icon's
        for (unsigned i = 0; i < area; ++i) {
            if (random() % 20 == 0) run = random() % 3;
            alphas[i] = static_cast<unsigned char>(all ? i >> 8 : run == 0 ? random() : run == 1 ? 0 : 255);
            colors[i] = all ? i * 0x07010301 + 0x5500 : static_cast<GrColor>(random());
            auto const pixel = all && Surface::kBytes > 2 ? (i & 255) * 0x030201 + 0x11555500
                : all                                     ? i
                                                          : random();
            Surface::WritePixel(target.data(), static_cast<int>(i), static_cast<Pixel>(pixel));
        }

        int const count = static_cast<int>(area);
        Rows::Read(target.data(), count, read.data());
        Rows::Write(written.data(), count, colors.data());
        for (int i = 0; i < count; ++i) {
            auto const pixel = static_cast<Pixel>(Surface::ReadPixel(target.data(), i));
            ASSERT_EQ(read[static_cast<unsigned>(i)], Colors::FromPixel(pixel));
            ASSERT_EQ(
                Surface::ReadPixel(written.data(), i), Colors::ToPixel(colors[static_cast<unsigned>(i)]));
        }

        // With and without colours, alpha values, something below, diffusion.
        std::vector<std::int32_t> errors(width * 3);
        for (int kind = 0; kind < (Colors::kDithers ? 16 : 8); ++kind)
            for (unsigned alpha = all ? 0 : random() % 256; alpha < 256; alpha += all ? 51 : 256) {
                auto expected = target, actual = target;
                GrBlend blend{{expected.data(), std::ptrdiff_t{width} * Surface::kBytes,
                                  static_cast<int>(width), static_cast<int>(height)},
                    kind & 1 ? reinterpret_cast<unsigned char*>(colors.data()) : nullptr,
                    kind & 2 ? alphas.data() : nullptr, static_cast<int>(width),
                    static_cast<std::uint8_t>(alpha), (kind & 4) != 0, Colors::ToPixel(colors[0]),
                    Surface::kAllBits, kind & 8 ? errors.data() : nullptr};
                BlendPixels<Surface, Colors>(blend);
                blend.target.address = actual.data();
                Rows::Blend(blend);
                ASSERT_TRUE(actual == expected) << width << " by " << height << ", kind " << kind;
            }
    }
}

template <int kLanes, typename Surface>
void JudgeBits()
{
    std::mt19937 random(NewSeed());
    auto const number = [&](int below) { return static_cast<int>(random() % static_cast<unsigned>(below)); };
    for (int round = 0; round < 500; ++round) {
        GrBits bits{nullptr, 1 + number(round % 2 ? 80 : 12), 1 + number(20), 0, number(2) != 0};
        if (number(2)) bits.pitch = (bits.width + 7) / 8 + number(3);
        int const last =
            bits.pitch ? (bits.height - 1) * bits.pitch * 8 + bits.width : bits.width * bits.height;
        std::vector<unsigned char> data(static_cast<std::size_t>(last + 7) / 8), actual(30000),
            expected(actual);
        for (auto& byte : data)
            byte = static_cast<unsigned char>(random());
        bits.data = data.data();
        int const column = number(bits.width), row = number(bits.height), stride = 90 * Surface::kBytes + 1;
        GrBitsBox const box{{actual.data(), stride, bits.width - column, bits.height - row}, bits, column,
            row, static_cast<typename Surface::Pixel>(random()),
            static_cast<typename Surface::Pixel>(random()), number(2) != 0};
        for (int y = row; y < bits.height; ++y)
            for (int x = column; x < bits.width; ++x)
                if (bits.IsSet(y, x) || !box.transparent)
                    Surface::WritePixel(expected.data() + (y - row) * stride, x - column,
                        static_cast<typename Surface::Pixel>(bits.IsSet(y, x) ? box.fore : box.back));
        GrWideBits<kLanes, Surface>::Paint(box);
        ASSERT_EQ(actual, expected) << kLanes << " lanes of " << Surface::kBytes;
    }
}

template <int kLanes>
void JudgeFormats()
{
    if (WideLanes() < kLanes) GTEST_SKIP() << "no registers of " << kLanes << " words here";
    JudgeRows<kLanes, GrSurface8, GrColors8>();
    JudgeRows<kLanes, GrSurface16, GrColors15>();
    JudgeRows<kLanes, GrSurface16, GrColors16>();
    JudgeRows<kLanes, GrSurface24, GrColors24>();
    JudgeRows<kLanes, GrSurface32, GrColors24>();
    JudgeRows<kLanes, GrSurface32, GrColorsRGB>();
    JudgeBits<kLanes, GrSurface8>();
    JudgeBits<kLanes, GrSurface16>();
    JudgeBits<kLanes, GrSurface24>();
    JudgeBits<kLanes, GrSurface32>();
}

// The same pixels as one by one.
TEST(WideRows, OfFourLanesAreRight) { JudgeFormats<4>(); }
TEST(WideRows, OfEightLanesAreRight) { JudgeFormats<8>(); }
TEST(WideRows, OfSixteenLanesAreRight) { JudgeFormats<16>(); }

struct Picture {
    GrImage image{3, 1, GrImageTrueColor};
    std::unique_ptr<GrContext> context{image.GetContext()};

    GrColor Blended(GrColor over, GrColor below, GrBlendParams params, GrImage const* source = nullptr)
    {
        context->SetForeColor(below);
        context->FillRegion(GrRect{0, 0, 3, 1});
        context->SetForeColor(over);
        context->DrawImageAlpha({0, 0, 1, 1}, source, 0, 0, params);
        return context->GetPixel(0, 0);
    }
};

TEST(Blend, NeitherRoundsNorStopsAt255)
{
    Picture picture;
    EXPECT_EQ(picture.Blended(0xFFFFFF, 0, {true, false, true, 128}), 0xFF7F7F7Fu);
    EXPECT_EQ(picture.Blended(0, 0xFFFFFF, {true, false, true, 1}), 0xFFFDFDFDu);
    EXPECT_EQ(picture.Blended(0xFFFFFF, 0xFFFFFF, {true, false, true, 254}), 0xFFFDFDFDu);
    GrImage source(1, 1, GrImageHasAlpha);
    std::memset(source.pixels, 0xFF, 4);
    source.alphaPlane[0] = 1;
    EXPECT_EQ(picture.Blended(0, 0x0000FF, {true, false, false, 0}, &source), 0xFFFFFFFCu)
        << "255 + 253: the ninth bit is set in green already";
    source.pixels[1] = 0x10;
    EXPECT_EQ(picture.Blended(0, 0x0000FF, {true, false, false, 0}, &source), 0xFFFF11FCu);
}

TEST(Blend, FillsHolesAndRefusesWhatCannotBeBlended)
{
    Picture picture;
    GrRegion region = GrRect{0, 0, 3, 1};
    region -= GrRect{1, 0, 2, 1};
    picture.context->SetForeColor(0x102030);
    picture.context->FillRegionAlpha(region, 255);
    EXPECT_EQ(picture.context->GetPixel(1, 0), 0x102030u);

    GrImage other(1, 1, new unsigned char[4](), nullptr, 0);
    testing::internal::CaptureStderr();
    EXPECT_EQ(picture.Blended(1, 2, {true, false, true, 128}, &other), 2u);
    EXPECT_NE(testing::internal::GetCapturedStderr().find("!image || image->isTrueColor(), file "),
        std::string::npos);
    other.bits = 99;
    testing::internal::CaptureStderr();
    picture.context->DrawImage({0, 0, 1, 1}, other, 0, 0);
    picture.context->ReadImage({0, 0, 1, 1}, other, 0, 0);
    EXPECT_NE(testing::internal::GetCapturedStderr().find("false, file "), std::string::npos);
    for (auto const* const image : {&picture.image, static_cast<GrImage*>(nullptr)})
        EXPECT_EQ(picture.Blended(1, 2, {true, false, false, 128}, image), 2u) << "there is no alpha plane";
}

TEST(Blend, OfAnImageIntoItselfGoesFromLeftToRight)
{
    GrImage image(40, 1, GrImageTrueColor);
    std::unique_ptr<GrContext> const context(image.GetContext());
    GrColor colors[40];
    for (unsigned i = 0; i < 40; ++i)
        colors[i] = i * 0x050607;
    std::memcpy(image.pixels, colors, sizeof colors);
    context->DrawImageAlpha({1, 0, 40, 1}, &image, 0, 0, {true, false, true, 200});
    for (unsigned i = 1; i < 40; ++i)
        colors[i] = Mixed(Faded(colors[i - 1], 200), colors[i], 55);
    EXPECT_EQ(std::memcmp(image.pixels, colors, sizeof colors), 0);
}

TEST(Bits, FollowEachOtherWithoutAPitch)
{
    std::uint8_t const data[] = {0b0000'0101, 0b0000'0010};
    GrBits const stream{data, 3, 4, 0, true}, rows{data, 3, 2, 1, true};
    EXPECT_TRUE(stream.IsSet(0, 0) && !stream.IsSet(0, 1) && stream.IsSet(0, 2) && stream.IsSet(3, 0));
    EXPECT_TRUE(!rows.IsSet(0, 0) && GrBits({data, 8, 2, 1, true}).IsSet(1, 6));
}

}
