#include <support/canvas.h>
#include <tessella/bitmap.h>
#include <tessella/image.h>
#include <tessella/pixel/colors.h>
#include <tessella/pixel/surface.h>

#include <gtest/gtest.h>

#include <cstring>
#include <random>
#include <vector>

namespace {

struct Format : Canvas::Format {
    std::uint32_t flags = 0;
};

Format const kFormats[] = {{Canvas::FormatOf<GrSurface8, GrColors4>()},
    {Canvas::FormatOf<GrSurface8, GrColors8>()}, {Canvas::FormatOf<GrSurface16, GrColors15>()},
    {Canvas::FormatOf<GrSurface16, GrColors16>()}, {Canvas::FormatOf<GrSurface24, GrColors24>()},
    {Canvas::FormatOf<GrSurface32, GrColors24>(32)},
    {Canvas::FormatOf<GrSurface32, GrColorsRGBA>(), GrImageTrueColor}};

/// Loads random streams and judges every byte: a pixel at a time, the errors of the conversion as a table of
/// the columns' and a triple of the row's.
struct Streams {
    Format const& format;
    std::mt19937& random;
    int width = Number(1, 40), height = Number(1, 9);
    int area = width * height;
    bool hasAlpha = Number(0, 1) != 0, noDither = Number(0, 3) == 0;
    int step = hasAlpha ? Number(4, 5) : Number(3, 5);
    std::vector<unsigned char> stream = Random(area * step - (hasAlpha ? 0 : step - 3));
    std::vector<unsigned char> alphas = Random(area);
    GrImage image{width, height, new unsigned char[static_cast<std::size_t>(area * format.bytes)],
        hasAlpha ? new unsigned char[static_cast<std::size_t>(area)] : nullptr,
        format.flags | (noDither ? GrImageNoDither : 0u)};
    std::vector<unsigned char> expected = Random(area * format.bytes);

    int Number(int from, int to) { return std::uniform_int_distribution(from, to)(random); }
    std::vector<unsigned char> Random(int size)
    {
        std::vector<unsigned char> bytes(static_cast<std::size_t>(size));
        for (auto& byte : bytes)
            byte = Number(0, 2) ? static_cast<unsigned char>(random()) : 255;
        return bytes;
    }

    void Load()
    {
        image.bits = format.bits;
        image.bytes = format.bytes;
        std::memcpy(image.pixels, expected.data(), expected.size());
        if (hasAlpha) std::memcpy(image.alphaPlane, alphas.data(), alphas.size());
        bool const dithers = format.dithers && !noDither;
        std::vector<int> columns(static_cast<std::size_t>(width * 3));
        int left[3];
        for (int i = 0; i < area; ++i) {
            unsigned char const* const pixel = stream.data() + i * step;
            if (i % width == 0) left[0] = left[1] = left[2] = 0;
            if (dithers && hasAlpha && alphas[static_cast<std::size_t>(i)] < 255) continue;
            GrColor color = hasAlpha && !dithers ? static_cast<GrColor>(pixel[3]) << 24 : 0;
            int* const above = &columns[static_cast<std::size_t>(i % width * 3)];
            for (int c = 0; c < 3; ++c) {
                int const sum = pixel[c] + (dithers ? above[c] + left[c] : 0);
                color |= static_cast<GrColor>(sum < 0 ? 0 : sum > 255 ? 255 : sum) << 8 * c;
            }
            std::uint32_t const value = format.toPixel(color);
            for (int c = 0; c < 3; ++c)
                left[c] = above[c] =
                    (int(color >> 8 * c & 255) - int(format.fromPixel(value) >> 8 * c & 255)) / 2;
            std::memcpy(&expected[static_cast<std::size_t>(i * format.bytes)], &value,
                static_cast<std::size_t>(format.bytes));
            if (hasAlpha && !dithers) alphas[static_cast<std::size_t>(i)] = pixel[3];
        }
        image.Load(stream.data(), static_cast<unsigned>(step));
        ASSERT_EQ(std::memcmp(image.pixels, expected.data(), expected.size()), 0);
        if (hasAlpha) {
            ASSERT_EQ(std::memcmp(image.alphaPlane, alphas.data(), alphas.size()), 0);
        }
    }

    /// What no pixel writes keeps its old value.
    void Unload()
    {
        std::vector<unsigned char> target = Random((area - 1) * step + 3 + (area > 1 ? 8 - 3 : 0));
        auto judge = target;
        for (int i = 0; i < area; ++i) {
            std::uint32_t value = 0;
            std::memcpy(&value, &expected[static_cast<std::size_t>(i * format.bytes)],
                static_cast<std::size_t>(format.bytes));
            GrColor const color = format.fromPixel(value);
            for (int byte = 0; byte < (i == area - 1 ? 3 : 8); ++byte)
                judge[static_cast<std::size_t>(i * step + byte)] =
                    static_cast<unsigned char>(byte < 4 ? color >> 8 * byte : 0);
        }
        image.Unload(target.data(), static_cast<unsigned>(step));
        ASSERT_EQ(target, judge);
    }
};

TEST(ImageStreams, AreLoadedAndUnloadedPixelByPixel)
{
    GrColors4::BuildColorCube();
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    for (int round = 0; round < 300; ++round)
        for (auto const& format : kFormats) {
            Streams streams{format, random};
            SCOPED_TRACE(format.bits);
            streams.Load();
            streams.Unload();
            if (HasFatalFailure()) return;
        }
}

/// The streams' vectors hold no byte more than these sizes, and the sanitizers watch them.
TEST(ImageStreams, EndAtTheirLastByte)
{
    GrImage image(2, 2, GrImageTrueColor);
    std::vector<unsigned char> three(2 * 2 * 3, 200), four(2 * 2 * 4, 200);
    image.Load(three.data(), 3);
    EXPECT_EQ(image.flags, GrImageTrueColor | GrImagePremultiplied);
    image.Unload(four.data(), 4);
    EXPECT_EQ(four, std::vector<unsigned char>(16, 0)) << "without an alpha plane, the alpha is 0";
    three.resize(2 * 2 * 3 + 2, 200);
    image.Unload(three.data(), 3);
    EXPECT_EQ(three.back(), 0);
}

TEST(ImageStreams, FillWhatTheImageHas)
{
    unsigned char stream[] = {1, 2, 3, 4, 5, 6, 7, 8};
    GrImage alphaOnly(2, 1, GrImageHasAlpha | GrImageAlphaOnly);
    alphaOnly.Load(stream, 4);
    EXPECT_TRUE(alphaOnly.alphaPlane[0] == 4 && alphaOnly.alphaPlane[1] == 8);
    alphaOnly.Unload(nullptr, 4);
    GrImage nothing(0, 10, GrImageHasAlpha);
    nothing.Load(nullptr, 4);
    nothing.Unload(nullptr, 4);
}

TEST(Bitmap, HasWholeBytesARow)
{
    GrBitmap bitmap(9, 2);
    unsigned char const bits[] = {1, 2, 3, 4};
    EXPECT_EQ(std::vector<unsigned char>(bitmap.data, bitmap.data + 4), std::vector<unsigned char>(4, 0));
    bitmap.Load(bits);
    EXPECT_EQ(std::memcmp(bitmap.data, bits, 4), 0);
    bitmap.data[6] = 0;  // three spare bytes
    for (auto const& [width, height] : {std::pair{0, 5}, {5, 0}, {-3, 2}}) {
        GrBitmap empty(width, height);
        EXPECT_TRUE(empty.width == 0 && empty.height == 0 && empty.data == nullptr);
        empty.Load(nullptr);
    }
}

}
