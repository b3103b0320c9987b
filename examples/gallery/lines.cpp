#include "pages.h"

namespace gallery {

namespace {

void Line(Plate const& plate, Point from, Point to) { plate.context.DrawLine(from.x, from.y, to.x, to.y); }

/// Lines through `count` points, where `pointAt` says that the i-th lies.
template <typename PointAt>
void Polyline(Plate const& plate, int count, PointAt pointAt)
{
    for (int i = 1; i < count; ++i)
        Line(plate, pointAt(i - 1), pointAt(i));
}

void DrawStar(Plate const& plate)
{
    for (int i = 0; i < 72; ++i) {
        plate.context.SetForeColor(Hue(i / 6));
        Line(plate, OnCircle(plate.Centre(), plate.Side() / 12, i * kFullCircle / 72),
            OnCircle(plate.Centre(), plate.Side() * 45 / 100, i * kFullCircle / 72));
    }
}

/// Threads from one side of a corner to the other, in all four corners.
void DrawThreads(Plate const& plate)
{
    int const right = plate.width - 1, bottom = plate.height - 1;
    for (int i = 0; i <= 20; ++i) {
        int const x = right * i / 20, y = bottom * i / 20;
        plate.context.SetForeColor(Mix(Hue(0), Hue(6), i * 256 / 20));
        plate.context.DrawLine(0, y, x, bottom);
        plate.context.DrawLine(right, bottom - y, right - x, 0);
        plate.context.SetForeColor(Mix(Hue(4), Hue(5), i * 256 / 20));
        plate.context.DrawLine(0, bottom - y, x, 0);
        plate.context.DrawLine(right, y, right - x, bottom);
    }
}

/// Each point of a circle is joined to the one twice as far around.
void DrawHeart(Plate const& plate)
{
    plate.context.SetForeColor(Hue(0));
    auto const at = [&](int i) {
        return OnCircle(plate.Centre(), plate.Side() * 46 / 100, i * kFullCircle / 120);
    };
    for (int i = 1; i < 120; ++i)
        Line(plate, at(i), at(2 * i));
}

void DrawPlaid(Plate const& plate)
{
    for (int i = 0, at = 2; at < plate.width || at < plate.height; at += ++i) {
        plate.context.SetForeColor(Hue(5));
        plate.context.DrawLine(at, 0, at, plate.height - 1);
        plate.context.SetForeColor(Hue(3));
        plate.context.DrawLine(0, at, plate.width - 1, at);
    }
}

void DrawDiagonals(Plate const& plate)
{
    for (int at = -plate.height; at < plate.width; at += 8) {
        plate.context.SetForeColor(Hue(4));
        plate.context.DrawLine(at, 0, at + plate.height, plate.height);
        plate.context.SetForeColor(Hue(1));
        plate.context.DrawLine(at, plate.height, at + plate.height, 0);
    }
}

void DrawWaves(Plate const& plate)
{
    for (int wave = 0; wave < 7; ++wave) {
        plate.context.SetForeColor(Hue(wave));
        Polyline(plate, plate.width / 4 + 2, [&](int i) {
            int const swing = OnCircle({0, 0}, plate.height / 3, i * kFullCircle * 4 / plate.width).y;
            return Point{i * 4, plate.height / 2 + swing * (wave - 3) / 3};
        });
    }
}

/// Lines of every slope through transparent patterns, which give them dashes.
void DrawDashes(Plate const& plate)
{
    static constexpr Pattern kDashes[] = {{0x0F, 0x0F, 0x0F, 0x0F, 0xF0, 0xF0, 0xF0, 0xF0},
        {0x33, 0x33, 0xCC, 0xCC, 0x33, 0x33, 0xCC, 0xCC}, {0x55, 0xAA, 0x55, 0xAA, 0x55, 0xAA, 0x55, 0xAA}};
    for (int i = 0; i <= 12; ++i) {
        plate.context.SetPattern(kDashes[i % 3], 0, 0, true);
        plate.context.SetForeColor(Hue(i % 3 * 2));
        plate.context.DrawLine(4, plate.height * (i + 1) / 14, plate.width - 5, plate.height * (13 - i) / 14);
    }
}

void DrawSpiral(Plate const& plate)
{
    for (int turn = 0; turn < 4; ++turn) {
        plate.context.SetForeColor(Hue(turn * 2));
        Polyline(plate, 97, [&](int i) {
            return OnCircle(
                plate.Centre(), plate.Side() * i / 210, i * kFullCircle / 36 + turn * kFullCircle / 4);
        });
    }
}

void DrawTurningSquares(Plate const& plate)
{
    for (int i = 0; i < 24; ++i) {
        plate.context.SetForeColor(Mix(Hue(5), Hue(1), i * 256 / 23));
        Polyline(plate, 5, [&](int corner) {
            return OnCircle(plate.Centre(), plate.Side() * (26 - i) / 53, (corner * 90 + 45 + i * 5) * 64);
        });
    }
}

void DrawRose(Plate const& plate)
{
    auto const at = [&](int i) {
        return OnCircle(plate.Centre(), plate.Side() * 46 / 100, i * kFullCircle / 14);
    };
    for (int step = 1; step <= 7; ++step) {
        plate.context.SetForeColor(Hue(step - 1));
        for (int i = 0; i < 14; ++i)
            Line(plate, at(i), at(i + step));
    }
}

void DrawThroughRings(Plate const& plate)
{
    GrRegion rings;
    for (int i = 5; i > 0; --i) {
        GrRegion const disc = Disc(plate.Centre(), plate.Side() * i / 11);
        if (i % 2)
            rings += disc;
        else
            rings -= disc;
    }
    plate.context.SetClipRegion(rings);
    for (int x = -plate.height; x < plate.width; x += 4) {
        plate.context.SetForeColor(Hue((x + plate.height) / 24));
        plate.context.DrawLine(x, plate.height, x + plate.height / 2, 0);
        plate.context.DrawLine(x + plate.height / 2, plate.height, x + plate.height / 2 * 2, 0);
    }
}

void DrawKnot(Plate const& plate)
{
    for (int strand = 0; strand < 3; ++strand) {
        plate.context.SetForeColor(Hue(4 + strand));
        Polyline(plate, 181, [&](int i) {
            int const angle = i * kFullCircle / 180;
            return Point{OnCircle(plate.Centre(), plate.width * 45 / 100, 3 * angle + strand * 300).x,
                OnCircle(plate.Centre(), plate.height * 45 / 100, 4 * angle).y};
        });
    }
}

}

void DrawLines(Plate const& page)
{
    DrawPlates(page, 4,
        {DrawStar, DrawThreads, DrawHeart, DrawPlaid, DrawDiagonals, DrawWaves, DrawDashes, DrawSpiral,
            DrawTurningSquares, DrawRose, DrawThroughRings, DrawKnot});
}

}
