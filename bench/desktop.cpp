#include <bench/rows.h>
#include <bench/shapes.h>
#include <bench/surfaces.h>

#include <benchmark/benchmark.h>
#include <pixman.h>

#include <cstdlib>
#include <cstring>
#include <vector>

// A desktop, painted anew: a background, windows with borders, shades behind them, rulings, and icons.

namespace {

constexpr int kIcon = 48;

/// An icon, premultiplied: opaque within, with soft edges; red and blue are alike, so that one order of the
/// channels serves all.
std::vector<std::uint32_t> IconPixels()
{
    std::vector<std::uint32_t> pixels;
    for (int y = 0; y < kIcon; ++y)
        for (int x = 0; x < kIcon; ++x) {
            int const dx = x - kIcon / 2, dy = y - kIcon / 2, distance = dx * dx + dy * dy;
            auto const alpha = static_cast<std::uint8_t>(distance < 400 ? 255
                    : distance > 560                                    ? 0
                                                                        : 560 - distance);
            auto const color = static_cast<std::uint8_t>((x + y) * alpha / 256);
            pixels.push_back(GrMakeColor(color, alpha, color, alpha));
        }
    return pixels;
}

/// Calls `fill` (rectangle, colour), `shade` (rectangle) and `icon` (place) for everything on the desktop.
template <typename Fill, typename Shade, typename Icon>
void PaintDesktop(Fill fill, Shade shade, Icon icon)
{
    fill(GrRect{0, 0, kScreenWidth, kScreenHeight}, GrMakeColor(60, 90, 130));
    for (int i = 0; i < 8; ++i) {
        GrRect const window{20 + 80 * i, 20 + 60 * i, 320 + 80 * i, 240 + 60 * i};
        shade(GrRect{window.x1 + 8, window.y1 + 8, window.x2 + 8, window.y2 + 8});
        fill(window, GrMakeColor(20, 20, 20));
        fill(GrRect{window.x1 + 1, window.y1 + 1, window.x2 - 1, window.y2 - 1}, GrMakeColor(220, 220, 210));
        fill(GrRect{window.x1 + 2, window.y1 + 2, window.x2 - 2, window.y1 + 20}, GrMakeColor(40, 60, 160));
        for (int y = window.y1 + 30; y < window.y2 - 10; y += 10)
            fill(GrRect{window.x1 + 10, y, window.x2 - 10, y + 1}, GrMakeColor(160, 160, 150));
        for (int x = 0; x < 5; ++x)
            icon(window.x1 + 10 + 56 * x, window.y1 + 40);
    }
}

}

void AddRows()
{
    constexpr char kName[] = "desktop 1024x768, 32 bits";
    auto const surface = std::make_shared<Surface const>(kScreenWidth, 32);
    auto const pixels = std::make_shared<std::vector<std::uint32_t>>(IconPixels());
    auto const icon = std::make_shared<GrImage>(kIcon, kIcon, GrImageHasAlpha);
    std::memcpy(icon->pixels, pixels->data(), pixels->size() * 4);
    for (std::size_t i = 0; i < pixels->size(); ++i)
        icon->alphaPlane[i] = GrAlpha((*pixels)[i]);

    auto const paintOurs = [=] {
        auto const context = surface->NewContext();
        PaintDesktop(
            [&](GrRect const& rect, GrColor color) {
                context->SetForeColor(color);
                context->FillRegion(rect);
            },
            [&](GrRect const& rect) {
                context->SetForeColor(0);
                context->FillRegionAlpha(rect, 80);
            },
            [&](int x, int y) {
                context->DrawImage({x, y, x + kIcon, y + kIcon}, *icon, 0, 0);
            });
    };
    auto const paintPixman = [=] {
        auto const target = surface->NewPixmanImage();
        PixmanImage const source(
            pixman_image_create_bits(PIXMAN_a8r8g8b8, kIcon, kIcon, pixels->data(), kIcon * 4));
        auto const fill = [&](pixman_op_t operation, GrRect const& rect, pixman_color_t const& color) {
            pixman_box32_t const box{rect.x1, rect.y1, rect.x2, rect.y2};
            pixman_image_fill_boxes(operation, target.get(), &color, 1, &box);
        };
        auto const wide = [](std::uint8_t channel) { return static_cast<std::uint16_t>(channel * 257); };
        PaintDesktop(
            [&](GrRect const& rect, GrColor color) {
                fill(PIXMAN_OP_SRC, rect,
                    {wide(GrRed(color)), wide(GrGreen(color)), wide(GrBlue(color)), 0xFFFF});
            },
            [&](GrRect const& rect) {
                fill(PIXMAN_OP_OVER, rect, {0, 0, 0, 80 * 257});
            },
            [&](int x, int y) {
                pixman_image_composite32(
                    PIXMAN_OP_OVER, source.get(), nullptr, target.get(), 0, 0, 0, 0, x, y, kIcon, kIcon);
            });
    };
    auto const add = [&](char const* contender, auto const& paint) {
        AddContender(kName, contender, [paint](benchmark::State& state) {
            for (auto _ : state) {
                paint();
                benchmark::ClobberMemory();
            }
        });
    };
    add(kOurs, paintOurs);
    add(kPixman, paintPixman);

    paintOurs();
    std::vector<unsigned char> const ours(surface->Row(0), surface->Row(kSurfaceHeight));
    paintPixman();
    for (std::size_t i = 0; i < ours.size(); ++i)
        ExpectSame(i % 4 == 3 || std::abs(ours[i] - surface->Row(0)[i]) <= 3, kName);
}
