#include "pages.h"

#include <algorithm>
#include <cstdlib>

namespace gallery {

namespace {

constexpr int kDegree = 64;

/// The box around a circle, as arcs take it: the ends belong to it.
void Circle(Plate const& plate, Point centre, int radius, GrColor color)
{
    plate.context.SetForeColor(color);
    plate.context.DrawArc(centre.x - radius, centre.y - radius, 2 * radius, 2 * radius, 0, kFullCircle);
}

void Pie(Plate const& plate, Point centre, int radius, GrColor color, int start = 0, int sweep = kFullCircle)
{
    plate.context.SetForeColor(color);
    plate.context.FillArc(centre.x - radius, centre.y - radius, 2 * radius, 2 * radius, start, sweep);
}

void DrawCircles(Plate const& plate)
{
    for (int radius = plate.Side() * 47 / 100, i = 0; radius > 0; radius -= 3, ++i)
        Circle(plate, plate.Centre(), radius, Mix(Hue(6), Hue(1), i * 6));
}

/// Ellipses of all widths, and of all heights.
void DrawEllipses(Plate const& plate)
{
    int const w = plate.width * 9 / 10, h = plate.height * 9 / 10;
    for (int i = 0; i <= 8; ++i) {
        plate.context.SetForeColor(Hue(5));
        plate.context.DrawArc(
            (plate.width - w * i / 8) / 2, (plate.height - h) / 2, w * i / 8, h, 0, kFullCircle);
        plate.context.SetForeColor(Hue(0));
        plate.context.DrawArc(
            (plate.width - w) / 2, (plate.height - h * i / 8) / 2, w, h * i / 8, 0, kFullCircle);
    }
}

/// Arcs that begin at the top and reach further from ring to ring.
void DrawGrowingArcs(Plate const& plate)
{
    int const rings = 12, step = plate.Side() * 46 / 100 / rings;
    for (int i = 0; i < rings; ++i)
        for (int line = 0; line < std::max(1, step - 1); ++line) {
            int const radius = (i + 1) * step - line;
            plate.context.SetForeColor(Hue(i));
            plate.context.DrawArc(plate.width / 2 - radius, plate.height / 2 - radius, 2 * radius, 2 * radius,
                90 * kDegree, -(i + 1) * kFullCircle / rings);
        }
}

void DrawPieChart(Plate const& plate)
{
    static constexpr int kParts[] = {95, 80, 65, 50, 40, 30};
    int start = 20;
    for (int i = 0; i < 6; ++i) {
        Point const centre =
            OnCircle(plate.Centre(), plate.Side() / (i == 0 ? 14 : 60), (start + kParts[i] / 2) * kDegree);
        Pie(plate, centre, plate.Side() * 40 / 100, Hue(i), start * kDegree, kParts[i] * kDegree);
        start += kParts[i];
    }
}

void DrawClocks(Plate const& plate)
{
    int const w = plate.width, h = plate.height, radius = plate.Side() / 8;
    for (int i = 0; i < 9; ++i) {
        Point const centre = {w * (2 * (i % 3) + 1) / 6, h * (2 * (i / 3) + 1) / 6};
        Pie(plate, centre, radius, kShade);
        Pie(plate, centre, radius, Hue(i), 90 * kDegree, -(i + 1) * kFullCircle / 9);
    }
}

void DrawRainbow(Plate const& plate)
{
    GrColor const sky = Rgb(176, 214, 240);
    int const horizon = plate.height * 7 / 10;
    plate.Fill(plate.All(), sky);
    for (int i = 0; i <= 7; ++i)
        Pie(plate, {plate.width / 2, horizon}, plate.Side() * (46 - 4 * i) / 100, i < 7 ? Hue(i) : sky, 0,
            kFullCircle / 2);
    plate.Fill(GrRect{0, horizon, plate.width, plate.height}, Hue(3));
}

void DrawYinAndYang(Plate const& plate)
{
    auto const [x, y] = plate.Centre();
    int const radius = plate.Side() * 44 / 100;
    Pie(plate, {x, y}, radius, Hue(1), 90 * kDegree, kFullCircle / 2);
    Pie(plate, {x, y}, radius, Hue(5), -90 * kDegree, kFullCircle / 2);
    for (int side : {-1, 1}) {
        Pie(plate, {x, y + side * radius / 2}, radius / 2, Hue(side < 0 ? 1 : 5));
        Pie(plate, {x, y + side * radius / 2}, radius / 7, Hue(side < 0 ? 5 : 1));
    }
}

/// Rings, each cut out of the one before, in a half turn.
void DrawTarget(Plate const& plate)
{
    for (int i = 0; i < 8; ++i) {
        int const radius = plate.Side() * (47 - 6 * i) / 100;
        Pie(plate, plate.Centre(), radius, Hue(i), 45 * kDegree, kFullCircle / 2);
        Pie(plate, plate.Centre(), radius, Mix(Hue(i), kPaper, 130), 225 * kDegree, kFullCircle / 2);
    }
}

void DrawPatternedPies(Plate const& plate)
{
    for (int i = 0; i < 6; ++i) {
        plate.context.SetBackColor(Mix(Hue(i), kPaper, 190));
        plate.context.SetPattern(kPatterns[i], 0, 0, false);
        Pie(plate, plate.Centre(), plate.Side() * 46 / 100, Hue(i), i * 60 * kDegree, 60 * kDegree);
    }
}

/// Circles around the points of a circle.
void DrawFlower(Plate const& plate)
{
    int const radius = plate.Side() * 23 / 100;
    for (int i = 0; i < 24; ++i)
        Circle(plate, OnCircle(plate.Centre(), radius, i * kFullCircle / 24), radius,
            Mix(Hue(0), Hue(6), std::abs(i - 12) * 256 / 12));
}

void DrawScales(Plate const& plate)
{
    int const radius = plate.width / 10, step = radius / 2 + 1;
    for (int row = -1; row * step < plate.height + radius; ++row)
        for (int x = row % 2 ? 0 : radius; x <= plate.width + radius; x += 2 * radius) {
            Pie(plate, {x, row * step}, radius,
                Mix(Hue(4), Hue(5), row * 256 * step / (plate.height + radius)));
            Circle(plate, {x, row * step}, radius, kPaper);
        }
}

/// Tiles of two quarter rings each, one way round or the other, which join to winding paths.
void DrawWindingPaths(Plate const& plate)
{
    int const tiles = 6, size = plate.width / tiles + 1;
    for (int i = 0; i < tiles * tiles; ++i) {
        GrRect const tile{i % tiles * size, i / tiles * size, std::min((i % tiles + 1) * size, plate.width),
            std::min((i / tiles + 1) * size, plate.height)};
        plate.context.SetClipRegion(tile);
        bool const falling = (i * 7 + i / tiles * 5 + i % 4) % 3 != 0;
        for (int const side : {0, 1}) {
            Point const corner = {tile.x1 + side * size, tile.y1 + (side == falling ? size : 0)};
            Pie(plate, corner, size * 5 / 8, Hue(4));
            Pie(plate, corner, size * 3 / 8, kPaper);
        }
    }
}

}

void DrawArcs(Plate const& page)
{
    DrawPlates(page, 4,
        {DrawCircles, DrawEllipses, DrawGrowingArcs, DrawPieChart, DrawClocks, DrawRainbow, DrawYinAndYang,
            DrawTarget, DrawPatternedPies, DrawFlower, DrawScales, DrawWindingPaths});
}

}
