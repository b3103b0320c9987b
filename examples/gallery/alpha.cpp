#include "pages.h"

#include <algorithm>
#include <cmath>

namespace gallery {

namespace {

constexpr GrBlendParams kOverPage = {true, true, false, 0};

/// 0 in the middle of the plate, 256 at its nearest edges, and more beyond.
int Distance(Plate const& plate, int x, int y)
{
    double const dx = 2 * x + 1 - plate.width, dy = 2 * y + 1 - plate.height;
    return static_cast<int>(std::sqrt(dx * dx + dy * dy) * 256 / plate.Side());
}

void DrawSteps(Plate const& plate)
{
    DrawChecks(plate, 8, kPaper, kShade);
    for (int row = 0; row < 7; ++row)
        for (int i = 0; i < 16; ++i) {
            plate.context.SetForeColor(Hue(row));
            plate.context.FillRegionAlpha(GrRect{plate.width * i / 16, plate.height * row / 7,
                                              plate.width * (i + 1) / 16, plate.height * (row + 1) / 7},
                static_cast<std::uint8_t>(i * 17));
        }
}

/// A picture in strips, each as a whole more opaque than the one before.
void DrawStrips(Plate const& plate)
{
    DrawChecks(plate, 8, kPaper, kShade);
    auto const image = NewImage({32, GrImageTrueColor}, plate.width, plate.height, Landscape);
    for (int i = 0; i < 8; ++i) {
        GrRect const strip{plate.width * i / 8, 0, plate.width * (i + 1) / 8, plate.height};
        auto const alpha = static_cast<std::uint8_t>(255 * (i + 1) / 8);
        // The pixels of an image are to be multiplied by its alpha, except by one that holds for all of it.
        plate.context.DrawImageAlpha(strip, image.get(), strip.x1, 0, {true, true, true, alpha});
    }
}

void DrawLights(Plate const& plate)
{
    plate.Fill(plate.All(), kInk);
    for (int i = 0; i < 3; ++i) {
        Point const lamp = OnCircle({0, 0}, plate.Side() / 6, kFullCircle * (4 * i + 3) / 12);
        auto const image = NewAlphaImage(plate.width, plate.height, [&](int x, int y) {
            int const level = std::max(0, 255 - Distance(plate, x - lamp.x, y - lamp.y) * 7 / 5);
            return WithAlpha(Hue(i * 2), level);
        });
        plate.context.DrawImageAlpha(plate.All(), image.get(), 0, 0, kOverPage);
    }
}

/// A ball of glass with a soft edge and a gleam.
std::unique_ptr<GrImage> NewBall(Plate const& plate, std::uint32_t flags = 0)
{
    return NewAlphaImage(
        plate.width, plate.height,
        [&](int x, int y) {
            int const distance = Distance(plate, x, y);
            int const gleam = Distance(plate, x + plate.Side() / 8, y + plate.Side() / 6);
            int const edge = std::clamp((224 - distance) * 32, 0, 255);
            GrColor const glass = Mix(Hue(4), Hue(5), distance);
            return WithAlpha(Mix(Rgb(255, 255, 255), glass, gleam * 4),
                edge * std::max(90 + distance / 2, 255 - gleam * 4) / 255);
        },
        flags);
}

void DrawStripes(Plate const& plate)
{
    for (int i = 0; i < 10; i += 2)
        plate.Fill(GrRect{0, plate.height * i / 10, plate.width, plate.height * (i + 1) / 10}, Hue(1));
}

void DrawBall(Plate const& plate)
{
    DrawStripes(plate);
    plate.context.DrawImage(plate.All(), *NewBall(plate), 0, 0);
}

/// The left half over the page, the right half over the back colour.
void DrawOverBackColor(Plate const& plate)
{
    DrawStripes(plate);
    plate.context.SetBackColor(Hue(2));
    int const middle = plate.width / 2;
    plate.context.DrawImage({0, 0, middle, plate.height}, *NewBall(plate), 0, 0);
    plate.context.DrawImage(
        {middle, 0, plate.width, plate.height}, *NewBall(plate, GrImageOverBack), middle, 0);
}

/// A soft ring without colours of its own.
void DrawInForeColor(Plate const& plate)
{
    auto const ring = NewAlphaImage(
        plate.width, plate.height,
        [&](int x, int y) {
            int const offCentre = std::abs(Distance(plate, x, y) - 96);
            return WithAlpha(0, std::clamp(255 - (offCentre - 10) * 8, 0, 255));
        },
        GrImageAlphaOnly);
    for (int i = 0; i < 5; ++i) {
        int const x = plate.Side() * (i - 2) / 9, y = plate.Side() * (i % 2 ? 1 : -1) / 7;
        plate.context.SetForeColor(Hue(i * 2));
        plate.context.DrawImage({x, y, x + plate.width, y + plate.height}, *ring, 0, 0);
    }
}

void DrawFadeIn(Plate const& plate)
{
    int const w = plate.width, h = plate.height;
    auto const image = NewAlphaImage(w, h,
        [w, h](int x, int y) { return WithAlpha(Landscape(x * 1024 / w, y * 1024 / h), x * 255 / (w - 1)); });
    plate.context.DrawImage(plate.All(), *image, 0, 0);
}

/// Panes of coloured glass that lie over each other.
void DrawPanes(Plate const& plate)
{
    int const w = plate.width, h = plate.height;
    for (int i = 0; i < 4; ++i) {
        int const x = w * (8 + 12 * i) / 100, y = h * (8 + 12 * i) / 100;
        plate.context.SetForeColor(Hue(i * 2));
        plate.context.FillRegionAlpha(GrRect{x, h - y - h * 48 / 100, x + w * 48 / 100, h - y}, 128);
        plate.context.FillRegionAlpha(GrRect{x, y, x + w * 48 / 100, y + h * 48 / 100}, 128);
    }
}

void DrawShadow(Plate const& plate)
{
    int const w = plate.width, h = plate.height, soft = w / 10;
    GrRect const card{w * 2 / 10, h * 2 / 10, w * 8 / 10, h * 8 / 10};
    auto const shadow = NewAlphaImage(
        w, h,
        [&](int x, int y) {
            auto const inside = [soft](int at, int from, int to) {
                return std::clamp(std::min(at - from, to - at) * 128 / soft + 64, 0, 128);
            };
            return WithAlpha(0, inside(x, card.x1, card.x2) * inside(y, card.y1, card.y2) / 128);
        },
        GrImageAlphaOnly);
    DrawChecks(plate, 8, kPaper, kShade);
    plate.context.SetForeColor(kInk);
    plate.context.DrawImage({soft / 2, soft / 2, w, h}, *shadow, 0, 0);
    plate.Fill(card, Rgb(255, 255, 255));
    plate.Fill(GrRect{card.x1, card.y1, card.x2, card.y1 + h / 10}, Hue(5));
}

/// No image at all: what is blended is the fore colour.
void DrawTints(Plate const& plate)
{
    auto const image = NewImage(plate.format, plate.width, plate.height, Landscape);
    plate.context.DrawImage(plate.All(), *image, 0, 0);
    for (int i = 0; i < 4; ++i) {
        GrRect const quarter{plate.width / 2 * (i % 2), plate.height / 2 * (i / 2),
            plate.width / 2 * (i % 2 + 1), plate.height / 2 * (i / 2 + 1)};
        plate.context.SetForeColor(Hue(i * 2));
        if (i > 0) plate.context.DrawImageAlpha(quarter, nullptr, 0, 0, {true, true, true, 140});
    }
}

void DrawCrossingRamps(Plate const& plate)
{
    for (int x = 0; x < plate.width; ++x) {
        plate.context.SetForeColor(Hue(6));
        plate.context.FillRegionAlpha(
            GrRect{x, 0, x + 1, plate.height}, static_cast<std::uint8_t>(x * 255 / plate.width));
    }
    for (int y = 0; y < plate.height; ++y) {
        plate.context.SetForeColor(Hue(2));
        plate.context.FillRegionAlpha(
            GrRect{0, y, plate.width, y + 1}, static_cast<std::uint8_t>(y * 255 / plate.height));
    }
}

/// Darkness that a round light takes away.
void DrawSpotlight(Plate const& plate)
{
    auto const image = NewImage(plate.format, plate.width, plate.height, Landscape);
    plate.context.DrawImage(plate.All(), *image, 0, 0);
    auto const night = NewAlphaImage(plate.width, plate.height, [&](int x, int y) {
        int const distance = Distance(plate, x - plate.width / 8, y);
        return WithAlpha(Rgb(8, 10, 30), std::clamp((distance - 110) * 3, 0, 220));
    });
    plate.context.DrawImage(plate.All(), *night, 0, 0);
}

}

void DrawAlpha(Plate const& page)
{
    DrawPlates(page, 4,
        {DrawSteps, DrawStrips, DrawLights, DrawBall, DrawOverBackColor, DrawInForeColor, DrawFadeIn,
            DrawPanes, DrawShadow, DrawTints, DrawCrossingRamps, DrawSpotlight});
}

}
