#include <support/random_blits.h>

#include <gtest/gtest.h>

#include <random>
#include <vector>

namespace {

using Bytes = std::vector<unsigned char>;

class Streams {
public:
    explicit Streams(unsigned seed) : random(seed) {}

    /// Loads and unloads a random stream and judges every byte of image and stream.
    void Judge(ImageKind const& kind)
    {
        int const width = Number(1, 40), area = width * Number(1, 9);
        bool const hasAlpha = Number(0, 1) != 0, dithers = kind.dithers && Number(0, 3) != 0;
        int const step = Number(hasAlpha ? 4 : 3, 5);
        Bytes const stream = NewBytes((area - 1) * step + (hasAlpha ? 4 : 3));
        Bytes pixels = NewBytes(area * kind.bytes), alphas = NewBytes(hasAlpha ? area : 0);
        GrImage image(width, area / width, pixels.data(), hasAlpha ? alphas.data() : nullptr,
            (kind.flags & GrImageTrueColor) | (dithers ? 0u : GrImageNoDither));
        image.bits = kind.bits;
        image.bytes = kind.bytes;
        Bytes expectedPixels = pixels, expectedAlphas = alphas, colors = NewBytes((area - 1) * step + 8);
        Bytes expectedColors = colors;
        Canvas::Errors errors(width);
        for (int i = 0; i < area; ++i) {
            if (i % width == 0) errors.StartRow();
            unsigned char const* const from = &stream[At(i * step)];
            GrColor const color = GrMakeColor(from[0], from[1], from[2], hasAlpha ? from[3] : 0);
            std::uint32_t pixel = 0;
            unsigned char* const to = &expectedPixels[At(i * kind.bytes)];
            if (!dithers) {
                pixel = kind.toPixel(color);
                if (hasAlpha) expectedAlphas[At(i)] = from[3];
            } else if (!hasAlpha || alphas[At(i)] == 255) {
                pixel = errors.Diffuse(kind, color, i % width);
            } else {
                std::memcpy(&pixel, to, At(kind.bytes));
            }
            std::memcpy(to, &pixel, At(kind.bytes));
            std::uint64_t const unloaded = kind.fromPixel(pixel);
            std::memcpy(&expectedColors[At(i * step)], &unloaded, i == area - 1 ? 3 : 8);
        }
        image.Load(stream.data(), static_cast<unsigned>(step));
        image.Unload(colors.data(), static_cast<unsigned>(step));
        image.Detach();
        ASSERT_EQ(pixels, expectedPixels);
        ASSERT_EQ(alphas, expectedAlphas);
        ASSERT_EQ(colors, expectedColors);
    }

private:
    static std::size_t At(int index) { return static_cast<std::size_t>(index); }
    int Number(int from, int to) { return std::uniform_int_distribution(from, to)(random); }
    Bytes NewBytes(int size)
    {
        Bytes bytes(At(size));
        for (auto& byte : bytes)
            byte = static_cast<unsigned char>(Number(0, 2) ? random() : 255);
        return bytes;
    }

    std::mt19937 random;
};

TEST(ImageStreams, AreLoadedAndUnloadedPixelByPixel)
{
    GrColors4::BuildColorCube();
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    Streams streams(seed);
    for (int round = 0; round < 300; ++round)
        for (auto const& kind : kImageKinds) {
            // Loading makes true colour premultiplied.
            if (kind.flags != GrImageTrueColor) streams.Judge(kind);
            if (HasFatalFailure()) return;
        }
}

/// The streams have no byte more than these, and the sanitizers watch.
TEST(ImageStreams, EndAtTheirLastByteAndFillWhatThereIs)
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
