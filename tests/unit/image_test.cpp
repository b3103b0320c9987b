#include <tessella/bitmap.h>
#include <tessella/image.h>
#include <tessella/pixel/image_contexts.h>
#include <tessella/screen.h>
#include <tessella/video_mode.h>

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <vector>

namespace {

using Bytes = std::vector<unsigned char>;

/// True if an image of the format has a context of the given class.
template <typename Surface, typename Colors>
bool Gives(int bits, int bytes, std::uint32_t flags = 0)
{
    GrImage image(3, 3, new unsigned char[36](), nullptr, flags);
    if (!image.isTrueColor()) {
        image.bits = bits;
        image.bytes = bytes;
    }
    std::unique_ptr<GrContext> const context(image.GetContext());
    return dynamic_cast<GrImageContext<Surface, Colors>*>(context.get()) != nullptr;
}

TEST(Image, ContextFollowsTheFormat)
{
    EXPECT_TRUE((Gives<GrSurface8, GrColors4>(4, 1)));
    EXPECT_TRUE((Gives<GrSurface8, GrColors8>(8, 1)));
    EXPECT_TRUE((Gives<GrSurface16, GrColors15>(15, 2)));
    EXPECT_TRUE((Gives<GrSurface16, GrColors16>(16, 2)));
    EXPECT_TRUE((Gives<GrSurface24, GrColors24>(24, 3)));
    EXPECT_TRUE((Gives<GrSurface32, GrColors24>(32, 4)));
    EXPECT_TRUE((Gives<GrSurface32, GrColorsRGB>(0, 0, GrImageTrueColor)));
    EXPECT_TRUE((Gives<GrSurface32, GrColorsRGBA>(0, 0, GrImageTrueColor | GrImagePremultiplied)));

    for (unsigned const bits : {24, 32}) {
        GrScreen.depth = 24;
        GrScreen.bytesPerPixel = bits / 8;
        GrScreen.createImageContext = FindVideoMode(bits, 24)->createImageContext;
        EXPECT_TRUE((Gives<GrSurface24, GrColors24>(24, 3) && Gives<GrSurface32, GrColors24>(24, 4)))
            << "an image outlives the mode that it was made in";
    }
    GrScreen = {};

    testing::internal::CaptureStderr();
    EXPECT_EQ(GrImage(3, 3, 0).GetContext(), nullptr);
    EXPECT_NE(
        testing::internal::GetCapturedStderr().find("Assertion failed: false, file "), std::string::npos);
}

TEST(Image, SixteenColoursAreLookedUpFromTheFirstContextOn)
{
    for (auto& entry : GrColors4::colorCube)
        entry = 0;
    EXPECT_EQ(GrColors4::ToPixel(0xFFFFFF), 0);
    EXPECT_TRUE((Gives<GrSurface8, GrColors4>(4, 1)));
    EXPECT_EQ(GrColors4::ToPixel(0xFFFFFF), 15);
}

TEST(Image, TakesTheScreensFormatUnlessTrueColorIsAskedFor)
{
    GrScreen.depth = 16;
    GrScreen.bytesPerPixel = 2;
    GrImage const native(3, 2, GrImageNoDither);
    GrScreen = {};
    EXPECT_EQ(native.bits, 16);
    EXPECT_EQ(native.bytes, 2);
    EXPECT_EQ(native.flags, GrImageNoDither);
    EXPECT_EQ(native.alphaPlane, nullptr);
    for (int i = 0; i < 12; ++i)
        EXPECT_EQ(native.pixels[i], 0);

    GrImage const both(3, 2, GrImageHasAlpha);
    EXPECT_EQ(both.flags, GrImageHasAlpha | GrImageTrueColor);
    EXPECT_EQ(both.bits, 32);
    EXPECT_EQ(both.bytes, 4);
    EXPECT_TRUE(both.pixels && both.alphaPlane);

    GrImage alphaOnly(3, 2, GrImageHasAlpha | GrImageAlphaOnly);
    EXPECT_EQ(alphaOnly.pixels, nullptr);
    EXPECT_NE(alphaOnly.alphaPlane, nullptr);
    std::unique_ptr<GrContext> const context(alphaOnly.GetContext());
    context->FillRegion(GrRect{0, 0, 3, 2});
    EXPECT_EQ(context->GetPixel(1, 1), 0u) << "there are no pixels to paint";
    alphaOnly.SetFlags(~0u);
    EXPECT_EQ(alphaOnly.flags,
        GrImageHasAlpha | GrImageAlphaOnly | GrImageTrueColor | GrImageNoDither | GrImageOverBack);
    alphaOnly.SetFlags(GrImageOverBack);
    EXPECT_EQ(alphaOnly.flags & (GrImageNoDither | GrImageOverBack), GrImageOverBack + 0u);

    EXPECT_NE(GrImage(3, 2, GrImageAlphaOnly | GrImageTrueColor).pixels, nullptr)
        << "it goes with alpha only";

    for (auto const& [width, height] : {std::pair{0, 2}, {-1, 2}, {2, -1}}) {
        GrImage const nothing(width, height, GrImageHasAlpha);
        EXPECT_TRUE(!nothing.pixels && !nothing.alphaPlane);
    }

    unsigned char pixels[4], alpha[1];
    GrImage borrowed(1, 1, pixels, alpha, GrImageHasAlpha);
    EXPECT_TRUE(borrowed.isTrueColor() && borrowed.bits == 32 && borrowed.bytes == 4);
    borrowed.Detach();
}

/// The streams have no byte more than these, and the sanitizers watch.
TEST(Image, StreamsEndAtTheirLastByteAndFillWhatThereIs)
{
    GrImage image(2, 2, GrImageTrueColor);
    Bytes three(2 * 2 * 3, 200), four(2 * 2 * 4, 200);
    image.Load(three.data(), 3);
    EXPECT_EQ(image.flags, GrImageTrueColor | GrImagePremultiplied);
    image.Unload(four.data(), 4);
    EXPECT_EQ(four, Bytes(16, 0)) << "without an alpha plane, the alpha is 0";
    three.resize(2 * 2 * 3 + 2, 200);
    image.Unload(three.data(), 3);
    EXPECT_EQ(three.back(), 0);

    unsigned char const stream[] = {1, 2, 3, 4, 5, 6, 7, 8};
    GrImage alphaOnly(2, 1, GrImageHasAlpha | GrImageAlphaOnly), nothing(0, 10, GrImageHasAlpha);
    alphaOnly.Load(stream, 4);
    EXPECT_TRUE(alphaOnly.alphaPlane[0] == 4 && alphaOnly.alphaPlane[1] == 8);
    alphaOnly.Unload(nullptr, 4);
    nothing.Load(nullptr, 4);
    nothing.Unload(nullptr, 4);
}

TEST(Bitmap, HasWholeBytesARow)
{
    GrBitmap bitmap(9, 2);
    EXPECT_EQ(Bytes(bitmap.data, bitmap.data + 4), Bytes(4, 0));
    unsigned char const bits[] = {1, 2, 3, 4};
    bitmap.Load(bits);
    EXPECT_EQ(std::memcmp(bitmap.data, bits, 4), 0);
    bitmap.data[6] = 0;  // the last of three spare bytes
    for (auto const& [width, height] : {std::pair{0, 5}, {5, 0}, {-3, 2}}) {
        GrBitmap empty(width, height);
        EXPECT_TRUE(empty.width == 0 && empty.height == 0 && empty.data == nullptr);
        empty.Load(nullptr);
    }
}

}
