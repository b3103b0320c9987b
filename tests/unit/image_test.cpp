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

TEST(Image, OutlivesTheModeThatItWasMadeIn)
{
    auto const setMode = [](unsigned bits) {
        GrScreen.depth = 24;
        GrScreen.bytesPerPixel = bits / 8;
        GrScreen.createImageContext = FindVideoMode(bits, 24)->createImageContext;
    };
    for (unsigned const then : {24, 32})
        for (unsigned const now : {24, 32}) {
            setMode(then);
            GrImage const image(3, 3, 0);
            setMode(now);
            std::unique_ptr<GrContext> const context(image.GetContext());
            using Wide = GrImageContext<GrSurface32, GrColors24>;
            EXPECT_EQ(dynamic_cast<Wide*>(context.get()) != nullptr, then == 32) << then << ' ' << now;
        }
    GrScreen = {};
}

TEST(Image, SixteenColoursAreLookedUpFromTheFirstContextOn)
{
    for (auto& entry : GrColors4::colorCube)
        entry = 0;
    EXPECT_EQ(GrColors4::ToPixel(0xFFFFFF), 0);
    GrImage image(1, 1, nullptr, nullptr, 0);
    image.bits = 4;
    delete image.GetContext();
    EXPECT_EQ(GrColors4::ToPixel(0xFFFFFF), 15);
}

TEST(Image, TakesTheScreensFormatUnlessTrueColorIsAskedFor)
{
    GrScreen.depth = 16;
    GrScreen.bytesPerPixel = 2;
    GrImage const native(3, 2, GrImageNoDither);
    GrScreen = {};
    EXPECT_TRUE(native.bits == 16 && native.bytes == 2 && native.flags == GrImageNoDither);
    EXPECT_EQ(native.alphaPlane, nullptr);
    EXPECT_EQ(Bytes(native.pixels, native.pixels + 12), Bytes(12, 0));

    GrImage const both(3, 2, GrImageHasAlpha);
    EXPECT_EQ(both.flags, GrImageHasAlpha | GrImageTrueColor);
    EXPECT_TRUE(both.bits == 32 && both.bytes == 4 && both.pixels && both.alphaPlane);

    GrImage alphaOnly(3, 2, GrImageHasAlpha | GrImageAlphaOnly);
    EXPECT_TRUE(!alphaOnly.pixels && alphaOnly.alphaPlane);
    std::unique_ptr<GrContext> const context(alphaOnly.GetContext());
    context->FillRegion(GrRect{0, 0, 3, 2});
    EXPECT_EQ(context->GetPixel(1, 1), 0u) << "there are no pixels to paint";
    std::uint32_t const kept = alphaOnly.flags;
    alphaOnly.SetFlags(~0u);
    EXPECT_EQ(alphaOnly.flags, kept | GrImageNoDither | GrImageOverBack);
    alphaOnly.SetFlags(GrImageOverBack);
    EXPECT_EQ(alphaOnly.flags, kept | GrImageOverBack);

    EXPECT_NE(GrImage(3, 2, GrImageAlphaOnly | GrImageTrueColor).pixels, nullptr);
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
    GrImage alphaOnly(2, 1, GrImageHasAlpha | GrImageAlphaOnly);
    alphaOnly.Load(stream, 4);
    EXPECT_TRUE(alphaOnly.alphaPlane[0] == 4 && alphaOnly.alphaPlane[1] == 8);
    alphaOnly.Unload(nullptr, 4);
    for (int const width : {0, -1})
        for (int const bits : {8, 24}) {
            GrImage nothing(width, 10, new unsigned char[1], nullptr, 0);
            nothing.bits = bits;
            nothing.Load(nullptr, 4);
            nothing.Unload(nullptr, 4);
        }
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
