#include "pages.h"

#include <array>

namespace gallery {

namespace {

/// A polygon of a number of points.
template <typename... Points>
void Polygon(Plate const& plate, GrColor color, Points... points)
{
    std::array<Point, sizeof...(points)> const corners{points...};
    std::array<std::int16_t, 2 * corners.size()> xy;
    for (std::size_t i = 0; i < corners.size(); ++i) {
        xy[2 * i] = static_cast<std::int16_t>(corners[i].x);
        xy[2 * i + 1] = static_cast<std::int16_t>(corners[i].y);
    }
    plate.context.SetForeColor(color);
    plate.context.FillPolygon(xy.data(), static_cast<unsigned>(corners.size()));
}

void RegularPolygon(Plate const& plate, Point centre, int radius, int corners, int turned)
{
    std::vector<std::int16_t> xy;
    for (int i = 0; i < corners; ++i) {
        auto const [x, y] = OnCircle(centre, radius, turned + i * kFullCircle / corners);
        xy.push_back(static_cast<std::int16_t>(x));
        xy.push_back(static_cast<std::int16_t>(y));
    }
    plate.context.FillPolygon(xy.data(), static_cast<unsigned>(corners));
}

void DrawRegular(Plate const& plate)
{
    int const w = plate.width, h = plate.height;
    for (int i = 0; i < 9; ++i) {
        plate.context.SetForeColor(Hue(i));
        RegularPolygon(plate, {w * (2 * (i % 3) + 1) / 6, h * (2 * (i / 3) + 1) / 6}, plate.Side() / 7, i + 3,
            kFullCircle / 4);
    }
}

/// Triangles that share edges, and no pixels.
void DrawMesh(Plate const& plate)
{
    constexpr int kCells = 5;
    auto const at = [&](int column, int row) {
        bool const inside = column % kCells != 0 && row % kCells != 0;
        int const jitter = inside ? plate.width / 25 : 0;
        return Point{plate.width * column / kCells + ((column * 7 + row * 5) % 5 - 2) * jitter / 2,
            plate.height * row / kCells + ((column * 3 + row * 11) % 5 - 2) * jitter / 2};
    };
    for (int row = 0; row < kCells; ++row)
        for (int column = 0; column < kCells; ++column) {
            GrColor const color = Mix(Hue(4), Hue(6), (row + column) * 256 / (2 * kCells));
            Polygon(plate, color, at(column, row), at(column + 1, row), at(column, row + 1));
            Polygon(plate, Mix(color, kPaper, 90), at(column + 1, row), at(column + 1, row + 1),
                at(column, row + 1));
        }
}

void DrawCubes(Plate const& plate)
{
    int const h = plate.width / 10, w = h * 7 / 4, top = plate.height % (3 * h) / 2;
    for (int row = -1; row * 3 * h < plate.height + h; ++row)
        for (int column = -1; column * 2 * w < plate.width + w; ++column) {
            int const x = column * 2 * w + row % 2 * w, y = top + row * 3 * h;
            Polygon(
                plate, Hue(2), Point{x, y}, Point{x + w, y - h}, Point{x + 2 * w, y}, Point{x + w, y + h});
            Polygon(plate, Hue(1), Point{x, y}, Point{x + w, y + h}, Point{x + w, y + 3 * h},
                Point{x, y + 2 * h});
            Polygon(plate, Hue(0), Point{x + w, y + h}, Point{x + 2 * w, y}, Point{x + 2 * w, y + 2 * h},
                Point{x + w, y + 3 * h});
        }
}

/// Rays, each a triangle; every second one lighter.
void DrawRays(Plate const& plate)
{
    for (int i = 0; i < 32; ++i)
        Polygon(plate, i % 2 ? Mix(Hue(2), kPaper, 150) : Hue(2), plate.Centre(),
            OnCircle(plate.Centre(), plate.width + plate.height, i * kFullCircle / 32),
            OnCircle(plate.Centre(), plate.width + plate.height, (i + 1) * kFullCircle / 32));
    plate.context.SetForeColor(Hue(0));
    RegularPolygon(plate, plate.Centre(), plate.Side() / 5, 24, 0);
}

void DrawNested(Plate const& plate)
{
    for (int i = 0; i < 14; ++i) {
        plate.context.SetForeColor(Mix(Hue(5), Hue(2), i * 256 / 13));
        RegularPolygon(plate, plate.Centre(), plate.Side() * (15 - i) / 31, 5, kFullCircle / 4 + i * 5 * 64);
    }
}

/// Five points, each of two triangles, light and dark.
void DrawFoldedStar(Plate const& plate)
{
    int const outer = plate.Side() * 47 / 100, inner = plate.Side() * 19 / 100, turn = kFullCircle / 10;
    for (int i = 0; i < 5; ++i) {
        int const angle = kFullCircle / 4 + 2 * i * turn;
        Point const tip = OnCircle(plate.Centre(), outer, angle);
        Polygon(plate, Hue(1), plate.Centre(), tip, OnCircle(plate.Centre(), inner, angle + turn));
        Polygon(plate, Hue(0), plate.Centre(), OnCircle(plate.Centre(), inner, angle - turn), tip);
    }
}

void DrawChevrons(Plate const& plate)
{
    int const w = plate.width / 6, h = plate.height;
    for (int i = -3; i < 7; ++i)
        Polygon(plate, Hue(i + 7), Point{i * w, 0}, Point{(i + 1) * w, 0}, Point{(i + 3) * w, h / 2},
            Point{(i + 1) * w, h}, Point{i * w, h}, Point{(i + 2) * w, h / 2});
}

void DrawHoneycomb(Plate const& plate)
{
    int const radius = plate.width / 9, w = radius * 7 / 8;
    for (int row = 0; row * radius * 3 / 2 < plate.height + radius; ++row)
        for (int column = 0; column * 2 * w < plate.width + 2 * w; ++column) {
            plate.context.SetForeColor(Mix(Hue(2), Hue(1), (row * 5 + column * 3) % 7 * 40));
            RegularPolygon(
                plate, {column * 2 * w + row % 2 * w, row * radius * 3 / 2}, radius - 1, 6, kFullCircle / 4);
        }
}

/// A ball of flat pieces, lit from the upper left.
void DrawBall(Plate const& plate)
{
    int const radius = plate.Side() * 45 / 100;
    auto const at = [&](int longitude, int latitude) {  // in 12ths of half a circle
        Point const ring = OnCircle({0, 0}, radius, latitude * kFullCircle / 24);
        return Point{plate.width / 2 + OnCircle({0, 0}, ring.x, longitude * kFullCircle / 24).x,
            plate.height / 2 + ring.y};
    };
    for (int latitude = -6; latitude < 6; ++latitude)
        for (int longitude = 0; longitude < 12; ++longitude) {
            int const dark = (longitude - 8) * (longitude - 8) * 4 + (latitude - 3) * (latitude - 3) * 3;
            Polygon(plate, Mix(Mix(Hue(4), kPaper, 160), Mix(Hue(5), kInk, 128), dark),
                at(longitude, latitude), at(longitude + 1, latitude), at(longitude + 1, latitude + 1),
                at(longitude, latitude + 1));
        }
}

void DrawPatterned(Plate const& plate)
{
    for (int i = 0; i < 3; ++i) {
        plate.context.SetBackColor(Mix(Hue(i * 2), kPaper, 190));
        plate.context.SetPattern(kPatterns[i + 1], 0, 0, i == 1);
        plate.context.SetForeColor(Hue(i * 2));
        RegularPolygon(plate, OnCircle(plate.Centre(), plate.Side() / 5, kFullCircle * (4 * i + 3) / 12),
            plate.Side() * 28 / 100, 3 + i, kFullCircle / 4);
    }
}

/// Seven pieces of one square.
void DrawSevenPieces(Plate const& plate)
{
    int const unit = plate.Side() * 9 / 40, left = (plate.width - 4 * unit) / 2,
              top = (plate.height - 4 * unit) / 2;
    auto const at = [&](int x, int y) { return Point{left + x * unit, top + y * unit}; };
    Polygon(plate, Hue(0), at(0, 0), at(4, 0), at(2, 2));
    Polygon(plate, Hue(1), at(0, 0), at(2, 2), at(0, 4));
    Polygon(plate, Hue(2), at(4, 0), at(4, 2), at(3, 1));
    Polygon(plate, Hue(3), at(3, 1), at(4, 2), at(3, 3), at(2, 2));
    Polygon(plate, Hue(4), at(2, 2), at(3, 3), at(1, 3));
    Polygon(plate, Hue(5), at(0, 4), at(1, 3), at(3, 3), at(2, 4));
    Polygon(plate, Hue(6), at(4, 2), at(4, 4), at(2, 4));
}

void DrawPinwheel(Plate const& plate)
{
    constexpr int kVanes = 8, kTurn = kFullCircle / kVanes;
    int const radius = plate.Side() * 46 / 100;
    for (bool const folded : {false, true})
        for (int i = 0; i < kVanes; ++i) {
            GrColor const color = Hue(i % 2 ? 6 : 4);
            Point const tip = OnCircle(plate.Centre(), radius, i * kTurn);
            Point const edge = OnCircle(plate.Centre(), radius * 7 / 10, (i + 1) * kTurn);
            Point const fold = OnCircle(plate.Centre(), radius * 45 / 100, i * kTurn + kTurn / 2);
            if (folded)
                Polygon(plate, Mix(color, kPaper, 120), plate.Centre(), tip, fold);
            else
                Polygon(plate, color, plate.Centre(), tip, edge);
        }
}

}

void DrawPolygons(Plate const& page)
{
    DrawPlates(page, 4,
        {DrawRegular, DrawMesh, DrawCubes, DrawRays, DrawNested, DrawFoldedStar, DrawChevrons, DrawHoneycomb,
            DrawBall, DrawPatterned, DrawSevenPieces, DrawPinwheel});
}

}
