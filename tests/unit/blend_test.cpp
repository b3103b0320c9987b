#include <tessella/image.h>
#include <tessella/pixel/generic_context.h>
#include <tessella/pixel/wide_rows.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <limits>
#include <memory>
#include <random>
#include <vector>

namespace {

using Bytes = std::vector<unsigned char>;

constexpr std::size_t At(int index) { return static_cast<std::size_t>(index); }

/// Compares the rows for one width of registers with those that go pixel by pixel.
template <int kLanes, typename Surface, typename Colors>
class WideRows {
public:
    void Judge()
    {
        SCOPED_TRACE(std::to_string(kLanes) + " lanes, " + std::to_string(Colors::kBits) + " bits");
        if (WideLanes() < kLanes) return;  // this processor cannot run them
        // All pairs of alpha and channel; and in formats of 16 bits, all pixels.
        Resize(256, 256);
        for (int i = 0; i < 65536; ++i) {
            int const pixel = Surface::kBytes <= 2 ? i : (i & 255) * 0x030201 + 0x11555500;
            alphas[At(i)] = static_cast<unsigned char>(i / 256);
            colors[At(i)] = GrMakeColor(static_cast<std::uint8_t>(i), static_cast<std::uint8_t>(i + 85),
                static_cast<std::uint8_t>(i + 170), static_cast<std::uint8_t>(i * 7));
            Surface::WritePixel(target.data(), i, static_cast<typename Surface::Pixel>(pixel));
        }
        JudgeConversion();
        for (int const alpha : {0, 1, 40, 128, 254, 255})
            JudgeBlends(alpha);
        for (int round = 0; round < 150 && !testing::Test::HasFailure(); ++round) {
            Resize(Number(1, 300), Number(1, 35));
            JudgeConversion();
            JudgeBlends(Number(0, 255));
        }
    }

private:
    int Number(int from, int to) { return std::uniform_int_distribution(from, to)(random); }

    void Resize(int newWidth, int newHeight)
    {
        width = newWidth;
        height = newHeight;
        colors.resize(At(width * height));
        alphas.resize(At(width * height));
        target.resize(At(width * height * Surface::kBytes));
        std::generate(colors.begin(), colors.end(), [&] { return static_cast<GrColor>(random()); });
        std::generate(target.begin(), target.end(), [&] { return static_cast<unsigned char>(random()); });
        int run = 0;  // like an icon's
        for (auto& alpha : alphas) {
            if (Number(0, 20) == 0) run = Number(0, 2);
            alpha = static_cast<unsigned char>(run == 0 ? random() : run == 1 ? 0 : 255);
        }
    }

    /// With and without colours, alpha values, something below, diffusion.
    void JudgeBlends(int alpha)
    {
        std::vector<std::int32_t> errors(At(width * 3));
        for (int kind = 0; kind < (Colors::kDithers ? 16 : 8); ++kind) {
            Bytes expected = target, actual = target;
            GrBlend blend{{expected.data(), std::ptrdiff_t{width} * Surface::kBytes, width, height},
                kind & 1 ? reinterpret_cast<unsigned char*>(colors.data()) : nullptr,
                kind & 2 ? alphas.data() : nullptr, width, static_cast<std::uint8_t>(alpha), (kind & 4) != 0,
                Colors::ToPixel(colors[0]), Surface::kAllBits, kind & 8 ? errors.data() : nullptr};
            BlendPixels<Surface, Colors>(blend);
            blend.target.address = actual.data();
            GrWideRows<kLanes, Surface, Colors>::Blend(blend);
            ASSERT_TRUE(actual == expected) << width << " by " << height << ", kind " << kind;
        }
    }

    void JudgeConversion()
    {
        std::vector<GrColor> read(colors.size());
        Bytes written(target.size());
        GrWideRows<kLanes, Surface, Colors>::Read(target.data(), width * height, read.data());
        GrWideRows<kLanes, Surface, Colors>::Write(written.data(), width * height, colors.data());
        for (int i = 0; i < width * height; ++i) {
            auto const pixel = static_cast<typename Colors::Pixel>(Surface::ReadPixel(target.data(), i));
            ASSERT_EQ(read[At(i)], Colors::FromPixel(pixel));
            ASSERT_EQ(Surface::ReadPixel(written.data(), i), Colors::ToPixel(colors[At(i)]));
        }
    }

    std::mt19937 random{std::random_device{}()};
    int width, height;
    std::vector<GrColor> colors;
    Bytes target, alphas;
};

template <typename Surface, typename Colors>
void JudgeWideRows()
{
    WideRows<4, Surface, Colors>().Judge();
    WideRows<8, Surface, Colors>().Judge();
    WideRows<16, Surface, Colors>().Judge();
}

TEST(WideRows, GiveTheSamePixelsAsOneByOne)
{
    JudgeWideRows<GrSurface8, GrColors8>();
    JudgeWideRows<GrSurface16, GrColors15>();
    JudgeWideRows<GrSurface16, GrColors16>();
    JudgeWideRows<GrSurface24, GrColors24>();
    JudgeWideRows<GrSurface32, GrColors24>();
    JudgeWideRows<GrSurface32, GrColorsRGB>();
}

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
    for (auto const* const image : {&picture.image, static_cast<GrImage*>(nullptr)})
        EXPECT_EQ(picture.Blended(1, 2, {true, false, false, 128}, image), 2u) << "there is no alpha plane";
}

TEST(Blit, TakesAnyCoordinatesAndNoUnknownFormat)
{
    constexpr int kMin = std::numeric_limits<int>::min(), kMax = std::numeric_limits<int>::max();
    Picture picture;
    for (int const origin : {kMin, -1, 0, 1, kMax}) {
        picture.context->SetOrigin(origin, origin);
        for (GrRect const& rect : {GrRect{kMin, kMin, kMax, kMax}, {kMax, kMax, kMin, kMin}, {5, 0, -5, 9}}) {
            picture.context->CopyFromContext(rect, picture.context.get(), kMax, kMin);
            picture.context->DrawBitmap(rect.x1, rect.y1, GrBitmap(0, 0));
            picture.context->DrawImageDirect({5, 0, -5, 9}, picture.image, 0, 0);
            picture.context->DrawImageAlpha(rect, nullptr, kMin, kMax, {true, false, true, 9});
        }
    }
    GrImage odd(2, 2, nullptr, nullptr, 0);
    odd.bits = 99;
    odd.bytes = 4;
    testing::internal::CaptureStderr();
    picture.context->DrawImage({0, 0, 2, 2}, odd, 0, 0);
    picture.context->ReadImage({0, 0, 2, 2}, odd, 0, 0);
    EXPECT_NE(testing::internal::GetCapturedStderr().find("false, file "), std::string::npos);
}

TEST(Bits, FollowEachOtherWithoutAPitch)
{
    std::uint8_t const data[] = {0b0000'0101, 0b0000'0010};
    GrBits const stream{data, 3, 4, 0, true}, rows{data, 3, 2, 1, true};
    EXPECT_TRUE(stream.IsSet(0, 0) && !stream.IsSet(0, 1) && stream.IsSet(0, 2) && stream.IsSet(3, 0));
    EXPECT_TRUE(!rows.IsSet(0, 0) && GrBits({data, 8, 2, 1, true}).IsSet(1, 6));
}

}
