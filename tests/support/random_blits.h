#pragma once

#include <support/canvas.h>
#include <tessella/bitmap.h>
#include <tessella/image.h>
#include <tessella/pixel/colors.h>
#include <tessella/pixel/surface.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <random>

/// What images there are, and the format of their contexts.
struct ImageKind : Canvas::Format {
    std::uint32_t flags = 0;
};
inline ImageKind const kImageKinds[] = {{Canvas::FormatOf<GrSurface8, GrColors4>()},
    {Canvas::FormatOf<GrSurface8, GrColors8>()}, {Canvas::FormatOf<GrSurface16, GrColors15>()},
    {Canvas::FormatOf<GrSurface16, GrColors16>()}, {Canvas::FormatOf<GrSurface24, GrColors24>()},
    {Canvas::FormatOf<GrSurface32, GrColors24>(32)},
    {Canvas::FormatOf<GrSurface32, GrColorsRGB>(), GrImageTrueColor},
    {Canvas::FormatOf<GrSurface32, GrColorsRGBA>(), GrImageTrueColor | GrImagePremultiplied}};

/// Random blits of all kinds, from images of every format, on a context and on the canvas that judges it. The
/// judge goes from range to range as a context does, since that shows where a surface is copied onto itself,
/// and where errors are diffused.
class RandomBlits {
public:
    /// `drawnImage` is what the context draws on, or null for a screen.
    RandomBlits(GrContext& drawnContext, GrImage const* drawnImage, Canvas& judgingCanvas, unsigned seed)
        : context(drawnContext), drawn(drawnImage), canvas(judgingCanvas), format(canvas.format), random(seed)
    {}

    void Step()
    {
        int const x = Number(-9, canvas.width), y = Number(-9, canvas.height);
        rect = {x, y, x + Number(0, 60), y + Number(0, 30)};
        sx = Number(0, 30);
        sy = Number(0, 30);
        direct = false;
        switch (Number(0, 7)) {
        case 0: return DrawBitmap();
        case 1: return CopyOwnFormat();
        case 2: return drawn ? Stream() : void();
        case 3: return CopyForeign();
        case 4: return CopyOntoItself();
        case 5: return ReadForeign();
        default: return Blend();
        }
    }

private:
    static constexpr int kWidth = 90, kHeight = 60;  // of images; enough for every rectangle
    using Bytes = std::vector<unsigned char>;

    int Number(int from, int to) { return std::uniform_int_distribution(from, to)(random); }
    bool Chance() { return Number(0, 1) != 0; }
    /// Perhaps the rectangle is one of the surface from now on, for operations that do not clip.
    void MayBeDirect()
    {
        direct = Chance();
        if (!direct) return;
        int const x = Number(0, canvas.width - 1), y = Number(0, canvas.height - 1);
        rect = {x, y, std::min(rect.x2 - rect.x1 + x, canvas.width),
            std::min(rect.y2 - rect.y1 + y, canvas.height)};
    }
    unsigned char* NewBytes(int size)
    {
        auto* const bytes = new unsigned char[static_cast<std::size_t>(size)];
        std::generate_n(bytes, size, [&] { return static_cast<unsigned char>(random()); });
        return bytes;
    }
    std::unique_ptr<GrBitmap> NewBitmap(int width, int height)
    {
        auto bitmap = std::make_unique<GrBitmap>(width, height);
        bitmap->Load(std::unique_ptr<unsigned char[]>(NewBytes((width + 7) / 8 * height)).get());
        return bitmap;
    }
    std::unique_ptr<GrImage> NewImage(Canvas::Format const& kind, std::uint32_t flags)
    {
        auto image = std::make_unique<GrImage>(kWidth, kHeight,
            flags & GrImageAlphaOnly ? nullptr : NewBytes(kWidth * kHeight * kind.bytes),
            flags & GrImageHasAlpha ? NewBytes(kWidth * kHeight) : nullptr, flags);
        image->bits = kind.bits;
        image->bytes = kind.bytes;
        // Like an icon's: runs of 0 and 255 between others.
        for (int i = 0, run = 0; image->alphaPlane && i < kWidth * kHeight; ++i) {
            if (Number(0, 20) == 0) run = Number(0, 2);
            if (run != 0) image->alphaPlane[i] = run == 1 ? 0 : 255;
        }
        return image;
    }
    static bool Bit(GrBitmap const& bitmap, int x, int y)
    {
        return bitmap.data[y * ((bitmap.width + 7) / 8) + x / 8] >> x % 8 & 1;
    }
    static std::uint32_t Pixel(GrImage const& image, int x, int y)
    {
        std::uint32_t pixel = 0;
        std::memcpy(
            &pixel, image.pixels + (y * kWidth + x) * image.bytes, static_cast<unsigned>(image.bytes));
        return pixel;
    }

    /// Visits the pixels of the rectangle within the clip, with the source's that go there and the range.
    template <typename Visit>
    void Walk(Visit visit)
    {
        int const x0 = direct ? 0 : canvas.originX, y0 = direct ? 0 : canvas.originY;
        GrRegion local = rect;
        if (!direct) {
            context.GetClipRegion(local);
            local &= rect;
        }
        for (int i = 0; i < local.bands.item_count; ++i)
            for (int j = 0; j < local.bands.items[i].item_count; ++j) {
                auto const& band = local.bands.items[i];
                for (int y = band.r1; y < band.r2; ++y)
                    for (int x = band.items[j].r1; x < band.items[j].r2; ++x)
                        visit(x + x0, y + y0, sx + x - rect.x1, sy + y - rect.y1,
                            GrRect{band.items[j].r1 + x0, band.r1 + y0, band.items[j].r2 + x0, band.r2 + y0});
            }
    }

    void DrawBitmap()
    {
        auto const bitmap = NewBitmap(rect.x2 - rect.x1, rect.y2 - rect.y1);
        bool const transparent = Chance();
        sx = sy = 0;
        Walk([&](int x, int y, int u, int v, auto) {
            if (!transparent)
                canvas.Write(x, y, Bit(*bitmap, u, v) ? canvas.fore : canvas.back);
            else if (Bit(*bitmap, u, v))
                canvas.Paint(x, y);
        });
        (context.*(transparent ? &GrContext::DrawBitmapTransparent : &GrContext::DrawBitmap))(
            rect.x1, rect.y1, *bitmap);
    }

    /// Perhaps through a mask, then back into another image.
    void CopyOwnFormat()
    {
        MayBeDirect();
        auto const source = NewImage(format, 0), read = NewImage(format, 0), expected = NewImage(format, 0);
        auto const mask = NewBitmap(kWidth, kHeight);
        bool const masked = Chance();
        Walk([&](int x, int y, int u, int v, auto) {
            if (!masked || Bit(*mask, u, v)) canvas.Write(x, y, Pixel(*source, u, v));
        });
        if (masked)
            (context.*(direct ? &GrContext::DrawImageMaskedDirect : &GrContext::DrawImageMasked))(
                rect, *source, *mask, sx, sy);
        else
            (context.*(direct ? &GrContext::DrawImageDirect : &GrContext::DrawImage))(rect, *source, sx, sy);
        context.DrawImageMasked(rect, *source, *NewBitmap(kWidth, kHeight + 1), sx, sy);

        auto const bytes = static_cast<unsigned>(format.bytes), size = kWidth * kHeight * bytes;
        std::memcpy(expected->pixels, read->pixels, size);
        Walk([&](int x, int y, int u, int v, auto) {
            std::uint32_t const pixel = canvas.Read(x, y);
            std::memcpy(expected->pixels + (v * kWidth + u) * format.bytes, &pixel, bytes);
        });
        (context.*(direct ? &GrContext::ReadImageDirect : &GrContext::ReadImage))(rect, *read, sx, sy);
        EXPECT_EQ(std::memcmp(read->pixels, expected->pixels, size), 0);
    }

    /// From a context with a clip and an origin of its own, or from an image as a whole; not only where it
    /// has pixels.
    void CopyForeign()
    {
        ImageKind const& kind = kImageKinds[Number(0, 7)];
        auto const image = NewImage(kind, kind.flags);
        std::unique_ptr<GrContext> const source(image->GetContext());
        bool const asImage = (kind.bits != format.bits || kind.bytes != format.bytes) && Chance();
        sx -= 40;
        sy -= 40;
        if (!asImage) {
            source->SetOrigin(Number(-9, 9), 4);
            source->SetClipRegion(GrRect{-5, -5, 70, 40});
            source->ExcludeClipRect({Number(0, 40), 5, 50, 20});
        }
        Walk([&](int x, int y, int u, int v, auto) {
            canvas.Write(x, y, format.toPixel(source->GetPixel(u, v)));
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
        Walk([&](int x, int y, int u, int v, auto) {
            canvas.Write(x, y, format.toPixel(canvas.GetPixel(u, v)));
        });
        context.CopyFromContext(rect, &context, sx, sy);
    }

    void ReadForeign()
    {
        ImageKind const& kind = kImageKinds[Number(0, 7)];
        if (kind.bits == format.bits && kind.bytes == format.bytes) return;
        auto const image = NewImage(kind, kind.flags);
        context.ReadImage(rect, *image, sx, sy);
        for (int y = rect.y1; y < rect.y2; ++y)
            for (int x = rect.x1; x < rect.x2; ++x)
                EXPECT_EQ(
                    Pixel(*image, sx + x - rect.x1, sy + y - rect.y1), kind.toPixel(canvas.GetPixel(x, y)));
    }

    /// Loads and unloads all pixels.
    void Stream()
    {
        bool const dithers = format.dithers && !(drawn->flags & GrImageNoDither);
        int const step = Number(drawn->alphaPlane ? 4 : 3, 5), area = drawn->width * drawn->height;
        std::unique_ptr<unsigned char[]> const stream(NewBytes(area * step)), got(NewBytes(area * step + 8));
        Bytes alphas(drawn->alphaPlane, drawn->alphaPlane + (drawn->alphaPlane ? area : 0));
        Bytes unloaded(got.get(), got.get() + area * step + 8);
        Canvas::Errors errors(drawn->width);
        for (int i = 0; i < area; ++i) {
            int const x = i % drawn->width, y = i / drawn->width;
            if (x == 0) errors.StartRow();
            unsigned char const* const from = stream.get() + i * step;
            GrColor const color = GrMakeColor(from[0], from[1], from[2], alphas.empty() ? 0 : from[3]);
            auto* const alpha = alphas.empty() ? nullptr : &alphas[static_cast<std::size_t>(i)];
            if (!dithers) {
                canvas.Write(x, y, format.toPixel(color));
                if (alpha) *alpha = from[3];
            } else if (!alpha || *alpha == 255) {
                canvas.Write(x, y, errors.Diffuse(format, color, x));
            }
            std::uint64_t const back = format.fromPixel(canvas.Read(x, y));
            std::memcpy(&unloaded[static_cast<std::size_t>(i * step)], &back, i == area - 1 ? 3 : 8);
        }
        auto& whole = static_cast<GrContextI&>(context);
        whole.LoadPixels(stream.get(), static_cast<unsigned>(step));
        whole.UnloadPixels(got.get(), static_cast<unsigned>(step));
        EXPECT_TRUE(std::equal(unloaded.begin(), unloaded.end(), got.get()));
        EXPECT_TRUE(std::equal(alphas.begin(), alphas.end(), drawn->alphaPlane));
    }

    /// With and without an image, its pixels, its alpha plane; through all operations that blend.
    void Blend()
    {
        constexpr std::uint32_t kAlpha = GrImageHasAlpha | GrImageTrueColor;
        static constexpr std::uint32_t kFlags[] = {
            GrImageTrueColor, kAlpha, kAlpha | GrImagePremultiplied, kAlpha | GrImageAlphaOnly};
        static constexpr std::uint8_t kAlphas[] = {0, 1, 40, 128, 254, 255};
        std::uint32_t const flags =
            kFlags[Number(0, 3)] | (Chance() ? GrImageNoDither : 0u) | (Chance() ? GrImageOverBack : 0u);
        GrBlendParams params{
            Chance(), Chance(), !(flags & GrImageHasAlpha) || Chance(), kAlphas[Number(0, 5)]};
        MayBeDirect();
        std::unique_ptr<GrImage> image;
        if (direct || Chance()) image = NewImage(kImageKinds[6], flags);
        bool const simply = !direct && Chance() && (!image || image->alphaPlane);
        if (!image) params.uniformAlpha = true;
        if (simply && !image) params.overDestination = params.dither = true;
        if (simply && image) params = {!(flags & GrImageOverBack), !(flags & GrImageNoDither), false, 0};
        JudgeBlend(image.get(), params);
        if (direct)
            context.DrawImageAlphaDirect(rect, image.get(), sx, sy, params);
        else if (!simply)
            context.DrawImageAlpha(rect, image.get(), sx, sy, params);
        else if (image)
            context.DrawImage(rect, *image, sx, sy);
        else
            context.FillRegionAlpha(rect, params.alpha);
    }
    void JudgeBlend(GrImage const* image, GrBlendParams const& params)
    {
        Canvas::Errors errors;
        bool const hasPixels = image && image->pixels;
        Walk([&](int x, int y, int u, int v, GrRect const& range) {
            if (x == range.x1 && y == range.y1) errors = Canvas::Errors(range.x2 - range.x1);
            if (x == range.x1) errors.StartRow();
            int const alpha = params.uniformAlpha ? params.alpha : image->alphaPlane[v * kWidth + u];
            if (alpha == 0) {
                if (!params.overDestination) canvas.Write(x, y, canvas.back);
                return;
            }
            GrColor color = hasPixels ? Pixel(*image, u, v) : format.fromPixel(canvas.fore);
            std::uint32_t pixel = hasPixels ? format.toPixel(color) : canvas.fore;
            if (alpha < 255) {
                GrColor const under =
                    format.fromPixel(params.overDestination ? canvas.Read(x, y) : canvas.back);
                color = Canvas::Mixed(color, under, alpha, hasPixels && !params.uniformAlpha ? 256 : alpha);
                pixel = format.toPixel(color);
            }
            if (params.dither && format.dithers) pixel = errors.Diffuse(format, color, x - range.x1);
            canvas.Write(x, y, pixel);
        });
    }

    GrContext& context;
    GrImage const* drawn;
    Canvas& canvas;
    Canvas::Format const& format;
    std::mt19937 random;
    GrRect rect;  // of the operation
    bool direct;  // the rectangle is one of the surface and not clipped
    int sx, sy;
};
