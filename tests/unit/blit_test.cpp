#include <support/canvas.h>
#include <tessella/bitmap.h>
#include <tessella/pixel/image_contexts.h>
#include <tessella/screen.h>
#include <tessella/video_mode.h>

#include <gtest/gtest.h>

#include <memory>
#include <random>

// Random blits of all kinds on contexts of every format, from images of every format, judged by a canvas: after
// each operation every byte must be the same. The judge goes from range to range as a context does, since that
// shows where a surface is copied onto itself, and where errors are diffused.

namespace {

constexpr int kWidth = 71, kHeight = 37;
constexpr int kImageWidth = 90, kImageHeight = 60;  // enough for every rectangle

using Bytes = std::vector<unsigned char>;

/// What images there are, and the formats of their contexts.
struct Kind : Canvas::Format {
    std::uint32_t flags = 0;
};
constexpr std::uint32_t kAlpha = GrImageHasAlpha | GrImageTrueColor;
Kind const kKinds[] = {{Canvas::FormatOf<GrSurface8, GrColors4>()},
    {Canvas::FormatOf<GrSurface8, GrColors8>()}, {Canvas::FormatOf<GrSurface16, GrColors15>()},
    {Canvas::FormatOf<GrSurface16, GrColors16>()}, {Canvas::FormatOf<GrSurface24, GrColors24>()},
    {Canvas::FormatOf<GrSurface32, GrColors24>(32)},
    {Canvas::FormatOf<GrSurface32, GrColorsRGB>(), GrImageTrueColor},
    {Canvas::FormatOf<GrSurface32, GrColorsRGBA>(), GrImageTrueColor | GrImagePremultiplied}};

class RandomBlits {
public:
    RandomBlits(GrContext& drawnContext, Canvas& judgingCanvas, unsigned seed)
        : context(drawnContext), canvas(judgingCanvas), random(seed)
    {}

    void Step()
    {
        rect = Rect();
        direct = false;
        sx = Number(0, 30);
        sy = Number(0, 30);
        switch (Number(0, 9)) {
        case 0: return ChangeState();
        case 1: return DrawBitmap();
        case 2: return CopyOwnFormat();
        case 3: return DrawMasked();
        case 4: return CopyForeign();
        case 5: return CopyOntoItself();
        case 6: return ReadForeign();
        default: return Blend();
        }
    }

private:
    int Number(int from, int to) { return std::uniform_int_distribution(from, to)(random); }
    bool Chance() { return Number(0, 1) != 0; }
    GrRect Rect()
    {
        int const x = Number(-9, kWidth), y = Number(-9, kHeight);
        return {x, y, x + Number(0, 60), y + Number(0, 30)};
    }
    /// From now on the rectangle is one of the surface.
    void MayBeDirect()
    {
        direct = Chance();
        if (!direct) return;
        int const x = Number(0, kWidth - 1), y = Number(0, kHeight - 1);
        rect = {x, y, std::min(rect.x2 - rect.x1 + x, kWidth), std::min(rect.y2 - rect.y1 + y, kHeight)};
    }
    Bytes Random(int size)
    {
        Bytes bytes(static_cast<std::size_t>(size));
        for (auto& byte : bytes)
            byte = static_cast<unsigned char>(random());
        return bytes;
    }
    std::unique_ptr<GrImage> NewImage(Canvas::Format const& format, std::uint32_t flags)
    {
        constexpr int kArea = kImageWidth * kImageHeight;
        auto image = std::make_unique<GrImage>(kImageWidth, kImageHeight, nullptr, nullptr, flags);
        image->bits = format.bits;
        image->bytes = format.bytes;
        auto const copyOf = [](Bytes const& bytes) {
            auto* const copy = new unsigned char[bytes.size()];
            std::copy(bytes.begin(), bytes.end(), copy);
            return copy;
        };
        if (!(flags & GrImageAlphaOnly)) image->pixels = copyOf(Random(kArea * format.bytes));
        if (!(flags & GrImageHasAlpha)) return image;
        Bytes alphas = Random(kArea);  // like an icon's: runs of 0 and 255 between others
        int kind = 0;
        for (auto& alpha : alphas) {
            if (Number(0, 20) == 0) kind = Number(0, 2);
            if (kind != 0) alpha = kind == 1 ? 0 : 255;
        }
        image->alphaPlane = copyOf(alphas);
        return image;
    }
    std::uint32_t PixelOf(GrImage const& image, int x, int y) const
    {
        std::uint32_t pixel = 0;
        std::memcpy(&pixel, image.pixels + (y * image.width + x) * image.bytes,
            static_cast<std::size_t>(image.bytes));
        return pixel;
    }

    /// The ranges of the clip within the rectangle, on the surface.
    std::vector<GrRect> Pieces()
    {
        if (direct) return {rect};
        GrRegion local;
        context.GetClipRegion(local);
        local &= rect;
        local.Offset(canvas.originX, canvas.originY);
        std::vector<GrRect> pieces;
        for (int i = 0; i < local.bands.item_count; ++i) {
            auto const& band = local.bands.items[i];
            for (int j = 0; j < band.item_count; ++j)
                pieces.push_back({band.items[j].r1, band.r1, band.items[j].r2, band.r2});
        }
        return pieces;
    }
    /// Visits the pixels of the rectangle within the clip, and the source's that go there.
    template <typename Visit>
    void Walk(Visit visit)
    {
        int const left = rect.x1 + (direct ? 0 : canvas.originX),
                  top = rect.y1 + (direct ? 0 : canvas.originY);
        for (auto const& piece : Pieces())
            for (int y = piece.y1; y < piece.y2; ++y)
                for (int x = piece.x1; x < piece.x2; ++x)
                    visit(x, y, sx + x - left, sy + y - top, piece);
    }

    void ChangeState()
    {
        auto const both = [&](auto operation) {
            operation(context);
            operation(canvas);
        };
        GrRegion region = GrRect{-9, -9, 2 * kWidth, 2 * kHeight};
        for (int cuts = Number(0, 4); cuts > 0; --cuts)
            region -= Rect();
        Bytes const bits = Random(8);
        both([x = Number(-9, 9), y = Number(-9, 9)](auto& c) { c.SetOrigin(x, y); });
        both([&](auto& c) { c.SetClipRegion(region); });
        both([color = random()](auto& c) { c.SetForeColor(static_cast<GrColor>(color)); });
        both([color = random()](auto& c) { c.SetBackColor(static_cast<GrColor>(color)); });
        both([&, transparent = Chance()](auto& c) { c.SetPattern(bits.data(), 3, 5, transparent); });
        both([mode = Number(3, 4)](auto& c) { c.SetRasterMode(static_cast<std::uint32_t>(mode)); });
    }

    void DrawBitmap()
    {
        GrBitmap bitmap(rect.x2 - rect.x1, rect.y2 - rect.y1);
        int const pitch = (bitmap.width + 7) / 8;
        bitmap.Load(Random(pitch * bitmap.height).data());
        bool const transparent = Chance();
        sx = sy = 0;
        Walk([&](int x, int y, int column, int row, GrRect const&) {
            bool const set = bitmap.data[row * pitch + column / 8] >> column % 8 & 1;
            if (!transparent)
                canvas.Write(x, y, set ? canvas.fore : canvas.back);
            else if (set)
                canvas.Paint(x, y);
        });
        if (transparent)
            context.DrawBitmapTransparent(rect.x1, rect.y1, bitmap);
        else
            context.DrawBitmap(rect.x1, rect.y1, bitmap);
    }

    void CopyOwnFormat()
    {
        MayBeDirect();
        auto const image = NewImage(canvas.format, 0);
        Walk([&](int x, int y, int u, int v, GrRect const&) { canvas.Write(x, y, PixelOf(*image, u, v)); });
        (context.*(direct ? &GrContext::DrawImageDirect : &GrContext::DrawImage))(rect, *image, sx, sy);

        auto const read = NewImage(canvas.format, 0);
        Bytes expected(read->pixels, read->pixels + kImageWidth * kImageHeight * canvas.format.bytes);
        Walk([&](int x, int y, int u, int v, GrRect const&) {
            std::uint32_t const pixel = canvas.Read(x, y);
            std::memcpy(&expected[static_cast<std::size_t>((v * kImageWidth + u) * canvas.format.bytes)],
                &pixel, static_cast<std::size_t>(canvas.format.bytes));
        });
        (context.*(direct ? &GrContext::ReadImageDirect : &GrContext::ReadImage))(rect, *read, sx, sy);
        EXPECT_EQ(std::memcmp(read->pixels, expected.data(), expected.size()), 0);
    }

    void DrawMasked()
    {
        MayBeDirect();
        auto const image = NewImage(canvas.format, 0);
        constexpr int kPitch = (kImageWidth + 7) / 8;
        GrBitmap mask(kImageWidth, kImageHeight);
        mask.Load(Random(kPitch * kImageHeight).data());
        Walk([&](int x, int y, int u, int v, GrRect const&) {
            if (mask.data[v * kPitch + u / 8] >> u % 8 & 1) canvas.Write(x, y, PixelOf(*image, u, v));
        });
        (context.*(direct ? &GrContext::DrawImageMaskedDirect : &GrContext::DrawImageMasked))(
            rect, *image, mask, sx, sy);
        context.DrawImageMasked(rect, *image, GrBitmap(kImageWidth, kImageHeight + 1), sx, sy);
    }

    /// From a context with a clip and an origin of its own, or from an image as a whole; not only from where
    /// it has pixels.
    void CopyForeign()
    {
        Kind const& kind = kKinds[Number(0, 7)];
        auto const image = NewImage(kind, kind.flags);
        std::unique_ptr<GrContext> const source(image->GetContext());
        bool const isOwn = kind.bits == canvas.format.bits && kind.bytes == canvas.format.bytes;
        bool const asImage = !isOwn && Chance();
        sx -= 40;
        sy -= 40;
        if (!asImage) {
            source->SetOrigin(Number(-9, 9), 4);
            GrRegion clip = GrRect{-5, -5, 70, 40};
            clip -= Rect();
            source->SetClipRegion(clip);
        }
        Walk([&](int x, int y, int u, int v, GrRect const&) {
            canvas.Write(x, y, canvas.format.toPixel(source->GetPixel(u, v)));
        });
        if (asImage)
            context.DrawImage(rect, *image, sx, sy);
        else
            context.CopyFromContext(rect, source.get(), sx, sy);
    }

    void CopyOntoItself()
    {
        sx = rect.x1 + Number(-3, 3);
        sy = rect.y1 + Number(-3, 3);
        Walk([&](int x, int y, int u, int v, GrRect const&) {
            canvas.Write(x, y, canvas.format.toPixel(canvas.GetPixel(u, v)));
        });
        context.CopyFromContext(rect, &context, sx, sy);
    }

    void ReadForeign()
    {
        Kind const& kind = kKinds[Number(0, 7)];
        if (kind.bits == canvas.format.bits && kind.bytes == canvas.format.bytes) return;
        auto const image = NewImage(kind, kind.flags);
        context.ReadImage(rect, *image, sx, sy);
        for (int y = 0; y < rect.y2 - rect.y1; ++y)
            for (int x = 0; x < rect.x2 - rect.x1; ++x)
                EXPECT_EQ(
                    PixelOf(*image, sx + x, sy + y), kind.toPixel(canvas.GetPixel(rect.x1 + x, rect.y1 + y)));
    }

    /// With and without an image, its pixels, its alpha plane; through all operations that blend.
    void Blend()
    {
        static constexpr std::uint32_t kFlags[] = {
            GrImageTrueColor, kAlpha, kAlpha, kAlpha | GrImagePremultiplied, kAlpha | GrImageAlphaOnly};
        static constexpr std::uint8_t kAlphas[] = {0, 1, 40, 128, 254, 255};
        std::uint32_t const flags =
            kFlags[Number(0, 4)] | (Chance() ? GrImageNoDither : 0u) | (Chance() ? GrImageOverBack : 0u);
        GrBlendParams params{
            Chance(), Chance(), !(flags & GrImageHasAlpha) || Chance(), kAlphas[Number(0, 5)]};
        MayBeDirect();
        std::unique_ptr<GrImage> image;
        int const operation = direct ? 0 : Number(0, 3);
        if (operation < 3) image = NewImage(kKinds[6], flags);
        if (operation == 1 && image->alphaPlane)
            params = {!(flags & GrImageOverBack), !(flags & GrImageNoDither), false, 0};
        if (operation == 3) params = {true, true, true, params.alpha};
        if (operation == 2) {
            image = nullptr;
            params.uniformAlpha = true;
        }
        JudgeBlend(image.get(), params);
        if (direct)
            context.DrawImageAlphaDirect(rect, image.get(), sx, sy, params);
        else if (operation == 3)
            context.FillRegionAlpha(rect, params.alpha);
        else if (operation == 1 && image->alphaPlane)
            context.DrawImage(rect, *image, sx, sy);
        else
            context.DrawImageAlpha(rect, image.get(), sx, sy, params);
    }
    void JudgeBlend(GrImage const* image, GrBlendParams const& params)
    {
        auto const& format = canvas.format;
        std::vector<int> above;
        int left[3] = {};
        Walk([&](int x, int y, int u, int v, GrRect const& piece) {
            if (x == piece.x1 && y == piece.y1) above.assign(static_cast<std::size_t>(kWidth * 3), 0);
            if (x == piece.x1) left[0] = left[1] = left[2] = 0;
            bool const hasPixels = image && image->pixels;
            int const alpha = params.uniformAlpha ? params.alpha : image->alphaPlane[v * kImageWidth + u];
            if (alpha == 0) {
                if (!params.overDestination) canvas.Write(x, y, canvas.back);
                return;
            }
            GrColor color = hasPixels ? PixelOf(*image, u, v) : format.fromPixel(canvas.fore);
            std::uint32_t pixel = hasPixels || alpha < 255 ? format.toPixel(color) : canvas.fore;
            if (alpha < 255) {
                GrColor const under =
                    format.fromPixel(params.overDestination ? canvas.Read(x, y) : canvas.back);
                GrColor mixed = 0xFF000000;
                for (int shift = 0; shift < 24; shift += 8) {
                    int const own = color >> shift & 255, other = under >> shift & 255;
                    int const share = hasPixels && !params.uniformAlpha ? own : own * alpha / 256;
                    mixed |= static_cast<GrColor>(share + other * (255 - alpha) / 256) << shift;
                }
                color = mixed;
                pixel = format.toPixel(color);
            }
            if (params.dither && format.dithers) {
                int* const column = &above[static_cast<std::size_t>((x - piece.x1) * 3)];
                GrColor wanted = 0xFF000000;
                for (int c = 0; c < 3; ++c)
                    wanted |= static_cast<GrColor>(
                                  std::clamp(int(color >> 8 * c & 255) + column[c] + left[c], 0, 255))
                        << 8 * c;
                pixel = format.toPixel(wanted);
                for (int c = 0; c < 3; ++c)
                    left[c] = column[c] =
                        (int(wanted >> 8 * c & 255) - int(format.fromPixel(pixel) >> 8 * c & 255)) / 2;
            }
            canvas.Write(x, y, pixel);
        });
    }

    GrContext& context;
    Canvas& canvas;
    std::mt19937 random;
    GrRect rect;  // of the operation
    bool direct;  // the rectangle is one of the surface and not clipped
    int sx, sy;
};

void Judge(GrContext& context, unsigned char const* pixels, Canvas& canvas)
{
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    RandomBlits blits(context, canvas, seed);
    for (int step = 0; step < 1500; ++step) {
        blits.Step();
        ASSERT_FALSE(testing::Test::HasFailure()) << "step " << step;
        ASSERT_EQ(std::memcmp(pixels, canvas.memory.data(), canvas.memory.size()), 0) << "step " << step;
    }
}

template <typename Surface, typename Colors>
void JudgeImage(std::uint32_t flags = 0)
{
    Canvas canvas(Canvas::FormatOf<Surface, Colors>(), kWidth, kHeight, kWidth * Surface::kBytes);
    GrImage image(kWidth, kHeight, new unsigned char[canvas.memory.size()](), nullptr, flags);
    std::unique_ptr<GrContext> const context(CreateImageContext<Surface, Colors>(&image));
    Judge(*context, image.pixels, canvas);
}

TEST(Blits, OnImagesOfEveryFormatMatchTheCanvas)
{
    JudgeImage<GrSurface8, GrColors4>();
    JudgeImage<GrSurface8, GrColors8>();
    JudgeImage<GrSurface16, GrColors15>();
    JudgeImage<GrSurface16, GrColors16>();
    JudgeImage<GrSurface24, GrColors24>();
    JudgeImage<GrSurface32, GrColors24>();
    JudgeImage<GrSurface32, GrColorsRGB>();
    JudgeImage<GrSurface32, GrColorsRGBA>();
}

/// A screen in this process' memory, with rows longer than they need to be.
template <typename Surface, typename Colors>
void JudgeScreen(unsigned bits, unsigned colorBits)
{
    int const stride = kWidth * Surface::kBytes + 5;
    Canvas canvas(Canvas::FormatOf<Surface, Colors>(), kWidth, kHeight, stride);
    Bytes memory(canvas.memory.size());
    std::vector<std::int32_t> errors(kWidth * 3);
    GrScreen.fbMemory = memory.data();
    GrScreen.stride = static_cast<std::uint32_t>(stride);
    GrScreen.ditherLine = errors.data();
    std::unique_ptr<GrContext> const context(
        FindVideoMode(bits, colorBits)->createScreenContext(GrRect{0, 0, kWidth, kHeight}, 0, 0));
    Judge(*context, memory.data(), canvas);
    GrScreen = {};
}

TEST(Blits, OnScreensOfEveryModeMatchTheCanvas)
{
    JudgeScreen<GrSurface8, GrColors8>(8, 18);
    JudgeScreen<GrSurface16, GrColors15>(16, 15);
    JudgeScreen<GrSurface16, GrColors16>(16, 16);
    JudgeScreen<GrSurface24, GrColors24>(24, 24);
    JudgeScreen<GrSurface32, GrColors24>(32, 24);
}

}
