#include <bench/rows.h>
#include <bench/shapes.h>
#include <bench/surfaces.h>
#include <tessella/pixel/blend.h>

#include <SDL.h>
#include <benchmark/benchmark.h>
#include <pixman.h>

#include <cstdlib>
#include <cstring>
#include <random>
#include <vector>

// Pictures on the screen: copied, converted, blended, dithered. The peers get them in the layout that suits
// them best, which for blending is that of the screen.

namespace {

enum class Alphas { None, Random, Icon };

/// A picture of random pixels, for us and, in two layouts, for the others.
struct Picture {
    int width, height;
    GrImage image;                       // true colour, premultiplied, perhaps with an alpha plane
    std::vector<std::uint32_t> swapped;  // the same in the screen's order, each alpha in its pixel

    Picture(int pictureWidth, int pictureHeight, Alphas kind)
        : width(pictureWidth), height(pictureHeight),
          image(width, height, kind == Alphas::None ? GrImageTrueColor : GrImageHasAlpha)
    {
        std::mt19937 random(1);
        auto const area = static_cast<std::size_t>(width) * static_cast<unsigned>(height);
        std::uint32_t alpha = 255, run = 0;
        for (std::size_t i = 0; i < area; ++i) {
            if (kind == Alphas::Random) alpha = random() % 256;
            if (kind == Alphas::Icon && run-- == 0) {
                run = random() % 60;
                alpha = run < 4 ? random() % 256 : random() % 2 * 255;
            }
            GrColor const color = Faded(static_cast<GrColor>(random()), alpha + (alpha == 255)) | alpha << 24;
            std::memcpy(image.pixels + i * 4, &color, sizeof color);
            if (image.alphaPlane) image.alphaPlane[i] = static_cast<unsigned char>(alpha);
            swapped.push_back(GrColors24::ToPixel(color) | alpha << 24);
        }
    }

    PixmanImage NewPixmanImage(pixman_format_code_t format) const
    {
        bool const isSwapped = PIXMAN_FORMAT_TYPE(format) == PIXMAN_TYPE_ARGB;
        auto const* const bits = isSwapped ? swapped.data() : reinterpret_cast<std::uint32_t*>(image.pixels);
        return PixmanImage(
            pixman_image_create_bits(format, width, height, const_cast<std::uint32_t*>(bits), width * 4));
    }
    SdlSurface NewSdlSurface(Uint32 format) const
    {
        void* const bits = SDL_BYTESPERPIXEL(format) == 4 && format == SDL_PIXELFORMAT_XBGR8888
            ? static_cast<void*>(image.pixels)
            : const_cast<std::uint32_t*>(swapped.data());
        auto* const surface = SDL_CreateRGBSurfaceWithFormatFrom(bits, width, height, 32, width * 4, format);
        SDL_SetSurfaceBlendMode(surface, SDL_BLENDMODE_NONE);
        return SdlSurface(surface);
    }
};

/// A row in the making: one operation on rectangles of one size.
struct BlitRow {
    std::string name;
    std::shared_ptr<Surface const> surface;
    std::shared_ptr<Picture const> picture;
    int tolerance;                           // how far channels of two contenders may be apart
    mutable std::vector<GrColor> ours = {};  // what the first contender painted

    RectLoop Places() const { return {picture->width, picture->height}; }

    template <typename Make>
    void Add(char const* contender, Make make) const
    {
        AddContender(name, contender, [row = *this, make](benchmark::State& state) {
            RectLoop place = row.Places();
            auto blit = make(*row.surface, *row.picture);
            for (auto _ : state) {
                blit(place.Next());
                benchmark::ClobberMemory();
            }
        });
        ExpectSame(LooksLikeOurs(make), name);
    }

    template <typename Make>
    bool LooksLikeOurs(Make make) const
    {
        RectLoop place = Places();
        GrRect const rect = place.Next();
        std::memset(surface->Row(0), 0x5C, surface->Size());
        make(*surface, *picture)(rect);
        auto const context = surface->NewContext();
        std::vector<GrColor> colors;
        for (int y = rect.y1; y < rect.y2; y += 7)
            for (int x = rect.x1; x < rect.x2; ++x)
                colors.push_back(context->GetPixel(x, y));
        if (ours.empty()) ours = colors;
        for (std::size_t i = 0; i < colors.size(); ++i)
            for (int shift = 0; shift < 24; shift += 8) {
                int const difference =
                    static_cast<int>(colors[i] >> shift & 255) - static_cast<int>(ours[i] >> shift & 255);
                if (std::abs(difference) > tolerance) return false;
            }
        return true;
    }
};

// The contenders. Each makes what a user would keep, and returns what paints a rectangle with it.

auto DrawOurs(Surface const& surface, Picture const& picture)
{
    return [context = surface.NewContext(), &picture](
               GrRect const& rect) { context->DrawImage(rect, picture.image, 0, 0); };
}

auto BlendOurs(GrBlendParams params)
{
    return [params](Surface const& surface, Picture const& picture) {
        return [context = surface.NewContext(), &picture, params](
                   GrRect const& rect) { context->DrawImageAlpha(rect, &picture.image, 0, 0, params); };
    };
}

/// An image in the surface's own format.
auto CopyOurs(Surface const& surface, Picture const& picture)
{
    auto image = std::make_unique<GrImage>(picture.width, picture.height, nullptr, nullptr, 0);
    image->bits = surface.Bits() == 32 ? 24 : surface.Bits();
    image->bytes = surface.Bytes();
    auto const size = picture.swapped.size() * 4;
    image->pixels = new unsigned char[size];
    std::memcpy(image->pixels, picture.swapped.data(), size);
    return [context = surface.NewContext(), image = std::move(image)](
               GrRect const& rect) { context->DrawImage(rect, *image, 0, 0); };
}

/// The loop that goes pixel by pixel.
template <typename Width, typename Colors>
auto BlendPlainly(bool isOpaque)
{
    return [isOpaque](Surface const& surface, Picture const& picture) {
        return
            [&, isOpaque, errors = std::vector<std::int32_t>(kScreenWidth * 3)](GrRect const& rect) mutable {
                BlendPixels<Width, Colors>({{surface.Row(rect.y1) + rect.x1 * Width::kBytes, surface.Stride(),
                                                rect.x2 - rect.x1, rect.y2 - rect.y1},
                    picture.image.pixels, isOpaque ? nullptr : picture.image.alphaPlane, picture.width, 255,
                    true, 0, 0, errors.data()});
            };
    };
}

/// `alpha` is that of a mask, or 255 for none.
auto Composite(pixman_op_t operation, pixman_format_code_t format, int alpha = 255)
{
    return [=](Surface const& surface, Picture const& picture) {
        auto const weight = static_cast<std::uint16_t>(alpha * 257);
        pixman_color_t const color{0, 0, 0, weight};
        PixmanImage mask(alpha == 255 ? nullptr : pixman_image_create_solid_fill(&color));
        return [=, target = surface.NewPixmanImage(), source = picture.NewPixmanImage(format),
                   mask = std::move(mask)](GrRect const& rect) {
            pixman_image_composite32(operation, source.get(), mask.get(), target.get(), 0, 0, 0, 0, rect.x1,
                rect.y1, rect.x2 - rect.x1, rect.y2 - rect.y1);
        };
    };
}

auto BlitSdl(Uint32 format)
{
    return [format](Surface const& surface, Picture const& picture) {
        return
            [target = surface.NewSdlSurface(), source = picture.NewSdlSurface(format)](GrRect const& rect) {
                SDL_Rect box{rect.x1, rect.y1, 0, 0};
                SDL_BlitSurface(source.get(), nullptr, target.get(), &box);
            };
    };
}

constexpr std::uint8_t kShade = 40;

auto ShadeOurs(Surface const& surface, Picture const&)
{
    auto context = surface.NewContext();
    context->SetForeColor(0);
    return [context = std::move(context)](GrRect const& rect) {
        context->DrawImageAlpha(rect, nullptr, 0, 0, {true, false, true, kShade});
    };
}

/// As the shadows of windows are painted, errors diffused where the format does.
auto ShadeRegionOurs(Surface const& surface, Picture const&)
{
    auto context = surface.NewContext();
    context->SetForeColor(0);
    return [context = std::move(context)](GrRect const& rect) { context->FillRegionAlpha(rect, kShade); };
}

auto ShadePixman(Surface const& surface, Picture const&)
{
    pixman_color_t const color{0, 0, 0, kShade * 257};
    return [target = surface.NewPixmanImage(), source = PixmanImage(pixman_image_create_solid_fill(&color))](
               GrRect const& rect) {
        pixman_image_composite32(PIXMAN_OP_OVER, source.get(), nullptr, target.get(), 0, 0, 0, 0, rect.x1,
            rect.y1, rect.x2 - rect.x1, rect.y2 - rect.y1);
    };
}

void AddCopyRow(std::shared_ptr<Surface const> const& surface, int width, int height)
{
    BlitRow const row{"copy " + std::to_string(width) + "x" + std::to_string(height) + ", 32 bits", surface,
        std::make_shared<Picture>(width, height, Alphas::None), 0};
    row.Add(kOurs, CopyOurs);
    row.Add(kPixman, Composite(PIXMAN_OP_SRC, PIXMAN_x8r8g8b8));
    row.Add(kSdl, BlitSdl(SDL_PIXELFORMAT_RGB888));
}

}

void AddRows()
{
    auto const newSurface = [](int bits) { return std::make_shared<Surface const>(kScreenWidth, bits); };
    auto const screen8 = newSurface(8), screen16 = newSurface(16), screen32 = newSurface(32);
    auto const opaque = std::make_shared<Picture>(300, 200, Alphas::None);
    auto const random = std::make_shared<Picture>(300, 200, Alphas::Random);
    auto const icon = std::make_shared<Picture>(300, 200, Alphas::Icon);

    AddCopyRow(screen32, kScreenWidth, kScreenHeight);
    AddCopyRow(screen32, 16, 16);
    for (auto const& screen : {screen16, screen32}) {
        std::string const bits = ", " + std::to_string(screen->Bits()) + " bits";
        int const step = screen == screen16 ? 16 : 3;
        BlitRow row{"convert 300x200" + bits, screen, opaque, 0};
        row.Add(kOurs, DrawOurs);
        // To 32 bits, red and blue change places; to 16 bits the peers are faster from the other order.
        bool const turned = screen == screen32;
        row.Add(kPixman, Composite(PIXMAN_OP_SRC, turned ? PIXMAN_x8b8g8r8 : PIXMAN_x8r8g8b8));
        row.Add(kSdl, BlitSdl(turned ? SDL_PIXELFORMAT_XBGR8888 : SDL_PIXELFORMAT_RGB888));

        GrBlendParams const over{true, false, false, 0};
        row = {"blend 300x200, random alpha" + bits, screen, random, step};
        row.Add(kOurs, BlendOurs(over));
        row.Add(kPixman, Composite(PIXMAN_OP_OVER, PIXMAN_a8r8g8b8));
        row = {"blend 300x200, alpha like an icon's" + bits, screen, icon, step};
        row.Add(kOurs, BlendOurs(over));
        row.Add(kPixman, Composite(PIXMAN_OP_OVER, PIXMAN_a8r8g8b8));
        row = {"blend 300x200, uniform alpha" + bits, screen, opaque, step};
        row.Add(kOurs, BlendOurs({true, false, true, 100}));
        row.Add(kPixman, Composite(PIXMAN_OP_OVER, PIXMAN_x8r8g8b8, 100));
        row = {"shade 300x200" + bits, screen, opaque, step};
        row.Add(kOurs, ShadeOurs);
        row.Add(kPixman, ShadePixman);
        row.name = "FillRegionAlpha 300x200" + bits;
        row.Add(kOurs, ShadeRegionOurs);
        row.Add(kPixman, ShadePixman);
    }

    GrBlendParams const ditherOpaque{true, true, true, 255}, ditherOver{true, true, false, 0};
    BlitRow row{"diffuse 300x200, opaque, 16 bits", screen16, random, 0};
    row.Add(kOurs, BlendOurs(ditherOpaque));
    row.Add(kPlain, BlendPlainly<GrSurface16, GrColors16>(true));
    row = {"diffuse 300x200, over, 16 bits", screen16, random, 0};
    row.Add(kOurs, BlendOurs(ditherOver));
    row.Add(kPlain, BlendPlainly<GrSurface16, GrColors16>(false));
    row = {"diffuse 300x200, opaque, 8 bits", screen8, random, 0};
    row.Add(kOurs, BlendOurs(ditherOpaque));
    row.Add(kPlain, BlendPlainly<GrSurface8, GrColors8>(true));
}
