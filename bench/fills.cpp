#include <bench/pixman_region.h>
#include <bench/rows.h>
#include <bench/shapes.h>
#include <bench/surfaces.h>

#include <SDL.h>
#include <benchmark/benchmark.h>
#include <pixman.h>

#include <algorithm>
#include <cstring>

// Solid fills through the public interface, of a rectangle that becomes a region in the call, on images as
// wide as the screen or 16 pixels wider: a pitch of 4,096 bytes sends all rows of a column to one cache set,
// any other does not.

namespace {

using SharedSurface = std::shared_ptr<Surface const>;

// The contenders. Each function makes what a user would keep, and returns what fills a rectangle with it.

auto FillOurs(Surface const& surface, GrRegion const& clip)
{
    auto context = surface.NewContext();
    context->SetClipRegion(clip);
    return [context = std::move(context)](GrRect const& rect) { context->FillRegion(rect); };
}

/// For those who keep a region for their fills, too.
auto FillOursKeepingRegion(Surface const& surface, GrRegion const& clip)
{
    auto context = surface.NewContext();
    context->SetClipRegion(clip);
    return [context = std::move(context), region = GrRegion()](GrRect const& rect) mutable {
        region = rect;
        context->FillRegion(region);
    };
}

/// Bytes instead of pixels: the limit.
auto FillMemset(Surface const& surface, GrRegion const&)
{
    return [&surface](GrRect const& rect) {
        auto const length =
            static_cast<std::size_t>(rect.x2 - rect.x1) * static_cast<unsigned>(surface.Bytes());
        unsigned char* row = surface.Row(rect.y1) + rect.x1 * surface.Bytes();
        for (int y = rect.y1; y < rect.y2; ++y, row += surface.Stride())
            std::memset(row, 0x5A, length);
    };
}

/// Its fill without an image; there is none for 24 bits.
auto FillPixmanBits(Surface const& surface, GrRegion const&)
{
    return [&surface](GrRect const& rect) {
        pixman_fill(reinterpret_cast<std::uint32_t*>(surface.Row(0)), static_cast<int>(surface.Stride() / 4),
            surface.Bits(), rect.x1, rect.y1, rect.x2 - rect.x1, rect.y2 - rect.y1, surface.Pixel());
    };
}

auto FillPixman(Surface const& surface, GrRegion const& clip)
{
    auto image = surface.NewPixmanImage();
    pixman_image_set_clip_region32(image.get(), NewPixmanRegion(clip).get());
    return [image = std::move(image)](GrRect const& rect) {
        pixman_color_t const color{0x2020, 0x6060, 0xA0A0, 0xFFFF};
        pixman_box32_t const box{rect.x1, rect.y1, rect.x2, rect.y2};
        pixman_image_fill_boxes(PIXMAN_OP_SRC, image.get(), &color, 1, &box);
    };
}

auto FillSdl(Surface const& surface, GrRegion const& clip)
{
    GrRect outer;
    clip.GetOuterRect(outer);
    auto sdl = surface.NewSdlSurface();
    SDL_Rect const bounds{outer.x1, outer.y1, outer.x2 - outer.x1, outer.y2 - outer.y1};
    SDL_SetClipRect(sdl.get(), &bounds);
    return [sdl = std::move(sdl), pixel = surface.Pixel()](GrRect const& rect) {
        SDL_Rect const box{rect.x1, rect.y1, rect.x2 - rect.x1, rect.y2 - rect.y1};
        SDL_FillRects(sdl.get(), &box, 1, pixel);
    };
}

/// True if filling `rect` changes the pixels of `clip` within it, and no other.
template <typename Fill>
bool FillsExactly(Surface const& surface, GrRect const& rect, GrRegion const& clip, Fill& fill)
{
    std::memset(surface.Row(0), 0, surface.Size());
    fill(rect);
    GrRegion painted(clip);
    painted &= rect;
    auto const columns = static_cast<int>(surface.Stride() / surface.Bytes());
    for (int y = 0; y < kSurfaceHeight; ++y) {
        unsigned char const* pixel = surface.Row(y);
        for (int x = 0; x < columns; ++x, pixel += surface.Bytes()) {
            bool const isPainted =
                std::any_of(pixel, pixel + surface.Bytes(), [](auto byte) { return byte != 0; });
            if (isPainted != painted.Contains(x, y)) return false;
        }
    }
    return true;
}

/// A row in the making: fills of one size on a surface, through a clip.
struct FillRow {
    std::string name;
    SharedSurface surface;
    RectLoop places;
    GrRegion clip;

    /// `make` makes a contender's filling function, given the surface.
    template <typename Make>
    void Add(char const* contender, Make make) const
    {
        AddContender(name, contender, [row = *this, make](benchmark::State& state) {
            RectLoop place = row.places;
            auto fill = make(*row.surface, row.clip);
            for (auto _ : state) {
                fill(place.Next());
                benchmark::ClobberMemory();
            }
        });
        RectLoop checked = places;
        auto fill = make(*surface, clip);
        ExpectSame(FillsExactly(*surface, checked.Next(), clip, fill), name);
    }
};

void AddSolidRow(SharedSurface const& surface, int width, int height, std::string const& format)
{
    GrRegion const whole(
        GrRect{0, 0, static_cast<int>(surface->Stride() / surface->Bytes()), kSurfaceHeight});
    std::string const size = std::to_string(width) + "x" + std::to_string(height);
    FillRow const row{"solid fill " + size + format, surface, {width, height}, whole};
    row.Add(kOurs, FillOurs);
    row.Add(kMemset, FillMemset);
    if (surface->Bits() == 24)
        row.Add(kPixman, FillPixman);
    else
        row.Add(kPixman, FillPixmanBits);
    row.Add(kSdl, FillSdl);
}

/// Only pixman can follow with a clip that is no rectangle.
void AddClippedRows(SharedSurface const& surface, std::string const& format)
{
    GrRegion const frame(GrRect{8, 8, kScreenWidth - 8, kScreenHeight - 8});
    FillRow row{"FillRegion 16x16, clip of 1 range" + format, surface, {16, 16}, frame};
    row.Add(kOurs, FillOurs);
    row.Add(kPixman, FillPixman);
    row.Add(kSdl, FillSdl);
    row.name = "FillRegion 16x16, region kept, clip of 1 range" + format;
    row.Add(kOurs, FillOursKeepingRegion);
    row.Add(kPixman, FillPixman);
    row.Add(kSdl, FillSdl);
    row.name = "FillRegion 16x16, clip of 10 ranges" + format;
    row.clip = ScreenWithHoles(7, 10);
    row.Add(kOurs, FillOurs);
    row.Add(kPixman, FillPixman);
}

}

void AddRows()
{
    for (int const width : {kScreenWidth, kScreenWidth + 16}) {
        for (int const bits : {8, 16, 24, 32}) {
            auto const surface = std::make_shared<Surface const>(width, bits);
            std::string const format = ", " + std::to_string(bits) + " bits, width " + std::to_string(width);
            AddSolidRow(surface, 16, 16, format);
            AddSolidRow(surface, 300, 200, format);
            AddSolidRow(surface, kScreenWidth, kScreenHeight, format);
            AddClippedRows(surface, format);
        }
    }
}
