#pragma once

#include <support/canvas.h>
#include <tessella/bitmap.h>
#include <tessella/image.h>
#include <tessella/pixel/clip_walk.h>
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
    {Canvas::FormatOf<GrSurface32, GrColors24>()},
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
    {
        GrColors4::BuildColorCube();  // which only the first image of 4 bits does
    }

    void Step()
    {
        int const x = Number(-9, canvas.width), y = Number(-9, canvas.height);
        rect = {x, y, x + Number(0, 60), y + Number(0, 30)};
        sx = Number(0, 30);
        sy = Number(0, 30);
        direct = false;
        switch (Number(0, 7)) {
        case 0: return DrawBitmap();
        case 1: return CopyOwn();
        case 2: return drawn ? Stream() : void();
        case 3:
        case 4: return CopyConverted();
        case 5: return Read();
        default: return Blend();
        }
    }

private:
    static constexpr int kWidth = 90, kHeight = 60, kArea = kWidth * kHeight;  // enough for every rectangle
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
    Bytes NewBytes(int size)
    {
        Bytes bytes(static_cast<std::size_t>(size));
        std::generate(bytes.begin(), bytes.end(), [&] { return static_cast<unsigned char>(random()); });
        return bytes;
    }
    /// Like an icon's: runs of 0 and 255 between others.
    Bytes NewAlphas(int size)
    {
        Bytes alphas = NewBytes(size);
        int run = 0;
        for (unsigned char& alpha : alphas) {
            if (Number(0, 20) == 0) run = Number(0, 2);
            if (run != 0) alpha = run == 1 ? 0 : 255;
        }
        return alphas;
    }
    static unsigned char* Owned(Bytes const& bytes)
    {
        return std::copy(bytes.begin(), bytes.end(), new unsigned char[bytes.size()]) - bytes.size();
    }
    std::unique_ptr<GrBitmap> NewBitmap(int width, int height)
    {
        auto bitmap = std::make_unique<GrBitmap>(width, height);
        bitmap->Load(NewBytes((width + 7) / 8 * height).data());
        return bitmap;
    }
    std::unique_ptr<GrImage> NewImage(Canvas::Format const& kind, std::uint32_t flags)
    {
        auto image = std::make_unique<GrImage>(kWidth, kHeight,
            flags & GrImageAlphaOnly ? nullptr : Owned(NewBytes(kArea * kind.bytes)),
            flags & GrImageHasAlpha ? Owned(NewAlphas(kArea)) : nullptr, flags);
        image->bits = kind.bits;
        image->bytes = kind.bytes;
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
        for (auto const& band : BandsOf(local))
            for (auto const& [left, right] : RangesOf(band))
                for (int y = band.r1; y < band.r2; ++y)
                    for (int x = left; x < right; ++x)
                        visit(x + x0, y + y0, sx + x - rect.x1, sy + y - rect.y1,
                            GrRect{left + x0, band.r1 + y0, right + x0, band.r2 + y0});
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

    /// Perhaps through a mask.
    void CopyOwn()
    {
        MayBeDirect();
        auto const source = NewImage(format, 0);
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
    }

    /// From an image, the context itself, or another one over the same pixels; not only where they have any.
    void CopyConverted()
    {
        ImageKind const& kind = kImageKinds[Number(0, 7)];
        auto const image = NewImage(kind, kind.flags);
        enum { FromImage, FromItself, FromTwin };
        int const from = Number(0, drawn ? 2 : 1);
        bool const isForeign = kind.bits != format.bits || kind.bytes != format.bytes;
        bool const asImage = from == FromImage && isForeign && Chance();
        std::unique_ptr<GrContext> const other((from == FromTwin ? drawn : image.get())->GetContext());
        GrContext& source = from == FromItself ? context : *other;
        sx = from == FromImage ? sx - 40 : rect.x1 + Number(-3, 3);
        sy = from == FromImage ? sy - 40 : rect.y1 + Number(-3, 3);
        int x0 = from == FromItself ? canvas.originX : 0, y0 = from == FromItself ? canvas.originY : 0;
        if (from != FromItself && !asImage) {
            source.SetOrigin(x0 = Number(-9, 9), y0 = 4);
            source.SetClipRegion(GrRect{-5, -5, 70, 40});
            source.ExcludeClipRect({Number(0, 40), 5, 50, 20});
        }
        GrRegion seen;
        source.GetClipRegion(seen);
        Walk([&](int x, int y, int u, int v, auto) {
            GrColor color = 0;
            if (seen.Contains(u, v))
                color = from == FromImage ? kind.fromPixel(Pixel(*image, u + x0, v + y0))
                                          : format.fromPixel(canvas.Seen(u + x0, v + y0));
            canvas.Write(x, y, format.toPixel(color));
        });
        if (asImage)
            context.DrawImage(rect, *image, sx, sy);
        else
            context.CopyFromContext(rect, &source, sx, sy);
    }

    /// Outside the clip, an image of the own format is left alone, and others become black.
    void Read()
    {
        MayBeDirect();
        ImageKind const& kind = kImageKinds[Number(0, 7)];
        if (!format.readable && (direct || kind.bits == format.bits)) return;
        bool const isOwn = direct || (kind.bits == format.bits && kind.bytes == format.bytes);
        auto const image = NewImage(isOwn ? format : kind, isOwn ? 0 : kind.flags);
        auto const size = static_cast<std::size_t>(image->bytes);
        Bytes expected(image->pixels, image->pixels + kArea * size);
        auto const expect = [&](int u, int v, std::uint32_t pixel) {
            std::memcpy(&expected.at(static_cast<std::size_t>(v * kWidth + u) * size), &pixel, size);
        };
        for (int y = rect.y1; !isOwn && y < rect.y2; ++y)
            for (int x = rect.x1; x < rect.x2; ++x)
                expect(sx + x - rect.x1, sy + y - rect.y1, kind.toPixel(0));
        Walk([&](int x, int y, int u, int v, auto) {
            expect(u, v, isOwn ? canvas.Read(x, y) : kind.toPixel(format.fromPixel(canvas.Seen(x, y))));
        });
        (context.*(direct ? &GrContext::ReadImageDirect : &GrContext::ReadImage))(rect, *image, sx, sy);
        EXPECT_TRUE(std::equal(expected.begin(), expected.end(), image->pixels));
    }

    /// Loads all pixels, perhaps diffused by alpha values of their own, and unloads them.
    void Stream()
    {
        auto& whole = static_cast<GrContextI&>(context);
        bool const diffused = format.dithers && Chance();
        bool const dithers = diffused || (format.dithers && !(drawn->flags & GrImageNoDither));
        unsigned const step = static_cast<unsigned>(Number(drawn->alphaPlane ? 4 : 3, 11));
        int const area = drawn->width * drawn->height, size = area * static_cast<int>(step);
        Bytes const stream = NewBytes(size);
        Bytes own = NewAlphas(area), got = NewBytes(size + 8), unloaded = got;
        unsigned char* const plane = drawn->alphaPlane;
        if (plane && !diffused) own.assign(plane, plane + area);
        bool const hasAlphas = plane || diffused;
        Canvas::Errors errors(drawn->width);
        for (std::size_t i = 0; i < own.size(); ++i) {
            int const x = static_cast<int>(i) % drawn->width, y = static_cast<int>(i) / drawn->width;
            if (x == 0) errors.StartRow();
            unsigned char const* const from = &stream[i * step];
            GrColor const color = GrMakeColor(from[0], from[1], from[2], plane ? from[3] : 0);
            if (!dithers) {
                canvas.Write(x, y, format.toPixel(color));
                if (plane) own[i] = from[3];
            } else if (!hasAlphas || own[i] == 255) {
                canvas.Write(x, y, errors.Diffuse(format, color, x));
            }
            std::uint64_t const back = format.fromPixel(canvas.Read(x, y));
            std::memcpy(&unloaded[i * step], &back, i == own.size() - 1 ? 3 : 8);
        }
        if (diffused)
            whole.LoadPixelsDithered(stream.data(), own.data(), step);
        else
            whole.LoadPixels(stream.data(), step);
        whole.UnloadPixels(got.data(), step);
        EXPECT_EQ(got, unloaded);
        EXPECT_TRUE(!plane || diffused || std::equal(own.begin(), own.end(), plane));
    }

    /// With and without an image, its pixels, its alpha plane; through all operations that blend.
    void Blend()
    {
        static constexpr std::uint32_t kFlags[] = {
            0, GrImageHasAlpha, GrImageHasAlpha | GrImagePremultiplied, GrImageHasAlpha | GrImageAlphaOnly};
        static constexpr std::uint8_t kAlphas[] = {0, 1, 40, 128, 254, 255};
        std::uint32_t const flags = GrImageTrueColor | kFlags[Number(0, 3)] |
            (Chance() ? GrImageNoDither : 0u) | (Chance() ? GrImageOverBack : 0u);
        MayBeDirect();
        auto const image = direct || Chance() ? NewImage(kImageKinds[6], flags) : nullptr;
        bool const hasAlphas = image && image->alphaPlane,
                   simply = !direct && (hasAlphas || !image) && Chance();
        GrBlendParams params{Chance(), Chance(), !hasAlphas || Chance(), kAlphas[Number(0, 5)]};
        if (simply && image) params = {!(flags & GrImageOverBack), !(flags & GrImageNoDither), false, 0};
        if (simply && !image) params.overDestination = params.dither = true;
        JudgeBlend(image.get(), params);
        if (simply)
            image ? context.DrawImage(rect, *image, sx, sy) : context.FillRegionAlpha(rect, params.alpha);
        else
            (context.*(direct ? &GrContext::DrawImageAlphaDirect : &GrContext::DrawImageAlpha))(
                rect, image.get(), sx, sy, params);
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
                canvas.Write(x, y, canvas.Under(x, y, params.overDestination));
                return;
            }
            GrColor color = hasPixels ? Pixel(*image, u, v) : format.fromPixel(canvas.fore);
            std::uint32_t pixel = hasPixels ? format.toPixel(color) : canvas.fore;
            if (alpha < 255) {
                GrColor const under = format.fromPixel(canvas.Under(x, y, params.overDestination));
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
