#include "pages.h"

namespace gallery {

namespace {

/// Four of the patterns, from the first on; `transparent` over stripes.
void DrawFourPatterns(Plate const& plate, int first, bool transparent)
{
    int const w = plate.width / 2, h = plate.height / 2;
    for (int x = 0; transparent && x < plate.width; x += 16)
        plate.Fill(GrRect{x, 0, x + 8, plate.height}, kShade);
    for (int i = 0; i < 4; ++i) {
        int const x = i % 2 * w, y = i / 2 * h;
        plate.context.SetBackColor(Mix(Hue(first + i), kPaper, 190));
        plate.context.SetPattern(kPatterns[first + i], 0, 0, transparent);
        plate.Fill(GrRect{x + w / 10, y + h / 10, x + w - w / 10, y + h - h / 10}, Hue(first + i));
    }
}

/// Bands in which a pattern of stripes is moved to the right, a pixel more in each.
void DrawMovedPattern(Plate const& plate)
{
    static constexpr Pattern kStripes = {0x0F, 0x0F, 0x0F, 0x0F, 0x0F, 0x0F, 0x0F, 0x0F};
    plate.context.SetBackColor(Mix(Hue(4), kPaper, 200));
    for (int i = 0; i < 16; ++i) {
        plate.context.SetPattern(kStripes, i, 0, false);
        plate.Fill(GrRect{0, plate.height * i / 16, plate.width, plate.height * (i + 1) / 16}, Hue(4));
    }
}

void DrawFrames(Plate const& plate)
{
    int const step = plate.width / 20 + 1;
    for (int i = 0; i * 2 * step < plate.width && i * 2 * step < plate.height; ++i)
        plate.Fill(GrRect{i * step, i * step, plate.width - i * step, plate.height - i * step}, Hue(i));
}

/// Three discs; where they meet is found by region arithmetic.
void DrawCommonParts(Plate const& plate)
{
    int const side = plate.Side(), radius = side * 27 / 100;
    auto const [x, y] = plate.Centre();
    GrRegion const discs[] = {Disc({x - side * 14 / 100, y - side * 13 / 100}, radius),
        Disc({x + side * 14 / 100, y - side * 13 / 100}, radius), Disc({x, y + side * 11 / 100}, radius)};
    for (int i = 0; i < 3; ++i)
        plate.Fill(discs[i], Hue(i * 2));
    GrRegion all(discs[0]);
    for (int i = 0; i < 3; ++i) {
        GrRegion common(discs[i]);
        common &= discs[(i + 1) % 3];
        plate.Fill(common, Hue(i * 2 + 1));
        all &= discs[i];
    }
    plate.Fill(all, kInk);
}

/// Discs put together and smaller ones cut out, then painted through a pattern.
void DrawLattice(Plate const& plate)
{
    auto const disc = [&plate](int i, int percent) {
        return Disc(
            {plate.width * (i % 4 + 1) / 5, plate.height * (i / 4 + 1) / 5}, plate.Side() * percent / 100);
    };
    GrRegion lattice;
    for (int i = 0; i < 16; ++i)
        lattice += disc(i, 14);
    for (int i = 0; i < 16; ++i)
        lattice -= disc(i, 8);
    plate.context.SetBackColor(Hue(1));
    plate.context.SetPattern(kPatterns[2], 0, 0, false);
    plate.Fill(lattice, Hue(0));
}

/// A fill through a clip with parts taken out of it.
void DrawThroughClip(Plate const& plate)
{
    plate.context.SetClipRegion(Disc(plate.Centre(), plate.Side() * 45 / 100));
    for (int x = 0; x < plate.width; x += plate.Side() / 6)
        plate.context.ExcludeClipRect({x, 0, x + plate.Side() / 24, plate.height});
    plate.context.ExcludeClipRegion(Disc(plate.Centre(), plate.Side() * 18 / 100));
    plate.context.SetBackColor(Mix(Hue(5), kPaper, 160));
    plate.context.SetPattern(kPatterns[0], 0, 0, false);
    plate.Fill(plate.All(), Hue(5));
}

/// Single pixels, where the bits of their coordinates have nothing in common.
void DrawPixels(Plate const& plate)
{
    for (int y = 0; y < plate.height; ++y)
        for (int x = 0; x < plate.width; ++x)
            if ((x & y & 63) == 0) {
                plate.context.SetForeColor(Mix(Hue(0), Hue(5), (x + y) * 256 / (plate.width + plate.height)));
                plate.context.DrawPixel(x, y);
            }
}

/// What the copying and what the inverting raster mode make of the same drawing.
void AddBothModes(std::vector<DrawPlate>& plates, DrawPlate const& scene)
{
    for (std::uint32_t const mode : {std::uint32_t{GrRasterModeCopy}, std::uint32_t{0}})
        plates.push_back([mode, scene](Plate const& plate) {
            int const w = plate.width, h = plate.height;
            for (int i = 0; i < 7; ++i)
                plate.Fill(GrRect{w * i / 7, h / 2, w * (i + 1) / 7, h}, Hue(i));
            plate.context.SetRasterMode(mode);
            plate.context.SetForeColor(kInk);
            plate.context.SetBackColor(kShade);
            scene(plate);
        });
}

void DrawTwoDiscs(Plate const& plate)
{
    auto const [x, y] = plate.Centre();
    for (int const side : {-1, 1})
        plate.context.FillRegion(Disc({x + side * plate.Side() * 13 / 100, y}, plate.Side() * 3 / 10));
}

void DrawFan(Plate const& plate)
{
    for (int x = 0; x < plate.width; x += 5)
        plate.context.DrawLine(plate.width / 2, 0, x, plate.height - 1);
}

void DrawTurnedSquares(Plate const& plate)
{
    for (int i = 0; i < 6; ++i) {
        std::int16_t xy[8];
        for (int corner = 0; corner < 4; ++corner) {
            auto const [x, y] = OnCircle(
                plate.Centre(), plate.Side() * (6 - i) / 13, kFullCircle / 4 * corner + kFullCircle / 24 * i);
            xy[2 * corner] = static_cast<std::int16_t>(x);
            xy[2 * corner + 1] = static_cast<std::int16_t>(y);
        }
        plate.context.FillPolygon(xy, 4);
    }
}

void DrawPatternBars(Plate const& plate)
{
    int const h = plate.height / 4;
    for (int i = 0; i < 4; ++i) {
        plate.context.SetPattern(kPatterns[i + 4], 0, 0, i % 2 == 0);
        plate.context.FillRegion(GrRect{h / 3, h * i + h / 6, plate.width - h / 3, h * (i + 1) - h / 6});
    }
}

void DrawRings(Plate const& plate)
{
    auto const [x, y] = plate.Centre();
    for (int i = 1; i < 8; ++i) {
        int const radius = plate.Side() * i / 16;
        plate.context.FillArc(x - radius, y - radius, 2 * radius, 2 * radius, 0, kFullCircle);
    }
}

void DrawMaskedTiles(Plate const& plate)
{
    int const size = plate.Side() / 5;
    int const left = (plate.width - 4 * size) / 2, top = (plate.height - 4 * size) / 2;
    auto const mask =
        NewMask(size, size, [size](int x, int y) { return ((x * 8 / size) & (y * 8 / size)) == 0; });
    for (int i = 0; i < 9; ++i)
        plate.context.DrawBitmapTransparent(left + i % 3 * size * 3 / 2, top + i / 3 * size * 3 / 2, *mask);
}

}

void DrawFills(Plate const& page)
{
    auto const fourPatterns = [](int first, bool transparent) {
        return [=](Plate const& plate) { DrawFourPatterns(plate, first, transparent); };
    };
    DrawPlates(page, 4,
        {fourPatterns(0, false), fourPatterns(4, false), fourPatterns(0, true), fourPatterns(4, true),
            DrawMovedPattern, DrawFrames, DrawCommonParts, DrawLattice, DrawThroughClip, DrawPixels,
            [](Plate const& plate) {  // what is left of a disc, and stars
                auto const [x, y] = plate.Centre();
                int const side = plate.Side();
                GrRegion moon = Disc({x, y}, side * 4 / 10);
                moon -= Disc({x + side * 14 / 100, y - side * 8 / 100}, side * 35 / 100);
                plate.Fill(plate.All(), Rgb(40, 52, 102));
                plate.Fill(moon, Hue(2));
                for (int i = 0; i < 24; ++i) {
                    int const left = i * 379 % plate.width, top = i * 173 % plate.height;
                    plate.Fill(GrRect{left, top, left + 1 + i % 2, top + 1 + i % 2}, kPaper);
                }
            },
            [](Plate const& plate) {  // one row a step
                for (int y = 0; y < plate.height; ++y)
                    plate.Fill(GrRect{0, y, plate.width, y + 1}, Mix(Hue(5), Hue(2), y * 256 / plate.height));
            }});
}

void DrawRasterModes(Plate const& page)
{
    std::vector<DrawPlate> plates;
    for (auto* const scene :
        {DrawTwoDiscs, DrawFan, DrawTurnedSquares, DrawPatternBars, DrawRings, DrawMaskedTiles})
        AddBothModes(plates, scene);
    DrawPlates(page, 4, plates);
}

}
