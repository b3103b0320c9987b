#include "pages.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>

namespace gallery {

namespace {

std::unique_ptr<GrBitmap> NewHeart(int size)
{
    return NewMask(size, size, [size](int x, int y) {
        // In 100ths: two discs side by side, and a triangle that touches them.
        int const dx = std::abs(200 * x + 100 - 100 * size) / size, dy = (200 * y + 100 - 62 * size) / size;
        if ((dx - 46) * (dx - 46) + dy * dy <= 50 * 50) return true;
        return (dx < 46 ? dy > 0 : dy > 35) && dx + dy <= 117;
    });
}

void DrawHeart(Plate const& plate)
{
    int const size = plate.Side() * 8 / 10;
    plate.context.DrawBitmap((plate.width - size) / 2, (plate.height - size) / 2, *NewHeart(size));
}

void DrawHeartTransparent(Plate const& plate)
{
    int const size = plate.Side() * 8 / 10;
    plate.context.DrawBitmapTransparent((plate.width - size) / 2, (plate.height - size) / 2, *NewHeart(size));
}

void DrawStripes(Plate const& plate)
{
    for (int i = 0; i < 7; ++i)
        plate.Fill(GrRect{plate.width * i / 7, 0, plate.width * (i + 1) / 7, plate.height},
            Mix(Hue(i), kPaper, 150));
}

/// The landscape where `isShown` says so.
template <typename IsShown>
DrawPlate Masked(IsShown isShown)
{
    return [isShown](Plate const& plate) {
        int const w = plate.width, h = plate.height;
        auto const mask = NewMask(w, h, [&](int x, int y) { return isShown(plate, x, y); });
        plate.context.DrawImageMasked(plate.All(), *NewImage(plate.format, w, h, Landscape), *mask, 0, 0);
    };
}

bool IsInFlower(Plate const& plate, int x, int y)
{
    double const dx = x + 0.5 - plate.width / 2.0, dy = y + 0.5 - plate.height / 2.0;
    double const petal = 0.36 + 0.1 * std::cos(6 * std::atan2(dx, dy));
    return std::hypot(dx, dy) < petal * plate.Side();
}

/// Dots that grow from the top down.
bool IsInDots(Plate const& plate, int x, int y)
{
    int const dx = x % 8 * 2 - 7, dy = y % 8 * 2 - 7;
    return dx * dx + dy * dy < (y / 8 * 8 + 4) * 100 / plate.height;
}

bool IsInBlinds(Plate const& plate, int x, int)
{
    int const blind = plate.width / 8 + 1;
    return x % blind < blind * (x / blind + 1) / 8;
}

/// Pixels that come in from the left, spread evenly.
bool IsDissolved(Plate const& plate, int x, int y)
{
    static constexpr int kOrder[4][4] = {{0, 8, 2, 10}, {12, 4, 14, 6}, {3, 11, 1, 9}, {15, 7, 13, 5}};
    return kOrder[y / 2 % 4][x / 2 % 4] < x * 17 / plate.width;
}

/// The picture cut into round pieces, drawn with gaps between them.
void DrawPieces(Plate const& plate)
{
    int const size = plate.Side() / 4, gap = size / 12;
    int const left = plate.width % size / 2, top = plate.height % size / 2;
    auto const image = NewImage(plate.format, plate.width, plate.height, Landscape);
    auto const mask = NewMask(plate.width, plate.height, [=](int x, int y) {
        int const dx = 2 * ((x + size - left) % size) + 1 - size,
                  dy = 2 * ((y + size - top) % size) + 1 - size;
        return dx * dx + dy * dy < size * size;
    });
    plate.Fill(plate.All(), kInk);
    for (int y = top; y + size <= plate.height; y += size)
        for (int x = left; x + size <= plate.width; x += size)
            plate.context.DrawImageMasked(
                {x + gap, y + gap, x + size - gap, y + size - gap}, *image, *mask, x + gap, y + gap);
}

/// Two pictures that share a plate: what the mask takes of one, its opposite leaves to the other.
void DrawTwoPictures(Plate const& plate)
{
    int const w = plate.width, h = plate.height, size = w / 6 + 1;
    for (bool const first : {false, true}) {
        auto const image = NewImage(plate.format, w, h, first ? Landscape : Ramps);
        auto const mask =
            NewMask(w, h, [=](int x, int y) { return ((x / size + y / size) % 2 == 0) == first; });
        plate.context.DrawImageMasked(plate.All(), *image, *mask, 0, 0);
    }
}

void DrawFigures(Plate const& plate)
{
    // One row a byte, the leftmost pixel in bit 0.
    static constexpr Pattern kFigures[] = {{0x66, 0xFF, 0xFF, 0xFF, 0x7E, 0x7E, 0x3C, 0x18},
        {0x18, 0x3C, 0x7E, 0xFF, 0xFF, 0x7E, 0x3C, 0x18}, {0x18, 0x3C, 0x7E, 0xFF, 0xFF, 0xDB, 0x18, 0x3C},
        {0x18, 0x3C, 0x18, 0x66, 0xFF, 0x7E, 0x18, 0x3C}};
    GrBitmap figure(8, 8);
    plate.Fill(plate.All(), kInk);
    int const columns = (plate.width - 8) / 14, rows = (plate.height - 8) / 14;
    int const left = (plate.width - columns * 14 + 6) / 2, top = (plate.height - rows * 14 + 6) / 2;
    for (int row = 0; row < rows; ++row)
        for (int column = 0; column < columns; ++column) {
            figure.Load(kFigures[(row + column) % 4]);
            plate.context.SetForeColor(Hue(row));
            plate.context.DrawBitmapTransparent(left + column * 14, top + row * 14, figure);
        }
}

void DrawShrinkingHearts(Plate const& plate)
{
    for (int i = 0; i < 9; ++i) {
        int const size = plate.Side() * (9 - i) / 10;
        plate.context.SetForeColor(i % 2 ? kPaper : Hue(0));
        plate.context.DrawBitmapTransparent(
            (plate.width - size) / 2, (plate.height - size) / 2, *NewHeart(size));
    }
}

}

void DrawMasks(Plate const& page)
{
    DrawPlates(page, 4,
        {[](Plate const& plate) {
             plate.Fill(plate.All(), Hue(5));
             plate.context.SetForeColor(Hue(0));
             plate.context.SetBackColor(Hue(2));
             DrawHeart(plate);
         },
            [](Plate const& plate) {
                DrawStripes(plate);
                plate.context.SetForeColor(Hue(0));
                DrawHeartTransparent(plate);
            },
            [](Plate const& plate) {
                DrawStripes(plate);
                plate.context.SetPattern(kPatterns[0], 0, 0, true);
                plate.context.SetForeColor(Hue(6));
                DrawHeartTransparent(plate);
            },
            [](Plate const& plate) {
                DrawStripes(plate);
                plate.context.SetRasterMode(0);
                DrawHeartTransparent(plate);
            },
            Masked(IsInFlower), Masked(IsInDots), Masked(IsInBlinds), Masked(IsDissolved), DrawPieces,
            DrawTwoPictures, DrawFigures, DrawShrinkingHearts});
}

}
